// Makes and removes the file between two network locations.
#include "transfer/temporary_file.h"

#include <cstdio>

#include "platform/platform.h"

namespace zv {

bool TemporaryFile::prepare(const char* server_path) {
  PathBuffer name;
  const bool named = name.fill([server_path](char* room, size_t size) {
    return zv_extract_filename(server_path, room, size) != 0;
  });
  if (!named || !platform::names_a_file(name.view())) return false;

  PathBuffer folder;
  if (!folder.fill([](char* room, size_t size) { return zv_tempdir(room, size) != 0; }))
    return false;
  if (folder.back() != '/' && !folder.append('/')) return false;
  if (!platform::make_private_folder(folder)) return false;

  folder_ = folder;
  // A local path takes part in a copy with one character less than fits.
  return path_.assign(folder.view()) && path_.append('/') && path_.append(name.view()) &&
         path_.size() < PathBuffer::capacity;
}

TemporaryFile::~TemporaryFile() {
  if (folder_.empty()) return;
  std::remove(path_.c_str());
  platform::remove_folder(folder_.c_str());
}

}  // namespace zv
