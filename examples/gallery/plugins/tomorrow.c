/* A plugin of a later time, which speaks version 9 of the API and nothing older: today's gallery
   reports it and goes on. */
#include "img.h"

#include <zarvo.h>

static plugin_t* release(plugin_t* self) {
  (void)self;
  return NULL;
}

static const char* formats(void) {
  return "Hologram|.holo|\0";
}

static img_api_t functions = {NULL};
static plugin_t descriptor = {release, formats, &functions};

ZV_PLUGIN_EXPORT plugin_t* zv_plugin(const char* api, int min, int max, int* code) {
  (void)api;
  return zv_plugin_match_vers(min, max, 9, 9, code) ? &descriptor : NULL;
}
