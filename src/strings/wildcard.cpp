// Wildcard patterns.
//
// A pattern is a row of runs with stars between them. What follows a star either matches or makes
// the match hopeless: a run that merely differs is tried again from the star's next place. So once
// a run has matched up to a further star, the stars before it are settled, only the last one is
// ever tried again, and neither recursion nor heap is needed. The match is given up as hopeless
// once the text ends before the pattern does, or the pattern turns out malformed.
#include <bit>
#include <cstring>
#include <string_view>

#include "strings/search.h"
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
  if (byte < 0xC0) return {byte, 1};
  const int ones = std::countl_one(byte);
  if (ones > 6) return {byte, 1};
  uint32_t value = byte & (0x7FU >> ones);
  for (int i = 1; i < ones; ++i) {
    if (!is_continuation(p[i])) return {byte, 1};
    value = value << 6 | (static_cast<unsigned char>(p[i]) & 0x3FU);
  }
  return {value, ones};
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
    uint32_t first = 0;
    bool may_start_range = false;
    for (const char* p = members_; p != close_;) {
      const bool range = may_start_range && *p == '-' && p + 1 != close_;
      if (range) ++p;
      const Character member = decode(p);
      p += member.length;
      if (!range) first = member.value;
      if (first <= value && value <= member.value) return true;
      may_start_range = !range;
    }
    return false;
  }

  bool negated_;
  const char* members_;
  const char* close_ = nullptr;
};

// The literal text that a pattern begins with.
std::string_view literal_head(const char* pattern) {
  return {pattern, std::strcspn(pattern, "*?[\\")};
}

// The start of the literal text that a pattern ends with. A byte of it may stand behind a `\`,
// which changes nothing, or in a set without its bracket, which matches nothing anyway.
const char* literal_tail(const char* pattern, const char* end) {
  const auto is_special = [](char ch) {
    return ch == '*' || ch == '?' || ch == '[' || ch == ']' || ch == '\\';
  };
  while (end != pattern && !is_special(end[-1])) --end;
  return end;
}

enum class Outcome { matched, differs, given_up };

class Matcher {
 public:
  Matcher(std::string_view text, std::string_view pattern)
      : text_(text.data()),
        text_end_(text_ + text.size()),
        pattern_(pattern.data()),
        pattern_end_(pattern_ + pattern.size()),
        tail_(literal_tail(pattern_, pattern_end_)) {}

  bool match() {
    if (!ends_with_tail()) return false;
    if (tail_ == pattern_) return pattern_end_ - pattern_ == text_end_ - text_;
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
    const Set set(pattern_);
    if (!set.closed()) return Outcome::given_up;
    const Character character = decode(text_);
    text_ += character.length;
    pattern_ = set.end();
    return set.takes(character.value) ? Outcome::matched : Outcome::differs;
  }

  // Finds the first place from here on where the run behind a star matches; the last run must also
  // reach the end of the text.
  bool match_behind_star() {
    const char* const run = pattern_;
    const char* start = text_;
    while ((start = next_start(start, run)) != nullptr) {
      text_ = start;
      pattern_ = run;
      const Outcome outcome = match_run();
      if (outcome == Outcome::given_up) return false;
      if (outcome == Outcome::matched && (*pattern_ == '*' || text_ == text_end_)) return true;
      start += decode(start).length;
    }
    return false;
  }

  // The next place from `text` on where the beginning of a run matches; nullptr when there is none.
  const char* next_start(const char* text, const char* run) const {
    if (text == text_end_) return nullptr;
    if (*run == '?' || *run == '\\') return text;
    if (*run == '[') return next_in_set(text, Set(run));
    // Any other byte than a continuation can only be the first of a character.
    if (!is_continuation(*run)) return zv::find({text, text_end_}, literal_head(run));
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
  const char* text_end_;
  const char* pattern_;
  const char* pattern_end_;
  const char* tail_;
};

}  // namespace

int zv_strpat(const char* text, const char* pattern) {
  return Matcher(text, pattern).match() ? 1 : 0;
}
