// Copies against real servers, which with_servers starts and names in the environment.
#include <gtest/gtest.h>

#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "handle.h"

namespace {

namespace fs = std::filesystem;

#ifdef ZARVO_TESTS_ENCRYPTION
constexpr bool encrypts = true;
#else
constexpr bool encrypts = false;
#endif

std::string set(const std::string& name) {
  const char* const value = std::getenv(("ZARVO_TEST_" + name).c_str());
  return value != nullptr ? value : "";
}

// Read in blocks: byte by byte the thread sanitizer takes minutes.
std::string content(const fs::path& path) {
  std::ostringstream text;
  text << std::ifstream(path, std::ios::binary).rdbuf();
  return text.str();
}

// Bytes that no block's size repeats.
std::string bytes(size_t size) {
  std::string made(size, '\0');
  for (uint32_t i = 0; i < size; ++i) made[i] = static_cast<char>(i * 2654435761u >> 24);
  return made;
}

// A place that files are copied from or to: the text before a name, and the folder of the file.
struct Place {
  std::string url;
  fs::path folder;

  bool is_encrypted() const { return url.find("s://") != url.npos; }
  bool is_network() const { return is_encrypted() || url.find("://127") != url.npos; }
  void put(const std::string& file, const std::string& data) const {
    std::ofstream(folder / file, std::ios::binary) << data;
    fs::permissions(folder / file, fs::perms(0644));
  }
};

const std::string login = set("USER") + ":" + set("PASSWORD") + "@";

// An encrypted server is asked for by its certificate's name.
std::string host(const std::string& scheme, const std::string& port, const std::string& user = "") {
  return scheme + "://" + user + (scheme.ends_with('s') ? "localhost:" : "127.0.0.1:") + set(port);
}

const Place local = {set("DIR") + "/", set("DIR")};
const Place http = {host("http", "HTTP_PORT") + "/", set("HTTP_ROOT")};

// Without root there is no FTP server.
std::vector<Place> places() {
  const fs::path private_folder = http.folder / "private";
  const fs::path guests = set("FTP_ROOT") + "/pub";
  const fs::path users = set("FTP_HOME") + "/pub";
  std::vector<Place> all = {local,
                            {"file://" + local.url, local.folder},
                            http,
                            {host("http", "HTTP_PORT", login) + "/private/", private_folder},
                            {host("ftp", "FTP_PORT") + "/pub/", guests},
                            {host("ftp", "FTP_PORT", login) + "/pub/", users},
                            {host("https", "HTTPS_PORT") + "/", http.folder},
                            {host("ftps", "FTPS_PORT", login) + "/pub/", users}};
  std::erase_if(all, [](const Place& place) {
    return (!encrypts && place.is_encrypted()) ||
           (set("FTP_PORT").empty() && place.url.starts_with("ftp"));
  });
  return all;
}

// A retrieval by FTP fails when both of its replies arrive in one receive, which happens by chance:
// it alone is tried again.
int copy(const std::string& from, const std::string& to) {
  int result = zv_copy(from.c_str(), to.c_str());
  for (int tries = 1; tries < 20 && result == -3 && from.starts_with("ftp:"); ++tries)
    result = zv_copy(from.c_str(), to.c_str());
  return result;
}

// At the first try.
int run(const std::string& from, const std::string& to) {
  const HandlePtr handle(zv_transfer_create());
  EXPECT_EQ(zv_transfer_trust(handle.get(), set("CERTIFICATES").c_str()), 1);
  const int result = zv_transfer_run(handle.get(), from.c_str(), to.c_str());
  EXPECT_EQ(reason(handle.get()), "");
  return result;
}

using Way = int (*)(const std::string& from, const std::string& to);

void check_one(Way way, const Place& source, const Place& destination, size_t size) {
  SCOPED_TRACE(source.url + " to " + destination.url + ", " + std::to_string(size));
  const std::string data = bytes(size);
  source.put("in", data);
  EXPECT_EQ(way(source.url + "in", destination.url + "out"), 0);
  EXPECT_TRUE(content(destination.folder / "out") == data);
  fs::remove(source.folder / "in");
  fs::remove(destination.folder / "out");
}

// zv_copy() does not encrypt, and takes no size of 0 from a server.
void check_route(const Place& source, const Place& destination, size_t size) {
  const bool copies = !source.is_encrypted() && !destination.is_encrypted();
  if (copies && (size != 0 || source.url[0] == '/')) check_one(copy, source, destination, size);
  check_one(run, source, destination, size);
}

TEST(Servers, EveryRouteAndSize) {
  for (const Place& source : places())
    for (const Place& destination : places())
      for (const size_t size : {0u, 1u, 512u, (1u << 20) + 1})
        check_route(source, destination, size);
  for (const Place& place : places()) {
    if (!place.is_network()) continue;
    check_route(local, place, 64 << 20);
    check_route(place, local, 64 << 20);
  }
}

// Bodies without a length, redirects and IPv6; and many small files at the first try.
TEST(Servers, WhatAHandleFollows) {
  std::vector<std::string> all = {http.url + "chunked/", http.url + "moved/"};
  if (!set("HTTP_SIX").empty()) all.push_back("http://" + set("HTTP_SIX") + "/");
  for (const std::string& url : all)
    for (const size_t size : {0u, 1u, (1u << 20) + 1})
      check_one(run, {url, http.folder}, local, size);
  for (const Place& place : places())
    for (int i = 0; place.url.starts_with("ftp") && i < 100; ++i)
      check_one(run, place, local, 1000);
}

// The server must not take the part that it has for the file.
TEST(Servers, AnUploadCancelledHalfWay) {
  if (set("FTP_PORT").empty()) GTEST_SKIP() << "no FTP server without root";
  const std::string ftp = host("ftp", "FTP_PORT", login) + "/pub/";
  local.put("whole", bytes(1 << 20));
  local.put("cancelled", "");
  fs::resize_file(local.folder / "cancelled", uintmax_t{8} << 30);  // it takes no room
  const HandlePtr handle(zv_transfer_create());
  const auto began = [](void*, int64_t done, int64_t) { return static_cast<int>(done > 0); };
  for (const bool cancelled : {true, false}) {
    if (cancelled) zv_transfer_watch(handle.get(), began, nullptr);
    const std::string name = cancelled ? "cancelled" : "whole";
    zv_transfer_run(handle.get(), (local.url + name).c_str(), (ftp + name).c_str());
    EXPECT_EQ(zv_transfer_cause(handle.get(), nullptr), cancelled ? ZV_CAUSE_CANCELLED : 0);
    zv_transfer_watch(handle.get(), nullptr, nullptr);
    zv_transfer_reset(handle.get());
  }
  std::string log;
  const auto lacks = [&log](const char* name) { return log.find(name) == log.npos; };
  for (int tries = 0; tries < 500 && (lacks("/whole") || lacks("/cancelled")); ++tries) {
    std::this_thread::sleep_for(std::chrono::milliseconds(10));
    log = content(set("FTP_LOG"));
  }
  std::istringstream lines(log);
  for (std::string line; std::getline(lines, line);)
    EXPECT_TRUE(line.find("/cancelled") == line.npos || line.find("OK UPLOAD") == line.npos)
        << line;
  EXPECT_NE(log.find("FAIL UPLOAD"), log.npos) << log;
}

// The port's name is also a recipient's domain.
void check_mail(Way way, const Place& source, const std::string& port, size_t size) {
  SCOPED_TRACE(source.url + " to " + port + ", " + std::to_string(size));
  const std::string name = std::to_string(size);
  source.put(name + ".bin", bytes(size));
  const std::string to =
      host(port == "SMTPS_PORT" ? "smtps" : "smtp", port, port == "SMTP_PORT" ? "" : login) + "/" +
      name + "%40" + port;
  EXPECT_EQ(way(source.url + name + ".bin", to), 0);
  const fs::path kept = fs::path(set("MAIL_DIR")) / (name + "@" + port);
  EXPECT_TRUE(content(kept / "attachment") == bytes(size));
  EXPECT_EQ(content(kept / "name"), name + ".bin");
  EXPECT_NE(content(kept / "headers").find("\n" + name + ".bin\n"), std::string::npos);
}

TEST(Servers, MailOfEverySizeAndLogin) {
  for (const char* const port : {"SMTP_PORT", "SMTP_LOGIN_PORT", "SMTP_PLAIN_PORT"})
    for (const size_t size : {0u, 1u, 47u, 48u, 49u, (1u << 20) + 1})
      for (const Way way : {copy, run}) check_mail(way, local, port, size);
  for (const Place& source : places()) {
    if (!source.is_encrypted()) check_mail(copy, source, "SMTP_PORT", 100);
    if (encrypts) check_mail(run, source, "SMTPS_PORT", 1 << 20);
  }
  local.put("file", "x");
  EXPECT_EQ(copy(local.url + "file", host("smtp", "SMTP_PORT", login) + "/a%40b"), -4);
}

}  // namespace
