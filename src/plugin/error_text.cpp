// The words for why there is no plugin.
#include "plugin/error_text.h"

#include "zarvo.h"

namespace zv {

const char* plugin_error_text(int code) {
  switch (code) {
    case ZV_PLUGIN_E_MEMORY:
      return "memory allocation failed";
    case ZV_PLUGIN_E_ARGUMENTS:
      return "invalid function arguments";
    case ZV_PLUGIN_E_NOT_FOUND:
      return "library could not be found";
    case ZV_PLUGIN_E_LOAD:
      return "library could not be loaded";
    case ZV_PLUGIN_E_ENTRY:
      return "library does not export an zv_plugin function";
    case ZV_PLUGIN_E_API:
      return "plugin does not support requested api";
    case ZV_PLUGIN_E_DESCRIPTOR:
      return "plugin is not compatible with plugin_t";
    case ZV_PLUGIN_E_SILENT:
      return "plugin did not set an error code";
    default:
      return nullptr;
  }
}

}  // namespace zv
