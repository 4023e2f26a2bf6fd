// Frame calls: kvReadFrame, kvhdnReadFrame, kvWriteFrame, kvhdnReadFrameEthernet,
// kvhdnWriteFrameEthernet.
#include <memory>
#include <optional>

#include "driver.h"
#include "driver_call.h"
#include "driver_export.h"
#include "frame_reads.h"
#include "frame_writes.h"
#include "kvsvplatform.h"

using namespace nKvorSim;

namespace {

CallArgs FrameCall(const char *function, uint32_t session, uint32_t size1, uint32_t size2 = 0) {
  CallArgs args;
  args.function = function;
  args.object = session;
  args.size1 = size1;
  args.size2 = size2;
  return args;
}

// A frame call whose `body` works on the open session of `handle`; an error session answers with
// its status.
template <class Body>
Status RunFrameCall(const CallArgs &args, uint32_t handle, Body &&body) {
  return RunDriverCall(args, handle, [&](CallArgs &call) -> Status {
    Driver &driver = Driver::Instance();
    std::shared_ptr<Session> session;
    const Status status = driver.UseSession(handle, &session);
    if (status != 0) return status;
    return body(driver, *session, call);
  });
}

}  // namespace

KVOR_DRIVER_API int32_t kvReadFrame(uint32_t session, void *buffer, uint32_t size, double timeout,
                                    uint32_t *bytesReturned) {
  return RunFrameCall(FrameCall("kvReadFrame", session, size), session,
                      [&](Driver &driver, Session &target, const CallArgs &call) {
                        const ReadWait wait{timeout, driver.Blocked(), call.function};
                        return ReadRecords(target, buffer, size, std::nullopt, wait,
                                           bytesReturned);
                      });
}

KVOR_DRIVER_API int32_t kvhdnReadFrame(uint32_t session, void *buffer, uint32_t size,
                                       uint32_t numFrames, double timeout,
                                       uint32_t *bytesReturned) {
  return RunFrameCall(FrameCall("kvhdnReadFrame", session, size, numFrames), session,
                      [&](Driver &driver, Session &target, const CallArgs &call) {
                        const ReadWait wait{timeout, driver.Blocked(), call.function};
                        return ReadRecords(target, buffer, size, numFrames, wait, bytesReturned);
                      });
}

KVOR_DRIVER_API int32_t kvWriteFrame(uint32_t session, const void *buffer, uint32_t size,
                                     double timeout) {
  return RunFrameCall(FrameCall("kvWriteFrame", session, size), session,
                      [&](Driver &driver, Session &target, const CallArgs &) {
                        return WriteRecords(driver, target, buffer, size, timeout);
                      });
}

KVOR_DRIVER_API int32_t kvhdnReadFrameEthernet(uint32_t session, void *descriptors,
                                               uint32_t numFrames, int32_t *numReturned,
                                               double timeout) {
  return RunFrameCall(FrameCall("kvhdnReadFrameEthernet", session, numFrames), session,
                      [&](Driver &driver, Session &target, const CallArgs &call) {
                        const ReadWait wait{timeout, driver.Blocked(), call.function};
                        return ReadEthernetFrames(
                            target, static_cast<tEthernetReadDescriptor *>(descriptors),
                            numFrames, wait, numReturned);
                      });
}

KVOR_DRIVER_API int32_t kvhdnWriteFrameEthernet(uint32_t session, const void *descriptors,
                                                uint32_t numFrames, double timeout) {
  return RunFrameCall(FrameCall("kvhdnWriteFrameEthernet", session, numFrames), session,
                      [&](Driver &driver, Session &target, const CallArgs &) {
                        return WriteEthernetFrames(
                            driver, target,
                            static_cast<const tEthernetWriteDescriptor *>(descriptors), numFrames,
                            timeout);
                      });
}
