#include "session/slot_guard.h"

#include "session/session_manager.h"

namespace nKVSVAPI100 {

cSlotGuard::cSlotGuard(uint32_t session, tGuardWord word) : word_(word) {
  const uint32_t index = SlotIndex(session);
  tSessionSlot *slot = index > kMaxSlotIndex ? nullptr : gSessionManager.slots[index].load();
  if (slot == nullptr) {
    status_ = kvErrInvalidSession;
    return;
  }
  std::atomic<uint32_t> &guard = slot->*word_;
  if (guard.exchange(1) != 0) {
    status_ = kvErrSessionBusy;
    return;
  }
  // Teardown clears slotValid before it waits for the guards: past this test the slot stays. A
  // record ended and reused for another index between our load and our guard is not ours.
  if (slot->slotValid.load() == 0 || gSessionManager.slots[index].load() != slot) {
    guard.exchange(0);
    status_ = kvErrSessionBusy;
    return;
  }
  slot_ = slot;
}

cSlotGuard::~cSlotGuard() {
  if (slot_ == nullptr || !release_) return;
  std::atomic<uint32_t> &guard = slot_->*word_;
  // An abort on another thread may have freed the guard already.
  if (guard.load(std::memory_order_relaxed) != 0) guard.exchange(0);
}

}  // namespace nKVSVAPI100
