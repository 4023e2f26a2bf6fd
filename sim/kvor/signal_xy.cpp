#include "signal_xy.h"

#include <algorithm>
#include <cmath>
#include <optional>
#include <vector>

#include "kvsim.h"
#include "kvsvplatform.h"
#include "signal_by_name.h"
#include "signal_fill.h"
#include "signal_outputs.h"

namespace nKvorSim {

namespace {

constexpr uint64_t kBytesPerValue = 8;

// Checks the regions against the session's signals and gives the length of one run. The pair
// counts must have room for every signal, the timestamps (when given, or when `timesNeeded`) for
// every value.
Status MeasureRuns(uint32_t count, const tXYRegions &regions, bool timesNeeded, uint32_t *run) {
  *run = 0;
  if (regions.numPairsSize < uint64_t{count} * 4) return kvsimErrBufferTooSmall;
  if (count == 0) return 0;
  if (regions.numPairs == nullptr) return kvsimErrNullPointer;
  *run = static_cast<uint32_t>(regions.valuesSize / (count * kBytesPerValue));
  if (*run == 0) return 0;
  if (regions.values == nullptr) return kvsimErrNullPointer;
  if (regions.timestamps == nullptr) return timesNeeded ? kvsimErrNullPointer : 0;
  if (regions.timestampsSize < uint64_t{*run} * count * kBytesPerValue) {
    return kvsimErrBufferTooSmall;
  }
  return 0;
}

void FillRuns(uint32_t count, uint32_t run, uint32_t fill, uint64_t now,
              const tXYRegions &regions) {
  for (uint32_t i = 0; i < count; ++i) {
    const uint32_t pairs = std::min(run, fill);
    for (uint32_t k = 0; k < pairs; ++k) {
      regions.values[i * run + k] = FillValue(i, k);
      regions.timestamps[i * run + k] = FillTime(now, k);
    }
    regions.numPairs[i] = pairs;
  }
}

}  // namespace

Status ReadSignalXY(Driver &driver, Session &session, const uint64_t *timeLimit,
                    const tXYRegions &regions) {
  const SessionDefinition &definition = session.Definition();
  if (definition.mode != kvMode_SignalInXY) return kvsimErrWrongMode;
  const uint32_t count = static_cast<uint32_t>(definition.items.size());
  uint32_t run = 0;
  const Status status = MeasureRuns(count, regions, true, &run);
  if (status != 0) return status;
  SignalInputs &inputs = session.SignalsIn();
  if (std::optional<uint32_t> fill = inputs.Fill()) {
    FillRuns(count, run, *fill, driver.Clock().Now(), regions);
    return 0;
  }
  std::optional<uint64_t> limit;
  if (timeLimit != nullptr) limit = *timeLimit;
  if (limit) {
    auto ready = [&] {
      if (driver.Clock().Now() >= *limit) return true;
      for (uint32_t i = 0; i < count; ++i) {
        if (inputs.CountPairs(i, limit, run) < run) return false;
      }
      return true;
    };
    if (!ready()) {
      const Status waited =
          session.Events().WaitUntil(ready, -1.0, driver.Blocked(), "kvReadSignalXY");
      if (waited != 0) return waited;
    }
  }
  for (uint32_t i = 0; i < count; ++i) {
    regions.numPairs[i] = inputs.TakePairs(i, limit, run, regions.values + uint64_t{i} * run,
                                           regions.timestamps + uint64_t{i} * run);
  }
  return 0;
}

Status WriteSignalXY(Driver &driver, Session &session, double timeout, const tXYRegions &regions) {
  const SessionDefinition &definition = session.Definition();
  if (definition.mode != kvMode_SignalOutXY) return kvsimErrWrongMode;
  if (std::isnan(timeout)) return kvsimErrInvalidArgument;
  const uint32_t count = static_cast<uint32_t>(definition.items.size());
  uint32_t run = 0;
  const Status status = MeasureRuns(count, regions, false, &run);
  if (status != 0) return status;
  for (uint32_t i = 0; i < count; ++i) {
    if (regions.numPairs[i] > run) return kvsimErrInvalidArgument;
  }
  const uint64_t now = driver.Clock().Now();
  std::vector<tSignalEvent> events;
  std::vector<std::optional<double>> last(count);
  for (uint32_t i = 0; i < count; ++i) {
    for (uint32_t k = 0; k < regions.numPairs[i]; ++k) {
      const uint64_t at = uint64_t{i} * run + k;
      const uint64_t time = regions.timestamps != nullptr ? regions.timestamps[at] : now;
      events.push_back(tSignalEvent{time, i, regions.values[at]});
      last[i] = regions.values[at];
    }
  }
  if (definition.signals == nullptr) {
    PublishLast(definition, last, now);
    return 0;
  }
  driver.Bus().TransmitStamped(session,
                               session.SignalsOut().Encode(*definition.signals, std::move(events)),
                               driver.Sessions());
  return 0;
}

}  // namespace nKvorSim
