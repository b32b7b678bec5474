// A hash table with a chain a bucket. A variable is one block: its record, its name, its values.
#include "host/variable_table.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <utility>

#include "frame/byte_map.h"
#include "platform/platform.h"
#include "strings/find.h"
#include "strings/hash.h"

namespace zv {

struct Variable {
  Variable* next;  // in its bucket
  uint64_t hash;
  size_t name_size;
  size_t values_size;
  size_t values_room;

  std::string_view name() const { return {reinterpret_cast<const char*>(this + 1), name_size}; }
  // Each ended by a NUL.
  char* values() { return reinterpret_cast<char*>(this + 1) + name_size; }
  std::string_view all_values() { return {values(), values_size}; }
};

namespace {

// A to Z among the eight characters of a word made lower-case.
uint64_t lower_ascii(uint64_t word) {
  constexpr uint64_t each = 0x0101010101010101U;
  const uint64_t low = word & 0x7F * each;
  const uint64_t from_a = low + (0x80 - 'A') * each;
  const uint64_t above_z = low + (0x7F - 'Z') * each;
  return word | (from_a & ~above_z & ~word & 0x80 * each) >> 2;
}

// Looks for the value and its NUL, which nothing but the end of a value can be.
bool holds(std::string_view values, const char* value) {
  const std::string_view wanted(value, std::strlen(value) + 1);
  const char* const start = values.data();
  const char* const end = start + values.size();
  for (const char* place = start; place != end; ++place) {
    place = find({place, static_cast<size_t>(end - place)}, wanted);
    if (place == nullptr) return false;
    if (place == start || place[-1] == '\0') return true;
  }
  return false;
}

// Moves the variable that `place` leads to into a block of more room.
bool enlarge(Variable** place, size_t name_size, size_t values_room) {
  void* const block = std::realloc(*place, sizeof(Variable) + name_size + values_room);
  if (block == nullptr) return false;
  *place = static_cast<Variable*>(block);
  (*place)->values_room = values_room;
  return true;
}

// Room doubles, so that many appends do not copy the values each time.
bool add_value(Variable** place, std::string_view value) {
  const size_t size = (*place)->values_size;
  const size_t needed = size + value.size() + 1;
  if (needed > (*place)->values_room &&
      !enlarge(place, (*place)->name_size, std::max(needed, 2 * size)))
    return false;
  char* const end = (*place)->values() + size;
  std::memcpy(end, value.data(), value.size());
  end[value.size()] = '\0';
  (*place)->values_size = needed;
  return true;
}

void remove_at(Variable** place) {
  Variable* const variable = *place;
  *place = variable->next;
  std::free(variable);
}

}  // namespace

std::string_view VariableTable::values(std::string_view name) const {
  Variable** const found = find(name);
  return found != nullptr ? (*found)->all_values() : std::string_view();
}

bool VariableTable::set(std::string_view name, std::string_view value) {
  Variable** const found = find(name);
  if (found == nullptr) return make(name, value);
  (*found)->values_size = 0;
  if (add_value(found, value)) return true;
  remove_at(found);
  --count_;
  return false;
}

bool VariableTable::append(std::string_view name, const char* value) {
  Variable** const found = find(name);
  if (found == nullptr) return make(name, value);
  return holds((*found)->all_values(), value) || add_value(found, value);
}

void VariableTable::remove(std::string_view name) {
  Variable** const found = find(name);
  if (found == nullptr) return;
  remove_at(found);
  --count_;
}

void VariableTable::clear() {
  for (size_t i = 0; i < bucket_count_; ++i)
    while (buckets_[i] != nullptr) remove_at(&buckets_[i]);
  std::free(buckets_);
  *this = VariableTable();
}

void VariableTable::note_case() {
  ByteMap room;
  const int32_t* const lower = platform::lower_map(room);
  std::copy(lower, lower + room.size(), fold_.begin());
  only_ascii_has_case_ = agrees(lower, ascii_lower);
}

// Each of the eight characters in lower case.
uint64_t VariableTable::folded(uint64_t word) const {
  if (only_ascii_has_case_) return lower_ascii(word);
  uint64_t lowered = 0;
  for (int shift = 0; shift < 64; shift += 8)
    lowered |= static_cast<uint64_t>(fold_[word >> shift & 0xFF]) << shift;
  return lowered;
}

bool VariableTable::is_name_of(const Variable& variable, std::string_view name) const {
  std::string_view own = variable.name();
  if (own.size() != name.size()) return false;
  for (; name.size() > 8; name.remove_prefix(8), own.remove_prefix(8))
    if (folded(load_word<uint64_t>(name.data())) != folded(load_word<uint64_t>(own.data())))
      return false;
  return folded(load_short(name)) == folded(load_short(own));
}

// The link that leads to the variable; nullptr where there is none.
Variable** VariableTable::find(std::string_view name) const {
  if (count_ == 0) return nullptr;
  const uint64_t hash = hash_of(name, key_, [this](uint64_t word) { return folded(word); });
  for (Variable** place = &bucket(hash); *place != nullptr; place = &(*place)->next)
    if ((*place)->hash == hash && is_name_of(**place, name)) return place;
  return nullptr;
}

// One bucket a variable. Where memory for more buckets is short, the ones there are go on serving.
bool VariableTable::make_room() {
  if (count_ < bucket_count_) return true;
  const size_t wanted = std::max<size_t>(16, 2 * bucket_count_);
  auto** const made = static_cast<Variable**>(std::calloc(wanted, sizeof(Variable*)));
  if (made == nullptr) return bucket_count_ != 0;
  if (bucket_count_ == 0) {
    note_case();
    key_ = hash_key();
  }
  for (size_t i = 0; i < bucket_count_; ++i) {
    while (Variable* const variable = buckets_[i]) {
      buckets_[i] = variable->next;
      variable->next = std::exchange(made[variable->hash & (wanted - 1)], variable);
    }
  }
  std::free(buckets_);
  buckets_ = made;
  bucket_count_ = wanted;
  return true;
}

bool VariableTable::make(std::string_view name, std::string_view value) {
  Variable* made = nullptr;
  if (!make_room() || !enlarge(&made, name.size(), value.size() + 1)) return false;
  const uint64_t hash = hash_of(name, key_, [this](uint64_t word) { return folded(word); });
  made->hash = hash;
  made->name_size = name.size();
  made->values_size = 0;
  std::memcpy(made + 1, name.data(), name.size());
  static_cast<void>(add_value(&made, value));
  made->next = std::exchange(bucket(hash), made);
  ++count_;
  return true;
}

}  // namespace zv
