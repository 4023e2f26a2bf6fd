#include "session/session_manager.h"

#include <new>

#include "kvsvapi.h"

namespace nKVSVAPI100 {

cSnLifeManager gSessionManager;

cSnLifeManager::cSnLifeManager()
    : status(), mutex(new cRecursiveMutex(status)), interfaces(16) {
  interfaces.max_load_factor(1.0f);
  for (auto &slot : slots) slot.store(nullptr, std::memory_order_relaxed);
}

cSnLifeManager::~cSnLifeManager() {
  mutex.reset();
  for (auto &entry : interfaces) delete entry.second;
  interfaces.clear();
  for (auto &slot : slots) DestroySlot(slot.exchange(nullptr));
  for (tSessionSlot *slot : retired_) delete slot;
  retired_.clear();
}

tSessionSlot *cSnLifeManager::NewSlot() {
  {
    std::lock_guard<std::mutex> lock(retiredMutex_);
    if (!retired_.empty()) {
      tSessionSlot *slot = retired_.back();
      retired_.pop_back();
      return slot;
    }
  }
  return new (std::nothrow) tSessionSlot();
}

void cSnLifeManager::RetireSlot(tSessionSlot *slot) {
  std::lock_guard<std::mutex> lock(retiredMutex_);
  retired_.push_back(slot);
}

void cSnLifeManager::InsertInterface(const std::string &key, cSnLifeInterface *record) {
  interfaces[key] = record;
  interfaceCount_.store(interfaces.size());
}

void cSnLifeManager::EraseInterface(const std::string &key) {
  auto it = interfaces.find(key);
  if (it == interfaces.end()) return;
  delete it->second;
  interfaces.erase(it);
  interfaceCount_.store(interfaces.size());
}

Status CreateSlot(cSnLifeManager &manager, uint32_t handle, Status openStatus) {
  const uint32_t index = SlotIndex(handle);
  if (index == 0 || index > kMaxSlotIndex) return openStatus < 0 ? openStatus : kvErrInvalidSession;
  tSessionSlot *slot = manager.NewSlot();
  if (slot == nullptr) return kvErrOutOfMemory;
  slot->slotValid.store(1);
  // A pointer left by a session that the driver no longer has is overwritten: its handle is gone.
  manager.slots[index].store(slot);
  return 0;
}

}  // namespace nKVSVAPI100

extern "C" KVSV_EXPORT int32_t kvsvGetIsProjectSessionOpen(void) {
  return nKVSVAPI100::gSessionManager.ProjectSessionOpen() ? 1 : 0;
}
