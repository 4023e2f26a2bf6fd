// The record of driver calls, in the order in which they entered the driver. A call is recorded
// on entry, so that a call parked or blocked inside the driver is visible, and completed with its
// result when it returns.
#ifndef KVOR_SIM_CALL_LOG_H
#define KVOR_SIM_CALL_LOG_H

#include <cstddef>
#include <cstdint>
#include <deque>
#include <mutex>
#include <optional>
#include <string_view>

#include "driver_status.h"
#include "kvsim.h"

namespace nKvorSim {

// What a call is recorded with; the meaning of each field per function is told in kvsim.h.
struct CallArgs {
  const char *function = "";
  uint32_t object = 0;
  uint32_t propertyId = 0;
  uint32_t size1 = 0;
  uint32_t size2 = 0;
  char text[64] = {};  // fixed: exports fill it before any exception handler is in place
};

class CallLog {
 public:
  // The latest calls kept; a bound so that a long benchmark cannot exhaust memory.
  static constexpr size_t kCapacity = size_t{1} << 20;

  // Records a call on entry, unless the log is off; the result is its sequence number for
  // Complete.
  uint64_t Append(const CallArgs &args);
  // Fills in the outcome; a call dropped from the log meanwhile is left alone.
  void Complete(uint64_t sequence, uint32_t object, Status status);

  size_t Count() const;
  std::optional<kvsimCallRecord> Entry(size_t index) const;
  void Clear();
  // While off, calls enter no record, so that a benchmark pays nothing for the log.
  void SetEnabled(bool enabled);

  size_t CountCalls(std::string_view function) const;
  // Reads of a property through kvGetPropertySize, kvGetProperty and kvGetSubProperty.
  size_t CountPropertyReads(uint32_t propertyId) const;

 private:
  struct Call {
    CallArgs args;
    Status status;
  };

  mutable std::mutex mutex_;
  std::deque<Call> calls_;
  uint64_t firstSequence_ = 0;  // sequence number of calls_.front()
  bool enabled_ = true;
};

}  // namespace nKvorSim

#endif
