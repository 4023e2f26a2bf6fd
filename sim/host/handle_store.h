// The host's memory manager: relocatable blocks reached through master pointers. A handle is the
// address of a master record that the manager keeps for as long as the process runs, so that a
// handle it did not make, or made and freed, is caught at its first use instead of corrupting the
// heap, and so that asking a handle's size takes no lock, as it takes none in a real host.
#ifndef SVHOST_HANDLE_STORE_H
#define SVHOST_HANDLE_STORE_H

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <mutex>
#include <type_traits>

#include "fatal.h"
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
  // Size of a live handle. Aborts on a handle that is not live. Takes no lock and is inline, since
  // the library may ask it for many frames of a call, as a real host answers it from a block header.
  static size_t Size(SvHandle handle, const char *operation) {
    return Find(handle, operation).size.load(std::memory_order_relaxed);
  }
  // Size as a program asks it, counted, so that tests can tell how often the library asks.
  static size_t QueriedSize(SvHandle handle) {
    sizeQueries_.fetch_add(1, std::memory_order_relaxed);
    return Size(handle, "svGetHandleSize");
  }
  void Dispose(SvHandle handle, const char *operation);

  void SetMoveOnResize(bool on);
  void SetResizeError(int32_t code);

  uint64_t Allocations();
  uint64_t Resizes();
  uint64_t Frees();
  static uint64_t SizeQueries() { return sizeQueries_.load(std::memory_order_relaxed); }
  uint64_t Live();
  void ResetCounters();
  // Counters, move mode and resize error back to their defaults; live handles stay.
  void Reset();

 private:
  // What a handle points at. `pointer` comes first: the handle is its address, and a program
  // reads its block through it. `block` is the store's own copy, null while the record is free;
  // `next` links free records and is touched only under the mutex.
  struct alignas(32) Master {
    void *pointer;
    std::atomic<void *> block;
    std::atomic<size_t> size;
    Master *next;
  };

  // Records come in slabs aligned to their size, so that the slab of any address is found by
  // masking it; slab addresses sit in an open-addressed table that is only ever added to.
  static constexpr size_t kSlabBytes = size_t{1} << 16;
  static constexpr size_t kSlabSlots = 4096;
  static constexpr size_t kMaxSlabs = kSlabSlots / 2;
  // A freed record is handed out again only after this many others were freed, so that a stale
  // handle keeps failing for a while instead of quietly reaching someone else's block.
  static constexpr size_t kQuarantine = 1024;

  // The first slot of the table to try for the slab at `base`: Fibonacci hashing of its number.
  static size_t FirstSlot(uintptr_t base) {
    static_assert(kSlabSlots == size_t{1} << 12, "the hash yields 12 bits");
    return static_cast<size_t>(((base / kSlabBytes) * 0x9E3779B97F4A7C15u) >> 52);
  }
  // The record at `handle`, or null when `handle` is not the address of one.
  static Master *Lookup(SvHandle handle) {
    // A handle is the address of a record's first member, so the two convert into each other.
    static_assert(std::is_standard_layout<Master>::value, "a handle is its record's address");
    static_assert(kSlabBytes % sizeof(Master) == 0, "records fill their slab exactly");
    const uintptr_t address = reinterpret_cast<uintptr_t>(handle);
    const uintptr_t base = address & ~uintptr_t{kSlabBytes - 1};
    if (base == 0 || (address - base) % sizeof(Master) != 0) return nullptr;
    // The table is never more than half full, so the probe ends at an empty slot.
    for (size_t slot = FirstSlot(base);; slot = (slot + 1) % kSlabSlots) {
      const uintptr_t slab = slabs_[slot].load(std::memory_order_acquire);
      if (slab == base) return reinterpret_cast<Master *>(address);
      if (slab == 0) return nullptr;
    }
  }
  // Aborts unless `handle` is live and its master pointer still holds the block it was given.
  static Master &Find(SvHandle handle, const char *operation) {
    Master *master = Lookup(handle);
    if (master == nullptr || master->block.load(std::memory_order_acquire) == nullptr)
      Fatal(operation, handle, "not a live handle (never made, or already disposed of)");
    if (master->pointer != master->block.load(std::memory_order_relaxed))
      Fatal(operation, handle, "master pointer overwritten: it no longer holds the handle's block");
    return *master;
  }
  // A free record, or null when no memory is left for one. Under the mutex.
  Master *Take();
  bool AddSlab();

  // Zero before any code runs and reached without a pointer to the store, so that the size query
  // is a few loads; hidden, so that it is not reached through the symbol table either.
  __attribute__((visibility("hidden"))) static std::atomic<uintptr_t> slabs_[kSlabSlots];
  __attribute__((visibility("hidden"))) static std::atomic<uint64_t> sizeQueries_;
  std::mutex mutex_;
  size_t slabCount_ = 0;
  Master *fresh_ = nullptr;  // the rest of the newest slab, never handed out yet
  Master *freshEnd_ = nullptr;
  Master *freeHead_ = nullptr;
  Master *freeTail_ = nullptr;
  size_t freeCount_ = 0;
  uint64_t live_ = 0;
  bool moveOnResize_ = false;
  int32_t resizeError_ = SVSIM_ERR_MEMORY;
  uint64_t allocations_ = 0;
  uint64_t resizes_ = 0;
  uint64_t frees_ = 0;
};

}  // namespace svhost

#endif
