// What the library asks of its platform, in the library's own terms. posix/ and windows/ each
// implement it under the same file names; no other folder of the library includes a system header.
#ifndef ZARVO_PLATFORM_PLATFORM_H
#define ZARVO_PLATFORM_PLATFORM_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <ctime>
#include <string_view>

#include "frame/text_buffer.h"
#include "zarvo.h"

namespace zv::platform {

// ---- status.cpp: one path on the file system ----------------------------------------------------

// The path as the platform's calls want it, where a caller may write either separator: `path`
// itself, or a copy in `room`. nullptr when the copy does not fit.
const char* native_path(const char* path, PathBuffer& room);

// 0 or -1, errno as the platform left it. The paths are native ones; status() follows links.
int access(const char* path, int mode);
int status(const char* path, struct _stat64* st);
int make_directory(const char* path);

// The platform's hidden attribute of a path that exists.
bool is_hidden(const char* path);
bool set_hidden(const char* path, bool hidden);  // writes nothing where it is so already

// ---- folders.cpp: folders that the process knows ------------------------------------------------

// As the platform writes them: separators and the trailing one are the caller's to tidy.
bool working_directory(PathBuffer& out, size_t limit);  // `limit`: bytes offered to the platform
bool drive_directory(int drive, PathBuffer& out);       // drive 1 is A
int current_drive();                                    // 0 where there are no drives
bool long_path(const char* path, PathBuffer& out);      // false where it cannot be had
const char* temp_folder();                              // nullptr when none is named
char search_path_separator(const char* search_path);    // between the elements of "PATH"

// ---- host.cpp: the user and the machine ---------------------------------------------------------

bool user_name(TextBuffer<257>& out);
bool host_name(TextBuffer<16>& out);
bool home_folder(PathBuffer& out);  // as the platform writes it

// ---- heap.cpp: blocks of the C heap -------------------------------------------------------------

// How many bytes a block has room for, at least what was asked for; 0 for nullptr.
size_t block_size(void* block);

// ---- letter_case.cpp: case in the current locale, byte by byte ----------------------------------

// What tolower() or toupper() makes of each byte: the platform's own table, or `room` filled.
using ByteMap = std::array<int32_t, 256>;
const int32_t* lower_map(ByteMap& room);
const int32_t* upper_map(ByteMap& room);

// The order of two texts, or of their first `n` bytes: unsigned, after tolower().
int compare_without_case(const char* a, const char* b);
int compare_without_case(const char* a, const char* b, size_t n);

// ---- clock.cpp: local time ----------------------------------------------------------------------

// The time now on the local clock, and its offset from UTC at that moment.
bool local_time(struct tm& out, int& offset_minutes);

// ---- processor.cpp: what the machine can do -----------------------------------------------------

bool has_wide_vectors();  // AVX2

// ---- temporary.cpp: a folder of one's own for a short time --------------------------------------

// Makes a folder that nobody else may enter, of a new name inside the folder `path`, which ends in
// a separator; appends the name to it.
bool make_private_folder(PathBuffer& path);

// Whether a plain path may end in the name and mean an ordinary file of that folder: no separator
// in either style, no device, no stream of another file.
bool names_a_file(std::string_view name);

// ---- stream.cpp: what C streams leave out -------------------------------------------------------

void set_binary(FILE* stream);
int seek(FILE* stream, int64_t offset, int origin);
int64_t tell(FILE* stream);
// Binary, and not inherited by child processes.
FILE* open_to_read(const char* path);
FILE* open_to_write(const char* path);   // made or emptied
FILE* open_unemptied(const char* path);  // made or left, so that identity can be looked at first
bool empty_file(FILE* stream);

// What a stream leads to.
struct OpenFile {
  bool is_folder = false;
  bool has_content = false;   // that emptying it would remove; a device has none
  bool has_identity = false;  // in which two streams of one file agree
  uint64_t device = 0;
  uint64_t number = 0;

  bool is_same(const OpenFile& other) const {
    return has_identity && other.has_identity && device == other.device && number == other.number;
  }
};

bool look_at(FILE* stream, OpenFile& out);  // false when it cannot be told

// ---- copy.cpp: file contents that the system moves by itself ------------------------------------

// Copies as much of one file to another as the system does without the bytes passing through the
// process, which may be nothing; the caller copies on from there. The streams are unbuffered and
// fresh.
void copy_within(FILE* from, FILE* to);

// ---- directory.cpp: searches --------------------------------------------------------------------

enum class EntryKind { unknown, directory, link, other };
enum class Hidden { unknown, no, yes };

struct Entry {
  const char* name;  // valid until the next entry is asked for
  EntryKind kind;    // of the entry itself: a link is a link
  Hidden hidden = Hidden::unknown;
};

constexpr intptr_t no_search = -1;

// A search through one folder, in the platform's order, "." and ".." included; "" is the current
// one. The folder that is named may be reached through a link.
intptr_t search_first(const char* directory, Entry& entry);

// A search through the folder that another search has just found: `name` there, `path` from where
// the process stands. Where the platform can, a link that took the folder's place is refused.
intptr_t search_below(intptr_t search, const char* name, const char* path, Entry& entry);

bool search_next(intptr_t search, Entry& entry);
void search_close(intptr_t search);

// What a path itself is, for an entry whose kind its search did not tell; unknown when it is gone.
EntryKind entry_kind(const char* path);

// ---- tree.cpp: removal that cannot be led outside its tree --------------------------------------

constexpr intptr_t no_folder = -1;

// A folder held open where the platform can, so that what is removed in it lies in it whatever
// becomes of its path. Only a folder itself is opened, not a link to one.
intptr_t folder_open(const char* path);
intptr_t folder_open_below(intptr_t folder, const char* name, const char* path);
void folder_close(intptr_t folder);

enum class Removal { removed, gone, failed };

// Removes an entry itself, a folder only when it is empty. `path` is its full path, for a platform
// that has no calls relative to a folder.
Removal remove_below(intptr_t folder, const char* name, const char* path);
bool remove_folder(const char* path);  // an empty one

// ---- library.cpp: dynamic libraries -------------------------------------------------------------

// nullptr on failure. The path is in either separator style, its extension included.
void* load_library(const char* path);
void* library_symbol(void* library, const char* name);
void unload_library(void* library);

// ---- socket.cpp: IPv4 stream sockets ------------------------------------------------------------

using Socket = intptr_t;
constexpr Socket no_socket = -1;

struct Address {
  unsigned char bytes[4];  // network byte order
};

// Counted: each start that succeeded needs its stop.
bool network_start();
void network_stop();

Socket socket_open();
void socket_close(Socket socket);
bool socket_connect(Socket socket, const Address& address, unsigned port);
// Bytes sent or received, 0 when the peer has closed, -1 on failure. Never raises a signal.
int64_t socket_send(Socket socket, const char* data, size_t size);
int64_t socket_receive(Socket socket, char* room, size_t size);
int receive_buffer_size(Socket socket);  // 0 when the platform does not tell
int send_buffer_size(Socket socket);

bool resolve_name(const char* host, Address& out);
bool official_host_name(TextBuffer<256>& out);

}  // namespace zv::platform

#endif
