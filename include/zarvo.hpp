/* SPDX-License-Identifier: MIT
 *
 * zarvo for C++17: the functions of zarvo.h with the types of the standard library, and owners for
 * what they hand out. All of it is in this header, and it does nothing that they do not do.
 */
#ifndef ZARVO_HPP
#define ZARVO_HPP

#include <array>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <type_traits>
#include <vector>

#include <zarvo.h>

/**
 * @defgroup cpp C++
 * Owners for what C functions hand out, and strings for what they write to buffers: zarvo.hpp, for
 * C++17, in the namespace `zarvo`.
 *
 * - A function has the name of the C function that it calls, without `zv_`: what it does in detail,
 *   and what threads may do, is told there. What needs no buffer and no owner is called as C has
 *   it, with `text.c_str()`; a text is edited in place by `text.resize(zv_strtrim(text.data()))`.
 * - An owner can be moved and not copied, and gives back what it holds when its life ends. One that
 *   holds nothing, because what it was made for failed, is false when tested; get() is the C object
 *   that it holds. Only such as hold something may be called otherwise.
 * - A failure is a value: false, an empty `std::optional`, an owner that is false. Nothing is
 *   thrown but `std::bad_alloc`, by the standard library.
 * - A path of more than 319 characters, or with a NUL in it, is refused and never cut: the function
 *   fails. Any other text ends at its first NUL.
 *
 * @code{.cpp}
 * const auto folder = zarvo::normalize_path("album\\.\\");
 * if (!folder) return 1;
 * for (const std::string& name : zarvo::Directory(*folder))
 *   if (zv_strpat(name.c_str(), "*.png")) std::puts(name.c_str());  // prints a.png
 * if (zarvo::copy(*folder + "/a.png", "copy.png") != zarvo::Copied::whole) return 1;
 * @endcode
 */

/** The functions and owners for C++: see @ref cpp. */
namespace zarvo {

/** @cond */
namespace detail {

// A path in a buffer that the C functions may work in; false where it is refused.
class Path {
 public:
  explicit Path(std::string_view path)
      : good_(path.size() < buffer_.size() && path.find('\0') == std::string_view::npos) {
    buffer_[good_ ? path.copy(buffer_.data(), path.size()) : 0] = '\0';
  }
  explicit operator bool() const { return good_; }
  char* get() { return buffer_.data(); }

 private:
  std::array<char, ZV_PATH_MAX> buffer_;
  bool good_;
};

// What a function leaves in a path that it edits in place.
template <class Edit>
std::optional<std::string> edited(std::string_view path, Edit edit) {
  Path buffer(path);
  if (!buffer || edit(buffer.get()) == 0) return std::nullopt;
  return std::string(buffer.get());
}

// What a function writes to a sized buffer, which may be the path that it reads.
template <class Fill>
std::optional<std::string> filled(std::string_view path, Fill fill) {
  return edited(path, [&](char* out) { return fill(out, out, std::size_t{ZV_PATH_MAX}); });
}

// A base that was not given has no address, unlike an empty one.
template <class Combine>
std::optional<std::string> combined(std::string_view path, std::string_view base, Combine combine) {
  Path folder(base);
  if (!folder) return std::nullopt;
  return filled(path, [&](const char* from, char* out, std::size_t size) {
    return combine(from, base.data() != nullptr ? folder.get() : nullptr, out, size);
  });
}

template <class Tell>
std::optional<std::string> told(Tell tell) {
  return edited("", [=](char* out) { return tell(out, ZV_PATH_MAX); });
}

inline std::vector<std::string> pieces(const char* sequence) {
  std::vector<std::string> found;
  for (; *sequence != '\0'; sequence += found.back().size() + 1) found.emplace_back(sequence);
  return found;
}

struct GiveBack {
  void operator()(void* block) const { zv_free(block); }
  void operator()(char** list) const { zv_strlist_free(list, -1); }
  void operator()(FILE* stream) const { zv_fclose(stream); }
  void operator()(zv_transfer_t* transfer) const { zv_transfer_destroy(transfer); }
  void operator()(zv_plugin_t** records) const {
    for (zv_plugin_t** at = records; *at != nullptr; ++at) zv_plugin_destroy(*at);
    zv_free(records);
  }
};

struct CloseDirectory {
  void operator()(void* handle) const { zv_dir_close(reinterpret_cast<std::intptr_t>(handle)); }
};

struct CloseLibrary {
  void operator()(void* library) const { zv_dll_close(library); }
};

struct Unload {
  void operator()(zv_plugin_t* record) const { zv_plugin_unload(record); }
};

struct All {
  bool operator()(const char*, const char*) const { return true; }
};

}  // namespace detail
/** @endcond */

/** @addtogroup cpp
 * @{ */

/** What all owners have in common. */
template <class Held, class Deleter = detail::GiveBack>
class Owner {
 public:
  /** Whether it holds anything. */
  explicit operator bool() const { return held_ != nullptr; }
  /** The C object, which stays this owner's. @return NULL when it holds none. */
  Held* get() const { return held_.get(); }
  /** Gives back what it holds. */
  void reset() { held_.reset(); }

 protected:
  /** Holds nothing. */
  Owner() = default;
  /** Takes an object over. @param held the object, or NULL. */
  explicit Owner(Held* held) : held_(held) {}
  std::unique_ptr<Held, Deleter> held_; /**< the object */
};

/** Owns a string list; without one it is an empty list. Sort the entries from begin() to end(). */
class StringList : public Owner<char*> {
 public:
  /** Holds no list. */
  StringList() = default;
  /** Takes a list over. @param list a list of the C interface, or NULL. */
  explicit StringList(char** list)
      : Owner(list), size_(list != nullptr ? zv_strlist_len(list) : 0) {}

  /**
   * Split a text, as zv_strlist(). Holds nothing when memory ran out.
   * @param text      the text, each of whose pieces the separator ends.
   * @param separator the separator; 0 when `text` is a zero-separated sequence.
   */
  StringList(std::string_view text, char separator) {
    char** list = nullptr;
    size_ = zv_strlist(&list, std::string(text).c_str(), separator);
    held_.reset(list);
  }

  /** How many entries. @return their number. */
  std::size_t size() const { return static_cast<std::size_t>(count()); }
  /** Where the entries begin. @return the first one's place. */
  char** begin() const { return get(); }
  /** Where the entries end. @return the place after the last one. */
  char** end() const { return get() + size(); }
  /** An entry. @param at its position, below size(). @return its text. */
  const char* operator[](std::size_t at) const { return get()[at]; }
  /** Copies all entries. @return the copies. */
  std::vector<std::string> strings() const { return {begin(), end()}; }

  /**
   * Insert a copy of a text, as zv_strlist_insert().
   * @param at   its position, at most size().
   * @param text the text.
   * @return false when memory ran out.
   */
  bool insert(std::size_t at, std::string_view text) {
    const int before = count();
    char** list = held_.release();
    const int added =
        zv_strlist_insert(&list, before, static_cast<int>(at), std::string(text).c_str());
    held_.reset(list);
    size_ = before + added;
    return added != 0;
  }

  /** Take an entry out, as zv_strlist_remove(). @param at its position. @return its text. */
  std::string remove(std::size_t at) {
    const std::unique_ptr<char, detail::GiveBack> text(
        zv_strlist_remove(get(), size_--, static_cast<int>(at)));
    return text.get();
  }

  /** Find an entry, as zv_strlist_idx(). @param text its text. @return the first one's position. */
  std::optional<std::size_t> find(std::string_view text) const {
    const int at = *this ? zv_strlist_idx(get(), size_, std::string(text).c_str()) : -1;
    if (at < 0) return std::nullopt;
    return static_cast<std::size_t>(at);
  }

 private:
  int count() const { return *this ? size_ : 0; }
  int size_ = 0;
};

/** @name Paths from paths
 * @{ */
/**
 * Make one path of another. It is in canonical form, which normalize_path() makes.
 * @param path the path.
 * @return what the C function makes of it; nothing where that fails.
 */
inline std::optional<std::string> normalize_path(std::string_view path) {
  return detail::edited(path, zv_normalize_path);
}
inline std::optional<std::string> extract_directory(std::string_view path) {
  return detail::filled(path, zv_extract_directory);
}
inline std::optional<std::string> extract_filename(std::string_view path) {
  return detail::filled(path, zv_extract_filename);
}
inline std::optional<std::string> extract_extension(std::string_view path) {
  return detail::filled(path, zv_extract_extension);
}
inline std::optional<std::string> pathmap_locate(std::string_view path) {
  return detail::edited(path, zv_pathmap_locate);
}
inline std::optional<std::string> path_locate(std::string_view path) {
  return detail::edited(path, zv_path_locate);
}
/** @} */

/** @name Paths and folders
 * @{ */
/**
 * Make a path absolute, or relative to a folder.
 * @param path the path, in canonical form.
 * @param base the folder, in canonical form; without it, the working directory.
 * @return the other path; nothing on failure.
 */
inline std::optional<std::string> absolute(std::string_view path, std::string_view base = {}) {
  return detail::combined(path, base, zv_absolute);
}
inline std::optional<std::string> relative(std::string_view path, std::string_view base = {}) {
  return detail::combined(path, base, zv_relative);
}
/** @} */

/**
 * Split a path into its pieces.
 * @param path the path, in canonical form.
 * @return the pieces, a root first; none for a path that is refused.
 */
inline std::vector<std::string> split_path(std::string_view path) {
  std::array<char, ZV_PATH_MAX + 2> text{};
  if (!detail::Path(path)) return {};
  path.copy(text.data(), path.size());
  zv_split_path(text.data());
  return detail::pieces(text.data());
}

/** List the folders of the search path. @return the folders; false when there are none. */
inline StringList pathlist() {
  char** list = nullptr;
  zv_pathlist(&list);
  return StringList(list);
}

/** @name Host
 * @{ */
/**
 * Tell the user's home folder, the folder for temporary files, the working directory (zv_getcwd()),
 * the user's name, the computer's name.
 * @return the folder or the name; nothing on failure.
 */
inline std::optional<std::string> homedir() {
  return detail::told(zv_homedir);
}
inline std::optional<std::string> tempdir() {
  return detail::told(zv_tempdir);
}
inline std::optional<std::string> working_directory() {
  return detail::told(zv_getcwd);
}
inline std::optional<std::string> username() {
  return detail::told(zv_username);
}
inline std::optional<std::string> hostname() {
  return detail::told(zv_hostname);
}
/** @} */

/** Read a variable of the private environment. @param name the variable. @return its values. */
inline std::vector<std::string> getenv_private(std::string_view name) {
  const std::unique_ptr<char, detail::GiveBack> values(
      zv_getenv_private(std::string(name).c_str()));
  return values ? detail::pieces(values.get()) : std::vector<std::string>();
}

/** Owns a stream. */
class Stream : public Owner<FILE> {
 public:
  /** Holds no stream. */
  Stream() = default;

  /**
   * Open a file as a binary stream, as zv_fopen().
   * @param path the file.
   * @param mode as for `fopen`.
   */
  Stream(std::string_view path, std::string_view mode) {
    if (detail::Path file{path})
      held_.reset(zv_fopen(file.get(), std::string(mode).c_str(), nullptr));
  }

  /**
   * Read elements, as zv_fread().
   * @param elements receives them.
   * @param count    how many.
   * @param swap     whether to reverse the bytes of each.
   * @return how many were read.
   */
  template <class Element>
  std::size_t read(Element* elements, std::size_t count, bool swap = false) {
    static_assert(std::is_trivially_copyable_v<Element>);
    return zv_fread(elements, sizeof(Element), count, get(), swap);
  }

  /**
   * Write elements as they are, as zv_fwrite().
   * @param elements the elements.
   * @param count    how many.
   * @return how many were written.
   */
  template <class Element>
  std::size_t write(const Element* elements, std::size_t count) {
    static_assert(std::is_trivially_copyable_v<Element>);
    return zv_fwrite(const_cast<Element*>(elements), sizeof(Element), count, get(), 0);
  }

  /**
   * Write a text, as zv_fputs().
   * @param text the text.
   * @param crlf whether to write CR LF for each LF.
   * @return false when not all could be written.
   */
  bool write_text(std::string_view text, bool crlf = false) {
    return zv_fputs(std::string(text).c_str(), get(), crlf) == 0;
  }

  /**
   * Read a line of any length, as zv_fgets() in pieces.
   * @return the line without its LF or CR LF; nothing at the end of the file and on failure.
   */
  std::optional<std::string> read_line() {
    std::array<char, 512> piece;
    std::optional<std::string> line;
    while (zv_fgets(piece.data(), static_cast<int>(piece.size()), get(), 0) != nullptr) {
      if (!line) line.emplace();
      // The rest of the buffer is zero, so that a line may hold a NUL itself.
      const std::string_view text(piece.data(), piece.size());
      line->append(text, 0, text.find_last_not_of('\0') + 1);
      if (line->empty() || line->back() != '\n') continue;
      line->pop_back();
      if (!line->empty() && line->back() == '\r') line->pop_back();
      break;
    }
    return line;
  }
};

/**
 * Owns the reading of a folder, for one `for` over the names in it: as zv_dir_readfirst() and
 * zv_dir_readnext(), with the folder itself and its parent left out.
 */
class Directory : public Owner<void, detail::CloseDirectory> {
 public:
  /** @cond */
  struct End {};
  class Iterator {
   public:
    explicit Iterator(Directory& folder) : folder_(folder) {}
    const std::string& operator*() const { return folder_.name_; }
    Iterator& operator++() {
      folder_.read();
      return *this;
    }
    bool operator!=(End) const { return !folder_.name_.empty(); }

   private:
    Directory& folder_;
  };
  /** @endcond */

  /** Starts to read a folder. @param folder the folder; empty means the current one. */
  explicit Directory(std::string_view folder) {
    std::array<char, ZV_PATH_MAX> name{};
    detail::Path path(folder);
    const std::intptr_t handle = path ? zv_dir_readfirst(path.get(), name.data(), name.size()) : -1;
    if (handle != -1) held_.reset(reinterpret_cast<void*>(handle));
    take(name.data());
  }

  /** Where the reading stands. @return what is at the name that was read last. */
  Iterator begin() { return Iterator(*this); }
  /** The end. @return what follows the last name. */
  static End end() { return {}; }

 private:
  void read() {
    std::array<char, ZV_PATH_MAX> name{};
    if (*this) zv_dir_readnext(reinterpret_cast<std::intptr_t>(get()), name.data(), name.size());
    take(name.data());
  }
  void take(const char* name) {
    name_ = name;
    if (name_ == "." || name_ == "..") read();
  }

  std::string name_;  // empty at the end
};

/** What a scan lists. */
enum class Listed {
  names, /**< the names in a folder */
  paths, /**< the same as paths, which begin with the folder's */
  tree   /**< paths, of all folders below it too */
};

/**
 * List what a folder holds. The list is false when the scan fails, and empty for a folder that
 * cannot be read.
 * @param folder the folder; empty means the current one.
 * @param listed what to list.
 * @param filter decides about each entry, called with the texts `folder` and `name`; without it all
 *               are listed. It must not throw, which would end the program.
 * @return the list.
 */
template <class Filter = detail::All>
StringList dir_scan(std::string_view folder, Listed listed, Filter filter = {}) {
  const dir_filter_t call = [](const char* dir, const char* name, void* user) noexcept -> int {
    return static_cast<bool>((*static_cast<Filter*>(user))(dir, name));
  };
  char** list = nullptr;
  if (detail::Path dir{folder})
    zv_dir_scan(dir.get(), &list, call, &filter, listed != Listed::names, listed == Listed::tree);
  return StringList(list);
}

/** Owns a dynamic library. */
class Library : public Owner<void, detail::CloseLibrary> {
 public:
  /** Open a library, as zv_dll_open(). @param path its path, with its extension. */
  explicit Library(std::string_view path) {
    detail::Path file(path);
    void* const library = file ? zv_dll_open(file.get(), 1) : nullptr;
    if (reinterpret_cast<std::intptr_t>(library) != -1) held_.reset(library);
  }

  /**
   * Find a symbol, as zv_dll_getptr(): `library.symbol<int(char*)>("name")`.
   * @param name the symbol's name.
   * @return the symbol; NULL when there is none, or no library.
   */
  template <class Type>
  Type* symbol(const std::string& name) const {
    return *this ? reinterpret_cast<Type*>(zv_dll_getptr(get(), name.c_str(), "")) : nullptr;
  }
};

/** Owns the records of an API's plugins, which end with NULL. */
class Plugins : public Owner<zv_plugin_t*> {
 public:
  /**
   * Find every plugin of an API, as zv_plugin_enumerate().
   * @param api  the name of the API.
   * @param min  the oldest version that the host speaks.
   * @param max  the newest version that the host speaks.
   * @param keep false to unload each plugin at once.
   */
  Plugins(std::string_view api, int min, int max, bool keep = false) {
    zv_plugin_t** records = nullptr;
    zv_plugin_enumerate(&records, std::string(api).c_str(), min, max, keep);
    held_.reset(records);
  }

  /** Find the plugin for a file. @param path the file. @return its record, or NULL. */
  zv_plugin_t* for_file(std::string_view path) const {
    return zv_plugin_get_entry_by_fmt(get(), std::string(path).c_str());
  }
  /** Collect all format entries, as zv_plugin_formats(). @return the entries. */
  StringList formats() const {
    char** list = nullptr;
    zv_plugin_formats(get(), &list);
    return StringList(list);
  }
};

/** Keeps a plugin loaded, from zv_plugin_load() to zv_plugin_unload(). */
class Loaded : public Owner<zv_plugin_t, detail::Unload> {
 public:
  /** Loads a plugin. @param record its record, which must live longer, or NULL. */
  explicit Loaded(zv_plugin_t* record) : Owner(zv_plugin_load(record) != 0 ? record : nullptr) {}
  /** What the plugin offers. @return its `api_entry`, as both agreed on it. */
  template <class Api>
  Api* api() const {
    return static_cast<Api*>(get()->plugin->api_entry);
  }
};

/**
 * Give a file name the extension of a format, unless it has one that the format knows.
 * @param entry the format entry.
 * @param name  the file name.
 * @return the name with an extension; nothing when the entry has no default pattern.
 */
inline std::optional<std::string> fmt_force(std::string_view entry, std::string_view name) {
  std::string text(name);
  text.resize(name.size() + entry.size());
  if (zv_fmt_force(std::string(entry).c_str(), text.data()) == nullptr) return std::nullopt;
  text.resize(std::strlen(text.c_str()));
  return text;
}

/** How a copy ended. */
enum class Copied {
  whole = 0,                                       /**< all of the file has arrived */
  source_failed = ZV_COPY_SOURCE_FAILED,           /**< it failed on its source's side */
  destination_failed = ZV_COPY_DESTINATION_FAILED, /**< it failed on its destination's side */
  running = -1                                     /**< the handle runs already */
};

/** Copy the contents of a file. @param from its place. @param to the other. @return the end. */
[[nodiscard]] inline Copied copy(std::string_view from, std::string_view to) {
  return static_cast<Copied>(zv_copy(std::string(from).c_str(), std::string(to).c_str()));
}

/** Owns the handle of a transfer. */
class Transfer : public Owner<zv_transfer_t> {
 public:
  /** Makes a handle, as zv_transfer_create(). */
  Transfer() : Owner(zv_transfer_create()) {}

  /**
   * Have the runs to come watched, as zv_transfer_watch().
   * @param watch called with the bytes that have moved and those that the file has; false cancels.
   *              It must live as long as the runs, and must not throw, which would end the program.
   * @return false while the handle runs.
   */
  template <class Watch>
  bool watch(Watch& watch) {
    const transfer_watch_t call = [](void* context, std::int64_t done,
                                     std::int64_t total) noexcept -> int {
      return !(*static_cast<Watch*>(context))(done, total);
    };
    return zv_transfer_watch(get(), call, const_cast<void*>(static_cast<const void*>(&watch))) != 0;
  }

  /** Copy, as zv_transfer_run(). @param from the source. @param to the target. @return the end. */
  [[nodiscard]] Copied run(const std::string& from, const std::string& to) {
    return static_cast<Copied>(zv_transfer_run(get(), from.c_str(), to.c_str()));
  }

  /** Why the last run failed, as zv_transfer_reason(). @return one line for a person. */
  std::string reason() const {
    std::string text(std::size_t{1} << 15, '\0');  // nothing in it is that long
    text.resize(zv_transfer_reason(get(), text.data(), text.size()));
    return text;
  }
};

/** @} */
}  // namespace zarvo

#endif
