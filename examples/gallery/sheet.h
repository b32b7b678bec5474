/* The contact sheet: a picture with a cell for each file. */
#ifndef GALLERY_SHEET_H
#define GALLERY_SHEET_H

#include "img.h"

/* Makes an empty sheet with that many cells; 0 when memory ran out. Free its pixels with
   zv_free(). */
int make_sheet(img_picture_t* sheet, int cells);

/* Draws the picture into its cell, scaled down to fit, over a bar of its average colour. */
void place_picture(img_picture_t* sheet, int cell, const img_picture_t* picture);

/* Draws a cross where there is no picture. */
void cross_out(img_picture_t* sheet, int cell);

void average_colour(const img_picture_t* picture, unsigned char rgb[3]);

#endif
