// Writes a report, mails it as an attachment and leaves nothing of it on the disk.
#include <cstdio>

#include <zarvo.h>

namespace {

// A folder that was not there before, so that nobody has prepared what will lie in it.
bool make_folder(char* folder) {
  char temporary[ZV_PATH_MAX];
  if (zv_tempdir(temporary, sizeof temporary) == 0) return false;
  for (int i = 0; i < 100; ++i) {
    const int length = std::snprintf(folder, ZV_PATH_MAX, "%s/report-%d", temporary, i);
    if (length < ZV_PATH_MAX && zv_mkdir(folder) == 0) return true;
  }
  return false;
}

bool write_report(const char* path) {
  char user[64];
  char host[64];
  zv_username(user, sizeof user);
  zv_hostname(host, sizeof host);
  FILE* const file = zv_fopen(path, "w", nullptr);
  if (file == nullptr) return false;
  std::fprintf(file, "All is well on %s, says %s.\n", host, user);
  const bool written = std::fflush(file) == 0 && std::ferror(file) == 0;
  zv_fclose(file);
  return written;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2 || zv_strnicmp(argv[1], "smtp://", 7) != 0) {
    std::fprintf(stderr, "usage: report smtp://[SENDER[:PASSWORD]@]SERVER[:PORT]/RECIPIENT\n");
    return 2;
  }
  char folder[ZV_PATH_MAX];
  char report[ZV_PATH_MAX];  // the attachment has this file's name
  if (!make_folder(folder)) {
    std::fprintf(stderr, "report: no folder can be made in the temporary folder\n");
    return 1;
  }
  int result = ZV_COPY_SOURCE_FAILED;
  if (zv_absolute("report.txt", folder, report, sizeof report) && write_report(report))
    result = zv_copy(report, argv[1]);
  zv_rmpath(folder);
  if (result == ZV_COPY_SOURCE_FAILED) std::fprintf(stderr, "report: cannot be written\n");
  if (result == ZV_COPY_DESTINATION_FAILED) std::fprintf(stderr, "report: cannot be mailed\n");
  return result == 0 ? 0 : 1;
}
