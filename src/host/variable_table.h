// Variables with several values each, in the order in which they were made, found by name as fast
// among ten thousand as among ten.
#ifndef ZARVO_HOST_VARIABLE_TABLE_H
#define ZARVO_HOST_VARIABLE_TABLE_H

#include <cstddef>
#include <string_view>

namespace zv {

struct Variable;

// Names are compared without regard to case, as the locale has it when the first variable is made:
// a later change of locale must not make a variable unfindable. There is no destructor, because
// nothing is to run when the library is unloaded.
class VariableTable {
 public:
  // The variable's values, each ended by a NUL; empty when there is no such variable.
  std::string_view values(std::string_view name) const;

  // Makes the variable anew, as the last one. False when memory ran out: a former variable of that
  // name is gone all the same.
  [[nodiscard]] bool set(std::string_view name, std::string_view value);

  // Makes the variable, or adds a value to it unless it holds that one. False when memory ran out,
  // and the table is as it was.
  [[nodiscard]] bool append(std::string_view name, std::string_view value);

  void remove(std::string_view name);
  void clear();

 private:
  unsigned char folded(char ch) const { return fold_[static_cast<unsigned char>(ch)]; }
  size_t hash_of(std::string_view name) const;
  bool is_name_of(const Variable& variable, std::string_view name) const;
  Variable*& bucket(size_t hash) const { return buckets_[hash & (bucket_count_ - 1)]; }
  Variable* find(std::string_view name) const;
  bool make_room();
  void note_case();
  void link(Variable* variable);
  void unlink(Variable* variable);

  unsigned char fold_[256] = {};
  Variable** buckets_ = nullptr;
  size_t bucket_count_ = 0;  // a power of 2; 0 while the table is absent
  size_t count_ = 0;
  Variable* oldest_ = nullptr;
  Variable* newest_ = nullptr;
};

}  // namespace zv

#endif
