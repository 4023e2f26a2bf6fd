// What the blocked calls of one session wait for: its raised wait conditions and its clearing.
// A clear wakes every call blocked on the session and makes later waits fail at once.
#ifndef KVOR_SIM_SESSION_EVENTS_H
#define KVOR_SIM_SESSION_EVENTS_H

#include <atomic>
#include <condition_variable>
#include <cstdint>
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
