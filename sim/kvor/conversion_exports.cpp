// Conversion calls: kvConvertSignalsToFramesSinglePoint, kvConvertFramesToSignalsSinglePoint,
// kvConvertByteArrayToFramesSinglePoint, kvConvertFramesToByteArraySinglePoint.
#include <memory>

#include "conversions.h"
#include "driver.h"
#include "driver_call.h"
#include "driver_export.h"
#include "kvsvplatform.h"

using namespace nKvorSim;

namespace {

CallArgs ConversionCall(const char *function, uint32_t session, uint32_t size1, uint32_t size2) {
  CallArgs args;
  args.function = function;
  args.object = session;
  args.size1 = size1;
  args.size2 = size2;
  return args;
}

// A conversion whose `body` works on the open session of `handle`; an error session answers with
// its status.
template <class Body>
Status RunConversion(const CallArgs &args, uint32_t handle, Body &&body) {
  return RunDriverCall(args, handle, [&](CallArgs &) -> Status {
    Driver &driver = Driver::Instance();
    std::shared_ptr<Session> session;
    const Status status = driver.UseSession(handle, &session);
    if (status != 0) return status;
    return body(driver, *session);
  });
}

}  // namespace

KVOR_DRIVER_API int32_t kvConvertSignalsToFramesSinglePoint(uint32_t session, const double *values,
                                                            uint32_t valuesSize, void *frames,
                                                            uint32_t framesSize,
                                                            uint32_t *bytesReturned) {
  return RunConversion(
      ConversionCall("kvConvertSignalsToFramesSinglePoint", session, valuesSize, framesSize),
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
  return RunConversion(
      ConversionCall("kvConvertFramesToSignalsSinglePoint", session, framesSize, valuesSize),
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
  return RunConversion(
      ConversionCall("kvConvertByteArrayToFramesSinglePoint", session, bytesSize, framesSize),
      session, [&](Driver &driver, const Session &target) {
        return ConvertImageToFrames(target, driver.Clock().Now(), bytes, bytesSize,
                                    tRecordsOut{frames, framesSize, bytesReturned});
      });
}

KVOR_DRIVER_API int32_t kvConvertFramesToByteArraySinglePoint(uint32_t session, const void *frames,
                                                              uint32_t framesSize, uint8_t *bytes,
                                                              uint32_t bytesSize) {
  return RunConversion(
      ConversionCall("kvConvertFramesToByteArraySinglePoint", session, framesSize, bytesSize),
      session, [&](Driver &, const Session &target) {
        return ConvertFramesToImage(target, frames, framesSize, bytes, bytesSize);
      });
}
