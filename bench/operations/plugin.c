/* A plugin with nothing in it but the contract; the benchmark enumerates copies of its library. */
#include <string.h>
#include <zarvo.h>

static plugin_t* release(plugin_t* self) {
  (void)self;
  return NULL;
}

static const char* formats(void) {
  return "Picture|.pic|.picture|\0Drawing|.drw|\0";
}

static int api_entry;
static plugin_t descriptor = {release, formats, &api_entry};

ZV_PLUGIN_EXPORT plugin_t* zv_plugin(const char* api, int min, int max, int* code);

ZV_PLUGIN_EXPORT plugin_t* zv_plugin(const char* api, int min, int max, int* code) {
  if (strcmp(api, "bench") != 0) {
    *code = ZV_PLUGIN_E_API;
    return NULL;
  }
  return zv_plugin_match_vers(min, max, 1, 2, code) ? &descriptor : NULL;
}
