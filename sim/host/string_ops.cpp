// The host's string operations on counted strings.
#include <cctype>
#include <cstdarg>
#include <new>
#include <string>

#include "counted_text.h"
#include "kvsvplatform.h"
#include "svsim.h"
#include "text_format.h"

extern "C" {

int32_t svStrPrintf(SvHandle string, const char *format, ...) {
  if (string == nullptr || format == nullptr) return SVSIM_PRINTF_BAD_FORMAT;
  std::string text;
  va_list arguments;
  va_start(arguments, format);
  bool formatted = false;
  try {
    formatted = svhost::FormatText(text, format, arguments);
  } catch (const std::bad_alloc &) {
    va_end(arguments);
    return SVSIM_PRINTF_NO_MEMORY;
  }
  va_end(arguments);
  if (!formatted) return SVSIM_PRINTF_BAD_FORMAT;
  const int32_t status = svhost::StoreText(&string, text.data(), text.size(), "svStrPrintf");
  if (status == SVSIM_ERR_ARGUMENT) return SVSIM_PRINTF_BAD_FORMAT;
  if (status != 0) return SVSIM_PRINTF_NO_MEMORY;
  return static_cast<int32_t>(text.size());
}

int32_t svStrCaseCmp(const SvStr *a, const SvStr *b) {
  const int32_t lengthA = a == nullptr || a->cnt < 0 ? 0 : a->cnt;
  const int32_t lengthB = b == nullptr || b->cnt < 0 ? 0 : b->cnt;
  const int32_t common = lengthA < lengthB ? lengthA : lengthB;
  // The text runs past the declared one-byte array: walk it through plain pointers.
  const unsigned char *textA = common > 0 ? a->str : nullptr;
  const unsigned char *textB = common > 0 ? b->str : nullptr;
  for (int32_t i = 0; i < common; ++i) {
    const int ca = std::tolower(textA[i]);
    const int cb = std::tolower(textB[i]);
    if (ca != cb) return ca < cb ? -1 : 1;
  }
  if (lengthA == lengthB) return 0;
  return lengthA < lengthB ? -1 : 1;
}

int32_t svStrFromPtr(SvHandle *string, int32_t length, const void *bytes) {
  if (string == nullptr || length < 0 || (bytes == nullptr && length > 0))
    return SVSIM_ERR_ARGUMENT;
  return svhost::StoreText(string, static_cast<const char *>(bytes), static_cast<size_t>(length),
                           "svStrFromPtr");
}

}  // extern "C"
