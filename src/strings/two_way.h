// Two-way search, whose time is linear whatever the texts are, and which needs no memory.
//
// The needle is cut where it repeats itself the least: whatever its right part has matched before
// it fails, the next place worth a look lies beyond that. Only when all of the right part has
// matched is the left one compared, and the needle then moves by its period. (M. Crochemore,
// D. Perrin: Two-way string-matching, Journal of the ACM 38, 1991.)
#ifndef ZARVO_STRINGS_TWO_WAY_H
#define ZARVO_STRINGS_TWO_WAY_H

#include <algorithm>
#include <cstddef>
#include <string_view>

namespace zv {

// The greatest suffix of a text in an order of its characters, and the suffix's period.
struct Suffix {
  size_t start;
  size_t period;
};

template <class Less>
Suffix greatest_suffix(std::string_view text, Less less) {
  Suffix best = {0, 1};
  size_t matched = 0;  // characters that the suffix at `other` has in common with the best one
  for (size_t other = 1; other + matched < text.size();) {
    const char ch = text[other + matched];
    const char best_ch = text[best.start + matched];
    if (less(ch, best_ch)) {
      other += matched + 1;
      matched = 0;
      best.period = other - best.start;
    } else if (less(best_ch, ch)) {
      best = {other++, 1};
      matched = 0;
    } else if (++matched == best.period) {
      other += matched;
      matched = 0;
    }
  }
  return best;
}

// The first place of the needle, which is not empty, in a text that is not shorter; nullptr when
// there is none. Characters are equal that `fold` makes the same of.
template <class Fold>
const char* find_two_way(std::string_view text, std::string_view needle, Fold fold) {
  const auto less = [fold](char a, char b) { return fold(a) < fold(b); };
  const auto greater = [fold](char a, char b) { return fold(a) > fold(b); };
  const auto equal = [fold](char a, char b) { return a == b || fold(a) == fold(b); };
  const Suffix up = greatest_suffix(needle, less);
  const Suffix down = greatest_suffix(needle, greater);
  const auto [cut, period] = up.start > down.start ? up : down;
  const char* const begin = needle.data();
  // Where the left part recurs one period later, the whole needle has that period, and a needle
  // that has moved by it need not be compared again where it overlaps.
  const bool repeats = std::equal(begin, begin + cut, begin + period, equal);
  const size_t step = repeats ? period : std::max(cut, needle.size() - cut) + 1;
  const size_t overlap = repeats ? needle.size() - period : 0;

  const char* place = text.data();
  const char* const last = place + (text.size() - needle.size());
  for (size_t known = 0; place <= last;) {
    size_t i = std::max(cut, known);
    while (i < needle.size() && equal(needle[i], place[i])) ++i;
    if (i < needle.size()) {
      place += i - cut + 1;
      known = 0;
      continue;
    }
    i = cut;
    while (i > known && equal(needle[i - 1], place[i - 1])) --i;
    if (i <= known) return place;
    place += step;
    known = overlap;
  }
  return nullptr;
}

}  // namespace zv

#endif
