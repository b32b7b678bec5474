// Absolute and relative paths: two inverse operations on the pieces of paths.
#include "path/resolve.h"

#include <algorithm>
#include <cctype>

#include "frame/text_view.h"
#include "path/folder.h"
#include "path/form.h"
#include "zarvo.h"

namespace zv {

namespace {

bool same_ignoring_case(std::string_view a, std::string_view b) {
  const auto folded = [](char ch) { return std::tolower(static_cast<unsigned char>(ch)); };
  return std::equal(a.begin(), a.end(), b.begin(), b.end(),
                    [folded](char x, char y) { return x == y || folded(x) == folded(y); });
}

std::string_view server_of(std::string_view root) {
  root.remove_prefix(2);
  return {root.data(), root.find('/')};
}

// Shares of one server are compared like folders of one root.
void split_shares_of_one_server(Pieces& path, Pieces& base) {
  const std::string_view ours = path.front();
  const std::string_view theirs = base.front();
  if (share_size(ours) == 0 || share_size(theirs) == 0) return;
  if (!same_ignoring_case(server_of(ours), server_of(theirs))) return;
  path.split_share();
  base.split_share();
}

// The caller's base, or the working directory in its place.
bool base_text(const char* base, PathBuffer& room, std::string_view& text) {
  if (base == nullptr && !working_folder(room)) return false;
  text = base != nullptr ? path_text(base) : room.view();
  return true;
}

}  // namespace

bool resolve(Pieces& path, Pieces& base, JoinedPath& out) {
  while (path.begins_with(".")) path.drop_first();
  while (path.begins_with("..") && !base.empty()) {
    path.drop_first();
    base.drop_last();
  }
  if (base.empty()) return true;
  return join(out, base) && join(out, path) && finish(out);
}

bool relate(Pieces& path, Pieces& base, JoinedPath& out) {
  if (path.empty() || base.empty()) return false;
  split_shares_of_one_server(path, base);
  if (!same_ignoring_case(path.front(), base.front())) return false;
  while (!path.empty() && !base.empty() && same_ignoring_case(path.front(), base.front())) {
    path.drop_first();
    base.drop_first();
  }
  for (; !base.empty(); base.drop_first())
    if (!join(out, "..")) return false;
  return join(out, path) && finish(out);
}

}  // namespace zv

int zv_absolute(const char* path, const char* base, char* out, size_t size) {
  zv::PathBuffer room;
  std::string_view folder;
  if (!zv::base_text(base, room, folder)) return 0;
  zv::Pieces of_path(zv::path_text(path));
  zv::Pieces of_base(folder);
  zv::JoinedPath absolute;
  if (of_base.empty() || !zv::resolve(of_path, of_base, absolute)) return 0;
  return zv::put(absolute.view(), out, size) != 0;
}

int zv_relative(const char* path, const char* base, char* out, size_t size) {
  zv::PathBuffer room;
  std::string_view folder;
  zv::JoinedPath relative;
  const bool known = zv::base_text(base, room, folder);
  zv::Pieces of_path(zv::path_text(path));
  zv::Pieces of_base(folder);
  const bool related = known && zv::relate(of_path, of_base, relative);
  zv::put(related ? relative.view() : path, out, size);
  return related;
}
