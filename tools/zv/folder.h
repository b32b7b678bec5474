// Folders as the commands look at them.
#ifndef ZV_TOOL_FOLDER_H
#define ZV_TOOL_FOLDER_H

#include <span>
#include <string>

#include "zarvo.h"

namespace tool {

// Whether it can be looked into; says why not.
bool is_folder(const std::string& path);

// The entries of a folder, sorted by name.
class Listing {
 public:
  Listing() = default;
  ~Listing() { zv_strlist_free(list_, -1); }
  Listing(const Listing&) = delete;
  Listing& operator=(const Listing&) = delete;

  // Every entry, where no selection is given; with full paths and all that lies below, where
  // `recursive`. Says so and gives false when an entry cannot be examined.
  bool scan(const std::string& folder, dirsel_t* selection, bool recursive);

  std::span<char*> names() const { return {list_, count_}; }

 private:
  char** list_ = nullptr;
  size_t count_ = 0;
};

}  // namespace tool

#endif
