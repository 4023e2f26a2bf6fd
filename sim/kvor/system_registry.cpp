#include "system_registry.h"

#include <algorithm>

#include "kvsim.h"

namespace nKvorSim {

Status SystemRegistry::Open(uint32_t *handle) {
  std::lock_guard<std::mutex> lock(mutex_);
  // Numbers go round rather than being reused at once, so that the handle of a system that was
  // just closed does not come back for the next open.
  for (uint32_t step = 1; step <= kMaxSystems; ++step) {
    const uint32_t number = (last_ + step - 1) % kMaxSystems + 1;
    if (open_[number]) continue;
    open_[number] = true;
    last_ = number;
    *handle = HandleOf(SystemObject{SystemObjectKind::kSystem, number, 0, 0});
    return 0;
  }
  return kvsimErrTooManySystems;
}

Status SystemRegistry::Close(uint32_t handle) {
  std::optional<SystemObject> object = DecodeSystemHandle(handle);
  std::lock_guard<std::mutex> lock(mutex_);
  if (!object || object->kind != SystemObjectKind::kSystem || !open_[object->system]) {
    return kvsimErrInvalidObject;
  }
  open_[object->system] = false;
  return 0;
}

void SystemRegistry::CloseAll() {
  std::lock_guard<std::mutex> lock(mutex_);
  open_.fill(false);
}

size_t SystemRegistry::OpenCount() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return static_cast<size_t>(std::count(open_.begin(), open_.end(), true));
}

std::optional<SystemObject> SystemRegistry::Resolve(uint32_t handle) const {
  std::optional<SystemObject> object = DecodeSystemHandle(handle);
  if (!object) return std::nullopt;
  std::lock_guard<std::mutex> lock(mutex_);
  if (!open_[object->system]) return std::nullopt;
  return object;
}

}  // namespace nKvorSim
