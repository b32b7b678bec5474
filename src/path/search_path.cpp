// The folders that "PATH" names.
#include <cstdlib>
#include <cstring>

#include "frame/owner.h"
#include "path/form.h"
#include "path/pieces.h"
#include "platform/platform.h"
#include "strlist/list_owner.h"
#include "zarvo.h"

namespace platform = zv::platform;

namespace {

// The elements of "PATH", each as it is written there; none when it is not set or empty.
class SearchPath {
 public:
  SearchPath() : rest_(std::getenv("PATH")) {
    if (rest_ != nullptr && *rest_ == '\0') rest_ = nullptr;
    if (rest_ != nullptr) separator_ = platform::search_path_separator(rest_);
  }

  bool next(std::string_view& element) {
    if (rest_ == nullptr) return false;
    const char* const end = std::strchr(rest_, separator_);
    element = end != nullptr ? std::string_view(rest_, static_cast<size_t>(end - rest_)) : rest_;
    rest_ = end != nullptr ? end + 1 : nullptr;
    return true;
  }

 private:
  const char* rest_;
  char separator_ = '\0';
};

// The long form of an element, or the element as written where there is none. False when it is
// longer than a path may be.
bool long_form(std::string_view element, zv::PathBuffer& folder) {
  zv::PathBuffer written;
  if (!written.assign(element)) return false;
  if (!platform::long_path(written.c_str(), folder)) folder = written;
  folder.replace('\\', '/');
  return true;
}

bool append_folder(zv::ListOwner& folders, std::string_view element) {
  zv::PathBuffer folder;
  if (long_form(element, folder)) return folders.append(folder.view());
  if (!folders.append(element)) return false;
  zv_strreplchr(folders[folders.count() - 1], '\\', '/');
  return true;
}

}  // namespace

int zv_pathlist(char*** list) {
  SearchPath elements;
  std::string_view element;
  zv::ListOwner folders;
  while (elements.next(element))
    if (!append_folder(folders, element)) return 0;
  const int count = folders.count();
  if (count != 0) *list = folders.release();
  return count;
}

int zv_path_locate(char* path) {
  const std::string_view name = zv::file_name(path);
  SearchPath elements;
  std::string_view element;
  while (elements.next(element)) {
    zv::PathBuffer candidate;
    if (!long_form(element, candidate)) continue;
    if (!name.empty() && !zv::append_name(candidate, name)) continue;
    if (platform::lies_at(candidate.c_str()) == platform::Kind::none) continue;
    zv_strncpy(path, candidate.c_str(), ZV_PATH_MAX);
    return 1;
  }
  return 0;
}
