#include "session/teardown_slot.h"

#include <cstdlib>
#include <cstring>
#include <string>

#include "core/internal_error.h"
#include "core/sleep.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/malloc_block.h"

namespace nKVSVAPI100 {

namespace {

// Guards are polled every 100 ms, 1000 times: a call has 100 seconds to leave a closing session.
constexpr uint32_t kGuardPollMs = 100;
constexpr uint32_t kGuardPolls = 1000;

// The interface text as the driver gives it, or nothing.
bool ReadInterfaceName(uint32_t handle, std::string &name) {
  uint32_t size = 0;
  if (kvGetPropertySize(handle, kvPropSession_IntfName, &size) < 0) return false;
  tMallocBlock block(static_cast<char *>(std::malloc(size != 0 ? size : 1)));
  if (!block) return false;
  if (kvGetProperty(handle, kvPropSession_IntfName, size, block.get()) < 0) return false;
  name.assign(block.get(), size != 0 ? strnlen(block.get(), size) : 0);
  return true;
}

bool GuardsFree(const tSessionSlot &slot) {
  return slot.guard.load() == 0 && slot.listGuard.load() == 0;
}

}  // namespace

Status CloseProjectSession(cSnLifeManager &manager, uint32_t handle) {
  if (handle == 0) return 0;
  std::string interfaceName;
  if (!ReadInterfaceName(handle, interfaceName)) return kvClear(handle);
  const auto record = manager.interfaces.find(interfaceName);
  if (record == manager.interfaces.end()) return kvClear(handle);

  Status status = 0;
  bool found = false;
  bool claimedSiblingRemains = false;
  for (auto &entry : record->second->sessions) {
    cSnLifeSession &session = *entry.second;
    if (session.handle == handle) {
      status = kvClear(handle);
      session.state = cSnLifeSession::kGone;
      found = true;
    } else if (session.state == cSnLifeSession::kClaimed) {
      claimedSiblingRemains = true;
    }
  }
  if (!found) return kvClear(handle);
  if (claimedSiblingRemains) return status;

  // Nobody holds a session of this interface any more: its unclaimed siblings go with it.
  for (auto &entry : record->second->sessions) {
    if (entry.second->state != cSnLifeSession::kCreated) continue;
    const Status cleared = kvClear(entry.second->handle);
    if (cleared < 0 && status >= 0) status = cleared;
  }
  manager.EraseInterface(interfaceName);
  return status;
}

Status TeardownSlot(cSnLifeManager &manager, uint32_t handle) {
  const Status closed = CloseProjectSession(manager, handle);
  const uint32_t index = SlotIndex(handle);
  if (index == 0 || index > kMaxSlotIndex) return closed < 0 ? closed : kvErrInvalidSession;
  tSessionSlot *slot = manager.slots[index].exchange(nullptr);
  if (slot == nullptr) return closed;
  // From here a caller that wins the guard leaves at once.
  slot->slotValid.exchange(0);
  if (GuardsFree(*slot)) {
    DestroySlot(slot);
    return closed;
  }
  for (uint32_t tries = kGuardPolls;; --tries) {
    const bool free = GuardsFree(*slot);
    if (free && tries != 0) {
      DestroySlot(slot);
      return closed;
    }
    // The last look counts as a failure even if the guards have just been freed.
    if (tries == 0) break;
    SleepMs(kGuardPollMs);
  }
  const Status reported = ReportInternalError(kComponentKvsvapi, nFile::kSessionFile, 1485, 0);
  DestroySlot(slot);
  return reported;
}

}  // namespace nKVSVAPI100
