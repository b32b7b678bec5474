// Names of files in the header lines of a mail: as they are where that is safe, else encoded (RFC
// 2047, RFC 2231). Every line that comes of it is 7-bit and has 78 characters at most.
#ifndef ZARVO_TRANSFER_MAIL_WORDS_H
#define ZARVO_TRANSFER_MAIL_WORDS_H

#include <string_view>

#include "frame/text_buffer.h"

namespace zv {

using MailText = TextBuffer<12288>;

// Whether a text is well-formed UTF-8 (RFC 3629) without control characters.
bool is_mail_name(std::string_view text);

// The functions below take such names. False when the text has no room for what they append.

// The field, "Subject: ", and the name: as it is, or as encoded words.
[[nodiscard]] bool put_field(std::string_view field, std::string_view name, MailText& out);

// The last parameter of a field, on lines of its own: " filename=", and the name in quotes; or the
// name in sections with escapes.
[[nodiscard]] bool put_parameter(std::string_view parameter, std::string_view name, MailText& out);

// A line of a body: the label and the name in base64.
[[nodiscard]] bool put_base64_line(std::string_view label, std::string_view name, MailText& out);

// Whether the name may stand in a line as it is, beside so many other characters.
bool is_plain(std::string_view name, size_t others);

}  // namespace zv

#endif
