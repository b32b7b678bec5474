// Copies between local files: one large file, and many small ones.
#include <apr_file_io.h>
#include <zarvo.h>

#include <filesystem>

#include "folder.h"
#include "program.h"
#include "runner.h"

namespace bench {

namespace {

using Copy = bool (*)(const std::string&, const std::string&);

bool copy_with_apr(const std::string& from, const std::string& to) {
  apr_pool_t* pool = nullptr;
  apr_pool_create(&pool, nullptr);
  const bool copied =
      apr_file_copy(from.c_str(), to.c_str(), APR_FPROT_FILE_SOURCE_PERMS, pool) == APR_SUCCESS;
  apr_pool_destroy(pool);
  return copied;
}

Row copy_row(const std::string& name, const std::string& from, const std::string& to,
             const std::vector<std::string>& names) {
  const std::pair<const char*, Copy> copies[] = {
      {"zarvo",
       [](const std::string& source, const std::string& destination) {
         return zv_copy(source.c_str(), destination.c_str()) == 0;
       }},
      {"zarvo with a handle",
       [](const std::string& source, const std::string& destination) {
         zv_transfer_t* const handle = zv_transfer_create();
         const bool copied = zv_transfer_run(handle, source.c_str(), destination.c_str()) == 0;
         zv_transfer_destroy(handle);
         return copied;
       }},
      {"std::filesystem",
       [](const std::string& source, const std::string& destination) {
         std::error_code error;
         return std::filesystem::copy_file(source, destination, error);
       }},
      {"apr", copy_with_apr},
  };
  Row row = {name, {}};
  for (const auto& [who, copy] : copies)
    row.contenders.push_back({who, [copy = copy, from, to, names] {
                                for (const std::string& file : names)
                                  if (!copy(from + "/" + file, to + "/" + file)) return false;
                                return true;
                              }});
  row.contenders.push_back({"cp", [from, to] { return run_program({"cp", "-rT", from, to}); }});
  // What was copied is gone again before the system has written it out.
  row.before = [to] { make_empty(to); };
  row.after = [to] { make_empty(to); };
  return row;
}

}  // namespace

void measure(Runner& runner) {
  struct Case {
    const char* name;
    int count;
    size_t size;
  };
  constexpr size_t kib = 1024;
  const Case cases[] = {
      {"4 KiB files @100", 100, 4 * kib},     {"4 KiB files @1000", 1000, 4 * kib},
      {"4 KiB files @10000", 10000, 4 * kib}, {"64 KiB x 2,000", 2000, 64 * kib},
      {"1 GiB", 1, kib * kib * kib},
  };
  for (const Case& each : cases) {
    const WorkFolder work;
    const std::string from = work.path("from");
    const std::vector<std::string> names = write_files(from, runner.scaled(each.count), each.size);
    Row row = copy_row(std::string("copy/") + each.name, from, work.path("to"), names);
    runner.measure(row);
  }
}

}  // namespace bench
