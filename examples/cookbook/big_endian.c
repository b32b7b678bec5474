/* Reads a file of big-endian numbers, a sound file here, on a machine of either byte order. */
#include <stdio.h>
#include <stdlib.h>
#include <zarvo.h>

/* The file begins with these numbers; then, at `offset`, come the samples. */
typedef struct {
  uint32_t magic, offset, bytes, encoding, rate, channels;
} header_t;

enum { MAGIC = 0x2E736E64, SAMPLES_OF_16_BITS = 3 };

/* Whether the machine's own order differs from the file's. */
static int needs_swap(void) {
  const uint16_t one = 1;
  return *(const unsigned char*)&one;
}

static int read_header(FILE* file, header_t* header) {
  return zv_fread(header, sizeof header->magic, 6, file, needs_swap()) == 6 &&
         header->magic == MAGIC && header->encoding == SAMPLES_OF_16_BITS && header->channels > 0 &&
         zv_fseek(file, header->offset, SEEK_SET) == 0;
}

/* Gives how many samples there are. */
static size_t read_samples(FILE* file, int* loudest) {
  int16_t block[4096];
  size_t count, all = 0;
  while ((count = zv_fread(block, sizeof *block, 4096, file, needs_swap())) > 0) {
    for (size_t i = 0; i < count; ++i)
      if (abs(block[i]) > *loudest) *loudest = abs(block[i]);
    all += count;
  }
  return all;
}

static int describe(FILE* file) {
  header_t header;
  int loudest = 0;
  size_t samples;
  if (!read_header(file, &header)) return 0;
  samples = read_samples(file, &loudest);
  if (ferror(file)) return 0;
  printf("%u Hz, %u channels, %lu samples in each, loudest %d\n", (unsigned)header.rate,
         (unsigned)header.channels, (unsigned long)(samples / header.channels), loudest);
  return 1;
}

int main(int argc, char** argv) {
  FILE* const file = argc == 2 ? zv_fopen(argv[1], "r", NULL) : NULL;
  const int good = file != NULL && describe(file);
  zv_fclose(file);
  if (argc != 2)
    fprintf(stderr, "usage: big_endian FILE\n");
  else if (!good)
    fprintf(stderr, "big_endian: %s is not a sound file of 16-bit samples\n", argv[1]);
  return good ? 0 : argc == 2 ? 1 : 2;
}
