// Raw frame reads: the driver's records handed to a host byte array as they are.
#include "frame/frame_read_support.h"

namespace {

using namespace kvsvtest;
using nKVSVAPI100::kUnknown;

class ReadRaw : public FrameReadTest {
 protected:
  ReadRaw() : FrameReadTest(kvsvReadFrameCAN, 32, 16) {}
  void SetUp() override {
    FrameReadTest::SetUp();
    Bus("CAN1", "CAN2");
  }
  void TearDown() override {
    svDisposeHandle(data_);
    FrameReadTest::TearDown();
  }
  kvsvStatus ReadBytes(int32_t n, double timeout = 0.0) {
    return kvsvReadFrameRaw(reader_, n, &data_, timeout);
  }

  SvHandle data_ = nullptr;
};

TEST_F(ReadRaw, RecordsArriveAsTheDriverGivesThem) {
  kvsimSetClock(kGoldenRawTime);
  tBytes records, expected;
  AppendRecord(records, 0x123, 0x04, 0, 0, 3, {1, 2, 3}, 24);
  AppendRecord(records, 0x20000456, 0x00, 0, 0, 8, Pattern(8, 9), 24);
  Write(records);
  AppendRecord(expected, 0x123, 0x04, 0, 0, 3, {1, 2, 3}, 24, kGoldenRawTime);
  AppendRecord(expected, 0x20000456, 0x00, 0, 0, 8, Pattern(8, 9), 24, kGoldenRawTime);
  ASSERT_EQ(ReadBytes(100), 0);
  EXPECT_EQ(PayloadBytes(data_), expected);
  EXPECT_EQ(svGetHandleSize(data_), 107u);
  EXPECT_EQ(LastCallOf("kvReadFrame").size1, 100u);
  // A smaller read neither shrinks the handle nor forgets its size.
  svsimResetCounters();
  ASSERT_EQ(ReadBytes(48), 0);
  EXPECT_EQ(svGetHandleSize(data_), 107u);
  EXPECT_EQ(Slot(reader_)->cachedSamples, 100);
  EXPECT_EQ(svsimResizeCount(), 0u);
}

TEST_F(ReadRaw, ZeroBytesOnAFreshSessionMakesASevenByteHandle) {
  ASSERT_EQ(ReadBytes(0), 0);
  EXPECT_EQ(svGetHandleSize(data_), 7u);
  EXPECT_EQ(Count(data_), 0);
  EXPECT_EQ(LastCallOf("kvReadFrame").size1, 0u);
}

TEST_F(ReadRaw, NegativeCountAsksForTheWholeCapacity) {
  EXPECT_EQ(ReadBytes(-1, 1.0), kvErrInvalidTimeout);
  EXPECT_EQ(data_, nullptr);
  SetU32(reader_, kvPropSession_QueueSize, 4096);
  ASSERT_EQ(ReadBytes(-1), 0);
  EXPECT_EQ(svGetHandleSize(data_), 4103u);
  EXPECT_EQ(LastCallOf("kvReadFrame").size1, 4096u);
  kvsimLogClear();
  ASSERT_EQ(ReadBytes(-1), 0);
  EXPECT_EQ(kvsimLogCount(), 1);  // known now: no property read

  // A list session: the records of its whole list at the payload limit.
  const uint32_t list = MakeSession("0x1,0x2,0x3", kvMode_FrameInSinglePoint, "CAN2");
  SetU32(list, kvPropSession_PayldLenMax, 20);
  SvHandle listData = Keep(svNewHandleClr(4));
  ASSERT_EQ(kvsvReadFrameRaw(list, -1, &listData, 0.0), 0);
  EXPECT_EQ(svGetHandleSize(listData), 3u * 40u + 7u);
}

TEST_F(ReadRaw, FailuresForgetTheSizeAndLeaveTheCountAtZero) {
  const struct {
    bool failResize;
    kvsvStatus status;
  } cases[] = {{true, kvErrOutputMemory}, {false, kvsimErrInternal}};
  for (const auto &c : cases) {
    ASSERT_EQ(ReadBytes(24), 0);
    if (c.failResize) {
      svsimFailResizeAt(1);
    } else {
      ASSERT_EQ(kvsimFailCall("kvReadFrame", kvsimErrInternal, 1), 0);
    }
    EXPECT_EQ(ReadBytes(c.failResize ? 1000 : 24), c.status);
    EXPECT_EQ(Count(data_), 0);
    EXPECT_EQ(Slot(reader_)->cachedSamples, kUnknown);
  }
  EXPECT_EQ(kvsvReadFrameRaw(reader_, 1, nullptr, 0.0), kvErrNullArgument);
}

}  // namespace
