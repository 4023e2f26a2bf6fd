// Decoding UTF-8 one code point at a time.
#ifndef KVSVAPI_PATHS_UTF8_DECODE_H
#define KVSVAPI_PATHS_UTF8_DECODE_H

#include <cstdint>

namespace kvpath {

enum eUtf8Result : int {
  kUtf8Ok = 0,
  kUtf8Truncated = 1,         // the text ends inside a sequence
  kUtf8BadLead = 2,           // a continuation byte or 11111xxx where a sequence must start
  kUtf8BadContinuation = 3,   // a byte inside a sequence that is not 10xxxxxx
  kUtf8Overlong = 4,          // a shorter sequence could hold the code point
  kUtf8AboveMaximum = 5,      // above 0x10FFFF
  kUtf8Surrogate = 6,         // 0xD800 to 0xDFFF: never a character of its own
};

// Decodes the code point at `position` (before `end`). On success `position` moves past it; on
// any failure it stays at the start of the sequence and `codePoint` is unspecified.
int DecodeUtf8(const unsigned char *&position, const unsigned char *end, uint32_t &codePoint);

// For text that DecodeUtf8 has accepted already: the same lead bytes without the tests. Never
// fails and never reads at or past `end`.
uint32_t DecodeUtf8Unchecked(const unsigned char *&position, const unsigned char *end);

}  // namespace kvpath

#endif
