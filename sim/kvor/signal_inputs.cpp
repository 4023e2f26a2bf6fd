#include "signal_inputs.h"

#include <algorithm>
#include <cmath>

namespace nKvorSim {

namespace {

constexpr double kRawPerSecond = 1e7;

}  // namespace

void SignalInputs::Size(uint32_t count) {
  if (latest_.size() >= count) return;
  latest_.resize(count);
  pending_.resize(count);
  held_.resize(count, 0.0);
}

void SignalInputs::Receive(uint32_t count, uint32_t index, uint64_t time, double value,
                           uint32_t capacity) {
  std::lock_guard<std::mutex> lock(mutex_);
  Size(count);
  std::optional<tSignalPair> &latest = latest_[index];
  if (!latest || latest->time <= time) latest = tSignalPair{time, value};
  std::deque<tSignalPair> &pending = pending_[index];
  if (pending.size() >= capacity) return;
  // Pairs mostly arrive in time order; one stamped earlier than those waiting goes before them.
  auto place = pending.end();
  while (place != pending.begin() && std::prev(place)->time > time) --place;
  pending.insert(place, tSignalPair{time, value});
}

void SignalInputs::Latest(uint32_t count, double *values, uint64_t *times) {
  std::lock_guard<std::mutex> lock(mutex_);
  Size(count);
  for (uint32_t i = 0; i < count; ++i) {
    const tSignalPair pair = latest_[i].value_or(tSignalPair{});
    values[i] = pair.value;
    if (times != nullptr) times[i] = pair.time;
  }
}

uint32_t SignalInputs::CountPairs(uint32_t index, std::optional<uint64_t> limit, uint32_t most) {
  std::lock_guard<std::mutex> lock(mutex_);
  Size(index + 1);
  uint32_t counted = 0;
  for (const tSignalPair &pair : pending_[index]) {
    if (counted == most || (limit && pair.time > *limit)) break;
    ++counted;
  }
  return counted;
}

uint32_t SignalInputs::TakePairs(uint32_t index, std::optional<uint64_t> limit, uint32_t most,
                                 double *values, uint64_t *times) {
  std::lock_guard<std::mutex> lock(mutex_);
  Size(index + 1);
  std::deque<tSignalPair> &pending = pending_[index];
  uint32_t taken = 0;
  while (taken < most && !pending.empty() && (!limit || pending.front().time <= *limit)) {
    values[taken] = pending.front().value;
    times[taken] = pending.front().time;
    pending.pop_front();
    ++taken;
  }
  return taken;
}

void SignalInputs::PrepareGrid(double rate, uint64_t origin) {
  if (!grid_.started) grid_ = tGrid{true, origin, 0, rate};
  if (grid_.rate == 0.0) grid_.rate = rate;
  if (grid_.rate != rate) grid_ = tGrid{true, InstantAt(grid_.next), 0, rate};
}

uint64_t SignalInputs::InstantAt(uint64_t index) const {
  return grid_.start + static_cast<uint64_t>(
                           std::llround(static_cast<double>(index) * kRawPerSecond / grid_.rate));
}

uint64_t SignalInputs::DueLocked(uint64_t now) const {
  if (now < InstantAt(grid_.next)) return 0;
  // A first guess from the rate, then corrected so that rounding agrees with InstantAt.
  uint64_t last =
      static_cast<uint64_t>(static_cast<double>(now - grid_.start) * grid_.rate / kRawPerSecond);
  last = std::max(last, grid_.next);
  while (InstantAt(last + 1) <= now) ++last;
  while (last > grid_.next && InstantAt(last) > now) --last;
  return last + 1 - grid_.next;
}

uint64_t SignalInputs::InstantsDue(uint64_t now, double rate, uint64_t origin) {
  std::lock_guard<std::mutex> lock(mutex_);
  PrepareGrid(rate, origin);
  return DueLocked(now);
}

uint64_t SignalInputs::Sample(uint32_t count, uint32_t samples, double rate, uint64_t origin,
                              double *const *buffers) {
  std::lock_guard<std::mutex> lock(mutex_);
  Size(count);
  PrepareGrid(rate, origin);
  const uint64_t first = InstantAt(grid_.next);
  for (uint32_t k = 0; k < samples; ++k) {
    const uint64_t instant = InstantAt(grid_.next + k);
    for (uint32_t i = 0; i < count; ++i) {
      std::deque<tSignalPair> &pending = pending_[i];
      while (!pending.empty() && pending.front().time <= instant) {
        held_[i] = pending.front().value;
        pending.pop_front();
      }
      buffers[i][k] = held_[i];
    }
  }
  grid_.next += samples;
  return first;
}

void SignalInputs::Flush(uint64_t now) {
  std::lock_guard<std::mutex> lock(mutex_);
  for (std::optional<tSignalPair> &latest : latest_) latest.reset();
  for (std::deque<tSignalPair> &pending : pending_) pending.clear();
  std::fill(held_.begin(), held_.end(), 0.0);
  grid_ = tGrid{true, now, 0, 0.0};
}

std::optional<uint32_t> SignalInputs::Fill() const {
  const int32_t pairs = fill_.load();
  if (pairs < 0) return std::nullopt;
  return static_cast<uint32_t>(pairs);
}

}  // namespace nKvorSim
