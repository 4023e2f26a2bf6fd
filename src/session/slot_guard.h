// The entry and exit that every read, write and convert call shares: the slot by the low 16 bits
// of the handle, and its guard word, on which nothing ever waits.
#ifndef KVSVAPI_SESSION_SLOT_GUARD_H
#define KVSVAPI_SESSION_SLOT_GUARD_H

#include <atomic>
#include <cstdint>

#include <boost/noncopyable.hpp>

#include "core/status.h"
#include "session/session_slot.h"

namespace nKVSVAPI100 {

class cSlotGuard : boost::noncopyable {
 public:
  using tGuardWord = std::atomic<uint32_t> tSessionSlot::*;

  // 0xBFF63020 for an index above 8192 or an empty slot; 0xBFF63027 if the guard is held by
  // another call or the slot is being torn down. Only on status 0 is the guard held.
  explicit cSlotGuard(uint32_t session, tGuardWord word = &tSessionSlot::guard);
  // Releases the guard unless an abort has already done so.
  ~cSlotGuard();

  Status status() const { return status_; }
  tSessionSlot &slot() const { return *slot_; }
  explicit operator bool() const { return status_ == 0; }
  // The guard stays held past this object: the slot then answers every call as busy until an
  // abort or the close frees it.
  void LeaveHeld() { release_ = false; }

 private:
  tSessionSlot *slot_ = nullptr;
  tGuardWord word_;
  Status status_ = 0;
  bool release_ = true;
};

}  // namespace nKVSVAPI100

#endif
