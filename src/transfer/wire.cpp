// Moves bytes over one connection of a run, and waits within its limits.
#include "transfer/wire.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstring>

namespace zv {

namespace {

Step step_of_error(Step wants) {
  const int error = platform::last_error();
  if (error == EAGAIN || error == EWOULDBLOCK) return wants;
  return Step::cut;
}

Step read_plain(platform::Socket socket, char* room, size_t size, size_t& count) {
  const int64_t got = platform::socket_receive(socket, room, size);
  if (got < 0) return step_of_error(Step::wants_to_read);
  count = static_cast<size_t>(got);
  return got != 0 ? Step::done : Step::ended;
}

Step write_plain(platform::Socket socket, const char* data, size_t size, size_t& count) {
  const int64_t sent = platform::socket_send(socket, data, size);
  if (sent < 0) return step_of_error(Step::wants_to_write);
  count = static_cast<size_t>(sent);
  return Step::done;
}

}  // namespace

// The end is announced to the peer as far as that goes at once.
void Wire::close() {
  if (stream_ != nullptr) (void)encryption().finish(stream_);
  drop_stream();
  if (socket_ != platform::no_socket) platform::socket_close(socket_);
  socket_ = platform::no_socket;
}

void Wire::reset() {
  drop_stream();
  if (socket_ != platform::no_socket) platform::socket_reset(socket_);
  socket_ = platform::no_socket;
}

void Wire::drop_stream() {
  if (stream_ != nullptr) encryption().close(stream_);
  stream_ = nullptr;
}

// ---- Steps and clocks ----

void Wire::begin_step(Words words) {
  step_.clear();
  for (const std::string_view word : words) {
    const size_t room = StepWords::capacity - step_.size();
    if (!step_.append({word.data(), std::min(word.size(), room)})) return;
  }
}

bool Wire::fail(int cause, int number, Words words) {
  LineBuffer text;
  for (const std::string_view word : words)
    if (!text.append({word.data(), std::min(word.size(), LineBuffer::capacity - text.size())}))
      break;
  run_.fail(code_, cause, number, {step_.view(), ": ", text.view()});
  return false;
}

bool Wire::fail_end(Step step) {
  if (step != Step::failed) return fail(ZV_CAUSE_CLOSED, 0, {"the connection was closed"});
  run_.fail(code_, ZV_CAUSE_ENCRYPTION, 0, {encryption().reason(stream_)});
  return false;
}

int64_t Wire::silence(int64_t standard) const {
  const int64_t set = run_.options().silence;
  return set == Options::unset ? standard : set;
}

void Wire::expect_reply(int64_t standard) {
  clock_ = Clock::reply;
  silence_ = silence(standard);
  since_ = platform::monotonic_ms();
  draining_ = platform::no_socket;
}

void Wire::expect_last_reply(const Wire& body, int64_t standard) {
  expect_reply(standard);
  draining_ = body.socket_;
  unsent_ = draining_ != platform::no_socket ? platform::unsent_bytes(draining_) : 0;
}

void Wire::begin_body(int64_t standard) {
  clock_ = Clock::body;
  silence_ = silence(standard);
  since_ = last_moved_ = platform::monotonic_ms();
  moved_ = 0;
}

void Wire::count_body(size_t bytes) {
  if (clock_ != Clock::body) return;
  last_moved_ = platform::monotonic_ms();
  moved_ += static_cast<int64_t>(bytes);
}

bool Wire::is_body_in_time(int64_t now) {
  if (now - last_moved_ >= silence_)
    return fail(ZV_CAUSE_SILENCE, 0, {"nothing moved for ", duration(silence_).view()});
  if (now - since_ < silence_) return true;
  const int64_t wanted = run_.options().speed;
  if (moved_ / silence_ < wanted && moved_ * 1000 / silence_ < wanted)
    return fail(ZV_CAUSE_SPEED, 0, {"too slow for ", duration(silence_).view()});
  since_ = now;
  moved_ = 0;
  return true;
}

// Whether a wait may go on, and for how long at most.
bool Wire::may_wait(int64_t& most) {
  most = longest_wait_ms;
  if (!run_.may_go_on(code_)) return false;
  if (silence_ == 0) return true;
  const int64_t now = platform::monotonic_ms();
  if (clock_ == Clock::body) return is_body_in_time(now);
  if (draining_ != platform::no_socket) {
    const int64_t unsent = platform::unsent_bytes(draining_);
    if (unsent < unsent_) since_ = now;
    unsent_ = unsent;
  }
  const int64_t left = silence_ - (now - since_);
  if (left <= 0) return fail(ZV_CAUSE_SILENCE, 0, {"no reply within ", duration(silence_).view()});
  most = std::min(left, longest_wait_ms);
  return true;
}

bool Wire::wait_for(std::span<platform::Waiting> sockets) {
  int64_t most = 0;
  if (!may_wait(most)) return false;
  if (platform::wait_for_sockets(sockets, static_cast<int>(most))) return true;
  run_.fail_system(code_, ZV_CAUSE_LOCAL, platform::last_error(), {step_.view()});
  return false;
}

bool Wire::wait(Step step) {
  std::array<platform::Waiting, 1> waiting = {{{.socket = socket_,
                                                .to_read = step == Step::wants_to_read,
                                                .to_write = step == Step::wants_to_write}}};
  do {
    if (!wait_for(waiting)) return false;
  } while (!waiting[0].can_read && !waiting[0].can_write);
  return true;
}

// ---- Moving bytes ----

bool Wire::send(std::string_view bytes) {
  while (!bytes.empty()) {
    size_t count = 0;
    const Step step = try_write(bytes.data(), bytes.size(), count);
    if (has_to_wait(step)) {
      if (!wait(step)) return false;
    } else if (step != Step::done) {
      return fail_end(step);
    }
    bytes.remove_prefix(count);
  }
  return true;
}

Step Wire::try_read(char* room, size_t size, size_t& count) {
  return stream_ == nullptr ? read_plain(socket_, room, size, count)
                            : encryption().read(stream_, room, size, &count);
}

Step Wire::try_write(const char* data, size_t size, size_t& count) {
  return stream_ == nullptr ? write_plain(socket_, data, size, count)
                            : encryption().write(stream_, data, size, &count);
}

// Tries to receive more after what the input holds; it has room.
Step Wire::try_fill() {
  if (begin_ != 0) {
    std::memmove(input_.get(), input_.get() + begin_, end_ - begin_);
    end_ -= begin_;
    begin_ = 0;
  }
  if (end_ == input_size) return Step::done;
  size_t count = 0;
  const Step step = try_read(input_.get() + end_, input_size - end_, count);
  end_ += count;
  if (step == Step::done) count_body(count);
  return step;
}

// The clock is looked at before each look: a peer that never stops talking is late, too.
bool Wire::fill_input() {
  for (;;) {
    int64_t most = 0;
    if (!may_wait(most)) return false;
    const Step step = try_fill();
    if (step == Step::done) return true;
    if (!has_to_wait(step)) return fail_end(step);
    if (!wait(step)) return false;
  }
}

bool Wire::read_line(std::string_view& line) {
  for (;;) {
    const std::string_view have(input_.get() + begin_, end_ - begin_);
    const size_t end = have.find('\n');
    if (std::min(end, have.size()) > longest_line)
      return fail(ZV_CAUSE_PROTOCOL, 0, {"a line longer than 8 KiB"});
    if (end != std::string_view::npos) {
      line = {have.data(), end};
      if (line.ends_with('\r')) line.remove_suffix(1);
      begin_ += end + 1;
      return run_.may_go_on(code_);
    }
    if (!fill_input()) return false;
  }
}

int64_t Wire::receive(std::span<char> room) {
  if (begin_ != end_) {
    const size_t count = std::min(room.size(), end_ - begin_);
    std::memcpy(room.data(), input_.get() + begin_, count);
    begin_ += count;
    return static_cast<int64_t>(count);
  }
  for (;;) {
    int64_t most = 0;
    if (!may_wait(most)) return -1;
    size_t count = 0;
    const Step step = try_read(room.data(), room.size(), count);
    if (step == Step::done) {
      count_body(count);
      return static_cast<int64_t>(count);
    }
    is_cut_ = step == Step::cut && stream_ != nullptr;
    if (step == Step::ended || is_cut_) return 0;
    if (!has_to_wait(step)) {
      fail_end(step);
      return -1;
    }
    if (!wait(step)) return -1;
  }
}

Sent Wire::send_some(std::string_view& bytes, Wire* answers) {
  const Wire& other = answers != nullptr ? *answers : *this;
  const bool beside = &other != this;
  for (;;) {
    int64_t most = 0;
    if (!may_wait(most)) return Sent::failed;
    size_t count = 0;
    const Step step = try_write(bytes.data(), bytes.size(), count);
    if (step == Step::done) {
      bytes.remove_prefix(count);
      count_body(count);
      return Sent::some;
    }
    if (!has_to_wait(step)) return Sent::cut;
    if (answers != nullptr && answers->begin_ != answers->end_) return Sent::answered;

    const bool to_write = step == Step::wants_to_write;
    std::array<platform::Waiting, 2> waiting = {
        {{.socket = socket_, .to_read = !to_write || answers == this, .to_write = to_write},
         {.socket = other.socket_, .to_read = true}}};
    if (!wait_for({waiting.data(), beside ? size_t{2} : size_t{1}})) return Sent::failed;
    const bool may_be_answered = beside ? waiting[1].can_read : to_write && waiting[0].can_read;
    // What arrived may be the encryption's own message.
    if (may_be_answered && answers != nullptr && !has_to_wait(answers->try_fill()))
      return Sent::answered;
  }
}

bool Wire::end() {
  while (stream_ != nullptr) {
    const Step step = encryption().finish(stream_);
    if (!has_to_wait(step)) break;
    if (!wait(step)) return false;
  }
  platform::socket_end(socket_);
  return true;
}

void Wire::send_farewell(std::string_view bytes) {
  size_t count = 0;
  (void)try_write(bytes.data(), bytes.size(), count);
}

}  // namespace zv
