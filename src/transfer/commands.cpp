// Sends commands and reads numbered replies within a run.
#include "transfer/commands.h"

namespace zv {

int reply_code(std::string_view line, bool& goes_on) {
  goes_on = false;
  if (line.size() < 3 || line[0] < '1' || line[0] > '5') return 0;
  int code = 0;
  for (size_t i = 0; i < 3; ++i) {
    if (line[i] < '0' || line[i] > '9') return 0;
    code = code * 10 + (line[i] - '0');
  }
  if (line.size() > 3 && line[3] != ' ' && line[3] != '-') return 0;
  goes_on = line.size() > 3 && line[3] == '-';
  return code;
}

// A reply of several lines ends with its own code and a blank (RFC 959 4.2).
int Commands::read_reply() {
  constexpr size_t longest_reply = 65536;
  std::string_view line;
  bool goes_on = false;
  if (!wire_.read_line(line)) return 0;
  code_ = reply_code(line, goes_on);
  if (code_ == 0) return wire_.fail(ZV_CAUSE_PROTOCOL, 0, {"a reply without a code"});
  const int first = code_;
  for (size_t size = line.size(); goes_on;) {
    if (!wire_.read_line(line)) return 0;
    size += line.size() + 1;
    if (size > longest_reply)
      return wire_.fail(ZV_CAUSE_PROTOCOL, 0, {"a reply longer than 64 KiB"});
    bool continued = false;
    goes_on = reply_code(line, continued) != first || continued;
  }
  (void)reply_.assign(line);
  return code_;
}

int Commands::send(Words command, std::string_view shown, int64_t silence) {
  HeapText joined;
  HeapText line;
  if (!joined.assign(command) || !line.assign({joined.view(), "\r\n"})) {
    wire_.fail(ZV_CAUSE_MEMORY, 0, {"out of memory"});
    return 0;
  }
  wire_.begin_step({shown.empty() ? joined.view() : shown});
  if (holds_line_end(joined.view())) {
    wire_.fail(ZV_CAUSE_LOCATION, 0, {"a line end"});
    return 0;
  }
  wire_.expect_reply(silence);
  return wire_.send(line.view()) ? read_reply() : 0;
}

bool Commands::refuse(int cause) {
  if (code_ / 100 == 4) cause = ZV_CAUSE_REFUSED_NOW;
  if (code_ / 100 != 4 && code_ / 100 != 5) cause = ZV_CAUSE_PROTOCOL;
  return wire_.fail(cause, code_, {wire_.run().shown(reply_.view())});
}

}  // namespace zv
