#include "handle_store.h"

#include <cstdlib>
#include <cstring>
#include <new>

#if defined(__has_include)
#if __has_include(<sanitizer/asan_interface.h>)
#include <sanitizer/asan_interface.h>
#endif
#endif
#ifndef ASAN_POISON_MEMORY_REGION
#define ASAN_POISON_MEMORY_REGION(address, size) ((void)(address), (void)(size))
#define ASAN_UNPOISON_MEMORY_REGION(address, size) ((void)(address), (void)(size))
#endif

#include "fault_plan.h"

namespace svhost {

namespace {

// Written over a block before it is freed, so that a stale pointer reads garbage even in a build
// without address checking.
constexpr int kFreedPattern = 0xDB;

// malloc(0) may give null; the host still needs a distinct block for an empty handle.
void *AllocateBlock(size_t size) { return std::malloc(size == 0 ? 1 : size); }

void FreeBlock(void *block, size_t size) {
  std::memset(block, kFreedPattern, size);
  std::free(block);
}

}  // namespace

std::atomic<uintptr_t> HandleStore::slabs_[HandleStore::kSlabSlots];
std::atomic<uint64_t> HandleStore::sizeQueries_{0};

HandleStore &HandleStore::Instance() {
  // Never destroyed: the library may still dispose of handles from static destructors at exit.
  static HandleStore *store = new HandleStore;
  return *store;
}

bool HandleStore::AddSlab() {
  if (slabCount_ == kMaxSlabs) return false;
  void *slab = std::aligned_alloc(kSlabBytes, kSlabBytes);
  if (slab == nullptr) return false;
  auto first = static_cast<Master *>(slab);
  const size_t count = kSlabBytes / sizeof(Master);
  for (size_t i = 0; i < count; ++i) new (first + i) Master{};
  const uintptr_t base = reinterpret_cast<uintptr_t>(slab);
  size_t slot = FirstSlot(base);
  while (slabs_[slot].load(std::memory_order_relaxed) != 0) slot = (slot + 1) % kSlabSlots;
  slabs_[slot].store(base, std::memory_order_release);
  ++slabCount_;
  fresh_ = first;
  freshEnd_ = first + count;
  return true;
}

HandleStore::Master *HandleStore::Take() {
  const bool fresh = freeCount_ <= kQuarantine && (fresh_ != freshEnd_ || AddSlab());
  if (fresh) return fresh_++;
  // Past the quarantine, or out of slabs: the oldest freed record serves again.
  Master *master = freeHead_;
  if (master == nullptr) return nullptr;
  freeHead_ = master->next;
  if (freeHead_ == nullptr) freeTail_ = nullptr;
  --freeCount_;
  return master;
}

SvHandle HandleStore::Create(size_t size) {
  if (FaultPlan::Instance().AllocationFails()) return nullptr;
  void *block = AllocateBlock(size);
  if (block == nullptr) return nullptr;
  std::memset(block, 0, size);
  std::lock_guard<std::mutex> lock(mutex_);
  Master *master = Take();
  if (master == nullptr) {
    std::free(block);
    return nullptr;
  }
  ASAN_UNPOISON_MEMORY_REGION(&master->pointer, sizeof master->pointer);
  master->pointer = block;
  master->next = nullptr;
  master->size.store(size, std::memory_order_relaxed);
  master->block.store(block, std::memory_order_release);
  ++live_;
  ++allocations_;
  return &master->pointer;
}

int32_t HandleStore::Resize(SvHandle handle, size_t size, const char *operation) {
  std::lock_guard<std::mutex> lock(mutex_);
  Master &master = Find(handle, operation);
  if (FaultPlan::Instance().ResizeFails()) return resizeError_;
  void *const old = master.block.load(std::memory_order_relaxed);
  const size_t oldSize = master.size.load(std::memory_order_relaxed);
  void *block = nullptr;
  if (moveOnResize_) {
    block = AllocateBlock(size);
    if (block == nullptr) return resizeError_;
    std::memcpy(block, old, oldSize < size ? oldSize : size);
    FreeBlock(old, oldSize);
  } else {
    block = std::realloc(old, size == 0 ? 1 : size);
    if (block == nullptr) return resizeError_;
  }
  if (size > oldSize) std::memset(static_cast<char *>(block) + oldSize, 0, size - oldSize);
  master.pointer = block;
  master.size.store(size, std::memory_order_relaxed);
  master.block.store(block, std::memory_order_release);
  ++resizes_;
  return 0;
}

void HandleStore::Dispose(SvHandle handle, const char *operation) {
  std::lock_guard<std::mutex> lock(mutex_);
  Master &master = Find(handle, operation);
  void *const block = master.block.load(std::memory_order_relaxed);
  master.block.store(nullptr, std::memory_order_release);
  FreeBlock(block, master.size.load(std::memory_order_relaxed));
  // A program that reads its block through a disposed handle is caught by address checking,
  // and finds no block without it.
  master.pointer = nullptr;
  ASAN_POISON_MEMORY_REGION(&master.pointer, sizeof master.pointer);
  master.next = nullptr;
  (freeTail_ != nullptr ? freeTail_->next : freeHead_) = &master;
  freeTail_ = &master;
  ++freeCount_;
  --live_;
  ++frees_;
}

void HandleStore::SetMoveOnResize(bool on) {
  std::lock_guard<std::mutex> lock(mutex_);
  moveOnResize_ = on;
}

void HandleStore::SetResizeError(int32_t code) {
  std::lock_guard<std::mutex> lock(mutex_);
  resizeError_ = code;
}

uint64_t HandleStore::Allocations() {
  std::lock_guard<std::mutex> lock(mutex_);
  return allocations_;
}

uint64_t HandleStore::Resizes() {
  std::lock_guard<std::mutex> lock(mutex_);
  return resizes_;
}

uint64_t HandleStore::Frees() {
  std::lock_guard<std::mutex> lock(mutex_);
  return frees_;
}

uint64_t HandleStore::Live() {
  std::lock_guard<std::mutex> lock(mutex_);
  return live_;
}

void HandleStore::ResetCounters() {
  std::lock_guard<std::mutex> lock(mutex_);
  allocations_ = 0;
  resizes_ = 0;
  frees_ = 0;
  sizeQueries_.store(0, std::memory_order_relaxed);
}

void HandleStore::Reset() {
  std::lock_guard<std::mutex> lock(mutex_);
  moveOnResize_ = false;
  resizeError_ = SVSIM_ERR_MEMORY;
  allocations_ = 0;
  resizes_ = 0;
  frees_ = 0;
  sizeQueries_.store(0, std::memory_order_relaxed);
}

}  // namespace svhost
