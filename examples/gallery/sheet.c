/* The contact sheet. */
#include "sheet.h"

#include <string.h>
#include <zarvo.h>

enum {
  columns = 4,
  box = 128,
  gap = 12,
  bar = 8,
  cell_width = box + gap,
  cell_height = box + bar + 2 * gap
};

static const unsigned char paper[3] = {32, 34, 40};
static const unsigned char ink[3] = {96, 100, 112};

typedef struct area_t {
  int x, y, width, height;
} area_t;

static unsigned char* pixel(const img_picture_t* picture, int x, int y) {
  return picture->rgb + ((size_t)y * (size_t)picture->width + (size_t)x) * 3;
}

static void fill(img_picture_t* sheet, area_t area, const unsigned char rgb[3]) {
  int x, y;
  for (y = area.y; y < area.y + area.height; ++y)
    for (x = area.x; x < area.x + area.width; ++x) memcpy(pixel(sheet, x, y), rgb, 3);
}

/* The mean of the picture's pixels in an area of it, rounded to the nearest. */
static void mean(const img_picture_t* picture, area_t area, unsigned char rgb[3]) {
  const unsigned long long pixels =
      (unsigned long long)area.width * (unsigned long long)area.height;
  unsigned long long sum[3] = {0, 0, 0};
  int x, y, i;
  for (y = area.y; y < area.y + area.height; ++y)
    for (x = area.x; x < area.x + area.width; ++x)
      for (i = 0; i < 3; ++i) sum[i] += pixel(picture, x, y)[i];
  for (i = 0; i < 3; ++i) rgb[i] = (unsigned char)((sum[i] + pixels / 2) / pixels);
}

static area_t cell_box(int cell) {
  area_t area;
  area.x = gap + cell % columns * cell_width;
  area.y = gap + cell / columns * cell_height;
  area.width = box;
  area.height = box;
  return area;
}

/* A pixel of the small picture is the mean of those that it stands for. */
static void scale(img_picture_t* sheet, area_t to, const img_picture_t* picture) {
  int x, y;
  for (y = 0; y < to.height; ++y) {
    for (x = 0; x < to.width; ++x) {
      area_t from;
      from.x = (int)((long long)x * picture->width / to.width);
      from.y = (int)((long long)y * picture->height / to.height);
      from.width = (int)((long long)(x + 1) * picture->width / to.width) - from.x;
      from.height = (int)((long long)(y + 1) * picture->height / to.height) - from.y;
      mean(picture, from, pixel(sheet, to.x + x, to.y + y));
    }
  }
}

static int at_least_one(long long length) {
  return length < 1 ? 1 : (int)length;
}

int make_sheet(img_picture_t* sheet, int cells) {
  const int rows = cells == 0 ? 1 : (cells + columns - 1) / columns;
  const area_t all = {0, 0, gap + columns * cell_width, gap + rows * cell_height};
  sheet->width = all.width;
  sheet->height = all.height;
  sheet->rgb = (unsigned char*)zv_malloc((size_t)all.width * (size_t)all.height * 3);
  if (sheet->rgb != NULL) fill(sheet, all, paper);
  return sheet->rgb != NULL;
}

void place_picture(img_picture_t* sheet, int cell, const img_picture_t* picture) {
  const int longer = picture->width > picture->height ? picture->width : picture->height;
  area_t area = cell_box(cell);
  area_t strip = area;
  unsigned char rgb[3];
  average_colour(picture, rgb);
  strip.y += box + gap / 2;
  strip.height = bar;
  fill(sheet, strip, rgb);

  /* A picture that fits is not made larger. */
  area.width = picture->width;
  area.height = picture->height;
  if (longer > box) {
    area.width = at_least_one((long long)picture->width * box / longer);
    area.height = at_least_one((long long)picture->height * box / longer);
  }
  area.x += (box - area.width) / 2;
  area.y += (box - area.height) / 2;
  scale(sheet, area, picture);
}

void cross_out(img_picture_t* sheet, int cell) {
  const area_t area = cell_box(cell);
  int i;
  for (i = 0; i < box; ++i) {
    memcpy(pixel(sheet, area.x + i, area.y + i), ink, 3);
    memcpy(pixel(sheet, area.x + i, area.y + box - 1 - i), ink, 3);
  }
}

void average_colour(const img_picture_t* picture, unsigned char rgb[3]) {
  area_t all = {0, 0, 0, 0};
  all.width = picture->width;
  all.height = picture->height;
  mean(picture, all, rgb);
}
