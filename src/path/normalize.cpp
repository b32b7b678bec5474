// A path as somebody wrote it, brought into canonical form.
#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <cstring>

#include "frame/text_view.h"
#include "path/components.h"
#include "path/folder.h"
#include "path/form.h"
#include "path/normalize.h"
#include "platform/platform.h"
#include "zarvo.h"

namespace platform = zv::platform;

namespace {

std::string_view without_spaces(std::string_view text) {
  while (!text.empty() && zv::is_space(text.front())) text.remove_prefix(1);
  while (!text.empty() && zv::is_space(text.back())) text.remove_suffix(1);
  return text;
}

// How much after a separator adds nothing: more separators, and "." components.
size_t idle_size(const char* text) {
  size_t size = 0;
  for (;;) {
    const char* const rest = text + size;
    const bool component = rest[0] == '.' && (rest[1] == '/' || rest[1] == '\0');
    if (rest[0] != '/' && !component) return size;
    ++size;
  }
}

// Leaves one separator between components, and no "." after one.
void squeeze(char* text) {
  char* kept = text;
  while (*text != '\0') {
    const char ch = *text++;
    *kept++ = ch;
    if (ch == '/') text += idle_size(text);
  }
  *kept = '\0';
}

// The two separators in front of a share are not doubled ones.
void squeeze_path(zv::PathBuffer& path) {
  const size_t start = zv::share_size(path.view()) != 0 ? std::min<size_t>(2, path.size()) : 0;
  path.edit_shrinking([start](char* text) { squeeze(text + start); });
}

// The drive's place in the alphabet; 0 for a character that names none.
int drive_number(char letter) {
  const int upper = std::toupper(static_cast<unsigned char>(letter));
  return upper >= 'A' && upper <= 'Z' ? upper - 'A' + 1 : 0;
}

// "X:" and "X:name" stand for the current folder of a drive and what lies below it.
bool complete_from_drive(zv::PathBuffer& path) {
  zv::PathBuffer full;
  if (!platform::drive_directory(drive_number(path[0]), full)) return false;
  std::string_view below = zv::without_slashes(path.view());
  below.remove_prefix(2);
  return (below.empty() || append_name(full, below)) && path.assign(full.view());
}

// Where there are drives, "/name" lies on the current one.
bool put_drive_in_front(zv::PathBuffer& path) {
  const int drive = platform::current_drive();
  if (drive == 0) return true;
  const char prefix[] = {static_cast<char>('A' + drive - 1), ':'};
  zv::PathBuffer full;
  return full.append({prefix, sizeof prefix}) && full.append(path.view()) &&
         path.assign(full.view());
}

bool expand_drive(zv::PathBuffer& path) {
  if (zv::is_dos(path.view()) && path[2] != '/') return complete_from_drive(path);
  if (path[0] == '/' && path[1] != '/') return put_drive_in_front(path);
  return true;
}

// Takes "NAME" out of "%NAME%" or "$NAME"; false for an ordinary component.
bool take_variable_name(std::string_view& component) {
  if (component.size() > 1 && component.front() == '%' && component.back() == '%')
    component.remove_suffix(1);
  else if (component.empty() || component.front() != '$')
    return false;
  component.remove_prefix(1);
  return true;
}

bool read_variable(std::string_view name, zv::PathBuffer& value) {
  zv::PathBuffer key;
  if (name.empty() || !key.assign(name)) return false;
  const char* const text = std::getenv(key.c_str());
  if (text == nullptr) return false;
  value.assign_cut(text);
  // A share that has no room for its separator gets it when it is joined, or fails there.
  static_cast<void>(zv::tidy_folder(value));
  return true;
}

// Joins the components, "~" and variables replaced. False with what was joined before a variable
// that is not set; false and empty where there is no home folder or the result does not fit.
bool join_expanded(const zv::Components& components, zv::JoinedPath& out) {
  zv::PathBuffer room;
  for (size_t i = 0; i < components.size(); ++i) {
    std::string_view component = components[i];
    if (i == 0 && component == "~") {
      if (!zv::home_folder(room) || !zv::make_usable(room)) return false;
      component = room.view();
    }
    if (take_variable_name(component)) {
      if (!read_variable(component, room)) return false;
      component = room.view();
    }
    if (!zv::join(out, component)) {
      out.clear();
      return false;
    }
  }
  return true;
}

bool climbs_above_root(const zv::Components& components) {
  return components.has_root() && components.size() > 1 && components[1] == "..";
}

}  // namespace

bool zv::normalize_fully(PathBuffer& text, JoinedPath& out) {
  text.replace('\\', '/');
  squeeze_path(text);
  if (!expand_drive(text)) return false;

  zv::Components components(text.view());
  components.drop_dot_pairs();
  if (climbs_above_root(components)) return false;
  if (!join_expanded(components, out)) return false;
  if (zv::finish(out)) return true;
  out.clear();
  return false;
}

int zv_normalize_path(char* path) {
  zv::PathBuffer text;
  if (!text.assign(without_spaces(zv::path_text(path)))) return 0;  // which always fits
  if (zv::normalize_fast(text, path)) return 1;
  zv::JoinedPath normal;
  const bool done = zv::normalize_fully(text, normal);
  zv::put(normal.view(), path, ZV_PATH_MAX);
  return done;
}
