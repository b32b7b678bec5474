// Plugin records and arrays of them, as the functions that make them share them.
#ifndef ZARVO_PLUGIN_RECORD_H
#define ZARVO_PLUGIN_RECORD_H

#include <memory>

#include "frame/text_buffer.h"
#include "plugin/loaded_plugin.h"
#include "zarvo.h"

namespace zv {

struct DestroyRecord {
  void operator()(zv_plugin_t* record) const { zv_plugin_destroy(record); }
};

using RecordPtr = std::unique_ptr<zv_plugin_t, DestroyRecord>;

// The record of a library that lies in a canonical folder, loaded once. `code` receives the agreed
// version, or why there is no record.
RecordPtr create_record(const PathBuffer& folder, const char* lib, const Request& request,
                        int* code);

// The array with room for so many records and the NULL after them; nullptr, with the array as it
// was, when memory runs out.
zv_plugin_t** resize_array(zv_plugin_t** array, size_t records);

}  // namespace zv

#endif
