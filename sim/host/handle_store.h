// The host's memory manager: relocatable blocks reached through master pointers. Every live handle
// is in a table with its size, so that a handle the manager did not make, or made and freed, is
// caught at its first use instead of corrupting the heap.
#ifndef SVHOST_HANDLE_STORE_H
#define SVHOST_HANDLE_STORE_H

#include <cstddef>
#include <cstdint>
#include <mutex>
#include <unordered_map>

#include "kvsvapi.h"
#include "svsim.h"

namespace svhost {

class HandleStore {
 public:
  static HandleStore &Instance();

  // A handle to `size` zeroed bytes, or null when the allocation fails.
  SvHandle Create(size_t size);
  // 0, or the resize error code with the block left as it was. Growth is zeroed. `operation`
  // names the caller in the message of a fatal stop, here and below.
  int32_t Resize(SvHandle handle, size_t size, const char *operation);
  // Size of a live handle. Aborts on a handle that is not live.
  size_t Size(SvHandle handle, const char *operation);
  void Dispose(SvHandle handle, const char *operation);

  void SetMoveOnResize(bool on);
  void SetResizeError(int32_t code);

  uint64_t Allocations();
  uint64_t Resizes();
  uint64_t Frees();
  uint64_t Live();
  void ResetCounters();
  // Counters, move mode and resize error back to their defaults; live handles stay.
  void Reset();

 private:
  struct Entry {
    void *block;
    size_t size;
  };

  // Aborts unless `handle` is live and its master pointer still holds the block it was given.
  Entry &Find(SvHandle handle, const char *operation);

  std::mutex mutex_;
  std::unordered_map<SvHandle, Entry> live_;
  bool moveOnResize_ = false;
  int32_t resizeError_ = SVSIM_ERR_MEMORY;
  uint64_t allocations_ = 0;
  uint64_t resizes_ = 0;
  uint64_t frees_ = 0;
};

}  // namespace svhost

#endif
