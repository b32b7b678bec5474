// Locations as the tool reads and shows them: a folder as destination, a password in no message.
#include "location_text.h"

#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <stdexcept>
#include <string_view>

#include "zarvo.h"

namespace tool {
namespace {

constexpr std::string_view mark = "://";

// The scheme of a location, in small letters; empty for a local path, of which a single letter in
// front is the drive.
std::string scheme(const std::string& location) {
  std::string name = location.substr(0, std::min(location.find(mark), location.size()));
  if (name.size() < 2 || name.size() == location.size()) return "";
  zv_strlwr(name.data());
  const auto is_part = [](unsigned char ch) {
    return std::isalnum(ch) != 0 || ch == '+' || ch == '-' || ch == '.';
  };
  return std::ranges::all_of(name, is_part) ? name : "";
}

std::string decoded(const std::string& text) {
  std::string result;
  for (size_t i = 0; i < text.size(); ++i) {
    const std::string digits = text[i] == '%' ? text.substr(i + 1, 2) : "";
    if (digits.size() == 2 &&
        digits.find_first_not_of("0123456789ABCDEFabcdef") == std::string::npos) {
      result += static_cast<char>(std::strtol(digits.c_str(), nullptr, 16));
      i += 2;
    } else {
      result += text[i];
    }
  }
  return result;
}

// The local path that a location names; empty where it names none.
std::string local_path(const std::string& location) {
  if (is_network(location)) return "";
  if (scheme(location).empty()) return location;
  const std::string path = decoded(location.substr(std::string_view("file://").size()));
  return path.size() > 2 && path[0] == '/' && path[2] == ':' ? path.substr(1) : path;
}

bool is_folder(const std::string& path) {
  struct _stat64 status = {};
  return zv_stat(path.c_str(), &status) == 0 && (status.st_mode & S_IFMT) == S_IFDIR;
}

// The last piece of a location's path, without what HTTP adds to it.
std::string own_name(const std::string& from) {
  if (!is_network(from)) {
    const std::string path = local_path(from);
    return path.substr(path.find_last_of("/\\") + 1);
  }
  std::string path = from.substr(from.find(mark) + mark.size());
  if (scheme(from).starts_with("http"))
    path.resize(std::min(path.find_first_of("?#"), path.size()));
  const size_t slash = path.rfind('/');
  return slash == std::string::npos ? "" : decoded(path.substr(slash + 1));
}

}  // namespace

bool is_network(const std::string& location) {
  const std::string name = scheme(location);
  return !name.empty() && name != "file";
}

bool is_mail(const std::string& location) {
  return scheme(location).starts_with("smtp");
}

// What stands before the host is a login up to the last `@`. Without one, a port that is no number
// may be the beginning of a password with a slash.
std::string without_logins(const std::string& text) {
  std::string result = text;
  for (size_t at = 0; (at = result.find(mark, at)) != std::string::npos;) {
    at += mark.size();
    const size_t end = std::min(result.find_first_of("/\n", at), result.size());
    const size_t login = result.rfind('@', end);
    const size_t port = result.find(':', at);
    if (login != std::string::npos && login >= at)
      result.erase(at, login + 1 - at);
    else if (result[at] != '[' && port < end &&
             result.find_first_not_of("0123456789", port + 1) < end)
      result.replace(at, std::min(result.find('\n', at), result.size()) - at, "...");
  }
  return result;
}

std::string destination(const std::string& from, const std::string& to) {
  const std::string folder = local_path(to);
  if (folder.empty() || !is_folder(folder)) return to;
  const std::string name = own_name(from);
  const bool is_plain = name.find_first_of(std::string_view("/\\\0", 3)) == std::string::npos;
  if (name.empty() || name == "." || name == ".." || !is_plain)
    throw std::runtime_error(without_logins(from) + " has no name for a file in " + to);
  return folder + '/' + name;
}

}  // namespace tool
