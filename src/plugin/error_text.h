// The words for why there is no plugin.
#ifndef ZARVO_PLUGIN_ERROR_TEXT_H
#define ZARVO_PLUGIN_ERROR_TEXT_H

namespace zv {

// The words for a zv_plugin_error; nullptr for any other code.
const char* plugin_error_text(int code);

}  // namespace zv

#endif
