// Single-point signal calls: kvReadSignalSinglePoint, kvWriteSignalSinglePoint.
#include <memory>

#include "driver.h"
#include "driver_call.h"
#include "driver_export.h"
#include "kvsvplatform.h"
#include "signal_single_point.h"

using namespace nKvorSim;

KVOR_DRIVER_API int32_t kvReadSignalSinglePoint(uint32_t session, double *values,
                                                uint32_t valuesSize, uint64_t *timestamps,
                                                uint32_t timestampsSize) {
  CallArgs args;
  args.function = "kvReadSignalSinglePoint";
  args.object = session;
  args.size1 = valuesSize;
  args.size2 = timestampsSize;
  return RunDriverCall(args, session, [&](CallArgs &) -> Status {
    std::shared_ptr<Session> target;
    const Status status = Driver::Instance().UseSession(session, &target);
    if (status != 0) return status;
    return ReadSignalSinglePoint(*target, values, valuesSize, timestamps, timestampsSize);
  });
}

KVOR_DRIVER_API int32_t kvWriteSignalSinglePoint(uint32_t session, const double *values,
                                                 uint32_t valuesSize) {
  CallArgs args;
  args.function = "kvWriteSignalSinglePoint";
  args.object = session;
  args.size1 = valuesSize;
  return RunDriverCall(args, session, [&](CallArgs &) -> Status {
    Driver &driver = Driver::Instance();
    std::shared_ptr<Session> target;
    const Status status = driver.UseSession(session, &target);
    if (status != 0) return status;
    return WriteSignalSinglePoint(*target, values, valuesSize, driver.Clock().Now());
  });
}
