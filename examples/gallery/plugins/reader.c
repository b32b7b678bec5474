/* A plugin of the API "img" around the decoder of one format. */
#include "reader.h"

#include <string.h>

enum { widest = 16384, largest_file = 256 * 1024 * 1024 };

int make_pixels(img_picture_t* picture, size_t width, size_t height) {
  if (width == 0 || height == 0 || width > widest || height > widest) return 0;
  picture->width = (int)width;
  picture->height = (int)height;
  picture->rgb = (unsigned char*)zv_calloc(width * height * 3);
  return picture->rgb != NULL;
}

/* The whole file in a block; NULL when it is too large or cannot be read. */
static unsigned char* load(const char* path, size_t* size) {
  struct _stat64 st;
  FILE* file;
  unsigned char* data = NULL;
  if (zv_stat(path, &st) != 0 || st.st_size <= 0 || st.st_size > largest_file) return NULL;
  file = zv_fopen(path, "rb", NULL);
  if (file != NULL) data = (unsigned char*)zv_malloc((size_t)st.st_size);
  if (data != NULL) *size = zv_fread(data, 1, (size_t)st.st_size, file, 0);
  zv_fclose(file);
  return data;
}

static int read_file(const char* path, img_picture_t* picture) {
  bytes_t file = {NULL, 0};
  unsigned char* const data = load(path, &file.size);
  int read;
  if (data == NULL) return 0;
  file.data = data;
  picture->rgb = NULL;
  read = decode_picture(file, picture);
  if (!read) zv_free(picture->rgb);
  zv_free(data);
  return read;
}

static plugin_t* release(plugin_t* self) {
  (void)self;
  return NULL;
}

static const char* formats(void) {
  return picture_formats;
}

static img_api_t functions = {read_file};
static plugin_t descriptor = {release, formats, &functions};

ZV_PLUGIN_EXPORT plugin_t* zv_plugin(const char* api, int min, int max, int* code) {
  if (strcmp(api, IMG_API) != 0) {
    *code = ZV_PLUGIN_E_API;
    return NULL;
  }
  return zv_plugin_match_vers(min, max, 1, 2, code) ? &descriptor : NULL;
}
