#include <cstring>

#include "diagnostics/json_status.h"
#include "diagnostics/jsonz.h"

namespace jsonz {

char *StoreDocument(char *buffer, size_t size, const char *text) {
  if (buffer == nullptr || size < 2) return nullptr;
  const char *source = text != nullptr ? text : buffer;
  const size_t length = text != nullptr ? std::strlen(text) : strnlen(buffer, size);
  // The NUL and the sentinel both need a byte of their own.
  if (length + 2 > size) return nullptr;
  if (source != buffer) std::memmove(buffer, source, length + 1);
  std::memset(buffer + length + 1, 0, size - length - 2);
  buffer[size - 1] = nKVSVAPI100::kJsonSentinel;
  return length == 0 ? buffer : buffer + length - 1;
}

}  // namespace jsonz
