/* Pictures written as PNG files. */
#ifndef GALLERY_PNG_H
#define GALLERY_PNG_H

#include "img.h"

/* Writes the picture; 0 when the file cannot be written. */
int write_png(const char* path, const img_picture_t* picture);

#endif
