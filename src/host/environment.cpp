// The private environment: one table for the process, behind one lock.
#include "host/environment.h"

#include <pthread.h>

#include <cstdlib>
#include <cstring>

#include "frame/lock.h"
#include "host/variable_table.h"
#include "zarvo.h"

namespace {

constexpr char record_separator = '\x1E';

pthread_mutex_t mutex = PTHREAD_MUTEX_INITIALIZER;
constinit zv::VariableTable table;

bool holds_separator(const char* text) {
  return std::strchr(text, record_separator) != nullptr;
}

}  // namespace

bool zv::get_private(const char* name, HeapPtr<char>& values) {
  values.reset();
  const LockGuard lock(mutex);
  if (!lock.held()) return false;
  const std::string_view found = table.values(name);
  if (found.empty()) return true;
  values.reset(static_cast<char*>(std::malloc(found.size() + 1)));
  if (values == nullptr) return false;
  std::memcpy(values.get(), found.data(), found.size());
  values.get()[found.size()] = '\0';
  return true;
}

int zv_putenv_private(const char* name, const char* value, int append) {
  const zv::LockGuard lock(mutex);
  if (!lock.held()) return 0;
  if (name == nullptr) {
    table.clear();
    return 1;
  }
  if (holds_separator(name) || (value != nullptr && holds_separator(value))) return 0;
  if (value == nullptr) {
    table.remove(name);
    return 1;
  }
  return append != 0 ? table.append(name, value) : table.set(name, value);
}

char* zv_getenv_private(const char* name) {
  zv::HeapPtr<char> values;
  return zv::get_private(name, values) ? values.release() : nullptr;
}
