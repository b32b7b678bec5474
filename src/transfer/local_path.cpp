// Reads local paths in location texts.
#include "transfer/local_path.h"

#include <cctype>

#include "platform/platform.h"
#include "transfer/percent.h"
#include "zarvo.h"

namespace zv {

namespace {

// "/D|/dir" and "/D:/dir" are how a path with a drive stands after "file://".
void uncover_drive(char* path) {
  const bool is_letter = path[0] == '/' && std::isalpha(static_cast<unsigned char>(path[1])) != 0;
  if (!is_letter || (path[2] != ':' && path[2] != '|')) return;
  path[2] = ':';
  zv_strlshift(path, 1);
}

void decode(PathBuffer& text) {
  const size_t size = text.size();
  text.edit_shrinking([size](char* path) { percent_decode(path, size); });
  text.edit_shrinking(uncover_drive);
}

}  // namespace

void take_local_path(PathBuffer& text, bool is_url) {
  if (text.view().find('\\') != std::string_view::npos) {
    PathBuffer written = text;
    PathBuffer read;
    if (is_url) decode(written);
    const bool is_as_written =
        platform::slashed_path(written.c_str(), read) && read.view() == written.view();
    if (is_as_written) text = written;
    if (is_as_written) return;
    text.replace('\\', '/');
  }
  if (is_url) decode(text);
}

}  // namespace zv
