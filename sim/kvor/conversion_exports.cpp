// Conversion calls: kvConvertSignalsToFramesSinglePoint, kvConvertFramesToSignalsSinglePoint,
// kvConvertByteArrayToFramesSinglePoint, kvConvertFramesToByteArraySinglePoint.
#include "conversions.h"
#include "driver.h"
#include "driver_export.h"
#include "kvsvplatform.h"
#include "session_call.h"

using namespace nKvorSim;

KVOR_DRIVER_API int32_t kvConvertSignalsToFramesSinglePoint(uint32_t session, const double *values,
                                                            uint32_t valuesSize, void *frames,
                                                            uint32_t framesSize,
                                                            uint32_t *bytesReturned) {
  return RunSessionCall(
      SessionCallArgs("kvConvertSignalsToFramesSinglePoint", session, valuesSize, framesSize),
      session, [&](Driver &driver, const Session &target) {
        return ConvertSignalsToFrames(target, driver.Clock().Now(), values, valuesSize,
                                      tRecordsOut{frames, framesSize, bytesReturned});
      });
}

KVOR_DRIVER_API int32_t kvConvertFramesToSignalsSinglePoint(uint32_t session, const void *frames,
                                                            uint32_t framesSize, double *values,
                                                            uint32_t valuesSize,
                                                            uint64_t *timestamps,
                                                            uint32_t timestampsSize) {
  return RunSessionCall(
      SessionCallArgs("kvConvertFramesToSignalsSinglePoint", session, framesSize, valuesSize),
      session, [&](Driver &, const Session &target) {
        return ConvertFramesToSignals(target, frames, framesSize, values, valuesSize, timestamps,
                                      timestampsSize);
      });
}

KVOR_DRIVER_API int32_t kvConvertByteArrayToFramesSinglePoint(uint32_t session,
                                                              const uint8_t *bytes,
                                                              uint32_t bytesSize, void *frames,
                                                              uint32_t framesSize,
                                                              uint32_t *bytesReturned) {
  return RunSessionCall(
      SessionCallArgs("kvConvertByteArrayToFramesSinglePoint", session, bytesSize, framesSize),
      session, [&](Driver &driver, const Session &target) {
        return ConvertImageToFrames(target, driver.Clock().Now(), bytes, bytesSize,
                                    tRecordsOut{frames, framesSize, bytesReturned});
      });
}

KVOR_DRIVER_API int32_t kvConvertFramesToByteArraySinglePoint(uint32_t session, const void *frames,
                                                              uint32_t framesSize, uint8_t *bytes,
                                                              uint32_t bytesSize) {
  return RunSessionCall(
      SessionCallArgs("kvConvertFramesToByteArraySinglePoint", session, framesSize, bytesSize),
      session, [&](Driver &, const Session &target) {
        return ConvertFramesToImage(target, frames, framesSize, bytes, bytesSize);
      });
}
