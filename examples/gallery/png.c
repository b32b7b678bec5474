/* The smallest PNG writer: its rows are stored, not compressed (RFC 2083, RFC 1950, RFC 1951). */
#include "png.h"

#include <stdio.h>
#include <zarvo.h>

/* A chunk while it is written, with the checksum of its bytes. */
typedef struct chunk_t {
  FILE* file;
  unsigned long crc;
} chunk_t;

static void put(chunk_t* chunk, const unsigned char* bytes, size_t size) {
  size_t i;
  int bit;
  for (i = 0; i < size; ++i) {
    chunk->crc ^= bytes[i];
    for (bit = 0; bit < 8; ++bit)
      chunk->crc = chunk->crc >> 1 ^ ((chunk->crc & 1) != 0 ? 0xedb88320ul : 0);
  }
  fwrite(bytes, 1, size, chunk->file);
}

static void store(unsigned char bytes[4], unsigned long value) {
  int i;
  for (i = 0; i < 4; ++i) bytes[i] = (unsigned char)(value >> (24 - 8 * i));
}

static void put_number(chunk_t* chunk, unsigned long value) {
  unsigned char bytes[4];
  store(bytes, value);
  put(chunk, bytes, sizeof bytes);
}

static chunk_t begin(FILE* file, const char* type, unsigned long size) {
  chunk_t chunk = {file, 0};
  put_number(&chunk, size);
  chunk.crc = 0xfffffffful;
  put(&chunk, (const unsigned char*)type, 4);
  return chunk;
}

static void end(chunk_t* chunk) {
  put_number(chunk, ~chunk->crc & 0xfffffffful);
}

static void put_header(FILE* file, const img_picture_t* picture) {
  static const unsigned char truecolour[5] = {8, 2, 0, 0, 0};
  chunk_t chunk = begin(file, "IHDR", 13);
  put_number(&chunk, (unsigned long)picture->width);
  put_number(&chunk, (unsigned long)picture->height);
  put(&chunk, truecolour, sizeof truecolour);
  end(&chunk);
}

/* The checksum of what is compressed. */
static unsigned long adler(unsigned long sum, const unsigned char* bytes, size_t size) {
  unsigned long low = sum & 0xffff;
  unsigned long high = sum >> 16;
  while (size-- > 0) {
    low = (low + *bytes++) % 65521;
    high = (high + low) % 65521;
  }
  return high << 16 | low;
}

/* Each row, with the filter byte 0 before it, is a stored block of its own. */
static void put_rows(FILE* file, const img_picture_t* picture) {
  static const unsigned char start[2] = {0x78, 0x01};
  static const unsigned char filter[1] = {0};
  const size_t row = (size_t)picture->width * 3;
  const size_t size = sizeof start + (row + 6) * (size_t)picture->height + 4;
  unsigned long sum = 1;
  int y;
  chunk_t chunk = begin(file, "IDAT", (unsigned long)size);
  put(&chunk, start, sizeof start);
  for (y = 0; y < picture->height; ++y) {
    const unsigned char* const pixels = picture->rgb + (size_t)y * row;
    const size_t length = row + 1;
    unsigned char block[5];
    block[0] = y == picture->height - 1; /* the last one says so */
    block[1] = (unsigned char)length;
    block[2] = (unsigned char)(length >> 8);
    block[3] = (unsigned char)~block[1];
    block[4] = (unsigned char)~block[2];
    put(&chunk, block, sizeof block);
    put(&chunk, filter, sizeof filter);
    put(&chunk, pixels, row);
    sum = adler(adler(sum, filter, sizeof filter), pixels, row);
  }
  put_number(&chunk, sum);
  end(&chunk);
}

int write_png(const char* path, const img_picture_t* picture) {
  static const unsigned char signature[8] = {0x89, 'P', 'N', 'G', '\r', '\n', 0x1a, '\n'};
  FILE* const file = zv_fopen(path, "wb", NULL);
  chunk_t last;
  int failed;
  if (file == NULL) return 0;
  fwrite(signature, 1, sizeof signature, file);
  put_header(file, picture);
  put_rows(file, picture);
  last = begin(file, "IEND", 0);
  end(&last);
  /* Only a file that could be closed is written. */
  failed = ferror(file);
  return fclose(file) == 0 && !failed;
}
