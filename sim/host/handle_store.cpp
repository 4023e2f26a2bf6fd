#include "handle_store.h"

#include <cstdlib>
#include <cstring>
#include <new>

#include "fatal.h"
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

HandleStore &HandleStore::Instance() {
  // Never destroyed: the library may still dispose of handles from static destructors at exit.
  static HandleStore *store = new HandleStore;
  return *store;
}

HandleStore::Entry &HandleStore::Find(SvHandle handle, const char *operation) {
  auto it = live_.find(handle);
  if (it == live_.end())
    Fatal(operation, handle, "not a live handle (never made, or already disposed of)");
  if (*handle != it->second.block)
    Fatal(operation, handle, "master pointer overwritten: it no longer holds the handle's block");
  return it->second;
}

SvHandle HandleStore::Create(size_t size) {
  if (FaultPlan::Instance().AllocationFails()) return nullptr;
  void *block = AllocateBlock(size);
  if (block == nullptr) return nullptr;
  auto handle = static_cast<SvHandle>(std::malloc(sizeof(void *)));
  if (handle == nullptr) {
    std::free(block);
    return nullptr;
  }
  std::memset(block, 0, size);
  *handle = block;
  std::lock_guard<std::mutex> lock(mutex_);
  try {
    live_.emplace(handle, Entry{block, size});
  } catch (const std::bad_alloc &) {
    std::free(block);
    std::free(handle);
    return nullptr;
  }
  ++allocations_;
  return handle;
}

int32_t HandleStore::Resize(SvHandle handle, size_t size, const char *operation) {
  std::lock_guard<std::mutex> lock(mutex_);
  Entry &entry = Find(handle, operation);
  if (FaultPlan::Instance().ResizeFails()) return resizeError_;
  void *block = nullptr;
  if (moveOnResize_) {
    block = AllocateBlock(size);
    if (block == nullptr) return resizeError_;
    std::memcpy(block, entry.block, entry.size < size ? entry.size : size);
    FreeBlock(entry.block, entry.size);
  } else {
    block = std::realloc(entry.block, size == 0 ? 1 : size);
    if (block == nullptr) return resizeError_;
  }
  if (size > entry.size) std::memset(static_cast<char *>(block) + entry.size, 0, size - entry.size);
  *handle = block;
  entry = Entry{block, size};
  ++resizes_;
  return 0;
}

size_t HandleStore::Size(SvHandle handle, const char *operation) {
  std::lock_guard<std::mutex> lock(mutex_);
  return Find(handle, operation).size;
}

void HandleStore::Dispose(SvHandle handle, const char *operation) {
  std::lock_guard<std::mutex> lock(mutex_);
  const Entry entry = Find(handle, operation);
  live_.erase(handle);
  FreeBlock(entry.block, entry.size);
  std::free(handle);
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
  return live_.size();
}

void HandleStore::ResetCounters() {
  std::lock_guard<std::mutex> lock(mutex_);
  allocations_ = 0;
  resizes_ = 0;
  frees_ = 0;
}

void HandleStore::Reset() {
  std::lock_guard<std::mutex> lock(mutex_);
  moveOnResize_ = false;
  resizeError_ = SVSIM_ERR_MEMORY;
  allocations_ = 0;
  resizes_ = 0;
  frees_ = 0;
}

}  // namespace svhost
