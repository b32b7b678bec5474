// What a reason says for the errors of the system.
#ifndef ZARVO_TRANSFER_ERROR_WORDS_H
#define ZARVO_TRANSFER_ERROR_WORDS_H

#include "frame/text_buffer.h"

namespace zv {

using ErrorWords = TextBuffer<64>;

// The words for errno's number, the same on both platforms and in every locale; "error N" for one
// that has none here.
ErrorWords error_words(int number);

}  // namespace zv

#endif
