// Signal calls: kvReadSignalSinglePoint, kvWriteSignalSinglePoint, kvhdnReadSignalWaveform,
// kvhdnWriteSignalWaveform, kvReadSignalXY, kvWriteSignalXY.
#include <memory>

#include "driver.h"
#include "driver_call.h"
#include "driver_export.h"
#include "kvsvplatform.h"
#include "signal_single_point.h"
#include "signal_waveform.h"
#include "signal_xy.h"

using namespace nKvorSim;

namespace {

CallArgs SignalCall(const char *function, uint32_t session, uint32_t size1, uint32_t size2 = 0) {
  CallArgs args;
  args.function = function;
  args.object = session;
  args.size1 = size1;
  args.size2 = size2;
  return args;
}

// A signal call whose `body` works on the open session of `handle`; an error session answers with
// its status.
template <class Body>
Status RunSignalCall(const CallArgs &args, uint32_t handle, Body &&body) {
  return RunDriverCall(args, handle, [&](CallArgs &) -> Status {
    Driver &driver = Driver::Instance();
    std::shared_ptr<Session> session;
    const Status status = driver.UseSession(handle, &session);
    if (status != 0) return status;
    return body(driver, *session);
  });
}

}  // namespace

KVOR_DRIVER_API int32_t kvReadSignalSinglePoint(uint32_t session, double *values,
                                                uint32_t valuesSize, uint64_t *timestamps,
                                                uint32_t timestampsSize) {
  return RunSignalCall(SignalCall("kvReadSignalSinglePoint", session, valuesSize, timestampsSize),
                       session, [&](Driver &driver, Session &target) {
                         return ReadSignalSinglePoint(target, driver.Clock().Now(), values,
                                                      valuesSize, timestamps, timestampsSize);
                       });
}

KVOR_DRIVER_API int32_t kvWriteSignalSinglePoint(uint32_t session, const double *values,
                                                 uint32_t valuesSize) {
  return RunSignalCall(SignalCall("kvWriteSignalSinglePoint", session, valuesSize), session,
                       [&](Driver &driver, Session &target) {
                         return WriteSignalSinglePoint(driver, target, values, valuesSize);
                       });
}

KVOR_DRIVER_API int32_t kvhdnReadSignalWaveform(uint32_t session, double timeout,
                                                uint64_t *startTime, double *interval,
                                                double *const *buffers, uint32_t bufferSize,
                                                uint32_t *numSamples) {
  return RunSignalCall(
      SignalCall("kvhdnReadSignalWaveform", session, bufferSize), session,
      [&](Driver &driver, Session &target) {
        const tWaveformRead read{startTime, interval, buffers, bufferSize, numSamples};
        return ReadSignalWaveform(driver, target, timeout, read);
      });
}

KVOR_DRIVER_API int32_t kvhdnWriteSignalWaveform(uint32_t session, double timeout,
                                                 const double *const *buffers,
                                                 uint32_t bufferSize) {
  return RunSignalCall(SignalCall("kvhdnWriteSignalWaveform", session, bufferSize), session,
                       [&](Driver &driver, Session &target) {
                         return WriteSignalWaveform(driver, target, timeout, buffers, bufferSize);
                       });
}

KVOR_DRIVER_API int32_t kvReadSignalXY(uint32_t session, const uint64_t *timeLimit, double *values,
                                       uint32_t valuesSize, uint64_t *timestamps,
                                       uint32_t timestampsSize, uint32_t *numPairs,
                                       uint32_t numPairsSize) {
  return RunSignalCall(SignalCall("kvReadSignalXY", session, valuesSize, numPairsSize), session,
                       [&](Driver &driver, Session &target) {
                         const tXYRegions regions{values,         valuesSize, timestamps,
                                                  timestampsSize, numPairs,   numPairsSize};
                         return ReadSignalXY(driver, target, timeLimit, regions);
                       });
}

KVOR_DRIVER_API int32_t kvWriteSignalXY(uint32_t session, double timeout, const double *values,
                                        uint32_t valuesSize, const uint64_t *timestamps,
                                        uint32_t timestampsSize, const uint32_t *numPairs,
                                        uint32_t numPairsSize) {
  return RunSignalCall(SignalCall("kvWriteSignalXY", session, valuesSize, numPairsSize), session,
                       [&](Driver &driver, Session &target) {
                         // The regions are only read: the driver never writes a caller's input.
                         const tXYRegions regions{
                             const_cast<double *>(values),       valuesSize,
                             const_cast<uint64_t *>(timestamps), timestampsSize,
                             const_cast<uint32_t *>(numPairs),   numPairsSize};
                         return WriteSignalXY(driver, target, timeout, regions);
                       });
}
