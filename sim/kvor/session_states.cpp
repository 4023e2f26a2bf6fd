#include "session_states.h"

#include <utility>

namespace nKvorSim {

void SessionStates::Set(uint32_t stateId, StateValue value) {
  std::lock_guard<std::mutex> lock(mutex_);
  values_[stateId] = std::move(value);
}

std::optional<StateValue> SessionStates::Get(uint32_t stateId) const {
  std::lock_guard<std::mutex> lock(mutex_);
  auto found = values_.find(stateId);
  if (found == values_.end()) return std::nullopt;
  return found->second;
}

void SessionStates::SetTrigger(const TimeTrigger &trigger) {
  std::lock_guard<std::mutex> lock(mutex_);
  trigger_ = trigger;
}

std::optional<TimeTrigger> SessionStates::Trigger() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return trigger_;
}

}  // namespace nKvorSim
