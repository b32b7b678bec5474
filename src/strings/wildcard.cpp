// Wildcard patterns.
//
// A pattern is a row of runs with stars between them. What follows a star either matches or makes
// the match hopeless: a run that merely differs is tried again from the star's next place. So once
// a run has matched up to a further star, the stars before it are settled, only the last one is
// ever tried again, and neither recursion nor heap is needed. The match is given up as hopeless
// once the text ends before the pattern does, or the pattern turns out malformed. The run after
// the last star is looked for at the end of the text alone, where it has to be, and a run's leading
// question marks are passed over with the star: `*?` matches what `?*` does.
#include <algorithm>
#include <array>
#include <bit>
#include <cstring>
#include <string_view>

#include "frame/text_view.h"
#include "strings/find.h"
#include "zarvo.h"

namespace {

struct Character {
  uint32_t value;
  int length;
};

bool is_ascii(char ch) {
  return static_cast<unsigned char>(ch) < 0x80;
}

bool is_continuation(char ch) {
  return (static_cast<unsigned char>(ch) & 0xC0) == 0x80;
}

// Two to six bytes of UTF-8, of any value, or else the one byte.
Character decode_sequence(const char* p) {
  const auto byte = static_cast<unsigned char>(*p);
  const int ones = std::countl_one(byte);
  if (ones > 6) return {byte, 1};
  uint32_t value = byte & (0x7FU >> ones);
  for (int i = 1; i < ones; ++i) {
    if (!is_continuation(p[i])) return {byte, 1};
    value = value << 6 | (static_cast<unsigned char>(p[i]) & 0x3FU);
  }
  return {value, ones};
}

// The character at `p`, in front of the NUL or bracket that no multi-byte character can run over.
inline Character decode(const char* p) {
  const auto byte = static_cast<unsigned char>(*p);
  return byte < 0xC0 ? Character{byte, 1} : decode_sequence(p);
}

// Where the character begins that ends at `end`, in a text that begins at `first`. Only a
// continuation can belong to the character of a byte before it.
const char* character_before(const char* end, const char* first) {
  constexpr ptrdiff_t longest = 6;
  const char* start = end - 1;
  while (is_continuation(*start) && start != first && end - start < longest) --start;
  return start + decode(start).length == end ? start : end - 1;
}

// A set, from its opening bracket on.
class Set {
 public:
  explicit Set(const char* bracket)
      : negated_(bracket[1] == '^'), members_(bracket + (negated_ ? 2 : 1)) {
    if (*members_ == '\0') return;
    const char* end = members_ + 1;  // the first member may be the bracket itself
    while (*end != ']' && *end != '\0') ++end;
    if (*end == ']') close_ = end;
  }

  bool closed() const { return close_ != nullptr; }
  const char* end() const { return close_ + 1; }
  bool takes(uint32_t value) const { return holds(value) != negated_; }

 private:
  bool holds(uint32_t value) const {
    for (const char* p = members_; p != close_;) {
      const Character first = decode(p);
      p += first.length;
      if (value == first.value) return true;
      if (*p != '-' || p + 1 == close_) continue;
      const Character last = decode(p + 1);
      p += 1 + last.length;
      if (first.value < value && value <= last.value) return true;
    }
    return false;
  }

  bool negated_;
  const char* members_;
  const char* close_ = nullptr;
};

// Looked up, because every character of a pattern is asked.
constexpr std::array<bool, 256> specials = [] {
  std::array<bool, 256> map{};
  for (const char ch : {'*', '?', '[', ']', '\\', '\0'}) map[static_cast<unsigned char>(ch)] = true;
  return map;
}();

bool is_special(char ch) {
  return specials[static_cast<unsigned char>(ch)];
}

// The literal text that a pattern begins with.
std::string_view literal_head(const char* pattern) {
  const char* end = pattern;
  while (!is_special(*end)) ++end;
  return {pattern, end};
}

// The literal text that a pattern ends with. A byte of it may stand after a `\`, which changes
// nothing, or in a set without its bracket, which matches nothing anyway.
std::string_view literal_tail(const char* pattern) {
  const char* const end = pattern + std::strlen(pattern);
  const char* start = end;
  while (start != pattern && !is_special(start[-1])) --start;
  return {start, end};
}

enum class Outcome { matched, differs, given_up };

class Matcher {
 public:
  Matcher(const char* text, const char* pattern) : text_(text), pattern_(pattern) {}

  bool match() {
    if (match_run() != Outcome::matched) return false;
    if (*pattern_ == '\0') return *text_ == '\0';
    text_end_ = text_ + std::strlen(text_);
    // A long text is not gone through in vain.
    const bool is_long = text_end_ - text_ >= 64;
    for (bool look_at_tail = is_long;; look_at_tail = false) {
      if (!pass_star()) return false;
      const std::string_view head = literal_head(pattern_);
      const char after_head = pattern_[head.size()];
      const bool starts_character = !is_continuation(*pattern_);
      if (starts_character && after_head == '\0') return zv::has_tail({text_, text_end_}, head);
      const bool is_literal = starts_character && after_head == '*';
      if (!is_literal)
        if (const size_t characters = rest_length(); characters != 0) return match_rest(characters);
      if (look_at_tail && !ends_with_tail()) return false;
      if (!(is_literal ? match_literal(head) : match_after_star())) return false;
    }
  }

 private:
  // Passes over stars and question marks, and in the text over a character for each of the latter;
  // false when it has too few.
  bool pass_star() {
    for (; *pattern_ == '*' || *pattern_ == '?'; ++pattern_) {
      if (*pattern_ == '*') continue;
      if (text_ == text_end_) return false;
      text_ += decode(text_).length;
    }
    return true;
  }

  // How many characters the rest of the pattern takes; 0 where no one number is known: it holds a
  // star, a part of a character, or a set without its bracket.
  size_t rest_length() const {
    size_t characters = 0;
    for (const char* p = pattern_;; ++characters) {
      for (; !is_special(*p); ++characters) {
        const int length = decode(p).length;
        if (length == 1 && !is_ascii(*p)) return 0;
        p += length;
      }
      if (*p == '\0') return characters;
      if (*p == '*') return 0;
      if (*p == '[') {
        const Set set(p);
        if (!set.closed()) return 0;
        p = set.end();
      } else {
        if (*p == '\\' && p[1] != '\0') ++p;
        if (!is_ascii(*p++)) return 0;
      }
    }
  }

  // A text that does not end like the pattern cannot match.
  bool ends_with_tail() const { return zv::has_tail({text_, text_end_}, literal_tail(pattern_)); }

  // The last run must end where the text does. Where each part of it takes one character, that
  // leaves one place for it.
  bool match_rest(size_t characters) {
    if (characters > static_cast<size_t>(text_end_ - text_)) return false;
    const char* start = text_end_ - characters;
    if (!std::all_of(start, text_end_, is_ascii)) start = rest_start(characters);
    if (start == nullptr) return false;
    text_ = start;
    return match_run() == Outcome::matched && text_ == text_end_;
  }

  // Where so many characters begin that end with the text; nullptr when there are fewer.
  const char* rest_start(size_t characters) const {
    const char* start = text_end_;
    for (; characters != 0 && start != text_; --characters) start = character_before(start, text_);
    return characters == 0 ? start : nullptr;
  }

  // Matches the pattern up to its next star, or to its end, from here on.
  Outcome match_run() {
    for (;;) {
      for (; !is_special(*pattern_); ++text_, ++pattern_)
        if (*text_ != *pattern_) return *text_ == '\0' ? Outcome::given_up : Outcome::differs;
      if (*pattern_ == '*' || *pattern_ == '\0') return Outcome::matched;
      if (*text_ == '\0') return Outcome::given_up;
      const Outcome outcome = match_special();
      if (outcome != Outcome::matched) return outcome;
    }
  }

  Outcome match_special() {
    if (*pattern_ == '?') return match_any();
    if (*pattern_ == '[') return match_set();
    return match_byte();
  }

  Outcome match_any() {
    text_ += decode(text_).length;
    ++pattern_;
    return Outcome::matched;
  }

  // A `\` at the very end leaves the NUL to compare with, which no byte of a text equals.
  Outcome match_byte() {
    if (*pattern_ == '\\') ++pattern_;
    if (*text_ != *pattern_) return Outcome::differs;
    ++text_;
    ++pattern_;
    return Outcome::matched;
  }

  Outcome match_set() {
    const Set set(pattern_);
    if (!set.closed()) return Outcome::given_up;
    const Character character = decode(text_);
    text_ += character.length;
    pattern_ = set.end();
    return set.takes(character.value) ? Outcome::matched : Outcome::differs;
  }

  bool match_literal(std::string_view run) {
    text_ = zv::find({text_, text_end_}, run);
    if (text_ == nullptr) return false;
    text_ += run.size();
    pattern_ += run.size();
    return true;
  }

  // Finds the first place from here on where the run after a star matches; the last run must also
  // reach the end of the text.
  bool match_after_star() {
    const char* const run = pattern_;
    const std::string_view head = literal_head(run);
    const char* start = text_;
    while ((start = next_start(start, run, head)) != nullptr) {
      text_ = start;
      pattern_ = run;
      const Outcome outcome = match_run();
      if (outcome == Outcome::given_up) return false;
      if (outcome == Outcome::matched && (*pattern_ == '*' || text_ == text_end_)) return true;
      start += decode(start).length;
    }
    return false;
  }

  // The next place from `text` on where a run may match that begins with `head`; nullptr when there
  // is none.
  const char* next_start(const char* text, const char* run, std::string_view head) const {
    if (text == text_end_) return nullptr;
    if (head.empty()) return *run == '[' ? next_in_set(text, Set(run)) : text;
    // Any other byte than a continuation can only be the first of a character.
    if (!is_continuation(*run)) return zv::find({text, text_end_}, head);
    while (text != text_end_ && *text != *run) text += decode(text).length;
    return text != text_end_ ? text : nullptr;
  }

  const char* next_in_set(const char* text, const Set& set) const {
    while (set.closed() && text != text_end_) {
      const Character character = decode(text);
      if (set.takes(character.value)) return text;
      text += character.length;
    }
    return nullptr;
  }

  const char* text_;
  const char* pattern_;
  const char* text_end_ = nullptr;  // measured at the first star
};

// The text after a star, to the pattern's end.
bool ends_with(const char* text, std::string_view tail) {
  const size_t length = std::strlen(text);
  if (length < tail.size()) return false;
  const char* end = text + length;
  for (; !tail.empty(); tail.remove_suffix(1))
    if (*--end != tail.back()) return false;
  return true;
}

}  // namespace

// Literal text up to a star and after it, as most patterns have it, is compared where it has to
// be; the matcher gets the others, from the first character on that is not literal.
int zv_strpat(const char* text, const char* pattern) {
  for (; !is_special(*pattern); ++text, ++pattern)
    if (*text != *pattern) return 0;
  if (*pattern == '\0') return *text == '\0' ? 1 : 0;
  if (*pattern == '*') {
    const std::string_view tail = literal_head(pattern + 1);
    const bool is_last = pattern[1 + tail.size()] == '\0';
    if (is_last && !is_continuation(pattern[1])) return ends_with(text, tail) ? 1 : 0;
  }
  return Matcher(text, pattern).match() ? 1 : 0;
}
