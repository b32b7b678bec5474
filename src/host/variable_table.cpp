// A hash index over a list: the list keeps the order, the index finds.
#include "host/variable_table.h"

#include <algorithm>
#include <cctype>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <memory>

namespace zv {

// The name, in the spelling it was made with, lies behind the record in the same block.
struct Variable {
  size_t hash;
  Variable* next_in_bucket;
  Variable* older;
  Variable* newer;
  char* values;
  size_t values_size;
  size_t values_room;
  size_t name_size;

  char* name_room() { return reinterpret_cast<char*>(this + 1); }
  std::string_view name() const { return {reinterpret_cast<const char*>(this + 1), name_size}; }
};

namespace {

struct FreeVariable {
  void operator()(Variable* variable) const {
    std::free(variable->values);
    std::free(variable);
  }
};

using VariablePtr = std::unique_ptr<Variable, FreeVariable>;

// Room doubles, so that many appends do not copy the values each time.
bool add_value(Variable& variable, std::string_view value) {
  const size_t needed = variable.values_size + value.size() + 1;
  if (needed > variable.values_room) {
    const size_t room = std::max(needed, 2 * variable.values_room);
    void* const moved = std::realloc(variable.values, room);
    if (moved == nullptr) return false;
    variable.values = static_cast<char*>(moved);
    variable.values_room = room;
  }
  std::memcpy(variable.values + variable.values_size, value.data(), value.size());
  variable.values[needed - 1] = '\0';
  variable.values_size = needed;
  return true;
}

bool holds(std::string_view values, std::string_view value) {
  while (!values.empty()) {
    const size_t size = values.find('\0');
    if (std::string_view(values.data(), size) == value) return true;
    values.remove_prefix(size + 1);
  }
  return false;
}

VariablePtr make_variable(std::string_view name, std::string_view value) {
  VariablePtr made(static_cast<Variable*>(std::calloc(1, sizeof(Variable) + name.size())));
  if (made == nullptr || !add_value(*made, value)) return nullptr;
  std::memcpy(made->name_room(), name.data(), name.size());
  made->name_size = name.size();
  return made;
}

}  // namespace

std::string_view VariableTable::values(std::string_view name) const {
  const Variable* const found = find(name);
  if (found == nullptr) return {};
  return {found->values, found->values_size};
}

bool VariableTable::set(std::string_view name, std::string_view value) {
  remove(name);
  if (!make_room()) return false;
  VariablePtr made = make_variable(name, value);
  if (made == nullptr) return false;
  link(made.release());
  return true;
}

bool VariableTable::append(std::string_view name, std::string_view value) {
  Variable* const found = find(name);
  if (found == nullptr) return set(name, value);
  return holds({found->values, found->values_size}, value) || add_value(*found, value);
}

void VariableTable::remove(std::string_view name) {
  Variable* const found = find(name);
  if (found == nullptr) return;
  unlink(found);
  FreeVariable()(found);
}

void VariableTable::clear() {
  while (oldest_ != nullptr) {
    const VariablePtr variable(oldest_);
    oldest_ = variable->newer;
  }
  std::free(buckets_);
  *this = VariableTable();
}

// FNV-1a over the folded name.
size_t VariableTable::hash_of(std::string_view name) const {
  uint64_t hash = 0xcbf29ce484222325U;
  for (const char ch : name) hash = (hash ^ folded(ch)) * 0x100000001b3U;
  return hash;
}

bool VariableTable::is_name_of(const Variable& variable, std::string_view name) const {
  const std::string_view own = variable.name();
  return std::equal(own.begin(), own.end(), name.begin(), name.end(),
                    [this](char a, char b) { return folded(a) == folded(b); });
}

Variable* VariableTable::find(std::string_view name) const {
  if (count_ == 0) return nullptr;
  const size_t hash = hash_of(name);
  Variable* variable = bucket(hash);
  while (variable != nullptr && !(variable->hash == hash && is_name_of(*variable, name)))
    variable = variable->next_in_bucket;
  return variable;
}

// One bucket a variable. Where memory for more buckets is short, the ones there are go on serving.
bool VariableTable::make_room() {
  if (count_ < bucket_count_) return true;
  const size_t wanted = std::max<size_t>(16, 2 * bucket_count_);
  void* const made = std::calloc(wanted, sizeof(Variable*));
  if (made == nullptr) return bucket_count_ != 0;
  if (bucket_count_ == 0) note_case();
  std::free(buckets_);
  buckets_ = static_cast<Variable**>(made);
  bucket_count_ = wanted;
  for (Variable* variable = oldest_; variable != nullptr; variable = variable->newer) {
    variable->next_in_bucket = bucket(variable->hash);
    bucket(variable->hash) = variable;
  }
  return true;
}

void VariableTable::note_case() {
  for (int ch = 0; ch < 256; ++ch) fold_[ch] = static_cast<unsigned char>(std::tolower(ch));
}

void VariableTable::link(Variable* variable) {
  variable->hash = hash_of(variable->name());
  variable->next_in_bucket = bucket(variable->hash);
  bucket(variable->hash) = variable;
  variable->older = newest_;
  (newest_ != nullptr ? newest_->newer : oldest_) = variable;
  newest_ = variable;
  ++count_;
}

void VariableTable::unlink(Variable* variable) {
  Variable** place = &bucket(variable->hash);
  while (*place != variable) place = &(*place)->next_in_bucket;
  *place = variable->next_in_bucket;
  (variable->older != nullptr ? variable->older->newer : oldest_) = variable->newer;
  (variable->newer != nullptr ? variable->newer->older : newest_) = variable->older;
  --count_;
}

}  // namespace zv
