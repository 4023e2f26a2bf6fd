// The trigger that kvFutureTimeTrigger armed last on one session: its time, in the session's
// units, and its option. Safe for many threads.
#ifndef KVOR_SIM_FUTURE_TRIGGER_H
#define KVOR_SIM_FUTURE_TRIGGER_H

#include <cstdint>
#include <mutex>
#include <optional>

namespace nKvorSim {

struct ArmedTrigger {
  uint64_t when = 0;  // raw time, or 1 ns time since 1970 on Ethernet
  uint32_t option = 0;
};

class FutureTrigger {
 public:
  void Arm(const ArmedTrigger &trigger) {
    std::lock_guard<std::mutex> lock(mutex_);
    armed_ = trigger;
  }
  std::optional<ArmedTrigger> Armed() const {
    std::lock_guard<std::mutex> lock(mutex_);
    return armed_;
  }

 private:
  mutable std::mutex mutex_;
  std::optional<ArmedTrigger> armed_;
};

}  // namespace nKvorSim

#endif
