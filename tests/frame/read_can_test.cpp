// CAN frame reads through the library against the driver stand-in's virtual CAN1-CAN2 bus, and
// against streams of records served as they are.
#include <limits>

#include "frame/frame_read_support.h"
#include "support/fake_error_log.h"

namespace {

using namespace kvsvtest;
using nKVSVAPI100::kUnknown;

// tFrameClusterCAN: Identifier, Type, Extended, Echo.
constexpr uint32_t kId = 24, kType = 28;

class ReadCan : public FrameReadTest {
 protected:
  ReadCan() : FrameReadTest(kvsvReadFrameCAN, 32, 16) {}

  // A queued reader on CAN2 and a writer on CAN1, both with `property` set to 1 if given.
  void Open(uint32_t property = 0, uint32_t mode = kvMode_FrameInQueued, const char *list = "") {
    Bus("CAN1", "CAN2", mode, list);
    if (property != 0) {
      SetU32(writer_, property, 1);
      SetU32(reader_, property, 1);
    }
  }
  // `count` classic frames with identifiers 0x100 + i and 8-byte payloads seeded by `seed` + i.
  void SendClassic(int count, uint8_t seed) {
    tBytes records;
    for (int i = 0; i < count; ++i)
      AppendRecord(records, 0x100 + i, 0, 0, 0, 8, Pattern(8, seed + i), 24);
    Write(records);
  }
};

TEST_F(ReadCan, ClassicRecordsWithEveryFieldAndEveryIdentifierAndFlagBit) {
  Open();
  const struct {
    uint32_t recordId;
    uint8_t type, flags;
    tBytes payload;
    uint32_t id;
    uint8_t extended, echo;
  } frames[] = {{0x123, 0x00, 0x00, {0xDE, 0xAD, 0xBE, 0xEF}, 0x123, 0, 0},
                {0x21ABCDEF, 0x07, 0x00, Pattern(8, 0x40), 0x1ABCDEF, 1, 0},
                {0x7FF, 0x22, 0x00, {}, 0x7FF, 0, 0},
                {0x60000123, 0x00, 0x00, {9}, 0x123, 1, 0},
                {0x9FFFFFFF, 0x00, 0x7F, {9}, 0x1FFFFFFF, 0, 0},
                {0x00000456, 0x00, 0x80, {9}, 0x456, 0, 1}};
  tBytes stream;
  for (const auto &f : frames)
    AppendRecord(stream, f.recordId, f.type, f.flags, 0, static_cast<uint8_t>(f.payload.size()),
                 f.payload, 24, kGoldenRawTime);
  Serve(stream);
  ASSERT_EQ(Read(6), 0);
  ASSERT_EQ(Count(frames_), 6);
  for (int32_t i = 0; i < 6; ++i) {
    SCOPED_TRACE(i);
    ExpectTime(i, 0);
    EXPECT_EQ(At<uint32_t>(i, kId), frames[i].id);
    EXPECT_EQ(Bytes(i, kType, 3), (tBytes{frames[i].type, frames[i].extended, frames[i].echo}));
    EXPECT_EQ(PayloadOf(i), frames[i].payload);
    EXPECT_GE(svGetHandleSize(Payload(i)), 15u);
  }
  EXPECT_EQ(LastCallOf("kvReadFrame").size1, 6u * 24u);
}

TEST_F(ReadCan, CanFdFramesOfTwelveToSixtyFourBytes) {
  Open(kvPropSession_IntfCanIoMode);
  const uint32_t lengths[] = {12, 16, 20, 24, 32, 48, 64};
  tBytes records;
  for (uint32_t i = 0; i < 7; ++i)
    AppendRecord(records, 0x300 + i, 0, 0, 0, static_cast<uint8_t>(lengths[i]),
                 Pattern(lengths[i], static_cast<uint8_t>(i)), 16 + ((lengths[i] + 7) & ~7u));
  Write(records);
  ASSERT_EQ(Read(7), 0);
  ASSERT_EQ(Count(frames_), 7);
  for (int32_t i = 0; i < 7; ++i) {
    EXPECT_EQ(At<uint32_t>(i, kId), 0x300u + i);
    EXPECT_EQ(PayloadOf(i), Pattern(lengths[i], static_cast<uint8_t>(i)));
    EXPECT_GE(svGetHandleSize(Payload(i)), 71u);
  }
  const kvsimCallRecord call = LastCallOf("kvhdnReadFrame");
  EXPECT_EQ(call.size1, 7u * 80u);  // seven records of the 64-byte limit
  EXPECT_EQ(call.size2, 7u);
}

TEST_F(ReadCan, J1939MessageOfFullLengthGrowsItsHandle) {
  Open(kvPropSession_ApplicationProtocol);
  kvsimSetClock(kGoldenRawTime);
  tBytes records;
  AppendRecord(records, 0x38FEF100, 0xC0, 0, 1785 >> 8, 1785 & 0xFF, Pattern(1785, 3), 1808);
  Write(records);
  ASSERT_EQ(Read(1), 0);
  ASSERT_EQ(Count(frames_), 1);
  EXPECT_EQ(PayloadOf(0), Pattern(1785, 3));
  EXPECT_GE(svGetHandleSize(Payload(0)), 1792u);
  EXPECT_EQ(At<uint32_t>(0, kId), 0x18FEF100u);
  EXPECT_EQ(Bytes(0, kType, 2), (tBytes{0xC0, 1}));
  ExpectTime(0, 0);
  // The buffer always holds one message of full length, whatever the frame count asks for.
  EXPECT_EQ(LastCallOf("kvhdnReadFrame").size1, 0x710u);
}

TEST_F(ReadCan, SurplusHandlesGoToSparesAndComeBackLastInFirstOutInSteadyReads) {
  Open();
  SendClassic(5, 0);
  ASSERT_EQ(Read(5), 0);
  SvHandle h[5];
  for (int32_t i = 0; i < 5; ++i) h[i] = Payload(i);
  svsimResetCounters();
  kvsimLogClear();
  SendClassic(2, 50);
  ASSERT_EQ(Read(5), 0);
  EXPECT_EQ(Count(frames_), 2);
  ASSERT_EQ(Count(spares_), 3);
  for (int32_t i = 0; i < 3; ++i) EXPECT_EQ(SpareAt(spares_, i), h[2 + i]);
  EXPECT_EQ(Payload(2), nullptr);
  SendClassic(5, 100);
  ASSERT_EQ(Read(5), 0);
  EXPECT_EQ(Count(spares_), 0);
  const SvHandle lifo[] = {h[0], h[1], h[4], h[3], h[2]};
  for (int32_t i = 0; i < 5; ++i) {
    EXPECT_EQ(Payload(i), lifo[i]);
    EXPECT_EQ(PayloadOf(i), Pattern(8, static_cast<uint8_t>(100 + i)));
  }
  EXPECT_EQ(svsimAllocCount() + svsimResizeCount() + svsimFreeCount(), 0u);
  EXPECT_EQ(kvsimCountCalls("kvReadFrame"), 2);
  EXPECT_EQ(kvsimLogCount(), 4);  // and the two writes: no property read
}

TEST_F(ReadCan, PayloadOverTheLimitIsClippedAndTheNextFrameStillDelivered) {
  Open();
  tBytes stream;
  AppendRecord(stream, 0x10, 0, 0, 0, 12, Pattern(12, 1), 24);
  AppendRecord(stream, 0x11, 0, 0, 0, 2, {7, 8}, 24);
  Serve(stream);
  EXPECT_EQ(Read(2), kvErrPayloadTruncated);
  ASSERT_EQ(Count(frames_), 2);
  EXPECT_EQ(PayloadOf(0), Pattern(8, 1));
  EXPECT_EQ(PayloadOf(1), (tBytes{7, 8}));
  EXPECT_EQ(Buffer()[15], 8);  // the record itself now says 8
  EXPECT_EQ(Slot(reader_)->cachedCount, kUnknown);
  // So the next read sizes everything anew, which asks the driver for the session's mode again.
  kvsimLogClear();
  Serve(stream);
  EXPECT_EQ(Read(2), kvErrPayloadTruncated);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_Mode), 1);
}

TEST_F(ReadCan, ClippedVariableRecordMakesTheNextStepFallShort) {
  Open(kvPropSession_IntfCanIoMode);
  SetU32(reader_, kvPropSession_PayldLenMax, 16);
  // A 64-byte record whose payload holds, where the clipped step lands, two records of its own.
  tBytes inner;
  AppendRecord(inner, 0x555, 0, 0, 0, 0, {}, 24);
  AppendRecord(inner, 0x666, 0, 0, 0, 3, {1, 2, 3}, 24);
  tBytes payload = Pattern(64, 9);
  std::copy(inner.begin(), inner.end(), payload.begin() + 16);
  tBytes stream;
  AppendRecord(stream, 0x444, 0, 0, 0, 64, payload, 80);
  AppendRecord(stream, 0x777, 0, 0, 0, 1, {0xAA}, 24);
  Serve(stream);
  EXPECT_EQ(Read(4), kvErrPayloadTruncated);
  ASSERT_EQ(Count(frames_), 4);
  const uint32_t ids[] = {0x444, 0x555, 0x666, 0x777};
  for (int32_t i = 0; i < 4; ++i) EXPECT_EQ(At<uint32_t>(i, kId), ids[i]);
  EXPECT_EQ(PayloadOf(0), Pattern(16, 9));
  EXPECT_EQ(PayloadOf(2), (tBytes{1, 2, 3}));
  EXPECT_EQ(Buffer()[15], 16);

  // With handles for two frames only, the third record finds no spare: the walk ends there.
  cFakeErrorLog log;
  DisposeArrays();
  Serve(stream);
  EXPECT_EQ(Read(2), kvErrInternal);
  EXPECT_EQ(Count(frames_), 2);
  EXPECT_EQ(log.Records().size(), 1u);
}

TEST_F(ReadCan, LongTypeOnCanFdStepsByElevenBitsButCopiesEight) {
  Open(kvPropSession_IntfCanIoMode);
  tBytes stream;
  AppendRecord(stream, 0x1, 0xC0, 0, 1, 4, Pattern(260, 5), 280);  // length 260
  AppendRecord(stream, 0x2, 0, 0, 0, 2, {4, 2}, 24);
  Serve(stream);
  ASSERT_EQ(Read(4), 0);
  ASSERT_EQ(Count(frames_), 2);
  EXPECT_EQ(PayloadOf(0), Pattern(4, 5));
  EXPECT_EQ(PayloadOf(1), (tBytes{4, 2}));
}

TEST_F(ReadCan, ListSessionMustBeReadWhole) {
  Open(0, kvMode_FrameInSinglePoint, "0x100,0x101:3,0x102");
  EXPECT_EQ(Read(2), kvErrFrameCountTooSmall);
  EXPECT_EQ(Count(frames_), 0);
  EXPECT_EQ(kvsimCountCalls("kvReadFrame"), 0);
  ASSERT_EQ(Read(-1), 0);  // the whole list
  ASSERT_EQ(Count(frames_), 3);
  EXPECT_EQ(At<uint32_t>(1, kId), 0x101u);
  EXPECT_EQ(PayloadOf(1), tBytes(3, 0));
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), 1);
  // Once sized, a smaller count passes the cache and goes to the driver as it is.
  ASSERT_EQ(Read(1), 0);
  EXPECT_EQ(Count(frames_), 1);
  EXPECT_EQ(LastCallOf("kvReadFrame").size1, 24u);
}

TEST_F(ReadCan, NegativeCountAsksForTheWholeQueue) {
  Open();
  SetU32(reader_, kvPropSession_QueueSize, 2400);
  SendClassic(2, 0);
  ASSERT_EQ(Read(-1, 1.0), kvErrInvalidTimeout);
  EXPECT_EQ(kvsimCountCalls("kvReadFrame"), 0);
  EXPECT_EQ(frames_, nullptr);
  ASSERT_EQ(Read(-1), 0);
  EXPECT_EQ(Count(frames_), 2);
  EXPECT_EQ(LastCallOf("kvReadFrame").size1, 2400u);  // 100 frames of 24 bytes
  kvsimLogClear();
  ASSERT_EQ(Read(-1), 0);
  EXPECT_EQ(kvsimLogCount(), 1);  // the limit is known: no property read
}

TEST_F(ReadCan, ZeroFramesOnAFreshSessionMakesEmptyArrays) {
  Open();
  ASSERT_EQ(Read(0), 0);
  EXPECT_EQ(svGetHandleSize(frames_), 8u);
  EXPECT_EQ(svGetHandleSize(spares_), 8u);
  EXPECT_EQ(Count(frames_), 0);
  EXPECT_EQ(LastCallOf("kvReadFrame").size1, 0u);
}

TEST_F(ReadCan, TimeLimitOtherThanZeroRegistersTheAbort) {
  Open();
  const struct {
    double timeout;
    int32_t registrations;
    kvsvStatus status;
  } cases[] = {{0.0, 0, 0},
               {std::numeric_limits<double>::quiet_NaN(), 1, kvsimErrInvalidArgument},
               {-1.0, 2, 0}};
  for (const auto &c : cases) {
    SendClassic(1, 0);  // there already: a limit never has to run out
    EXPECT_EQ(Read(1, c.timeout), c.status);
    EXPECT_EQ(svsimCleanupRegistrations(), c.registrations);
  }
  SvCleanupProc procedure = nullptr;
  uint64_t argument = 0;
  int32_t mode = 0;
  ASSERT_EQ(svsimLastCleanup(&procedure, &argument, &mode), 1);
  EXPECT_EQ(procedure, &kvsvSessionAbort);
  EXPECT_EQ(argument, reader_);
  EXPECT_EQ(mode, 6);
}

TEST_F(ReadCan, HostRefusalsAtEachGrowthStep) {
  const struct {
    uint32_t failAlloc;
    int32_t frameCount, spareCount;  // -1: no array
  } cases[] = {{1, -1, -1}, {2, 0, -1}, {4, 0, 1}};  // frames, spares, second payload handle
  for (const auto &c : cases) {
    SCOPED_TRACE(c.failAlloc);
    Open();
    svsimFailAllocAt(c.failAlloc);
    EXPECT_EQ(Read(3), kvErrOutputMemory);
    EXPECT_EQ(Count(frames_), c.frameCount);
    EXPECT_EQ(Count(spares_), c.spareCount);
    EXPECT_EQ(Slot(reader_)->cachedCount, kUnknown);
    EXPECT_EQ(kvsimCountCalls("kvReadFrame"), 0);
    DisposeArrays();
  }
}

TEST_F(ReadCan, RefusedResizesLeaveTheHandlesInTheArrays) {
  Open();
  // One frame whose payload handle is too small for a CAN frame, in arrays large enough.
  frames_ = svNewHandleClr(40);
  spares_ = svNewHandleClr(16);
  SvHandle small = svNewHandleClr(4);
  const int32_t one = 1;
  std::memcpy(*frames_, &one, 4);
  std::memcpy(static_cast<uint8_t *>(*frames_) + 8 + 16, &small, 8);
  svsimFailResizeAt(1);
  EXPECT_EQ(Read(1), kvErrOutOfMemory);  // an existing payload handle: not the output's status
  EXPECT_EQ(Count(frames_), 0);
  ASSERT_EQ(Count(spares_), 1);
  EXPECT_EQ(SpareAt(spares_, 0), small);
  EXPECT_EQ(svGetHandleSize(small), 4u);
  svsimFailResizeAt(1);  // the frames array, now too small for two
  EXPECT_EQ(Read(2), kvErrOutputMemory);
  EXPECT_EQ(svGetHandleSize(frames_), 40u);
  EXPECT_EQ(kvsimCountCalls("kvReadFrame"), 0);
}

TEST_F(ReadCan, RefusedCallsAndTheSkipByteTouchNothing) {
  Open();
  SendClassic(1, 0);
  kvsimLogClear();
  const uint8_t skip = 1, run = 0;
  EXPECT_EQ(kvsvReadFrameCAN(reader_ | 0xFFFF, 1, &frames_, &spares_, 0.0), kvErrInvalidSession);
  EXPECT_EQ(kvsvReadFrameCAN(reader_ & 0xFFFF0000u, 1, &frames_, &spares_, 0.0),
            kvErrInvalidSession);
  EXPECT_EQ(kvsvReadFrameCAN(reader_, 1, nullptr, &spares_, 0.0), kvErrNullArgument);
  Slot(reader_)->guard = 1;
  EXPECT_EQ(Read(1), kvErrSessionBusy);
  EXPECT_EQ(kvsvReadFrameCANEx(reader_, 1, &frames_, &spares_, &skip, 0.0), 0);
  EXPECT_EQ(Slot(reader_)->guard.load(), 1u);
  Slot(reader_)->guard = 0;
  EXPECT_EQ(frames_, nullptr);
  EXPECT_EQ(spares_, nullptr);
  EXPECT_EQ(kvsimLogCount(), 0);
  ASSERT_EQ(kvsvReadFrameCANEx(reader_, 1, &frames_, &spares_, &run, 0.0), 0);
  EXPECT_EQ(Count(frames_), 1);
}

}  // namespace
