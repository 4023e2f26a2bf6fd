// Frame calls: kvReadFrame, kvhdnReadFrame, kvWriteFrame, kvhdnReadFrameEthernet,
// kvhdnWriteFrameEthernet.
#include <memory>
#include <optional>

#include "driver.h"
#include "driver_export.h"
#include "frame_reads.h"
#include "frame_writes.h"
#include "kvsvplatform.h"
#include "session_call.h"

using namespace nKvorSim;

KVOR_DRIVER_API int32_t kvReadFrame(uint32_t session, void *buffer, uint32_t size, double timeout,
                                    uint32_t *bytesReturned) {
  return RunSessionCall(SessionCallArgs("kvReadFrame", session, size), session,
                      [&](Driver &driver, Session &target, const CallArgs &call) {
                        const ReadWait wait{timeout, driver.Blocked(), call.function};
                        return ReadRecords(target, buffer, size, std::nullopt, wait,
                                           bytesReturned);
                      });
}

KVOR_DRIVER_API int32_t kvhdnReadFrame(uint32_t session, void *buffer, uint32_t size,
                                       uint32_t numFrames, double timeout,
                                       uint32_t *bytesReturned) {
  return RunSessionCall(SessionCallArgs("kvhdnReadFrame", session, size, numFrames), session,
                      [&](Driver &driver, Session &target, const CallArgs &call) {
                        const ReadWait wait{timeout, driver.Blocked(), call.function};
                        return ReadRecords(target, buffer, size, numFrames, wait, bytesReturned);
                      });
}

KVOR_DRIVER_API int32_t kvWriteFrame(uint32_t session, const void *buffer, uint32_t size,
                                     double timeout) {
  return RunSessionCall(SessionCallArgs("kvWriteFrame", session, size), session,
                      [&](Driver &driver, Session &target, const CallArgs &) {
                        return WriteRecords(driver, target, buffer, size, timeout);
                      });
}

KVOR_DRIVER_API int32_t kvhdnReadFrameEthernet(uint32_t session, void *descriptors,
                                               uint32_t numFrames, int32_t *numReturned,
                                               double timeout) {
  return RunSessionCall(SessionCallArgs("kvhdnReadFrameEthernet", session, numFrames), session,
                      [&](Driver &driver, Session &target, const CallArgs &call) {
                        const ReadWait wait{timeout, driver.Blocked(), call.function};
                        return ReadEthernetFrames(
                            target, static_cast<tEthernetReadDescriptor *>(descriptors),
                            numFrames, wait, numReturned);
                      });
}

KVOR_DRIVER_API int32_t kvhdnWriteFrameEthernet(uint32_t session, const void *descriptors,
                                                uint32_t numFrames, double timeout) {
  return RunSessionCall(SessionCallArgs("kvhdnWriteFrameEthernet", session, numFrames), session,
                      [&](Driver &driver, Session &target, const CallArgs &) {
                        return WriteEthernetFrames(
                            driver, target,
                            static_cast<const tEthernetWriteDescriptor *>(descriptors), numFrames,
                            timeout);
                      });
}
