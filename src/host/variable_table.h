// Variables with several values each, found by name as fast among ten thousand as among ten.
#ifndef ZARVO_HOST_VARIABLE_TABLE_H
#define ZARVO_HOST_VARIABLE_TABLE_H

#include <cstddef>
#include <cstdint>
#include <string_view>

#include "frame/byte_map.h"

namespace zv {

struct Variable;

// Names are compared without regard to case, as the locale has it when the first variable is made:
// a later change of locale must not make a variable unfindable. There is no destructor, because
// nothing is to run when the library is unloaded.
class VariableTable {
 public:
  // The variable's values, each ended by a NUL; empty when there is no such variable.
  std::string_view values(std::string_view name) const;

  // Gives the variable this value alone. False when memory ran out: a former variable of that name
  // is gone all the same.
  [[nodiscard]] bool set(std::string_view name, std::string_view value);

  // Makes the variable, or adds a value to it unless it holds that one. False when memory ran out,
  // and the table is as it was.
  [[nodiscard]] bool append(std::string_view name, const char* value);

  void remove(std::string_view name);
  void clear();

 private:
  void note_case();
  uint64_t folded(uint64_t word) const;
  bool is_name_of(const Variable& variable, std::string_view name) const;
  Variable*& bucket(uint64_t hash) const { return buckets_[hash & (bucket_count_ - 1)]; }
  Variable** find(std::string_view name) const;
  [[nodiscard]] bool make_room();
  [[nodiscard]] bool make(std::string_view name, std::string_view value);

  Variable** buckets_ = nullptr;
  size_t bucket_count_ = 0;  // a power of 2; 0 while the table is absent
  size_t count_ = 0;
  uint64_t key_ = 0;
  bool only_ascii_has_case_ = false;
  ByteMap fold_ = {};
};

}  // namespace zv

#endif
