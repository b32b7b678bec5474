// Copies against real servers, which with_servers starts and names in the environment.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <random>
#include <string>
#include <vector>

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

std::string host(const char* scheme, const char* port, const std::string& login = "") {
  return std::string(scheme) + "://" + login + "127.0.0.1:" + set(port);
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

// A retrieval fails when both of its replies arrive in one receive, which happens by chance.
int copy(const std::string& from, const std::string& to) {
  int result = -3;
  for (int tries = 0; tries < 20 && result == -3; ++tries)
    result = zv_copy(from.c_str(), to.c_str());
  return result;
}

void check_route(const Place& source, const Place& destination, size_t size) {
  SCOPED_TRACE(std::string(source.name) + " to " + destination.name + ", " + std::to_string(size));
  const std::string file = "f" + std::to_string(size);
  const std::string sent = file + ".in";
  const std::string got = file + ".out";
  const std::string data = bytes(size);
  source.put(sent, data);
  EXPECT_EQ(copy(source.location(sent), destination.location(got)), 0);
  EXPECT_TRUE(content(destination.path(got)) == data);
  fs::remove(source.path(sent));
  fs::remove(destination.path(got));
}

TEST(Servers, EveryRouteAndSize) {
  for (const Place& source : places()) {
    for (const Place& destination : places()) {
      for (const size_t size : {1u, 512u, (1u << 20) + 1}) check_route(source, destination, size);
      if (source.url.starts_with("/")) check_route(source, destination, 0);
    }
  }
}

TEST(Servers, LargeFilesBothWays) {
  const Place local = places().front();
  for (const Place& place : places()) {
    if (place.url.find("://127") == std::string::npos) continue;
    check_route(local, place, 64 << 20);
    check_route(place, local, 64 << 20);
  }
}

// The port's name is also a recipient's domain.
void check_mail(const Place& source, const std::string& port, size_t size) {
  SCOPED_TRACE(std::string(source.name) + " to " + port + ", " + std::to_string(size));
  const std::string recipient = std::to_string(size) + "@" + port;
  const std::string name = std::to_string(size) + ".bin";
  const std::string data = bytes(size);
  source.put(name, data);
  const std::string user = port == "SMTP_PORT" ? "" : login();
  const std::string to =
      host("smtp", port.c_str(), user) + "/" + std::to_string(size) + "%40" + port;
  EXPECT_EQ(copy(source.location(name), to), 0);
  const fs::path kept = fs::path(set("MAIL_DIR")) / recipient;
  EXPECT_TRUE(content(kept / "attachment") == data);
  EXPECT_EQ(content(kept / "name"), name);
  EXPECT_NE(content(kept / "headers").find("\n" + name + "\n"), std::string::npos);
  fs::remove(source.path(name));
}

TEST(Servers, MailOfEverySizeAndLogin) {
  const Place local = places().front();
  for (const char* const port : {"SMTP_PORT", "SMTP_LOGIN_PORT", "SMTP_PLAIN_PORT"})
    for (const size_t size : {0u, 1u, 47u, 48u, 49u, (1u << 20) + 1}) check_mail(local, port, size);
  for (const Place& source : places()) check_mail(source, "SMTP_PORT", 100);

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
