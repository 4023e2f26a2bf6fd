#include "signal_single_point.h"

#include <vector>

#include "kvsim.h"
#include "kvsvplatform.h"
#include "signal_fill.h"
#include "signal_properties.h"

namespace nKvorSim {

namespace {

constexpr uint64_t kBytesPerSignal = 8;

bool ReadsSinglePoint(const SessionDefinition &definition) {
  if (definition.signals != nullptr) return IsSignalInputMode(definition.mode);
  return definition.mode == kvMode_SignalInSinglePoint;
}

}  // namespace

Status ReadSignalSinglePoint(Session &session, uint64_t now, double *values, uint32_t valuesSize,
                             uint64_t *timestamps, uint32_t timestampsSize) {
  const SessionDefinition &definition = session.Definition();
  if (!ReadsSinglePoint(definition)) return kvsimErrWrongMode;
  const uint32_t count = static_cast<uint32_t>(definition.items.size());
  const uint64_t needed = count * kBytesPerSignal;
  if (valuesSize < needed) return kvsimErrBufferTooSmall;
  if (timestamps != nullptr && timestampsSize < needed) return kvsimErrBufferTooSmall;
  if (count != 0 && values == nullptr) return kvsimErrNullPointer;
  if (session.SignalsIn().Fill()) {
    for (uint32_t i = 0; i < count; ++i) {
      values[i] = FillValue(i, 0);
      if (timestamps != nullptr) timestamps[i] = FillTime(now, 0);
    }
  } else if (definition.signals != nullptr) {
    session.SignalsIn().Latest(count, values, timestamps);
  } else {
    definition.network->Sample(definition.items, count, values, timestamps,
                               session.FlushedThrough());
  }
  return 0;
}

Status WriteSignalSinglePoint(Driver &driver, Session &session, const double *values,
                              uint32_t valuesSize) {
  const SessionDefinition &definition = session.Definition();
  if (definition.mode != kvMode_SignalOutSinglePoint) return kvsimErrWrongMode;
  const uint32_t count = static_cast<uint32_t>(definition.items.size());
  if (valuesSize < count * kBytesPerSignal) return kvsimErrBufferTooSmall;
  if (count != 0 && values == nullptr) return kvsimErrNullPointer;
  const uint64_t now = driver.Clock().Now();
  if (definition.signals == nullptr) {
    definition.network->Publish(definition.items, values, count, now);
    return 0;
  }
  std::vector<tSignalEvent> events;
  events.reserve(count);
  for (uint32_t i = 0; i < count; ++i) events.push_back(tSignalEvent{now, i, values[i]});
  driver.Bus().TransmitStamped(session, session.SignalsOut().Encode(*definition.signals, events),
                               driver.Sessions());
  return 0;
}

}  // namespace nKvorSim
