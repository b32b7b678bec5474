// Resolves references against the location that they came from.
#include "transfer/redirect.h"

#include "frame/text_view.h"

namespace zv {

namespace {

constexpr size_t none = std::string_view::npos;

// Takes "." and ".." out of a path that begins with "/", in place; gives its new length.
size_t remove_dots(char* path, size_t size) {
  const std::string_view text(path, size);
  size_t out = 0;
  for (size_t at = 0; at < size;) {
    const size_t next = std::min(text.find('/', at + 1), size);
    const std::string_view piece = part(text, at + 1, next);
    const bool is_last = next == size;
    if (piece == "..") {
      while (out > 0 && path[--out] != '/') {
      }
    } else if (piece != ".") {
      for (size_t i = at; i < next; ++i) path[out++] = path[i];
    }
    if (is_last && (piece == "." || piece == "..")) path[out++] = '/';
    at = next;
  }
  return out;
}

// The scheme of a reference, "" for a relative one.
std::string_view scheme_of(std::string_view reference) {
  const size_t end = reference.find_first_of(":/?#");
  return end != none && reference[end] == ':' ? part(reference, 0, end) : "";
}

// What comes after the authority: a path without dots, and the query. An empty path is "/".
bool join(std::string_view front, std::string_view folder, std::string_view rest, HeapText& out) {
  const size_t query = std::min(rest.find_first_of("?#"), rest.size());
  HeapText path;
  if (!path.assign({folder, part(rest, 0, query)})) return false;
  path.edit_shrinking(remove_dots);
  return out.assign({front, path.empty() ? "/" : path.view(), part(rest, query)});
}

}  // namespace

bool resolve_reference(const RunLocation& base, std::string_view reference, HeapText& out) {
  const HostAndPort server = host_and_port(base);
  LineBuffer front;
  (void)(front.append(scheme_of(base)) && front.append("://") && front.append(server.view()));
  const std::string_view path = part(base.path.view(), 0, base.path.view().find_first_of("?#"));

  const std::string_view scheme = scheme_of(reference);
  std::string_view rest = part(reference, scheme.empty() ? 0 : scheme.size() + 1);
  if (has_front(rest, "//")) {
    // The last "@" before the path ends a login, which is not for us.
    const size_t end = std::min(rest.find_first_of("/?#", 2), rest.size());
    const size_t at = part(rest, 0, end).rfind('@');
    const std::string_view host = part(rest, at == none ? 2 : at + 1, end);
    LineBuffer other;
    if (!other.append(scheme.empty() ? scheme_of(base) : scheme) || !other.append("://") ||
        !other.append(host))
      return out.assign({scheme, "://"});
    return join(other.view(), "", part(rest, end), out);
  }
  if (!scheme.empty()) return out.assign(reference);
  if (rest.empty() || rest[0] == '#') return out.assign({front.view(), base.path.view()});
  if (rest[0] == '?') return out.assign({front.view(), path, rest});
  if (rest[0] == '/') return join(front.view(), "", rest, out);
  return join(front.view(), part(path, 0, path.rfind('/') + 1), rest, out);
}

}  // namespace zv
