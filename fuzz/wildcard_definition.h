// What a wildcard match is, written out: recursive, with its rule for giving up; and texts with
// patterns that often match them. Tests and fuzzing hold the matcher against it.
#ifndef ZARVO_FUZZ_WILDCARD_DEFINITION_H
#define ZARVO_FUZZ_WILDCARD_DEFINITION_H

#include <cstddef>
#include <cstring>
#include <iterator>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

class WildcardDefinition {
 public:
  static bool matches(const std::string& text, const std::string& pattern) {
    if (pattern == "*") return true;
    const char* const p = pattern.c_str();
    return match(text.c_str(), p, p + pattern.size() - 1) == Outcome::yes;
  }

 private:
  enum class Outcome { yes, no, give_up };

  static unsigned long long decode(const char* p, const char* last, const char** next) {
    const auto byte = static_cast<unsigned char>(*p);
    int ones = 0;
    while (ones < 8 && (byte & (0x80 >> ones)) != 0) ++ones;
    *next = p + 1;
    if (ones < 2 || ones > 6) return byte;
    unsigned long long value = byte & ((1U << (7 - ones)) - 1);
    for (int i = 1; i < ones; ++i) {
      if (p + i > last || (static_cast<unsigned char>(p[i]) & 0xC0) != 0x80) return byte;
      value = value * 64 + (static_cast<unsigned char>(p[i]) & 0x3F);
    }
    *next = p + ones;
    return value;
  }

  static const char* step(const char* text) {
    const char* next;
    decode(text, text + std::strlen(text), &next);
    return next;
  }

  static bool belongs(unsigned long long value, const char* first, const char* last) {
    const bool negated = *first == '^';
    if (negated) ++first;
    const char* const start = first;
    bool after_single = false;
    unsigned long long previous = 0;
    while (first <= last) {
      if (*first == '-' && first != start && after_single && first != last) {
        const unsigned long long end = decode(first + 1, last, &first);
        if (previous <= value && value <= end) return !negated;
        after_single = false;
      } else {
        previous = decode(first, last, &first);
        if (previous == value) return !negated;
        after_single = true;
      }
    }
    return negated;
  }

  static Outcome match(const char* text, const char* p, const char* last) {
    if (p > last) return *text == '\0' ? Outcome::yes : Outcome::no;
    for (; p <= last; ++p) {
      if (*text == '\0' && *p != '*') return Outcome::give_up;
      switch (*p) {
        case '*':
          return match_star(text, p, last);
        case '?':
          text = step(text);
          break;
        case '[': {
          const char* close = p + (p[1] == '^' ? 3 : 2);
          if (close > last) return Outcome::give_up;
          while (close <= last && *close != ']') ++close;
          if (close > last) return Outcome::give_up;
          const unsigned long long value = decode(text, text + std::strlen(text), &text);
          if (!belongs(value, p + 1, close - 1)) return Outcome::no;
          p = close;
          break;
        }
        case '\\':
          if (*++p == '\0') return Outcome::give_up;
          [[fallthrough]];
        default:
          if (*text != *p) return Outcome::no;
          ++text;
      }
    }
    return *text == '\0' ? Outcome::yes : Outcome::no;
  }

  static Outcome match_star(const char* text, const char* p, const char* last) {
    while (p <= last && *p == '*') ++p;
    if (p > last) return Outcome::yes;
    if (*p == '[' || *p == '\\' || *p == '?') {
      for (; *text != '\0'; text = step(text)) {
        const Outcome outcome = match(text, p, last);
        if (outcome != Outcome::no) return outcome;
      }
      return Outcome::give_up;
    }
    for (;;) {
      while (*text != '\0' && *text != *p) text = step(text);
      if (*text == '\0') return Outcome::give_up;
      const Outcome outcome = match(++text, p + 1, last);
      if (outcome != Outcome::no) return outcome;
      if (*text == '\0') return Outcome::give_up;
    }
  }
};

// `choose(limit)` gives a number below the limit.
template <class Choose>
class WildcardGenerator {
 public:
  explicit WildcardGenerator(Choose choose) : choose_(std::move(choose)) {
    std::istringstream words(
        "a a b b c - ] ^ [ * ? \\ \xC3\xA9 \xC3\xA0 \xE2\x82\xAC \xC3 \xA9 \x80 \xE2\x82 "
        "\xF8\x88\x80\x80\x81 \xFC\x84\x80\x80\x80\x81 \xFE \xFF");
    for (std::string word; words >> word;) pieces_.push_back(word);
  }

  std::string text(size_t length) {
    std::string made;
    while (length-- > 0) made += pieces_[choose_(pieces_.size())];
    return made;
  }

  // Some of the text's pieces, and wild ones instead of others.
  std::string pattern_for(const std::string& text) {
    std::string made;
    for (size_t at = 0; at < text.size();) {
      const std::string piece = text.substr(at, 1 + choose_(2) * choose_(4));
      const std::string ways[] = {piece,       piece, piece, '\\' + piece, "*",
                                  "*" + piece, "?",   set(), this->text(1)};
      made += ways[choose_(std::size(ways))];
      at += piece.size();
    }
    return choose_(8) == 0 ? made + "*\\"[choose_(2)] : made;
  }

 private:
  std::string set() {
    std::string made = choose_(3) == 0 ? "[^" : "[";
    for (size_t members = 1 + choose_(3); members > 0; --members)
      made += text(1) + (choose_(2) == 0 ? '-' + text(1) : "");
    return choose_(10) == 0 ? made : made + ']';
  }

  Choose choose_;
  std::vector<std::string> pieces_;
};

#endif
