// Holds on driver functions: while a function is held, each of its calls parks inside the driver
// until the hold is lifted or the session it works on is cleared.
#ifndef KVOR_SIM_CALL_HOLDS_H
#define KVOR_SIM_CALL_HOLDS_H

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <functional>
#include <map>
#include <mutex>
#include <string>
#include <string_view>

#include "call_counter.h"

namespace nKvorSim {

class CallHolds {
 public:
  void Hold(std::string_view function);
  void Release(std::string_view function);
  void ReleaseAll();

  // Parks the calling thread while `function` is held. Returns false if `cancelled` turned true
  // while it was parked, true otherwise.
  bool ParkWhileHeld(std::string_view function, const std::function<bool()> &cancelled);
  // Makes parked calls look at their cancellation again, after a session has been cleared.
  void Wake();

  bool WaitParked(std::string_view function, int count, std::chrono::milliseconds limit);

 private:
  struct HoldState {
    bool held = false;
    uint64_t releases = 0;  // a parked call goes on once this moves
  };

  std::mutex mutex_;
  std::condition_variable changed_;
  std::map<std::string, HoldState, std::less<>> holds_;
  CallCounter parked_;
};

}  // namespace nKvorSim

#endif
