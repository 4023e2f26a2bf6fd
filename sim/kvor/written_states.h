// The states that a test declared writable on one session, and what kvWriteState wrote to each:
// the driver's other states, beside the LIN schedule, as far as the stand-in keeps them. Safe for
// many threads.
#ifndef KVOR_SIM_WRITTEN_STATES_H
#define KVOR_SIM_WRITTEN_STATES_H

#include <cstdint>
#include <map>
#include <mutex>
#include <optional>

namespace nKvorSim {

class WrittenStates {
 public:
  void Allow(uint32_t stateId) {
    std::lock_guard<std::mutex> lock(mutex_);
    values_.emplace(stateId, std::nullopt);
  }
  bool Allows(uint32_t stateId) const {
    std::lock_guard<std::mutex> lock(mutex_);
    return values_.count(stateId) != 0;
  }
  // Keeps the value of a writable state; false for any other state.
  bool Write(uint32_t stateId, uint32_t value) {
    std::lock_guard<std::mutex> lock(mutex_);
    const auto entry = values_.find(stateId);
    if (entry == values_.end()) return false;
    entry->second = value;
    return true;
  }
  // The last value written; none if the state is not writable or was never written.
  std::optional<uint32_t> Last(uint32_t stateId) const {
    std::lock_guard<std::mutex> lock(mutex_);
    const auto entry = values_.find(stateId);
    if (entry == values_.end()) return std::nullopt;
    return entry->second;
  }

 private:
  mutable std::mutex mutex_;
  std::map<uint32_t, std::optional<uint32_t>> values_;
};

}  // namespace nKvorSim

#endif
