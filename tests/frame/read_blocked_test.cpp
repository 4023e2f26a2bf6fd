// A frame read blocked in the driver is ended from another thread: by the host's end of the
// program, which runs the abort that the read registered, and by a clear of the session. The
// read then leaves the slot to its teardown and its arrays consistent.
#include <thread>

#include "frame/frame_read_support.h"
#include "support/session_helpers.h"

namespace {

using namespace kvsvtest;

class ReadBlocked : public FrameReadTest {
 protected:
  ReadBlocked() : FrameReadTest(kvsvReadFrameCAN, 32, 16) {}

  // Starts a read of two frames with no time limit while only one is on the bus, and returns
  // once it waits in the driver; a second read meanwhile finds the session busy.
  void StartBlockedRead() {
    EXPECT_EQ(kvCreateSession(":memory:", "", "", "CAN1", kvMode_FrameOutQueued, &writer_), 0);
    tBytes record;
    AppendRecord(record, 0x42, 0, 0, 0, 1, {1}, 24);
    Write(record);
    reading_ = std::thread([this] { status_ = Read(2, -1.0); });
    ASSERT_EQ(kvsimWaitBlocked("kvReadFrame", 1), 1);
    SvHandle otherFrames = nullptr, otherSpares = nullptr;
    EXPECT_EQ(kvsvReadFrameCAN(reader_, 1, &otherFrames, &otherSpares, 0.0), kvErrSessionBusy);
  }
  void ExpectEndedRead() {
    reading_.join();
    EXPECT_EQ(status_, kvsimErrSessionCleared);
    EXPECT_EQ(Count(frames_), 0);
    EXPECT_EQ(Count(spares_), 2);  // both payload handles kept for a later read
    EXPECT_FALSE(HasSlot(reader_));
  }

  std::thread reading_;
  kvsvStatus status_ = 0;
};

TEST_F(ReadBlocked, EndOfProgramAbortsTheSession) {
  reader_ = MakeSession("", kvMode_FrameInQueued, "CAN2");
  StartBlockedRead();
  SvsimEndReport report{};
  ASSERT_EQ(svsimEndProgram(&report), 0);
  EXPECT_EQ(report.cleanupsRun, 1);
  ExpectEndedRead();
}

TEST_F(ReadBlocked, ClearOfTheSessionEndsTheRead) {
  const tManualSession session = CreateManual("", kvMode_FrameInQueued, "CAN2");
  ASSERT_EQ(session.status, 0);
  reader_ = session.handle;
  StartBlockedRead();
  EXPECT_EQ(kvsvSessionClear(session.handle, session.reference), 0);
  ExpectEndedRead();
}

}  // namespace
