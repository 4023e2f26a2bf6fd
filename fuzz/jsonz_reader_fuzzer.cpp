// Any text given to the JSON reader: parsing, key lookup, string and integer reads and unescaping
// must stay inside the text and its NUL.
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <vector>

#include "diagnostics/jsonz.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
  // The reader works on NUL-terminated text; an exactly sized copy lets the sanitiser see a read
  // past the NUL.
  std::vector<char> text(data, data + size);
  text.push_back('\0');
  const char *document = text.data();

  const jsonz::tValue value = jsonz::ParseDocument(document);
  if (value.kind == jsonz::kKindString) {
    std::vector<char> decoded(static_cast<size_t>(value.length) + 1);
    jsonz::JsonUnescape(value.start, static_cast<size_t>(value.length), decoded.data());
  }
  for (const char *key : {"a", "error_constant", ""}) {
    const char *member = jsonz::JsonFindKey(document, key);
    if (member == nullptr) continue;
    size_t length = 0;
    const char *end = nullptr;
    const char *raw = jsonz::JsonReadString(member, "", &length, &end);
    if (end != nullptr) {
      std::vector<char> decoded(length + 1);
      jsonz::JsonUnescape(raw, length, decoded.data());
    }
    jsonz::JsonReadInt(member, 0, nullptr);
  }
  return 0;
}
