// Variants are looked up in a sorted index, so that a full folder costs no walk for each name.
#include "plugin/candidates.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>

#include "frame/owner.h"
#include "frame/text_buffer.h"
#include "zarvo.h"

namespace zv {

namespace {

struct Candidate {
  char* name;
  bool dropped;
};

struct ByName {
  bool operator()(const Candidate* a, const Candidate* b) const { return less(a->name, b->name); }
  bool operator()(const Candidate* a, const char* b) const { return less(a->name, b); }
  bool operator()(const char* a, const Candidate* b) const { return less(a, b->name); }
  static bool less(const char* a, const char* b) { return zv_stricmp(a, b) < 0; }
};

using VariantName = TextBuffer<ZV_PATH_MAX + 1>;

bool variant_of(const char* name, VariantName& variant) {
  const char* const dot = std::strrchr(name, '.');
  return dot != nullptr && variant.assign({name, dot}) && variant.append('d') &&
         variant.append(dot);
}

// Frees the dropped names and closes the gaps.
int compact(const Candidate* candidates, int n, char** names) {
  int kept = 0;
  for (int i = 0; i < n; ++i) {
    if (candidates[i].dropped)
      zv_free(candidates[i].name);
    else
      names[kept++] = candidates[i].name;
  }
  names[kept] = nullptr;
  return kept;
}

}  // namespace

int drop_variants(char** names, int n) {
  const auto count = static_cast<size_t>(n);
  const HeapPtr<Candidate[]> candidates(
      static_cast<Candidate*>(std::calloc(count + 1, sizeof(Candidate))));
  const HeapPtr<Candidate*[]> sorted(
      static_cast<Candidate**>(std::calloc(count + 1, sizeof(Candidate*))));
  if (candidates == nullptr || sorted == nullptr) return -1;
  for (size_t i = 0; i < count; ++i) {
    candidates[i].name = names[i];
    sorted[i] = &candidates[i];
  }
  Candidate** const end = sorted.get() + count;
  std::sort(sorted.get(), end, ByName());

  // A name that an earlier one has dropped drops nothing itself.
  VariantName variant;
  for (size_t i = 0; i < count; ++i) {
    if (candidates[i].dropped || !variant_of(candidates[i].name, variant)) continue;
    const auto [first, last] = std::equal_range(sorted.get(), end, variant.c_str(), ByName());
    std::for_each(first, last, [](Candidate* candidate) { candidate->dropped = true; });
  }
  return compact(candidates.get(), n, names);
}

}  // namespace zv
