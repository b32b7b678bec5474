// Builds the mail of a run.
#include "transfer/run_message.h"

#include <algorithm>
#include <cstdio>

#include "platform/platform.h"
#include "transfer/date_line.h"
#include "transfer/mail_message.h"
#include "transfer/result.h"

namespace zv {

namespace {

// Anything else could be read as something beside the address.
bool take_address(std::string_view text, MailAddress& out) {
  return !text.empty() && out.assign(text) && std::all_of(text.begin(), text.end(), [](char ch) {
    return ch > ' ' && ch <= '~' && ch != '<' && ch != '>';
  });
}

bool take_sender(std::string_view user, std::string_view host, MailAddress& out) {
  PathBuffer login;
  PathBuffer sender;
  return login.fill([](char* room, size_t size) { return zv_username(room, size) != 0; }) &&
         build_sender(user, login.view(), host.empty() ? "localhost" : host, sender) &&
         take_address(sender.view(), out);
}

bool take_name(const char* local, platform::Utf8Name& out) {
  PathBuffer name;
  return name.fill([local](char* room, size_t size) {
    zv_extract_filename(local, room, size);
    return true;  // a path without a name gives an attachment without one
  }) && platform::utf8_name(name.c_str(), out) &&
         is_mail_name(out.view());
}

// ---- Lines ----

bool put(MailText& out, std::initializer_list<std::string_view> words) {
  return std::all_of(words.begin(), words.end(),
                     [&out](std::string_view word) { return out.append(word); }) &&
         out.append("\r\n");
}

bool put_address(MailText& out, std::string_view field, std::string_view address) {
  return put(out, {field, is_plain(address, field.size() + 1) ? " " : "\r\n ", address});
}

// The host only has to make it plain where the message came from.
bool put_message_id(MailText& out, std::string_view host) {
  constexpr size_t others = 31;
  uint64_t number = 0;
  TextBuffer<24> digits;
  const bool drawn =
      platform::random_number(number) && digits.fill([number](char* room, size_t size) {
        return std::snprintf(room, size, "%016llx", static_cast<unsigned long long>(number)) > 0;
      });
  return drawn && put(out, {"Message-ID: <", digits.view(), "@",
                            host.empty() || !is_plain(host, others) ? "localhost" : host, ">"});
}

constexpr std::string_view boundary = "===ZV_BOUNDARY_QM===";

bool put_header(const RunMessage& message, std::string_view name, MailText& out) {
  DateLine date;
  return put_address(out, "From:", message.sender.view()) &&
         put_address(out, "To:", message.recipient.view()) && put_field("Subject: ", name, out) &&
         format_date_line(date) && put(out, {date.view()}) &&
         put_message_id(out, message.host.view()) && put(out, {"MIME-Version: 1.0"}) &&
         put(out, {"Content-Type: multipart/mixed; boundary=\"", boundary, "\"\r\n"});
}

// What a reader sees who cannot open the file.
bool put_text(std::string_view name, MailText& out) {
  constexpr std::string_view label = "Attached file: ";
  const bool plain = is_plain(name, label.size());
  return put(out, {"--", boundary}) &&
         put(out, {"Content-Type: text/plain; charset=", plain ? "us-ascii" : "utf-8"}) &&
         put(out, {"Content-Transfer-Encoding: ", plain ? "7bit" : "base64"}) &&
         put(out, {"Content-Disposition: inline\r\n"}) &&
         (plain ? put(out, {label, name, "\r\n"})
                : put_base64_line(label, name, out) && put(out, {}));
}

bool put_attachment(std::string_view name, MailText& out) {
  return put(out, {"--", boundary}) && put(out, {"Content-Type: application/octet-stream"}) &&
         put(out, {"Content-Transfer-Encoding: base64"}) &&
         put(out, {"Content-Disposition: attachment;"}) && put_parameter(" filename", name, out) &&
         put(out, {});
}

}  // namespace

bool write_run_message(Run& run, const char* local, std::string_view user,
                       std::string_view recipient, RunMessage& message) {
  platform::Utf8Name name;
  if (!take_name(local, name)) {
    run.fail(source_failed, ZV_CAUSE_LOCAL, 0, {"mail ", local, ": its name cannot be written"});
    return false;
  }
  if (!take_address(recipient, message.recipient)) {
    run.fail(destination_failed, ZV_CAUSE_LOCATION, 0, {"not an address: ", recipient});
    return false;
  }
  if (!platform::official_host_name(message.host)) message.host.clear();
  if (!take_sender(user, message.host.view(), message.sender)) {
    run.fail(destination_failed, ZV_CAUSE_LOCATION, 0, {"the sender has no usable address"});
    return false;
  }
  message.head.clear();
  if (put_header(message, name.view(), message.head) && put_text(name.view(), message.head) &&
      put_attachment(name.view(), message.head))
    return true;
  run.fail(source_failed, ZV_CAUSE_LOCAL, 0, {"mail ", local, ": its message cannot be built"});
  return false;
}

}  // namespace zv
