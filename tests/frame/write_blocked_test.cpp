// A CAN write blocked in the driver: it keeps the session's guard, and the abort that its time
// limit registered ends it when the host stops the program.
#include <cmath>
#include <thread>

#include "frame/frame_write_support.h"

namespace {

using namespace kvsvtest;

using WriteBlocked = SlotFixture;

TEST_F(WriteBlocked, BlockedWriteHoldsTheSessionUntilTheProgramsAbort) {
  const uint32_t session = MakeSession("", kvMode_FrameOutQueued, "CAN1");
  cClusterArray frames(1, 32, 16);
  frames.Payload(0, Pattern(8, 0));
  ASSERT_EQ(kvsimHold("kvWriteFrame"), 0);
  kvsvStatus status = 0;
  std::thread writer([&] { status = kvsvWriteFrameCAN(session, frames.handle(), NAN); });
  ASSERT_EQ(kvsimWaitParked("kvWriteFrame", 1), 1);
  EXPECT_EQ(kvsvWriteFrameCAN(session, frames.handle(), 0.0), kvErrSessionBusy);
  SvCleanupProc procedure = nullptr;
  uint64_t argument = 0;
  int32_t mode = 0;
  ASSERT_EQ(svsimLastCleanup(&procedure, &argument, &mode), 1);
  EXPECT_EQ(procedure, &kvsvSessionAbort);
  EXPECT_EQ(argument, session);
  EXPECT_EQ(mode, 6);
  ASSERT_EQ(svsimEndProgram(nullptr), 0);
  writer.join();
  EXPECT_EQ(status, kvsimErrSessionCleared);
  EXPECT_EQ(Slot(session), nullptr);  // the abort ended the session
  kvsimRelease("kvWriteFrame");
}

}  // namespace
