// The session manager: project interface records and the flat table of session slots.
#ifndef KVSVAPI_SESSION_SESSION_MANAGER_H
#define KVSVAPI_SESSION_SESSION_MANAGER_H

#include <array>
#include <atomic>
#include <cstdint>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include <boost/noncopyable.hpp>
#include <boost/unordered_map.hpp>

#include "core/recursive_mutex.h"
#include "core/status.h"
#include "core/status_block.h"
#include "session/session_slot.h"
#include "session/sn_life_interface.h"

namespace nKVSVAPI100 {

// Slot indices run from 1 to 8192; index 0 is never filled.
constexpr uint32_t kMaxSlotIndex = 8192;

inline uint32_t SlotIndex(uint32_t session) { return session & 0xFFFFu; }

class cSnLifeManager : boost::noncopyable {
 public:
  cSnLifeManager();
  // Frees the records and the slots; driver sessions are left to the driver.
  ~cSnLifeManager();

  // Built before the mutex, which records its failure here.
  tStatusBlock status;  // negative code if the mutex could not be made
  // Serialises open, create, close, clear and every change of the map and the slot pointers.
  std::unique_ptr<cRecursiveMutex> mutex;
  boost::unordered_map<std::string, cSnLifeInterface *> interfaces;  // owned
  // Read without a lock by every guarded call; written under `mutex`.
  std::array<std::atomic<tSessionSlot *>, kMaxSlotIndex + 1> slots;

  // Changes of `interfaces` go through these so that the open flag can be read without the mutex.
  void InsertInterface(const std::string &key, cSnLifeInterface *record);
  void EraseInterface(const std::string &key);
  bool ProjectSessionOpen() const { return interfaceCount_.load() != 0; }

  // A caller that loaded a slot pointer just before its teardown may still touch the record's
  // guard, so records are never handed back to the allocator while the process runs: an ended
  // slot is kept here, invalid, and the next new slot reuses it.
  tSessionSlot *NewSlot();
  void RetireSlot(tSessionSlot *slot);

 private:
  std::atomic<std::size_t> interfaceCount_{0};
  std::mutex retiredMutex_;  // a leaf lock: nothing is called while it is held
  std::vector<tSessionSlot *> retired_;
};

extern cSnLifeManager gSessionManager;

// Makes the slot of `handle` under the manager's mutex. An index of 0 or above 8192 makes nothing
// and returns `openStatus` if that is an error, else 0xBFF63020.
Status CreateSlot(cSnLifeManager &manager, uint32_t handle, Status openStatus);

}  // namespace nKVSVAPI100

#endif
