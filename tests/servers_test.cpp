// Copies against real servers, which with_servers starts and names in the environment.
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <random>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "handle.h"
#include "zarvo.h"

namespace {

namespace fs = std::filesystem;

std::string set(const char* name) {
  const char* const value = std::getenv((std::string("ZARVO_TEST_") + name).c_str());
  return value != nullptr ? value : "";
}

// Read in one go: byte by byte the thread sanitizer takes minutes.
std::string content(const fs::path& path) {
  std::error_code missing;
  const uintmax_t size = fs::file_size(path, missing);
  std::string text(missing ? 0 : size, '\0');
  std::ifstream file(path, std::ios::binary);
  file.read(text.data(), static_cast<std::streamsize>(text.size()));
  return text;
}

// Random bytes whose period is no multiple of any block's size.
std::string bytes(size_t size) {
  std::mt19937 random(static_cast<unsigned>(size) + 1);
  std::string period(std::min<size_t>(size, 65537), '\0');
  for (char& byte : period) byte = static_cast<char>(random());
  std::string made;
  made.reserve(size + period.size());
  while (made.size() < size) made += period;
  made.resize(size);
  return made;
}

// A place that files are copied from or to: its location text for a name, and the file there.
struct Place {
  const char* name;
  std::string url;
  fs::path folder;

  std::string location(const std::string& file) const { return url + file; }
  fs::path path(const std::string& file) const { return folder / file; }
  void put(const std::string& file, const std::string& data) const {
    std::ofstream(path(file), std::ios::binary) << data;
    fs::permissions(path(file), fs::perms(0644));
  }
};

// An encrypted server is asked for by its certificate's name.
std::string host(const char* scheme, const char* port, const std::string& login = "") {
  const bool encrypted = std::string_view(scheme).ends_with('s');
  return std::string(scheme) + "://" + login + (encrypted ? "localhost:" : "127.0.0.1:") +
         set(port);
}

std::string login() {
  return set("USER") + ":" + set("PASSWORD") + "@";
}

std::vector<Place> places() {
  std::vector<Place> all = {
      {"local", set("DIR") + "/", set("DIR")},
      {"file", "file://" + set("DIR") + "/", set("DIR")},
      {"http", host("http", "HTTP_PORT") + "/", set("HTTP_ROOT")},
      {"http with login", host("http", "HTTP_PORT", login()) + "/private/",
       set("HTTP_ROOT") + "/private"},
  };
  if (set("FTP_PORT").empty()) return all;  // it needs root
  all.push_back({"ftp", host("ftp", "FTP_PORT") + "/pub/", set("FTP_ROOT") + "/pub"});
  all.push_back(
      {"ftp with login", host("ftp", "FTP_PORT", login()) + "/pub/", set("FTP_HOME") + "/pub"});
  return all;
}

#ifdef ZARVO_TESTS_ENCRYPTION
constexpr bool encrypts = true;
#else
constexpr bool encrypts = false;
#endif

// Those of a run.
std::vector<Place> places_of_runs() {
  std::vector<Place> all = places();
  if (!encrypts) return all;
  all.push_back({"https", host("https", "HTTPS_PORT") + "/", set("HTTP_ROOT")});
  if (set("FTPS_PORT").empty()) return all;
  all.push_back({"ftps", host("ftps", "FTPS_PORT", login()) + "/pub/", set("FTP_HOME") + "/pub"});
  return all;
}

bool is_encrypted(const Place& place) {
  return place.url.find("s://") != std::string::npos;
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

void check_route(Way way, const Place& source, const Place& destination, size_t size) {
  SCOPED_TRACE(std::string(way == copy ? "copy " : "run ") + source.name + " to " +
               destination.name + ", " + std::to_string(size));
  const std::string file = "f" + std::to_string(size);
  const std::string sent = file + ".in";
  const std::string got = file + ".out";
  const std::string data = bytes(size);
  source.put(sent, data);
  EXPECT_EQ(way(source.location(sent), destination.location(got)), 0);
  EXPECT_TRUE(content(destination.path(got)) == data);
  fs::remove(source.path(sent));
  fs::remove(destination.path(got));
}

TEST(Servers, EveryRouteAndSize) {
  for (const Place& source : places_of_runs()) {
    for (const Place& destination : places_of_runs()) {
      for (const size_t size : {0u, 1u, 512u, (1u << 20) + 1}) {
        const bool copies = !is_encrypted(source) && !is_encrypted(destination) &&
                            (size != 0 || source.url.starts_with("/"));
        if (copies) check_route(copy, source, destination, size);
        check_route(run, source, destination, size);
      }
    }
  }
}

TEST(Servers, LargeFilesBothWays) {
  const Place local = places().front();
  for (const Place& place : places_of_runs()) {
    if (place.url.find("://127") == std::string::npos && !is_encrypted(place)) continue;
    for (const Way way : {copy, run}) {
      if (way == copy && is_encrypted(place)) continue;
      check_route(way, local, place, 64 << 20);
      check_route(way, place, local, 64 << 20);
    }
  }
}

// Bodies without a length, redirects, and IPv6.
TEST(Servers, WhatAHandleFollows) {
  const Place local = places().front();
  const Place http = places()[2];
  std::vector<Place> all = {{"chunked", http.url + "chunked/", http.folder},
                            {"moved", http.url + "moved/", http.folder}};
  if (!set("HTTP_SIX").empty())
    all.push_back({"IPv6", "http://" + set("HTTP_SIX") + "/", http.folder});
  for (const Place& place : all)
    for (const size_t size : {0u, 1u, (1u << 20) + 1}) check_route(run, place, local, size);
}

// The server must not take the part that it has for the file.
TEST(Servers, AnUploadCancelledHalfWay) {
  if (set("FTP_PORT").empty()) GTEST_SKIP() << "no FTP server without root";
  const Place local = places().front();
  const Place ftp = places().back();
  local.put("large", bytes(64 << 20));
  const HandlePtr handle(zv_transfer_create());
  for (const bool cancelled : {true, false}) {
    const std::string name = cancelled ? "cancelled" : "whole";
    std::thread later([&] {
      int64_t done = 0;
      while (cancelled && done == 0) zv_transfer_progress(handle.get(), &done, nullptr);
      if (cancelled) zv_transfer_cancel(handle.get());
    });
    const int result =
        zv_transfer_run(handle.get(), local.path("large").c_str(), ftp.location(name).c_str());
    later.join();
    EXPECT_EQ(result != 0, cancelled) << reason(handle.get());
    EXPECT_EQ(zv_transfer_cause(handle.get(), nullptr) == ZV_CAUSE_CANCELLED, cancelled);
    zv_transfer_reset(handle.get());
  }
  std::string log;
  for (int tries = 0; tries < 500 && log.find("whole") == std::string::npos; ++tries) {
    std::this_thread::sleep_for(std::chrono::milliseconds(10));
    log = content(set("FTP_LOG"));
  }
  std::istringstream lines(log);
  for (std::string line; std::getline(lines, line);) {
    if (line.find("/cancelled") != std::string::npos) {
      EXPECT_EQ(line.find("OK UPLOAD"), std::string::npos) << line;
    }
  }
  EXPECT_NE(log.find("FAIL UPLOAD"), std::string::npos) << log;
  fs::remove(local.path("large"));
}

TEST(Servers, ManySmallDownloadsAtTheFirstTry) {
  const Place local = places().front();
  for (const Place& remote : {places().back(), places_of_runs().back()})
    for (int i = 0; i < 100; ++i) check_route(run, remote, local, 1000);
}

// The port's name is also a recipient's domain.
void check_mail(Way way, const Place& source, const std::string& port, size_t size) {
  SCOPED_TRACE(std::string(source.name) + " to " + port + ", " + std::to_string(size));
  const std::string recipient = std::to_string(size) + "@" + port;
  const std::string name = std::to_string(size) + ".bin";
  const std::string data = bytes(size);
  source.put(name, data);
  const std::string user = port == "SMTP_PORT" ? "" : login();
  const std::string to = host(port == "SMTPS_PORT" ? "smtps" : "smtp", port.c_str(), user) + "/" +
                         std::to_string(size) + "%40" + port;
  EXPECT_EQ(way(source.location(name), to), 0);
  const fs::path kept = fs::path(set("MAIL_DIR")) / recipient;
  EXPECT_TRUE(content(kept / "attachment") == data);
  EXPECT_EQ(content(kept / "name"), name);
  EXPECT_NE(content(kept / "headers").find("\n" + name + "\n"), std::string::npos);
  fs::remove(source.path(name));
}

TEST(Servers, MailOfEverySizeAndLogin) {
  const Place local = places().front();
  for (const char* const port : {"SMTP_PORT", "SMTP_LOGIN_PORT", "SMTP_PLAIN_PORT"})
    for (const size_t size : {0u, 1u, 47u, 48u, 49u, (1u << 20) + 1})
      for (const Way way : {copy, run}) check_mail(way, local, port, size);
  for (const Place& source : places()) check_mail(copy, source, "SMTP_PORT", 100);
  if (encrypts)
    for (const Place& source : places_of_runs()) check_mail(run, source, "SMTPS_PORT", 1 << 20);

  const std::string refused = host("smtp", "SMTP_PORT", login()) + "/a%40b";
  std::ofstream(local.path("file")) << "x";
  EXPECT_EQ(zv_copy(local.location("file").c_str(), refused.c_str()), -4);
}

TEST(Servers, WhatIsNotThere) {
  const std::string got = set("DIR") + "/got";
  for (const Place& place : places()) {
    SCOPED_TRACE(place.name);
    EXPECT_EQ(zv_copy(place.location("missing").c_str(), got.c_str()), -3);
    const std::string below = place.location("missing/folder/file");
    std::ofstream(set("DIR") + "/file") << "x";
    const int result = zv_copy((set("DIR") + "/file").c_str(), below.c_str());
    EXPECT_EQ(result, place.url.starts_with("http") ? 0 : -4);  // nginx makes the folders
  }
}

}  // namespace
