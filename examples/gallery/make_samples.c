/* Makes a folder's worth of pictures to try the gallery with: make_samples FOLDER.
   One of each format, a PNG that was cut short, and two files that no plugin reads. */
#include <stdio.h>
#include <stdlib.h>
#include <zarvo.h>

#include "img.h"

#define STB_IMAGE_WRITE_IMPLEMENTATION
#include "stb_image_write.h"

enum { width = 240, height = 160 };

static unsigned char pixels[height][width][3];

static void set(int x, int y, int red, int green, int blue) {
  pixels[y][x][0] = (unsigned char)red;
  pixels[y][x][1] = (unsigned char)green;
  pixels[y][x][2] = (unsigned char)blue;
}

static int squared_distance(int x, int y, int to_x, int to_y) {
  return (x - to_x) * (x - to_x) + (y - to_y) * (y - to_y);
}

/* Each draws the pixel at x, y of its picture. */
static void draw_sunrise(int x, int y) {
  const int glow = squared_distance(x, y, 120, 130) < 1600;
  if (y > 130)
    set(x, y, 20 + x / 12, 30, 70);
  else
    set(x, y, glow ? 255 : 90 + y, glow ? 220 : 60 + y / 2, glow ? 90 : 150 - y / 2);
}

static void draw_moon(int x, int y) {
  const int lit = squared_distance(x, y, 120, 80) < 3600 && squared_distance(x, y, 150, 65) > 3000;
  const int grey = lit ? 235 : 18 + y / 8;
  set(x, y, grey, grey, grey);
}

static void draw_tiles(int x, int y) {
  const int dark = (x / 20 + y / 20) % 2;
  set(x, y, dark ? 30 : 240, dark ? 90 + x / 4 : 235, dark ? 110 : 220 - y / 2);
}

static void draw_rings(int x, int y) {
  const int ring = squared_distance(x, y, 70, 60) / 500 % 3;
  set(x, y, ring == 0 ? 210 : 40, ring == 1 ? 180 : 50, ring == 2 ? 200 : 60);
}

static void draw_hills(int x, int y) {
  const int far_hill = 70 + squared_distance(x, 0, 60, 0) / 250;
  const int near_hill = 150 - (x * (width - x)) / 280;
  if (y > near_hill)
    set(x, y, 40, 110 - y / 4, 50);
  else if (y > far_hill)
    set(x, y, 90, 130, 110);
  else
    set(x, y, 150 + y / 2, 190 + y / 3, 230);
}

static void draw(void (*at)(int x, int y)) {
  int x, y;
  for (y = 0; y < height; ++y)
    for (x = 0; x < width; ++x) at(x, y);
}

static FILE* create(const char* folder, const char* name) {
  char path[ZV_PATH_MAX];
  FILE* file;
  snprintf(path, sizeof path, "%s/%s", folder, name);
  file = zv_fopen(path, "wb", NULL);
  if (file == NULL) {
    fprintf(stderr, "make_samples: cannot write %s\n", path);
    exit(1);
  }
  return file;
}

static void write_text(const char* folder, const char* name, const char* text) {
  FILE* const file = create(folder, name);
  fputs(text, file);
  zv_fclose(file);
}

static void write_ppm(const char* folder, const char* name) {
  FILE* const file = create(folder, name);
  fprintf(file, "P6\n# a sample\n%d %d\n255\n", width, height);
  fwrite(pixels, 1, sizeof pixels, file);
  zv_fclose(file);
}

/* Two bytes a sample. */
static void write_pgm(const char* folder, const char* name) {
  FILE* const file = create(folder, name);
  int x, y;
  fprintf(file, "P5 %d %d 65535\n", width, height);
  for (y = 0; y < height; ++y) {
    for (x = 0; x < width; ++x) {
      fputc(pixels[y][x][1], file);
      fputc(pixels[y][x][1], file);
    }
  }
  zv_fclose(file);
}

static void put_little(FILE* file, int size, unsigned long value) {
  for (; size > 0; --size, value >>= 8) fputc((int)(value & 0xff), file);
}

/* 24 bits a pixel, rows from bottom to top; a row of 240 pixels needs no filling up. */
static void write_bmp(const char* folder, const char* name) {
  FILE* const file = create(folder, name);
  int x, y;
  fputs("BM", file);
  put_little(file, 4, 54 + sizeof pixels);
  put_little(file, 4, 0);
  put_little(file, 4, 54);
  put_little(file, 4, 40);
  put_little(file, 4, width);
  put_little(file, 4, height);
  put_little(file, 2, 1);
  put_little(file, 2, 24);
  put_little(file, 24, 0);
  for (y = height - 1; y >= 0; --y)
    for (x = 0; x < width; ++x)
      put_little(file, 3,
                 (unsigned long)pixels[y][x][0] << 16 | (unsigned long)pixels[y][x][1] << 8 |
                     pixels[y][x][2]);
  zv_fclose(file);
}

static void append(void* file, void* data, int size) {
  fwrite(data, 1, (size_t)size, (FILE*)file);
}

static void append_start(void* file, void* data, int size) {
  append(file, data, size / 2);
}

static void write_png(const char* folder, const char* name, stbi_write_func* how) {
  FILE* const file = create(folder, name);
  stbi_write_png_to_func(how, file, width, height, 3, pixels, width * 3);
  zv_fclose(file);
}

static void write_jpeg(const char* folder, const char* name) {
  FILE* const file = create(folder, name);
  stbi_write_jpg_to_func(append, file, width, height, 3, pixels, 90);
  zv_fclose(file);
}

int main(int argc, char** argv) {
  const char* const folder = argc == 2 ? argv[1] : NULL;
  if (folder == NULL) {
    fprintf(stderr, "usage: make_samples FOLDER\n");
    return 2;
  }
  zv_mkpath(folder);
  draw(draw_sunrise);
  write_ppm(folder, "sunrise.ppm");
  draw(draw_moon);
  write_pgm(folder, "moon.pgm");
  draw(draw_tiles);
  write_bmp(folder, "Tiles.BMP");
  draw(draw_rings);
  write_png(folder, "rings.png", append);
  write_png(folder, "cut.png", append_start);
  draw(draw_hills);
  write_jpeg(folder, "hills.jpg");
  write_text(folder, "sky.colour", "#87ceeb 96x64\n");
  write_text(folder, "vase.holo", "a picture of tomorrow\n");
  write_text(folder, "notes.txt", "no picture\n");
  return 0;
}
