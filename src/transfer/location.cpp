// Takes location texts apart.
#include "transfer/location.h"

#include <array>
#include <cctype>
#include <string_view>

#include "frame/text_view.h"
#include "transfer/line.h"
#include "transfer/local_path.h"
#include "transfer/network.h"
#include "transfer/number.h"
#include "transfer/percent.h"

namespace zv {

namespace {

struct Scheme {
  std::string_view prefix;
  LocationKind kind;
  unsigned port;
};

constexpr Scheme schemes[] = {{"smtp://", LOC_SMTP, 25},
                              {"http://", LOC_HTTP, 80},
                              {"ftp://", LOC_FTP, 21},
                              {"file://", LOC_FILE, 0}};
constexpr Scheme plain_path = {"", LOC_FILE, 0};

const Scheme& scheme_of(const char* text) {
  for (const Scheme& scheme : schemes)
    if (zv_strnicmp(text, scheme.prefix.data(), scheme.prefix.size()) == 0) return scheme;
  return plain_path;
}

bool is_letter(char ch) {
  return std::isalpha(static_cast<unsigned char>(ch)) != 0;
}

// What atoi() reads, as long as it is a port.
bool read_port(std::string_view text, unsigned& port) {
  int number = 0;
  take_number(text, number);
  port = static_cast<unsigned>(number);
  return number >= 0 && number <= 65535;
}

// "user:password"; without a password's colon all of it is the user.
bool split_credentials(std::string_view text, size_t colon, Location& location) {
  const bool has_password = colon != std::string_view::npos;
  const size_t user_end = has_password ? colon : text.size();
  const size_t password_begin = has_password ? colon + 1 : text.size();
  return location.user.assign(part(text, 0, user_end)) &&
         location.password.assign(part(text, password_begin, text.size()));
}

// A name is looked up, four decimal numbers are taken as they stand.
bool resolve_host(const char* host, platform::Address& address) {
  if (is_letter(*host)) {
    const NetworkGuard network;
    return network.started() && platform::resolve_name(host, address);
  }
  std::string_view text = host;
  std::array<int, 4> numbers;
  if (text.starts_with('-') || text.starts_with('+')) return false;
  if (!take_numbers(text, '.', numbers)) return false;
  for (size_t i = 0; i < numbers.size(); ++i)
    address.bytes[i] = static_cast<unsigned char>(numbers[i]);
  return true;
}

// Takes "[user[:password]@]host[:port]" off the front of the location's path and stores its parts;
// a port that the text does not name stays as it was. False leaves the location undefined.
bool split_authority(Location& location) {
  constexpr size_t none = std::string_view::npos;
  const size_t slash = location.path.view().find('/');
  if (slash == none) return false;
  PathBuffer text = location.path;
  text.shorten(slash);
  location.path.edit_shrinking([slash](char* path) { zv_strlshift(path, slash); });

  const std::string_view authority = text.view();
  const size_t at = authority.rfind('@');
  const size_t colon = authority.rfind(':');
  const bool has_user = at != none;
  const bool has_port = colon != none && (!has_user || colon > at);
  if (has_port && !read_port(part(authority, colon + 1, authority.size()), location.port))
    return false;

  // Credentials divide at their first colon when a port follows, else at their last.
  const std::string_view credentials = part(authority, 0, has_user ? at : 0);
  const size_t divide = has_port ? credentials.find(':') : credentials.rfind(':');
  PathBuffer host;
  return split_credentials(credentials, divide, location) &&
         host.assign(part(authority, has_user ? at + 1 : 0, has_port ? colon : authority.size())) &&
         resolve_host(host.c_str(), location.addr);
}

bool parse_network(Location& location) {
  if (!split_authority(location)) return false;
  const size_t size = location.path.size();
  location.path.edit_shrinking([size](char* path) { percent_decode(path, size); });
  return !holds_line_end(location.path.view()) && !holds_line_end(location.user.view()) &&
         !holds_line_end(location.password.view());
}

bool parse_local(Location& location, bool is_url) {
  location.addr = {};
  location.user.clear();
  location.password.clear();
  take_local_path(location.path, is_url);
  return true;
}

}  // namespace

LocationKind parse_location(const char* text, Location& location) {
  location.kind = LOC_NONE;
  if (text == nullptr || *text == '\0') return LOC_NONE;

  const Scheme& scheme = scheme_of(text);
  const bool whole = location.path.assign_cut(text + scheme.prefix.size());
  if (!whole || location.path.size() == PathBuffer::capacity) return LOC_NONE;

  location.port = scheme.port;
  const bool usable = scheme.kind == LOC_FILE ? parse_local(location, &scheme != &plain_path)
                                              : parse_network(location);
  if (usable) location.kind = scheme.kind;
  return location.kind;
}

}  // namespace zv
