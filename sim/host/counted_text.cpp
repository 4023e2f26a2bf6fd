#include "counted_text.h"

#include <cstring>
#include <limits>

#include "fatal.h"
#include "handle_store.h"
#include "svsim.h"

namespace svhost {

namespace {

constexpr size_t kCountSize = sizeof(int32_t);

}  // namespace

std::string BlockText(const SvStr *block) {
  if (block == nullptr || block->cnt <= 0) return std::string();
  return std::string(reinterpret_cast<const char *>(block->str), static_cast<size_t>(block->cnt));
}

std::string HandleText(SvHandle string, const char *operation) {
  if (string == nullptr) return std::string();
  const size_t size = HandleStore::Instance().Size(string, operation);
  const auto *block = static_cast<const SvStr *>(*string);
  if (size < kCountSize) {
    if (size == 0) return std::string();
    Fatal(operation, string, "string handle smaller than its count");
  }
  if (block->cnt > 0 && static_cast<size_t>(block->cnt) > size - kCountSize)
    Fatal(operation, string, "string count runs past the end of its handle");
  return BlockText(block);
}

int32_t StoreText(SvHandle *string, const char *bytes, size_t length, const char *operation) {
  if (length > static_cast<size_t>(std::numeric_limits<int32_t>::max()) - kCountSize)
    return SVSIM_ERR_ARGUMENT;
  HandleStore &store = HandleStore::Instance();
  const size_t needed = kCountSize + length;
  if (*string == nullptr) {
    SvHandle made = store.Create(needed);
    if (made == nullptr) return SVSIM_ERR_MEMORY;
    *string = made;
  } else if (store.Size(*string, operation) < needed) {
    const int32_t status = store.Resize(*string, needed, operation);
    if (status != 0) return status;
  }
  auto *block = static_cast<SvStr *>(**string);
  block->cnt = static_cast<int32_t>(length);
  if (length != 0) std::memcpy(block->str, bytes, length);
  return 0;
}

}  // namespace svhost
