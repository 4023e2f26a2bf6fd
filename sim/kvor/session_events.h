// What the blocked calls of one session wait for: its raised wait conditions and its clearing.
// A clear wakes every call blocked on the session and makes later waits fail at once.
#ifndef KVOR_SIM_SESSION_EVENTS_H
#define KVOR_SIM_SESSION_EVENTS_H

#include <atomic>
#include <condition_variable>
#include <cstdint>
#include <functional>
#include <map>
#include <mutex>
#include <string_view>

#include "call_counter.h"
#include "driver_status.h"

namespace nKvorSim {

// Whether kvWait knows `condition`.
bool IsWaitCondition(uint32_t condition);

class SessionEvents {
 public:
  // Blocks until `condition` is raised (0, with the raised value in *value if not null), the time
  // limit in seconds runs out (negative: none), or the session is cleared. While it is blocked the
  // call counts in `blocked` under `function`.
  Status WaitFor(uint32_t condition, double timeLimit, uint32_t *value, CallCounter &blocked,
                 std::string_view function);

  // Blocks until `ready` holds, the time limit in seconds runs out (negative: none), or the session
  // is cleared; kvsimErrSessionCleared for the clear, 0 otherwise, so the caller looks at what
  // it waited for. `ready` is called with this object's lock held: whatever it looks at must be
  // changed before Notify, so that a change cannot slip past the wait. While it is blocked the call
  // counts in `blocked` under `function`.
  Status WaitUntil(const std::function<bool()> &ready, double timeLimit, CallCounter &blocked,
                   std::string_view function);
  // Wakes the waits of WaitUntil to look at their `ready` again.
  void Notify();

  void Raise(uint32_t condition, uint32_t value);
  void Lower(uint32_t condition);

  void MarkCleared();
  bool IsCleared() const { return cleared_.load(); }

 private:
  std::mutex mutex_;
  std::condition_variable changed_;
  std::map<uint32_t, uint32_t> raised_;  // raised condition -> value for the waiter
  std::atomic<bool> cleared_{false};
};

}  // namespace nKvorSim

#endif
