// The private environment as it grows, read by one thread and by four.
#include <unistd.h>

#include <cctype>
#include <cstdlib>
#include <cstring>
#include <mutex>
#include <string>
#include <unordered_map>
#include <vector>

#include "frame/measure.h"
#include "zarvo.h"

namespace {

const bench::Item item("environment");

const char* const value = "the value of a variable";

// What an application would write itself: a map with a lock, names in any case, and copies.
class LockedMap {
 public:
  void put(const char* name) {
    const std::lock_guard lock(mutex_);
    values_[lowered(name)] = std::string(value) + '\0';
  }
  size_t get(const char* name) {
    char* copy = nullptr;
    {
      const std::lock_guard lock(mutex_);
      const auto found = values_.find(lowered(name));
      if (found == values_.end()) return 0;
      copy = static_cast<char*>(std::malloc(found->second.size() + 1));
      std::memcpy(copy, found->second.c_str(), found->second.size() + 1);
    }
    const size_t size = std::strlen(copy);
    std::free(copy);
    return size;
  }
  void clear() { values_.clear(); }

 private:
  static std::string lowered(std::string name) {
    for (char& ch : name) ch = static_cast<char>(std::tolower(static_cast<unsigned char>(ch)));
    return name;
  }

  std::mutex mutex_;
  std::unordered_map<std::string, std::string> values_;
};

LockedMap locked_map;

size_t get_from_map(const char* name) {
  return locked_map.get(name);
}

// The process's environment, replaced by one of so many variables.
class Environment {
 public:
  explicit Environment(int count) {
    for (int i = 0; i < count; ++i) names_.push_back("ZV_BENCH_VARIABLE_" + std::to_string(i));
    for (const std::string& name : names_) entries_.push_back(name + '=' + value);
    for (std::string& entry : entries_) pointers_.push_back(entry.data());
    pointers_.push_back(nullptr);
  }

  // Both environments hold these variables and no other.
  void take() {
    environ = pointers_.data();
    zv_putenv_private(nullptr, nullptr, 0);
    locked_map.clear();
    for (const std::string& name : names_) {
      zv_putenv_private(name.c_str(), value, 0);
      locked_map.put(name.c_str());
    }
  }

  // Sixteen variables from all over it.
  std::vector<std::string> some() const {
    std::vector<std::string> names;
    for (size_t i = 0; i < 16; ++i) names.push_back(names_[i * 5 % 16 * names_.size() / 16]);
    return names;
  }

 private:
  std::vector<std::string> names_;
  std::vector<std::string> entries_;
  std::vector<char*> pointers_;
};

template <int count>
void take(const benchmark::State&) {
  static Environment environment(count);
  environment.take();
}

size_t get_private(const char* name) {
  char* const copy = zv_getenv_private(name);
  const size_t size = copy != nullptr ? std::strlen(copy) : 0;
  zv_free(copy);
  return size;
}

size_t get_from_process(const char* name) {
  const char* const text = std::getenv(name);
  return text != nullptr ? std::strlen(text) : 0;
}

template <int count>
void add_get(const char* who, int threads, size_t (*get)(const char*)) {
  Environment environment(count);
  char** const usual = environ;
  environment.take();
  const std::string what = std::string("get, ") + (threads == 1 ? "one thread" : "four threads") +
                           " @" + std::to_string(count);
  const auto work = [get, names = environment.some()] {
    uint64_t size = 0;
    for (const std::string& name : names) size += get(name.c_str());
    return size;
  };
  item.add(what, who, work)->Setup(take<count>)->Threads(threads)->UseRealTime();
  environ = usual;
}

template <int count>
void add_gets(int threads) {
  add_get<count>("zarvo", threads, get_private);
  add_get<count>("getenv", threads, get_from_process);
  add_get<count>("std::unordered_map with a mutex", threads, get_from_map);
}

struct Emptied {
  ~Emptied() { zv_putenv_private(nullptr, nullptr, 0); }
};

void add_put(int count) {
  std::vector<std::string> names;
  for (int i = 0; i < count; ++i) names.push_back("VARIABLE_" + std::to_string(i));
  zv_putenv_private(nullptr, nullptr, 0);
  item.add("put all @" + std::to_string(count), "std::unordered_map with a mutex", [=] {
    LockedMap map;
    for (const std::string& name : names) map.put(name.c_str());
    return names.size();
  });
  item.add("put all @" + std::to_string(count), "zarvo", [=] {
    const Emptied emptied;
    uint64_t made = 0;
    for (const std::string& name : names) made += zv_putenv_private(name.c_str(), value, 0) != 0;
    return made;
  });
}

}  // namespace

void bench::add_cases() {
  for (const int threads : {1, 4}) {
    add_gets<10>(threads);
    add_gets<1000>(threads);
    add_gets<10000>(threads);
  }
  for (const int count : {10, 1000, 10000}) add_put(count);
}
