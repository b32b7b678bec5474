// Whether the server's certificate is one to trust and holds the name or address that was asked
// for.
#include "platform/schannel/stream.h"

#include <wincrypt.h>
#include <ws2tcpip.h>

#include <cstddef>
#include <cstdio>
#include <memory>

#include "frame/der.h"

namespace zv::platform {

namespace {

struct FreeCertificate {
  void operator()(const CERT_CONTEXT* certificate) const {
    CertFreeCertificateContext(certificate);
  }
  void operator()(const CERT_CHAIN_CONTEXT* chain) const { CertFreeCertificateChain(chain); }
  void operator()(CERT_ALT_NAME_INFO* names) const { LocalFree(names); }
};

using CertificatePtr = std::unique_ptr<const CERT_CONTEXT, FreeCertificate>;
using ChainPtr = std::unique_ptr<const CERT_CHAIN_CONTEXT, FreeCertificate>;
using NamesPtr = std::unique_ptr<CERT_ALT_NAME_INFO, FreeCertificate>;

// ---- trust
// ---------------------------------------------------------------------------------------

// An engine that takes the store's certificates for roots, whether or not they sign themselves.
// Systems before Windows 8 know a shorter record.
HCERTCHAINENGINE make_engine(HCERTSTORE trusted) {
  CERT_CHAIN_ENGINE_CONFIG wanted = {};
  wanted.cbSize = sizeof wanted;
  wanted.hExclusiveRoot = trusted;
  wanted.dwExclusiveFlags = CERT_CHAIN_EXCLUSIVE_ENABLE_CA_FLAG;
  HCERTCHAINENGINE engine = nullptr;
  if (CertCreateCertificateChainEngine(&wanted, &engine)) return engine;
  wanted.cbSize = offsetof(CERT_CHAIN_ENGINE_CONFIG, dwExclusiveFlags);
  return CertCreateCertificateChainEngine(&wanted, &engine) ? engine : nullptr;
}

// ---- names
// ---------------------------------------------------------------------------------------

// A name of the certificate as text; what no host's name holds becomes "?".
HostName text_of(const wchar_t* name) {
  HostName text;
  for (; *name != L'\0'; ++name)
    if (!text.append(*name > L' ' && *name < 0x7F ? static_cast<char>(*name) : '?')) break;
  return text;
}

char lower(char ch) {
  return ch >= 'A' && ch <= 'Z' ? static_cast<char>(ch - 'A' + 'a') : ch;
}

bool equal_names(std::string_view a, std::string_view b) {
  return std::ranges::equal(a, b, {}, lower, lower);
}

std::string_view after_first_label(std::string_view name) {
  const size_t dot = name.find('.');
  if (dot == std::string_view::npos) return {};
  return {name.data() + dot, name.size() - dot};
}

// RFC 6125 6.4.3: "*" stands for the whole first label, before two others at least.
bool holds_name(std::string_view pattern, std::string_view host) {
  if (pattern.size() < 2 || pattern[0] != '*' || pattern[1] != '.')
    return equal_names(pattern, host);
  const std::string_view rest(pattern.data() + 1, pattern.size() - 1);
  const std::string_view of_host = after_first_label(host);
  return rest.find('.', 1) != std::string_view::npos && of_host.size() < host.size() &&
         equal_names(rest, of_host);
}

// A host that is an address: its bytes.
struct HostAddress {
  unsigned char bytes[16];
  size_t size = 0;

  explicit HostAddress(const HostName& host) {
    if (InetPtonA(AF_INET, host.c_str(), bytes) == 1)
      size = 4;
    else if (InetPtonA(AF_INET6, host.c_str(), bytes) == 1)
      size = 16;
  }
  bool is_in(const CRYPT_DATA_BLOB& address) const {
    return size != 0 && address.cbData == size && std::memcmp(address.pbData, bytes, size) == 0;
  }
};

void add_address(CertificateNames& names, const CRYPT_DATA_BLOB& address) {
  TextBuffer<INET6_ADDRSTRLEN> text;
  const int family = address.cbData == 4 ? AF_INET : AF_INET6;
  if (family == AF_INET6 && address.cbData != 16) return;
  const auto write = [&](char* room, size_t size) {
    return InetNtopA(family, address.pbData, room, size) != nullptr;
  };
  if (text.fill(write)) names.add(text.view());
}

NamesPtr names_of(const CERT_CONTEXT* certificate) {
  const CERT_EXTENSION* const list =
      CertFindExtension(szOID_SUBJECT_ALT_NAME2, certificate->pCertInfo->cExtension,
                        certificate->pCertInfo->rgExtension);
  CERT_ALT_NAME_INFO* names = nullptr;
  DWORD size = 0;
  if (list == nullptr ||
      !CryptDecodeObjectEx(X509_ASN_ENCODING, X509_ALTERNATE_NAME, list->Value.pbData,
                           list->Value.cbData, CRYPT_DECODE_ALLOC_FLAG, nullptr, &names, &size))
    return nullptr;
  return NamesPtr(names);
}

// The list of names alone counts: the system's own look would fall back on the common name.
bool holds_host(const CERT_CONTEXT* certificate, const HostName& host, CertificateNames& told) {
  const NamesPtr names = names_of(certificate);
  const HostAddress address(host);
  bool found = false;
  for (DWORD i = 0; names != nullptr && i < names->cAltEntry; ++i) {
    const CERT_ALT_NAME_ENTRY& entry = names->rgAltEntry[i];
    if (entry.dwAltNameChoice == CERT_ALT_NAME_DNS_NAME) {
      const HostName name = text_of(entry.pwszDNSName);
      found = found || (address.size == 0 && holds_name(name.view(), host.view()));
      told.add(name.view());
    } else if (entry.dwAltNameChoice == CERT_ALT_NAME_IP_ADDRESS) {
      found = found || address.is_in(entry.IPAddress);
      add_address(told, entry.IPAddress);
    }
  }
  return found;
}

// ---- the chain
// -----------------------------------------------------------------------------------

ChainPtr chain_of(const EncryptionContext& context, const CERT_CONTEXT* certificate) {
  char purpose[] = szOID_PKIX_KP_SERVER_AUTH;
  LPSTR purposes[] = {purpose};
  CERT_CHAIN_PARA wanted = {};
  wanted.cbSize = sizeof wanted;
  wanted.RequestedUsage.dwType = USAGE_MATCH_TYPE_AND;
  wanted.RequestedUsage.Usage = {1, purposes};
  const CERT_CHAIN_CONTEXT* chain = nullptr;
  if (!CertGetCertificateChain(context.engine, certificate, nullptr, certificate->hCertStore,
                               &wanted, 0, nullptr, &chain))
    return nullptr;
  return ChainPtr(chain);
}

Day day_of(const FILETIME& time) {
  SYSTEMTIME parts = {};
  FileTimeToSystemTime(&time, &parts);
  return {parts.wYear, parts.wMonth, parts.wDay};
}

void tell_dates(EncryptedStream& stream, const CERT_SIMPLE_CHAIN& chain) {
  for (DWORD i = 0; i < chain.cElement; ++i) {
    const CERT_INFO* const info = chain.rgpElement[i]->pCertContext->pCertInfo;
    const LONG order = CertVerifyTimeValidity(nullptr, const_cast<CERT_INFO*>(info));
    if (order > 0)
      return tell_validity(stream.reason, stream.host, static_cast<int>(i), Validity::ended,
                           day_of(info->NotAfter));
    if (order < 0)
      return tell_validity(stream.reason, stream.host, static_cast<int>(i), Validity::begins,
                           day_of(info->NotBefore));
  }
}

// Whether the chain leads to somebody who is trusted, and when not, how that is told.
bool is_trusted(EncryptedStream& stream, const CERT_SIMPLE_CHAIN& chain, DWORD faults) {
  constexpr DWORD broken = CERT_TRUST_IS_PARTIAL_CHAIN | CERT_TRUST_IS_UNTRUSTED_ROOT |
                           CERT_TRUST_IS_NOT_SIGNATURE_VALID | CERT_TRUST_IS_CYCLIC;
  if ((faults & broken) == 0) return true;
  const bool alone = chain.cElement == 1 && (chain.rgpElement[0]->TrustStatus.dwInfoStatus &
                                             CERT_TRUST_IS_SELF_SIGNED) != 0;
  tell_certificate(stream.reason, stream.host, 0, alone ? self_signed : untrusted_issuer);
  return false;
}

// The system's last word: whatever else it knows that speaks against the certificate.
bool is_accepted(EncryptedStream& stream, const CERT_CHAIN_CONTEXT* chain) {
  constexpr DWORD ignore_name = 0x1000;  // SECURITY_FLAG_IGNORE_CERT_CN_INVALID of wininet.h
  wchar_t name[HostName::capacity + 1] = {};
  std::ranges::copy(stream.host.view(), name);
  HTTPSPolicyCallbackData server = {};
  server.cbSize = sizeof server;
  server.dwAuthType = AUTHTYPE_SERVER;
  server.pwszServerName = name;
  // Older systems look for an address among the names only.
  if (HostAddress(stream.host).size != 0) server.fdwChecks = ignore_name;
  CERT_CHAIN_POLICY_PARA wanted = {};
  wanted.cbSize = sizeof wanted;
  wanted.pvExtraPolicyPara = &server;
  CERT_CHAIN_POLICY_STATUS status = {};
  status.cbSize = sizeof status;
  if (!CertVerifyCertificateChainPolicy(CERT_CHAIN_POLICY_SSL, chain, &wanted, &status))
    status.dwError = GetLastError();
  if (status.dwError == 0 && chain->TrustStatus.dwErrorStatus == 0) return true;
  TextBuffer<64> fault;
  const auto write = [&](char* room, size_t size) {
    return std::snprintf(room, size, "refused by the system (0x%08lX, 0x%lX)", status.dwError,
                         chain->TrustStatus.dwErrorStatus) > 0;
  };
  (void)fault.fill(write);
  tell_certificate(stream.reason, stream.host, 0, fault.view());
  return false;
}

bool is_good(EncryptedStream& stream, const CERT_CONTEXT* certificate) {
  const ChainPtr chain = chain_of(stream.context, certificate);
  if (chain == nullptr || chain->cChain == 0) return false;
  const CERT_SIMPLE_CHAIN& first = *chain->rgpChain[0];
  const DWORD faults = chain->TrustStatus.dwErrorStatus;
  if (!is_trusted(stream, first, faults)) return false;
  CertificateNames names;
  if (!holds_host(certificate, stream.host, names)) {
    tell_names(stream.reason, stream.host, names);
    return false;
  }
  if ((faults & CERT_TRUST_IS_NOT_TIME_VALID) != 0) {
    tell_dates(stream, first);
    return false;
  }
  return is_accepted(stream, chain.get());
}

}  // namespace

bool trust(EncryptionContext& context, const unsigned char* certificates, size_t size) {
  if (size == 0) return true;
  context.trusted =
      CertOpenStore(CERT_STORE_PROV_MEMORY, 0, 0, CERT_STORE_CREATE_NEW_FLAG, nullptr);
  if (context.trusted == nullptr) return false;
  for (const unsigned char* const end = certificates + size; certificates != end;) {
    const size_t length = sequence_size(certificates, static_cast<size_t>(end - certificates));
    if (length == 0 || !CertAddEncodedCertificateToStore(context.trusted, X509_ASN_ENCODING,
                                                         certificates, static_cast<DWORD>(length),
                                                         CERT_STORE_ADD_ALWAYS, nullptr))
      return false;
    certificates += length;
  }
  context.engine = make_engine(context.trusted);
  return context.engine != nullptr;
}

EncryptionStep judge_certificate(EncryptedStream& stream) {
  const CERT_CONTEXT* certificate = nullptr;
  const SECURITY_STATUS status =
      QueryContextAttributesA(&stream.security, SECPKG_ATTR_REMOTE_CERT_CONTEXT, &certificate);
  if (status != SEC_E_OK) return fail(stream, status);
  const CertificatePtr owner(certificate);
  return is_good(stream, certificate) ? EncryptionStep::done
                                      : fail(stream, "its certificate cannot be judged");
}

}  // namespace zv::platform
