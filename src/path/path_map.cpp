// The path map: folders that have moved, in one table for the process, behind one lock.
#include <pthread.h>

#include <algorithm>
#include <cstdlib>
#include <utility>

#include "frame/owner.h"
#include "path/components.h"
#include "path/folder.h"
#include "path/form.h"
#include "path/pieces.h"
#include "path/resolve.h"
#include "zarvo.h"

namespace {

using Text = zv::HeapPtr<char>;

Text copy_of(const zv::PathBuffer& text) {
  return Text(static_cast<char*>(zv_dalloc(text.c_str(), text.size() + 1)));
}

// The texts belong to the table, which has no destructor: nothing is to run when the library is
// unloaded.
struct Redirect {
  char* from;
  size_t from_size;
  char* to;
};

struct Redirects {
  Redirect* entries;  // oldest first
  size_t count;
  size_t room;

  Redirect* begin() const { return entries; }
  Redirect* end() const { return entries + count; }
};

pthread_mutex_t mutex = PTHREAD_MUTEX_INITIALIZER;
constinit Redirects redirects = {nullptr, 0, 0};

Redirect* find(std::string_view from) {
  return std::find_if(redirects.begin(), redirects.end(), [from](const Redirect& entry) {
    return from == std::string_view(entry.from, entry.from_size);
  });
}

bool make_room() {
  if (redirects.count < redirects.room) return true;
  const size_t room = std::max<size_t>(8, 2 * redirects.room);
  void* const moved = std::realloc(redirects.entries, room * sizeof(Redirect));
  if (moved == nullptr) return false;
  redirects.entries = static_cast<Redirect*>(moved);
  redirects.room = room;
  return true;
}

bool change(Redirect& entry, const zv::PathBuffer& to) {
  if (to.view() == entry.to) return false;
  Text copy = copy_of(to);
  if (copy == nullptr) return false;
  std::free(std::exchange(entry.to, copy.release()));
  return true;
}

bool add(const zv::PathBuffer& from, const zv::PathBuffer& to) {
  Text from_copy = copy_of(from);
  Text to_copy = copy_of(to);
  if (from_copy == nullptr || to_copy == nullptr || !make_room()) return false;
  redirects.entries[redirects.count++] = {from_copy.release(), from.size(), to_copy.release()};
  return true;
}

// Where a file of this folder would be if the folder had moved along with the entry's.
bool candidate_for(const Redirect& entry, std::string_view folder, std::string_view name,
                   zv::PathBuffer& out) {
  zv::Pieces of_folder(folder);
  zv::Pieces of_from({entry.from, entry.from_size});
  zv::JoinedPath relative;
  if (!zv::relate(of_folder, of_from, relative)) return false;

  zv::Pieces of_relative(relative.view());
  zv::Pieces of_to(entry.to);
  zv::JoinedPath moved;
  if (!zv::resolve(of_relative, of_to, moved) || moved.empty()) return false;
  return out.assign(moved.view()) && zv::append_name(out, name);
}

bool exists(const char* path) {
  struct _stat64 st;
  return zv_stat(path, &st) == 0;
}

}  // namespace

int zv_pathmap(const char* from, const char* to) {
  zv::PathBuffer from_folder;
  zv::PathBuffer to_folder;
  zv::folder_of(from, from_folder);
  zv::folder_of(to, to_folder);
  if (to_folder.empty() && !zv::working_folder(to_folder)) return 0;
  if (from_folder.view() == to_folder.view()) return 0;

  const zv::LockGuard lock(mutex);
  if (!lock.held()) return 0;
  Redirect* const found = find(from_folder.view());
  return found != redirects.end() ? change(*found, to_folder) : add(from_folder, to_folder);
}

void zv_pathmap_clear() {
  const zv::LockGuard lock(mutex);
  if (!lock.held()) return;
  for (const Redirect& entry : redirects) {
    std::free(entry.from);
    std::free(entry.to);
  }
  std::free(redirects.entries);
  redirects = {nullptr, 0, 0};
}

int zv_pathmap_locate(char* path) {
  if (exists(path)) return 1;
  zv::PathBuffer folder;
  zv::folder_of(path, folder);
  const std::string_view name = zv::file_name(path);

  const zv::LockGuard lock(mutex);
  if (!lock.held()) return 0;
  for (const Redirect& entry : redirects) {
    zv::PathBuffer candidate;
    if (!candidate_for(entry, folder.view(), name, candidate)) continue;
    if (!exists(candidate.c_str())) continue;
    zv_strncpy(path, candidate.c_str(), ZV_PATH_MAX);
    return 1;
  }
  return 0;
}
