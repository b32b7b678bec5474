// The path map: folders that have moved, in one table for the process, behind one lock.
#include <pthread.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <utility>

#include "frame/lock.h"
#include "frame/owner.h"
#include "path/components.h"
#include "path/folder.h"
#include "path/form.h"
#include "path/pieces.h"
#include "path/resolve.h"
#include "platform/platform.h"
#include "strings/hash.h"
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
  uint64_t hash;  // of `from`
  char* to;
  size_t next;  // in its bucket, as there
};

// A hash index with a chain a bucket finds what the list holds: a place there, counted from 1.
struct Redirects {
  Redirect* entries;  // oldest first
  size_t* buckets;    // as many as there is room for entries, a power of 2
  size_t count;
  size_t room;

  Redirect* begin() const { return entries; }
  Redirect* end() const { return entries + count; }
  size_t& bucket(uint64_t hash) const { return buckets[hash & (room - 1)]; }
};

pthread_mutex_t mutex = PTHREAD_MUTEX_INITIALIZER;
constinit Redirects redirects = {nullptr, nullptr, 0, 0};

uint64_t hash_of(std::string_view from) {
  return zv::hash_of(from, zv::hash_key(), [](uint64_t word) { return word; });
}

Redirect* find(std::string_view from) {
  if (redirects.count == 0) return nullptr;
  const uint64_t hash = hash_of(from);
  for (size_t place = redirects.bucket(hash); place != 0;) {
    Redirect& entry = redirects.entries[place - 1];
    if (entry.hash == hash && from == std::string_view(entry.from, entry.from_size)) return &entry;
    place = entry.next;
  }
  return nullptr;
}

void link(size_t place) {
  Redirect& entry = redirects.entries[place - 1];
  entry.next = std::exchange(redirects.bucket(entry.hash), place);
}

bool make_room() {
  if (redirects.count < redirects.room) return true;
  const size_t room = std::max<size_t>(8, 2 * redirects.room);
  zv::HeapPtr<size_t[]> buckets(static_cast<size_t*>(std::calloc(room, sizeof(size_t))));
  void* const moved = std::realloc(redirects.entries, room * sizeof(Redirect));
  if (moved != nullptr) redirects.entries = static_cast<Redirect*>(moved);
  if (moved == nullptr || buckets == nullptr) return false;
  std::free(std::exchange(redirects.buckets, buckets.release()));
  redirects.room = room;
  for (size_t place = 1; place <= redirects.count; ++place) link(place);
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
  redirects.entries[redirects.count++] = {from_copy.release(), from.size(), hash_of(from.view()),
                                          to_copy.release(), 0};
  link(redirects.count);
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
  return zv::platform::lies_at(path) != zv::platform::Kind::none;
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
  return found != nullptr ? change(*found, to_folder) : add(from_folder, to_folder);
}

void zv_pathmap_clear() {
  const zv::LockGuard lock(mutex);
  if (!lock.held()) return;
  for (const Redirect& entry : redirects) {
    std::free(entry.from);
    std::free(entry.to);
  }
  std::free(redirects.entries);
  std::free(redirects.buckets);
  redirects = {nullptr, nullptr, 0, 0};
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
