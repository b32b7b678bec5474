#include "transfer/location.h"

#include <array>
#include <cctype>
#include <string_view>

#include "transfer/connection.h"
#include "transfer/line.h"
#include "transfer/number.h"

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

int hex_value(char ch) {
  if (ch >= '0' && ch <= '9') return ch - '0';
  if (ch >= 'a' && ch <= 'f') return ch - 'a' + 10;
  if (ch >= 'A' && ch <= 'F') return ch - 'A' + 10;
  return -1;
}

std::string_view between(std::string_view text, size_t begin, size_t end) {
  return {text.data() + begin, end - begin};
}

// What atoi() reads, as long as it is a port.
bool read_port(std::string_view text, unsigned& port) {
  int number = 0;
  take_number(text, number);
  port = static_cast<unsigned>(number);
  return number >= 0 && number <= 65535;
}

// "user:password"; without a password's colon all of it is the user.
bool split_credentials(std::string_view text, size_t colon, location_t& location) {
  const bool has_password = colon != std::string_view::npos;
  const size_t user_end = has_password ? colon : text.size();
  const size_t password_begin = has_password ? colon + 1 : text.size();
  return location.user.assign(between(text, 0, user_end)) &&
         location.password.assign(between(text, password_begin, text.size()));
}

bool parse_network(location_t& location) {
  if (!split_authority(location)) return false;
  location.path.edit_shrinking(percent_decode);
  return !holds_line_end(location.path.view()) && !holds_line_end(location.user.view()) &&
         !holds_line_end(location.password.view());
}

// "/D|/dir" and "/D:/dir" are how a path with a drive stands behind "file://".
void uncover_drive(char* path) {
  if (path[0] != '/' || !is_letter(path[1]) || (path[2] != ':' && path[2] != '|')) return;
  path[2] = ':';
  zv_strlshift(path, 1);
}

bool parse_local(location_t& location, bool is_url) {
  location.addr = {};
  location.user.clear();
  location.password.clear();
  location.path.replace('\\', '/');
  if (is_url) {
    location.path.edit_shrinking(percent_decode);
    location.path.edit_shrinking(uncover_drive);
  }
  return true;
}

}  // namespace

LocationKind parse_location(const char* text, location_t& location) {
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

bool split_authority(location_t& location) {
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
  if (has_port && !read_port(between(authority, colon + 1, authority.size()), location.port))
    return false;

  // Credentials divide at their first colon when a port follows, else at their last.
  const std::string_view credentials = between(authority, 0, has_user ? at : 0);
  const size_t divide = has_port ? credentials.find(':') : credentials.rfind(':');
  PathBuffer host;
  return split_credentials(credentials, divide, location) &&
         host.assign(
             between(authority, has_user ? at + 1 : 0, has_port ? colon : authority.size())) &&
         resolve_host(host.c_str(), location.addr);
}

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

void percent_decode(char* text) {
  char* out = text;
  for (const char* in = text; *in != '\0'; ++in, ++out) {
    const int high = *in == '%' ? hex_value(in[1]) : -1;
    const int low = high >= 0 ? hex_value(in[2]) : -1;
    *out = low >= 0 ? static_cast<char>(high * 16 + low) : *in;
    if (low >= 0) in += 2;
  }
  *out = '\0';
}

}  // namespace zv
