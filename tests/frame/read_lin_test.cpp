// LIN frame reads through the library of record streams served by the driver stand-in to a LIN2
// session: always the fixed form, with a limit of 8 bytes.
#include "frame/frame_read_support.h"

namespace {

using namespace kvsvtest;
using nKVSVAPI100::kUnknown;

// tFrameClusterLIN: Identifier, then Type, Info, Flag0, Echo.
constexpr uint32_t kId = 24, kType = 28;

class ReadLin : public FrameReadTest {
 protected:
  ReadLin() : FrameReadTest(kvsvReadFrameLIN, 32, 16) {}
  void SetUp() override {
    FrameReadTest::SetUp();
    Bus("LIN1", "LIN2");
  }
};

TEST_F(ReadLin, RecordsWithInfoAndFlagsTheLowByteOfTheIdentifierAndTwoFlagBits) {
  const struct {
    uint32_t recordId;
    uint8_t type, flags, info;
    tBytes payload;
    uint32_t id;
    uint8_t flag0, echo;
  } frames[] = {{0x3C, 0x03, 0x01, 0x5A, Pattern(8, 1), 0x3C, 1, 0},
                {0x21, 0x00, 0x00, 0x00, {0xCA, 0xFE}, 0x21, 0, 0},
                {0x12345678, 0x00, 0x81, 0x00, {}, 0x78, 1, 1},
                {0x0140, 0x00, 0x80, 0x00, {}, 0x40, 0, 1},
                {0xFF, 0x00, 0x7E, 0x00, {}, 0xFF, 0, 0}};
  tBytes stream;
  for (const auto &f : frames)
    AppendRecord(stream, f.recordId, f.type, f.flags, f.info,
                 static_cast<uint8_t>(f.payload.size()), f.payload, 24, kGoldenRawTime);
  Serve(stream);
  ASSERT_EQ(Read(5), 0);
  ASSERT_EQ(Count(frames_), 5);
  for (int32_t i = 0; i < 5; ++i) {
    SCOPED_TRACE(i);
    ExpectTime(i, 0);
    EXPECT_EQ(At<uint32_t>(i, kId), frames[i].id);
    EXPECT_EQ(Bytes(i, kType, 4),
              (tBytes{frames[i].type, frames[i].info, frames[i].flag0, frames[i].echo}));
    EXPECT_EQ(PayloadOf(i), frames[i].payload);
    EXPECT_EQ(svGetHandleSize(Payload(i)), 15u);
  }
}

TEST_F(ReadLin, PayloadOverEightIsClippedInTheRecordToo) {
  tBytes stream;
  AppendRecord(stream, 0x10, 0, 0, 0, 9, Pattern(8, 4), 24);
  AppendRecord(stream, 0x11, 0, 0, 0, 1, {6}, 24);
  Serve(stream);
  EXPECT_EQ(Read(2), kvErrPayloadTruncated);
  ASSERT_EQ(Count(frames_), 2);
  EXPECT_EQ(PayloadOf(0), Pattern(8, 4));
  EXPECT_EQ(PayloadOf(1), tBytes{6});
  EXPECT_EQ(Buffer()[15], 8);
  EXPECT_EQ(Slot(reader_)->cachedCount, kUnknown);
}

TEST_F(ReadLin, NegativeCountDividesTheQueueByTwentyFour) {
  SetU32(reader_, kvPropSession_QueueSize, 240);
  EXPECT_EQ(Read(-1, 0.5), kvErrInvalidTimeout);
  EXPECT_EQ(kvsimCountCalls("kvReadFrame"), 0);
  ASSERT_EQ(Read(-1), 0);
  EXPECT_EQ(LastCallOf("kvReadFrame").size1, 240u);
  EXPECT_EQ(Count(spares_), 10);
}

TEST_F(ReadLin, ListSessionMayBeReadInPartAndRefusalsKeepTheHandles) {
  reader_ = MakeSession("0x10,0x11,0x12", kvMode_FrameInSinglePoint, "LIN2");
  svsimFailAllocAt(4);  // frames, spares, one payload handle, then the second
  EXPECT_EQ(Read(2), kvErrOutputMemory);
  EXPECT_EQ(Count(frames_), 0);
  EXPECT_EQ(Count(spares_), 1);
  svsimResetCounters();
  ASSERT_EQ(Read(1), 0);  // fewer than the list: no test of it here
  ASSERT_EQ(Count(frames_), 1);
  EXPECT_EQ(At<uint32_t>(0, kId), 0x10u);
  EXPECT_EQ(svsimAllocCount(), 0u);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_Mode), 0);
  const uint8_t skip = 1;
  EXPECT_EQ(kvsvReadFrameLINEx(reader_, 5, &frames_, &spares_, &skip, 0.0), 0);
  EXPECT_EQ(Count(frames_), 1);
}

}  // namespace
