// Files over HTTP, FTP and mail, to and from real servers on this machine. libcurl makes a new
// connection for each file too, and has its larger buffers.
#include <curl/curl.h>
#include <zarvo.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <functional>
#include <iostream>

#include "folder.h"
#include "mail_server.h"
#include "runner.h"

namespace bench {

namespace {

constexpr size_t kib = 1024;

// What scripts/servers/with_servers tells; "" without it.
std::string told(const char* name) {
  const char* const value = std::getenv((std::string("ZARVO_TEST_") + name).c_str());
  return value != nullptr ? value : "";
}

// One handle for all files, as libcurl advises; its connections are not used again.
class Curl {
 public:
  Curl() : handle_(curl_easy_init()) {
    constexpr long buffer = 512 * 1024;
    set(CURLOPT_FRESH_CONNECT, 1L);
    set(CURLOPT_FORBID_REUSE, 1L);
    set(CURLOPT_FAILONERROR, 1L);
    set(CURLOPT_BUFFERSIZE, buffer);
    set(CURLOPT_UPLOAD_BUFFERSIZE, buffer);
    set(CURLOPT_FTP_FILEMETHOD, static_cast<long>(CURLFTPMETHOD_NOCWD));
    // Without it an upload waits for the server's leave.
    headers_ = curl_slist_append(nullptr, "Expect:");
    set(CURLOPT_HTTPHEADER, headers_);
  }
  ~Curl() {
    curl_easy_cleanup(handle_);
    curl_slist_free_all(headers_);
  }
  Curl(const Curl&) = delete;
  Curl& operator=(const Curl&) = delete;

  void trust(const std::string& certificates) { set(CURLOPT_CAINFO, certificates.c_str()); }

  bool download(const std::string& url, const std::string& path) {
    FILE* const file = std::fopen(path.c_str(), "wb");
    set(CURLOPT_URL, url.c_str());
    set(CURLOPT_WRITEDATA, file);
    const bool good = curl_easy_perform(handle_) == CURLE_OK;
    return std::fclose(file) == 0 && good;
  }

  bool upload(const std::string& path, const std::string& url) {
    FILE* const file = std::fopen(path.c_str(), "rb");
    set(CURLOPT_URL, url.c_str());
    set(CURLOPT_UPLOAD, 1L);
    set(CURLOPT_READDATA, file);
    set(CURLOPT_INFILESIZE_LARGE, static_cast<curl_off_t>(std::filesystem::file_size(path)));
    const bool good = curl_easy_perform(handle_) == CURLE_OK;
    std::fclose(file);
    return good;
  }

  bool mail(const std::string& path, const std::string& url) {
    curl_mime* const mime = curl_mime_init(handle_);
    curl_mimepart* part = curl_mime_addpart(mime);
    curl_mime_data(part, "The file is attached.\r\n", CURL_ZERO_TERMINATED);
    part = curl_mime_addpart(mime);
    curl_mime_filedata(part, path.c_str());
    curl_mime_encoder(part, "base64");
    curl_slist* const recipients = curl_slist_append(nullptr, "somebody@localhost");
    set(CURLOPT_HTTPHEADER, nullptr);
    set(CURLOPT_URL, url.c_str());
    set(CURLOPT_MAIL_FROM, "zarvo@localhost");
    set(CURLOPT_MAIL_RCPT, recipients);
    set(CURLOPT_MIMEPOST, mime);
    const bool good = curl_easy_perform(handle_) == CURLE_OK;
    curl_slist_free_all(recipients);
    curl_mime_free(mime);
    return good;
  }

 private:
  template <class Value>
  void set(CURLoption option, Value value) {
    curl_easy_setopt(handle_, option, value);
  }

  CURL* handle_;
  curl_slist* headers_ = nullptr;
};

struct Files {
  const char* name;
  int count;
  size_t size;
};

constexpr Files large = {"512 MiB", 1, 512 * kib* kib};
constexpr Files small = {"4 KiB x 500", 500, 4 * kib};
constexpr Files more = {"4 KiB x 1,000", 1000, 4 * kib};

// A retrieval fails when a server's first and last reply arrive together; then it is tried again.
int retries = 0;

bool get_with_zarvo(const std::string& url, const std::string& path) {
  constexpr int most = 20;
  for (int i = 0; i < most; ++i, ++retries)
    if (zv_copy(url.c_str(), path.c_str()) == 0) return true;
  return false;
}

bool run_with_zarvo(const std::string& from, const std::string& to) {
  zv_transfer_t* const handle = zv_transfer_create();
  const bool good = zv_transfer_run(handle, from.c_str(), to.c_str()) == 0;
  zv_transfer_destroy(handle);
  return good;
}

// One file each way, by both.
bool put_with_zarvo(const std::string& path, const std::string& url) {
  return zv_copy(path.c_str(), url.c_str()) == 0;
}

bool get_with_curl(Curl& curl, const std::string& url, const std::string& path) {
  return curl.download(url, path);
}

bool put_with_curl(Curl& curl, const std::string& path, const std::string& url) {
  return curl.upload(path, url);
}

// A row that moves all files from one place to another; each place ends in a slash.
struct Places {
  std::string from, to;
  std::vector<std::string> names;
};

using Copy = bool (*)(const std::string& from, const std::string& to);

std::function<bool()> each(const Places& places, Copy copy) {
  return [places, copy] {
    return std::ranges::all_of(places.names, [&](const std::string& file) {
      return copy(places.from + file, places.to + file);
    });
  };
}

template <class Libcurl>
Row way(const std::string& name, const Places& places, Copy zarvo, Libcurl libcurl) {
  Row row = {.name = "transfer/" + name, .contenders = {}};
  row.clock = true;
  row.contenders = {{"zarvo", each(places, zarvo)},
                    {"zarvo with a handle", each(places, run_with_zarvo)},
                    {"libcurl", [places, libcurl] {
                       Curl curl;
                       return std::ranges::all_of(places.names, [&](const std::string& file) {
                         return libcurl(curl, places.from + file, places.to + file);
                       });
                     }}};
  return row;
}

// Both ways between a local folder and a server's, `url` as the client names it.
void measure_ways(Runner& runner, const std::string& item, const std::string& url,
                  const std::string& server_folder, const Files& files) {
  const WorkFolder work;
  const std::string local = work.path("local");
  const int count = runner.scaled(files.count);

  const std::vector<std::string> names = write_files(server_folder, count, files.size);
  Row get =
      way(item + " GET, " + files.name, {url, local + "/", names}, get_with_zarvo, get_with_curl);
  get.before = [local] { make_empty(local); };
  runner.measure(get);
  if (retries > 0) std::cerr << item << ": " << retries << " retrievals repeated\n";
  retries = 0;

  write_files(local, count, files.size);
  Row put =
      way(item + " PUT, " + files.name, {local + "/", url, names}, put_with_zarvo, put_with_curl);
  put.before = [server_folder] {
    make_empty(server_folder);
    std::filesystem::permissions(server_folder, std::filesystem::perms::all);
  };
  runner.measure(put);
  std::filesystem::remove_all(server_folder);
}

// Each keeps one handle for all files: what it trusts is read once, and a session is used again.
void measure_encrypted(Runner& runner, const Files& files) {
  const WorkFolder work;
  const std::string local = work.path("local") + "/";
  const std::string server_folder = told("HTTP_ROOT") + "/bench";
  const std::string url = "https://localhost:" + told("HTTPS_PORT") + "/bench/";
  const std::vector<std::string> names =
      write_files(server_folder, runner.scaled(files.count), files.size);
  Row row = {.name = std::string("transfer/HTTPS GET, ") + files.name, .contenders = {}};
  row.clock = true;
  row.before = [local] { make_empty(local); };
  row.contenders = {{"zarvo with a handle",
                     [=] {
                       zv_transfer_t* const handle = zv_transfer_create();
                       zv_transfer_trust(handle, told("CERTIFICATES").c_str());
                       const bool good = std::ranges::all_of(names, [&](const std::string& file) {
                         return zv_transfer_run(handle, (url + file).c_str(),
                                                (local + file).c_str()) == 0;
                       });
                       zv_transfer_destroy(handle);
                       return good;
                     }},
                    {"libcurl", [=] {
                       Curl curl;
                       curl.trust(told("CERTIFICATES"));
                       return std::ranges::all_of(names, [&](const std::string& file) {
                         return curl.download(url + file, local + file);
                       });
                     }}};
  runner.measure(row);
  std::filesystem::remove_all(server_folder);
}

void measure_mail(Runner& runner) {
  const WorkFolder work;
  const MailServer server;
  const std::string path = work.path("attachment.bin");
  const std::string url = "smtp://127.0.0.1:" + std::to_string(server.port());
  write_file(path, 32 * kib * kib);
  Row row = {
      "transfer/mail, 32 MiB",
      {{"zarvo", [&] { return put_with_zarvo(path, url + "/somebody@localhost"); }},
       {"zarvo with a handle", [&] { return run_with_zarvo(path, url + "/somebody@localhost"); }},
       {"libcurl", [&] { return Curl().mail(path, url); }}}};
  row.clock = true;
  runner.measure(row);
}

}  // namespace

void measure(Runner& runner) {
  const std::string http = "http://127.0.0.1:" + told("HTTP_PORT") + "/bench/";
  const std::string ftp = "ftp://" + told("USER") + ":" + told("PASSWORD") +
                          "@127.0.0.1:" + told("FTP_PORT") + "/pub/bench/";
  for (const Files& files : {large, small}) {
    measure_ways(runner, "HTTP", http, told("HTTP_ROOT") + "/bench", files);
    // Without root there is no FTP server.
    if (!told("FTP_PORT").empty())
      measure_ways(runner, "FTP", ftp, told("FTP_HOME") + "/pub/bench", files);
  }
  for (const Files& files : {large, more}) measure_encrypted(runner, files);
  measure_mail(runner);
}

}  // namespace bench
