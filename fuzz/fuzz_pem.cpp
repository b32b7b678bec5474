// The certificates of a PEM text: what any text gives is whole, and what was encoded is found
// again.
#include <string>
#include <vector>

#include "check.h"
#include "transfer/base64.h"
#include "transfer/pem.h"

namespace {

using Bytes = std::vector<unsigned char>;

// The text and the room lie on the heap, and are exactly as large as they are said to be.
Bytes decode(const std::string& text) {
  const std::vector<char> exact(text.begin(), text.end());
  Bytes room(text.size());
  const size_t count = zv::decode_certificates({exact.data(), exact.size()}, room.data());
  CHECK(count <= room.size());
  room.resize(count);
  return room;
}

// Sequences with their lengths written out, one after another, and nothing else.
void check_sequences(const Bytes& found) {
  for (size_t at = 0; at != found.size();) {
    CHECK(found.size() - at >= 2 && found[at] == 0x30 && found[at + 1] != 0x80);
    const size_t more = found[at + 1] < 0x80 ? 0 : found[at + 1] - 0x80U;
    CHECK(more <= found.size() - at - 2);
    size_t length = more == 0 ? found[at + 1] : 0;
    for (size_t i = 0; i < more; ++i) length = length << 8 | found[at + 2 + i];
    at += 2 + more;
    CHECK(length <= found.size() - at);
    at += length;
  }
}

// A certificate's text, with `width` digits in each line.
std::string encode(const Bytes& certificate, size_t width) {
  std::string digits(zv::base64_length(certificate.size()) + 1, '\0');
  zv::base64_encode(certificate.data(), certificate.size(), digits.data());
  digits.pop_back();
  std::string text = "-----BEGIN CERTIFICATE-----\n";
  for (size_t at = 0; at < digits.size(); at += width) text += digits.substr(at, width) + "\r\n";
  return text + "-----END CERTIFICATE-----\n";
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const std::string text(reinterpret_cast<const char*>(data), size);
  const Bytes found = decode(text);
  check_sequences(found);
  if (!found.empty()) {
    Bytes twice = found;
    twice.insert(twice.end(), found.begin(), found.end());
    CHECK(decode(text + "\n" + text) == twice);
  }

  if (size > 0xFFFF) return 0;
  Bytes certificate = {0x30, 0x82, static_cast<unsigned char>(size >> 8),
                       static_cast<unsigned char>(size)};
  certificate.insert(certificate.end(), data, data + size);
  CHECK(decode(encode(certificate, 1 + size % 76)) == certificate);
  return 0;
}
