// Wildcard patterns.
//
// A pattern is a row of runs with stars between them. A star that is reached ends all doubt about
// the runs before it: whatever the rest of the text can match from a later place, it can match from
// the earliest. So each run is taken at the first place where it matches, only the last star is
// ever tried again, and neither recursion nor heap is needed. Once the text ends before the pattern
// does, or the pattern turns out malformed, no other place can help: the match is given up.
#include <bit>
#include <cstring>
#include <string_view>

#include "zarvo.h"

namespace {

struct Character {
  uint32_t value;
  int length;
};

bool is_continuation(char ch) {
  return (static_cast<unsigned char>(ch) & 0xC0) == 0x80;
}

// The character at `p`, in front of the NUL or bracket that no multi-byte character can run over:
// two to six bytes of UTF-8, of any value, or else the one byte.
Character decode(const char* p) {
  const auto byte = static_cast<unsigned char>(*p);
  const int ones = std::countl_one(byte);
  if (ones < 2 || ones > 6) return {byte, 1};
  uint32_t value = byte & (0x7FU >> ones);
  for (int i = 1; i < ones; ++i) {
    if (!is_continuation(p[i])) return {byte, 1};
    value = value << 6 | (static_cast<unsigned char>(p[i]) & 0x3FU);
  }
  return {value, ones};
}

// Whether a set's members, those between its brackets and behind its ^, hold the character.
bool holds(std::string_view members, uint32_t value) {
  const char* p = members.data();
  const char* const end = p + members.size();
  uint32_t first = 0;
  bool may_start_range = false;
  while (p != end) {
    const bool range = may_start_range && *p == '-' && p + 1 != end;
    if (range) ++p;
    const Character member = decode(p);
    p += member.length;
    if (!range) first = member.value;
    if (first <= value && value <= member.value) return true;
    may_start_range = !range;
  }
  return false;
}

// The end of the literal text that the pattern ends with. A byte of it may stand behind a `\`,
// which changes nothing, or in a set without its bracket, which matches nothing anyway.
const char* literal_tail(std::string_view pattern) {
  return pattern.data() + pattern.find_last_of("*?[]\\") + 1;  // npos + 1 is 0: all of it
}

enum class Outcome { matched, differs, given_up };

class Matcher {
 public:
  Matcher(std::string_view text, std::string_view pattern)
      : text_(text.data()),
        text_end_(text_ + text.size()),
        pattern_(pattern.data()),
        pattern_end_(pattern_ + pattern.size()),
        tail_(literal_tail(pattern)) {}

  bool match() {
    if (!ends_with_tail()) return false;
    if (match_run() != Outcome::matched) return false;
    while (*pattern_ == '*') {
      while (*pattern_ == '*') ++pattern_;
      if (pattern_ == pattern_end_) return true;
      if (pattern_ >= tail_ && !is_continuation(*pattern_))
        return pattern_end_ - pattern_ <= text_end_ - text_;
      if (!match_behind_star()) return false;
    }
    return text_ == text_end_;
  }

 private:
  // A text that does not end like the pattern cannot match.
  bool ends_with_tail() const {
    const auto length = static_cast<size_t>(pattern_end_ - tail_);
    return length <= static_cast<size_t>(text_end_ - text_) &&
           std::memcmp(text_end_ - length, tail_, length) == 0;
  }

  // Matches the pattern up to its next star, or to its end, from here on.
  Outcome match_run() {
    while (pattern_ != pattern_end_ && *pattern_ != '*') {
      if (text_ == text_end_) return Outcome::given_up;
      Outcome outcome;
      switch (*pattern_) {
        case '?':
          outcome = match_any();
          break;
        case '[':
          outcome = match_set();
          break;
        case '\\':
          ++pattern_;
          [[fallthrough]];
        default:
          outcome = match_byte();
      }
      if (outcome != Outcome::matched) return outcome;
    }
    return Outcome::matched;
  }

  Outcome match_any() {
    text_ += decode(text_).length;
    ++pattern_;
    return Outcome::matched;
  }

  // A `\` at the very end leaves the NUL to compare with, which no byte of a text equals.
  Outcome match_byte() {
    if (*text_ != *pattern_) return Outcome::differs;
    ++text_;
    ++pattern_;
    return Outcome::matched;
  }

  Outcome match_set() {
    const bool negated = pattern_[1] == '^';
    const char* const members = pattern_ + (negated ? 2 : 1);
    // The first member may be the bracket itself.
    const char* const close = *members != '\0' ? std::strchr(members + 1, ']') : nullptr;
    if (close == nullptr) return Outcome::given_up;
    const Character character = decode(text_);
    text_ += character.length;
    pattern_ = close + 1;
    return holds({members, close}, character.value) != negated ? Outcome::matched
                                                               : Outcome::differs;
  }

  // Finds the first place from here on where the run behind a star matches; the last run must also
  // reach the end of the text.
  bool match_behind_star() {
    const char* const run = pattern_;
    const char* start = text_;
    while ((start = next_start(start, *run)) != nullptr) {
      text_ = start;
      pattern_ = run;
      const Outcome outcome = match_run();
      if (outcome == Outcome::given_up) return false;
      if (outcome == Outcome::matched && (*pattern_ == '*' || text_ == text_end_)) return true;
      start += decode(start).length;
    }
    return false;
  }

  // The next character that a run with this first element may start at; nullptr when none is left.
  const char* next_start(const char* text, char element) const {
    if (text == text_end_) return nullptr;
    if (element == '[' || element == '?' || element == '\\') return text;
    // Any other byte than a continuation can only be the first of a character.
    if (!is_continuation(element)) return std::strchr(text, element);
    while (text != text_end_ && *text != element) text += decode(text).length;
    return text != text_end_ ? text : nullptr;
  }

  const char* text_;
  const char* text_end_;
  const char* pattern_;
  const char* pattern_end_;
  const char* tail_;
};

}  // namespace

int zv_strpat(const char* text, const char* pattern) {
  return Matcher(text, pattern).match() ? 1 : 0;
}
