// A run's limits, its watch and its failure.
#include "transfer/run.h"

#include <algorithm>
#include <cerrno>
#include <cstdio>

#include "platform/platform.h"
#include "transfer/error_words.h"
#include "transfer/result.h"

namespace zv {

namespace {

constexpr int64_t watch_every_ms = 200;

// Controls of ASCII, and the two bytes that those beyond ASCII are in UTF-8.
void hide_controls(char* text) {
  for (; *text != '\0'; ++text) {
    const auto ch = static_cast<unsigned char>(text[0]);
    const auto next = static_cast<unsigned char>(text[1]);
    if (ch == 0xC2 && next >= 0x80 && next < 0xA0) text[0] = text[1] = '?';
    if (ch < ' ' || ch == 0x7F) text[0] = '?';
  }
}

bool is_full(int number) {
#ifdef EDQUOT
  if (number == EDQUOT) return true;
#endif
  return number == ENOSPC;
}

}  // namespace

Run::Run(const Options& options, Watch watch, Signals& signals, Trust* trust)
    : options_(options),
      watch_(watch),
      signals_(signals),
      trust_(trust),
      begin_(platform::monotonic_ms()),
      watched_(begin_ - watch_every_ms) {}

bool Run::may_go_on(int code) {
  if (failed()) return false;
  const int64_t now = platform::monotonic_ms();
  if (now - watched_ >= watch_every_ms && !call_watch(now)) signals_.cancelled = true;
  if (signals_.cancelled) {
    fail(code, ZV_CAUSE_CANCELLED, 0, {"cancelled"});
  } else if (options_.time != 0 && now - begin_ >= options_.time) {
    fail(code, ZV_CAUSE_TIME, 0, {"not done within ", duration(options_.time).view()});
  }
  return !failed();
}

bool Run::call_watch(int64_t now) {
  watched_ = now;
  return watch_.call == nullptr || watch_.call(watch_.context, signals_.done, signals_.total) == 0;
}

void Run::begin_body(int64_t total) {
  signals_.done = 0;
  signals_.total = total;
}

void Run::end_body() {
  signals_.total = signals_.done.load();
  if (!call_watch(platform::monotonic_ms())) signals_.cancelled = true;
}

bool Run::allows(int64_t size) {
  if (options_.size != Options::unset && size > options_.size)
    fail(source_failed, ZV_CAUSE_TOO_LARGE, 0, {"larger than the size that is allowed"});
  return !failed();
}

int Run::fail(int code, int cause, int number, Words words) {
  if (failed()) return failure_.code;
  failure_.code = code;
  failure_.cause = cause;
  failure_.number = number;
  add_to_reason(words);
  return code;
}

void Run::explain(Words words) {
  if (failed()) add_to_reason(words);
}

void Run::add_to_reason(Words words) {
  for (const std::string_view word : words) {
    const size_t room = Reason::capacity - failure_.reason.size();
    if (!failure_.reason.append({word.data(), std::min(word.size(), room)})) break;
  }
  failure_.reason.edit_shrinking(hide_controls);
}

bool Run::keep_secret(std::string_view secret) {
  const auto is_known = [secret](const HeapText& known) { return known.view() == secret; };
  if (secret.empty() || std::any_of(secrets_.begin(), secrets_.end(), is_known)) return true;
  return secret_count_ < secrets_.size() && secrets_[secret_count_++].assign(secret);
}

std::string_view Run::shown(std::string_view said) const {
  constexpr size_t longest = 500;
  for (const HeapText& secret : secrets_)
    if (!secret.empty() && said.find(secret.view()) != std::string_view::npos)
      return {said.data(), std::min(said.find_first_of(" -"), said.size())};
  return {said.data(), std::min(said.size(), longest)};
}

int Run::fail_system(int code, int cause, int number, Words step) {
  if (failed()) return failure_.code;
  if (is_full(number)) cause = ZV_CAUSE_DISK_FULL;
  if (number == ENOMEM) cause = ZV_CAUSE_MEMORY;
  TextBuffer<1024> text;
  for (const std::string_view word : step)
    if (!text.append(word)) break;
  return fail(code, cause, number, {text.view(), ": ", error_words(number).view()});
}

Duration duration(int64_t milliseconds) {
  Duration text;
  const auto whole = static_cast<long long>(milliseconds / 1000);
  const int rest = static_cast<int>(milliseconds % 1000);
  (void)text.fill([&](char* room, size_t size) {
    return std::snprintf(room, size, rest == 0 ? "%lld" : "%lld.%03d", whole, rest) > 0;
  });
  while (rest != 0 && text.back() == '0') text.shorten(text.size() - 1);
  (void)text.append(" s");
  return text;
}

}  // namespace zv
