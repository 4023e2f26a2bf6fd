#include "paths/multibyte.h"

#include <cstdlib>
#include <cstring>
#include <new>
#include <vector>

#include "paths/utf8_decode.h"

namespace kvpath {

namespace {

bool IsSevenBit(const char *text) {
  for (const unsigned char *p = reinterpret_cast<const unsigned char *>(text); *p != 0; ++p) {
    if (*p >= 0x80) return false;
  }
  return true;
}

std::size_t Utf8Length(uint32_t c) {
  if (c < 0x80) return 1;
  if (c < 0x800) return 2;
  if (c < 0x10000) return 3;
  return 4;
}

// Writes `c` at `out` in Utf8Length(c) bytes; no surrogate handling, as wide characters of the
// locale are taken for what they say.
char *EncodeUtf8(uint32_t c, char *out) {
  const std::size_t length = Utf8Length(c);
  static const unsigned char kLeadMark[5] = {0, 0x00, 0xC0, 0xE0, 0xF0};
  for (std::size_t i = length - 1; i > 0; --i) {
    out[i] = static_cast<char>(0x80 | (c & 0x3F));
    c >>= 6;
  }
  out[0] = static_cast<char>(kLeadMark[length] | c);
  return out + length;
}

int32_t WideToUtf8(const char *text, std::string &output) {
  const std::size_t count = std::mbstowcs(nullptr, text, 0);
  if (count == static_cast<std::size_t>(-1)) return kConversionFailed;
  std::vector<wchar_t> wide(count + 1);
  if (std::mbstowcs(wide.data(), text, count + 1) == static_cast<std::size_t>(-1)) {
    return kConversionFailed;
  }
  std::size_t size = 0;
  for (std::size_t i = 0; i < count; ++i) size += Utf8Length(static_cast<uint32_t>(wide[i]));
  output.resize(size);
  char *out = &output[0];
  for (std::size_t i = 0; i < count; ++i) out = EncodeUtf8(static_cast<uint32_t>(wide[i]), out);
  return 0;
}

int32_t Utf8ToWide(const char *text, std::string &output) {
  const unsigned char *begin = reinterpret_cast<const unsigned char *>(text);
  const unsigned char *end = begin + std::strlen(text);
  // The text has been validated: count with the decoder that skips the tests.
  std::size_t count = 0;
  for (const unsigned char *p = begin; p < end; ++count) DecodeUtf8Unchecked(p, end);
  std::vector<wchar_t> wide(count + 1, L'\0');
  std::size_t i = 0;
  for (const unsigned char *p = begin; p < end; ++i) {
    wide[i] = static_cast<wchar_t>(DecodeUtf8Unchecked(p, end));
  }
  const std::size_t size = std::wcstombs(nullptr, wide.data(), 0);
  if (size == static_cast<std::size_t>(-1)) return kConversionFailed;
  // One byte more for the NUL that wcstombs writes when it has room.
  std::vector<char> bytes(size + 1);
  std::wcstombs(bytes.data(), wide.data(), size + 1);
  output.assign(bytes.data(), size);
  return 0;
}

}  // namespace

int32_t MultibyteToUtf8(const char *text, bool strict, std::string &output) {
  if (text == nullptr || *text == '\0') return 0;
  if (IsSevenBit(text)) {
    output = text;
    return 0;
  }
  if (strict) return kConversionStrict;
  try {
    return WideToUtf8(text, output);
  } catch (const std::bad_alloc &) {
    return kConversionMemoryFull;
  }
}

int32_t Utf8ToMultibyte(const char *text, bool strict, std::string &output) {
  if (text == nullptr || *text == '\0') return 0;
  if (IsSevenBit(text)) {
    output = text;
    return 0;
  }
  // Validation comes before the strict test: a broken text is a conversion failure either way.
  const unsigned char *p = reinterpret_cast<const unsigned char *>(text);
  const unsigned char *end = p + std::strlen(text);
  while (p < end) {
    uint32_t ignored = 0;
    if (DecodeUtf8(p, end, ignored) != kUtf8Ok) return kConversionFailed;
  }
  if (strict) return kConversionStrict;
  try {
    return Utf8ToWide(text, output);
  } catch (const std::bad_alloc &) {
    return kConversionMemoryFull;
  }
}

}  // namespace kvpath
