#include "call_log.h"

#include <algorithm>
#include <cstdio>

namespace nKvorSim {

uint64_t CallLog::Append(const CallArgs &args) {
  std::lock_guard<std::mutex> lock(mutex_);
  // A number that no record ever has, so that Complete leaves it alone.
  if (!enabled_) return UINT64_MAX;
  calls_.push_back(Call{args, KVSIM_STATUS_PENDING});
  if (calls_.size() > kCapacity) {
    calls_.pop_front();
    ++firstSequence_;
  }
  return firstSequence_ + calls_.size() - 1;
}

void CallLog::Complete(uint64_t sequence, uint32_t object, Status status) {
  std::lock_guard<std::mutex> lock(mutex_);
  if (sequence < firstSequence_ || sequence - firstSequence_ >= calls_.size()) return;
  Call &call = calls_[sequence - firstSequence_];
  call.args.object = object;
  call.status = status;
}

size_t CallLog::Count() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return calls_.size();
}

std::optional<kvsimCallRecord> CallLog::Entry(size_t index) const {
  std::lock_guard<std::mutex> lock(mutex_);
  if (index >= calls_.size()) return std::nullopt;
  const Call &call = calls_[index];
  kvsimCallRecord record{};
  std::snprintf(record.function, sizeof record.function, "%s", call.args.function);
  record.object = call.args.object;
  record.propertyId = call.args.propertyId;
  record.size1 = call.args.size1;
  record.size2 = call.args.size2;
  record.status = call.status;
  std::snprintf(record.text, sizeof record.text, "%s", call.args.text);
  return record;
}

void CallLog::Clear() {
  std::lock_guard<std::mutex> lock(mutex_);
  // Sequence numbers go on from where they were, so that a call still running when the log is
  // emptied finds nothing to complete.
  firstSequence_ += calls_.size();
  calls_.clear();
}

void CallLog::SetEnabled(bool enabled) {
  std::lock_guard<std::mutex> lock(mutex_);
  enabled_ = enabled;
}

size_t CallLog::CountCalls(std::string_view function) const {
  std::lock_guard<std::mutex> lock(mutex_);
  return static_cast<size_t>(std::count_if(calls_.begin(), calls_.end(), [&](const Call &call) {
    return function == call.args.function;
  }));
}

size_t CallLog::CountPropertyReads(uint32_t propertyId) const {
  std::lock_guard<std::mutex> lock(mutex_);
  return static_cast<size_t>(std::count_if(calls_.begin(), calls_.end(), [&](const Call &call) {
    const std::string_view function = call.args.function;
    return call.args.propertyId == propertyId &&
           (function == "kvGetPropertySize" || function == "kvGetProperty" ||
            function == "kvGetSubProperty");
  }));
}

}  // namespace nKvorSim
