// CAN, LIN and FlexRay frame writes: the records the driver is handed in each form, the
// whole-write refusal, the session's set-up and its failures, the steady loop and
// the empty write's way past the session table.
#include "frame/frame_write_support.h"
#include "kvorproperties.h"

namespace {

using namespace kvsvtest;
using nKVSVAPI100::kUnknown;

struct tProtocol {
  const char *name, *out, *in;
  kvsvStatus (*write)(uint32_t, SvHandle, double);
  uint32_t stride;
};
const tProtocol kCan{"CAN", "CAN1", "CAN2", kvsvWriteFrameCAN, 32};
const tProtocol kLin{"LIN", "LIN1", "LIN2", kvsvWriteFrameLIN, 32};
const tProtocol kFlexRay{"FlexRay", "FlexRay1", "FlexRay2", kvsvWriteFrameFlexRay, 40};

// Cluster offsets: identifier and payload are shared; the rest by protocol.
constexpr uint32_t kId = 24, kPayload = 16;
constexpr uint32_t kCanType = 28, kCanExtended = 29, kCanEcho = 30;
constexpr uint32_t kLinType = 28, kLinInfo = 29, kLinFlag0 = 30, kLinEcho = 31;
constexpr uint32_t kFrType = 26, kFrInfo = 27, kFrFlag0 = 28, kFrFlag1 = 29, kFrFlag5 = 32,
                   kFrEcho = 33;

class WriteRecords : public SlotFixture {
 protected:
  // A writer with `property` set to `value` before its first write.
  uint32_t Writer(const tProtocol &p, uint32_t property = 0, uint32_t value = 1) {
    writer_ = MakeSession("", kvMode_FrameOutQueued, p.out);
    if (property != 0) SetU32(writer_, property, value);
    return writer_;
  }
  // Frames of the golden time with identifiers 0x100 + i and payloads of `length` bytes.
  static void Fill(cClusterArray &frames, int32_t count, size_t length) {
    for (int32_t i = 0; i < count; ++i)
      frames.GoldenTime(i).Set(i, kId, 0x100u + i).Payload(i, Pattern(length, uint8_t(i)));
  }
  uint32_t writer_ = 0;
};

struct tGoldenCase {
  const char *name;
  const tProtocol *protocol;
  uint32_t property, value;  // set on the writer first, if not 0
  void (*build)(cClusterArray &);
  tBytes expected;
};

const tGoldenCase kGolden[] = {
    {"classic CAN", &kCan, 0, 0,
     [](cClusterArray &f) {
       f.Set(0, kId, 0x100u)
           .Set<uint8_t>(0, kCanExtended, 1)
           .Set<uint8_t>(0, kCanEcho, 1)
           .Payload(0, {1, 2});
       f.Set(1, kId, 0xC0000123u).Set<uint8_t>(1, kCanType, 0x22);  // no payload handle
       f.Set(2, kId, 0x1FFu).Payload(2, {9, 9}, false);             // a handle with no block
     },
     Join({Record(0x20000100, 0, 0, 0, 2, {1, 2}, 24), Record(0xC0000123, 0x22, 0, 0, 0, {}, 24),
           Record(0x1FF, 0, 0, 0, 0, {}, 24)})},
    {"CAN FD", &kCan, kvPropSession_IntfCanIoMode, 1,
     [](cClusterArray &f) {
       f.Set(0, kId, 1u).Payload(0, Pattern(12, 0));
       f.Set(1, kId, 2u).Payload(1, Pattern(64, 1));
     },
     Join({Record(1, 0, 0, 0, 12, Pattern(12, 0), 32), Record(2, 0, 0, 0, 64, Pattern(64, 1), 80),
           Record(0, 0, 0, 0, 0, {}, 24)})},
    {"J1939", &kCan, kvPropSession_ApplicationProtocol, 1,
     [](cClusterArray &f) {
       for (int32_t i = 0; i < 3; ++i) f.Set<uint8_t>(i, kCanType, 5);
       f.Payload(0, Pattern(256, 0)).Payload(1, Pattern(255, 1)).Payload(2, Pattern(1785, 2));
     },
     Join({Record(0, 0xC0, 0, 1, 0, Pattern(256, 0), 272),
           Record(0, 5, 0, 0, 255, Pattern(255, 1), 272),
           Record(0, 0xC0, 0, 6, 0xF9, Pattern(1785, 2), 1808)})},
    {"LIN", &kLin, 0, 0,
     [](cClusterArray &f) {
       f.Set(0, kId, 0x3Cu).Set<uint8_t>(0, kLinInfo, 0x55).Set<uint8_t>(0, kLinFlag0, 2);
       f.Set<uint8_t>(0, kLinEcho, 1).Payload(0, Pattern(8, 0));
       f.Set(1, kId, 0x12345678u)
           .Set<uint8_t>(1, kLinType, 2)
           .Set<uint8_t>(1, kLinInfo, 0x77)
           .Payload(1, {1});
     },
     Join({Record(0x3C, 0, 1, 0x55, 8, Pattern(8, 0), 24), Record(0x12345678, 2, 0, 0, 1, {1}, 24),
           Record(0, 0, 0, 0, 0, {}, 24)})},
    {"FlexRay", &kFlexRay, kvPropSession_PayldLenMax, 300,
     [](cClusterArray &f) {
       f.Set<uint16_t>(0, kId, 0x123).Set<uint8_t>(0, kFrType, 2).Set<uint8_t>(0, kFrInfo, 0x11);
       for (uint32_t flag = kFrFlag0; flag <= kFrEcho; ++flag)
         f.Set<uint8_t>(0, flag, uint8_t(flag));
       f.Payload(0, Pattern(16, 0));
       f.Set<uint16_t>(1, kId, 0x7FF).Set<uint8_t>(1, kFrFlag1, 1).Set<uint8_t>(1, kFrFlag5, 9);
       // The long form's Info counts in the step: 264 bytes of length, a 280-byte record.
       f.Set<uint8_t>(2, kFrType, 0xC0).Set<uint8_t>(2, kFrInfo, 1).Payload(2, Pattern(8, 2));
     },
     Join({Record(0x123, 2, 0x37, 0x11, 16, Pattern(16, 0), 32),
           Record(0x7FF, 0, 0x22, 0, 0, {}, 24), Record(0, 0xC0, 0, 1, 8, Pattern(8, 2), 280)})},
};

TEST_F(WriteRecords, RecordsAreWhatTheClustersSay) {
  for (const tGoldenCase &c : kGolden) {
    SCOPED_TRACE(c.name);
    Writer(*c.protocol, c.property, c.value);
    cClusterArray frames(3, c.protocol->stride, kPayload);
    for (int32_t i = 0; i < 3; ++i) frames.GoldenTime(i);
    c.build(frames);
    ASSERT_EQ(c.protocol->write(writer_, frames.handle(), 0.0), 0);
    EXPECT_EQ(LastWrite(writer_), c.expected);
  }
}

TEST_F(WriteRecords, PayloadLimitRefusesTheWholeWriteAndAFailedReadForgetsTheBuffer) {
  const struct {
    const tProtocol *protocol;
    uint32_t property;
    size_t over;  // one byte over the driver's default limit
  } cases[] = {{&kCan, 0, 9},
               {&kCan, kvPropSession_IntfCanIoMode, 65},
               {&kCan, kvPropSession_ApplicationProtocol, 1786},
               {&kLin, 0, 9},
               {&kFlexRay, 0, 255}};
  for (const auto &c : cases) {
    SCOPED_TRACE(c.over);
    const tProtocol &p = *c.protocol;
    Writer(p, c.property);
    const uint32_t reader = DriverSession(kvMode_FrameInQueued, p.in);
    cClusterArray three(3, p.stride, kPayload), four(4, p.stride, kPayload);
    Fill(three, 3, 8);
    three.Payload(2, Pattern(c.over, 0));
    kvsimLogClear();
    EXPECT_EQ(p.write(writer_, three.handle(), 0.0), kvErrPayloadTruncated);
    uint32_t pending = 99;
    ASSERT_EQ(kvGetProperty(reader, kvPropSession_NumPend, 4, &pending), 0);
    EXPECT_EQ(pending, 0u);
    EXPECT_EQ(Slot(writer_)->cachedCount, 3);  // the cache stays

    ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropSession_PayldLenMax, kvsimErrInternal, 1),
              0);
    EXPECT_EQ(p.write(writer_, four.handle(), 0.0), kvsimErrInternal);
    EXPECT_EQ(kvsimCountCalls("kvWriteFrame"), 0);
    EXPECT_EQ(Slot(writer_)->frameBuffer, nullptr);
    EXPECT_EQ(Slot(writer_)->frameBufferSize, 0u);
    EXPECT_EQ(Slot(writer_)->cachedCount, kUnknown);
    EXPECT_EQ(Slot(writer_)->cachedSamples, kUnknown);
    EXPECT_EQ(p.write(writer_, three.handle(), 0.0), kvErrPayloadTruncated);  // set up again
    EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_PayldLenMax), 3);         // once per set-up
  }
}

TEST_F(WriteRecords, FailedModeOrProtocolReadLeavesTheSimplerCanForm) {
  const struct {
    uint32_t failing;
    size_t length;
    uint32_t size;  // what the library hands over; the driver, which knows better, may refuse it
  } cases[] = {{kvPropSession_IntfCanIoMode, 12, 48},           // classic, not CAN FD
               {kvPropSession_ApplicationProtocol, 300, 128}};  // CAN FD, not J1939
  for (const auto &c : cases) {
    SCOPED_TRACE(c.length);
    Writer(kCan, kvPropSession_IntfCanIoMode);
    if (c.length > 255) SetU32(writer_, kvPropSession_ApplicationProtocol, 1);
    ASSERT_EQ(kvsimFailProperty("kvGetProperty", c.failing, kvsimErrInternal, 1), 0);
    cClusterArray two(2, kCan.stride, kPayload);
    Fill(two, 2, c.length);
    kvsvWriteFrameCAN(writer_, two.handle(), 0.0);
    EXPECT_EQ(LastCallOf("kvWriteFrame").size1, c.size);
    EXPECT_EQ(Slot(writer_)->cachedCount, 2);
  }
}

TEST_F(WriteRecords, J1939MeasuresItsMessagesOnEveryCall) {
  // Under a limit of 300 the buffer holds two 320-byte records; the long message is measured all
  // the same, and refused.
  Writer(kCan, kvPropSession_ApplicationProtocol);
  SetU32(writer_, kvPropSession_PayldLenMax, 300);
  cClusterArray two(2, kCan.stride, kPayload), longOne(2, kCan.stride, kPayload);
  Fill(two, 2, 8);
  ASSERT_EQ(kvsvWriteFrameCAN(writer_, two.handle(), 0.0), 0);
  EXPECT_EQ(Slot(writer_)->frameBufferSize, 640u);
  longOne.Payload(0, Pattern(1785, 0));  // element 1 has no payload and adds nothing
  EXPECT_EQ(kvsvWriteFrameCAN(writer_, longOne.handle(), 0.0), kvErrPayloadTruncated);
  EXPECT_EQ(Slot(writer_)->frameBufferSize, 1808u);
  EXPECT_EQ(Slot(writer_)->cachedCount, 2);
}

TEST_F(WriteRecords, RecordPastTheBufferEndGrowsIt) {
  // A FlexRay Info of 7 makes a record of 1816 bytes where 272 were planned; the driver then
  // refuses the length of 1800 that it claims.
  Writer(kFlexRay);
  cClusterArray frames(1, kFlexRay.stride, kPayload);
  frames.Set<uint8_t>(0, kFrType, 0xC0).Set<uint8_t>(0, kFrInfo, 7).Payload(0, Pattern(8, 0));
  EXPECT_EQ(kvsvWriteFrameFlexRay(writer_, frames.handle(), 0.0), kvsimErrInvalidFrame);
  EXPECT_EQ(LastCallOf("kvWriteFrame").size1, 1816u);
  EXPECT_GE(Slot(writer_)->frameBufferSize, 1816u);
}

TEST_F(WriteRecords, ABufferBeyond32BitsIsAMemoryFailure) {
  // The library allocates with plain malloc, which cannot be made to fail here; a size that the
  // slot cannot count is the one memory failure within reach.
  Writer(kCan, kvPropSession_IntfCanIoMode);
  SetU32(writer_, kvPropSession_PayldLenMax, 2040);      // 2056-byte records
  cClusterArray frames(2088992, kCan.stride, kPayload);  // 2088992 * 2056 > 2^32 - 1
  EXPECT_EQ(kvsvWriteFrameCAN(writer_, frames.handle(), 0.0), kvErrOutOfMemory);
  EXPECT_EQ(kvsimCountCalls("kvWriteFrame"), 0);
  EXPECT_EQ(Slot(writer_)->frameBufferSize, 0u);
  EXPECT_EQ(Slot(writer_)->cachedCount, kUnknown);
  EXPECT_EQ(Slot(writer_)->cachedSamples, kUnknown);
}

TEST_F(WriteRecords, SteadyWritesReadNoPropertyAndKeepTheBuffer) {
  Writer(kCan);
  cClusterArray three(3, kCan.stride, kPayload), one(1, kCan.stride, kPayload);
  Fill(three, 3, 8);
  Fill(one, 1, 4);
  ASSERT_EQ(kvsvWriteFrameCAN(writer_, three.handle(), 0.0), 0);
  const void *buffer = Slot(writer_)->frameBuffer;
  const int32_t registered = svsimCleanupRegistrations();
  svsimResetCounters();
  kvsimLogClear();
  for (int i = 0; i < 5; ++i) {
    ASSERT_EQ(kvsvWriteFrameCAN(writer_, three.handle(), 0.0), 0);
    ASSERT_EQ(kvsvWriteFrameCAN(writer_, one.handle(), 0.0), 0);
  }
  EXPECT_EQ(kvsimLogCount(), 10);  // the writes and nothing else
  EXPECT_EQ(svsimAllocCount() + svsimResizeCount(), 0u);
  EXPECT_EQ(svsimCleanupRegistrations(), registered);
  EXPECT_EQ(Slot(writer_)->frameBuffer, buffer);
  EXPECT_EQ(Slot(writer_)->frameBufferSize, 72u);
  EXPECT_EQ(LastWrite(writer_), Record(0x100, 0, 0, 0, 4, Pattern(4, 0), 24));
}

TEST_F(WriteRecords, EmptyWriteGoesToTheDriverWithoutTheSessionTable) {
  const uint32_t closed = DriverSession(kvMode_FrameOutQueued, "CAN1");
  ASSERT_EQ(kvClear(closed), 0);
  for (const tProtocol *p : {&kCan, &kLin, &kFlexRay}) {
    SCOPED_TRACE(p->name);
    cClusterArray empty(0, p->stride, kPayload), one(1, p->stride, kPayload);
    const int32_t registered = svsimCleanupRegistrations();
    kvsimLogClear();
    EXPECT_EQ(p->write(closed, empty.handle(), 2.5), kvsimErrInvalidSession);
    EXPECT_EQ(p->write(closed, nullptr, 0.0), kvsimErrInvalidSession);
    EXPECT_EQ(kvsimCountCalls("kvWriteFrame"), 2);
    EXPECT_EQ(LastCallOf("kvWriteFrame").size1, 0u);
    EXPECT_EQ(svsimCleanupRegistrations() - registered, 1);  // only the call with a time limit
    // With frames the table is asked first, and the closed session has no slot.
    EXPECT_EQ(p->write(closed, one.handle(), 0.0), kvErrInvalidSession);
  }
}

}  // namespace
