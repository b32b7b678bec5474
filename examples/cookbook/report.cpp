// Writes a report, mails it as an attachment and leaves nothing of it on the disk.
#include <cstdio>
#include <optional>
#include <string>

#include <zarvo.hpp>

namespace {

// A folder that was not there before, so that nobody has prepared what will lie in it.
std::optional<std::string> make_folder() {
  const auto temporary = zarvo::tempdir();
  for (int i = 0; temporary && i < 100; ++i) {
    auto folder = zarvo::absolute("report-" + std::to_string(i), *temporary);
    if (folder && zv_mkdir(folder->c_str()) == 0) return folder;
  }
  return std::nullopt;
}

bool write_report(const std::string& path) {
  zarvo::Stream file(path, "w");
  const auto host = zarvo::hostname().value_or("this machine");
  const auto user = zarvo::username().value_or("nobody");
  return file && file.write_text("All is well on " + host + ", says " + user + ".\n") &&
         std::fflush(file.get()) == 0;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2 || zv_strnicmp(argv[1], "smtp://", 7) != 0) {
    std::fprintf(stderr, "usage: report smtp://[SENDER[:PASSWORD]@]SERVER[:PORT]/RECIPIENT\n");
    return 2;
  }
  const auto folder = make_folder();
  if (!folder) {
    std::fprintf(stderr, "report: no folder can be made in the temporary folder\n");
    return 1;
  }
  auto result = zarvo::Copied::source_failed;
  const auto report =
      zarvo::absolute("report.txt", *folder);  // the attachment has this file's name
  if (report && write_report(*report)) result = zarvo::copy(*report, argv[1]);
  zv_rmpath(folder->c_str());
  if (result == zarvo::Copied::source_failed) std::fprintf(stderr, "report: cannot be written\n");
  if (result == zarvo::Copied::destination_failed)
    std::fprintf(stderr, "report: cannot be mailed\n");
  return result == zarvo::Copied::whole ? 0 : 1;
}
