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

/* A program that links zarvo.dll may define ZARVO_DLL, as zarvo::zarvo does for CMake's: calls go
 * straight into the library, and a function's address is the same as within it. */
#if defined(_WIN32) && defined(ZARVO_DLL)
#define ZV_API __declspec(dllimport)
#elif defined(__GNUC__) && !defined(_WIN32)
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
 *   (`int`, 1 or 0) or pointers (NULL for not found or no memory). No function throws, and no
 *   exception may pass through one: callbacks and plugins must not throw.
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
 *
 * @code
 * char release[12];
 * char* text = zv_dalloc("kept", 5);
 * if (text == NULL) return 1;
 * puts(text);                            // prints kept
 * zv_free(text);
 * zv_split_version(zarvo_version(), NULL, NULL, NULL, release);
 * puts(release);                         // prints Beta
 * @endcode
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
 * @return on success the block's new address, the old one being no longer valid; on failure the
 *         old one.
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
 *   Safe from any thread, while no thread changes the locale.
 */
ZV_API int zv_split_version(const char* version, int* major, int* minor, int* patch, char* release);

/** @} */

/* ================================================================================================
 * Strings
 */

/**
 * @defgroup copies Bounded copies and zero-separated sequences
 * The copy by whose rule every sized output is written, and several texts in one buffer.
 *
 * A zero-separated sequence is any number of non-empty texts laid end to end, each with its own
 * NUL, and one more NUL that closes the whole: `a\0xy\0\0`. Its length counts the texts and their
 * NULs, 5 here, but not the closing one; a buffer for it needs one byte more than its length.
 *
 * @code
 * char name[8];                                        // filled to its end: perhaps cut
 * if (zv_strncpy(name, "abcdefghi", sizeof name) == sizeof name - 1) puts(name);  // prints abcdefg
 *
 * char patterns[] = "*.png;*.jpg;";
 * zv_strreplchr(patterns, ';', '\0');                  // the sequence "*.png" "*.jpg"
 * for (char* p = patterns; *p != '\0'; p += strlen(p) + 1) puts(p);  // prints *.png *.jpg
 * @endcode
 * @{
 */

/**
 * Copy a text into a buffer of a given size, cutting what does not fit.
 *
 * Unlike strncpy(), always ends the copy with a NUL and never fills the rest of the buffer. A cut
 * is not reported: a text of size - 1 characters and a longer one give the same result.
 *
 * @param dst  the buffer. Must not overlap `src`.
 * @param src  the text.
 * @param size the buffer's size in bytes; 0 writes nothing.
 * @return the length of the text now in `dst`, at most `size` - 1; 0 when `size` is 0.
 * @par Thread safety
 *   Safe from any thread, for distinct buffers.
 */
ZV_API size_t zv_strncpy(char* dst, const char* src, size_t size);

/**
 * Replace a text on the heap.
 *
 * Store the result back into the variable that held `old`, which is freed in every case, and before
 * the copy is made: `s` must not lie inside it.
 *
 * @param old a block that the library handed out, or NULL.
 * @param s   the text to copy, or NULL for none.
 * @return the copy, to be given back with zv_free(); NULL when `s` is NULL or memory ran out.
 * @par Thread safety
 *   Safe from any thread, for distinct blocks.
 */
ZV_API char* zv_strredup(char* old, const char* s);

/**
 * Replace one character by another, wherever it stands.
 *
 * The whole of the text is gone through even when `to` is NUL, so that a list whose every piece is
 * ended by a separator turns into a zero-separated sequence.
 *
 * @param s    the text, edited in place.
 * @param from the character's value as a `signed char` (-128 to 127); any other finds nothing.
 * @param to   what to put in its place.
 * @par Thread safety
 *   Safe from any thread, for distinct texts.
 */
ZV_API void zv_strreplchr(char* s, int from, char to);

/**
 * Measure a zero-separated sequence.
 *
 * @param seq the sequence.
 * @return its length, each text's NUL included and the closing one not; 0 when it is empty.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API size_t zv_strnulllen(const char* seq);

/**
 * Make a zero-separated sequence of a text, by writing one more NUL after it.
 *
 * @param s the text, in a buffer of at least its length + 2 bytes. An empty text becomes the empty
 *          sequence.
 * @par Thread safety
 *   Safe from any thread, for distinct texts.
 */
ZV_API void zv_strnull(char* s);

/**
 * Make one text of a zero-separated sequence, with a separator after each of its pieces.
 *
 * The result is what zv_strlist() takes apart again with the same separator.
 *
 * @param seq the sequence, edited in place; an empty one stays as it is.
 * @param sep the separator.
 * @par Thread safety
 *   Safe from any thread, for distinct sequences.
 */
ZV_API void zv_strnullrepl(char* seq, char sep);

/**
 * Copy a zero-separated sequence into a buffer of a given size.
 *
 * A sequence longer than `size` - 1 is cut there. The buffer's last byte is then a NUL, but the
 * sequence in it is not closed by a second one: give its length + 1 bytes to have all of it.
 *
 * @param dst  the buffer. Must not overlap `src`.
 * @param src  the sequence.
 * @param size the buffer's size in bytes; 0 writes nothing.
 * @return the length copied, at most `size` - 1; 0 when `size` is 0.
 * @par Thread safety
 *   Safe from any thread, for distinct buffers.
 */
ZV_API size_t zv_strnnullcpy(char* dst, const char* src, size_t size);

/**
 * Append a zero-separated sequence to another, within a buffer of a given size.
 *
 * What does not fit is cut as zv_strnnullcpy() cuts it.
 *
 * @param dst  the buffer with the first sequence in it.
 * @param src  the sequence to append. Must not overlap `dst`.
 * @param size the size of the whole buffer in bytes.
 * @return the length appended; 0 when there is no room for any of it.
 * @par Thread safety
 *   Safe from any thread, for distinct buffers.
 */
ZV_API size_t zv_strnnullcat(char* dst, const char* src, size_t size);

/** @} */

/**
 * @defgroup edits Trimming, case and shifting
 * Edits of a text where it lies.
 *
 * Nothing is allocated and no size is tested: where a text grows, the caller has the room. White
 * space and case are those of the current C locale, byte by byte.
 *
 * @code
 * char line[80] = "  Key = value \n";
 * zv_strtrim(line);
 * zv_strlwr(line);
 * puts(line);                                 // prints key = value
 * char* rest = zv_strnrepl(line, "name", 3);
 * puts(line);                                 // prints name = value
 * puts(rest);                                 // prints = value
 * @endcode
 * @{
 */

/**
 * Remove the white space at the start of a text, moving the rest to the front.
 *
 * @param s the text, edited in place.
 * @return its length now.
 * @par Thread safety
 *   Safe from any thread, for distinct texts, while no thread changes the locale.
 */
ZV_API size_t zv_strltrim(char* s);

/**
 * Remove the white space at the end of a text.
 *
 * @param s the text, edited in place.
 * @return its length now.
 * @par Thread safety
 *   Safe from any thread, for distinct texts, while no thread changes the locale.
 */
ZV_API size_t zv_strrtrim(char* s);

/**
 * Remove the white space at both ends of a text.
 *
 * @param s the text, edited in place.
 * @return its length now.
 * @par Thread safety
 *   Safe from any thread, for distinct texts, while no thread changes the locale.
 */
ZV_API size_t zv_strtrim(char* s);

/**
 * Turn every byte of a text into its lower-case form, as tolower() does it.
 *
 * @param s the text, edited in place.
 * @return its length.
 * @par Thread safety
 *   Safe from any thread, for distinct texts, while no thread changes the locale.
 */
ZV_API size_t zv_strlwr(char* s);

/**
 * Turn every byte of a text into its upper-case form, as toupper() does it.
 *
 * @param s the text, edited in place.
 * @return its length.
 * @par Thread safety
 *   Safe from any thread, for distinct texts, while no thread changes the locale.
 */
ZV_API size_t zv_strupr(char* s);

/**
 * Remove characters from the start of a text.
 *
 * @param s the text, edited in place.
 * @param n how many, at most the text's length.
 * @par Thread safety
 *   Safe from any thread, for distinct texts.
 */
ZV_API void zv_strlshift(char* s, size_t n);

/**
 * Move a text to the right, to make room in front of it.
 *
 * The first `n` bytes keep what was there: "abc" moved by 2 reads "ababc" until they are filled.
 *
 * @param s the text, in a buffer of at least its length + `n` + 1 bytes.
 * @param n how far.
 * @par Thread safety
 *   Safe from any thread, for distinct texts.
 */
ZV_API void zv_strrshift(char* s, size_t n);

/**
 * Move a text to the right, or to the left where the distance is negative.
 *
 * @param s the text, with the room that zv_strrshift() asks for.
 * @param n above 0 as zv_strrshift() by `n`, below 0 as zv_strlshift() by -`n`.
 * @par Thread safety
 *   Safe from any thread, for distinct texts.
 */
ZV_API void zv_strshift(char* s, int n);

/**
 * Replace the first characters of a text by another text.
 *
 * @param dst the text, in a buffer of at least its length - `n` + the length of `src` + 1 bytes.
 * @param src what to put there, all of it. Must not overlap `dst`.
 * @param n   how many characters it replaces, from 0 to the length of `dst`.
 * @return the place in `dst` right after what was put there.
 * @par Thread safety
 *   Safe from any thread, for distinct texts.
 */
ZV_API char* zv_strnrepl(char* dst, const char* src, int n);

/** @} */

/**
 * @defgroup nocase Comparison and search without regard to case
 * Names, keys and header lines that may be written in either case.
 *
 * Bytes are compared as unsigned values after tolower() in the current C locale. In the "C" locale
 * only A to Z and a to z have case, and `_` sorts before every letter.
 *
 * @code
 * const char* line = "content-length: 42";
 * if (zv_strnicmp(line, "Content-Length:", 15) == 0) puts(line + 15);  // prints 42
 * const char* found = zv_stristr("<TITLE>News", "<title>");
 * if (found != NULL) puts(found + 7);         // prints News
 * @endcode
 * @{
 */

/**
 * Compare two texts without regard to case.
 *
 * @param a one text.
 * @param b the other.
 * @return below 0, 0 or above 0, as `a` sorts before, with or after `b`.
 * @par Thread safety
 *   Safe from any thread, while no thread changes the locale.
 */
ZV_API int zv_stricmp(const char* a, const char* b);

/**
 * Compare the beginnings of two texts without regard to case.
 *
 * @param a one text.
 * @param b the other.
 * @param n how many characters to compare at most; a NUL ends the comparison before that.
 * @return below 0, 0 or above 0, as with zv_stricmp(); 0 when `n` is 0.
 * @par Thread safety
 *   Safe from any thread, while no thread changes the locale.
 */
ZV_API int zv_strnicmp(const char* a, const char* b, size_t n);

/**
 * Find a character without regard to case.
 *
 * @param s  the text.
 * @param ch the character, taken as a byte. The NUL is never found, unlike with strchr().
 * @return its first place in `s`; NULL when there is none.
 * @par Thread safety
 *   Safe from any thread, while no thread changes the locale.
 */
ZV_API char* zv_strichr(const char* s, int ch);

/**
 * Find a text within another without regard to case.
 *
 * @param s      the text to search.
 * @param needle the text to find. An empty one is never found, unlike with strstr().
 * @return its first place in `s`; NULL when there is none.
 * @par Thread safety
 *   Safe from any thread, while no thread changes the locale.
 */
ZV_API char* zv_stristr(const char* s, const char* needle);

/** @} */

/**
 * @defgroup replacement Replacement, brackets, case of names, wide text
 * Further edits of a text where it lies, and texts of 16-bit units.
 *
 * Nothing is allocated and no size is tested: where a text grows, the caller has the room.
 *
 * @code
 * char path[80] = "a//b//readme.txt";
 * zv_strreplstr(path, "//", "/");
 * puts(path);                            // prints a/b/readme.txt
 * zv_strsynch(path, "NOTES.DOC");
 * zv_strbrkt(path, '"', '"');
 * puts(path);                            // prints "a/b/README.TXT"
 * @endcode
 * @{
 */

/**
 * Replace every occurrence of a text within another.
 *
 * Occurrences are found from left to right and do not overlap; what is put in is never searched.
 *
 * @param s      the text to edit, with room for what it grows by at each occurrence.
 * @param needle the text to replace. An empty one is never found.
 * @param repl   the text to put in its place. Neither may overlap `s`.
 * @return 1 if anything was replaced, else 0.
 * @par Thread safety
 *   Safe from any thread, for distinct texts.
 */
ZV_API int zv_strreplstr(char* s, const char* needle, const char* repl);

/**
 * Replace every occurrence of a text within another, found without regard to case as zv_stristr()
 * finds it.
 *
 * @param s      the text to edit, with room for what it grows by at each occurrence.
 * @param needle the text to replace. An empty one is never found.
 * @param repl   the text to put in its place, exactly as it is. Neither may overlap `s`.
 * @return 1 if anything was replaced, else 0.
 * @par Thread safety
 *   Safe from any thread, for distinct texts, while no thread changes the locale.
 */
ZV_API int zv_strireplstr(char* s, const char* needle, const char* repl);

/**
 * Put a character in front of a text and another after it.
 *
 * @param s     the text, in a buffer of at least its length + 3 bytes.
 * @param open  the character to go in front, a bracket or a quote or any other.
 * @param close the character to go after it.
 * @return 2, the number of characters added.
 * @par Thread safety
 *   Safe from any thread, for distinct texts.
 */
ZV_API int zv_strbrkt(char* s, char open, char close);

/**
 * Take the brackets off a text.
 *
 * Both characters must stand where they belong and be two: a lone quote is not a quoted text.
 *
 * @param s     the text, edited in place.
 * @param open  the first character, as the value of a `signed char`.
 * @param close the last character, as the value of a `signed char`.
 * @return 2, the number of characters removed; 0 when the text was left as it is.
 * @par Thread safety
 *   Safe from any thread, for distinct texts.
 */
ZV_API int zv_strubrkt(char* s, int open, int close);

/**
 * Give the name and the extension of a path the letter case of another path's.
 *
 * The case of each is told by its first two letters: two upper-case ones mean all upper case, two
 * lower-case ones all lower case, an upper-case one before a lower-case one a capital first and
 * lower case after it. Anything else leaves that part as it is. A model without an extension
 * rules the whole file name, and folders never change. The extension is the one that zv_dot()
 * finds.
 *
 * @param s     the path, edited in place.
 * @param model the path to follow.
 * @return 1 if any character changed, else 0.
 * @par Thread safety
 *   Safe from any thread, for distinct texts, while no thread changes the locale.
 */
ZV_API int zv_strsynch(char* s, const char* model);

/**
 * Widen a text to 16-bit units, one for each byte.
 *
 * This is not a conversion of encodings: a byte is widened as a signed value, so that 0xE9 becomes
 * 0xFFE9. zv_wcstostr() undoes it.
 *
 * @param dst receives the units and a 0 unit; room for the length of `src` + 1 units.
 * @param src the text.
 * @return the number of units before the 0 unit.
 * @par Thread safety
 *   Safe from any thread, for distinct buffers.
 */
ZV_API size_t zv_strtowcs(uint16_t* dst, const char* src);

/**
 * Narrow a text of 16-bit units, each to its low 8 bits.
 *
 * @param dst receives the bytes and a NUL; room for as many bytes as `src` has units, and one more.
 * @param src the units, up to a 0 unit.
 * @return the number of units converted. A unit whose low bits are 0 counts, though its NUL ends
 *         the text in `dst` early.
 * @par Thread safety
 *   Safe from any thread, for distinct buffers.
 */
ZV_API size_t zv_wcstostr(char* dst, const uint16_t* src);

/** @} */

/**
 * @defgroup wildcard Wildcard patterns
 * File names and the like, chosen by a pattern.
 *
 * | Element       | Matches                                                               |
 * |---------------|-----------------------------------------------------------------------|
 * | `*`           | any characters, also none                                             |
 * | `?`           | one character                                                         |
 * | `[abx-z]`     | one character of the set: `a`, `b`, or any from `x` to `z`            |
 * | `[^abx-z]`    | one character that is not in the set                                  |
 * | `\` and a byte | that byte, whatever it is; inside a set `\` is a member like others  |
 * | any other byte | the same byte                                                        |
 *
 * A set may hold `]` as its first member and `-` as its first or last. Only `^` negates it. A range
 * goes by the characters' values, and one that runs backwards holds its first character only.
 *
 * Where the bytes of text or set form UTF-8, `*`, `?` and sets take a character as a whole; any
 * other byte is a character by itself, whose value is the byte's.
 *
 * @code
 * const char* name = "report_7.txt";
 * if (zv_strpat(name, "report_[0-9]*.txt")) puts(name);  // prints report_7.txt
 * @endcode
 * @{
 */

/**
 * Tell whether a whole text matches a pattern.
 *
 * Case counts: to ignore it, turn both into lower case first with zv_strlwr(). Needs no memory, and
 * no pattern makes it recurse.
 *
 * @param text    the text.
 * @param pattern the pattern. A set without its `]`, or a `\` at the very end, matches nothing.
 * @return 1 if the text matches, else 0.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_strpat(const char* text, const char* pattern);

/** @} */

/* ================================================================================================
 * String lists
 */

/**
 * @defgroup strlist String lists
 * The one container that the whole interface hands around.
 *
 * A string list is a heap array of heap texts with a NULL entry after the last: walk it, index it,
 * sort it with qsort() as it lies. Whoever holds the list owns the array and the texts, and gives
 * both back with zv_strlist_free(). The empty list is an array with only the NULL in it, not a NULL
 * pointer. Nobody can count on room to spare in the array: where it may move, functions take its
 * address.
 *
 * Most functions take a count `n` of the entries, which saves counting them again; a negative `n`
 * counts them up to the NULL. A count above the real one is not noticed. With one below it, the
 * list ends after `n` entries: those after them are never read, moved or freed, and belong to the
 * caller. They stay where they stand in the array, until zv_strlist_insert() or zv_strlist_cat()
 * writes over them, or zv_strlist_reduce() makes the array shorter. Positions begin at 0.
 *
 * @code
 * char** names;
 * int n = zv_strlist(&names, "b;a;B;", ';');
 * if (n < 0) return 1;
 * n -= zv_strlist_iset(names, n);
 * if (zv_strlist_insert(&names, n, 0, "first")) ++n;
 * for (char** name = names; *name; ++name) puts(*name);  // prints first b a
 * zv_strlist_free(names, n);
 * @endcode
 * @{
 */

/**
 * Split a text into a new list.
 *
 * Every piece of the text must be ended by the separator, the last one too: "a;b;" gives two
 * entries, "a;b" only the first. Two separators side by side give an empty entry.
 *
 * @param out  receives the list, or NULL when memory ran out. What it held before is not freed.
 * @param text the text, or NULL for the empty list.
 * @param sep  the separator; 0 when `text` is a zero-separated sequence, each of whose texts
 *             becomes an entry. Only its low 8 bits count, so that 0xE9 and -23 are the same byte,
 *             and 256 is 0.
 * @return the number of entries; -1 when memory ran out.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_strlist(char*** out, const char* text, int sep);

/**
 * Count the entries of a list.
 *
 * @param list the list.
 * @return how many entries lie before the NULL.
 * @par Thread safety
 *   Safe while no thread changes the list.
 */
ZV_API int zv_strlist_len(char** list);

/**
 * Give a list and its texts back.
 *
 * @param list the list, or NULL, which does nothing.
 * @param n    how many entries to free before the array, negative for all. The texts of any more
 *             are not freed.
 * @return 0, always.
 * @par Thread safety
 *   Safe while no other thread uses the list.
 */
ZV_API int zv_strlist_free(char** list, int n);

/**
 * Insert a copy of a text into a list.
 *
 * @param list the list's variable, changed to the array's new address. It may hold NULL when `n`
 *             is 0.
 * @param n    the number of entries, negative to count them.
 * @param pos  the position of the new entry, at most the number of entries; negative to append.
 * @param s    the text to copy.
 * @return 1; 0 when memory ran out, and then the list is as it was.
 * @par Thread safety
 *   Safe while no other thread uses the list.
 */
ZV_API int zv_strlist_insert(char*** list, int n, int pos, const char* s);

/**
 * Take an entry out of a list.
 *
 * @param list the list; its array stays where it is and keeps its size.
 * @param n    the number of entries, negative to count them.
 * @param pos  the entry's position, at most the number of entries.
 * @return the entry's text, which now belongs to the caller and goes back through zv_free(); NULL
 *         when `pos` is the number of entries, and then nothing changes.
 * @par Thread safety
 *   Safe while no other thread uses the list.
 */
ZV_API char* zv_strlist_remove(char** list, int n, int pos);

/**
 * Put a copy of a text in an entry's place and free what was there.
 *
 * @param list the list.
 * @param pos  the entry's position, below the number of entries.
 * @param s    the text to copy.
 * @return 1; 0 when memory ran out, and then the entry is as it was.
 * @par Thread safety
 *   Safe while no other thread uses the list.
 */
ZV_API int zv_strlist_replace(char** list, int pos, const char* s);

/**
 * Append the entries of one list to another.
 *
 * The texts are not copied but move to `list`, while the other array still points at them: release
 * that array with zv_free() afterwards, never with zv_strlist_free().
 *
 * @param list        the list's variable, changed to the array's new address. It may hold NULL when
 *                    `count` is 0.
 * @param count       its number of entries, negative to count them.
 * @param other       the list to append.
 * @param other_count its number of entries, negative to count them.
 * @return the number of entries now; -1 when memory ran out, and then both lists are as they were.
 * @par Thread safety
 *   Safe while no other thread uses the lists.
 */
ZV_API int zv_strlist_cat(char*** list, int count, char** other, int other_count);

/**
 * Find an entry.
 *
 * @param list the list.
 * @param n    the number of entries, negative to count them.
 * @param s    the text to find.
 * @return the position of the first entry that equals it; -1 when there is none.
 * @par Thread safety
 *   Safe while no thread changes the list.
 */
ZV_API int zv_strlist_idx(char** list, int n, const char* s);

/**
 * Find an entry without regard to case, as zv_stricmp() compares.
 *
 * @param list the list.
 * @param n    the number of entries, negative to count them.
 * @param s    the text to find.
 * @return the position of the first entry that equals it; -1 when there is none.
 * @par Thread safety
 *   Safe while no thread changes the list or the locale.
 */
ZV_API int zv_strlist_iidx(char** list, int n, const char* s);

/**
 * Compare two entries, to sort a list.
 *
 * qsort() takes a function of two `const void*`: write one that returns
 * `zv_strlist_cmp((const char**)a, (const char**)b)`, which is C and C++. For std::sort() it is
 * `[](const char* a, const char* b) { return zv_strlist_cmp(&a, &b) < 0; }`.
 *
 * @param a points at one entry.
 * @param b points at the other.
 * @return -1, 0 or 1, as the bytes of the one, read as unsigned values, sort before, with or after
 *         those of the other.
 * @par Thread safety
 *   Safe while no thread changes the texts.
 */
ZV_API int zv_strlist_cmp(const char** a, const char** b);

/**
 * Compare two entries without regard to case, to sort a list as with zv_strlist_cmp().
 *
 * @param a points at one entry.
 * @param b points at the other.
 * @return below 0, 0 or above 0, as zv_stricmp() compares.
 * @par Thread safety
 *   Safe while no thread changes the texts or the locale.
 */
ZV_API int zv_strlist_icmp(const char** a, const char** b);

/**
 * Remove every entry that equals an earlier one.
 *
 * The first of each stays, and the order of those that stay is kept. The array keeps its size.
 *
 * @param list the list.
 * @param n    the number of entries, negative to count them.
 * @return how many entries were removed. Cannot fail; without memory for an index it takes longer.
 * @par Thread safety
 *   Safe while no other thread uses the list.
 */
ZV_API int zv_strlist_set(char** list, int n);

/**
 * Remove every entry that equals an earlier one without regard to case, as zv_stricmp() compares.
 *
 * The first written form of each stays, and the order of those that stay is kept. The array keeps
 * its size.
 *
 * @param list the list.
 * @param n    the number of entries, negative to count them.
 * @return how many entries were removed. Cannot fail; without memory for an index it takes longer.
 * @par Thread safety
 *   Safe while no other thread uses the list and none changes the locale.
 */
ZV_API int zv_strlist_iset(char** list, int n);

/**
 * Keep one entry of a list and free all others.
 *
 * @param list the list's variable, changed to the new list. Pointers into the old one are no longer
 *             valid.
 * @param n    the number of entries, negative to count them.
 * @param pos  the position of the entry to keep, below the number of entries.
 * @return 1, the number of entries now. Needs no memory and cannot fail.
 * @par Thread safety
 *   Safe while no other thread uses the list.
 */
ZV_API int zv_strlist_reduce(char*** list, int n, int pos);

/** @} */

/* ================================================================================================
 * Paths
 */

/**
 * @defgroup paths Paths
 * One path algebra for DOS, UNC and UNIX paths, on every platform.
 *
 * A canonical path is separated by `/` alone. Its root is `X:/`, `/` or `//server/share/`, and
 * apart from a root it ends with no separator. zv_normalize_path() makes one of what a user wrote;
 * the other functions expect one and take a backslash for an ordinary character. Only
 * zv_normalize_path(), the path map and the search path look beyond the text.
 *
 * At most 319 characters of a path take part. The calls of Windows itself end at 259, unless the
 * application's manifest asks for long paths.
 *
 * @code
 * char path[ZV_PATH_MAX] = "notes\\drafts\\..\\todo.txt";
 * char folder[ZV_PATH_MAX];
 * if (zv_normalize_path(path) && zv_extract_directory(path, folder, sizeof folder)) puts(folder);
 * puts(path);                            // prints notes notes/todo.txt
 * @endcode
 * @{
 */

/**
 * Tell whether a path has the DOS form: any first character, then `:`.
 *
 * `X:` and `X:name`, which are relative to the current folder of a drive, have it too.
 *
 * @param path the path.
 * @return 1 if it has, else 0.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_ispath_DOS(const char* path);

/**
 * Tell whether a path has the UNC form: `//`, a server, `/` and the first character of a share.
 *
 * @param path the path.
 * @return 1 if it has, else 0: `//server`, `//server/` and `///x` have none of the forms.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_ispath_UNC(const char* path);

/**
 * Tell whether a path has the UNIX form: one `/` in front and no second one.
 *
 * @param path the path.
 * @return 1 if it has, else 0.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_ispath_UNIX(const char* path);

/**
 * Tell whether a path is relative: it begins with no `/` and has no `:` as its second character.
 *
 * @param path the path.
 * @return 1 if it is, also for the empty path; 0 if not, also for `X:name`.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_ispath_relative(const char* path);

/**
 * Tell whether a path is a root: `X:/`, `/`, or `//server/share` with or without one `/` after it.
 *
 * @param path the path.
 * @return 1 if it is, else 0: `X:` alone is none.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_ispath_root(const char* path);

/**
 * Find the last separator.
 *
 * @param path the path.
 * @return the last `/` in `path`, or its terminating NUL when there is none.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API char* zv_slash(const char* path);

/**
 * Find the extension of the last component.
 *
 * A dot starts an extension unless it is the first or the last character of its name: `.profile`
 * and `name.` have none, and `a.tar.gz` has `.gz`.
 *
 * @param path the path.
 * @return the dot in `path`, or its terminating NUL when there is no extension.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API char* zv_dot(const char* path);

/**
 * End a path with a separator.
 *
 * @param path the path, in a buffer with room for one more character.
 * @return 1 if a `/` was appended; 0 if the path is empty or ended with one.
 * @par Thread safety
 *   Safe from any thread, for distinct buffers.
 */
ZV_API int zv_add_slash(char* path);

/**
 * Remove the separators at the end of a path that is no root, and give a UNC root its own.
 *
 * Whether the path is a root is looked at once, before anything is removed: `X://` becomes `X:`.
 *
 * @param path the path, in a buffer with room for one more character.
 * @return how many separators were removed; 1 if one was appended to a UNC root; 0 if nothing
 *         changed.
 * @par Thread safety
 *   Safe from any thread, for distinct buffers.
 */
ZV_API int zv_trim_slash(char* path);

/**
 * Split a path in place into its pieces, each ended by a NUL, with an empty piece after the last.
 *
 * The first piece of an absolute path is its root with its separator: `X:/a/b` becomes `X:/`, `a`
 * and `b`. `X:` and `X:name` have no root and split as a relative path does. An empty piece ends
 * the sequence, so that what follows a doubled separator is lost. zv_strlist() with the separator
 * 0 makes a list of the pieces.
 *
 * @param path the path, in a buffer with room for two more characters.
 * @par Thread safety
 *   Safe from any thread, for distinct buffers.
 */
ZV_API void zv_split_path(char* path);

/**
 * Take out the folder that a path lies in.
 *
 * A root is its own folder, and a path that ends with `.` or `..` is taken whole. Separators at the
 * end do not count. At most 319 characters of the path take part.
 *
 * @param path the path.
 * @param out  receives the folder, cut to `size` - 1 characters; may be `path` itself.
 * @param size bytes in `out`.
 * @return 1 if `out` is not empty, else 0: a lone name lies in no folder.
 * @par Thread safety
 *   Safe from any thread, for distinct buffers.
 */
ZV_API int zv_extract_directory(const char* path, char* out, size_t size);

/**
 * Take out the last component of a path.
 *
 * Separators at the end do not count. At most 319 characters of the path take part.
 *
 * @param path the path.
 * @param out  receives the name, cut to `size` - 1 characters; may be `path` itself.
 * @param size bytes in `out`.
 * @return 1 if `out` is not empty, else 0: a root, `.` and `..` are no names.
 * @par Thread safety
 *   Safe from any thread, for distinct buffers.
 */
ZV_API int zv_extract_filename(const char* path, char* out, size_t size);

/**
 * Take out the extension that zv_dot() finds, with its dot.
 *
 * @param path the path.
 * @param out  receives the extension, cut to `size` - 1 characters; may be `path` itself.
 * @param size bytes in `out`.
 * @return 1 if `out` is not empty, else 0.
 * @par Thread safety
 *   Safe from any thread, for distinct buffers.
 */
ZV_API int zv_extract_extension(const char* path, char* out, size_t size);

/**
 * Bring a path as somebody wrote it into canonical form, in place.
 *
 * In this order: white space at both ends goes and each backslash becomes `/`; doubled separators
 * and "." components after a separator go, but not a "." that the path begins with; `X:` and
 * `X:name` are completed with the current folder of that drive, and `/name` with the current drive;
 * each ".." cancels the component before it; a first component `~` becomes the home folder; each
 * component `%NAME%` or `$NAME` becomes the value of that variable of the process environment, with
 * its backslashes turned and the separator at its end removed.
 *
 * A value is not normalised again, and since ".." has worked before, `%TEMP%/../x` is `x`. At most
 * 319 characters of a value count: a longer one is cut without a word. `~name` is an ordinary
 * component. On Linux, where there are no drives, `/name` stays as it is and `X:`
 * and `X:name` fail; `X:/name` is text there and stays.
 *
 * @param path the path, in a buffer of #ZV_PATH_MAX bytes.
 * @return 1, `path` being normal, and empty where nothing is left of it; 0 on failure, `path` being
 *         empty: the drive is not there, the path climbs above its root, there is no home folder,
 *         or the result has more than 319 characters. 0 also for a variable that is not set: then
 *         the components before it stand in `path`.
 * @par Thread safety
 *   Safe from any thread, for distinct buffers, while none changes the process environment, a
 *   current folder or the locale.
 */
ZV_API int zv_normalize_path(char* path);

/**
 * Make a relative path absolute.
 *
 * Only the text is looked at: "." and ".." in front of the path are worked off against the base,
 * and those after its first other component stay where they are. The path is not tested for being
 * relative, and an absolute one would be appended like any component: ask zv_ispath_relative()
 * first.
 *
 * @param path the path, in canonical form.
 * @param base the folder it is relative to, in canonical form; NULL for the working directory.
 * @param out  receives the result, cut to `size` - 1 characters; may be `path` itself.
 * @param size bytes in `out`.
 * @return 1 if `out` is not empty; 0 on failure: the path climbs above the base's root and `out` is
 *         empty, or `out` is untouched because the base is empty, the working directory cannot be
 *         had or the result has more than 319 characters.
 * @par Thread safety
 *   Safe from any thread, for distinct buffers; without a base while none changes the working
 *   directory.
 */
ZV_API int zv_absolute(const char* path, const char* base, char* out, size_t size);

/**
 * Express a path relative to a folder.
 *
 * Only the text is looked at, without regard to case. Two shares of one server count as two folders
 * of one root. A relative path can be expressed relative to another with which it shares its first
 * component.
 *
 * @param path the path, in canonical form.
 * @param base the folder, in canonical form; NULL for the working directory.
 * @param out  receives the result, cut to `size` - 1 characters; may be `path` itself.
 * @param size bytes in `out`.
 * @return 1, `out` being empty where the path is the base itself; 0 on failure, `out` holding a
 *         copy of the path: the two share no root, one of them is empty, the working directory
 *         cannot be had or the result has more than 319 characters.
 * @par Thread safety
 *   Safe from any thread, for distinct buffers, while none changes the locale; without a base while
 *   none changes the working directory either.
 */
ZV_API int zv_relative(const char* path, const char* base, char* out, size_t size);

/**
 * Record in the path map that the files of one folder now lie in another.
 *
 * The last component of both arguments is dropped: they name files, or folders whose parents are
 * meant. A new target replaces the one that was recorded for the same folder, byte for byte.
 *
 * @param from a path in the former folder, in canonical form. With no folder in it the record is
 *             kept but never used.
 * @param to   a path in the new folder, in canonical form; with no folder in it the working
 *             directory is meant, as it is now.
 * @return 1 if something was recorded; 0 if the folders are the same or the record was there
 *         already, and on failure: memory ran out or the working directory cannot be had.
 * @par Thread safety
 *   Safe from any thread: holds the path map's own lock. Without a folder in `to`, while none
 *   changes the working directory.
 */
ZV_API int zv_pathmap(const char* from, const char* to);

/**
 * Forget all records of the path map.
 *
 * @par Thread safety
 *   Safe from any thread: holds the path map's own lock.
 */
ZV_API void zv_pathmap_clear(void);

/**
 * Find a file that may have moved.
 *
 * A path that exists is left alone. Otherwise each record is tried, oldest first: the path's folder
 * is taken relative to the record's former folder, without regard to case, and looked for at the
 * same place from the new one. That holds above the former folder too: after `D:/data/in` has
 * become `E:/x/in`, `D:/data/other` is looked for as `E:/x/other`. A lone name is never redirected,
 * and a candidate of more than 319 characters is passed over.
 *
 * @param path the path, in canonical form, in a buffer of #ZV_PATH_MAX bytes.
 * @return 1 if the path exists, or now names the first candidate that does; 0 if none exists,
 *         `path` being unchanged.
 * @par Thread safety
 *   Safe from any thread, for distinct buffers, while none changes the locale: holds the path map's
 *   own lock while the candidates are looked for on disk.
 */
ZV_API int zv_pathmap_locate(char* path);

/**
 * List the folders of the search path, the variable `PATH` of the process environment.
 *
 * Its elements are separated by `;`, on Linux by `:` where the value holds no `;`. They come in
 * their order with `/` as the separator, a last `/` kept, and on Windows in their long form. An
 * element that has none stays as written, and an empty element stays empty.
 *
 * @param list receives the list, to be given back with zv_strlist_free().
 * @return how many folders; 0 when the variable is not set or empty or memory ran out, `list` being
 *         untouched.
 * @par Thread safety
 *   Safe from any thread while none changes the process environment.
 */
ZV_API int zv_pathlist(char*** list);

/**
 * Find a file by its name in the folders of the search path, in their order.
 *
 * Only the last component of the path counts; without one, as in a root, the first folder that
 * exists is itself found. The working directory is not searched, no extension is added, and a
 * folder of that name counts as found. A candidate of more than 319 characters is passed over.
 *
 * @param path the name, in a buffer of #ZV_PATH_MAX bytes.
 * @return 1 if `path` now names the first that exists; 0 if none does, `path` being unchanged.
 * @par Thread safety
 *   Safe from any thread, for distinct buffers, while none changes the process environment.
 */
ZV_API int zv_path_locate(char* path);

/** @} */

/* ================================================================================================
 * Host and private environment
 */

/**
 * @defgroup host Host and private environment
 * Who and where the process is, and variables that only this process sees.
 *
 * Folders come back in canonical form. The process environment is read as safely as getenv() reads
 * it, which is not at all while another thread changes it: for settings that threads share there is
 * the private environment.
 *
 * After fork() in a process with threads, the child may call what POSIX calls async-signal-safe,
 * and nothing here: a lock that another thread held at that moment, as that of the private
 * environment, of the path map or of the C library's heap, is never given back in the child.
 *
 * @code
 * char folder[ZV_PATH_MAX];
 * if (zv_tempdir(folder, sizeof folder) == 0) return 1;
 * zv_putenv_private("PLG", "/opt/app/plugins", 0);
 * char* plugins = zv_getenv_private("PLG");
 * if (plugins != NULL) puts(plugins);    // prints /opt/app/plugins
 * zv_free(plugins);
 * @endcode
 * @{
 */

/**
 * Tell the user's home folder: on Windows the documents folder that the registry names, elsewhere
 * the variable `HOME`, or what the user database says where that is not set or empty.
 *
 * @param buf  receives the folder, cut to `size` - 1 characters.
 * @param size bytes in `buf`.
 * @return the folder's length; 0 on failure: the platform names none, or none shorter than
 *         #ZV_PATH_MAX, and `buf` is untouched, or what stands in `buf` is no folder that may be
 *         read and written.
 * @par Thread safety
 *   Safe from any thread while none changes the process environment.
 */
ZV_API size_t zv_homedir(char* buf, size_t size);

/**
 * Tell the folder for temporary files: the variable `TMP`, else `TEMP`, and on Linux else `TMPDIR`.
 *
 * The first of them that is set decides, even where it names no usable folder; an empty one, which
 * a process can inherit on Windows too, counts as not set. On Windows the long form of the folder
 * is given.
 *
 * @param buf  receives the folder, cut to `size` - 1 characters.
 * @param size bytes in `buf`.
 * @return the folder's length; 0 on failure: no variable is set, or that one has 320 characters or
 *         more, and `buf` is untouched, or what stands in `buf` is no folder that may be read and
 *         written.
 * @par Thread safety
 *   Safe from any thread while none changes the process environment.
 */
ZV_API size_t zv_tempdir(char* buf, size_t size);

/**
 * Tell the working directory.
 *
 * @param buf  receives the folder.
 * @param size bytes in `buf`; more than #ZV_PATH_MAX count as that.
 * @return 1; 0 on failure, `buf` being empty: a longer folder is never cut.
 * @par Thread safety
 *   Safe from any thread while none changes the working directory.
 */
ZV_API int zv_getcwd(char* buf, size_t size);

/**
 * Tell the name of the user that the process runs as, "nobody" where the platform tells none.
 *
 * @param buf  receives the name, cut to `size` - 1 characters.
 * @param size bytes in `buf`.
 * @return the length of the text in `buf`; never fails.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API size_t zv_username(char* buf, size_t size);

/**
 * Tell the computer's name, "localhost" where the platform tells none of at most 15 characters.
 *
 * @param buf  receives the name, cut to `size` - 1 characters.
 * @param size bytes in `buf`.
 * @return the length of the text in `buf`; never fails.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API size_t zv_hostname(char* buf, size_t size);

/**
 * Set, append to or remove a variable of the private environment, or clear it.
 *
 * Names are looked up as a whole and without regard to case, as the locale has it when the first
 * variable is made: a later change of the locale changes nothing until all variables are removed.
 * The process environment is neither read nor changed. The library itself reads the variables that
 * name plugin folders (see @ref plugin).
 *
 * @param name   the variable, or NULL to remove all of them.
 * @param value  the value, or NULL to remove the variable, which need not exist.
 * @param append 0 to give the variable this value alone; otherwise the value is added after those
 *               that it has, unless it is one of them.
 * @return 1; 0 when memory ran out, or when the name or the value holds the byte 0x1E. Then nothing
 *         has changed, except that a variable to be set anew is gone when memory ran out.
 * @par Thread safety
 *   Safe from any thread, while none changes the locale: holds the private environment's own lock.
 */
ZV_API int zv_putenv_private(const char* name, const char* value, int append);

/**
 * Read a variable of the private environment.
 *
 * @param name the variable, in any case.
 * @return its values, each ended by a NUL, with one more NUL after the last, so that read as one
 *         text it is the first value: a block to be given back with zv_free(). NULL when there is
 *         no such variable or memory ran out.
 * @par Thread safety
 *   Safe from any thread: holds the private environment's own lock. The block is the caller's own.
 */
ZV_API char* zv_getenv_private(const char* name);

/** @} */

/* ================================================================================================
 * Byte order
 */

/**
 * @defgroup byteorder Byte order
 * Values and arrays with their bytes in the opposite order.
 *
 * Bytes are reversed unconditionally: whether a file's order differs from the machine's is the
 * caller's to know. Twice is the value again, bit for bit.
 *
 * @code
 * uint16_t samples[] = {0x0100, 0x0200};
 * zv_swapv_16(samples, 2);                                 // in place
 * printf("%d %d\n", samples[0], samples[1]);               // prints 1 2
 * printf("%08x\n", (unsigned)zv_swap_uint32(0x7F454C46));  // prints 464c457f
 * @endcode
 * @{
 */

/**
 * Exchange the two bytes of a value.
 *
 * @param value the value.
 * @return its bytes in the opposite order.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int16_t zv_swap_int16(int16_t value);

/**
 * Exchange the two bytes of a value.
 *
 * @param value the value.
 * @return its bytes in the opposite order.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API uint16_t zv_swap_uint16(uint16_t value);

/**
 * Reverse the four bytes of a value.
 *
 * @param value the value.
 * @return its bytes in the opposite order.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int32_t zv_swap_int32(int32_t value);

/**
 * Reverse the four bytes of a value.
 *
 * @param value the value.
 * @return its bytes in the opposite order.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API uint32_t zv_swap_uint32(uint32_t value);

/**
 * Reverse the eight bytes of a value.
 *
 * @param value the value.
 * @return its bytes in the opposite order.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int64_t zv_swap_int64(int64_t value);

/**
 * Reverse the eight bytes of a value.
 *
 * @param value the value.
 * @return its bytes in the opposite order.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API uint64_t zv_swap_uint64(uint64_t value);

/**
 * Reverse the four bytes of a `float`.
 *
 * Nothing is converted: the result may be any bit pattern, a NaN too. A signalling NaN is safe only
 * where the machine passes a `float` unchanged; to swap file contents, swap the bytes in place.
 *
 * @param value the value.
 * @return the `float` whose bytes are those of the value in the opposite order.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API float zv_swap_float(float value);

/**
 * Reverse the eight bytes of a `double`.
 *
 * Nothing is converted: the result may be any bit pattern, a NaN too. A signalling NaN is safe only
 * where the machine passes a `double` unchanged; to swap file contents, swap the bytes in place.
 *
 * @param value the value.
 * @return the `double` whose bytes are those of the value in the opposite order.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API double zv_swap_double(double value);

/**
 * Reverse the bytes of each element of an array of 2-byte elements, in place.
 *
 * @param data  the array, at any address.
 * @param count how many elements; 0 and less touch nothing.
 * @par Thread safety
 *   Safe from any thread, for distinct arrays.
 */
ZV_API void zv_swapv_16(uint16_t* data, int count);

/**
 * Reverse the bytes of each element of an array of 4-byte elements, in place.
 *
 * @param data  the array, at any address.
 * @param count how many elements; 0 and less touch nothing.
 * @par Thread safety
 *   Safe from any thread, for distinct arrays.
 */
ZV_API void zv_swapv_32(uint32_t* data, int count);

/**
 * Reverse the bytes of each element of an array of 8-byte elements, in place.
 *
 * @param data  the array, at any address.
 * @param count how many elements; 0 and less touch nothing.
 * @par Thread safety
 *   Safe from any thread, for distinct arrays.
 */
ZV_API void zv_swapv_64(uint64_t* data, int count);

/**
 * Reverse the bytes of each element of an array, in place.
 *
 * @param data  the array, at any address.
 * @param count how many elements; 0 and less touch nothing.
 * @param size  bytes in an element: 2, 4 or 8. Any other size touches nothing.
 * @par Thread safety
 *   Safe from any thread, for distinct arrays.
 */
ZV_API void zv_swapv(void* data, int count, size_t size);

/** @} */

/* ================================================================================================
 * File streams
 */

/**
 * @defgroup stream File streams
 * The C library's streams, always binary, with offsets of 64 bits, and with conversions on request:
 * blocks with their bytes reversed, lines between CR LF and LF.
 *
 * A stream is the C library's own `FILE*`, so what is not here is done with the C library; on
 * Windows only by a caller that shares the library's C runtime. No function sets an error of its
 * own: `errno` is as the C library left it.
 *
 * @code
 * char line[256];
 * FILE* const in = zv_fopen("notes.txt", "r", NULL);
 * if (in != NULL) {
 *   while (zv_fgets(line, sizeof line, in, 1) != NULL) puts(line);  // prints first second
 *   zv_fclose(in);
 * }
 * @endcode
 * @{
 */

/**
 * Open a file as a binary stream.
 *
 * @param path the file.
 * @param mode as for `fopen`; "r" reads like "rb".
 * @param flag receives 0 when the file could be opened and is untouched when not; may be NULL.
 * @return the stream, to be closed with zv_fclose(); NULL when the file cannot be opened.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API FILE* zv_fopen(const char* path, const char* mode, int* flag);

/**
 * Close a stream. Whether the last bytes could be written is not told: a caller that must know
 * calls `fflush` first.
 *
 * @param fp the stream, or NULL, which does nothing.
 * @return 0, always.
 * @par Thread safety
 *   Safe from any thread, for distinct streams.
 */
ZV_API int zv_fclose(FILE* fp);

/**
 * Read elements.
 *
 * @param buf   receives them; at least `size` * `count` bytes.
 * @param size  bytes in an element.
 * @param count how many elements.
 * @param fp    the stream.
 * @param swap  non-zero to reverse the bytes of each element that was read, as zv_swapv() does it.
 * @return how many whole elements were read, fewer than `count` at the end of the file or on a
 *         failure.
 * @par Thread safety
 *   As `fread`: the stream is locked during the reading.
 */
ZV_API size_t zv_fread(void* buf, size_t size, size_t count, FILE* fp, int swap);

/**
 * Write elements.
 *
 * With `swap` the elements are reversed in the caller's own buffer and back again afterwards, after
 * a failure too: the buffer must be writable, and nobody may look at it meanwhile.
 *
 * @param buf   the elements.
 * @param size  bytes in an element.
 * @param count how many elements.
 * @param fp    the stream.
 * @param swap  non-zero to write each element with its bytes reversed, as zv_swapv() does it.
 * @return how many whole elements were written, fewer than `count` on a failure.
 * @par Thread safety
 *   As `fwrite`: the stream is locked during the writing.
 */
ZV_API size_t zv_fwrite(void* buf, size_t size, size_t count, FILE* fp, int swap);

/**
 * Move the position in a stream.
 *
 * @param fp     the stream.
 * @param offset bytes from the origin.
 * @param origin SEEK_SET, SEEK_CUR or SEEK_END.
 * @return 0, or non-zero on failure.
 * @par Thread safety
 *   As `fseek`.
 */
ZV_API int zv_fseek(FILE* fp, int64_t offset, int origin);

/**
 * Tell the position in a stream.
 *
 * @param fp the stream.
 * @return bytes from the start of the file, or -1 on failure.
 * @par Thread safety
 *   As `ftell`.
 */
ZV_API int64_t zv_ftell(FILE* fp);

/**
 * Skip the rest of a line, its line feed included. An end of file or an error from before is
 * forgotten first.
 *
 * @param fp the stream, or NULL.
 * @return 0; -1 when the file ended in front of a line feed, on a read error and for NULL.
 * @par Thread safety
 *   As `getc`, character by character.
 */
ZV_API int zv_fskip(FILE* fp);

/**
 * Read a line, or as much of it as there is room for.
 *
 * Each piece of a longer line is looked at alone: where its CR and its LF fall into two pieces,
 * both stay.
 *
 * @param buf      receives the text with its line feed; the rest of the buffer is zero.
 * @param size     bytes in `buf`, at least 1.
 * @param fp       the stream.
 * @param strip_cr non-zero to turn a CR LF at the end of the text into LF.
 * @return `buf`, or NULL at the end of the file and on failure.
 * @par Thread safety
 *   As `fgets`.
 */
ZV_API char* zv_fgets(char* buf, int size, FILE* fp, int strip_cr);

/**
 * Write a text.
 *
 * @param s    the text.
 * @param fp   the stream.
 * @param crlf non-zero to write CR LF for each LF, whether or not a CR stands in front of it.
 * @return 0, or -1 when not all could be written: then a part of it may have been.
 * @par Thread safety
 *   As `fwrite`; with `crlf` other threads' output may come between.
 */
ZV_API int zv_fputs(const char* s, FILE* fp, int crlf);

/** @} */

/* ================================================================================================
 * Directories
 */

/**
 * @defgroup directory Directories
 * What a folder holds: one name after another, or a list of all that a filter lets through, with or
 * without the folders below it.
 *
 * A folder's path is written with `/`; on Linux a `\` is part of a name, as it is in the names that
 * are handed out. Names come in the platform's order, which is no order. A path with its NUL takes
 * at most #ZV_PATH_MAX bytes: nothing longer is ever handed out, and a scan that meets one fails.
 *
 * @code
 * const dirsel_t images = {NULL, "*.png;*.jpg", ";", 0, 0};
 * char** list;
 * int n = zv_dir_scan("album", &list, (dir_filter_t)zv_dir_select, (void*)&images, 1, 1);
 * if (n < 0) return 1;
 * printf("%d pictures, such as %s\n", n, n > 0 ? list[0] : "none");
 * zv_strlist_free(list, n);
 * @endcode
 * @{
 */

/**
 * Decides whether an entry goes into the list of a scan.
 *
 * A filter must return: neither an exception nor longjmp() may leave it, for the library undoes
 * nothing on their way.
 *
 * @param dir  the folder being scanned: the text that zv_dir_scan() was given or, below it, a
 *             folder's full path without a separator at its end.
 * @param name the entry's name in that folder.
 * @param user what the caller of zv_dir_scan() passed along.
 * @return non-zero for an entry that goes into the list. A folder is scanned either way.
 */
typedef int (*dir_filter_t)(const char* dir, const char* name, void* user);

/** What zv_dir_select() selects. The texts belong to the caller and are only read. */
typedef struct dirsel_t {
  const char* dir_patterns;  /**< patterns for directories; NULL or empty selects none */
  const char* file_patterns; /**< patterns for all other entries; NULL or empty selects none */
  const char* separators;    /**< NULL: each text above is one pattern; empty: each is a sequence of
                                  NUL-terminated patterns that an empty one ends; else the characters
                                  that part the patterns, of which 319 characters take part */
  int show_hidden;           /**< 0: an entry with the hidden attribute is never selected */
  int match_case;            /**< 0: names and patterns are compared in lower case */
} dirsel_t;

/**
 * Start to read a folder.
 *
 * All entries are reported, `.` and `..` among them, unless the platform leaves some out.
 *
 * @param dir  the folder; empty means the current one.
 * @param name receives the first name, cut to `size` bytes with its NUL; untouched on failure.
 * @param size bytes in `name`.
 * @return a handle that zv_dir_close() must get back; -1 when the folder cannot be read.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API intptr_t zv_dir_readfirst(const char* dir, char* name, size_t size);

/**
 * Read the next name of a folder.
 *
 * @param handle the handle that zv_dir_readfirst() gave, or -1.
 * @param name   receives the name, cut to `size` bytes with its NUL; untouched when there is none.
 * @param size   bytes in `name`.
 * @return 1, or 0 at the end, on a failure and for the handle -1.
 * @par Thread safety
 *   Safe from any thread, for distinct handles.
 */
ZV_API int zv_dir_readnext(intptr_t handle, char* name, size_t size);

/**
 * End the reading of a folder, at its end or before.
 *
 * @param handle the handle, no longer valid afterwards; -1 does nothing.
 * @return -1, always, to be stored as the handle.
 * @par Thread safety
 *   Safe from any thread, for distinct handles.
 */
ZV_API intptr_t zv_dir_close(intptr_t handle);

/**
 * List what a folder holds, itself and its parent left out, each folder in front of its content.
 *
 * A folder that is missing or cannot be opened, for want of a right or of descriptors, of which
 * each level takes one, holds nothing, and one whose reading fails on the way what was read of it;
 * that is no failure. Of a folder that may be read but not searched the names are listed, and
 * nothing below it. A symbolic link is an entry and is never followed, except where `dir` itself is
 * one.
 *
 * @param dir       the folder; empty means the current one.
 * @param list      receives the list, to be given back with zv_strlist_free(); NULL on failure.
 * @param filter    decides about each entry, or NULL to list all.
 * @param user      passed on to `filter`.
 * @param full_path 0 for bare names, else `dir`, a `/` and the name.
 * @param recursive 0 for this folder alone, else with all folders below it, as full paths.
 * @return how many names `list` has. -1 when memory ran out, a path was too long or an entry could
 *         not be examined; before the first name was stored these give 0 and an empty list.
 * @par Thread safety
 *   Safe from any thread, as far as `filter` is.
 */
ZV_API int zv_dir_scan(const char* dir, char*** list, dir_filter_t filter, void* user,
                       int full_path, int recursive);

/**
 * Tell whether an entry is one that a selection asks for. Cast to #dir_filter_t it is a filter for
 * zv_dir_scan(), with the selection as `user`.
 *
 * Patterns are those of zv_strpat(). A symbolic link is what its target is.
 *
 * @param dir  the folder.
 * @param name the entry's name in it.
 * @param sel  the selection; NULL selects everything, even what does not exist.
 * @return 1 when the entry is selected; 0 when not, when it does not exist, when its path is too
 *         long and for a name that is NULL or empty.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_dir_select(const char* dir, const char* name, const dirsel_t* sel);

/** @} */

/* ================================================================================================
 * File status and trees
 */

/**
 * @defgroup status File status
 * One path on the file system: what it is, who may use it, whether it is hidden.
 *
 * Paths are written with `/` or `\`, whichever comes to hand, on every platform. On Linux, where a
 * `\` may be part of a name, a path that exists as it is written is taken so, and `\` is read as
 * `/` only in any other: a name that a scan handed out means itself. Nothing is printed; a failure
 * leaves `errno` (or the platform's last error) as the failing call set it.
 *
 * @code
 * struct _stat64 st;
 * if (zv_stat("data\\input.txt", &st) == 0 && (st.st_mode & 0xF000) == 0x8000)
 *   printf("%lld bytes\n", (long long)st.st_size);  // prints 5 bytes
 * @endcode
 * @{
 */

/**
 * Test whether a path exists and may be used.
 *
 * @param path the path.
 * @param mode 0 tests that it exists, 2 that it may be written, 4 that it may be read, 6 both. Bit
 *             0 is ignored: whether a file may be run is never tested.
 * @return 0 when the access is possible, -1 when not.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_access(const char* path, int mode);

/**
 * Read the status of a path. A symbolic link is followed: the status is its target's.
 *
 * @param path the path.
 * @param st   receives the status: among others the size in bytes in `st_size` and the kind in
 *             `st_mode & 0xF000`, 0x4000 for a directory and 0x8000 for a regular file.
 * @return 0, or -1 when the path does not exist or cannot be reached.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_stat(const char* path, struct _stat64* st);

/**
 * Create one directory. Its parent must exist; zv_mkpath() makes a whole chain.
 *
 * @param path the directory.
 * @return 0, or -1 on failure, which a path that exists already is too.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_mkdir(const char* path);

/**
 * Tell whether a file or a directory has the hidden attribute.
 *
 * The attribute is the platform's own on Windows. On Linux it is bit 2 of the extended attribute
 * `user.DOSATTRIB`, hex text such as `0x2`, the form that file servers and Windows emulators keep
 * there. A name that begins with a dot is not hidden for that.
 *
 * @param path the path.
 * @return 1 when it is hidden; 0 when it is not, does not exist, or lies where no attributes are
 *         kept.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_get_hidden(const char* path);

/**
 * Set or clear the hidden attribute of a file or a directory. All other attributes stay.
 *
 * @param path   the path.
 * @param hidden non-zero to set the attribute, 0 to clear it.
 * @return 1 when the attribute now has the wanted value, which costs no write when it had it
 *         before; 0 when the path does not exist or the attribute cannot be written.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_set_hidden(const char* path, int hidden);

/** @} */

/**
 * @defgroup tree Trees
 * Whole chains of directories made, whole trees removed.
 *
 * Paths are in either separator style, as for zv_stat(), and have at most 319 characters: a longer
 * one is refused, since a cut one would name something else. What was done before a failure stays
 * done.
 *
 * @code
 * if (zv_mkfile("out/report/summary.txt")) puts("out/report is there, and an empty file in it");
 * if (zv_rmpath("out")) puts("and all of it is gone");
 * @endcode
 * @{
 */

/**
 * Create every directory of a path that does not exist yet.
 *
 * What exists already is passed over, whatever it is: a file as the last piece too, while a file in
 * front of another piece makes the creation of that one fail. A doubled separator inside the path
 * ends it, as for zv_split_path().
 *
 * @param path the path; the empty one asks for nothing.
 * @return 1 when all of it exists afterwards; 0 otherwise, `errno` telling what failed:
 *         ENAMETOOLONG for a path of more than 319 characters.
 * @par Thread safety
 *   Safe from any thread, also for paths with common parts.
 */
ZV_API int zv_mkpath(const char* path);

/**
 * Create an empty file, and the directories that lead to it as zv_mkpath() does. A file that exists
 * already is emptied.
 *
 * @param path the file.
 * @return 1 when the file is there and empty; 0 otherwise, with `errno` as zv_mkpath() sets it.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_mkfile(const char* path);

/**
 * Remove a directory with everything below it.
 *
 * The tree is listed first, and nothing is removed when it cannot be listed, as when the path of an
 * entry would have more than 319 characters; then entries are removed from the last to the first,
 * and the first that cannot be removed ends it. Entries that vanished meanwhile are passed over.
 * There is no roll-back. Hidden entries are removed like others; a read-only file stops it where
 * the platform protects such files.
 *
 * A root, a drive (`X:`, `X:/`, `//./X:`) and a path whose last component is `.` or `..` are
 * refused.
 *
 * Links are never followed: a link in the tree is removed itself, and a link in place of the
 * directory, with or without a separator after it, gives 0. On Linux a directory that is swapped
 * for a link meanwhile does not lead the removal outside the tree either.
 *
 * @param path the directory.
 * @return 1 when all of it was removed, 0 otherwise and for a path of more than 319 characters.
 * @par Thread safety
 *   Safe from any thread; what others create in the tree meanwhile makes it give 0.
 */
ZV_API int zv_rmpath(const char* path);

/** @} */

/* ================================================================================================
 * Dynamic libraries and plugins
 */

/**
 * @defgroup dll Dynamic libraries
 * Open a library, find a symbol in it and close it, the same way on both platforms.
 *
 * A path may be written in either separator style, and the extension that is added is ".dll" on
 * every platform. A library is code: opening it runs its start-up with the caller's rights.
 *
 * @code
 * typedef int (*codec_t)(void);
 * void* lib = zv_dll_open("codecs/fast", 0);                 // codecs/fast.dll
 * void* symbol = zv_dll_getptr(lib, "codec", "%s_v2");       // codec_v2
 * if (symbol == NULL) return 1;
 * codec_t codec;
 * memcpy(&codec, &symbol, sizeof codec);                     // C knows no cast to a function
 * printf("version %d\n", codec());                           // prints version 2
 * lib = zv_dll_close(lib);
 * @endcode
 * @{
 */

/**
 * Open a dynamic library.
 *
 * A path without a directory is looked for where the platform looks; on Windows, a library with an
 * absolute path finds the libraries that lie beside it. Each open needs its own zv_dll_close(). On
 * Linux the library's symbols are all bound at once and stay its own (`RTLD_NOW | RTLD_LOCAL`), and
 * a path that leads to a pipe, or to a library whose end is missing or still zeros, is refused
 * rather than tried.
 *
 * @param path    the library's path; with its extension it has at most 319 characters.
 * @param has_ext 0 to add ".dll", also to a path that ends with it already; otherwise the path is
 *                used as it is.
 * @return the library's handle; -1 (all bits set), and never NULL, when it cannot be loaded.
 * @par Thread safety
 *   Safe from any thread; the platform's loader takes turns.
 */
ZV_API void* zv_dll_open(const char* path, int has_ext);

/**
 * Find a symbol of a library. On Linux, the libraries that it needs are searched after it.
 *
 * @param lib  a handle from zv_dll_open().
 * @param name the symbol's name.
 * @param fmt  how the name is decorated: the first "%s" stands for the name and everything else is
 *             copied as it stands, any other `%` included, so that a template can do no harm. NULL
 *             and "" stand for "%s".
 * @return the symbol's address; NULL when the library does not export it, when the decorated name
 *         is longer than 319 characters, or when `lib` is -1.
 * @par Thread safety
 *   Safe from any thread while the library stays open.
 */
ZV_API void* zv_dll_getptr(void* lib, const char* name, const char* fmt);

/**
 * Close a library.
 *
 * Nothing in it may be used afterwards, unless it was opened more than once.
 *
 * @param lib a handle from zv_dll_open(), or -1, which does nothing.
 * @return -1, always, to be stored in the variable that held the handle.
 * @par Thread safety
 *   Safe from any thread, as long as none uses the library.
 */
ZV_API void* zv_dll_close(void* lib);

/** @} */

/**
 * @defgroup plugin Plugins
 * Find the libraries that serve an API, agree on its version with each, load and unload them.
 *
 * An API is a name that the host chooses, such as "img" or "img.reader". Its plugins are the files
 * `img_*.dll` (on every platform) in one folder, which the host names in the private environment
 * under the API's base name, the part before the first dot. Each exports one function, `zv_plugin`
 * (#zv_plugin_entry_t), which answers the API and the range of versions that the host speaks with a
 * descriptor (#plugin_t) or with the reason why not. For each plugin that accepts, the host gets a
 * record (#zv_plugin_t), which keeps the plugin's formats also while its library is unloaded.
 *
 * A plugin is code and runs with the host's rights: name a folder that only trusted users can write
 * to. Name it by an absolute path, as one value, and only when there is one: an empty value means
 * the working folder, a relative one is found from there, and of several values only the first
 * counts. `~`, `%NAME%` and `$NAME` in it are replaced from the process environment, as
 * zv_normalize_path() does it, so a host that is started by others leaves them out.
 *
 * @code
 * typedef struct img_api_t { int (*width)(const char* path); } img_api_t;  // both sides know it
 *
 * zv_plugin_t** plugins = NULL;
 * zv_putenv_private("img", "plugins", 0);
 * zv_plugin_enumerate(&plugins, "img", 1, 5, 0);                 // loads, asks and unloads each
 * if (plugins == NULL) return 1;
 * zv_plugin_t* reader = zv_plugin_get_entry_by_fmt(plugins, "photo.png");
 * if (reader != NULL && zv_plugin_load(reader)) {
 *   img_api_t* img = (img_api_t*)reader->plugin->api_entry;
 *   printf("%d pixels wide\n", img->width("photo.png"));         // prints 640 pixels wide
 *   zv_plugin_unload(reader);
 * }
 * for (int i = 0; plugins[i] != NULL; ++i) zv_plugin_destroy(plugins[i]);
 * zv_free(plugins);
 * @endcode
 *
 * The plugin's side, as a whole source file:
 *
 * @code
 * typedef struct img_api_t { int (*width)(const char* path); } img_api_t;
 *
 * static int width(const char* path) { return path[0] != '\0' ? 640 : 0; }
 * static plugin_t* release(plugin_t* self) { (void)self; return NULL; }
 * static const char* formats(void) { return "PNG image|.png|\0"; }
 * static img_api_t functions = {width};
 * static plugin_t descriptor = {release, formats, &functions};
 *
 * ZV_PLUGIN_EXPORT plugin_t* zv_plugin(const char* api, int min, int max, int* code);
 *
 * ZV_PLUGIN_EXPORT plugin_t* zv_plugin(const char* api, int min, int max, int* code) {
 *   if (strcmp(api, "img") != 0) {
 *     *code = ZV_PLUGIN_E_API;
 *     return NULL;
 *   }
 *   return zv_plugin_match_vers(min, max, 1, 2, code) ? &descriptor : NULL;
 * }
 * @endcode
 * @{
 */

#if defined(_WIN32)
/** What makes a symbol of a plugin's library visible to the host. */
#define ZV_PLUGIN_VISIBLE __declspec(dllexport)
#elif defined(__GNUC__)
#define ZV_PLUGIN_VISIBLE __attribute__((visibility("default")))
#else
#define ZV_PLUGIN_VISIBLE
#endif
#ifndef __cplusplus
/** Stands before the definition of a plugin's `zv_plugin`, in C and in C++. */
#define ZV_PLUGIN_EXPORT ZV_PLUGIN_VISIBLE
#else
#define ZV_PLUGIN_EXPORT extern "C" ZV_PLUGIN_VISIBLE
#endif

/** Why there is no plugin. A code of 0 or more is a version, and other negative ones are the
 *  plugin's own. */
enum zv_plugin_error {
  ZV_PLUGIN_E_MEMORY = -9,     /**< memory ran out */
  ZV_PLUGIN_E_ARGUMENTS = -8,  /**< a NULL, a range such as 3 to 2, a library name with folders */
  ZV_PLUGIN_E_NOT_FOUND = -7,  /**< no such folder or file, or a path that is too long */
  ZV_PLUGIN_E_LOAD = -6,       /**< not a library, or one that the platform refuses to load */
  ZV_PLUGIN_E_ENTRY = -5,      /**< the library does not export `zv_plugin` */
  ZV_PLUGIN_E_API = -4,        /**< said by the plugin: it does not serve this API */
  ZV_PLUGIN_E_DESCRIPTOR = -2, /**< the descriptor lacks one of its three fields */
  ZV_PLUGIN_E_SILENT = -1      /**< the plugin refused without saying why */
};

typedef struct plugin_t plugin_t;

/**
 * A plugin's descriptor, which lies in the plugin's memory and lives while its library is loaded.
 *
 * None of the three fields may be NULL. Fields of the API's own may follow them. Neither function
 * may throw or otherwise leave through the library: the plugin would stay loaded for good.
 */
struct plugin_t {
  /** Called once before the library is let go, with the descriptor; returns NULL. */
  plugin_t* (*release)(plugin_t* self);
  /** The plugin's format entries (see @ref format) as a zero-separated sequence, "" for none. */
  const char* (*formats)(void);
  /** The API's own functions or data, in whatever form host and plugin agreed on. */
  void* api_entry;
};

/**
 * A plugin that accepted its host: where it lies, what was agreed and whether it is loaded.
 *
 * The host reads it and leaves every change to the functions below.
 */
typedef struct zv_plugin_t {
  char* dir;        /**< the folder of the library, absolute */
  char* lib;        /**< the library's file name */
  char** formats;   /**< a string list of its format entries, kept while the library is unloaded */
  char* api;        /**< the API's name */
  int version;      /**< the agreed version; each load stores the plugin's answer anew */
  int refs;         /**< how often it is loaded; 0: not at all */
  void* module;     /**< the library's handle, as zv_dll_open() gives it; -1 while not loaded */
  plugin_t* plugin; /**< the descriptor; while not loaded, what `release` returned */
} zv_plugin_t;

/**
 * The entry that a plugin's library exports under the name `zv_plugin`.
 *
 * It must not throw: nothing is released when a call leaves through the library. It may call its
 * host, which may use its arrays and records meanwhile, but for the record that is being loaded.
 *
 * @param api  the API that the host asks for.
 * @param min  the oldest version that the host speaks.
 * @param max  the newest version that the host speaks, not below `min`.
 * @param code receives the agreed version, or the reason of a refusal: #ZV_PLUGIN_E_API, the
 *             version that the plugin could offer instead (zv_plugin_match_vers() finds either), or
 *             a negative number of its own. It is -1 before the first call; when a plugin is loaded
 *             again, it is the agreed version, and `min` and `max` are that version as well.
 * @return the descriptor, or NULL to refuse.
 */
typedef plugin_t* (*zv_plugin_entry_t)(const char* api, int min, int max, int* code);

/**
 * Load a plugin and make its record.
 *
 * A plugin that is not accepted has been released and its library closed.
 *
 * @param dir  the folder of the library: normalised, and made absolute from the working directory.
 * @param lib  the library's file name, without folders.
 * @param api  the name of the API.
 * @param min  the oldest version that the host speaks, 0 or more.
 * @param max  the newest version that the host speaks, not below `min`.
 * @param code receives the agreed version; on failure a #zv_plugin_error or what the plugin
 *             answered: the version it could offer, or a negative number of its own. May be NULL.
 * @return the record, loaded once, to be given back with zv_plugin_destroy(); NULL when the plugin
 *         was not accepted or memory ran out.
 * @par Thread safety
 *   Safe from any thread, as far as the plugin's entry is, while none changes the process
 *   environment, the locale or, for a relative `dir`, the working directory.
 */
ZV_API zv_plugin_t* zv_plugin_create(const char* dir, const char* lib, const char* api, int min,
                                     int max, int* code);

/**
 * Give a record back, in whatever state it is.
 *
 * A plugin that is loaded, however often, is released once and its library closed once.
 *
 * @param rec the record, or NULL, which does nothing.
 * @return 0, always.
 * @par Thread safety
 *   Safe from any thread, for distinct records.
 */
ZV_API int zv_plugin_destroy(zv_plugin_t* rec);

/**
 * Load a plugin's library, unless it is loaded already, and count the load.
 *
 * The plugin is asked for exactly the version that it agreed to; `rec->version` receives its
 * answer, also when it refuses.
 *
 * @param rec the record, or NULL.
 * @return 1 when the plugin is loaded, which needs its own zv_plugin_unload(); 0 when the library
 *         or its entry is not there any more, when the plugin refuses or lacks a field of its
 *         descriptor, or for NULL.
 * @par Thread safety
 *   Safe from any thread, for distinct records.
 */
ZV_API int zv_plugin_load(zv_plugin_t* rec);

/**
 * Undo one load: the last one releases the plugin and closes its library.
 *
 * The record keeps its texts and formats. Unloading what is not loaded is not tested for.
 *
 * @param rec the record, or NULL.
 * @return 1; 0 for NULL.
 * @par Thread safety
 *   Safe from any thread, for distinct records.
 */
ZV_API int zv_plugin_unload(zv_plugin_t* rec);

/**
 * Add one library to a plugin array.
 *
 * Records are told apart by file name alone, case included: a library whose file name is in the
 * array already counts as added, and nothing is loaded.
 *
 * @param plugins the array: a heap block of records that ends with NULL, or NULL for none yet.
 *                Receives its new address, once the plugin has run: what the plugin had its host
 *                add meanwhile stays. A failure leaves it as it was.
 * @param path    the library's path: normalised, and made absolute from the working directory.
 * @param api     the name of the API.
 * @param min     the oldest version that the host speaks, 0 or more.
 * @param max     the newest version that the host speaks, not below `min`.
 * @param code    receives what zv_plugin_create() stores; #ZV_PLUGIN_E_NOT_FOUND when the library
 *                was in the array already. May be NULL.
 * @param keep    0 to unload the plugin at once.
 * @return 1 when the library is in the array, 0 when it is not. Destroy each record, then give the
 *         array back with zv_free().
 * @par Thread safety
 *   Safe from any thread, for distinct arrays and as far as the plugin's entry is, while none
 *   changes the process environment, the locale or, for a relative `path`, the working directory.
 */
ZV_API int zv_plugin_add_lib(zv_plugin_t*** plugins, const char* path, const char* api, int min,
                             int max, int* code, int keep);

/**
 * Find the version that a host and a plugin both speak: the plugin's answer to its host.
 *
 * @param min     the oldest version that the host speaks.
 * @param max     the newest version that the host speaks.
 * @param oldest  the oldest version that the plugin speaks.
 * @param newest  the newest version that the plugin speaks.
 * @param version receives the newest version that both speak; when there is none, the plugin's
 *                version that is nearest to the host's.
 * @return 1 when there is one, 0 when there is none.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_plugin_match_vers(int min, int max, int oldest, int newest, int* version);

/**
 * Find every plugin of an API.
 *
 * The folder is the value of the private-environment variable named by the API's base name, else of
 * "PLG", else of "LIB". Tried are its files `BASE_*.dll`, whatever their case, in the platform's
 * order, hidden ones left out. Of img_a.dll and its variant with a `d` before the dot, img_ad.dll,
 * only the first is tried.
 *
 * What becomes of each file is reported on standard error:
 *
 *     Testing library img_a.dll for img API...ok
 *     Testing library img_b.dll for img API...
 *             rejected: unsupported version 9
 *
 * with a tab before "rejected", and one of these reasons after it: "memory allocation failed",
 * "invalid function arguments", "library could not be found", "library could not be loaded",
 * "library does not export an zv_plugin function", "plugin does not support requested api",
 * "plugin is not compatible with plugin_t", "plugin did not set an error code",
 * "outdated version N", "unsupported version N", "error code N".
 *
 * @param plugins receives a new array of the accepted records, which ends with NULL; one that it
 *                held is neither used nor freed. Left as it was when there is no folder or no file
 *                to try, or no memory to list them; NULL while the plugins run, and when memory for
 *                the array ran out.
 * @param api     the name of the API. Its base name has 1 to 47 characters.
 * @param min     the oldest version that the host speaks, 0 or more.
 * @param max     the newest version that the host speaks, not below `min`.
 * @param keep    0 to unload each plugin at once.
 * @return how many were accepted. Destroy each record, then give the array back with zv_free().
 * @par Thread safety
 *   Safe from any thread, as far as the plugins' entries are, while none changes the process
 *   environment, the locale or, for a relative folder, the working directory. Holds the private
 *   environment's own lock, but not while plugins run. Reports that are made at the same time mix.
 */
ZV_API int zv_plugin_enumerate(zv_plugin_t*** plugins, const char* api, int min, int max, int keep);

/**
 * Find the record of a library.
 *
 * @param plugins an array of records that ends with NULL, or NULL.
 * @param lib     the library's file name, compared with its case; NULL and "" are never found.
 * @return the first record of that name, which stays the array's; NULL when there is none.
 * @par Thread safety
 *   Safe from any thread while none changes the array.
 */
ZV_API zv_plugin_t* zv_plugin_get_entry_by_lib(zv_plugin_t** plugins, const char* lib);

/**
 * Tell a plugin's file name.
 *
 * @param entry where a record is held, such as an element of an array; -1 for none.
 * @param buf   receives the name, cut silently to `size` - 1 characters; NULL to ask for its
 *              length.
 * @param size  the buffer's size in bytes.
 * @return how many characters `buf` holds, or the name's length when `buf` is NULL; 0 for -1.
 * @par Thread safety
 *   Safe from any thread while none changes the record.
 */
ZV_API size_t zv_plugin_get_lib(zv_plugin_t** entry, char* buf, int size);

/** @} */

/**
 * @defgroup format Formats
 * Match files to plugins by their names, without loading anything.
 *
 * A format entry is a text of fields, each followed by `|`: a description for people, then
 * patterns. `PNG image|.png|.apng|` has two. A pattern that begins with a dot stands for `*` and
 * itself; any other is one of zv_strpat(). The first is the format's default. Patterns are compared
 * with the file name in a path, ignoring case; of a pattern, its added `*` included, 319 characters
 * take part. A field that no `|` closes is not seen, so an entry such as `PNG image|.png` matches
 * nothing.
 *
 * @code
 * const char* pattern;
 * char name[64] = "picture";
 * size_t length = zv_fmt_default("PNG image|.png|.apng|", &pattern);
 * printf("%.*s\n", (int)length, pattern);                             // prints .png
 * zv_fmt_force("PNG image|.png|.apng|", name);
 * puts(name);                                                         // prints picture.png
 * @endcode
 * @{
 */

/**
 * Collect the format entries of all plugins.
 *
 * @param plugins an array of records that ends with NULL, or NULL.
 * @param list    the string list to append copies to; a NULL in it is replaced by a new list.
 * @return how many entries were appended; one that memory ran out for is counted, though it is not
 *         in the list.
 * @par Thread safety
 *   Safe from any thread while none changes the array or the list.
 */
ZV_API int zv_plugin_formats(zv_plugin_t** plugins, char*** list);

/**
 * Find the plugin that handles a file.
 *
 * @param plugins an array of records that ends with NULL, or NULL.
 * @param path    the file's path, with `/`; NULL and "" are never matched. The file need not exist.
 * @return the first record with a pattern that matches the file's name, which stays the array's;
 *         NULL when there is none.
 * @par Thread safety
 *   Safe from any thread while none changes the array.
 */
ZV_API zv_plugin_t* zv_plugin_get_entry_by_fmt(zv_plugin_t** plugins, const char* path);

/**
 * Tell whether a plugin handles a file.
 *
 * @param rec  the record.
 * @param path the file's path, with `/`; NULL and "" are never matched. The file need not exist.
 * @return 1 when one of the record's patterns matches the file's name, else 0.
 * @par Thread safety
 *   Safe from any thread while none changes the record.
 */
ZV_API int zv_plugin_match_fmt(zv_plugin_t* rec, const char* path);

/**
 * Append one entry that covers others: a description, and each of their patterns once, ignoring
 * case.
 *
 * Everything after an entry's first `|` is taken as it stands, so a last pattern that no `|` closes
 * runs into the next entry's first.
 *
 * @param list        the string list of entries. NULL, or one without entries, gives 0.
 * @param count       how many entries to cover, from the first; negative, or more than there are,
 *                    for all.
 * @param description the new entry's description; NULL or "" for "All recognized formats".
 * @return 1 when the entry was appended; 0, with the list as it was, when one of the entries has no
 *         `|` or memory ran out.
 * @par Thread safety
 *   Safe from any thread while none changes the list.
 */
ZV_API int zv_fmt_composite(char*** list, int count, const char* description);

/**
 * Find the default pattern of an entry.
 *
 * @param entry   the format entry.
 * @param pattern receives where the pattern stands in the entry; it ends with its length, not with
 *                a NUL. Left as it was when the entry has no `|`.
 * @return the pattern's length in bytes: up to the next `|` or the entry's end. 0 without a `|`.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API size_t zv_fmt_default(const char* entry, const char** pattern);

/**
 * Give a file name the extension of a format, unless it has one that the format knows.
 *
 * An extension is known when it occurs anywhere in the entry, ignoring case. The default pattern is
 * appended as it is written, so it should be an extension such as `.png`.
 *
 * @param entry the format entry.
 * @param name  the file name, in a buffer with room for the default pattern after it.
 * @return where in `entry` the name's extension stands; `name`, when the default pattern was
 *         appended; NULL when the entry has no default pattern.
 * @par Thread safety
 *   Safe from any thread, for distinct names.
 */
ZV_API char* zv_fmt_force(const char* entry, char* name);

/** @} */

/* ================================================================================================
 * Copying between locations
 */

/**
 * @defgroup transfer Copying between locations
 * One operation that moves one file: between two places on the disk, from or to an FTP or HTTP
 * server, or into a mail.
 *
 * A location is one of these texts; the scheme is read in either case:
 *
 * | Text | Location |
 * |---|---|
 * | `ftp://[user[:password]@]host[:port]/path` | a file on an FTP server, port 21 |
 * | `http://[user[:password]@]host[:port]/path` | a resource of a web server, port 80 |
 * | `smtp://[user[:password]@]host[:port]/recipient` | a mail to an address, port 25 |
 * | `file://path` | a local file; `file:///D:/f` names `D:/f` |
 * | anything else | a local path, in either separator style |
 *
 * The last `@` before the first `/` ends the credentials, so a user may hold one (`u@d:pw@host`).
 * Without a port the credentials divide at their last `:`, with one at their first. In the path
 * after a scheme, `%` and two hexadecimal digits stand for a byte; user, password and plain paths
 * are taken as written. `?` and `#` are characters like others. A host is a name with an IPv4
 * address, or four decimal numbers.
 *
 * @code
 * if (zv_copy("http://example.com/data.bin", "data.bin") != 0) return 1;
 * zv_copy("report.pdf", "ftp://user:pw@example.com/pub/report.pdf");
 * zv_copy("report.pdf", "smtp://me@example.com:pw@mail.example.com/you%40example.org");
 * @endcode
 * @{
 */

/** zv_copy() failed on the side of its source. */
#define ZV_COPY_SOURCE_FAILED (-3)
/** zv_copy() failed on the side of its destination. */
#define ZV_COPY_DESTINATION_FAILED (-4)

/**
 * Copy the contents of one file to another location.
 *
 * - It blocks until the transfer ends or fails; the network has no time limit but the platform's.
 * - Nothing is encrypted: users, passwords and files travel in the clear. An FTP server may name
 *   any address for the data connection, and it is used.
 * - A local destination is emptied before its source is opened on the network, and a failure leaves
 *   it empty or partial. Only a source that is not local or not readable, a directory among them,
 *   or is the destination itself under whatever name, leaves a local destination as it was.
 * - FTP (RFC 959) is passive, binary and anonymous without a user. The server must tell the size
 *   when it starts to send, and a file of 0 bytes cannot be fetched.
 * - HTTP is 1.0 (RFC 1945): GET and PUT, one request without a `Host` line, no redirects. A
 *   response must announce its length, and that must not be 0. A user is sent as Basic
 *   credentials.
 * - A mail (RFC 5321, RFC 2045) carries the file as an attachment under its own name. It comes from
 *   the location's user when that holds an `@`, else from the local user. A user asks for a login.
 *   Addresses and the file's name stand in the mail as they are: no angle brackets are added and
 *   nothing is quoted or encoded. A recipient with a space or a comma, or a name with a quotation
 *   mark or with bytes beyond ASCII, is for the server and the reader to judge.
 * - Between two network locations the file goes through a private folder in the temporary folder,
 *   which is removed. The source's file name must be one that a local file can have, without a
 *   backslash.
 * - No text adds a command or a header line: CR or LF in the user, password or decoded path of a
 *   network location makes it unusable, and a file with one in its name is not mailed.
 *
 * @param from the source: at most 318 characters after the scheme; not `smtp://`. NULL or "" is a
 *             failure of its side.
 * @param to   the destination, likewise.
 * @return 0 when all of the file has arrived and, in a local file, been written and closed.
 *         #ZV_COPY_SOURCE_FAILED (-3) for a source location that is not usable, a local file that
 *         cannot be read, a server that fails or refuses to deliver, and whatever the local machine
 *         lacks beside a local source. #ZV_COPY_DESTINATION_FAILED (-4) likewise for the
 *         destination, which is looked at only once the source location is found usable.
 * @par Thread safety
 *   Safe from any thread.
 */
ZV_API int zv_copy(const char* from, const char* to);

/** @} */

/* ================================================================================================
 * Transfers with a handle
 */

/**
 * @defgroup handle Transfers with a handle
 * A copy between locations that can be limited, watched, stopped and explained.
 *
 * A handle carries what holds for its runs: limits, logins, a function that watches. A run copies
 * one file as zv_copy() does, in the calling thread, and tells afterwards why it failed: by a cause
 * for the program and a reason for a person. There is no thread to start and nothing to end.
 *
 * @code
 * zv_transfer_t* transfer = zv_transfer_create();
 * char reason[200];
 * if (transfer == NULL) return 1;
 * zv_transfer_set(transfer, ZV_TRANSFER_SILENCE, 10000);         // a peer may be silent for 10 s
 * zv_transfer_set(transfer, ZV_TRANSFER_SIZE, 1000000);
 * if (zv_transfer_run(transfer, "missing.txt", "copy.txt") != 0) {
 *   zv_transfer_reason(transfer, reason, sizeof reason);
 *   puts(reason);                        // prints read missing.txt: No such file or directory
 * }
 * zv_transfer_destroy(transfer);
 * @endcode
 *
 * The locations are those of zv_copy(), with these differences:
 *
 * - A text that begins with a scheme (a letter, then letters, digits, `+`, `-` or `.`) and `://`
 *   is refused when that scheme is none of the four, and none of `https://` (port 443), `ftps://`
 *   (990, encrypted from the first byte) and `smtps://` (465). A single letter is a drive.
 * - A text may have 8,192 characters, a local path 319. User and password may hold escapes as the
 *   path may. `%00` is refused, and so is a line end in a network location. The path of an HTTP
 *   location is sent as it is written, without its fragment (`#`), and what a request cannot hold
 *   is escaped.
 * - An IPv6 address stands in brackets (`ftp://[::1]/f`); four numbers of 0 to 255 are an IPv4
 *   address, and anything else is a name, which is looked up for both. Every address is tried, in
 *   the system's order. A port is digits, from 1 to 65535; none after the colon is the default.
 *
 * And so do the protocols:
 *
 * - FTP (RFC 959): the size is asked for (RFC 3659), and a file may be empty. The data connection
 *   goes to the machine of the control connection, whatever address a reply names; over IPv6 it is
 *   asked for by `EPSV` (RFC 2428). An upload that fails resets it, so that the server does not
 *   take the part for a whole file.
 * - HTTP is 1.1 (RFC 9112). A GET takes 200 and 203 and follows five redirects, to `http://` and
 *   `https://`, but never from `https://` to `http://`; the login goes along to the same scheme,
 *   host and port only. A PUT takes any 2xx. A body without a length and without chunks ends with
 *   the connection: that it was cut cannot be noticed then, except where the connection is
 *   encrypted.
 *
 * An encrypted connection speaks TLS 1.2 or later, by the system's own means on Windows and by
 * OpenSSL 3 on Linux: there a run loads `libzarvo_tls.so.1` (package `libzarvo-tls1`) when a
 * location first needs it, and fails before it connects where that is not installed.
 *
 * - The server's certificate must come from an authority that the system trusts (on Linux
 *   `SSL_CERT_FILE` and `SSL_CERT_DIR` say where those are), or that zv_transfer_trust() names; it
 *   must be valid now; and the location's name must stand in its list of names, its address as an
 *   address. A common name does not count, a wildcard holds for one label. Nothing turns this off.
 *   Whether the certificate was revoked is not asked.
 * - No login leaves before that, and nothing is tried again in the clear. The data connection of
 *   `ftps://` is encrypted too (RFC 4217). A second handshake is refused.
 * - On Windows the system may fetch certificates that it lacks, which takes its own time.
 *
 * A local destination takes its place whole: it is written beside that under a private name
 * (`.zv-`, 16 hexadecimal digits, `.part`), closed, and renamed. A failure leaves the old file as
 * it was and nothing else; only a kill leaves the private file, which no run touches again.
 *
 * - A link stays a link, and the file that it leads to is replaced; one that leads nowhere is
 *   refused. What is no regular file, or is reached through `/proc` or `/dev/fd`, is written as it
 *   is.
 * - The file keeps the permission bits, the owner, the group and the access list of the one that it
 *   replaces; on Windows access list and streams are the new file's. A new file has the bits of a
 *   local source, else 0666, less the umask. Nothing is set-user, set-group or sticky.
 * - Refused before any connection (#ZV_CAUSE_LANDING, and the reason names #ZV_TRANSFER_IN_PLACE)
 *   is a destination that the process may not write, that has other hard links, whose owner or
 *   access list cannot be kept, or whose folder does not let it be replaced.
 * - A file that replaces one with content is flushed to the disk before it is renamed.
 *
 * A wait on a connection notices a cancel, the watch and every limit within 250 ms, and a local
 * copy does so every 8 MiB. Looking up a name, opening a pipe and writing to a disk take what the
 * system takes. What comes after the file has its place, or after the server's last good reply,
 * changes nothing.
 * @{
 */

/** What is limited, watched, stopped and explained; made by zv_transfer_create(). */
typedef struct zv_transfer_t zv_transfer_t;

/** What zv_transfer_set() sets. A number is never used again for something else. */
enum zv_transfer_option {
  /** Milliseconds a peer may be silent: a reply has to be complete by then, a body has to move.
   *  30,000; in a mail 300,000, and 600,000 for the reply to the message; 0 for ever, and the speed
   *  is not looked at. A value that was set holds for every reply. */
  ZV_TRANSFER_SILENCE = 1,
  ZV_TRANSFER_TIME = 2,  /**< milliseconds for the whole run; 0, as at first, for ever */
  ZV_TRANSFER_SPEED = 3, /**< fewest bytes a second of a body, as the mean over one silence; 1 */
  /** Most bytes that a download or a local copy may have, the first leg between two servers too; at
   *  first no limit. */
  ZV_TRANSFER_SIZE = 4,
  ZV_TRANSFER_IN_PLACE = 5, /**< 1 writes over a local file as zv_copy() does; 0 */
  /** 1 fails where a local destination exists, be it a link that leads nowhere; an upload does not
   *  look, and the file between two servers is none. 0 */
  ZV_TRANSFER_KEEP = 6,
  ZV_TRANSFER_SYNC = 7 /**< 1 flushes a new file to the disk too, on Linux with its folder; 0 */
};

/** Why a run failed, for a program to act on. */
enum zv_transfer_cause {
  ZV_CAUSE_NONE = 0,         /**< it did not fail */
  ZV_CAUSE_LOCATION = 1,     /**< a location that is not usable */
  ZV_CAUSE_LOOKUP = 2,       /**< the host has no address */
  ZV_CAUSE_CONNECT = 3,      /**< no address of the host answered */
  ZV_CAUSE_SILENCE = 4,      /**< the peer was silent for too long */
  ZV_CAUSE_TIME = 5,         /**< the time for the whole run is over */
  ZV_CAUSE_SPEED = 6,        /**< the body moved too slowly */
  ZV_CAUSE_CANCELLED = 7,    /**< zv_transfer_cancel(), or the watch said so */
  ZV_CAUSE_CLOSED = 8,       /**< the connection ended too early */
  ZV_CAUSE_PROTOCOL = 9,     /**< the peer broke the rules of its protocol */
  ZV_CAUSE_LOGIN = 10,       /**< user or password were refused */
  ZV_CAUSE_REFUSED_NOW = 11, /**< refused for now: worth another try later */
  ZV_CAUSE_REFUSED = 12,     /**< refused for good */
  ZV_CAUSE_LOCAL = 13,       /**< a local file, or the local machine */
  ZV_CAUSE_DISK_FULL = 14,   /**< no space left for the local file */
  ZV_CAUSE_SAME_FILE = 15,   /**< source and destination are one file */
  ZV_CAUSE_LANDING = 16,     /**< the destination cannot be replaced whole; see the reason */
  ZV_CAUSE_EXISTS = 17,      /**< the destination exists, and #ZV_TRANSFER_KEEP is set */
  ZV_CAUSE_TOO_LARGE = 18,   /**< larger than #ZV_TRANSFER_SIZE */
  ZV_CAUSE_MEMORY = 19,      /**< memory ran out */
  ZV_CAUSE_ENCRYPTION = 20   /**< the connection cannot be encrypted as it must be */
};

/**
 * Called while a run goes on, in its own thread, at least four times a second.
 *
 * It must not throw, and not end the handle or start it again.
 *
 * @param context what zv_transfer_watch() was given.
 * @param done    bytes of the file that have moved.
 * @param total   bytes that the file has; -1 while that is not known.
 * @return 0 to go on; anything else cancels.
 */
typedef int (*transfer_watch_t)(void* context, int64_t done, int64_t total);

/**
 * Make a handle.
 *
 * @return the handle, to be given back with zv_transfer_destroy(); NULL when memory ran out.
 * @par Thread safety
 *   Safe from any thread. One handle is for one thread at a time, except where a function says
 *   otherwise.
 */
ZV_API zv_transfer_t* zv_transfer_create(void);

/**
 * Give a handle back, and overwrite its logins in memory.
 *
 * @param transfer the handle, which must not run; or NULL, which does nothing.
 * @return 0, always.
 * @par Thread safety
 *   Safe from any thread, for distinct handles.
 */
ZV_API int zv_transfer_destroy(zv_transfer_t* transfer);

/**
 * Set an option for the runs to come.
 *
 * @param transfer the handle.
 * @param option   one of #zv_transfer_option.
 * @param value    times from 0 to 2,147,483,647 ms; a speed or a size from 0; a choice 0 or 1. -1
 *                 sets any option back to what it was at first.
 * @return 1; 0, and nothing changes, for another option or value, or while the handle runs.
 * @par Thread safety
 *   As zv_transfer_create() says.
 */
ZV_API int zv_transfer_set(zv_transfer_t* transfer, int option, int64_t value);

/**
 * Give the user and the password for one side, so that they need not stand in a location.
 *
 * They win over the location's, and go to that host and port only. A local location has no use for
 * them. The handle keeps a copy.
 *
 * @param transfer the handle.
 * @param side     0 for the source, 1 for the destination.
 * @param user     the user, as it is sent; NULL takes both back. One with a colon fails at a run
 *                 with HTTP.
 * @param password the password; NULL is "".
 * @return 1; 0, and nothing changes, for another side, a text with CR or LF, no memory, or while
 *         the handle runs.
 * @par Thread safety
 *   As zv_transfer_create() says.
 */
ZV_API int zv_transfer_login(zv_transfer_t* transfer, int side, const char* user,
                             const char* password);

/**
 * Trust the certificates of a file, in place of the system's, in encrypted connections to come.
 *
 * The file is read now, and the handle keeps what it needs of it. It may hold authorities, and also
 * a server's own certificate.
 *
 * @param transfer the handle.
 * @param pem_file the path of a file with one certificate or more, each between the lines
 *                 `BEGIN CERTIFICATE` and `END CERTIFICATE` (RFC 7468); anything else in it is
 *                 passed over. It may have 16 MiB. NULL means the system's certificates again.
 * @return 1; 0, and nothing changes, for a file that cannot be read, holds none, or is broken, for
 *         no memory, or while the handle runs. zv_transfer_reset() keeps the trust.
 * @par Thread safety
 *   As zv_transfer_create() says.
 */
ZV_API int zv_transfer_trust(zv_transfer_t* transfer, const char* pem_file);

/**
 * Have the runs to come watched.
 *
 * @param transfer the handle.
 * @param watch    called at least four times a second, once at the beginning, and once more at the
 *                 end of a body with the final count; NULL takes it away.
 * @param context  what it is called with.
 * @return 1; 0, and nothing changes, while the handle runs.
 * @par Thread safety
 *   As zv_transfer_create() says.
 */
ZV_API int zv_transfer_watch(zv_transfer_t* transfer, transfer_watch_t watch, void* context);

/**
 * Copy the contents of one file to another location.
 *
 * A handle can run again and again, also after a failure. Where the transfer fails, a local
 * destination that was there is as it was and a new one is not there, unless it is written in
 * place (#ZV_TRANSFER_IN_PLACE); a file on a server may hold a part then, and the reason says so.
 * Between two servers a second count of bytes begins at 0 once the first file has come.
 *
 * @param transfer the handle.
 * @param from     the source; not `smtp://`.
 * @param to       the destination.
 * @return 0 when all of the file has arrived. #ZV_COPY_SOURCE_FAILED (-3) or
 *         #ZV_COPY_DESTINATION_FAILED (-4) by the side of the step that failed; a run that begins
 *         cancelled and a file that is too large count to the source. -1, and nothing changes, when
 *         the handle runs already.
 * @par Thread safety
 *   As zv_transfer_create() says; a second run beside the first gives -1.
 */
ZV_API int zv_transfer_run(zv_transfer_t* transfer, const char* from, const char* to);

/**
 * Tell how far a run is.
 *
 * @param transfer the handle.
 * @param done     receives the bytes of the file that have moved, in the last run when none goes
 *                 on; may be NULL.
 * @param total    receives the bytes that the file has, -1 while that is not known; may be NULL.
 * @return 1 while the handle runs; 0 otherwise.
 * @par Thread safety
 *   Safe from any thread and from a signal handler, while the handle is there.
 */
ZV_API int zv_transfer_progress(const zv_transfer_t* transfer, int64_t* done, int64_t* total);

/**
 * End a run, and each that comes, until zv_transfer_reset().
 *
 * @param transfer the handle.
 * @return 1, always.
 * @par Thread safety
 *   Safe from any thread and from a signal handler, while the handle is there.
 */
ZV_API int zv_transfer_cancel(zv_transfer_t* transfer);

/**
 * Forget a cancel and the last result; options, logins and the watch stay.
 *
 * @param transfer the handle.
 * @return 1; 0, and nothing changes, while the handle runs.
 * @par Thread safety
 *   As zv_transfer_create() says.
 */
ZV_API int zv_transfer_reset(zv_transfer_t* transfer);

/**
 * Tell why the last run failed, for a program to act on.
 *
 * @param transfer the handle, which must not run.
 * @param number   receives the code of the reply, the HTTP status, or errno's number for an error
 *                 of the system, on both platforms; 0 where nothing goes with the cause. May be
 *                 NULL.
 * @return one of #zv_transfer_cause; #ZV_CAUSE_NONE after a success and before the first run.
 * @par Thread safety
 *   As zv_transfer_create() says.
 */
ZV_API int zv_transfer_cause(const zv_transfer_t* transfer, int* number);

/**
 * Tell why the last run failed, for a person.
 *
 * One line of English: the step and what it met, "RETR /pub/a.bin: 550 No such file.". What a
 * server said, and a file's name, have `?` in place of control characters. A password is never
 * shown.
 *
 * @param transfer the handle, which must not run.
 * @param buf      receives the text, "" after a success; what does not fit is cut.
 * @param size     room in `buf`, in bytes.
 * @return the length of the text in `buf`, as zv_strncpy() counts.
 * @par Thread safety
 *   As zv_transfer_create() says.
 */
ZV_API size_t zv_transfer_reason(const zv_transfer_t* transfer, char* buf, size_t size);

/** @} */

#ifdef __cplusplus
}
#endif

#endif
