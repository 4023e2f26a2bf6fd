// Signal reads that wait: an XY read with a time limit until every run can be filled or the clock
// reaches the limit, a waveform read with a time limit until the clock has reached its samples.
// (The library's tests end both with a clear.)
#include <future>
#include <vector>

#include "signal_test_support.h"

namespace {

using namespace kvsvtest;
using KvorSignalBlocking = KvorTest;

struct tXYResult {
  int32_t status;
  std::vector<uint32_t> counts;
};

std::future<tXYResult> ReadXYAsync(uint32_t session, uint32_t count, uint32_t run, uint64_t limit) {
  return std::async(std::launch::async, [=] {
    std::vector<double> values(count * run);
    std::vector<uint64_t> times(count * run);
    std::vector<uint32_t> counts(count, 0xEEEE);
    const uint32_t bytes = count * run * 8;
    const int32_t status = kvReadSignalXY(session, &limit, values.data(), bytes, times.data(),
                                          bytes, counts.data(), count * 4);
    return tXYResult{status, counts};
  });
}

std::future<int64_t> ReadWaveformAsync(uint32_t session, uint32_t samples) {
  return std::async(std::launch::async, [=]() -> int64_t {
    std::vector<double> buffer(samples);
    double *buffers[] = {buffer.data()};
    uint64_t start = 0;
    double interval = 0;
    uint32_t got = 0;
    const int32_t status =
        kvhdnReadSignalWaveform(session, -1.0, &start, &interval, buffers, samples * 8, &got);
    return status == 0 ? int64_t{got} : int64_t{status};
  });
}

void WritePair(uint32_t writer, double value, uint64_t time) {
  const uint32_t one = 1;
  ASSERT_EQ(kvWriteSignalXY(writer, 0.0, &value, 8, &time, 8, &one, 4), 0);
}

TEST_F(KvorSignalBlocking, AnXYReadWithALimitWaitsForFullRuns) {
  const uint32_t writer = TeslaSession("CAN1", kvMode_SignalOutXY, "DI_motorRPM");
  const uint32_t reader = TeslaSession("CAN2", kvMode_SignalInXY, "DI_motorRPM");
  auto reading = ReadXYAsync(reader, 1, 2, 100);
  ASSERT_EQ(kvsimWaitBlocked("kvReadSignalXY", 1), 1);
  WritePair(writer, 1, 10);
  WritePair(writer, 2, 200);  // past the limit: it does not count
  EXPECT_EQ(reading.wait_for(std::chrono::seconds(0)), std::future_status::timeout);
  WritePair(writer, 3, 90);
  const tXYResult result = reading.get();
  EXPECT_EQ(result.status, 0);
  EXPECT_EQ(result.counts, std::vector<uint32_t>{2});
}

TEST_F(KvorSignalBlocking, TheClockReachingTheLimitEndsAnXYRead) {
  const uint32_t writer = TeslaSession("CAN1", kvMode_SignalOutXY, "DI_motorRPM");
  const uint32_t reader = TeslaSession("CAN2", kvMode_SignalInXY, "DI_motorRPM");
  auto reading = ReadXYAsync(reader, 1, 4, 100);
  ASSERT_EQ(kvsimWaitBlocked("kvReadSignalXY", 1), 1);
  WritePair(writer, 1, 10);
  kvsimSetClock(99);
  EXPECT_EQ(reading.wait_for(std::chrono::seconds(0)), std::future_status::timeout);
  kvsimSetClock(100);
  EXPECT_EQ(reading.get().counts, std::vector<uint32_t>{1});
}

TEST_F(KvorSignalBlocking, AWaveformReadWaitsForTheClockToReachItsSamples) {
  const uint32_t reader = TeslaSession("CAN2", kvMode_SignalInWaveform, "DI_motorRPM");
  SetResampleRate(reader, 10.0);  // instants 0, 0.1 s, 0.2 s, ...
  auto reading = ReadWaveformAsync(reader, 3);
  ASSERT_EQ(kvsimWaitBlocked("kvhdnReadSignalWaveform", 1), 1);
  kvsimSetClock(1000000);  // two instants
  EXPECT_EQ(reading.wait_for(std::chrono::seconds(0)), std::future_status::timeout);
  kvsimAdvanceClock(1000000);
  EXPECT_EQ(reading.get(), 3);
}

}  // namespace
