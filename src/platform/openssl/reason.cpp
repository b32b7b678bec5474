// What is wrong with a certificate or a conversation, as OpenSSL tells it.
#include <arpa/inet.h>
#include <openssl/err.h>
#include <openssl/x509v3.h>

#include <ctime>

#include "platform/openssl/stream.h"

namespace zv::platform {

namespace {

std::string_view bytes_of(const ASN1_STRING* text) {
  return {reinterpret_cast<const char*>(ASN1_STRING_get0_data(text)),
          static_cast<size_t>(ASN1_STRING_length(text))};
}

void add_address(CertificateNames& names, const ASN1_OCTET_STRING* address) {
  TextBuffer<INET6_ADDRSTRLEN> text;
  const std::string_view bytes = bytes_of(address);
  const int family = bytes.size() == 4 ? AF_INET : AF_INET6;
  if (family == AF_INET6 && bytes.size() != 16) return;
  const auto write = [&](char* room, size_t size) {
    return inet_ntop(family, bytes.data(), room, static_cast<socklen_t>(size)) != nullptr;
  };
  if (text.fill(write)) names.add(text.view());
}

// The names that count: a common name does not.
CertificateNames names_of(const X509* certificate) {
  CertificateNames names;
  const OpensslPtr<GENERAL_NAMES> list(static_cast<GENERAL_NAMES*>(
      X509_get_ext_d2i(certificate, NID_subject_alt_name, nullptr, nullptr)));
  for (int i = 0; i < sk_GENERAL_NAME_num(list.get()); ++i) {
    int type = 0;
    const void* const value = GENERAL_NAME_get0_value(sk_GENERAL_NAME_value(list.get(), i), &type);
    if (type == GEN_DNS) names.add(bytes_of(static_cast<const ASN1_STRING*>(value)));
    if (type == GEN_IPADD) add_address(names, static_cast<const ASN1_OCTET_STRING*>(value));
  }
  return names;
}

Day day_of(const ASN1_TIME* time) {
  tm parts = {};
  if (ASN1_TIME_to_tm(time, &parts) != 1) return {};
  return {parts.tm_year + 1900, parts.tm_mon + 1, parts.tm_mday};
}

void tell_fault(Reason& reason, const HostName& host, int error, int depth,
                const X509* certificate) {
  switch (error) {
    case X509_V_ERR_CERT_HAS_EXPIRED:
      return tell_validity(reason, host, depth, Validity::ended,
                           day_of(X509_get0_notAfter(certificate)));
    case X509_V_ERR_CERT_NOT_YET_VALID:
      return tell_validity(reason, host, depth, Validity::begins,
                           day_of(X509_get0_notBefore(certificate)));
    case X509_V_ERR_HOSTNAME_MISMATCH:
    case X509_V_ERR_IP_ADDRESS_MISMATCH:
      return tell_names(reason, host, names_of(certificate));
    case X509_V_ERR_DEPTH_ZERO_SELF_SIGNED_CERT:
      return tell_certificate(reason, host, 0, self_signed);
    case X509_V_ERR_SELF_SIGNED_CERT_IN_CHAIN:
    case X509_V_ERR_UNABLE_TO_GET_ISSUER_CERT:
    case X509_V_ERR_UNABLE_TO_GET_ISSUER_CERT_LOCALLY:
    case X509_V_ERR_UNABLE_TO_VERIFY_LEAF_SIGNATURE:
      return tell_certificate(reason, host, 0, untrusted_issuer);
    default:
      return tell_certificate(reason, host, depth, X509_verify_cert_error_string(error));
  }
}

std::string_view words_of(unsigned long error) {
  const int reason = ERR_GET_REASON(error);
  if (ERR_GET_LIB(error) == ERR_LIB_SSL &&
      (reason == SSL_R_UNSUPPORTED_PROTOCOL || reason == SSL_R_TLSV1_ALERT_PROTOCOL_VERSION))
    return old_version;
  const char* const words = ERR_reason_error_string(error);
  return words != nullptr ? words : "it failed";
}

}  // namespace

int judge_certificate(int accepted, X509_STORE_CTX* chain) {
  const void* const ssl = X509_STORE_CTX_get_ex_data(chain, SSL_get_ex_data_X509_STORE_CTX_idx());
  EncryptedStream& stream = stream_of(static_cast<const SSL*>(ssl));
  if (accepted == 0 && stream.reason.empty())
    tell_fault(stream.reason, stream.host, X509_STORE_CTX_get_error(chain),
               X509_STORE_CTX_get_error_depth(chain), X509_STORE_CTX_get_current_cert(chain));
  return accepted;
}

void tell_failure(EncryptedStream& stream) {
  if (!stream.reason.empty()) return;
  tell_conversation(stream.reason, stream.host,
                    stream.is_tls ? words_of(ERR_peek_last_error()) : not_encrypted);
}

}  // namespace zv::platform
