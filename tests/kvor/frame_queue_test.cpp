// Input queues: their length, what a read takes from them, and the controls that fill them or
// stand in for them.
#include <algorithm>
#include <cmath>
#include <iterator>

#include "frame_test_support.h"

namespace {

using KvorFrameQueue = KvorTest;

std::vector<uint8_t> Numbered(uint32_t count, uint32_t first = 0) {
  std::vector<Rec> recs;
  for (uint32_t i = 0; i < count; ++i) recs.push_back({first + i, {static_cast<uint8_t>(i)}});
  return Pack(recs, true);
}

std::vector<uint32_t> Identifiers(const std::vector<Rec> &recs) {
  std::vector<uint32_t> ids;
  for (const Rec &r : recs) ids.push_back(r.identifier);
  return ids;
}

TEST_F(KvorFrameQueue, AQueueHoldsItsSizeInRecordsAndDropsWhatDoesNotFit) {
  const uint32_t writer = Create("CAN1", kvMode_FrameOutStream);
  const uint32_t small = Create("CAN2", kvMode_FrameInQueued);
  const uint32_t roomy = Create("CAN2", kvMode_FrameInStream);
  SetU32(small, kvPropSession_QueueSize, 5 * 24 + 23);
  const std::vector<uint8_t> eight = Numbered(8);
  ASSERT_EQ(kvWriteFrame(writer, eight.data(), static_cast<uint32_t>(eight.size()), 0.0), 0);
  EXPECT_EQ(ReadU32(small, kvPropSession_NumPend), 5u);
  EXPECT_EQ(kvsimDroppedFrames(small), 3);
  EXPECT_EQ(ReadU32(roomy, kvPropSession_NumPend), 8u);
  EXPECT_EQ(kvsimDroppedFrames(roomy), 0);
  EXPECT_EQ(Identifiers(Drain(small)), (std::vector<uint32_t>{0, 1, 2, 3, 4})) << "oldest kept";

  SetU32(small, kvPropSession_PayldLenMax, 64);  // now 143 bytes hold one record of 80
  ASSERT_EQ(kvWriteFrame(writer, eight.data(), 48, 0.0), 0);
  EXPECT_EQ(ReadU32(small, kvPropSession_NumPend), 1u);
  EXPECT_EQ(kvsimDroppedFrames(small), 4);
  ASSERT_EQ(kvFlush(roomy), 0);
  EXPECT_EQ(ReadU32(roomy, kvPropSession_NumPend), 0u) << "a flush empties the queue";
  EXPECT_TRUE(Drain(roomy).empty());
  EXPECT_EQ(kvsimDroppedFrames(writer), -1) << "an output session has no queue";
}

TEST_F(KvorFrameQueue, AReadTakesOnlyWholeRecords) {
  const uint32_t writer = Create("FlexRay1", kvMode_FrameOutStream);
  const uint32_t reader = Create("FlexRay2", kvMode_FrameInStream);
  const std::vector<uint8_t> bytes = Pack({{1, Pattern(12, 0)}, {2, {}}, {3, Pattern(12, 1)}});
  ASSERT_EQ(bytes.size(), 32u + 24 + 32);
  ASSERT_EQ(kvWriteFrame(writer, bytes.data(), static_cast<uint32_t>(bytes.size()), 0.0), 0);
  std::vector<uint8_t> buffer(100, 0xEE);
  uint32_t got = 0;
  ASSERT_EQ(kvReadFrame(reader, buffer.data(), 55, 0.0, &got), 0);
  EXPECT_EQ(got, 32u) << "the second record would end past 55";
  EXPECT_EQ(buffer[32], 0xEE) << "nothing written past the records";
  ASSERT_EQ(kvhdnReadFrame(reader, buffer.data(), 100, 1, 0.0, &got), 0);
  EXPECT_EQ(got, 24u) << "at most numFrames";
  ASSERT_EQ(kvhdnReadFrame(reader, buffer.data(), 100, 0, 0.0, &got), 0);
  EXPECT_EQ(got, 0u);
  EXPECT_EQ(Identifiers(Drain(reader)), std::vector<uint32_t>{3});
}

TEST_F(KvorFrameQueue, QueuedRecordsComeBackAsTheyWereGiven) {
  const uint32_t reader = Create("CAN1", kvMode_FrameInQueued);
  SetU32(reader, kvPropSession_IntfCanIoMode, 1);
  const std::vector<uint8_t> golden = Pack({
      {0x20000001, Pattern(256, 5), 0xC0, 0x85, 0xF8, 0x0102030405060708ull},
      {0xE0000002, {}, 0xFF, 0xFF, 0xFF, 1},
      {0x00000003, Pattern(64, 9), 0x07, 0x20, 0x00, 0},
  });
  ASSERT_EQ(golden.size(), 272u + 24 + 80);
  EXPECT_EQ(kvsimQueueFrames(reader, golden.data(), static_cast<uint32_t>(golden.size())), 3);
  std::vector<uint8_t> buffer(golden.size() + 8);
  uint32_t got = 0;
  ASSERT_EQ(kvReadFrame(reader, buffer.data(), static_cast<uint32_t>(buffer.size()), 0.0, &got), 0);
  ASSERT_EQ(got, golden.size());
  EXPECT_TRUE(std::equal(golden.begin(), golden.end(), buffer.begin())) << "byte for byte";

  EXPECT_EQ(kvsimQueueFrames(reader, golden.data(), 271), -1) << "a record cut short";
  std::vector<uint8_t> quirk(16, 0);  // 0x7F9 bytes: a length whose record size rounds to 16
  quirk[12] = 0xC0;
  quirk[14] = 7;
  quirk[15] = 0xF9;
  EXPECT_EQ(kvsimQueueFrames(reader, quirk.data(), 16), -1) << "the record cannot hold them";
  EXPECT_EQ(kvsimQueueFrames(Create("CAN1", kvMode_FrameOutQueued), golden.data(), 272), -1);
  EXPECT_EQ(ReadU32(reader, kvPropSession_NumPend), 0u) << "a refused buffer queues nothing";
}

TEST_F(KvorFrameQueue, AReadStreamIsCopiedVerbatimOnceOrOnEveryRead) {
  const uint32_t reader = Create("CAN1", kvMode_FrameInStream);
  // A 24-byte record that claims 12 payload bytes, and a variable-form one of 12.
  std::vector<uint8_t> stream = Pack({{0x11, Pattern(8, 1)}}, true);
  stream[15] = 12;
  const std::vector<uint8_t> second = Pack({{0x22, Pattern(12, 2)}});
  stream.insert(stream.end(), second.begin(), second.end());
  const uint32_t size = static_cast<uint32_t>(stream.size());
  ASSERT_EQ(kvsimQueueFrames(reader, Numbered(1, 0x99).data(), 24), 1);

  ASSERT_EQ(kvsimSetReadStream(reader, stream.data(), size, 0), 0);
  std::vector<uint8_t> buffer(200, 0);
  uint32_t got = 0;
  ASSERT_EQ(kvReadFrame(reader, buffer.data(), 200, 0.0, &got), 0);
  ASSERT_EQ(got, size);
  EXPECT_TRUE(std::equal(stream.begin(), stream.end(), buffer.begin()));
  ASSERT_EQ(kvReadFrame(reader, buffer.data(), 200, 0.0, &got), 0);
  EXPECT_EQ(got, 24u) << "served once; then the queue again";
  EXPECT_EQ(buffer[8], 0x99);

  ASSERT_EQ(kvsimSetReadStream(reader, stream.data(), size, 1), 0);
  for (uint32_t want : {10u, 200u, 0u}) {
    std::fill(buffer.begin(), buffer.end(), 0);
    ASSERT_EQ(kvReadFrame(reader, buffer.data(), want, 0.0, &got), 0);
    EXPECT_EQ(got, std::min(want, size)) << "as many bytes as fit";
    EXPECT_TRUE(std::equal(buffer.begin(), buffer.begin() + got, stream.begin()));
  }
  ASSERT_EQ(kvhdnReadFrame(reader, buffer.data(), 200, 1, 0.0, &got), 0);
  EXPECT_EQ(got, 32u) << "the first record, walked by its claimed 12 bytes";
  ASSERT_EQ(kvhdnReadFrame(reader, buffer.data(), 200, 2, 0.0, &got), 0);
  EXPECT_EQ(got, size) << "a walk past the end stops at the end";
  EXPECT_EQ(kvsimSetReadStream(Create("CAN1", kvMode_FrameOutStream), stream.data(), 1, 1), -1);
}

using KvorFrameCalls = KvorTest;

TEST_F(KvorFrameCalls, ReadsAndWritesNeedTheirModeProtocolAndArguments) {
  uint8_t buffer[24];
  uint32_t got = 0;
  for (uint32_t mode = 0; mode <= 12; ++mode) {
    const uint32_t session = Create("CAN1", mode, "0x1");
    const bool input = mode >= kvMode_FrameInStream && mode <= kvMode_FrameInSinglePoint;
    EXPECT_EQ(kvReadFrame(session, buffer, 24, 0.0, &got), input ? 0 : kvsimErrWrongMode) << mode;
    EXPECT_EQ(kvhdnReadFrame(session, buffer, 24, 1, 0.0, &got), input ? 0 : kvsimErrWrongMode);
  }
  const uint32_t can = Create("CAN1", kvMode_FrameInStream);
  const uint32_t writer = Create("CAN3", kvMode_FrameOutSinglePoint);
  const uint32_t reader = Create("CAN4", kvMode_FrameInStream);
  const uint32_t enetIn = Create("ENET1", kvMode_FrameInStream);
  const uint32_t enetOut = Create("ENET1", kvMode_FrameOutStream);
  const std::vector<uint8_t> one = Pack({{5, {5}}}, true);
  EthernetSlot slot{};
  int32_t returned = 0;
  const int32_t cases[][2] = {
      {kvReadFrame(enetIn, buffer, 24, 0.0, &got), kvsimErrWrongProtocol},
      {kvhdnReadFrameEthernet(can, &slot, 1, &returned, 0.0), kvsimErrWrongProtocol},
      {kvhdnReadFrameEthernet(Create("ENET1", kvMode_FrameInSinglePoint, "0x1"), &slot, 1,
                              &returned, 0.0),
       kvsimErrWrongMode},
      {kvReadFrame(can, buffer, 24, 0.0, nullptr), kvsimErrNullPointer},
      {kvReadFrame(can, nullptr, 24, 0.0, &got), kvsimErrNullPointer},
      {kvReadFrame(can, buffer, 24, std::nan(""), &got), kvsimErrInvalidArgument},
      {kvWriteFrame(writer, nullptr, 0, 0.0), 0},  // an empty write is valid
      {kvWriteFrame(writer, nullptr, 24, 0.0), kvsimErrNullPointer},
      {kvWriteFrame(writer, one.data(), 24, std::nan("")), kvsimErrInvalidArgument},
      {kvWriteFrame(can, one.data(), 24, 0.0), kvsimErrWrongMode},
      {kvWriteFrame(enetOut, one.data(), 24, 0.0), kvsimErrWrongProtocol},
      {kvhdnWriteFrameEthernet(writer, nullptr, 0, 0.0), kvsimErrWrongProtocol},
      {kvhdnWriteFrameEthernet(enetIn, nullptr, 0, 0.0), kvsimErrWrongMode},
      {kvWriteFrame(writer, one.data(), 24, 2.5), 0},  // a time limit is accepted
  };
  for (size_t i = 0; i < std::size(cases); ++i) EXPECT_EQ(cases[i][0], cases[i][1]) << i;
  EXPECT_EQ(ReadU32(reader, kvPropSession_NumPend), 1u) << "only the write with a time limit";
  ASSERT_EQ(kvClear(can), 0);
  EXPECT_EQ(kvReadFrame(can, buffer, 24, 0.0, &got), kvsimErrInvalidSession);
}

}  // namespace
