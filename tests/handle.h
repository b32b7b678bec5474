// A transfer's handle, owned by a test.
#ifndef ZARVO_TESTS_HANDLE_H
#define ZARVO_TESTS_HANDLE_H

#include <memory>
#include <string>
#include <utility>

#include "zarvo.h"

struct DestroyHandle {
  void operator()(zv_transfer_t* handle) const { zv_transfer_destroy(handle); }
};

using HandlePtr = std::unique_ptr<zv_transfer_t, DestroyHandle>;

inline std::string reason(const zv_transfer_t* handle) {
  char text[1100];
  return {text, zv_transfer_reason(handle, text, sizeof text)};
}

// At the second try where memory fails on purpose.
inline HandlePtr new_handle() {
  HandlePtr handle(zv_transfer_create());
  return handle != nullptr ? std::move(handle) : HandlePtr(zv_transfer_create());
}

#endif
