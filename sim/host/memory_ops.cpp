// The host's memory operations and their counters, over the handle store.
#include <cstring>

#include "handle_store.h"
#include "kvsvplatform.h"
#include "svsim.h"

using svhost::HandleStore;

extern "C" {

SvHandle svNewHandleClr(size_t size) { return HandleStore::Instance().Create(size); }

int32_t svSetHandleSizeClr(SvHandle handle, size_t size) {
  if (handle == nullptr) return SVSIM_ERR_ARGUMENT;
  return HandleStore::Instance().Resize(handle, size, "svSetHandleSizeClr");
}

size_t svGetHandleSize(SvHandle handle) {
  if (handle == nullptr) return 0;
  return HandleStore::QueriedSize(handle);
}

int32_t svDisposeHandle(SvHandle handle) {
  if (handle == nullptr) return SVSIM_ERR_ARGUMENT;
  HandleStore::Instance().Dispose(handle, "svDisposeHandle");
  return 0;
}

int32_t svCopyHandle(SvHandle *destination, SvHandle source) {
  if (destination == nullptr || source == nullptr) return SVSIM_ERR_ARGUMENT;
  HandleStore &store = HandleStore::Instance();
  const size_t size = store.Size(source, "svCopyHandle");
  if (*destination == source) return 0;
  if (*destination == nullptr) {
    SvHandle made = store.Create(size);
    if (made == nullptr) return SVSIM_ERR_MEMORY;
    *destination = made;
  } else {
    const int32_t status = store.Resize(*destination, size, "svCopyHandle");
    if (status != 0) return status;
  }
  std::memcpy(**destination, *source, size);
  return 0;
}

void svCopyBytes(const void *source, void *destination, size_t size) {
  if (size != 0) std::memmove(destination, source, size);
}

uint64_t svsimAllocCount(void) { return HandleStore::Instance().Allocations(); }
uint64_t svsimResizeCount(void) { return HandleStore::Instance().Resizes(); }
uint64_t svsimFreeCount(void) { return HandleStore::Instance().Frees(); }
uint64_t svsimHandleSizeQueries(void) { return HandleStore::SizeQueries(); }
uint64_t svsimLiveHandles(void) { return HandleStore::Instance().Live(); }
void svsimSetMoveOnResize(int32_t on) { HandleStore::Instance().SetMoveOnResize(on != 0); }
void svsimSetResizeError(int32_t code) { HandleStore::Instance().SetResizeError(code); }

}  // extern "C"
