// bench_ITEM [OPTION...]: measures one item. Prints every time as JSON and, on standard error, the
// medians and how many times ours they are. Options are Google Benchmark's own, as far as they mean
// something here: --benchmark_repetitions=ROUNDS, --benchmark_filter=REGEX; and --scale=X, which
// multiplies the numbers of files.
#include <apr_general.h>
#include <curl/curl.h>

#include <algorithm>
#include <iostream>
#include <optional>
#include <span>
#include <string>
#include <string_view>

#include "runner.h"

namespace {

// The value behind an option.
std::optional<std::string> value_of(std::string_view word, std::string_view option) {
  if (!word.starts_with(option)) return std::nullopt;
  return std::string(word.substr(option.size()));
}

bench::Settings read_options(int argc, char** argv) {
  bench::Settings settings;
  for (const std::string_view word : std::span(argv, static_cast<size_t>(argc)).subspan(1)) {
    if (const auto rounds = value_of(word, "--benchmark_repetitions="))
      settings.rounds = std::max(1, std::stoi(*rounds));
    if (const auto filter = value_of(word, "--benchmark_filter=")) settings.filter = *filter;
    if (const auto scale = value_of(word, "--scale=")) settings.scale = std::stod(*scale);
  }
  return settings;
}

}  // namespace

int main(int argc, char** argv) {
  apr_initialize();
  curl_global_init(CURL_GLOBAL_ALL);
  bench::Runner runner(read_options(argc, argv));
  bench::measure(runner);
  runner.write_json(std::cout);
  return runner.failed() ? 1 : 0;
}
