// The wildcard matcher beside its definition.
#include <fuzzer/FuzzedDataProvider.h>

#include <string>

#include "check.h"
#include "wildcard_definition.h"
#include "zarvo.h"

namespace {

void check(const std::string& text, const std::string& pattern) {
  const bool expected = WildcardDefinition::matches(text, pattern);
  CHECK(zv_strpat(text.c_str(), pattern.c_str()) == (expected ? 1 : 0));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  // The definition takes exponential time where its rule for giving up does not help.
  FuzzedDataProvider provider(data, size);
  const std::string pattern = provider.ConsumeRandomLengthString(24).c_str();
  const std::string text = provider.ConsumeRandomLengthString(40).c_str();
  check(text, pattern);
  WildcardGenerator generate(
      [&](size_t limit) { return provider.ConsumeIntegralInRange<size_t>(0, limit - 1); });
  const std::string made = generate.text(provider.ConsumeIntegralInRange<size_t>(0, 11));
  check(made, generate.pattern_for(made));
  return 0;
}
