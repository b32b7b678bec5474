// An application of the C++ layer, in C++17: every owner and every result. Prints what is wrong and
// ends with 1, or prints "consumer: ok".
#include <zarvo.hpp>

#include <cstdio>
#include <utility>

namespace {

using Texts = std::vector<std::string>;
using zarvo::Copied, zarvo::Listed, zarvo::Stream, zarvo::StringList;

const std::string nul("a\0b", 3);
const std::string longest(319, 'p');
const std::string longer(320, 'p');

int failures = 0;

#define EXPECT(truth) failures += (truth) ? 0 : std::printf("consumer: not so: %s\n", #truth)

void paths() {
  const std::pair<std::optional<std::string>, std::optional<std::string>> rows[] = {
      {zarvo::normalize_path("a\\.\\b/../c.txt"), "a/c.txt"},
      {zarvo::normalize_path(longest), longest},
      {zarvo::normalize_path(longer), {}},
      {zarvo::normalize_path(nul), {}},
      {zarvo::normalize_path(std::string_view("a/b/c", 3)), "a/b"},
      {zarvo::absolute("../x", "D:/a/b"), "D:/a/x"},
      {zarvo::absolute("xyz", "/" + longest.substr(3)), {}},
      {zarvo::absolute("x", std::string()), {}},
      {zarvo::absolute("x"), *zarvo::working_directory() + "/x"},
      {zarvo::relative("D:/a/x", "D:/a"), "x"},
      {zarvo::extract_directory("a/b.c"), "a"},
      {zarvo::extract_filename("a/b.c"), "b.c"},
      {zarvo::extract_extension("a/b.c"), ".c"},
      {zarvo::path_locate("no-such-file"), {}},
      {zarvo::pathmap_locate("no-such/file"), {}},
      {zarvo::fmt_force("PNG image|.png|", "photo"), "photo.png"},
  };
  for (const auto& row : rows) EXPECT(row.first == row.second);
  EXPECT(zarvo::split_path("/" + longest.substr(1)) == (Texts{"/", longest.substr(1)}));
  EXPECT(zarvo::split_path(longer).empty());
  EXPECT(zarvo::username() && zarvo::hostname() && zarvo::pathlist().size() > 0);
  EXPECT(zv_putenv_private("it", "one", 0) && zv_putenv_private("it", "two", 1));
  EXPECT(zarvo::getenv_private("IT") == (Texts{"one", "two"}));
}

void lists() {
  StringList list("b;a;b;", ';'), none;
  EXPECT(list.size() == 3 && list.find("b") == 0U && !list.find("c"));
  EXPECT(list.insert(3, "c") && list.remove(0) == "b");
  StringList moved = std::move(list);
  EXPECT(moved.strings() == (Texts{"a", "b", "c"}) && moved[1][0] == 'b');
  for (const StringList* const empty : {&list, &none})
    EXPECT(!*empty && empty->size() == 0 && empty->strings().empty() && !empty->find("a"));
  EXPECT(none.insert(0, longer) && none.strings() == Texts{longer});
  EXPECT(StringList(std::string_view("x\0y\0", 4), '\0').strings() == (Texts{"x", "y"}));
}

void streams() {
  Stream file("layer/file", "w");
  std::uint16_t units[] = {0x6162, 0x0D0A};
  EXPECT(file.write_text(longest + longest + "\n\n", true) && file.write(units, 2) == 2);
  file = Stream("layer/file", "r");
  EXPECT(file.read_line() == longest + longest && file.read_line() == "");
  EXPECT(file.read(units, 2, true) == 2 && units[1] == 0x0A0D && !file.read_line());
  file = Stream("layer/zero", "w");
  EXPECT(file.write(nul.data(), nul.size()) == nul.size());
  file = Stream("layer/zero", "r");
  EXPECT(file.read_line() == nul && !file.read_line());
  EXPECT(!Stream(nul, "r") && !Stream("layer/none", "r"));
}

void folders() {
  Texts names;
  for (const std::string& name : zarvo::Directory("layer")) names.push_back(name);
  EXPECT(names == (Texts{"file", "zero"}) || names == (Texts{"zero", "file"}));
  EXPECT(!zarvo::Directory("no-such") && !zarvo::Directory(nul));
  const auto only = [&](const char*, std::string_view name) { return name == "zero"; };
  EXPECT(zarvo::dir_scan("layer", Listed::names, only).strings() == Texts{"zero"});
  EXPECT(zarvo::dir_scan("layer", Listed::paths, only).strings() == Texts{"layer/zero"});
  EXPECT(zarvo::dir_scan("layer", Listed::tree).size() == 2);
  EXPECT(zarvo::dir_scan("no-such", Listed::tree) && !zarvo::dir_scan(longer, Listed::tree));
}

void rest() {
  EXPECT(!zarvo::Library("no-such.dll") && !zarvo::Library("no-such.dll").symbol<int()>("x"));
  zarvo::Plugins plugins("no-such", 1, 2);
  EXPECT(!plugins && plugins.formats().size() == 0 && !zarvo::Loaded(plugins.for_file("a.png")));
  EXPECT(zarvo::copy("layer/file", "layer/copy") == Copied::whole);
  zarvo::Transfer transfer;
  std::int64_t moved = -1;
  const auto watch = [&](std::int64_t done, std::int64_t) { return (moved = done) >= 0; };
  const auto stop = [](std::int64_t, std::int64_t) { return false; };
  EXPECT(transfer.watch(watch) && transfer.reason().empty());
  EXPECT(transfer.run("layer/file", "layer/copy") == Copied::whole && moved > 0);
  EXPECT(transfer.run("layer/none", "layer/copy") == Copied::source_failed);
  EXPECT(transfer.reason() == "read layer/none: No such file or directory");
  EXPECT(transfer.watch(stop) && transfer.run("layer/file", "layer/copy") != Copied::whole);
}

}  // namespace

int main() {
  EXPECT(zv_mkpath("layer"));
  for (const auto part : {paths, lists, streams, folders, rest}) part();
  EXPECT(zv_rmpath("layer"));
  if (failures == 0) std::puts("consumer: ok");
  return failures != 0;
}
