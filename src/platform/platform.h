// What the library asks of its platform, in the library's own terms. posix/ and windows/ each
// implement it under the same file names; no other folder of the library includes a system header.
#ifndef ZARVO_PLATFORM_PLATFORM_H
#define ZARVO_PLATFORM_PLATFORM_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <ctime>
#include <span>
#include <string_view>

#include "frame/byte_map.h"
#include "frame/text_buffer.h"
#include "zarvo.h"

namespace zv::platform {

// ---- status.cpp: one path on the file system ----------------------------------------------------

// Here a path may be written with either separator. Where `\` may also be part of a name, a path
// that exists as it is written is taken so, and `\` is read as `/` only in any other.

// The path as the platform's calls want it: `path` itself, or a copy in `room`. nullptr, errno set,
// when the copy does not fit.
const char* native_path(const char* path, PathBuffer& room);

// The same, with '/' wherever the platform reads a separator. False, errno set, when it does not
// fit.
[[nodiscard]] bool slashed_path(const char* path, PathBuffer& out);

// 0 or -1, errno as the platform left it.
int access(const char* path, int mode);
int status(const char* path, struct _stat64* st);  // follows links
int make_directory(const char* path);

enum class Kind {
  none,  // nothing is there, or nothing was told
  folder,
  link,  // where links are not followed
  other
};

// What lies at the path; links are followed.
Kind lies_at(const char* path);

bool is_hidden(const char* path);                // false where nothing is
bool set_hidden(const char* path, bool hidden);  // writes nothing where it is so already

// ---- folders.cpp: folders that the process knows ------------------------------------------------

// With '/' as the separator; the one at the end is the caller's to tidy.
bool working_directory(PathBuffer& out, size_t limit);  // `limit`: bytes offered to the platform
bool drive_directory(int drive, PathBuffer& out);       // drive 1 is A
int current_drive();                                    // 0 where there are no drives

// As they are written.
bool long_path(const char* path, PathBuffer& out);    // false where it cannot be had
const char* temp_folder();                            // nullptr when none is named
char search_path_separator(const char* search_path);  // between the elements of "PATH"

// ---- host.cpp: the user and the machine ---------------------------------------------------------

bool user_name(TextBuffer<257>& out);
bool host_name(TextBuffer<16>& out);
bool home_folder(PathBuffer& out);  // as the platform writes it

// ---- letter_case.cpp: case in the current locale, byte by byte ----------------------------------

// What tolower() or toupper() makes of each byte: ascii_lower or ascii_upper in the "C" locale,
// else the platform's own table, or `room` filled.
const int32_t* lower_map(ByteMap& room);
const int32_t* upper_map(ByteMap& room);

// The order of two texts, or of their first `n` bytes: unsigned, after tolower().
int compare_without_case(const char* a, const char* b);
int compare_without_case(const char* a, const char* b, size_t n);

// ---- error.cpp: why a call of the platform failed ----------------------------------------------

// What the last call of a function of this file met on this thread, where that says it tells: as
// errno's number, on both platforms. Functions of C streams tell by errno itself.
int last_error();

// ---- clock.cpp: local time and time that passes -------------------------------------------------

// The time now on the local clock, and its offset from UTC at that moment.
bool local_time(struct tm& out, int& offset_minutes);

// Milliseconds since some moment in the past; nothing sets this clock.
int64_t monotonic_ms();

// ---- processor.cpp: what the machine can do -----------------------------------------------------

bool has_wide_vectors();  // AVX2
bool has_fast_search();   // strstr() looks at more than one place at a time

// ---- names.cpp: names of files ------------------------------------------------------------------

// Whether a plain path may end in the name and mean an ordinary file of that folder: no separator
// in either style, no device, no stream of another file.
bool names_a_file(std::string_view name);

// The name in UTF-8, as which it is taken where it is bytes; false when it has no such form.
using Utf8Name = TextBuffer<1024>;
bool utf8_name(const char* name, Utf8Name& out);

// ---- temporary.cpp: a folder of one's own for a short time --------------------------------------

// Makes a folder that nobody else may enter, of a new name inside the folder `path`, which ends in
// a separator; appends the name to it.
bool make_private_folder(PathBuffer& path);

// One that nobody can guess.
bool random_number(uint64_t& out);

// ---- stream.cpp: what C streams leave out -------------------------------------------------------

void set_binary(FILE* stream);
int seek(FILE* stream, int64_t offset, int origin);
int64_t tell(FILE* stream);
// Binary, and not inherited by child processes; the path in either style, as for status().
FILE* open_to_read(const char* path);
FILE* open_to_write(const char* path);   // made or emptied
FILE* open_unemptied(const char* path);  // made or left, so that identity can be looked at first
bool empty_file(FILE* stream);

// What a stream leads to.
struct OpenFile {
  bool is_folder = false;
  bool is_file = false;  // of a disk: what is no such file has no size
  int64_t size = 0;
  unsigned bits = 0666;       // who may read, write and execute it
  bool has_identity = false;  // in which two streams of one file agree
  uint64_t device = 0;
  uint64_t number = 0;

  bool has_content() const { return size != 0; }  // that emptying it would remove
  bool is_same(const OpenFile& other) const {
    return has_identity && other.has_identity && device == other.device && number == other.number;
  }
};

bool look_at(FILE* stream, OpenFile& out);  // false when it cannot be told

// What there is to read, without waiting for more than a byte: the bytes read, 0 at the end, -1 on
// failure. The stream is unbuffered.
int64_t read_some(FILE* stream, char* room, size_t size);
// Whether a read need not wait, looked at for so long. Where the platform cannot tell, it need not.
bool wait_to_read(FILE* stream, int milliseconds);

// ---- copy.cpp: file contents that the system moves by itself ------------------------------------

// Copies at most so many bytes of one file to another without their passing through the process,
// and tells how many that were: fewer at the end of the file, and where the system leaves the rest
// to the caller. The streams are unbuffered.
size_t copy_within(FILE* from, FILE* to, size_t most);

// ---- directory.cpp: searches --------------------------------------------------------------------

enum class Hidden {
  unknown,
  no,
  yes,
  never  // nor is any other file of the same folder
};

struct Entry {
  const char* name;  // valid until the next entry is asked for
  Kind kind;         // of the entry itself; none where the search does not tell
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

// What an entry itself is, and whether what it leads to is hidden, where its search did not tell.
// `name` is an entry of the folder that is searched; the path is taken as it is.
Kind entry_kind(const char* path);
Hidden entry_hidden(intptr_t search, const char* name, const char* path);

// ---- tree.cpp: removal that cannot be led outside its tree --------------------------------------

constexpr intptr_t no_folder = -1;

// A folder held open where the platform can, so that what is removed in it lies in it whatever
// becomes of its path. Only what its name says is opened: no link, and nothing that the platform
// reads another way.
intptr_t folder_open(const char* path);
intptr_t folder_open_below(intptr_t folder, const char* name, const char* path);
void folder_close(intptr_t folder);

enum class Removal { removed, gone, failed };

// Removes an entry itself, a folder only when it is empty. `path` is its full path, for a platform
// that has no calls relative to a folder.
Removal remove_below(intptr_t folder, const char* name, const char* path);
bool remove_folder(const char* path);  // an empty one

// ---- landing.cpp: a file that takes its place whole ---------------------------------------------

// What stands at a place.
enum class Standing {
  nothing,
  file,
  folder,
  loose_link,  // that leads nowhere
  other        // a device, a pipe, or a way to what is open already: nothing that can be replaced
};

// Where a file lands: the end of a path whose links are followed. Its folder is held open where the
// platform can, so that all is done in that folder whatever becomes of the path.
struct Place {
  PathBuffer path;
  size_t name = 0;  // where the name begins in the path
  intptr_t folder = no_folder;
  Standing standing = Standing::nothing;
  OpenFile file;  // what stands there, when that is a file
};

// Why a file cannot be replaced by another that keeps all of its rights.
enum class Obstacle { none, read_only, linked, owner, access_list, folder };

// All that follows tells by last_error() why it failed. A place is to be closed after a failure
// too.
bool place_open(const char* path, Place& place);
void place_close(Place& place);
Obstacle place_obstacle(const Place& place);
bool may_make_file(const Place& place);  // as far as the platform tells before it is tried

// ".zv-", sixteen random hexadecimal digits and ".part".
constexpr size_t private_name_length = 25;
using PrivateName = TextBuffer<private_name_length + 1>;

// Makes a file of a new private name beside the place. It gets the bits, less those that the
// process withholds from what it makes; or what the file at the place passes on: permission bits,
// owner, group and access list.
FILE* make_private_file(const Place& place, unsigned bits, PrivateName& name);
void remove_private_file(const Place& place, const PrivateName& name);

// Gives the private file, which is closed, the name of the place. With `keep` it fails when there
// is an entry of that name, however late that came.
bool take_place(const Place& place, const PrivateName& name, bool keep);

// Opens what stands at the place, unemptied, or makes a file there.
FILE* open_in_place(const Place& place, unsigned bits, bool keep);

bool flush_file(FILE* stream);
bool flush_folder(const Place& place);  // so that a new name outlasts a power cut

// ---- library.cpp: dynamic libraries -------------------------------------------------------------

// nullptr on failure. The path is in either separator style, its extension included.
void* load_library(const char* path);
void* library_symbol(void* library, const char* name);
void unload_library(void* library);

// ---- socket.cpp: stream sockets -----------------------------------------------------------------

using Socket = intptr_t;
constexpr Socket no_socket = -1;

struct Address {
  unsigned char bytes[4];  // IPv4, network byte order
};

// Counted: each start that succeeded needs its stop.
bool network_start();
void network_stop();

// Over IPv4, and waiting in each call.
Socket socket_open();
void socket_close(Socket socket);
bool socket_connect(Socket socket, const Address& address, unsigned port);
// Bytes sent or received, 0 when the peer has closed, -1 on failure, which last_error() tells:
// EWOULDBLOCK where a socket that never waits would have to. Never raises a signal.
int64_t socket_send(Socket socket, const char* data, size_t size);
int64_t socket_receive(Socket socket, char* room, size_t size);
int receive_buffer_size(Socket socket);  // 0 when the platform does not tell
int send_buffer_size(Socket socket);

bool resolve_name(const char* host, Address& out);
bool official_host_name(TextBuffer<256>& out);

// ---- waiting_socket.cpp: stream sockets that never wait in a call -------------------------------

// Of IPv6 or IPv4.
struct HostAddress {
  bool is_six = false;
  std::array<unsigned char, 16> bytes = {};  // network byte order; IPv4 has the first four
  uint32_t scope = 0;                        // of an IPv6 address that holds on one link only
};

using AddressText = TextBuffer<64>;

// The addresses of a host in the system's order, as many as there is room for; none when the name
// is not known. The numbers of an IPv4 address are no name here, in whatever form.
size_t look_up_name(const char* name, std::span<HostAddress> room);
bool read_address_six(const char* text, HostAddress& out);  // without brackets
AddressText address_text(const HostAddress& address);       // without brackets

// Makes a socket that never waits, and begins to connect it. no_socket, and last_error(), when that
// fails at once; once it counts as writable, connect_error() tells how it ended.
Socket socket_begin(const HostAddress& address, unsigned port);
int connect_error(Socket socket);  // errno's number; 0 for a socket that is connected

// A socket, what is waited for, and whether that has come: an error has come, too.
struct Waiting {
  Socket socket = no_socket;
  bool to_read = false;
  bool to_write = false;
  bool can_read = false;
  bool can_write = false;
};

// Waits until one of them, two at most, is ready, or for so long. False when waiting fails.
bool wait_for_sockets(std::span<Waiting> sockets, int milliseconds);

void socket_end(Socket socket);    // sends what is left, and that nothing follows
void socket_reset(Socket socket);  // closes it so that the peer gets an error, not an end
bool peer_address(Socket socket, HostAddress& out);
bool local_address(Socket socket, HostAddress& out);
int64_t unsent_bytes(Socket socket);  // that the peer has not taken yet; 0 where nobody tells

}  // namespace zv::platform

#endif
