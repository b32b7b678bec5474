// The reasons of a failed encryption, in the same words whatever encrypts.
#ifndef ZARVO_PLATFORM_ENCRYPTION_REASON_H
#define ZARVO_PLATFORM_ENCRYPTION_REASON_H

#include <string_view>

#include "frame/text_buffer.h"

namespace zv::platform {

using HostName = TextBuffer<256>;
using Reason = TextBuffer<512>;

// The first names of a certificate, and how many there are besides.
class CertificateNames {
 public:
  void add(std::string_view name);
  void tell(Reason& reason) const;

 private:
  TextBuffer<256> first_;
  int others_ = 0;
};

enum class Validity { begins, ended };

struct Day {
  int year, month, day;
};

// What is wrong with a certificate, each the whole reason. The server's own is of depth 0, those of
// its issuers come after it.
void tell_validity(Reason& reason, const HostName& host, int depth, Validity validity, Day day);
void tell_names(Reason& reason, const HostName& host, const CertificateNames& names);
void tell_certificate(Reason& reason, const HostName& host, int depth, std::string_view fault);

constexpr std::string_view untrusted_issuer = "its issuer is not trusted";
constexpr std::string_view self_signed = "signed by itself, and not trusted";

// What is wrong with the conversation.
void tell_conversation(Reason& reason, const HostName& host, std::string_view fault);

constexpr std::string_view not_encrypted = "the answer is not encrypted";
constexpr std::string_view old_version = "it does not speak TLS 1.2 or later";
constexpr std::string_view second_handshake = "it wants a second handshake";

}  // namespace zv::platform

#endif
