// The head of an HTTP answer, line by line (RFC 9112).
#ifndef ZARVO_TRANSFER_HTTP_ANSWER_H
#define ZARVO_TRANSFER_HTTP_ANSWER_H

#include <cstdint>
#include <string_view>

#include "transfer/heap_text.h"
#include "transfer/wire.h"

namespace zv {

using StatusWords = TextBuffer<512>;

struct HttpAnswer {
  static constexpr int64_t unknown = -1;

  int status = 0;
  StatusWords words;         // "404 Not Found"
  int64_t length = unknown;  // of the body
  bool is_chunked = false;   // wins over a length
  HeapText location;         // "" for none

  bool is_success() const { return status / 100 == 2; }
};

enum class Taken { good, bad, no_memory };

// "HTTP/1.1 404 Not Found"
Taken take_status_line(std::string_view line, HttpAnswer& answer);
// "Content-Length: 5". Bad are lengths that differ or are no number, and encodings other than
// chunked; what is not known is passed over.
Taken take_header_line(std::string_view line, HttpAnswer& answer);
// "1a;name=value", the line before a chunk.
Taken take_chunk_size(std::string_view line, int64_t& size);

// Reads the head of one answer, 64 KiB at most. One of 100 to 199 only tells of progress. False, as
// of the functions below, when the run has failed.
[[nodiscard]] bool read_head(Wire& wire, HttpAnswer& answer);

// Reads the head of the answer that decides.
[[nodiscard]] bool read_answer(Wire& wire, HttpAnswer& answer);

// Reads the lines after a body of chunks.
[[nodiscard]] bool skip_trailer(Wire& wire);

}  // namespace zv

#endif
