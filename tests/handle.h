// Transfers of tests: by zv_copy(), and by a handle, whose runs end in more than a code.
#ifndef ZARVO_TESTS_HANDLE_H
#define ZARVO_TESTS_HANDLE_H

#include <gtest/gtest.h>

#include <initializer_list>
#include <memory>
#include <string>

#include "zarvo.h"

struct DestroyHandle {
  void operator()(zv_transfer_t* handle) const { zv_transfer_destroy(handle); }
};

using HandlePtr = std::unique_ptr<zv_transfer_t, DestroyHandle>;

struct Option {
  int option;
  int64_t value;
};

inline int copy(const std::string& from, const std::string& to) {
  return zv_copy(from.c_str(), to.c_str());
}

// At the second try where memory fails on purpose.
inline HandlePtr new_handle(std::initializer_list<Option> options = {}) {
  HandlePtr handle(zv_transfer_create());
  if (handle == nullptr) handle.reset(zv_transfer_create());
  for (const auto& [option, value] : options)
    EXPECT_EQ(zv_transfer_set(handle.get(), option, value), 1);
  return handle;
}

inline std::string reason(const zv_transfer_t* handle) {
  char text[1100];
  return {text, zv_transfer_reason(handle, text, sizeof text)};
}

struct Outcome {
  int code = 0, cause = ZV_CAUSE_NONE, number = 0;
  std::string reason = "";
};

inline Outcome outcome_of(const HandlePtr& handle, const std::string& from, const std::string& to) {
  Outcome end = {zv_transfer_run(handle.get(), from.c_str(), to.c_str())};
  end.cause = zv_transfer_cause(handle.get(), &end.number);
  end.reason = reason(handle.get());
  return end;
}

// A failure's reason holds the text.
inline void expect_end(const Outcome& end, const Outcome& expected) {
  EXPECT_EQ(end.code, expected.code);
  EXPECT_EQ(end.cause, expected.cause) << end.reason;
  EXPECT_EQ(end.number, expected.number);
  EXPECT_NE(end.reason.find(expected.reason), std::string::npos) << end.reason;
  EXPECT_EQ(end.reason.empty(), expected.code == 0) << end.reason;
}

#endif
