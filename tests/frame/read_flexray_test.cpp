// FlexRay frame reads through the library of record streams served by the driver stand-in to a
// FlexRay2 session: variable records up to the session's own payload limit.
#include "frame/frame_read_support.h"

namespace {

using namespace kvsvtest;
using nKVSVAPI100::kUnknown;

// tFrameClusterFlexRay: Identifier (16 bits), Type, Info, then Flag0, 1, 2, 4, 5 and Echo.
constexpr uint32_t kId = 24, kType = 26, kFlag0 = 28;

class ReadFlexRay : public FrameReadTest {
 protected:
  ReadFlexRay() : FrameReadTest(kvsvReadFrameFlexRay, 40, 16) {}
  void SetUp() override {
    FrameReadTest::SetUp();
    Bus("FlexRay1", "FlexRay2");
  }
};

TEST_F(ReadFlexRay, RecordsUpToTheLimitWithEveryIdentifierAndFlagBit) {
  const struct {
    uint32_t recordId;
    uint8_t flags;
    uint32_t length;
    uint16_t id;
    tBytes shown;  // Flag0, 1, 2, 4, 5 and Echo
  } frames[] = {{0x7F, 0x33, 0, 0x7F, {1, 1, 0, 1, 1, 0}},
                {0x80, 0x33, 32, 0x80, {1, 1, 0, 1, 1, 0}},
                {0x0001007F, 0x33, 254, 0x007F, {1, 1, 0, 1, 1, 0}},
                {0xFFFF0002, 0x84, 0, 0x0002, {0, 0, 1, 0, 0, 1}},
                {0x0000FFFF, 0x48, 0, 0xFFFF, {0, 0, 0, 0, 0, 0}}};
  tBytes stream;
  for (uint8_t i = 0; i < 5; ++i) {
    const uint32_t length = frames[i].length;
    AppendRecord(stream, frames[i].recordId, 0x05, frames[i].flags, 0x9C,
                 static_cast<uint8_t>(length), Pattern(length, i),
                 length == 0 ? 24 : 16 + ((length + 7) & ~7u), kGoldenRawTime);
  }
  Serve(stream);
  ASSERT_EQ(Read(10), 0);
  ASSERT_EQ(Count(frames_), 5);
  for (uint8_t i = 0; i < 5; ++i) {
    SCOPED_TRACE(i);
    ExpectTime(i, 0);
    EXPECT_EQ(At<uint16_t>(i, kId), frames[i].id);
    EXPECT_EQ(Bytes(i, kType, 2), (tBytes{0x05, 0x9C}));
    EXPECT_EQ(Bytes(i, kFlag0, 6), frames[i].shown);
    EXPECT_EQ(PayloadOf(i), Pattern(frames[i].length, i));
    EXPECT_GE(svGetHandleSize(Payload(i)), 261u);
  }
  const kvsimCallRecord call = LastCallOf("kvhdnReadFrame");
  EXPECT_EQ(call.size1, 2720u);  // ten records of 272 bytes
  EXPECT_EQ(call.size2, 10u);
}

TEST_F(ReadFlexRay, PayloadOverTheLimitIsClipped) {
  SetU32(reader_, kvPropSession_PayldLenMax, 16);
  // The clipped record's step lands in its own payload, on a record that the payload holds.
  tBytes payload = Pattern(32, 3);
  tBytes inner;
  AppendRecord(inner, 0x3, 0, 0, 0, 0, {}, 16);
  std::copy(inner.begin(), inner.end(), payload.begin() + 16);
  tBytes stream;
  AppendRecord(stream, 0x1, 0, 0, 0, 16, Pattern(16, 2), 32);
  AppendRecord(stream, 0x2, 0, 0, 0, 32, payload, 48);
  Serve(stream);
  EXPECT_EQ(Read(3), kvErrPayloadTruncated);
  ASSERT_EQ(Count(frames_), 3);
  EXPECT_EQ(PayloadOf(0), Pattern(16, 2));
  EXPECT_EQ(PayloadOf(1), Pattern(16, 3));
  EXPECT_EQ(At<uint16_t>(2, kId), 0x3);
  EXPECT_EQ(Slot(reader_)->cachedCount, kUnknown);
}

TEST_F(ReadFlexRay, UnreadableLimitLeavesTheSessionBusy) {
  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropSession_PayldLenMax, kvsimErrInternal, 1), 0);
  EXPECT_EQ(Read(1), kvsimErrInternal);
  EXPECT_EQ(Slot(reader_)->guard.load(), 1u);
  EXPECT_EQ(Slot(reader_)->cachedSamples, kUnknown);
  EXPECT_EQ(Read(1), kvErrSessionBusy);
  EXPECT_EQ(frames_, nullptr);
  EXPECT_EQ(spares_, nullptr);
  EXPECT_EQ(kvsimCountCalls("kvhdnReadFrame"), 0);
}

TEST_F(ReadFlexRay, NewHandlesMatchTheProbedHandle) {
  const struct {
    uint32_t spareSize, expected;
  } cases[] = {{300, 300}, {20, 261}};
  for (const auto &c : cases) {
    SCOPED_TRACE(c.spareSize);
    spares_ = svNewHandleClr(16);
    SvHandle spare = svNewHandleClr(c.spareSize);
    const int32_t one = 1;
    std::memcpy(*spares_, &one, 4);
    std::memcpy(static_cast<uint8_t *>(*spares_) + 8, &spare, 8);
    ASSERT_EQ(Read(3), 0);  // nothing on the bus: every handle ends among the spares
    ASSERT_EQ(Count(spares_), 3);
    EXPECT_EQ(SpareAt(spares_, 0), spare);
    for (int32_t i = 0; i < 3; ++i) EXPECT_EQ(svGetHandleSize(SpareAt(spares_, i)), c.expected);
    DisposeArrays();
  }
}

}  // namespace
