#include "session_events.h"

#include <chrono>
#include <cmath>
#include <optional>

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
  std::optional<uint32_t> raised;
  const Status status = WaitUntil(
      [&] {
        auto found = raised_.find(condition);
        if (found != raised_.end()) raised = found->second;
        return raised.has_value();
      },
      timeLimit, blocked, function);
  if (status != 0) return status;
  if (!raised) return kvsimErrTimeout;
  if (value != nullptr) *value = *raised;
  return 0;
}

Status SessionEvents::WaitUntil(const std::function<bool()> &ready, double timeLimit,
                                CallCounter &blocked, std::string_view function) {
  if (std::isnan(timeLimit)) return kvsimErrInvalidArgument;
  std::unique_lock<std::mutex> lock(mutex_);
  auto done = [&] { return cleared_.load() || ready(); };
  if (!done()) {
    // Counted while the lock is still held: whoever sees the count and then clears or raises
    // needs the lock, which the wait below gives up, so the wake cannot come too early.
    blocked.Enter(function);
    if (timeLimit < 0 || timeLimit > kLongestLimit) {
      changed_.wait(lock, done);
    } else {
      const auto deadline = std::chrono::steady_clock::now() +
                            std::chrono::duration_cast<std::chrono::steady_clock::duration>(
                                std::chrono::duration<double>(timeLimit));
      changed_.wait_until(lock, deadline, done);
    }
    blocked.Leave(function);
  }
  return cleared_.load() ? kvsimErrSessionCleared : 0;
}

void SessionEvents::Notify() {
  std::lock_guard<std::mutex> lock(mutex_);
  changed_.notify_all();
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
