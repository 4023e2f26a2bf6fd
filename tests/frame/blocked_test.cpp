// Frame calls blocked in the driver and ended from another thread. A read ends by the host's end
// of the program, which runs the abort that the read registered, or by a clear of the session,
// and leaves the slot to its teardown and its arrays consistent; a write held in the driver keeps
// the session's guard until the program's abort.
#include <cmath>
#include <thread>

#include "frame/frame_support.h"
#include "support/session_helpers.h"

namespace {

using namespace kvsvtest;

using FrameBlocked = FrameTest;

TEST_F(FrameBlocked, BlockedReadEndsByTheProgramsEndOrAClearAndKeepsItsHandles) {
  for (const bool clear : {false, true}) {
    SCOPED_TRACE(clear ? "clear" : "end of program");
    Open(kCan);
    const tManualSession manual =
        clear ? CreateManual("", kvMode_FrameInQueued, "CAN2") : tManualSession{};
    ASSERT_EQ(manual.status, 0);
    if (clear) reader_ = manual.handle;
    // Two frames with no time limit while only one is on the bus.
    const tBytes record = Record(0x42, 0, 0, 0, 1, {1}, 24);
    ASSERT_EQ(kvWriteFrame(writer_, record.data(), 24, 0.0), 0);
    kvsvStatus status = 0;
    std::thread reading([&] { status = Read(2, -1.0); });
    ASSERT_EQ(kvsimWaitBlocked("kvReadFrame", 1), 1);
    EXPECT_EQ(Read(1), kvErrSessionBusy);
    if (clear) {
      EXPECT_EQ(kvsvSessionClear(manual.handle, manual.reference), 0);
    } else {
      SvsimEndReport report{};
      ASSERT_EQ(svsimEndProgram(&report), 0);
      EXPECT_EQ(report.cleanupsRun, 1);  // the abort that the read registered
    }
    reading.join();
    EXPECT_EQ(status, kvsimErrSessionCleared);
    EXPECT_EQ(Frames(), 0);
    EXPECT_EQ(Count(arrays_->spares), 2);  // both payload handles kept for a later read
    EXPECT_FALSE(HasSlot(reader_));
  }
}

TEST_F(FrameBlocked, BlockedWriteHoldsTheSessionUntilTheProgramsAbort) {
  const uint32_t session = MakeSession("", kvMode_FrameOutQueued, "CAN1");
  cClusterArray frames(1, kCan);
  frames.Payload(0, Pattern(8, 0));
  ASSERT_EQ(kvsimHold("kvWriteFrame"), 0);
  kvsvStatus status = 0;
  std::thread writer([&] { status = kvsvWriteFrameCAN(session, frames.handle(), NAN); });
  ASSERT_EQ(kvsimWaitParked("kvWriteFrame", 1), 1);
  EXPECT_EQ(kvsvWriteFrameCAN(session, frames.handle(), 0.0), kvErrSessionBusy);
  ASSERT_EQ(svsimEndProgram(nullptr), 0);
  writer.join();
  EXPECT_EQ(status, kvsimErrSessionCleared);
  EXPECT_EQ(Slot(session), nullptr);  // the program's abort ended the session
  kvsimRelease("kvWriteFrame");
}

}  // namespace
