// Takes the locations of a run apart.
#include "transfer/run_location.h"

#include <cctype>
#include <charconv>

#include "frame/text_view.h"
#include "transfer/line.h"
#include "transfer/local_path.h"
#include "transfer/percent.h"
#include "transfer/result.h"

namespace zv {

namespace {

constexpr size_t none = std::string_view::npos;
constexpr size_t longest_text = 8192;

struct Scheme {
  std::string_view name;
  LocationKind kind;
  bool is_encrypted;
  unsigned port;
};

constexpr Scheme schemes[] = {{"file", LOC_FILE, false, 0},   {"ftp", LOC_FTP, false, 21},
                              {"ftps", LOC_FTP, true, 990},   {"http", LOC_HTTP, false, 80},
                              {"https", LOC_HTTP, true, 443}, {"smtp", LOC_SMTP, false, 25},
                              {"smtps", LOC_SMTP, true, 465}};

const Scheme& scheme_in_table(const RunLocation& location) {
  const auto is_its = [&](const Scheme& scheme) {
    return scheme.kind == location.kind && scheme.is_encrypted == location.is_encrypted;
  };
  return *std::ranges::find_if(schemes, is_its);
}

bool is_letter(char ch) {
  return (ch >= 'a' && ch <= 'z') || (ch >= 'A' && ch <= 'Z');
}

bool is_digit(char ch) {
  return ch >= '0' && ch <= '9';
}

// What stands before "://"; "" for a plain path. A single letter is a drive.
std::string_view scheme_of(std::string_view text) {
  size_t size = 0;
  while (size < text.size() && (is_letter(text[size]) || is_digit(text[size]) ||
                                std::string_view("+-.").find(text[size]) != none))
    ++size;
  const bool is_scheme = size >= 2 && is_letter(text[0]) && part(text, size, size + 3) == "://";
  return part(text, 0, is_scheme ? size : 0);
}

// One location's parsing: what is wrong with it fails the run.
class Parser {
 public:
  Parser(Run& run, int code, RunLocation& location) : run_(run), code_(code), location_(location) {}

  bool parse(std::string_view text);

 private:
  bool refuse(Words why);
  bool out_of_memory();
  bool take_local(std::string_view text, bool is_url);
  bool take_network(std::string_view text);
  bool take_login(std::string_view text, bool has_port);
  bool take_host(std::string_view text);
  bool take_port(std::string_view text);
  bool take_decoded(std::string_view text, HeapText& out);

  Run& run_;
  int code_;
  RunLocation& location_;
};

bool Parser::refuse(Words why) {
  LineBuffer reason;
  for (const std::string_view word : why)
    if (!reason.append(word)) break;
  const std::string_view side = code_ == source_failed ? "source: " : "destination: ";
  run_.fail(code_, ZV_CAUSE_LOCATION, 0, {side, reason.view()});
  return false;
}

bool Parser::out_of_memory() {
  run_.fail(code_, ZV_CAUSE_MEMORY, 0, {"out of memory"});
  return false;
}

bool Parser::parse(std::string_view text) {
  location_.kind = LOC_NONE;
  location_.is_six = location_.is_encrypted = false;
  if (text.empty()) return refuse({"no location"});
  if (text.size() > longest_text) return refuse({"longer than 8192 characters"});
  const std::string_view name = scheme_of(text);
  if (name.empty()) return take_local(text, false);
  for (const Scheme& scheme : schemes) {
    if (scheme.name.size() != name.size() ||
        zv_strnicmp(scheme.name.data(), name.data(), name.size()) != 0)
      continue;
    location_.kind = scheme.kind;
    location_.is_encrypted = scheme.is_encrypted;
    location_.port = scheme.port;
    const std::string_view rest = part(text, name.size() + 3);
    return scheme.kind == LOC_FILE ? take_local(rest, true) : take_network(rest);
  }
  return refuse({name, ":// is not spoken"});
}

bool Parser::take_local(std::string_view text, bool is_url) {
  location_.kind = LOC_FILE;
  HeapText decoded;
  if (is_url && !take_decoded(text, decoded)) return false;
  if (!location_.local.assign(text)) return refuse({"a local path is longer than 319 characters"});
  take_local_path(location_.local, is_url);
  return !location_.local.empty() || refuse({"no path"});
}

// "[user[:password]@]host[:port]/path"
bool Parser::take_network(std::string_view text) {
  if (holds_line_end(text)) return refuse({"a line end"});
  const size_t slash = text.find('/');
  if (slash == none) return refuse({"no path after the host"});
  const std::string_view authority = part(text, 0, slash);
  std::string_view path = part(text, slash);
  if (location_.kind == LOC_HTTP) path = part(path, 0, path.find('#'));

  const size_t at = authority.rfind('@');
  const std::string_view server = part(authority, at == none ? 0 : at + 1);
  const size_t bracket = server.rfind(']');
  const size_t colon = server.find(':', bracket == none ? 0 : bracket);
  return take_login(part(authority, 0, at == none ? 0 : at), colon != none) &&
         take_host(part(server, 0, colon)) &&
         (colon == none || take_port(part(server, colon + 1))) &&
         take_decoded(path, location_.path) &&
         (location_.kind != LOC_HTTP || location_.path.assign(path) || out_of_memory());
}

// Divided at its first colon when a port follows, else at its last.
bool Parser::take_login(std::string_view text, bool has_port) {
  const size_t colon = has_port ? text.find(':') : text.rfind(':');
  return take_decoded(part(text, 0, colon), location_.user) &&
         take_decoded(part(text, colon == none ? none : colon + 1), location_.password);
}

bool Parser::take_host(std::string_view text) {
  const bool bracketed = text.starts_with('[') && text.ends_with(']');
  if (bracketed) {
    platform::HostAddress address;
    HeapText zone;  // "%25" begins the name of the link that the address holds on
    if (!take_decoded(part(text, 1, text.size() - 1), zone)) return false;
    location_.is_six = true;
    const bool good =
        location_.host.assign(zone.view()) && platform::read_address_six(zone.c_str(), address);
    return good || refuse({"no IPv6 address between the brackets"});
  }
  constexpr std::string_view never = " \t\"%:<>[]\\^`{|}?#@";
  const bool usable = !text.empty() && text.find_first_of(never) == none;
  return (usable && location_.host.assign(text)) || refuse({"no usable host"});
}

bool Parser::take_port(std::string_view text) {
  if (text.empty()) return true;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), location_.port);
  const bool good = error == std::errc() && end == text.data() + text.size();
  return (good && location_.port >= 1 && location_.port <= 65535) || refuse({"no usable port"});
}

// Without its escapes. None may stand for a NUL, or for a line end outside a local file's name.
bool Parser::take_decoded(std::string_view text, HeapText& out) {
  if (!out.assign(text)) return out_of_memory();
  out.edit_shrinking(percent_decode);
  if (out.view().find('\0') != none) return refuse({"a %00"});
  return location_.kind == LOC_FILE || !holds_line_end(out.view()) || refuse({"a line end"});
}

}  // namespace

bool parse_run_location(Run& run, int code, const char* text, RunLocation& location) {
  return Parser(run, code, location).parse(text != nullptr ? text : "");
}

HostAndPort host_and_port(const RunLocation& location) {
  HostAndPort text;
  std::array<char, 8> digits;
  const auto* const end =
      std::to_chars(digits.data(), digits.data() + digits.size(), location.port).ptr;
  const std::string_view port(digits.data(), static_cast<size_t>(end - digits.data()));
  const bool six = location.is_six;
  (void)(text.append(six ? "[" : "") && text.append(location.host.view()) &&
         text.append(six ? "]:" : ":") && text.append(port));
  return text;
}

std::string_view scheme_of(const RunLocation& location) {
  return scheme_in_table(location).name;
}

unsigned default_port(const RunLocation& location) {
  return scheme_in_table(location).port;
}

bool is_same_server(const RunLocation& a, const RunLocation& b) {
  return a.kind == b.kind && a.is_encrypted == b.is_encrypted && a.port == b.port &&
         zv_stricmp(a.host.c_str(), b.host.c_str()) == 0;
}

}  // namespace zv
