// Signal reads blocked in the driver, ended by the host's end of the program, which runs the
// abort that the read registered: the read returns the driver's status, the slot goes, and the
// host data are left consistent (the waveform array unlocked and cut to what the driver gave).
#include <thread>

#include "signal/signal_test_support.h"
#include "support/session_helpers.h"
#include "support/slot_fixture.h"

namespace {

using namespace kvsvtest;
using SignalBlocked = SlotFixture;

void EndProgram() {
  SvsimEndReport report{};
  ASSERT_EQ(svsimEndProgram(&report), 0);
  EXPECT_EQ(report.cleanupsRun, 1);
}

TEST_F(SignalBlocked, AnXYReadWithATimeLimitEndsWithTheProgram) {
  const uint32_t session = MakeSession("A,B", kvMode_SignalInXY);
  SvHandle clusters = nullptr;
  kvsvStatus status = 0;
  const SvTime limit{0, 60};  // the clock stays at 0: nothing ends the wait but the abort
  std::thread reading([&] { status = kvsvReadSignalXY(session, 4, &limit, &clusters); });
  ASSERT_EQ(kvsimWaitBlocked("kvReadSignalXY", 1), 1);
  SvHandle other = nullptr;
  EXPECT_EQ(kvsvReadSignalXY(session, 4, &limit, &other), kvErrSessionBusy);
  EndProgram();
  reading.join();
  EXPECT_EQ(status, kvsimErrSessionCleared);
  EXPECT_FALSE(HasSlot(session));
  EXPECT_EQ(Count(clusters), 2);  // filled from the regions, as after any failed driver read
  DisposeClusters(clusters);
}

TEST_F(SignalBlocked, AWaveformReadEndsWithTheProgramAndUnlocksTheArray) {
  const uint32_t session = MakeSession("A,B", kvMode_SignalInWaveform);
  SvWaveformArray *waveforms = svsimMakeWaveformArray(0, 0);
  kvsvStatus status = 0;
  std::thread reading([&] { status = kvsvReadSignalWaveform(session, 5, waveforms, -1.0); });
  ASSERT_EQ(kvsimWaitBlocked("kvhdnReadSignalWaveform", 1), 1);
  EXPECT_EQ(svsimWaveformLocked(waveforms), 1);  // locked across the driver call
  EndProgram();
  reading.join();
  EXPECT_EQ(status, kvsimErrSessionCleared);
  EXPECT_FALSE(HasSlot(session));
  EXPECT_EQ(svsimWaveformLocked(waveforms), 0);
  EXPECT_EQ(svsimWaveformCount(waveforms), 2);
  EXPECT_EQ(svsimWaveformRead(waveforms, 0, nullptr, 0, nullptr, nullptr), 0);
  svsimDisposeWaveformArray(waveforms);
}

}  // namespace
