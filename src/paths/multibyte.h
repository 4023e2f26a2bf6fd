// Conversions between UTF-8 and the process locale's multibyte encoding.
#ifndef KVSVAPI_PATHS_MULTIBYTE_H
#define KVSVAPI_PATHS_MULTIBYTE_H

#include <cstdint>
#include <string>

namespace kvpath {

constexpr int32_t kConversionMemoryFull = -52000;   // ovapalerr_memoryFull
constexpr int32_t kConversionStrict = -52002;       // a strict caller refuses any real conversion
constexpr int32_t kConversionFailed = -52027;       // the text has no form in the other encoding

// Both leave `output` alone for a null or empty text and copy a 7-bit text unchanged, in any
// locale and whatever `strict` says: such text means the same in every encoding that we meet.
// Otherwise a strict call gives kConversionStrict; 0 on success.
int32_t MultibyteToUtf8(const char *text, bool strict, std::string &output);
int32_t Utf8ToMultibyte(const char *text, bool strict, std::string &output);

}  // namespace kvpath

#endif
