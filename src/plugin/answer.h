// What a plugin and its host answer each other, in words.
#ifndef ZARVO_PLUGIN_ANSWER_H
#define ZARVO_PLUGIN_ANSWER_H

namespace zv {

// The words for a zv_plugin_error; nullptr for any other code.
const char* plugin_error_text(int code);

}  // namespace zv

#endif
