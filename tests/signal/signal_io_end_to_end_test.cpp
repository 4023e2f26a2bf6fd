// Signal I/O end to end through the library's exports and the virtual bus: an output session on
// CAN1 made with tesla_can.dbc writes values, an input session on CAN2 reads them single point,
// as pairs with their timestamps and as a waveform, each value within its signal's resolution.
// Big-endian, signed and multiplexed signals are among them. Steady loops allocate nothing.
#include <gtest/gtest.h>

#include <vector>

#include "kvor/signal_test_support.h"
#include "signal/signal_test_support.h"
#include "support/slot_fixture.h"

namespace {

using namespace kvsvtest;

constexpr uint64_t kStart = 100000000;  // 10 s, raw
constexpr uint64_t kTick = 100000;      // 0.01 s, raw
constexpr int kSteadyRounds = 3;

// Sample k of a signal: its test value moved by k steps of its resolution.
double Sample(const tSignalCase &signal, uint32_t k) { return signal.value + k * signal.scale; }

class SignalEndToEnd : public SlotFixture {
 protected:
  void SetUp() override {
    SlotFixture::SetUp();
    kvsimSetClock(kStart);
  }
  uint32_t Tesla(const char *interfaceName, uint32_t mode) {
    const uint32_t session = TeslaSession(interfaceName, mode, ListOf(signals_));
    EXPECT_EQ(PlaceSlot(session), 0);
    return session;
  }
  // Host allocations, resizes and property reads from here on.
  void StartCounting() {
    svsimResetCounters();
    kvsimLogClear();
  }
  void ExpectNothingCounted() {
    EXPECT_EQ(svsimAllocCount() + svsimResizeCount() + svsimFreeCount(), 0u);
    EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), 0);
    EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_Mode), 0);
  }

  const std::vector<tSignalCase> &signals_ = TeslaSignals();
};

TEST_F(SignalEndToEnd, SinglePointValuesCrossTheBus) {
  const uint32_t writer = Tesla("CAN1", kvMode_SignalOutSinglePoint);
  const uint32_t reader = Tesla("CAN2", kvMode_SignalInSinglePoint);
  std::vector<double> written(signals_.size());
  SvHandle out = Keep(svsimMakeDoubleArray(written.data(), static_cast<int32_t>(written.size())));
  SvHandle in = nullptr;
  for (uint32_t round = 0; round <= kSteadyRounds; ++round) {
    if (round == 1) StartCounting();
    for (size_t i = 0; i < signals_.size(); ++i) {
      reinterpret_cast<double *>(static_cast<char *>(*out) + 8)[i] = Sample(signals_[i], round % 3);
    }
    ASSERT_EQ(kvsvWriteSignalSinglePoint(writer, out), 0);
    ASSERT_EQ(kvsvReadSignalSinglePoint(reader, &in), 0);
    const std::vector<double> read = ReadArray<double>(in);
    ASSERT_EQ(read.size(), signals_.size());
    for (size_t i = 0; i < signals_.size(); ++i) {
      EXPECT_NEAR(read[i], Sample(signals_[i], round % 3), signals_[i].scale / 2)
          << signals_[i].name << " round " << round;
    }
  }
  ExpectNothingCounted();
  svDisposeHandle(in);
}

TEST_F(SignalEndToEnd, PairsArriveWithTheirTimestamps) {
  const uint32_t writer = Tesla("CAN1", kvMode_SignalOutXY);
  const uint32_t reader = Tesla("CAN2", kvMode_SignalInXY);
  std::vector<tXY> pairs(signals_.size());
  for (size_t i = 0; i < signals_.size(); ++i) {
    for (uint32_t k = 0; k < 3; ++k) {
      pairs[i].times.push_back(kStart + k * kTick);
      pairs[i].values.push_back(Sample(signals_[i], k));
    }
  }
  SvHandle out = MakeClusters(pairs);
  SvHandle in = nullptr;
  for (int round = 0; round <= kSteadyRounds; ++round) {
    if (round == 1) StartCounting();
    ASSERT_EQ(kvsvWriteSignalXY(writer, out, 0.0), 0);
    // Two reads of runs of 2: the first takes the two oldest pairs, the second the last.
    for (uint32_t first : {0u, 2u}) {
      ASSERT_EQ(kvsvReadSignalXY(reader, 2, nullptr, &in), 0);
      const std::vector<tXY> read = ReadClusters(in);
      ASSERT_EQ(read.size(), signals_.size());
      const size_t taken = first == 0 ? 2 : 1;
      for (size_t i = 0; i < signals_.size(); ++i) {
        const auto from = pairs[i].times.begin() + first;
        EXPECT_EQ(read[i].times, std::vector<uint64_t>(from, from + taken)) << signals_[i].name;
        ASSERT_EQ(read[i].values.size(), taken) << signals_[i].name;
        for (size_t k = 0; k < taken; ++k) {
          EXPECT_NEAR(read[i].values[k], pairs[i].values[first + k], signals_[i].scale / 2)
              << signals_[i].name;
        }
      }
    }
  }
  ExpectNothingCounted();
  DisposeClusters(out);
  DisposeClusters(in);
}

TEST_F(SignalEndToEnd, WaveformsAreResampledOnTheReadersGrid) {
  const uint32_t writer = Tesla("CAN1", kvMode_SignalOutWaveform);
  const uint32_t reader = Tesla("CAN2", kvMode_SignalInWaveform);
  SetResampleRate(writer, 100.0);
  SetResampleRate(reader, 100.0);
  const int32_t count = static_cast<int32_t>(signals_.size());
  SvWaveformArray *out = svsimMakeWaveformArray(count, 3);
  for (int32_t i = 0; i < count; ++i) {
    const std::vector<double> samples = {Sample(signals_[i], 0), Sample(signals_[i], 1),
                                         Sample(signals_[i], 2)};
    ASSERT_EQ(svsimWaveformWrite(out, i, samples.data(), 3), 0);
  }
  SvWaveformArray *in = svsimMakeWaveformArray(0, 0);
  for (int round = 0; round <= kSteadyRounds; ++round) {
    if (round == 1) StartCounting();
    // Each write goes on where the last ended, and the reader's grid is as far as the clock.
    ASSERT_EQ(kvsvWriteSignalWaveform(writer, out, 0.0), 0);
    kvsimSetClock(kStart + (3 * round + 2) * kTick);
    ASSERT_EQ(kvsvReadSignalWaveform(reader, 3, in, 0.0), 0);
    ASSERT_EQ(svsimWaveformCount(in), count);
    for (int32_t i = 0; i < count; ++i) {
      std::vector<double> samples(3);
      SvTime t0{};
      double dt = 0;
      ASSERT_EQ(svsimWaveformRead(in, i, samples.data(), 3, &t0, &dt), 3);
      EXPECT_EQ(RawTime(t0), kStart + 3 * round * kTick);
      EXPECT_DOUBLE_EQ(dt, 0.01);
      for (uint32_t k = 0; k < 3; ++k) {
        EXPECT_NEAR(samples[k], Sample(signals_[i], k), signals_[i].scale / 2) << signals_[i].name;
      }
    }
  }
  ExpectNothingCounted();
  EXPECT_EQ(svsimWaveformLocked(in) + svsimWaveformLocked(out), 0);
  svsimDisposeWaveformArray(in);
  svsimDisposeWaveformArray(out);
}

}  // namespace
