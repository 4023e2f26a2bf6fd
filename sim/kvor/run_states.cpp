#include "run_states.h"

#include <algorithm>

#include "kvsim.h"

namespace nKvorSim {

Status RunStates::Start(uint32_t handle, const Session &session, uint32_t scope) {
  if (scope > kvsimScopeInterfaceOnly) return kvsimErrInvalidScope;
  const uint32_t interfaceIndex = session.Definition().interfaceIndex;
  std::lock_guard<std::mutex> lock(mutex_);
  // Checked under the lock: a clear marks the session before it calls Forget, so a start that
  // passes here is undone by that Forget, and no cleared handle stays counted as started.
  if (session.Events().IsCleared()) return kvsimErrInvalidSession;
  if (scope != kvsimScopeSessionOnly) interfaceStarted_[interfaceIndex] = true;
  if (scope != kvsimScopeInterfaceOnly) startedSessions_[handle] = interfaceIndex;
  return 0;
}

Status RunStates::Stop(uint32_t handle, const Session &session, uint32_t scope) {
  if (scope > kvsimScopeInterfaceOnly) return kvsimErrInvalidScope;
  const uint32_t interfaceIndex = session.Definition().interfaceIndex;
  std::lock_guard<std::mutex> lock(mutex_);
  if (scope == kvsimScopeInterfaceOnly) {
    interfaceStarted_[interfaceIndex] = false;
  } else {
    StopLocked(handle, interfaceIndex, scope == kvsimScopeNormal);
  }
  return 0;
}

void RunStates::Forget(uint32_t handle) {
  std::lock_guard<std::mutex> lock(mutex_);
  auto found = startedSessions_.find(handle);
  if (found == startedSessions_.end()) return;
  StopLocked(handle, found->second, true);
}

bool RunStates::SessionStarted(uint32_t handle) const {
  std::lock_guard<std::mutex> lock(mutex_);
  return startedSessions_.count(handle) != 0;
}

bool RunStates::InterfaceStarted(uint32_t interfaceIndex) const {
  std::lock_guard<std::mutex> lock(mutex_);
  return interfaceIndex < interfaceStarted_.size() && interfaceStarted_[interfaceIndex];
}

void RunStates::Reset() {
  std::lock_guard<std::mutex> lock(mutex_);
  startedSessions_.clear();
  interfaceStarted_.fill(false);
}

void RunStates::StopLocked(uint32_t handle, uint32_t interfaceIndex, bool normal) {
  startedSessions_.erase(handle);
  if (!normal) return;
  const bool othersRun =
      std::any_of(startedSessions_.begin(), startedSessions_.end(),
                  [&](const auto &entry) { return entry.second == interfaceIndex; });
  if (!othersRun) interfaceStarted_[interfaceIndex] = false;
}

}  // namespace nKvorSim
