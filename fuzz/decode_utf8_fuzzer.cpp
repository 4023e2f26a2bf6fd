// Fuzzes the UTF-8 decoder that guards every path component: walks any input, checks what each
// step promises, and compares the checked decoder with the one used after validation.
#include <cstddef>
#include <cstdint>
#include <cstdlib>

#include "paths/utf8_decode.h"

namespace {

void Check(bool condition) {
  if (!condition) std::abort();
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
  const unsigned char *position = data;
  const unsigned char *end = data + size;
  while (position < end) {
    const unsigned char *start = position;
    uint32_t codePoint = 0;
    const int result = kvpath::DecodeUtf8(position, end, codePoint);
    if (result == kvpath::kUtf8Ok) {
      const std::ptrdiff_t length = position - start;
      Check(length >= 1 && length <= 4);
      Check(codePoint <= 0x10FFFF);
      Check(codePoint < 0xD800 || codePoint > 0xDFFF);
      const unsigned char *again = start;
      Check(kvpath::DecodeUtf8Unchecked(again, end) == codePoint);
      Check(again == position);
    } else {
      Check(result >= kvpath::kUtf8Truncated && result <= kvpath::kUtf8Surrogate);
      Check(position == start);
      // The unchecked decoder must stay inside the text even on input it was never meant for.
      const unsigned char *unchecked = start;
      kvpath::DecodeUtf8Unchecked(unchecked, end);
      Check(unchecked > start && unchecked <= end);
      position = start + 1;
    }
  }
  return 0;
}
