// The states of one session as a test set them: the values kvReadState gives, with their fault
// words, and the time trigger that kvReadStateTimeTrigger waits for. Safe for many threads.
#ifndef KVOR_SIM_SESSION_STATES_H
#define KVOR_SIM_SESSION_STATES_H

#include <array>
#include <cstdint>
#include <map>
#include <mutex>
#include <optional>
#include <vector>

#include "known_states.h"

namespace nKvorSim {

struct StateValue {
  std::vector<uint8_t> bytes;
  uint32_t fault = 0;
};

struct TimeTrigger {
  uint64_t firesAt = 0;  // raw time of the driver's clock
  std::array<uint8_t, kTimeRecordSize> record{};
};

class SessionStates {
 public:
  void Set(uint32_t stateId, StateValue value);
  // What was set for the state; none if it never was.
  std::optional<StateValue> Get(uint32_t stateId) const;

  void SetTrigger(const TimeTrigger &trigger);
  std::optional<TimeTrigger> Trigger() const;

 private:
  mutable std::mutex mutex_;
  std::map<uint32_t, StateValue> values_;
  std::optional<TimeTrigger> trigger_;
};

}  // namespace nKvorSim

#endif
