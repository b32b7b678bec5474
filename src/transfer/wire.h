// One connection of a run: no call on its socket waits, so that every wait keeps the run's limits.
#ifndef ZARVO_TRANSFER_WIRE_H
#define ZARVO_TRANSFER_WIRE_H

#include <span>
#include <string_view>

#include "frame/owner.h"
#include "platform/encryption.h"
#include "platform/platform.h"
#include "transfer/run.h"
#include "transfer/run_location.h"

namespace zv {

// How a try to move bytes ended; one that has to wait says for what.
using Step = platform::EncryptionStep;

inline bool has_to_wait(Step step) {
  return step == Step::wants_to_read || step == Step::wants_to_write;
}

// What became of a piece of a body.
enum class Sent {
  some,      // a part of it, or all, has left
  answered,  // the peer says something before it has all
  cut,       // the peer takes no more
  failed     // the run may not go on
};

// False, of any function, says that the run has failed; the connection's side is charged with it.
class Wire {
 public:
  Wire(Run& run, int code) : run_(run), code_(code) {}
  ~Wire() { close(); }
  Wire(const Wire&) = delete;
  Wire& operator=(const Wire&) = delete;

  // Tries each address of the host in turn; encrypted from the first byte where the location is.
  [[nodiscard]] bool connect(const RunLocation& server);
  [[nodiscard]] bool connect(const platform::HostAddress& address, unsigned port);

  // Encrypts a connection from here on. An FTP data connection is encrypted like its control
  // connection, whose session it uses again (RFC 4217).
  [[nodiscard]] bool encrypt(const RunLocation& server, const Wire* like = nullptr);

  void close();
  void reset();  // so that the peer does not take it for an end
  platform::Socket socket() const { return socket_; }
  Run& run() const { return run_; }

  // ---- Requests and replies ----

  // What reasons name from now on. A password must not stand in it.
  void begin_step(Words words);

  // Fails the run: the step, ": ", the words.
  bool fail(int cause, int number, Words words);

  // Starts the clock of a reply, which the request counts to; `standard`, in ms, holds unless the
  // run has a silence of its own.
  void expect_reply(int64_t standard = standard_silence);

  [[nodiscard]] bool send(std::string_view bytes);

  // The next line without its end, of 8 KiB at most; it is valid until something else is read.
  [[nodiscard]] bool read_line(std::string_view& line);

  // ---- Bodies ----

  // Starts the clock of a body, which must move.
  void begin_body(int64_t standard = standard_silence);

  // Bytes of a body: their number, 0 at its end, -1 when the run has failed.
  int64_t receive(std::span<char> room);

  // Whether that end was one that the peer did not announce, on an encrypted connection: somebody
  // else may have made it.
  bool is_cut() const { return is_cut_; }

  // Sends what it can of a piece of a body, at least a byte, and takes that off its front. With
  // `answers`, which may be the same connection, what comes there first ends the wait.
  Sent send_some(std::string_view& bytes, Wire* answers);

  // The clock of the last reply to an upload: bytes that still leave `body` are no silence.
  void expect_last_reply(const Wire& body, int64_t standard = standard_silence);

  // Nothing more is sent, which ends the body for the peer.
  [[nodiscard]] bool end();

  // One try to send, of which nothing depends.
  void send_farewell(std::string_view bytes);

  static constexpr int64_t standard_silence = 30000;

 private:
  bool connect_to(const platform::HostAddress& address, unsigned port, int& error);
  bool fail_connect(int error);
  bool may_wait(int64_t& most);
  bool is_body_in_time(int64_t now);
  bool wait(Step step);
  bool wait_for(std::span<platform::Waiting> sockets);
  Step try_read(char* room, size_t size, size_t& count);
  Step try_write(const char* data, size_t size, size_t& count);
  Step try_fill();
  bool fill_input();
  bool fail_end(Step step);
  void drop_stream();
  const platform::Encryption& encryption() const { return run_.trust()->encryption(); }
  void count_body(size_t bytes);
  int64_t silence(int64_t standard) const;

  static constexpr int64_t longest_wait_ms = 200;  // so that what is due meanwhile is not late
  using StepWords = TextBuffer<512>;
  static constexpr size_t longest_line = 8192;
  static constexpr size_t input_size = 2 * longest_line;

  Run& run_;
  int code_;
  platform::Socket socket_ = platform::no_socket;
  platform::EncryptedStream* stream_ = nullptr;  // nullptr: in the clear
  bool is_cut_ = false;
  StepWords step_;

  HeapPtr<char[]> input_;  // received and not taken: from begin_ to end_
  size_t begin_ = 0;
  size_t end_ = 0;

  // When a reply is late; or, while a body moves, what moved in the current silence.
  enum class Clock { reply, body } clock_ = Clock::reply;
  int64_t silence_ = 0;  // ms, 0 for ever
  int64_t since_ = 0;
  int64_t moved_ = 0;
  int64_t last_moved_ = 0;
  platform::Socket draining_ = platform::no_socket;
  int64_t unsent_ = 0;  // of it, when the clock was looked at last
};

}  // namespace zv

#endif
