/* PPM and PGM, as text (P2, P3) and binary (P5, P6), with samples of one or two bytes. */
#include <ctype.h>
#include <string.h>

#include "reader.h"

const char picture_formats[] = "Portable anymap|.ppm|.pgm|.pnm|\0";

/* The bytes that are left. */
typedef struct cursor_t {
  const unsigned char* at;
  const unsigned char* end;
} cursor_t;

/* Skips white space and comments, which run from a # to the end of their line. */
static void skip_blanks(cursor_t* in) {
  int comment = 0;
  for (; in->at < in->end; ++in->at) {
    if (*in->at == '#') comment = 1;
    if (*in->at == '\n') comment = 0;
    if (!comment && !isspace(*in->at)) return;
  }
}

/* A decimal number of at most 65535; -1 when there is none. */
static long number(cursor_t* in) {
  long value = -1;
  skip_blanks(in);
  for (; in->at < in->end && isdigit(*in->at) && value <= 65535; ++in->at)
    value = (value < 0 ? 0 : value) * 10 + (*in->at - '0');
  return value <= 65535 ? value : -1;
}

/* A binary sample: two bytes, the higher first, when one does not hold the largest value. */
static long sample(cursor_t* in, long largest) {
  const int bytes = largest > 255 ? 2 : 1;
  long value = 0;
  if (in->end - in->at < bytes) return -1;
  value = *in->at++;
  if (bytes == 2) value = value * 256 + *in->at++;
  return value;
}

static int decode_samples(cursor_t* in, img_picture_t* picture, int text, size_t channels,
                          long largest) {
  const size_t pixels = (size_t)picture->width * (size_t)picture->height;
  size_t i;
  for (i = 0; i < pixels * 3; ++i) {
    const int repeated = channels == 1 && i % 3 != 0;
    const long value = repeated ? 0 : text ? number(in) : sample(in, largest);
    if (value < 0 || value > largest) return 0;
    if (repeated)
      picture->rgb[i] = picture->rgb[i - 1];
    else
      picture->rgb[i] = (unsigned char)((value * 255 + largest / 2) / largest);
  }
  return 1;
}

int decode_picture(bytes_t file, img_picture_t* picture) {
  cursor_t in = {file.data, file.data + file.size};
  size_t channels;
  int text;
  long width, height, largest;
  if (file.size < 3 || in.at[0] != 'P' || strchr("2356", in.at[1]) == NULL) return 0;
  text = in.at[1] < '4';
  channels = in.at[1] == '3' || in.at[1] == '6' ? 3 : 1;
  in.at += 2;
  width = number(&in);
  height = number(&in);
  largest = number(&in);
  if (width < 1 || height < 1 || largest < 1 || in.at == in.end || !isspace(*in.at)) return 0;
  ++in.at;
  /* Each sample takes a byte at least: a file that is too short needs no pixels. */
  if ((size_t)width * (size_t)height * channels > (size_t)(in.end - in.at)) return 0;
  return make_pixels(picture, (size_t)width, (size_t)height) &&
         decode_samples(&in, picture, text, channels, largest);
}
