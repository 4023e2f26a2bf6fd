// Blocking frame reads: they end when all they asked for has arrived, when their time limit runs
// out, or when another thread clears their session.
#include <chrono>
#include <future>

#include "frame_test_support.h"

namespace {

using KvorFrameBlocking = KvorTest;
using Clock = std::chrono::steady_clock;

struct ReadResult {
  int32_t status;
  std::vector<Rec> recs;
};

std::future<ReadResult> ReadAsync(uint32_t session, uint32_t numFrames, double limit) {
  return std::async(std::launch::async, [=] {
    std::vector<uint8_t> buffer(4096);
    uint32_t got = 0xEEEE;
    const int32_t status = kvhdnReadFrame(session, buffer.data(), 4096, numFrames, limit, &got);
    return ReadResult{status, status == 0 ? Unpack(buffer.data(), got) : std::vector<Rec>{}};
  });
}

void Send(uint32_t writer, std::vector<Rec> recs) {
  const std::vector<uint8_t> bytes = Pack(recs, true);
  ASSERT_EQ(kvWriteFrame(writer, bytes.data(), static_cast<uint32_t>(bytes.size()), 0.0), 0);
}

TEST_F(KvorFrameBlocking, AReadWaitsUntilAllItAskedForHasArrived) {
  const uint32_t writer = Create("CAN1", kvMode_FrameOutStream);
  const uint32_t reader = Create("CAN2", kvMode_FrameInStream);
  auto reading = ReadAsync(reader, 3, -1.0);
  ASSERT_EQ(kvsimWaitBlocked("kvhdnReadFrame", 1), 1);
  Send(writer, {{1, {1}}, {2, {2}}});
  EXPECT_EQ(reading.wait_for(std::chrono::seconds(0)), std::future_status::timeout)
      << "two of three do not end the read";
  Send(writer, {{3, {3}}, {4, {4}}});
  const ReadResult result = reading.get();
  EXPECT_EQ(result.status, 0);
  ASSERT_EQ(result.recs.size(), 3u);
  EXPECT_EQ(result.recs[2].identifier, 3u);
  EXPECT_EQ(ReadU32(reader, kvPropSession_NumPend), 1u) << "the fourth stays queued";
}

TEST_F(KvorFrameBlocking, AFixedFormReadWaitsUntilItsBufferIsFull) {
  const uint32_t writer = Create("LIN2", kvMode_FrameOutStream);
  const uint32_t reader = Create("LIN1", kvMode_FrameInQueued);
  auto reading = std::async(std::launch::async, [=] {
    uint8_t buffer[60];
    uint32_t got = 0;
    const int32_t status = kvReadFrame(reader, buffer, sizeof buffer, 3600.0, &got);
    return status == 0 ? got : 0u;
  });
  ASSERT_EQ(kvsimWaitBlocked("kvReadFrame", 1), 1);
  Send(writer, {{1, {1}}});
  Send(writer, {{2, {2}}});
  EXPECT_EQ(reading.get(), 48u) << "room for two records of 24 in 60 bytes";
}

TEST_F(KvorFrameBlocking, AReadThatRunsOutOfTimeTakesWhatIsThere) {
  const uint32_t writer = Create("FlexRay1", kvMode_FrameOutStream);
  const uint32_t reader = Create("FlexRay2", kvMode_FrameInStream);
  Send(writer, {{7, {7}}});
  const auto start = Clock::now();
  const ReadResult result = ReadAsync(reader, 5, 0.05).get();
  const std::chrono::duration<double> waited = Clock::now() - start;
  EXPECT_GE(waited.count(), 0.05) << "the wait is real";
  EXPECT_EQ(result.status, 0);
  ASSERT_EQ(result.recs.size(), 1u);
  EXPECT_EQ(result.recs[0].identifier, 7u);
}

TEST_F(KvorFrameBlocking, ClearingTheSessionEndsItsBlockedReads) {
  const uint32_t reader = Create("CAN3", kvMode_FrameInQueued);
  const uint32_t enet = Create("ENET1", kvMode_FrameInStream);
  auto records = ReadAsync(reader, 1, -1.0);
  auto frames = std::async(std::launch::async, [=] {
    EthernetSlot slot{};
    int32_t returned = -7;
    const int32_t status = kvhdnReadFrameEthernet(enet, &slot, 1, &returned, 3600.0);
    return std::make_pair(status, returned);
  });
  ASSERT_EQ(kvsimWaitBlocked("kvhdnReadFrame", 1), 1);
  ASSERT_EQ(kvsimWaitBlocked("kvhdnReadFrameEthernet", 1), 1);
  ASSERT_EQ(kvClear(reader), 0);
  EXPECT_EQ(records.get().status, kvsimErrSessionCleared);
  EXPECT_EQ(frames.wait_for(std::chrono::seconds(0)), std::future_status::timeout)
      << "a read on another session goes on";
  ASSERT_EQ(kvClear(enet), 0);
  EXPECT_EQ(frames.get(), std::make_pair(int32_t{kvsimErrSessionCleared}, -7));
}

TEST_F(KvorFrameBlocking, AnEthernetReadWaitsForItsFrames) {
  const uint32_t writer = Create("ENET1", kvMode_FrameOutStream);
  const uint32_t reader = Create("ENET1", kvMode_FrameInQueued);
  auto reading = std::async(std::launch::async, [=] {
    uint8_t room[2][8] = {};
    EthernetSlot slots[2] = {Room(room[0], 8), Room(room[1], 8)};
    int32_t returned = 0;
    const int32_t status = kvhdnReadFrameEthernet(reader, slots, 2, &returned, -1.0);
    return status == 0 ? returned : status;
  });
  ASSERT_EQ(kvsimWaitBlocked("kvhdnReadFrameEthernet", 1), 1);
  const uint8_t bytes[] = {1, 2};
  const EthernetOut frames[] = {Out(bytes, 2), Out(bytes, 1)};
  ASSERT_EQ(kvhdnWriteFrameEthernet(writer, frames, 2, 0.0), 0);
  EXPECT_EQ(reading.get(), 2);
}

TEST_F(KvorFrameBlocking, AHeldReadParksBeforeItLooksAtTheQueue) {
  const uint32_t writer = Create("CAN1", kvMode_FrameOutStream);
  const uint32_t reader = Create("CAN2", kvMode_FrameInStream);
  ASSERT_EQ(kvsimHold("kvhdnReadFrame"), 0);
  auto reading = ReadAsync(reader, 2, 0.0);
  ASSERT_EQ(kvsimWaitParked("kvhdnReadFrame", 1), 1);
  Send(writer, {{1, {1}}, {2, {2}}});
  ASSERT_EQ(kvsimRelease("kvhdnReadFrame"), 0);
  EXPECT_EQ(reading.get().recs.size(), 2u) << "frames sent while parked are read";
}

}  // namespace
