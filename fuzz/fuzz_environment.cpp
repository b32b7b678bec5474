// The private environment as a program, beside a plain model.
#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <cstring>
#include <string>
#include <vector>

#include "check.h"
#include "zarvo.h"

namespace {

constexpr char separator = 30;

struct Variable {
  std::string name;
  std::vector<std::string> values;
};

using Model = std::vector<Variable>;

Model::iterator find(Model& model, const std::string& name) {
  return std::find_if(model.begin(), model.end(), [&](const Variable& variable) {
    return zv_stricmp(variable.name.c_str(), name.c_str()) == 0;
  });
}

bool holds_separator(const std::string& text) {
  return text.find(separator) != std::string::npos;
}

int put(Model& model, const std::string& name, const std::string& value, bool append) {
  if (holds_separator(name) || holds_separator(value)) return 0;
  const auto found = find(model, name);
  if (append && found != model.end()) {
    auto& values = found->values;
    if (std::find(values.begin(), values.end(), value) == values.end()) values.push_back(value);
    return 1;
  }
  if (found != model.end()) model.erase(found);
  model.push_back({name, {value}});
  return 1;
}

void check_get(Model& model, const std::string& name) {
  char* const values = zv_getenv_private(name.c_str());
  const auto found = find(model, name);
  CHECK((values != nullptr) == (found != model.end()));
  if (values == nullptr) return;
  const char* value = values;
  for (const std::string& expected : found->values) {
    CHECK(expected == value);
    value += std::strlen(value) + 1;
  }
  CHECK(*value == '\0');
  zv_free(values);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  FuzzedDataProvider program(data, size);
  Model model;
  while (program.remaining_bytes() > 0) {
    const std::string name = program.ConsumeRandomLengthString(4).c_str();
    const std::string value = program.ConsumeRandomLengthString(8).c_str();
    switch (program.ConsumeIntegralInRange<int>(0, 9)) {
      case 0: {
        CHECK(zv_putenv_private(name.c_str(), nullptr, 0) == !holds_separator(name));
        const auto found = find(model, name);
        if (found != model.end()) model.erase(found);
        break;
      }
      case 1:
        if (program.ConsumeBool()) break;  // seldom
        CHECK(zv_putenv_private(nullptr, nullptr, 0) == 1);
        model.clear();
        break;
      default: {
        const bool append = program.ConsumeBool();
        const int expected = put(model, name, value, append);
        CHECK(zv_putenv_private(name.c_str(), value.c_str(), append) == expected);
      }
    }
    check_get(model, name);
  }
  for (const Variable& variable : Model(model)) check_get(model, variable.name);
  CHECK(zv_putenv_private(nullptr, nullptr, 0) == 1);
  return 0;
}
