// Signal reads from several threads. A second caller never waits on a session in use: it fails at
// once. A read blocked in the driver ends with the host's end of the program, which runs the abort
// that the read registered: the read returns the driver's status, the slot goes, and the host data
// are left consistent.
#include <atomic>
#include <thread>

#include "signal/signal_test_support.h"
#include "support/session_helpers.h"

namespace {

using namespace kvsvtest;

TEST_F(SignalTest, RacingReadersGetValuesOrBusyAndNothingElse) {
  const uint32_t session = MakeSession("A,B,C,D", kvMode_SignalInSinglePoint);
  const std::vector<double> published = {1, 2, 3, 4};
  ASSERT_EQ(kvsimSetSignalValues(session, published.data(), 4), 4);
  std::atomic<int> successes{0}, unexpected{0};
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([&] {
      SvHandle values = nullptr;
      for (int i = 0; i < 300; ++i) {
        const kvsvStatus status = kvsvReadSignalSinglePoint(session, &values);
        successes += status == 0;
        unexpected +=
            status == 0 ? ReadArray<double>(values) != published : status != kvErrSessionBusy;
      }
      svDisposeHandle(values);
    });
  }
  for (std::thread &t : threads) t.join();
  EXPECT_EQ(unexpected.load(), 0);
  EXPECT_GT(successes.load(), 0);
}

// Ends the program while `reading` is blocked in the driver: the host runs the one abort that the
// read registered, the read returns the driver's status and the slot is gone.
void EndProgramUnderRead(std::thread &reading, const kvsvStatus &status, uint32_t session) {
  SvsimEndReport report{};
  ASSERT_EQ(svsimEndProgram(&report), 0);
  EXPECT_EQ(report.cleanupsRun, 1);
  reading.join();
  EXPECT_EQ(status, kvsimErrSessionCleared);
  EXPECT_FALSE(HasSlot(session));
}

// An XY read with a time limit: the clock stays at 0, so nothing else ends its wait. A second
// caller meanwhile is refused.
TEST_F(SignalTest, AReadBlockedInTheDriverEndsWithTheProgram) {
  const uint32_t session = MakeSession("A,B", kvMode_SignalInXY);
  const SvTime limit{0, 60};
  kvsvStatus status = 0;
  std::thread reading([&] { status = kvsvReadSignalXY(session, 4, &limit, &clusters_); });
  ASSERT_EQ(kvsimWaitBlocked("kvReadSignalXY", 1), 1);
  EXPECT_EQ(kvsvReadSignalXY(session, 4, &limit, &clusters_), kvErrSessionBusy);
  EndProgramUnderRead(reading, status, session);
  EXPECT_EQ(Count(clusters_), 2);  // filled from the regions, as after any failed driver read
}

// A waveform read keeps the host's array locked across the driver call: the end of the program
// must leave it unlocked and cut to what the driver gave.
TEST_F(SignalTest, AWaveformReadEndsWithTheProgramAndUnlocksTheArray) {
  const uint32_t session = MakeSession("A,B", kvMode_SignalInWaveform);
  SvWaveformArray *waveforms = svsimMakeWaveformArray(0, 0);
  kvsvStatus status = 0;
  std::thread reading([&] { status = kvsvReadSignalWaveform(session, 5, waveforms, -1.0); });
  ASSERT_EQ(kvsimWaitBlocked("kvhdnReadSignalWaveform", 1), 1);
  EXPECT_EQ(svsimWaveformLocked(waveforms), 1);
  EndProgramUnderRead(reading, status, session);
  EXPECT_EQ(svsimWaveformLocked(waveforms), 0);
  EXPECT_EQ(svsimWaveformCount(waveforms), 2);
  svsimDisposeWaveformArray(waveforms);
}

}  // namespace
