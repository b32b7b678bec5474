// The reasons of a failed encryption.
#include "platform/encryption_reason.h"

#include <cstdio>
#include <initializer_list>

namespace zv::platform {

namespace {

// What does not fit is left out.
void set(Reason& reason, std::initializer_list<std::string_view> words) {
  reason.clear();
  for (const std::string_view word : words)
    if (!reason.append(word)) return;
}

}  // namespace

void CertificateNames::add(std::string_view name) {
  constexpr size_t most = 100;  // characters, so that a person can read them
  const size_t before = first_.size();
  const bool fits = others_ == 0 && before + name.size() <= most &&
                    (before == 0 || first_.append(", ")) && first_.append(name);
  if (fits) return;
  first_.shorten(before);
  ++others_;
}

void CertificateNames::tell(Reason& reason) const {
  TextBuffer<32> others;
  const auto count = [this](char* room, size_t size) {
    return std::snprintf(room, size, " and %d others", others_) > 0;
  };
  if (first_.empty()) {
    (void)reason.append("issued for no name");
  } else {
    (void)(reason.append("issued for ") && reason.append(first_.view()));
    if (others_ > 0 && others.fill(count)) (void)reason.append(others.view());
  }
}

void tell_certificate(Reason& reason, const HostName& host, int depth, std::string_view fault) {
  set(reason,
      {depth == 0 ? "certificate of " : "an issuer's certificate, of ", host.view(), ": ", fault});
}

void tell_validity(Reason& reason, const HostName& host, int depth, Validity validity, Day day) {
  TextBuffer<48> fault;
  const auto write = [&](char* room, size_t size) {
    const char* const words = validity == Validity::ended ? "expired on" : "not valid before";
    return std::snprintf(room, size, "%s %04d-%02d-%02d", words, day.year, day.month, day.day) > 0;
  };
  (void)fault.fill(write);
  tell_certificate(reason, host, depth, fault.view());
}

void tell_names(Reason& reason, const HostName& host, const CertificateNames& names) {
  tell_certificate(reason, host, 0, "");
  names.tell(reason);
}

void tell_conversation(Reason& reason, const HostName& host, std::string_view fault) {
  set(reason, {"encryption with ", host.view(), ": ", fault});
}

}  // namespace zv::platform
