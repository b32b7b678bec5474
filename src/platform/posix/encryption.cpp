// Encryption: a library of its own, loaded when it is first needed and kept.
#include "platform/encryption.h"

#include <dlfcn.h>

#include "frame/lock.h"

namespace zv::platform {

namespace {

pthread_mutex_t lock = PTHREAD_MUTEX_INITIALIZER;
const Encryption* loaded = nullptr;

const Encryption* load() {
  void* const library = dlopen("libzarvo_tls.so.1", RTLD_NOW | RTLD_LOCAL);
  if (library == nullptr) return nullptr;
  const auto* const table = static_cast<const Encryption*>(dlsym(library, "zarvo_encryption"));
  if (table != nullptr && table->version == encryption_version) return table;
  dlclose(library);
  return nullptr;
}

}  // namespace

// A library that is installed later is found later.
const Encryption* encryption() {
  const LockGuard guard(lock);
  if (loaded == nullptr && guard.held()) loaded = load();
  return loaded;
}

const char* const encryption_missing =
    "encryption needs libzarvo_tls.so.1, which is not installed (package libzarvo-tls1)";

}  // namespace zv::platform
