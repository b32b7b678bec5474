// The private environment: one table for the process, behind one lock.
#include <pthread.h>

#include <cstdlib>
#include <cstring>

#include "frame/owner.h"
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

int zv_putenv_private(const char* name, const char* value, int append) {
  const zv::LockGuard lock(mutex);
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
  const zv::LockGuard lock(mutex);
  const std::string_view values = table.values(name);
  if (values.empty()) return nullptr;
  char* const copy = static_cast<char*>(std::malloc(values.size() + 1));
  if (copy == nullptr) return nullptr;
  std::memcpy(copy, values.data(), values.size());
  copy[values.size()] = '\0';
  return copy;
}
