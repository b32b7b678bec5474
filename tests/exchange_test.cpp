// What transfers say to servers, and what they make of the answers: those of zv_copy(), and those
// of a handle, which has other rules.
#include <algorithm>
#include <chrono>
#include <regex>
#include <sstream>

#include "fixtures/dialogues.h"
#include "handle.h"
#include "scratch_folder.h"

namespace {

using namespace scripted;

std::string repeated(const std::string& text, size_t count) {
  std::string all;
  for (; count != 0; --count) all += text;
  return all;
}

Steps mail_with_login() {
  return mail({{"EHLO", "250 hello\r\n"},
               {"HELO", "250 hello\r\n"},
               {"AUTH LOGIN\r\n", "334 user\r\n"},
               {"dUBkLnRlc3Q=\r\n", "334 password\r\n"},
               {"cHc=\r\n", "235 in\r\n"}});
}

// Nothing is said after a refusal.
void expect_last_words(DialogueServer& server, const std::string& command) {
  const std::string said = "\n" + server.heard();
  const std::string last = said.substr(said.rfind('\n', said.size() - 2) + 1);
  EXPECT_TRUE(last.starts_with(command == mail_end ? "." : command)) << said;
}

// Other replies than usual, "COMMAND:reply|COMMAND:reply"; a greeting has no command. For HTTP: the
// answer, which may begin with its status and lack its end.
Steps with_replies(const std::string& scheme, const std::string& replies) {
  const bool has_status = !replies.empty() && std::isdigit(replies[0]) != 0;
  const std::string end = replies.find("\r\n\r\n") == std::string::npos ? "\r\n\r\n" : "";
  if (scheme == "http") return {{"GET", has_status ? "HTTP/1.1 " + replies + end : replies}};
  Steps steps =
      scheme == "ftp" ? ftp({{"RETR", "150 opening\r\n"}, {data_out, "hello"}}) : mail_with_login();
  std::istringstream list(replies);
  for (std::string reply; std::getline(list, reply, '|');) {
    const size_t colon = reply.find(':');
    size_t step = 0;
    while (!steps[step].heard.starts_with(reply.substr(0, colon))) ++step;
    steps[step].said = reply.substr(colon + 1) + (colon + 1 < reply.size() ? "\r\n" : "");
  }
  return steps;
}

// The text is what a success brings; else the reason holds it, and after ": " a refusal's code.
void check(const std::string& scheme, int cause, const std::string& text,
           std::initializer_list<std::string> all, Option option = {ZV_TRANSFER_SILENCE, 10000}) {
  const bool is_mail = scheme == "smtp";
  const bool good = cause == ZV_CAUSE_NONE;
  const int failure = is_mail ? -4 : -3;
  for (const std::string& replies : all) {
    SCOPED_TRACE(replies.substr(0, 80) + " " + text);
    const ScratchFolder folder;
    const std::string file = folder.make_file("a b.txt", "hello");
    const std::string got = folder.make_file("got", "old");
    DialogueServer server(with_replies(scheme, replies));
    const std::string url = server.url(scheme, "/f", "u@d.test:pw@");
    const std::string command = replies.substr(0, replies.find(':'));
    const std::string reply = scheme == "http" ? replies : replies.substr(command.size() + 1);
    const std::string code = text.ends_with(": ") ? reply.substr(0, 3) : "";
    const Outcome end = outcome_of(new_handle({option}), is_mail ? file : url, is_mail ? url : got);
    expect_end(end, {good ? 0 : failure, cause, std::atoi(code.c_str()), good ? "" : text + code});
    EXPECT_EQ(end.reason.find("pw"), std::string::npos) << end.reason;
    EXPECT_EQ(folder.content("got"), good && !is_mail ? text : "old");
    if (is_mail) expect_last_words(server, good ? "QUIT" : command);
    EXPECT_EQ(end.reason.find("delivered") < end.reason.size(),
              is_mail && cause == ZV_CAUSE_SILENCE);
  }
}

// ---- HTTP ---------------------------------------------------------------------------------------

const std::string ok = "HTTP/1.1 200 OK\r\n";
const std::string length = ok + "Content-Length: ";

TEST(Handle, HttpAnswers) {
  const std::string chunked = ok + "Transfer-Encoding: chunked\r\n\r\n";
  const std::string line = "X: " + std::string(8188, 'x') + "\r\n";
  const std::string off = "302 Off\r\nLocation: ";
  check("http", ZV_CAUSE_NONE, "hell", {length + "4\r\n\r\nhello"});
  check("http", ZV_CAUSE_NONE, "", {length + "0\r\n\r\n", ok + "\r\n", chunked + "0\r\n\r\n"});
  check("http", ZV_CAUSE_NONE, "hello",
        {length + "5\r\n\r\nhello", length + "5\r\ncontent-length:5, 5\r\n\r\nhello",
         "HTTP/1.0 203 \nX\ncontent-Length : 5 \n\nhello",
         "100 Go\r\n\r\nHTTP/1.1 103 x\r\nLink: y\r\n\r\n" + ok + "\r\nhello",
         ok + repeated(line, 7) + "\r\nhello",
         chunked + "2\r\nhe\r\n03 ;a=\"b\"\r\nllo\r\n0\r\nX: y\r\n\r\nmore",
         length + "9\r\ntransfer-encoding:Chunked\r\n\r\n5\r\nhello\r\n0\r\n\r\n"});
  check("http", ZV_CAUSE_CLOSED, "GET /f: the connection was closed",
        {length + "6\r\n\r\nhello", chunked + "5\r\nhell", chunked + "5\r\nhello\r\n",
         chunked + "5\r\nhello\r\n0\r\n", ok + "X: y\r\n", ""});
  check("http", ZV_CAUSE_PROTOCOL, "no usable length",
        {length + "5\r\nContent-Length: 6\r\n\r\nhello", length + "5, 6\r\n\r\nhello",
         length + "\r\n\r\nhello", length + "+5\r\n\r\nhello", length + "-5\r\n\r\nhello",
         length + "5x\r\n\r\nhello", length + "9223372036854775808\r\n\r\nhello",
         ok + "Transfer-Encoding: gzip, chunked\r\n\r\nhello"});
  check("http", ZV_CAUSE_PROTOCOL, "a chunk",
        {chunked + "5\r\nhellox\r\n0\r\n\r\n", chunked + "-1\r\n", chunked + "x\r\n",
         chunked + "5 5\r\nhello", chunked + "10000000000000000\r\nhello"});
  check("http", ZV_CAUSE_PROTOCOL, "longer than 64",
        {chunked + "0\r\n" + repeated(line, 9), ok + repeated(line, 8)});
  check("http", ZV_CAUSE_PROTOCOL, "longer than 8 KiB", {ok + std::string(9000, 'x')});
  check("http", ZV_CAUSE_PROTOCOL, "no HTTP", {"ICY 200 OK\r\n\r\n", "2000 OK", "99 OK", "20"});
  check("http", ZV_CAUSE_PROTOCOL, "another protocol", {"101 Other"});
  check("http", ZV_CAUSE_REFUSED, "GET /f: ",
        {"404 No", "204 Empty", "206 Part", "501 Never", "505 Never", "304 Same\r\nLocation: /g",
         off + "file:///etc/passwd", off + "ftp://127.0.0.1/f", off + "http://a b/f", "302 Off",
         "403 no pw", "403 no dUBkLnRlc3Q6cHc=, pw"});
  check("http", ZV_CAUSE_REFUSED_NOW,
        "GET /f: ", {"408 Later", "429 Later", "500 Later", "503 Later"});
  check("http", ZV_CAUSE_LOGIN, "GET /f: ", {"401 Who"});
}

TEST(Copy, HttpAnswers) {
  const auto check = [](int result, const std::string& content,
                        std::initializer_list<std::string> answers,
                        const std::string& slowly = "") {
    for (const std::string& answer : answers) {
      SCOPED_TRACE(answer.substr(0, 60));
      const ScratchFolder folder;
      const Fault fault = slowly.empty() ? Fault::none : Fault::bytewise;
      DialogueServer server({{"GET", answer}, {unasked, slowly}}, fault, 1);
      EXPECT_EQ(copy(server.url("http", "/f"), folder.path("got")), result);
      EXPECT_TRUE(folder.content("got") == content);
    }
  };
  const std::string five = "Content-Length: 5\r\n\r\nhello";
  const std::string large = repeated("large", 300000);
  check(0, "hello",
        {ok + five, "http/1.1 299 x\r\nServer: y\r\ncontent-length: 5\r\n\r\nhello",
         "HTTP/1.0 200 OK\nServer: y\r\n" + five, "\nHTTP/1.0 204 \r\n" + five,
         length + "  5 x\r\nContent-Length: 8\r\n\r\nhello"});
  check(0, "a\r\n\r\nb", {length + "6\r\n\r\na\r\n\r\nb"});
  check(0, large, {length + "1500000\r\n\r\n" + large});
  check(0, std::string(40, 'x'), {length + "40\r\n\r\n"}, std::string(40, 'x'));
  check(-3, large, {length + "1500001\r\n\r\n" + large});
  check(-3, "hello",
        {length + "6\r\n\r\nhello", length + "4\r\n\r\nhello",
         length + "9223372036854775807\r\n\r\nhello"});
  check(-3, "",
        {length + "9223372036854775808\r\n\r\nhello", length + "0\r\n\r\n",
         length + "-5\r\n\r\nhello", ok + "Content-Length:5\r\n\r\nhello", ok + "X-" + five,
         ok + "\r\nhello", ok + "Content-Length: 5\r\n", "HTTP/1.0 199 x\r\n" + five,
         "HTTP/1.0 300 x\r\n" + five, "HTTP/1.0 4294967496 x\r\n" + five,
         "HTTP/1.0 OK 200\r\n" + five, "HTTP/1.0\r\n" + five, "ICY 200 OK\r\n" + five,
         "HTT\r\n\r\n", "\r\n\r\n", ""});
}

// After a body that came with its header the server has to close; too much is not waited for.
TEST(Copy, TheEndOfTheBody) {
  const ScratchFolder folder;
  const std::string hello = length + "5\r\n\r\nhello";
  // Wine loses a reset that comes before it is waited for.
  const auto pause = [] { std::this_thread::sleep_for(std::chrono::milliseconds(200)); };
  DialogueServer resets({{"GET", hello}, {unasked, "", "", pause}}, Fault::reset, 1);
  DialogueServer goes_on({{"GET", hello}, {unasked, "!"}});
  DialogueServer waits({{"GET", hello + "!"}, {until_closed, ""}});
  for (DialogueServer* const server : {&resets, &goes_on, &waits})
    EXPECT_EQ(copy(server->url("http", "/f"), folder.path("got")), -3);
  EXPECT_EQ(waits.stored(), "closed");
}

void check_request(bool by_copy, const std::string& method, const std::string& path,
                   const std::string& target, const std::string& credentials,
                   const std::string& login, const std::string& answer = "204 Empty",
                   size_t size = 5, int result = 0) {
  SCOPED_TRACE(method + path + credentials + answer);
  const bool is_put = method == "PUT";
  const std::string said = with_replies("http", answer)[0].said;
  DialogueServer server(
      {{method, is_put ? "" : said}, {is_put ? body : unasked, is_put ? said : ""}});
  std::string url = server.url("http", path, credentials);
  const std::string filler(by_copy ? 325 - url.size() : 0, 'p');
  url += filler;
  const ScratchFolder folder;
  const std::string content = repeated("0123456", size / 7 + 1).substr(0, is_put ? size : 0);
  const std::string file = folder.make_file("file", content);
  const HandlePtr handle = new_handle();
  zv_transfer_login(handle.get(), 1, "u", "p");
  const std::string from = is_put ? file : url;
  const std::string to = is_put ? url : folder.path("got");
  const Outcome end = by_copy ? Outcome{copy(from, to)} : outcome_of(handle, from, to);
  EXPECT_EQ(end.code, result);
  EXPECT_EQ(end.reason.ends_with("403 No; the destination may hold a part"), answer == "403 No");
  EXPECT_TRUE(server.stored() == content);
  const std::string host = " HTTP/1.1\r\nHost: 127.0.0.1:" + std::to_string(server.port()) +
                           "\r\nUser-Agent: zarvo/" + zarvo_version() +
                           "\r\nAccept-Encoding: identity\r\n";
  EXPECT_EQ(server.heard(), method + " " + target + filler + (by_copy ? " HTTP/1.0\r\n" : host) +
                                (login.empty() ? "" : "Authorization: Basic " + login + "\r\n") +
                                (is_put ? "Content-Length: " + std::to_string(size) + "\r\n" : "") +
                                (by_copy ? "\r\n" : "Connection: close\r\n\r\n"));
}

// Of zv_copy() each with a path that leaves no room in its location; to a handle's destination with
// another login than the location's.
TEST(Copy, HttpRequests) {
  const std::string user(90, 'u');
  const std::string encoded = repeated("dXV1", 30) + "OnV1" + repeated("dXV1", 29) + "dQ==";
  const std::string odd = "/\xc3\xa4\"<>[]^`{|}\x7f";
  check_request(false, "PUT", "/a%20b c?d=%zz#e", "/a%20b%20c?d=%zz", "", "dTpw");
  check_request(false, "PUT", odd, "/%C3%A4%22%3C%3E%5B%5D%5E%60%7B%7C%7D%7F", "x:y@", "dTpw");
  check_request(false, "PUT", "/f", "/f", "", "dTpw", "100 Go\r\n\r\nHTTP/1.1 201 Made\r\n\r\n",
                100000);
  check_request(false, "PUT", "/f", "/f", "", "dTpw", "403 No", 0, -4);
  check_request(false, "GET", "/f", "/f", "u@", "dTo=", "404 No", 5, -3);
  check_request(false, "GET", "/f", "/f", "u%40:p%2F@", "dUA6cC8=", "404 No", 5, -3);
  check_request(false, "GET", "/f", "/f", "", "", "404 No", 5, -3);
  check_request(true, "GET", "/a%20b", "/a b", "u:p@", "dTpw", "404 No", 5, -3);
  check_request(true, "PUT", "/f", "/f", "", "", "201 Created", 0);
  check_request(true, "PUT", "/f", "/f", ":p@", "", "299 OK\r\n\r\nok", 1000000);
  check_request(true, "PUT", "/f", "/f", "u@", "dQ==");
  check_request(true, "PUT", "/f", "/f", user + ":" + user + "@", encoded);
  check_request(true, "PUT", "/f", "/f", "", "", "403 Forbidden", 5, -4);
  check_request(true, "PUT", "/f", "/f", "", "", "100 Continue", 5, -4);
  check_request(true, "PUT", "/f", "/f", "", "", "", 5, -4);
}

// What a server says before it has the whole body is why it takes no more.
TEST(Handle, EarlyAnswers) {
  const ScratchFolder folder;
  const std::string file = folder.make_file("file", std::string(30000000, 'x'));
  const HandlePtr handle = new_handle();
  DialogueServer put({{"PUT", "HTTP/1.1 413 Too large\r\n\r\n"}, {until_closed, ""}});
  EXPECT_EQ(outcome_of(handle, file, put.url("http", "/f")).reason,
            "PUT /f: 413 Too large; the destination may hold a part");
  const auto pause = [] { std::this_thread::sleep_for(std::chrono::milliseconds(700)); };
  DialogueServer later(ftp(
      {{"STOR", "150 send\r\n"}, {unasked, "452 full\r\n", "", pause}, {data_in, "", "", pause}}));
  DialogueServer at_once(ftp({{"STOR", "150 send\r\n452 full\r\n"}, {data_in, "", "", pause}}));
  for (const auto& [stor, silence] : {std::pair(&later, 1000), {&at_once, 400}}) {
    zv_transfer_set(handle.get(), ZV_TRANSFER_SILENCE, silence);
    EXPECT_EQ(outcome_of(handle, file, stor->url("ftp", "/f")).reason,
              "STOR /f: 452 full; the destination may hold a part");
  }
}

// Five redirects, and the login for its own server alone.
TEST(Handle, Redirects) {
  const ScratchFolder folder;
  const HandlePtr handle = new_handle();
  const char* const statuses[] = {"301", "302", "303", "307", "308", "302"};
  for (const size_t hops : {size_t{5}, size_t{6}}) {
    std::vector<std::unique_ptr<DialogueServer>> servers;
    std::string answer = ok + "Content-Length: 5\r\n\r\nhello";
    for (size_t i = 0; i <= hops; ++i) {
      servers.push_back(std::make_unique<DialogueServer>(Steps{{"GET /d ", answer}}));
      const std::string next = servers[i]->url("http", "/a/../d", "x:y@");
      if (i < hops)
        answer = std::string("HTTP/1.1 ") + statuses[i] + " x\r\nLocation: " + next + "\r\n\r\n";
    }
    const Outcome end =
        outcome_of(handle, servers[hops]->url("http", "/d", "u:p@"), folder.path("got"));
    EXPECT_EQ(end.reason, hops == 5 ? "" : "GET /d: more than five redirects");
    EXPECT_EQ(folder.content("got"), "hello");
    for (size_t i = 1; i <= hops; ++i)
      EXPECT_EQ(servers[i]->heard().find("Authorization: Basic dTpw") != std::string::npos,
                i == hops);
  }
}

// ---- FTP and mail -------------------------------------------------------------------------------

// A password is not in what is told of a reply.
TEST(Handle, FtpReplies) {
  const Option silence = {ZV_TRANSFER_SILENCE, 100};
  check("ftp", ZV_CAUSE_NONE, "hello",
        {"SIZE:550 no", "SIZE:550 no|RETR:125 (f) already (5 bytes)", "PASS:202 in", "PASV:227 &",
         "RETR:150-a\r\n 150 b\r\n151 c\r\n150-d\r\n150", ":120 wait\r\n220 now"});
  check("ftp", ZV_CAUSE_NONE, "", {"SIZE:213 0|<data out>:"});
  check("ftp", ZV_CAUSE_NONE, "hello", {"SIZE:213 5", "SIZE:550 no"}, {ZV_TRANSFER_SIZE, 5});
  check("ftp", ZV_CAUSE_NONE, "hello", {"SIZE:213 5"}, {ZV_TRANSFER_TIME, -1});
  check("ftp", ZV_CAUSE_NONE, "hello", {"SIZE:213 5"}, {ZV_TRANSFER_KEEP, -1});
  check("ftp", ZV_CAUSE_TOO_LARGE, "larger", {"SIZE:213 5", "SIZE:550 no"}, {ZV_TRANSFER_SIZE, 4});
  check("ftp", ZV_CAUSE_CLOSED, "RETR /f: the",
        {"SIZE:213 6", "SIZE:550 no|RETR:150 (f) (6 bytes)"});
  check("ftp", ZV_CAUSE_PROTOCOL, "RETR /f: more bytes than were told", {"SIZE:213 4"});
  check("ftp", ZV_CAUSE_PROTOCOL, "SIZE /f: no size",
        {"SIZE:213 9223372036854775808", "SIZE:213 -5"});
  check("ftp", ZV_CAUSE_PROTOCOL, "RETR /f: a reply without a code", {"RETR:999 what"});
  check("ftp", ZV_CAUSE_PROTOCOL, "longer than",
        {"RETR:150-" + repeated("x\r\n150-", 20000), "RETR:" + std::string(9000, '1')});
  check("ftp", ZV_CAUSE_PROTOCOL, "PASV: ", {"PASV:227 no numbers", "PASV:250 done"});
  check("ftp", ZV_CAUSE_SILENCE, "RETR /f: no reply within 0.1 s", {"RETR:"}, silence);
  check("ftp", ZV_CAUSE_SILENCE, "within 0.1 s", {":" + repeated("120 x\r\n", 5000000)}, silence);
  check("ftp", ZV_CAUSE_TIME, "not done within 0.35 s", {"RETR:"}, {ZV_TRANSFER_TIME, 350});
  check("ftp", ZV_CAUSE_LOGIN, ": ", {"PASS:530 no pw", "USER:332 account"});
  check("ftp", ZV_CAUSE_REFUSED_NOW, ": ", {":421 full", "PASS:421 later", "RETR:450 busy"});
  check("ftp", ZV_CAUSE_REFUSED, ": ", {":530 no", "PASV:502 no", "RETR:550 None.", "RETR:500 pw"});
}

TEST(Handle, MailReplies) {
  check("smtp", ZV_CAUSE_NONE, "", {"QUIT:421 later", "EHLO:502 what|HELO:250 hello"});
  check("smtp", ZV_CAUSE_LOGIN, "AUTH LOGIN: ", {"cHc=:535 not pw", "dUBk:535 no"});
  check("smtp", ZV_CAUSE_REFUSED, "MAIL FROM:<u@d.test>: ", {"MAIL:550 no"});
  check("smtp", ZV_CAUSE_REFUSED, ": ", {"DATA:554 no", "<mail end>:552 full"});
  check("smtp", ZV_CAUSE_REFUSED_NOW, ": ",
        {":421 busy", "EHLO:421 busy", "AUTH LOGIN:454 later", "RCPT:450 grey"});
  check("smtp", ZV_CAUSE_SILENCE, "may have been delivered", {"<mail end>:"},
        {ZV_TRANSFER_SILENCE, 300});
}

// What is said between a login and the file, but for the date and the number of a message. Only a
// run encodes names; " a" is the one here that needs it.
std::string mail_head(bool by_run, const std::string& sender, const std::string& to,
                      const std::string& name) {
  const bool plain = !by_run || name != " a";
  const std::string from_to[] = {by_run ? "<" + sender + ">" : sender,
                                 by_run ? "<" + to + ">" : to};
  const std::string part = "\r\n\r\n--===ZV_BOUNDARY_QM===";
  const std::string type = by_run ? "\r\nContent-Type: " : "\r\nContent-type: ";
  const std::string coded =
      by_run ? "\r\nContent-Transfer-Encoding: " : "\r\nContent-transfer-encoding: ";
  const std::string text = !by_run ? "iso-8859-1" + coded + "8bit"
                           : plain ? "us-ascii" + coded + "7bit"
                                   : "utf-8" + coded + "base64";
  return "MAIL FROM:" + from_to[0] + "\r\nRCPT TO:" + from_to[1] + "\r\nDATA\r\nFrom: " + sender +
         "\r\nTo:" + (by_run && to.size() > 74 ? "\r\n " : " ") + to +
         "\r\nSubject: " + (plain ? name : "=?UTF-8?B?IGE=?=") + "\r\nDate\r\nMIME-Version: 1.0" +
         type + "multipart/mixed; boundary=\"===ZV_BOUNDARY_QM===\"" + part + type +
         "text/plain; charset=" + text + "\r\nContent-Disposition: inline\r\n\r\n" +
         (plain ? "Attached file: " + name : "QXR0YWNoZWQgZmlsZTogIGENCg==") + part + type +
         "application/octet-stream" + coded + "base64\r\nContent-Disposition: attachment;" +
         (by_run ? "\r\n" : "") + " filename" + (plain ? "=\"" + name + "\"" : "*=UTF-8''%20a") +
         "\r\n\r\n";
}

void check_mail(bool by_run, const std::string& content, const std::string& lines,
                const std::string& name, const std::string& to = "r",
                const std::string& credentials = "", const Steps& login = {}) {
  SCOPED_TRACE(credentials + std::to_string(content.size()));
  const ScratchFolder folder;
  const std::string file = folder.make_file(name, content);
  Steps steps = login;
  steps.insert(steps.begin(), {"EHLO", "250 hello\r\n"});
  DialogueServer server(mail(steps));
  const std::string url = server.url("smtp", "/" + to, credentials);
  EXPECT_EQ(by_run ? outcome_of(new_handle(), file, url).code : copy(file, url), 0);
  const std::regex lot("Date: [^\r]+(\r\nMessage-ID: <[0-9a-f]{16}@[a-zA-Z0-9.-]+>)?");
  const std::string heard =
      std::regex_replace(server.heard(), lot, "Date", std::regex_constants::format_first_only);
  const size_t from = std::min(heard.find("\nFrom: ") + 7, heard.size());
  const std::string sender = heard.substr(from, heard.find('\r', from) - from);
  char user[257] = "";
  zv_username(user, sizeof user);
  EXPECT_TRUE(sender.starts_with(credentials.starts_with("u@d") ? "u@d" : user + std::string("@")));
  std::string expected;
  for (const Step& step : login) expected += step.heard;
  expected += mail_head(by_run, sender, to, name) + lines + "--===ZV_BOUNDARY_QM===--\r\n" +
              (by_run ? "" : "\r\n") + ".\r\nQUIT\r\n";
  EXPECT_TRUE(heard.substr(heard.find('\n') + 1) == expected) << heard.substr(0, 2000);
}

TEST(Copy, Mails) {
  if (!knows_own_name()) GTEST_SKIP() << "this host's own name has no address";
  // 48 bytes, and the line that they are.
  const std::string bytes48 = "0123456789 abcdefghijklmnopqrstuvwxyz, and a dot";
  const std::string line48 = "MDEyMzQ1Njc4OSBhYmNkZWZnaGlqa2xtbm9wcXJzdHV2d3h5eiwgYW5kIGEgZG90\r\n";
  const std::string line47 = "MTIzNDU2Nzg5IGFiY2RlZmdoaWprbG1ub3BxcnN0dXZ3eHl6LCBhbmQgYSBkb3Q=\r\n";
  const Step refused = {"AUTH LOGIN\r\n", "504 no\r\n"};
  const Step user = {"AUTH LOGIN\r\n", "334 user\r\n"};
  const Step plain = {"AUTH PLAIN\r\n", "334 go on\r\n"};
  const auto asked = [](std::string_view said) { return Step{said, "334 password\r\n"}; };
  const auto let_in = [](std::string_view said) { return Step{said, "235 in\r\n"}; };
  for (const bool by_run : {false, true}) {
    check_mail(by_run, "", "\r\n", "a report.pdf", "r@x.test");
    check_mail(by_run, bytes48, line48, " a", std::string(69, 'r') + "@test");
    check_mail(by_run, bytes48.substr(1), line47, "a", std::string(249, 'r') + "@test");
    check_mail(by_run, repeated(bytes48, 1024), repeated(line48, 1024), "a", std::string(75, 'r'));
    check_mail(by_run, repeated(bytes48, 11000) + "\xfb\xff", repeated(line48, 11000) + "+/8=\r\n",
               "a");
    check_mail(by_run, "x", "eA==\r\n", "a", "r", "u@d:p:q@",
               {user, asked("dUBk\r\n"), let_in("cDpx\r\n")});
    check_mail(by_run, "x", "eA==\r\n", "a", "r", "u@", {user, asked("dQ==\r\n"), let_in("\r\n")});
    check_mail(by_run, "x", "eA==\r\n", "a", "r", "u:p@", {refused, plain, let_in("AHUAcA==\r\n")});
  }
  check_mail(false, "x", "eA==\r\n", "a", "r", "u@", {refused, plain, let_in("AHUAdQ==\r\n")});
}

// A name that would be a line of its own is told to nobody.
TEST(Copy, MailRefused) {
  if (!knows_own_name()) GTEST_SKIP() << "this host's own name has no address";
  const ScratchFolder folder;
  const std::string file = folder.make_file("file", "hello");
  for (const std::string command : {"HELO", "MAIL", "RCPT", "DATA"}) {
    DialogueServer server(with_replies("smtp", "EHLO:502 what|" + command + ":550 no"));
    EXPECT_EQ(copy(file, server.url("smtp", "/r")), -4);
    expect_last_words(server, command);
  }
#ifndef _WIN32
  for (const std::string& name : {folder.make_file("a\nb"), folder.make_file("a\rb")}) {
    EXPECT_EQ(copy(name, "smtp://127.0.0.1:1/r"), -3);
    EXPECT_EQ(outcome_of(new_handle(), name, "smtp://127.0.0.1:1/r").code, -3);
  }
#endif
}

// The whole lines before the point where a file proves too short are sent, and no more.
TEST(Copy, MailAFileThatProvesShort) {
  if (!knows_own_name()) GTEST_SKIP() << "this host's own name has no address";
  const ScratchFolder folder;
  for (const size_t size : {0u, 47u, 48u, 100u}) {
    const std::string file = folder.make_file("f", std::string(150, 'x'));
    Steps steps = mail({{"EHLO", "250 hello\r\n"}});
    steps[4].before = [&] { std::filesystem::resize_file(file, size); };
    steps[5] = {until_closed, ""};
    DialogueServer server(steps);
    EXPECT_EQ(copy(file, server.url("smtp", "/r")), -3);
    const std::string sent = server.stored();
    EXPECT_EQ(sent.size() - sent.rfind("\"f\"\r\n\r\n"), size / 48 * 66 + 13) << sent;
  }
}

}  // namespace
