/* What the gallery's own plugins share. reader.c is the plugin and reads the file; each format's
   source adds the two things below that it needs. */
#ifndef GALLERY_READER_H
#define GALLERY_READER_H

#include <stddef.h>
#include <zarvo.h>

#include "img.h"

/* A picture file's bytes. */
typedef struct bytes_t {
  const unsigned char* data;
  size_t size;
} bytes_t;

/* Of each format: its entries, one string after another, closed by an empty one. */
extern const char picture_formats[];

/* Of each format: makes the picture, or returns 0 for bytes that are none. What the file says about
   itself is checked against its bytes before it is believed. */
int decode_picture(bytes_t file, img_picture_t* picture);

/* Allocates black pixels; 0 for a size that no picture has, or when memory ran out. */
int make_pixels(img_picture_t* picture, size_t width, size_t height);

#endif
