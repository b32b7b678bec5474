/* A whole plugin: it serves the API "img" with pictures of a single colour, text files such as
   "#336699 64x48". Built by zarvo_add_plugin(colour img SOURCES colour.c) as img_colour.dll. */
#include <stdio.h>
#include <string.h>
#include <zarvo.h>

#include "img.h"

static int read_colour(const char* path, img_picture_t* picture) {
  unsigned red, green, blue;
  size_t i, pixels;
  FILE* const file = zv_fopen(path, "r", NULL);
  const int fields = file == NULL ? 0
                                  : fscanf(file, "#%2x%2x%2x %4dx%4d", &red, &green, &blue,
                                           &picture->width, &picture->height);
  zv_fclose(file);
  if (fields != 5 || picture->width < 1 || picture->height < 1) return 0;
  pixels = (size_t)picture->width * (size_t)picture->height;
  picture->rgb = (unsigned char*)zv_malloc(pixels * 3);
  for (i = 0; picture->rgb != NULL && i < pixels; ++i) {
    picture->rgb[3 * i] = (unsigned char)red;
    picture->rgb[3 * i + 1] = (unsigned char)green;
    picture->rgb[3 * i + 2] = (unsigned char)blue;
  }
  return picture->rgb != NULL;
}

/* Called before the library is let go: the place to free what the plugin holds. */
static plugin_t* release(plugin_t* self) {
  (void)self;
  return NULL;
}

/* One string after another, closed by an empty one: the literal's own NUL. */
static const char* formats(void) {
  return "Single colour|.colour|\0";
}

static img_api_t functions = {read_colour};
static plugin_t descriptor = {release, formats, &functions};

/* The one name that the library exports. */
ZV_PLUGIN_EXPORT plugin_t* zv_plugin(const char* api, int min, int max, int* code) {
  if (strcmp(api, IMG_API) != 0) {
    *code = ZV_PLUGIN_E_API;
    return NULL;
  }
  return zv_plugin_match_vers(min, max, 1, 2, code) ? &descriptor : NULL;
}
