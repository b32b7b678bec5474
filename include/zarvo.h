/* SPDX-License-Identifier: MIT
 *
 * zarvo: the same application code on Windows and on Linux.
 *
 * The one public header, for C99 and C++. Each declaration carries its contract: what each
 * argument is and who owns it, sizes in bytes, the result in every case, what is not tested,
 * and whether threads may share it.
 */
#ifndef ZARVO_H
#define ZARVO_H

#include <stddef.h>
#include <stdint.h>
#include <stdio.h>
#include <sys/stat.h>
#include <sys/types.h>

#if defined(__GNUC__) && !defined(_WIN32)
#define ZV_API __attribute__((visibility("default")))
#else
#define ZV_API
#endif

#if !defined(_WIN32)
/** The 64-bit status record, under one name on both platforms. */
#define _stat64 stat
#endif

#ifdef __cplusplus
extern "C" {
#endif

/**
 * @mainpage
 *
 * What holds for every function:
 *
 * - Text is 8-bit, NUL-terminated and in the process's code page (an application manifest can make
 *   that UTF-8 on Windows). Classes and case of characters are those of the current C locale. Only
 *   zv_strpat() reads UTF-8.
 * - Buffers are of three kinds. A sized output (`char*` and `size_t`) receives at most size - 1
 *   characters and a NUL, and a longer result is cut silently, as zv_strncpy() does it. An in-place
 *   edit changes the caller's text where it lies; where it can grow, the caller provides the room
 *   that the function names. A path is worked on in a copy of #ZV_PATH_MAX bytes, so that at most
 *   319 characters of it take part.
 * - Results are lengths (`size_t`), counts (`int`, -1 for no memory or not found), truth values
 *   (`int`, 1 or 0) or pointers (NULL for not found or no memory). Nothing throws.
 * - A pointer argument must not be NULL unless the function says what NULL means.
 * - A heap block that a function hands out belongs to the caller and goes back through zv_free(),
 *   or through zv_strlist_free() for a string list.
 * - Nothing is printed, except by zv_plugin_enumerate(). No threads are made, loading the library
 *   runs none of its code, and there is no call to start or to end it.
 */

/* ================================================================================================
 * Memory and version
 */

/**
 * @defgroup frame Memory and version
 * Heap blocks that pass between the library and its caller, and the library's version.
 *
 * All blocks come from the library's own C heap, which on Windows need not be the application's:
 * give back with zv_free() what the library handed out.
 * @{
 */

/** Size in bytes of a path buffer, its NUL included: a path has at most 319 characters. */
#define ZV_PATH_MAX 320

/**
 * Allocate a block.
 *
 * @param size bytes wanted; 0 counts as 1.
 * @return the block, its contents undefined, to be given back with zv_free(); NULL when memory ran
 *         out.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API void* zv_malloc(size_t size);

/**
 * Allocate a block of zero bytes.
 *
 * @param size bytes wanted (one count, not a number of elements and their size); 0 counts as 1.
 * @return the block, to be given back with zv_free(); NULL when memory ran out.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API void* zv_calloc(size_t size);

/**
 * Resize a block.
 *
 * A caller may store the result straight back into its own variable: a failure hands back the old
 * block, still valid and unchanged, and never NULL in its place.
 *
 * @param block the block, or NULL for a fresh one.
 * @param size  bytes wanted; 0 counts as 1 and never frees.
 * @param ok    receives 1 on success and 0 on failure.
 * @return on success the block's new address, the old one being no longer valid; on failure
 * `block`.
 * @par Thread safety
 *   Safe from any thread, for distinct blocks.
 */
ZV_API void* zv_realloc(void* block, size_t size, int* ok);

/**
 * Give a block back.
 *
 * @param block a block that the library handed out, or NULL, which does nothing.
 * @return 0, always.
 * @par Thread safety
 *   Safe from any thread, for distinct blocks.
 */
ZV_API int zv_free(void* block);

/**
 * Allocate a copy of a block of bytes.
 *
 * @param src  the bytes to copy, or NULL to leave the new block's contents undefined.
 * @param size how many bytes; 0 counts as 1, so `src` must have at least one readable byte.
 * @return the copy, to be given back with zv_free(); NULL when memory ran out.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API void* zv_dalloc(const void* src, size_t size);

/**
 * Tell the library's version.
 *
 * @return the constant text "1.0.0b", which zv_split_version() takes apart. Not to be freed.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API const char* zarvo_version(void);

/**
 * Take a version text apart: up to three numbers with dots between them, and a last letter that
 * names the kind of release.
 *
 * At most 31 characters of the text take part. Each number is read as atoi() reads it, so one
 * without digits is 0, and so is one that is not there. A last letter `a` to `e` means "Alpha",
 * "Beta", "Custom", "Demo" or "Educational"; any other letter, or none, means "Release".
 *
 * @param version the text, such as "1.0.0b".
 * @param major   receives the first number, or NULL.
 * @param minor   receives the second number, or NULL.
 * @param patch   receives the third number, or NULL.
 * @param release a buffer of at least 12 bytes that receives the name of the release, or NULL.
 * @return 1, or 0 for the empty text, which leaves every output as it was.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_split_version(const char* version, int* major, int* minor, int* patch, char* release);

/** @} */

/* ================================================================================================
 * Strings
 */

ZV_API size_t zv_strncpy(char* dst, const char* src, size_t size);
size_t zv_strnulllen(const char* seq);
void zv_strnull(char* s);
void zv_strnullrepl(char* seq, char sep);
size_t zv_strnnullcpy(char* dst, const char* src, size_t size);
size_t zv_strnnullcat(char* dst, const char* src, size_t size);
char* zv_strredup(char* old, const char* s);
void zv_strreplchr(char* s, int from, char to);

size_t zv_strltrim(char* s);
size_t zv_strrtrim(char* s);
size_t zv_strtrim(char* s);
size_t zv_strlwr(char* s);
size_t zv_strupr(char* s);
int zv_stricmp(const char* a, const char* b);
int zv_strnicmp(const char* a, const char* b, size_t n);
char* zv_strichr(const char* s, int ch);
char* zv_stristr(const char* s, const char* needle);
void zv_strlshift(char* s, size_t n);
void zv_strrshift(char* s, size_t n);
void zv_strshift(char* s, int n);
char* zv_strnrepl(char* dst, const char* src, int n);

int zv_strreplstr(char* s, const char* needle, const char* repl);
int zv_strireplstr(char* s, const char* needle, const char* repl);
int zv_strbrkt(char* s, char open, char close);
int zv_strubrkt(char* s, int open, int close);
int zv_strsynch(char* s, const char* model);
size_t zv_strtowcs(uint16_t* dst, const char* src);
size_t zv_wcstostr(char* dst, const uint16_t* src);

int zv_strpat(const char* text, const char* pattern);

/* ================================================================================================
 * String lists
 */

int zv_strlist(char*** out, const char* text, int sep);
int zv_strlist_len(char** list);
int zv_strlist_free(char** list, int n);
int zv_strlist_insert(char*** list, int n, int pos, const char* s);
char* zv_strlist_remove(char** list, int n, int pos);
int zv_strlist_replace(char** list, int pos, const char* s);
int zv_strlist_cat(char*** list, int count, char** other, int other_count);
int zv_strlist_idx(char** list, int n, const char* s);
int zv_strlist_iidx(char** list, int n, const char* s);
int zv_strlist_cmp(const char** a, const char** b);
int zv_strlist_icmp(const char** a, const char** b);
int zv_strlist_set(char** list, int n);
int zv_strlist_iset(char** list, int n);
int zv_strlist_reduce(char*** list, int n, int pos);

/* ================================================================================================
 * Paths
 */

int zv_ispath_DOS(const char* path);
int zv_ispath_UNC(const char* path);
int zv_ispath_UNIX(const char* path);
int zv_ispath_relative(const char* path);
int zv_ispath_root(const char* path);
char* zv_slash(const char* path);
char* zv_dot(const char* path);
int zv_add_slash(char* path);
int zv_trim_slash(char* path);
void zv_split_path(char* path);
int zv_extract_directory(const char* path, char* out, size_t size);
int zv_extract_filename(const char* path, char* out, size_t size);
int zv_extract_extension(const char* path, char* out, size_t size);

int zv_normalize_path(char* path);
int zv_absolute(const char* path, const char* base, char* out, size_t size);
int zv_relative(const char* path, const char* base, char* out, size_t size);

int zv_pathmap(const char* from, const char* to);
void zv_pathmap_clear(void);
int zv_pathmap_locate(char* path);

int zv_pathlist(char*** list);
int zv_path_locate(char* path);

/* ================================================================================================
 * Host and private environment
 */

size_t zv_homedir(char* buf, size_t size);
size_t zv_tempdir(char* buf, size_t size);
int zv_getcwd(char* buf, size_t size);
size_t zv_username(char* buf, size_t size);
size_t zv_hostname(char* buf, size_t size);

int zv_putenv_private(const char* name, const char* value, int append);
char* zv_getenv_private(const char* name);

/* ================================================================================================
 * Byte order
 */

int16_t zv_swap_int16(int16_t value);
uint16_t zv_swap_uint16(uint16_t value);
int32_t zv_swap_int32(int32_t value);
uint32_t zv_swap_uint32(uint32_t value);
int64_t zv_swap_int64(int64_t value);
uint64_t zv_swap_uint64(uint64_t value);
float zv_swap_float(float value);
double zv_swap_double(double value);
void zv_swapv_16(uint16_t* data, int count);
void zv_swapv_32(uint32_t* data, int count);
void zv_swapv_64(uint64_t* data, int count);
void zv_swapv(void* data, int count, size_t size);

/* ================================================================================================
 * File streams
 */

FILE* zv_fopen(const char* path, const char* mode, int* flag);
int zv_fclose(FILE* fp);
size_t zv_fread(void* buf, size_t size, size_t count, FILE* fp, int swap);
size_t zv_fwrite(void* buf, size_t size, size_t count, FILE* fp, int swap);
int zv_fseek(FILE* fp, int64_t offset, int origin);
int64_t zv_ftell(FILE* fp);
int zv_fskip(FILE* fp);
char* zv_fgets(char* buf, int size, FILE* fp, int strip_cr);
int zv_fputs(const char* s, FILE* fp, int crlf);

/* ================================================================================================
 * Directories
 */

typedef int (*dir_filter_t)(const char* dir, const char* name, void* user);

typedef struct dirsel_t {
  const char* dir_patterns;
  const char* file_patterns;
  const char* separators;
  int show_hidden;
  int match_case;
} dirsel_t;

intptr_t zv_dir_readfirst(const char* dir, char* name, size_t size);
int zv_dir_readnext(intptr_t handle, char* name, size_t size);
intptr_t zv_dir_close(intptr_t handle);
int zv_dir_scan(const char* dir, char*** list, dir_filter_t filter, void* user, int full_path,
                int recursive);
int zv_dir_select(const char* dir, const char* name, const dirsel_t* sel);

/* ================================================================================================
 * File status and trees
 */

int zv_access(const char* path, int mode);
int zv_stat(const char* path, struct _stat64* st);
int zv_mkdir(const char* path);
int zv_get_hidden(const char* path);
int zv_set_hidden(const char* path, int hidden);

int zv_mkpath(const char* path);
int zv_mkfile(const char* path);
int zv_rmpath(const char* path);

/* ================================================================================================
 * Dynamic libraries and plugins
 */

void* zv_dll_open(const char* path, int has_ext);
void* zv_dll_getptr(void* lib, const char* name, const char* fmt);
void* zv_dll_close(void* lib);

typedef struct plugin_t plugin_t;
struct plugin_t {
  plugin_t* (*release)(plugin_t* self);
  const char* (*formats)(void);
  void* api_entry;
};

typedef struct zv_plugin_t {
  char* dir;
  char* lib;
  char** formats;
  char* api;
  int version;
  int refs;
  void* module;
  plugin_t* plugin;
} zv_plugin_t;

typedef plugin_t* (*zv_plugin_entry_t)(const char* api, int min, int max, int* code);

zv_plugin_t* zv_plugin_create(const char* dir, const char* lib, const char* api, int min, int max,
                              int* code);
int zv_plugin_destroy(zv_plugin_t* rec);
int zv_plugin_load(zv_plugin_t* rec);
int zv_plugin_unload(zv_plugin_t* rec);
int zv_plugin_add_lib(zv_plugin_t*** plugins, const char* path, const char* api, int min, int max,
                      int* code, int keep);
int zv_plugin_match_vers(int min, int max, int oldest, int newest, int* version);
int zv_plugin_enumerate(zv_plugin_t*** plugins, const char* api, int min, int max, int keep);

int zv_plugin_formats(zv_plugin_t** plugins, char*** list);
zv_plugin_t* zv_plugin_get_entry_by_fmt(zv_plugin_t** plugins, const char* path);
int zv_plugin_match_fmt(zv_plugin_t* rec, const char* path);
zv_plugin_t* zv_plugin_get_entry_by_lib(zv_plugin_t** plugins, const char* lib);
size_t zv_plugin_get_lib(zv_plugin_t** entry, char* buf, int size);
int zv_fmt_composite(char*** list, int count, const char* description);
size_t zv_fmt_default(const char* entry, const char** pattern);
char* zv_fmt_force(const char* entry, char* name);

/* ================================================================================================
 * Copying between locations
 */

/** zv_copy() failed on the side of its source. */
#define ZV_COPY_SOURCE_FAILED (-3)
/** zv_copy() failed on the side of its destination. */
#define ZV_COPY_DESTINATION_FAILED (-4)

int zv_copy(const char* from, const char* to);

#ifdef __cplusplus
}
#endif

#endif
