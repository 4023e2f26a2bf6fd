#include "call_holds.h"

namespace nKvorSim {

void CallHolds::Hold(std::string_view function) {
  std::lock_guard<std::mutex> lock(mutex_);
  auto found = holds_.find(function);
  if (found == holds_.end()) found = holds_.emplace(std::string(function), HoldState{}).first;
  found->second.held = true;
}

void CallHolds::Release(std::string_view function) {
  std::lock_guard<std::mutex> lock(mutex_);
  auto found = holds_.find(function);
  if (found == holds_.end() || !found->second.held) return;
  found->second.held = false;
  ++found->second.releases;
  changed_.notify_all();
}

void CallHolds::ReleaseAll() {
  std::lock_guard<std::mutex> lock(mutex_);
  for (auto &entry : holds_) {
    if (!entry.second.held) continue;
    entry.second.held = false;
    ++entry.second.releases;
  }
  changed_.notify_all();
}

bool CallHolds::ParkWhileHeld(std::string_view function, const std::function<bool()> &cancelled) {
  std::unique_lock<std::mutex> lock(mutex_);
  auto found = holds_.find(function);
  if (found == holds_.end() || !found->second.held) return true;
  // Map nodes stay where they are, so the state can be watched across the wait.
  const HoldState &state = found->second;
  const uint64_t releases = state.releases;
  parked_.Enter(function);
  changed_.wait(lock, [&] { return state.releases != releases || cancelled(); });
  parked_.Leave(function);
  return !cancelled();
}

void CallHolds::Wake() {
  // Taking the mutex orders the wake after the cancellation that the caller has already made
  // visible, so that a call about to park cannot miss it.
  std::lock_guard<std::mutex> lock(mutex_);
  changed_.notify_all();
}

bool CallHolds::WaitParked(std::string_view function, int count, std::chrono::milliseconds limit) {
  return parked_.WaitFor(function, count, limit);
}

}  // namespace nKvorSim
