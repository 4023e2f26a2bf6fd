// Signal calls: kvReadSignalSinglePoint, kvWriteSignalSinglePoint, kvhdnReadSignalWaveform,
// kvhdnWriteSignalWaveform, kvReadSignalXY, kvWriteSignalXY.
#include "driver.h"
#include "driver_export.h"
#include "kvsvplatform.h"
#include "session_call.h"
#include "signal_single_point.h"
#include "signal_waveform.h"
#include "signal_xy.h"

using namespace nKvorSim;

KVOR_DRIVER_API int32_t kvReadSignalSinglePoint(uint32_t session, double *values,
                                                uint32_t valuesSize, uint64_t *timestamps,
                                                uint32_t timestampsSize) {
  return RunSessionCall(SessionCallArgs("kvReadSignalSinglePoint", session, valuesSize, timestampsSize),
                       session, [&](Driver &driver, Session &target) {
                         return ReadSignalSinglePoint(target, driver.Clock().Now(), values,
                                                      valuesSize, timestamps, timestampsSize);
                       });
}

KVOR_DRIVER_API int32_t kvWriteSignalSinglePoint(uint32_t session, const double *values,
                                                 uint32_t valuesSize) {
  return RunSessionCall(SessionCallArgs("kvWriteSignalSinglePoint", session, valuesSize), session,
                       [&](Driver &driver, Session &target) {
                         return WriteSignalSinglePoint(driver, target, values, valuesSize);
                       });
}

KVOR_DRIVER_API int32_t kvhdnReadSignalWaveform(uint32_t session, double timeout,
                                                uint64_t *startTime, double *interval,
                                                double *const *buffers, uint32_t bufferSize,
                                                uint32_t *numSamples) {
  return RunSessionCall(
      SessionCallArgs("kvhdnReadSignalWaveform", session, bufferSize), session,
      [&](Driver &driver, Session &target) {
        const tWaveformRead read{startTime, interval, buffers, bufferSize, numSamples};
        return ReadSignalWaveform(driver, target, timeout, read);
      });
}

KVOR_DRIVER_API int32_t kvhdnWriteSignalWaveform(uint32_t session, double timeout,
                                                 const double *const *buffers,
                                                 uint32_t bufferSize) {
  return RunSessionCall(SessionCallArgs("kvhdnWriteSignalWaveform", session, bufferSize), session,
                       [&](Driver &driver, Session &target) {
                         return WriteSignalWaveform(driver, target, timeout, buffers, bufferSize);
                       });
}

KVOR_DRIVER_API int32_t kvReadSignalXY(uint32_t session, const uint64_t *timeLimit, double *values,
                                       uint32_t valuesSize, uint64_t *timestamps,
                                       uint32_t timestampsSize, uint32_t *numPairs,
                                       uint32_t numPairsSize) {
  return RunSessionCall(SessionCallArgs("kvReadSignalXY", session, valuesSize, numPairsSize), session,
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
  return RunSessionCall(SessionCallArgs("kvWriteSignalXY", session, valuesSize, numPairsSize), session,
                       [&](Driver &driver, Session &target) {
                         // The regions are only read: the driver never writes a caller's input.
                         const tXYRegions regions{
                             const_cast<double *>(values),       valuesSize,
                             const_cast<uint64_t *>(timestamps), timestampsSize,
                             const_cast<uint32_t *>(numPairs),   numPairsSize};
                         return WriteSignalXY(driver, target, timeout, regions);
                       });
}
