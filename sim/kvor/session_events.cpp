#include "session_events.h"

#include <chrono>
#include <cmath>

#include "kvsim.h"

namespace nKvorSim {

namespace {

// Limits beyond this many seconds wait as long as no limit; it also keeps the conversion to a
// clock duration from overflowing.
constexpr double kLongestLimit = 1.0e7;

}  // namespace

bool IsWaitCondition(uint32_t condition) {
  return condition == kvsimConditionTransmitComplete ||
         condition == kvsimConditionIntfCommunicating ||
         condition == kvsimConditionIntfRemoteWakeup;
}

Status SessionEvents::WaitFor(uint32_t condition, double timeLimit, uint32_t *value,
                              CallCounter &blocked, std::string_view function) {
  if (std::isnan(timeLimit)) return kvsimErrInvalidArgument;
  std::unique_lock<std::mutex> lock(mutex_);
  auto ready = [&] { return cleared_.load() || raised_.count(condition) != 0; };
  if (!ready()) {
    // Counted while the lock is still held: whoever sees the count and then clears or raises
    // needs the lock, which the wait below gives up, so the wake cannot come too early.
    blocked.Enter(function);
    if (timeLimit < 0 || timeLimit > kLongestLimit) {
      changed_.wait(lock, ready);
    } else {
      const auto deadline = std::chrono::steady_clock::now() +
                            std::chrono::duration_cast<std::chrono::steady_clock::duration>(
                                std::chrono::duration<double>(timeLimit));
      changed_.wait_until(lock, deadline, ready);
    }
    blocked.Leave(function);
  }
  if (cleared_.load()) return kvsimErrSessionCleared;
  auto raised = raised_.find(condition);
  if (raised == raised_.end()) return kvsimErrTimeout;
  if (value != nullptr) *value = raised->second;
  return 0;
}

void SessionEvents::Raise(uint32_t condition, uint32_t value) {
  std::lock_guard<std::mutex> lock(mutex_);
  raised_[condition] = value;
  changed_.notify_all();
}

void SessionEvents::Lower(uint32_t condition) {
  std::lock_guard<std::mutex> lock(mutex_);
  raised_.erase(condition);
}

void SessionEvents::MarkCleared() {
  std::lock_guard<std::mutex> lock(mutex_);
  cleared_.store(true);
  changed_.notify_all();
}

}  // namespace nKvorSim
