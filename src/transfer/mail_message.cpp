// Builds the message of a mail.
#include "transfer/mail_message.h"

#include "transfer/date_line.h"

namespace zv {

namespace {

constexpr std::string_view boundary = "===ZV_BOUNDARY_QM===";

// What follows the host's first dot, or all of a name without one.
std::string_view mail_domain(std::string_view host) {
  const size_t dot = host.find('.');
  if (dot != std::string_view::npos) host.remove_prefix(dot + 1);
  return host;
}

void write_head(Lines& head, std::string_view sender, std::string_view recipient,
                std::string_view date, std::string_view name) {
  head.add({"From: ", sender});
  head.add({"To: ", recipient});
  head.add({"Subject: ", name});
  head.add({date});
  head.add({"MIME-Version: 1.0"});
  head.add({"Content-type: multipart/mixed; boundary=\"", boundary, "\""});
  head.add({});
  head.add({"--", boundary});
  head.add({"Content-type: text/plain; charset=iso-8859-1"});
  head.add({"Content-transfer-encoding: 8bit"});
  head.add({"Content-Disposition: inline"});
  head.add({});
  head.add({"Attached file: ", name});
  head.add({});
  head.add({"--", boundary});
  head.add({"Content-type: application/octet-stream"});
  head.add({"Content-transfer-encoding: base64"});
  head.add({"Content-Disposition: attachment; filename=\"", name, "\""});
  head.add({});
}

void write_tail(Lines& tail) {
  tail.add({"--", boundary, "--"});
  tail.add({});
  tail.add({"."});
}

}  // namespace

void Lines::add(Words words) {
  LineBuffer line;
  good_ = good_ && build_line(line, words) && !holds_line_end(line.view()) &&
          text_.append(line.view()) && text_.append("\r\n");
}

bool build_sender(std::string_view user, std::string_view login, std::string_view host,
                  PathBuffer& sender) {
  sender.clear();
  if (user.find('@') != std::string_view::npos) return sender.append(user);
  return sender.append(login) && sender.append('@') && sender.append(mail_domain(host));
}

bool write_message(const char* user, const char* local, const char* recipient,
                   MailMessage& message) {
  PathBuffer login;
  PathBuffer name;
  DateLine date;
  const bool known =
      platform::official_host_name(message.host) &&
      login.fill([](char* room, size_t size) { return zv_username(room, size) != 0; }) &&
      name.fill([local](char* room, size_t size) {
        zv_extract_filename(local, room, size);
        return true;  // a path without a name gives an attachment without one
      }) &&
      format_date_line(date);
  if (!known || !build_sender(user, login.view(), message.host.view(), message.sender))
    return false;

  write_head(message.head, message.sender.view(), recipient, date.view(), name.view());
  write_tail(message.tail);
  return message.head.good();
}

}  // namespace zv
