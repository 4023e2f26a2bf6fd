// Host strings and the host arrays that hold them, as the exports take and give them: a text read
// back from a string handle, the texts of a string array, and arrays of strings or numbers made.
#ifndef KVSVAPI_TESTS_SUPPORT_HOST_STRINGS_H
#define KVSVAPI_TESTS_SUPPORT_HOST_STRINGS_H

#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "kvsim.h"
#include "svsim.h"

namespace kvsvtest {

inline std::string Text(SvHandle string) {
  char text[256] = {};
  return std::string(text, static_cast<size_t>(svsimReadString(string, text, sizeof text)));
}

// The strings of a host array: the count at byte 0, 8-byte string handles from byte 8.
inline std::vector<std::string> Texts(SvHandle array) {
  std::vector<std::string> texts;
  const int32_t count = array != nullptr ? *static_cast<int32_t *>(*array) : 0;
  for (int32_t i = 0; i < count; ++i)
    texts.push_back(Text(reinterpret_cast<SvHandle *>(static_cast<char *>(*array) + 8)[i]));
  return texts;
}

// A host array of new strings, which go with it.
inline SvHandle StringArray(const std::vector<const char *> &texts) {
  SvHandle array = svNewHandleClr(8 + texts.size() * 8);
  *static_cast<int32_t *>(*array) = static_cast<int32_t>(texts.size());
  for (size_t i = 0; i < texts.size(); ++i)
    reinterpret_cast<SvHandle *>(static_cast<char *>(*array) + 8)[i] = svsimMakeString(texts[i]);
  return array;
}

// A host array of `width`-byte numbers: the count at byte 0, the numbers from byte 4.
inline SvHandle NumberArray(const std::vector<uint32_t> &values, size_t width) {
  SvHandle array = svNewHandleClr(8 + values.size() * width);
  *static_cast<int32_t *>(*array) = static_cast<int32_t>(values.size());
  for (size_t i = 0; i < values.size(); ++i)
    std::memcpy(static_cast<char *>(*array) + 4 + i * width, &values[i], width);
  return array;
}

inline std::vector<uint32_t> ArrayNumbers(SvHandle array, size_t width) {
  std::vector<uint32_t> values(static_cast<size_t>(*static_cast<int32_t *>(*array)));
  for (size_t i = 0; i < values.size(); ++i)
    std::memcpy(&values[i], static_cast<char *>(*array) + 4 + i * width, width);
  return values;
}

}  // namespace kvsvtest

#endif
