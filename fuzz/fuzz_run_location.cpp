// Locations of a run, and redirects from them: what is accepted is bounded and adds no line to a
// dialogue, and what a redirect means is a location again or refused.
#include <netdb.h>

#include <string>

#include "check.h"
#include "transfer/redirect.h"
#include "transfer/run_location.h"

extern "C" int __wrap_getaddrinfo(const char*, const char*, const addrinfo*, addrinfo**) {
  return EAI_NONAME;
}

namespace {

bool parse(const std::string& text, zv::RunLocation& location) {
  zv::Signals signals;
  zv::Run run(zv::Options(), zv::Watch(), signals);
  const bool good = zv::parse_run_location(run, -3, text.c_str(), location);
  CHECK(good != run.failed());
  return good;
}

void check(const zv::RunLocation& location) {
  const auto has = [](const zv::HeapText& text, std::string_view signs) {
    return text.view().find_first_of(signs) != std::string_view::npos;
  };
  CHECK(location.port >= 1 && location.port <= 65535);
  CHECK(!location.host.empty());
  CHECK(location.path.view().starts_with('/') && location.path.view().size() <= 8192);
  for (const zv::HeapText* text : {&location.path, &location.user, &location.password})
    CHECK(!has(*text, {"\r\n\0", 3}));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const std::string text(reinterpret_cast<const char*>(data), size);
  const size_t blank = text.find(' ');
  zv::RunLocation location;
  if (!parse(text.substr(0, blank), location) || !location.is_network()) return 0;
  check(location);
  if (blank == std::string::npos || location.kind != zv::LOC_HTTP) return 0;

  zv::HeapText target;
  zv::RunLocation next;
  CHECK(zv::resolve_reference(location, text.substr(blank + 1), target));
  if (parse(target.c_str(), next) && next.is_network()) check(next);
  return 0;
}
