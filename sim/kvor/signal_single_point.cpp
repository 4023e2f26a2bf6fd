#include "signal_single_point.h"

#include "kvsim.h"
#include "kvsvplatform.h"

namespace nKvorSim {

namespace {

constexpr uint64_t kBytesPerSignal = 8;

}  // namespace

Status ReadSignalSinglePoint(const Session &session, double *values, uint32_t valuesSize,
                             uint64_t *timestamps, uint32_t timestampsSize) {
  const SessionDefinition &definition = session.Definition();
  if (definition.mode != kvMode_SignalInSinglePoint) return kvsimErrWrongMode;
  const size_t count = definition.items.size();
  const uint64_t needed = count * kBytesPerSignal;
  if (valuesSize < needed) return kvsimErrBufferTooSmall;
  if (timestamps != nullptr && timestampsSize < needed) return kvsimErrBufferTooSmall;
  if (count != 0 && values == nullptr) return kvsimErrNullPointer;
  definition.network->Sample(definition.items, count, values, timestamps, session.FlushedThrough());
  return 0;
}

Status WriteSignalSinglePoint(const Session &session, const double *values, uint32_t valuesSize,
                              uint64_t now) {
  const SessionDefinition &definition = session.Definition();
  if (definition.mode != kvMode_SignalOutSinglePoint) return kvsimErrWrongMode;
  const size_t count = definition.items.size();
  if (valuesSize < count * kBytesPerSignal) return kvsimErrBufferTooSmall;
  if (count != 0 && values == nullptr) return kvsimErrNullPointer;
  definition.network->Publish(definition.items, values, count, now);
  return 0;
}

}  // namespace nKvorSim
