// Ethernet frame writes through descriptors into the host's own payloads, and raw records handed
// to the driver as they are.
#include "frame/frame_write_support.h"
#include "kvorproperties.h"
#include "support/fake_error_log.h"

namespace {

using namespace kvsvtest;

constexpr uint32_t kStride = 56, kPayload = 32, kWord = 40, kReserved = 44, kFlag0 = 46;

tBytes EthernetFrame(uint32_t session, uint32_t index) {
  tBytes bytes(2000);
  const int32_t length = kvsimLastEthernetWrite(session, index, bytes.data(), 2000);
  bytes.resize(static_cast<size_t>(length < 0 ? 0 : length));
  return bytes;
}

class WriteEthernet : public SlotFixture {
 protected:
  void SetUp() override {
    SlotFixture::SetUp();
    writer_ = MakeSession("", kvMode_FrameOutQueued, "ENET1");
  }
  uint32_t writer_ = 0;
};

TEST_F(WriteEthernet, OnlyThePayloadsGoOut) {
  cClusterArray frames(3, kStride, kPayload);
  frames.GoldenTime(0, 0).GoldenTime(0, 16).Set(0, kWord, 0xFFFFFFFFu).Payload(0, Pattern(60, 1));
  for (uint32_t flag = 0; flag < 4; ++flag) frames.Set<uint8_t>(0, kFlag0 + flag, 1);
  frames.Payload(2, Pattern(1500, 3));  // element 1 has no payload: an empty frame
  ASSERT_EQ(kvsvWriteFrameEthernet(writer_, frames.handle(), 0.0), 0);
  ASSERT_EQ(kvsimLastEthernetWriteCount(writer_), 3);
  EXPECT_EQ(EthernetFrame(writer_, 0), Pattern(60, 1));
  EXPECT_EQ(EthernetFrame(writer_, 1), tBytes{});
  EXPECT_EQ(EthernetFrame(writer_, 2), Pattern(1500, 3));
}

TEST_F(WriteEthernet, ReservedInTheLastElementStopsTheWholeWrite) {
  cClusterArray frames(3, kStride, kPayload);
  for (int32_t i = 0; i < 3; ++i) frames.Payload(i, Pattern(10, 0));
  frames.Set<uint16_t>(2, kReserved, 0x0100);
  EXPECT_EQ(kvsvWriteFrameEthernet(writer_, frames.handle(), 0.0), kvErrEthernetFrameSize);
  EXPECT_EQ(kvsimCountCalls("kvhdnWriteFrameEthernet"), 0);
  EXPECT_EQ(Slot(writer_)->cachedCount, 3);
}

TEST_F(WriteEthernet, BufferIsReusedForFewerFramesAndReplacedForMore) {
  cClusterArray three(3, kStride, kPayload), two(2, kStride, kPayload), five(5, kStride, kPayload);
  ASSERT_EQ(kvsvWriteFrameEthernet(writer_, three.handle(), 0.0), 0);
  const void *buffer = Slot(writer_)->frameBuffer;
  svsimResetCounters();
  ASSERT_EQ(kvsvWriteFrameEthernet(writer_, two.handle(), 0.0), 0);
  EXPECT_EQ(Slot(writer_)->frameBuffer, buffer);
  EXPECT_EQ(Slot(writer_)->frameBufferSize, 48u);
  EXPECT_EQ(Slot(writer_)->cachedCount, 3);
  EXPECT_EQ(kvsimLastEthernetWriteCount(writer_), 2);
  ASSERT_EQ(kvsvWriteFrameEthernet(writer_, five.handle(), 0.0), 0);
  EXPECT_EQ(Slot(writer_)->frameBufferSize, 80u);
  EXPECT_EQ(Slot(writer_)->cachedCount, 5);
  EXPECT_EQ(svsimAllocCount() + svsimResizeCount(), 0u);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_PayldLenMax), 0);
}

TEST_F(WriteEthernet, AnEmptyArrayStillPassesTheGuardANullOneIsReportedBeforeIt) {
  cClusterArray empty(0, kStride, kPayload);
  EXPECT_EQ(kvsvWriteFrameEthernet(writer_, empty.handle(), 0.0), 0);
  EXPECT_EQ(Slot(writer_)->cachedCount, 0);
  EXPECT_EQ(LastCallOf("kvhdnWriteFrameEthernet").size1, 0u);
  const uint32_t noSlot = DriverSession(kvMode_FrameOutQueued, "ENET1");
  EXPECT_EQ(kvsvWriteFrameEthernet(noSlot, empty.handle(), 0.0), kvErrInvalidSession);
  cFakeErrorLog log;
  Slot(writer_)->guard = 1;
  EXPECT_EQ(kvsvWriteFrameEthernet(writer_, nullptr, 0.0), kvErrInternal);
  Slot(writer_)->guard = 0;
  const auto records = log.Records();
  ASSERT_EQ(records.size(), 1u);
  EXPECT_EQ(records[0].value.Component(), 13u);
  EXPECT_EQ(records[0].value.File(), 9u);
}

TEST_F(WriteEthernet, RawBytesGoToTheDriverAsTheyAre) {
  const uint32_t writer = MakeSession("", kvMode_FrameOutQueued, "CAN1");
  const uint32_t reader = DriverSession(kvMode_FrameInQueued, "CAN2");
  kvsimSetClock(kGoldenRawTime);
  const tBytes records = Join({Record(0x20000100, 0x33, 0x00, 0x05, 8, Pattern(8, 4), 24),
                               Record(0x7FF, 0, 0, 0, 3, {1, 2, 3}, 24)});
  SvHandle data = Keep(svNewHandleClr(4 + records.size()));
  const auto count = static_cast<int32_t>(records.size());
  std::memcpy(*data, &count, 4);
  std::memcpy(static_cast<uint8_t *>(*data) + 4, records.data(), records.size());
  const int32_t registered = svsimCleanupRegistrations();
  ASSERT_EQ(kvsvWriteFrameRaw(writer, data, 1.0), 0);
  EXPECT_EQ(LastWrite(writer), records);
  EXPECT_EQ(svsimCleanupRegistrations() - registered, 1);
  tBytes got(100);
  uint32_t bytes = 0;
  ASSERT_EQ(kvReadFrame(reader, got.data(), 100, 0.0, &bytes), 0);
  got.resize(bytes);
  EXPECT_EQ(got, records);

  // No slot is looked at: a closed session is the driver's to report, a null array sends nothing.
  EXPECT_EQ(kvsvWriteFrameRaw(writer, nullptr, 0.0), 0);
  EXPECT_EQ(LastCallOf("kvWriteFrame").size1, 0u);
  ASSERT_EQ(kvClear(reader), 0);
  EXPECT_EQ(kvsvWriteFrameRaw(reader, data, 0.0), kvsimErrInvalidSession);
}

}  // namespace
