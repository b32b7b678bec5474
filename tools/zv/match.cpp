// zv match: a text against a wildcard pattern.
#include "commands.h"
#include "zarvo.h"

int tool::match(const MatchOptions& options) {
  return zv_strpat(options.text.c_str(), options.pattern.c_str()) != 0 ? done : no;
}
