// The ready-made filter of directory scans: wildcard patterns, kinds, the hidden attribute.
//
// Everything that is asked here is only read, so the order is free: the patterns come first, and an
// entry that matches none costs no call to the platform.
#include "file/select.h"

#include <cstring>

namespace platform = zv::platform;
using platform::Kind;

namespace {

// One name, compared with one pattern after another.
class Matcher {
 public:
  Matcher(const char* name, bool match_case) : name_(name), match_case_(match_case) {
    if (match_case) return;
    lowered_.assign_cut(name);
    lowered_.edit_shrinking(zv_strlwr);
    name_ = lowered_.c_str();
  }

  bool matches(const char* pattern) const {
    if (match_case_) return zv_strpat(name_, pattern) != 0;
    zv::PathBuffer lowered;
    lowered.assign_cut(pattern);
    lowered.edit_shrinking(zv_strlwr);
    return zv_strpat(name_, lowered.c_str()) != 0;
  }

  bool matches_one_of(const char* patterns, const char* separators) const {
    if (patterns == nullptr || *patterns == '\0') return false;
    if (separators == nullptr) return matches(patterns);
    if (*separators == '\0') return matches_in_sequence(patterns);
    zv::PathBuffer fields;
    fields.assign_cut(patterns);
    return matches_in_fields(fields.c_str(), separators);
  }

 private:
  bool matches_in_sequence(const char* pattern) const {
    for (; *pattern != '\0'; pattern += std::strlen(pattern) + 1)
      if (matches(pattern)) return true;
    return false;
  }

  // Fields as strtok() tells them: empty ones do not count.
  bool matches_in_fields(const char* fields, const char* separators) const {
    zv::PathBuffer field;
    for (fields += std::strspn(fields, separators); *fields != '\0';
         fields += std::strspn(fields, separators)) {
      const size_t size = std::strcspn(fields, separators);
      if (field.assign({fields, size}) && matches(field.c_str())) return true;
      fields += size;
    }
    return false;
  }

  const char* name_;
  bool match_case_;
  zv::PathBuffer lowered_;
};

// What the entry leads to; none when it is gone.
Kind target_kind(const char* path, Kind kind) {
  return kind == Kind::folder || kind == Kind::other ? kind : platform::lies_at(path);
}

}  // namespace

bool zv::selects(const dirsel_t& sel, const char* dir, const platform::Entry& entry,
                 Search* search) {
  const Matcher matcher(entry.name, sel.match_case != 0);
  const bool as_directory =
      entry.kind != Kind::other && matcher.matches_one_of(sel.dir_patterns, sel.separators);
  const bool as_file =
      entry.kind != Kind::folder && matcher.matches_one_of(sel.file_patterns, sel.separators);
  if (!as_directory && !as_file) return false;

  zv::PathBuffer path;
  if (!path.append(dir) || !append_name(path, entry.name)) return false;
  const Kind kind = target_kind(path.c_str(), entry.kind);
  if (kind == Kind::none || !(kind == Kind::folder ? as_directory : as_file)) return false;
  if (sel.show_hidden != 0) return true;
  return !(search != nullptr ? search->hidden(path.c_str()) : platform::is_hidden(path.c_str()));
}

int zv_dir_select(const char* dir, const char* name, const dirsel_t* sel) {
  if (name == nullptr || *name == '\0') return 0;
  return sel == nullptr || zv::selects(*sel, dir, {name, Kind::none}, nullptr);
}
