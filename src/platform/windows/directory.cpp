// Searches through folders. The handle of a search is its record on the heap.
#include <io.h>
#include <windows.h>

#include <cstdlib>
#include <new>

#include "frame/owner.h"
#include "platform/platform.h"

namespace zv::platform {

namespace {

// A search remembers its folder: only a search by full path tells what a reparse point is.
struct Search {
  TextBuffer<ZV_PATH_MAX + 1> folder;  // with a separator at its end, or empty
  intptr_t handle = -1;
  struct __finddata64_t found;
};

Search& search_of(intptr_t search) {
  return *reinterpret_cast<Search*>(search);
}

// A reparse point that stands for another name is a link; any other is what its attributes say. One
// that cannot be asked, or has no tag, as Wine shows links, is not followed either.
bool is_link(const char* path) {
  constexpr DWORD name_surrogate = 0x20000000;
  WIN32_FIND_DATAA found;
  const HANDLE handle = FindFirstFileA(path, &found);
  if (handle == INVALID_HANDLE_VALUE) return true;
  FindClose(handle);
  return (found.dwFileAttributes & FILE_ATTRIBUTE_REPARSE_POINT) != 0 &&
         (found.dwReserved0 == 0 || (found.dwReserved0 & name_surrogate) != 0);
}

Kind kind_of(const char* path, DWORD attributes) {
  if ((attributes & FILE_ATTRIBUTE_REPARSE_POINT) != 0 && is_link(path)) return Kind::link;
  return (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0 ? Kind::folder : Kind::other;
}

Kind kind_of_found(const Search& search) {
  const DWORD attributes = search.found.attrib;
  TextBuffer<ZV_PATH_MAX + sizeof search.found.name> path;
  if ((attributes & FILE_ATTRIBUTE_REPARSE_POINT) != 0 &&
      (!path.append(search.folder.view()) || !path.append(search.found.name)))
    return Kind::none;
  return kind_of(path.c_str(), attributes);
}

Entry entry_of(Search& search) {
  const bool hidden = (search.found.attrib & FILE_ATTRIBUTE_HIDDEN) != 0;
  return {search.found.name, kind_of_found(search), hidden ? Hidden::yes : Hidden::no};
}

bool begin(Search& search, const char* directory) {
  TextBuffer<ZV_PATH_MAX + 2> pattern;
  if (!search.folder.append(directory) || !end_with_slash(search.folder)) return false;
  if (!pattern.append(search.folder.view()) || !pattern.append('*')) return false;
  search.handle = _findfirst64(pattern.c_str(), &search.found);
  return search.handle != -1;
}

}  // namespace

intptr_t search_first(const char* directory, Entry& entry) {
  HeapPtr<void> block(std::malloc(sizeof(Search)));
  if (block == nullptr) return no_search;
  auto* const search = new (block.get()) Search;
  if (!begin(*search, directory)) return no_search;
  entry = entry_of(*search);
  return reinterpret_cast<intptr_t>(block.release());
}

intptr_t search_below(intptr_t, const char*, const char* path, Entry& entry) {
  return search_first(path, entry);
}

bool search_next(intptr_t search, Entry& entry) {
  Search& going = search_of(search);
  if (_findnext64(going.handle, &going.found) != 0) return false;
  entry = entry_of(going);
  return true;
}

void search_close(intptr_t search) {
  const HeapPtr<Search> done(&search_of(search));
  _findclose(done->handle);
}

Kind entry_kind(const char* path) {
  const DWORD attributes = GetFileAttributesA(path);
  return attributes != INVALID_FILE_ATTRIBUTES ? kind_of(path, attributes) : Kind::none;
}

// Every search tells it.
Hidden entry_hidden(intptr_t search, const char*, const char*) {
  return entry_of(search_of(search)).hidden;
}

}  // namespace zv::platform
