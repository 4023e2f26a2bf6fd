// Frame reads and writes through the library against the driver stand-in. Reads: records decoded
// into the clusters of CAN, LIN and FlexRay, Ethernet frames that the driver writes straight into
// host payload handles, raw records as they are; the host arrays sized and their payload handles
// recycled through the spares. Writes: the records each cluster makes, the whole-write refusal,
// the session's set-up and buffer, Ethernet descriptors, raw records.
#include "frame/frame_support.h"
#include "kvorproperties.h"
#include "support/fake_error_log.h"

namespace {

using namespace kvsvtest;
using nKVSVAPI100::kUnknown;

// A record and the cluster that goes with it: identifier, the protocol's one-byte fields (none:
// zeros on writes), and payload with its handle on writes.
enum ePayload { kHandle, kNoHandle, kNoBlock };
struct tFrame {
  tBytes record;
  uint32_t id;
  tBytes fields, payload;
  ePayload handle = kHandle;
};
struct tStreamCase {
  const char *name;
  const tProtocol *p;
  uint32_t property, limit;  // set on the reader first if not 0, the property to 1
  int32_t n;
  kvsvStatus status;
  std::vector<tFrame> frames;
  const char *call;  // the driver read, and the bytes and frames it was asked for
  uint32_t bytes, asked;
  uint32_t handleSize;
};

// A 64-byte payload that holds, from byte 16 where its record clipped to 16 bytes steps to, two
// records of its own.
const tBytes kNestingPayload = [] {
  tBytes payload = Pattern(64, 9);
  const tBytes inner =
      Join({Record(0x555, 0, 0, 0, 0, {}, 24), Record(0x666, 0, 0, 0, 3, {1, 2, 3}, 24)});
  std::copy(inner.begin(), inner.end(), payload.begin() + 16);
  return payload;
}();

// clang-format off
const tStreamCase kStreams[] = {
    {"classic CAN: 29 identifier bits, bit 29 Extended, flag bit 7 Echo", &kCan, 0, 0, 4, 0, {
        {Record(0x123, 0, 0, 0, 4, {0xDE, 0xAD, 0xBE, 0xEF}, 24), 0x123, {0, 0, 0}, {0xDE, 0xAD, 0xBE, 0xEF}},
        {Record(0x21ABCDEF, 7, 0, 0, 8, Pattern(8, 0x40), 24), 0x1ABCDEF, {7, 1, 0}, Pattern(8, 0x40)},
        {Record(0x9FFFFFFF, 0, 0x7F, 0, 1, {9}, 24), 0x1FFFFFFF, {0, 0, 0}, {9}},
        {Record(0x456, 0, 0x80, 0, 1, {9}, 24), 0x456, {0, 0, 1}, {9}}},
     "kvReadFrame", 4 * 24, 0, 15},
    {"classic CAN over 8 bytes: clipped, the next frame delivered", &kCan, 0, 0, 2, kvErrPayloadTruncated, {
        {Record(0x10, 0, 0, 0, 12, Pattern(12, 1), 24), 0x10, {0, 0, 0}, Pattern(8, 1)},
        {Record(0x11, 0, 0, 0, 2, {7, 8}, 24), 0x11, {0, 0, 0}, {7, 8}}},
     "kvReadFrame", 48, 0, 15},
    {"CAN FD: variable records, the buffer at the 64-byte limit", &kCan, kvPropSession_IntfCanIoMode, 0, 2, 0, {
        {Record(0x300, 0, 0, 0, 12, Pattern(12, 0), 32), 0x300, {0, 0, 0}, Pattern(12, 0)},
        {Record(0x302, 0, 0, 0, 64, Pattern(64, 2), 80), 0x302, {0, 0, 0}, Pattern(64, 2)}},
     "kvhdnReadFrame", 2 * 80, 2, 71},
    {"CAN FD long type: steps by eleven bits, copies eight", &kCan, kvPropSession_IntfCanIoMode, 0, 4, 0, {
        {Record(0x1, 0xC0, 0, 1, 4, Pattern(260, 5), 280), 0x1, {0xC0, 0, 0}, Pattern(4, 5)},
        {Record(0x2, 0, 0, 0, 2, {4, 2}, 24), 0x2, {0, 0, 0}, {4, 2}}},
     "kvhdnReadFrame", 4 * 80, 4, 71},
    {"CAN FD over the limit: the step lands in the clipped payload", &kCan, kvPropSession_IntfCanIoMode, 16, 4,
     kvErrPayloadTruncated, {
        {Record(0x444, 0, 0, 0, 64, kNestingPayload, 80), 0x444, {0, 0, 0}, Pattern(16, 9)},
        {{}, 0x555, {0, 0, 0}, {}},
        {{}, 0x666, {0, 0, 0}, {1, 2, 3}},
        {Record(0x777, 0, 0, 0, 1, {0xAA}, 24), 0x777, {0, 0, 0}, {0xAA}}},
     "kvhdnReadFrame", 4 * 32, 4, 23},
    {"J1939 message of full length: the handle grows", &kCan, kvPropSession_ApplicationProtocol, 0, 1, 0, {
        {Record(0x38FEF100, 0xC0, 0, 1785 >> 8, 1785 & 0xFF, Pattern(1785, 3), 1808), 0x18FEF100, {0xC0, 1, 0},
         Pattern(1785, 3)}},
     "kvhdnReadFrame", 0x710, 1, 1792},  // one long message, whatever the count
    {"LIN: the low identifier byte, Flag0 and Echo", &kLin, 0, 0, 3, 0, {
        {Record(0x3C, 3, 1, 0x5A, 8, Pattern(8, 1), 24), 0x3C, {3, 0x5A, 1, 0}, Pattern(8, 1)},
        {Record(0x12345678, 0, 0x81, 0, 0, {}, 24), 0x78, {0, 0, 1, 1}, {}},
        {Record(0xFF, 0, 0x7E, 0, 0, {}, 24), 0xFF, {0, 0, 0, 0}, {}}},
     "kvReadFrame", 3 * 24, 0, 15},
    {"FlexRay: 16 identifier bits, six flag bits, up to the 254-byte limit", &kFlexRay, 0, 0, 10, 0, {
        {Record(0x80, 5, 0x33, 0x9C, 0, {}, 24), 0x80, {5, 0x9C, 1, 1, 0, 1, 1, 0}, {}},
        {Record(0x1007F, 5, 0x33, 0x9C, 254, Pattern(254, 2), 272), 0x7F, {5, 0x9C, 1, 1, 0, 1, 1, 0}, Pattern(254, 2)},
        {Record(0xFFFF0002, 5, 0x84, 0x9C, 0, {}, 24), 0x2, {5, 0x9C, 0, 0, 1, 0, 0, 1}, {}},
        {Record(0xFFFF, 5, 0x48, 0x9C, 0, {}, 24), 0xFFFF, {5, 0x9C, 0, 0, 0, 0, 0, 0}, {}}},
     "kvhdnReadFrame", 10 * 272, 10, 261},
};
// clang-format on

TEST_F(FrameTest, ReadRecordsAreDecodedIntoTheClustersOfEachProtocol) {
  for (const tStreamCase &c : kStreams) {
    SCOPED_TRACE(c.name);
    Open(*c.p, c.property);
    if (c.limit != 0) SetU32(reader_, kvPropSession_PayldLenMax, c.limit);
    tBytes stream;
    for (const tFrame &f : c.frames) stream = Join({stream, f.record});
    Serve(stream);
    EXPECT_EQ(Read(c.n), c.status);
    ASSERT_EQ(Frames(), static_cast<int32_t>(c.frames.size()));
    for (int32_t i = 0; i < Frames(); ++i) {
      SCOPED_TRACE(i);
      EXPECT_EQ(arrays_->At<uint64_t>(i, 0), kGoldenFraction);
      EXPECT_EQ(arrays_->At<int64_t>(i, 8), kGoldenSeconds);
      EXPECT_EQ(Id(i), c.frames[i].id);
      EXPECT_EQ(Fields(i), c.frames[i].fields);
      EXPECT_EQ(arrays_->PayloadOf(i), c.frames[i].payload);
      EXPECT_EQ(svGetHandleSize(arrays_->Payload(i)), c.handleSize);
    }
    const kvsimCallRecord call = LastCall(c.call);
    EXPECT_EQ(call.size1, c.bytes);
    EXPECT_EQ(call.size2, c.asked);
    // After a failure the next read sizes everything anew.
    EXPECT_EQ(Slot(reader_)->cachedCount, c.status < 0 ? kUnknown : c.n);
  }
}

TEST_F(FrameTest, ReadHandsSurplusHandlesToTheSparesAndTakesThemBackLastInFirstOut) {
  for (const tProtocol *p : {&kCan, &kEthernet}) {
    SCOPED_TRACE(p->name);
    Open(*p);
    const char *driverRead = p == &kCan ? "kvReadFrame" : "kvhdnReadFrameEthernet";
    Send(5, 0);
    ASSERT_EQ(Read(5), 0);
    const std::vector<SvHandle> h = arrays_->Payloads();
    svsimResetCounters();
    kvsimLogClear();
    Send(2, 50);
    ASSERT_EQ(Read(5), 0);
    EXPECT_EQ(Frames(), 2);
    EXPECT_EQ(arrays_->Spares(), (std::vector<SvHandle>{h[2], h[3], h[4]}));
    EXPECT_EQ(arrays_->Payload(2), nullptr);
    Send(5, 100);
    ASSERT_EQ(Read(5), 0);
    const std::vector<SvHandle> lifo{h[0], h[1], h[4], h[3], h[2]};
    EXPECT_EQ(arrays_->Payloads(), lifo);
    EXPECT_EQ(arrays_->PayloadOf(4), Pattern(8, 104));
    EXPECT_EQ(svsimAllocCount() + svsimResizeCount() + svsimFreeCount(), 0u);
    EXPECT_EQ(kvsimCountCalls("kvGetProperty"), 0);
    // A failed read empties the frames into the spares, in index order.
    ASSERT_EQ(kvsimFailCall(driverRead, kvsimErrInternal, 1), 0);
    EXPECT_EQ(Read(5), kvsimErrInternal);
    EXPECT_EQ(Frames(), 0);
    EXPECT_EQ(arrays_->Spares(), lifo);
    EXPECT_EQ(Slot(reader_)->cachedCount, kUnknown);
  }
}

// A payload handle of the host's own, with room for its count and one byte, swapped in for the
// spare that the last read left: the next frame that takes it must not be copied past it.
TEST_F(FrameTest, ReadGrowsAPayloadHandleSmallerThanTheOthersBeforeItsCopy) {
  const struct {
    const tProtocol *p;
    uint32_t property, limit;  // set on the reader if not 0
    uint32_t grown;            // the size a new handle of the session has
  } cases[] = {{&kCan, 0, 0, 15},
               {&kCan, kvPropSession_IntfCanIoMode, 0, 71},
               {&kCan, kvPropSession_ApplicationProtocol, 0, 71},
               {&kLin, 0, 0, 15},
               {&kFlexRay, 0, 0, 261},
               {&kEthernet, 0, 60, 67}};
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << c.p->name << " " << c.property);
    Open(*c.p, c.property);
    if (c.limit != 0) SetU32(reader_, kvPropSession_PayldLenMax, c.limit);
    Send(1, 0);
    ASSERT_EQ(Read(2), 0);
    ASSERT_EQ(Count(arrays_->spares), 1);
    SvHandle small = svNewHandleClr(5);
    svDisposeHandle(arrays_->Spares()[0]);
    std::memcpy(static_cast<uint8_t *>(*arrays_->spares) + 8, &small, sizeof small);
    svsimResetCounters();
    Send(2, 40);
    ASSERT_EQ(Read(2), 0);
    ASSERT_EQ(Frames(), 2);
    EXPECT_EQ(arrays_->Payload(1), small);
    EXPECT_EQ(svGetHandleSize(small), c.grown);
    EXPECT_EQ(arrays_->PayloadOf(1), Pattern(8, 41));
    EXPECT_EQ(svsimResizeCount(), 1u);
    EXPECT_EQ(svsimAllocCount(), 0u);
  }
}

// A program that keeps one pair of arrays for a CAN FD and a classic CAN session in turn: the
// classic read adds handles for 8 bytes, which the next CAN FD read fills with 64.
TEST_F(FrameTest, ReadOfCanFdGrowsTheHandlesThatAClassicReadAddedToTheSameArrays) {
  Open(kCan, kvPropSession_IntfCanIoMode);
  const uint32_t classic = MakeSession("", kvMode_FrameInQueued, kCan.in);
  const auto fd = [](int count) {
    tBytes records;
    for (int i = 0; i < count; ++i)
      records = Join({records, Record(0x300 + i, 0, 0, 0, 64, Pattern(64, uint8_t(i)), 80)});
    return records;
  };
  Serve(fd(1));
  ASSERT_EQ(Read(1), 0);
  tBytes classicRecords;
  for (int i = 0; i < 3; ++i)
    classicRecords = Join({classicRecords, Record(0x100 + i, 0, 0, 0, 8, Pattern(8, 0), 24)});
  ASSERT_EQ(kvsimSetReadStream(classic, classicRecords.data(), uint32_t(classicRecords.size()), 0), 0);
  ASSERT_EQ(kvsvReadFrameCAN(classic, 3, &arrays_->frames, &arrays_->spares, 0.0), 0);
  ASSERT_EQ(Frames(), 3);
  EXPECT_EQ(svGetHandleSize(arrays_->Payload(2)), 15u);
  svsimResetCounters();
  Serve(fd(3));
  ASSERT_EQ(Read(3), 0);
  ASSERT_EQ(Frames(), 3);
  for (int32_t i = 0; i < 3; ++i) {
    SCOPED_TRACE(i);
    EXPECT_EQ(arrays_->PayloadOf(i), Pattern(64, uint8_t(i)));
    EXPECT_EQ(svGetHandleSize(arrays_->Payload(i)), 71u);
  }
  EXPECT_EQ(svsimResizeCount(), 2u);
  EXPECT_EQ(svsimAllocCount(), 0u);
}

// A steady read finds frames no longer than those its handles hold already: it asks the host for
// no handle's size per frame, so the number of size queries of a call does not grow with its
// frames.
TEST_F(FrameTest, SteadyReadAsksForNoPayloadHandleSizePerFrame) {
  const struct {
    const tProtocol *p;
    uint32_t property;
    uint8_t length;
    uint32_t recordBytes;
  } cases[] = {{&kCan, 0, 8, 24},
               {&kCan, kvPropSession_IntfCanIoMode, 64, 80},
               {&kLin, 0, 8, 24},
               {&kFlexRay, 0, 254, 272}};
  const int32_t counts[] = {1, 40};
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << c.p->name << " " << int{c.length});
    uint64_t queries[2] = {};
    for (int k = 0; k < 2; ++k) {
      Open(*c.p, c.property);
      const auto serve = [&](uint8_t seed) {
        tBytes records;
        for (int32_t i = 0; i < counts[k]; ++i)
          records = Join({records, Record(0x100 + i, 0, 0, 0, c.length,
                                          Pattern(c.length, uint8_t(seed + i)), c.recordBytes)});
        Serve(records);
      };
      serve(0);
      ASSERT_EQ(Read(counts[k]), 0);
      svsimResetCounters();
      serve(50);
      ASSERT_EQ(Read(counts[k]), 0);
      ASSERT_EQ(Frames(), counts[k]);
      EXPECT_EQ(arrays_->PayloadOf(counts[k] - 1), Pattern(c.length, uint8_t(50 + counts[k] - 1)));
      queries[k] = svsimHandleSizeQueries();
    }
    EXPECT_EQ(queries[0], queries[1]);
  }
}

TEST_F(FrameTest, ReadOfAllTakesTheWholeQueueOrWhatIsPendingNow) {
  const struct {
    const tProtocol *p;
    uint32_t queue;  // bytes, if set
    const char *call;
    uint32_t asked;    // by the read of all
    int32_t capacity;  // frames the arrays then hold handles for
    int32_t rereads;   // properties read by the next read of all
  } cases[] = {{&kCan, 2400, "kvReadFrame", 2400, 100, 0},
               {&kEthernet, 0, "kvhdnReadFrameEthernet", 2, 2, 1}};  // what is pending now
  for (const auto &c : cases) {
    SCOPED_TRACE(c.p->name);
    Open(*c.p);
    if (c.queue != 0) SetU32(reader_, kvPropSession_QueueSize, c.queue);
    kvsimLogClear();
    EXPECT_EQ(Read(-1, 1.0), kvErrInvalidTimeout);
    EXPECT_EQ(kvsimCountCalls(c.call), 0);
    Send(2, 0);
    ASSERT_EQ(Read(-1), 0);
    EXPECT_EQ(Frames(), 2);
    EXPECT_EQ(Count(arrays_->spares), c.capacity - 2);
    EXPECT_EQ(LastCall(c.call).size1, c.asked);
    kvsimLogClear();
    ASSERT_EQ(Read(-1), 0);
    EXPECT_EQ(kvsimCountCalls("kvGetProperty"), c.rereads);
  }
}

TEST_F(FrameTest, ReadOfACanListSessionTakesTheWholeList) {
  Open(kCan, 0, kvMode_FrameInSinglePoint, "0x100,0x101:3,0x102");
  EXPECT_EQ(Read(2), kvErrFrameCountTooSmall);
  EXPECT_EQ(Frames(), 0);
  EXPECT_EQ(kvsimCountCalls("kvReadFrame"), 0);
  ASSERT_EQ(Read(-1), 0);
  ASSERT_EQ(Frames(), 3);
  EXPECT_EQ(Id(1), 0x101u);
  EXPECT_EQ(arrays_->PayloadOf(1), tBytes(3, 0));
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumInList), 1);
}

TEST_F(FrameTest, ReadRefusalsAndTheSkipByteTouchNothingButTheHandlesMade) {
  using tEx = kvsvStatus (*)(uint32_t, int32_t, SvHandle *, SvHandle *, const uint8_t *, double);
  const struct {
    const tProtocol *p;
    tEx ex;
    kvsvStatus noArray;  // Ethernet reports it as an internal error
  } cases[] = {{&kCan, kvsvReadFrameCANEx, kvErrNullArgument},
               {&kLin, kvsvReadFrameLINEx, kvErrNullArgument},
               {&kFlexRay, kvsvReadFrameFlexRayEx, kvErrNullArgument},
               {&kEthernet, kvsvReadFrameEthernetEx, kvErrInternal}};
  const uint8_t skip = 1, run = 0;
  for (const auto &c : cases) {
    SCOPED_TRACE(c.p->name);
    Open(*c.p);
    Send(1, 0);
    SvHandle &frames = arrays_->frames, &spares = arrays_->spares;
    Slot(reader_)->guard = 1;  // what comes before the guard ignores it
    EXPECT_EQ(c.p->read(reader_, 1, nullptr, &spares, 0.0), c.noArray);
    EXPECT_EQ(c.p->read(reader_, 1, &frames, nullptr, 0.0), c.noArray);
    EXPECT_EQ(c.ex(reader_, 1, nullptr, nullptr, &skip, 0.0), 0);
    EXPECT_EQ(Read(1), kvErrSessionBusy);
    Slot(reader_)->guard = 0;
    // The host refuses the second payload handle: the first stays among the spares.
    svsimFailAllocAt(4);
    EXPECT_EQ(Read(3), kvErrOutputMemory);
    EXPECT_EQ(Frames(), 0);
    EXPECT_EQ(Count(spares), 1);
    EXPECT_EQ(Slot(reader_)->cachedCount, kUnknown);
    ASSERT_EQ(c.ex(reader_, 1, &frames, &spares, &run, 0.0), 0);
    EXPECT_EQ(Frames(), 1);
  }
}

TEST_F(FrameTest, ReadOfFlexRayWhoseLimitCannotBeLearntIsClosedToLaterCalls) {
  Open(kFlexRay);
  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropSession_PayldLenMax, kvsimErrInternal, 1), 0);
  EXPECT_EQ(Read(1), kvsimErrInternal);
  EXPECT_EQ(Read(1), kvErrSessionBusy);
  EXPECT_EQ(kvsimCountCalls("kvhdnReadFrame"), 0);
}

TEST_F(FrameTest, ReadOfEthernetGivesTimesWordAndFlagsAndCutsAtTheLimit) {
  Open(kEthernet);
  const uint8_t echo = 1;
  ASSERT_EQ(kvSetProperty(writer_, kvPropSession_IntfEchoTx, 1, &echo), 0);
  SetU32(reader_, kvPropSession_PayldLenMax, 60);
  kvsimSetClock(116444736000000000ull + 10002500000ull);  // 1000.25 s past 1970
  Send(1, 0);
  ASSERT_EQ(Read(1), 0);
  std::memset(static_cast<uint8_t *>(*arrays_->frames) + 8 + 44, 0xFF, 2);  // Reserved
  Send(2, 1, 100);
  ASSERT_EQ(Read(2), 0);
  ASSERT_EQ(Frames(), 2);
  for (int32_t i = 0; i < 2; ++i) {
    SCOPED_TRACE(i);
    for (uint32_t at : {0u, 16u}) {
      EXPECT_EQ(arrays_->At<uint64_t>(i, at), 4611686018500000000ull);
      EXPECT_EQ(arrays_->At<int64_t>(i, at + 8), 2082845800);
    }
    EXPECT_EQ(arrays_->At<uint32_t>(i, 40), static_cast<uint32_t>(i + 2));  // frame numbers
    EXPECT_EQ(arrays_->At<uint16_t>(i, 44), 0);
    EXPECT_EQ(svGetHandleSize(arrays_->Payload(i)), 67u);
    EXPECT_EQ(arrays_->PayloadOf(i), Pattern(60, uint8_t(1 + i)));  // the driver's length, cut
    EXPECT_EQ(Fields(i), (tBytes{1, 0, 0, 1}));  // an echo of the session's own frame, cut
  }
}

TEST_F(FrameTest, ReadRawGivesTheRecordsAsTheyAreInAHandleThatOnlyGrows) {
  Open(kCan);
  SvHandle raw = Keep(svNewHandleClr(4));
  const tBytes records = Join({Record(0x123, 4, 0, 0, 3, {1, 2, 3}, 24),
                               Record(0x20000456, 0, 0, 0, 8, Pattern(8, 9), 24)});
  Serve(records);
  ASSERT_EQ(kvsvReadFrameRaw(reader_, 100, &raw, -1.0), 0);
  EXPECT_EQ(svsimCleanupRegistrations(), 1);  // a time limit registers the abort
  EXPECT_EQ(PayloadBytes(raw), records);
  EXPECT_EQ(svGetHandleSize(raw), 107u);
  EXPECT_EQ(LastCall("kvReadFrame").size1, 100u);
  svsimResetCounters();
  ASSERT_EQ(kvsvReadFrameRaw(reader_, 48, &raw, 0.0), 0);
  EXPECT_EQ(svGetHandleSize(raw), 107u);
  EXPECT_EQ(svsimResizeCount(), 0u);
  // A failure forgets the size and leaves the count at zero.
  Serve(records);
  ASSERT_EQ(kvsimFailCall("kvReadFrame", kvsimErrInternal, 1), 0);
  EXPECT_EQ(kvsvReadFrameRaw(reader_, 24, &raw, 0.0), kvsimErrInternal);
  EXPECT_EQ(Count(raw), 0);
  EXPECT_EQ(Slot(reader_)->cachedSamples, kUnknown);
  EXPECT_EQ(kvsvReadFrameRaw(reader_, 1, nullptr, 0.0), kvErrNullArgument);
  // A read of all asks for the queue's bytes, learnt once.
  EXPECT_EQ(kvsvReadFrameRaw(reader_, -1, &raw, 1.0), kvErrInvalidTimeout);
  SetU32(reader_, kvPropSession_QueueSize, 4096);
  ASSERT_EQ(kvsvReadFrameRaw(reader_, -1, &raw, 0.0), 0);
  EXPECT_EQ(svGetHandleSize(raw), 4103u);
  EXPECT_EQ(LastCall("kvReadFrame").size1, 4096u);
  kvsimLogClear();
  ASSERT_EQ(kvsvReadFrameRaw(reader_, -1, &raw, 0.0), 0);
  EXPECT_EQ(kvsimLogCount(), 1);
}

struct tWriteCase {
  const char *name;
  const tProtocol *p;
  uint32_t property, value;  // set on the writer first, if not 0
  std::vector<tFrame> frames;
};

void *gNoBlock = nullptr;  // the master pointer of a handle with no block

// clang-format off
const tWriteCase kWrites[] = {
    {"classic CAN: Extended as identifier bit 29, Echo left out", &kCan, 0, 0, {
        {Record(0x20000100, 0, 0, 0, 2, {1, 2}, 24), 0x100, {0, 1, 1}, {1, 2}},
        {Record(0xC0000123, 0x22, 0, 0, 0, {}, 24), 0xC0000123, {0x22}, {}, kNoHandle},
        {Record(0x1FF, 0, 0, 0, 0, {}, 24), 0x1FF, {}, {9, 9}, kNoBlock}}},
    {"CAN FD: variable records", &kCan, kvPropSession_IntfCanIoMode, 1, {
        {Record(1, 0, 0, 0, 12, Pattern(12, 0), 32), 1, {}, Pattern(12, 0)},
        {Record(2, 0, 0, 0, 64, Pattern(64, 1), 80), 2, {}, Pattern(64, 1)},
        {Record(0, 0, 0, 0, 0, {}, 24), 0, {}, {}, kNoHandle}}},
    {"J1939: the long form past 255 bytes", &kCan, kvPropSession_ApplicationProtocol, 1, {
        {Record(0, 0xC0, 0, 1, 0, Pattern(256, 0), 272), 0, {5}, Pattern(256, 0)},
        {Record(0, 5, 0, 0, 255, Pattern(255, 1), 272), 0, {5}, Pattern(255, 1)},
        {Record(0, 0xC0, 0, 6, 0xF9, Pattern(1785, 2), 1808), 0, {5}, Pattern(1785, 2)}}},
    {"LIN: Info only under Flag0", &kLin, 0, 0, {
        {Record(0x3C, 0, 1, 0x55, 8, Pattern(8, 0), 24), 0x3C, {0, 0x55, 2, 1}, Pattern(8, 0)},
        {Record(0x12345678, 2, 0, 0, 1, {1}, 24), 0x12345678, {2, 0x77, 0, 0}, {1}},
        {Record(0, 0, 0, 0, 0, {}, 24), 0, {}, {}, kNoHandle}}},
    // The long form's Info counts in the step: 264 bytes of length, a 280-byte record.
    {"FlexRay: flag bits 0, 1, 2, 4 and 5", &kFlexRay, kvPropSession_PayldLenMax, 300, {
        {Record(0x123, 2, 0x37, 0x11, 16, Pattern(16, 0), 32), 0x123, {2, 0x11, 1, 2, 3, 4, 5, 6}, Pattern(16, 0)},
        {Record(0x7FF, 0, 0x22, 0, 0, {}, 24), 0x7FF, {0, 0, 0, 1, 0, 0, 9, 0}, {}, kNoHandle},
        {Record(0, 0xC0, 0, 1, 8, Pattern(8, 2), 280), 0, {0xC0, 1}, Pattern(8, 2)}}},
};
// clang-format on

TEST_F(FrameTest, WriteHandsTheDriverTheRecordsThatTheClustersSayAndSetsUpOnce) {
  for (const tWriteCase &c : kWrites) {
    SCOPED_TRACE(c.name);
    Writer(*c.p, c.property, c.value);
    cClusterArray clusters(3, *c.p);
    tBytes expected;
    for (int32_t i = 0; i < 3; ++i) {
      const tFrame &f = c.frames[i];
      clusters.Frame(i, f.id, f.fields);
      if (f.handle == kHandle) clusters.Payload(i, f.payload);
      if (f.handle == kNoBlock) clusters.Set(i, c.p->payloadOffset, &gNoBlock);
      expected = Join({expected, f.record});
    }
    ASSERT_EQ(c.p->write(writer_, clusters.handle(), 0.0), 0);
    EXPECT_EQ(LastWrite(), expected);
    // Set up once: a steady write is the driver's write alone.
    kvsimLogClear();
    ASSERT_EQ(c.p->write(writer_, clusters.handle(), 0.0), 0);
    EXPECT_EQ(kvsimLogCount(), 1);
  }
}

// Frames with identifiers 0x100 + i and payloads of `length` bytes.
void Fill(cClusterArray &clusters, int32_t count, size_t length) {
  for (int32_t i = 0; i < count; ++i)
    clusters.Frame(i, 0x100u + i).Payload(i, Pattern(length, uint8_t(i)));
}

TEST_F(FrameTest, WriteOverThePayloadLimitIsRefusedWholeAFailedReadOfTheLimitForgetsTheBuffer) {
  const struct {
    const tProtocol *p;
    uint32_t property;
    size_t over;  // one byte over the driver's default limit
  } cases[] = {{&kCan, 0, 9}, {&kCan, kvPropSession_ApplicationProtocol, 1786}, {&kLin, 0, 9}};
  for (const auto &c : cases) {
    SCOPED_TRACE(c.over);
    Writer(*c.p, c.property);
    cClusterArray three(3, *c.p), four(4, *c.p);
    Fill(three, 3, 8);
    three.Payload(2, Pattern(c.over, 0));
    kvsimLogClear();
    EXPECT_EQ(c.p->write(writer_, three.handle(), 0.0), kvErrPayloadTruncated);
    EXPECT_EQ(kvsimCountCalls("kvWriteFrame"), 0);
    EXPECT_EQ(Slot(writer_)->cachedCount, 3);  // the cache stays
    ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropSession_PayldLenMax, kvsimErrInternal, 1),
              0);
    EXPECT_EQ(c.p->write(writer_, four.handle(), 0.0), kvsimErrInternal);
    EXPECT_EQ(kvsimCountCalls("kvWriteFrame"), 0);
    EXPECT_EQ(Slot(writer_)->frameBuffer, nullptr);
    EXPECT_EQ(Slot(writer_)->cachedCount, kUnknown);
    EXPECT_EQ(Slot(writer_)->cachedSamples, kUnknown);
    EXPECT_EQ(c.p->write(writer_, three.handle(), 0.0), kvErrPayloadTruncated);  // set up again
    EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_PayldLenMax), 3);            // once per set-up
  }
}

TEST_F(FrameTest, WriteWhoseModeOrProtocolCannotBeReadTakesTheSimplerCanForm) {
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
    cClusterArray two(2, kCan);
    Fill(two, 2, c.length);
    kvsvWriteFrameCAN(writer_, two.handle(), 0.0);
    EXPECT_EQ(LastCall("kvWriteFrame").size1, c.size);
    EXPECT_EQ(Slot(writer_)->cachedCount, 2);
  }
}

TEST_F(FrameTest, WriteBufferGrowsToTheRecordsButNotPast32Bits) {
  // A FlexRay Info of 7 makes a record of 1816 bytes where 272 were planned; the driver then
  // refuses the length of 1800 that it claims.
  Writer(kFlexRay);
  cClusterArray flexRay(1, kFlexRay);
  flexRay.Frame(0, 0, {0xC0, 7}).Payload(0, Pattern(8, 0));
  EXPECT_EQ(kvsvWriteFrameFlexRay(writer_, flexRay.handle(), 0.0), kvsimErrInvalidFrame);
  EXPECT_EQ(LastCall("kvWriteFrame").size1, 1816u);

  // malloc cannot be made to fail here; a size that the slot cannot count is the memory failure
  // within reach.
  Writer(kCan, kvPropSession_IntfCanIoMode);
  SetU32(writer_, kvPropSession_PayldLenMax, 2040);  // 2056-byte records
  cClusterArray many(2088992, kCan);                 // 2088992 * 2056 > 2^32 - 1
  EXPECT_EQ(kvsvWriteFrameCAN(writer_, many.handle(), 0.0), kvErrOutOfMemory);
  EXPECT_EQ(Slot(writer_)->frameBufferSize, 0u);
  EXPECT_EQ(Slot(writer_)->cachedCount, kUnknown);
  EXPECT_EQ(Slot(writer_)->cachedSamples, kUnknown);
}

TEST_F(FrameTest, WritesThatNeedNoSlotGoStraightToTheDriver) {
  // Raw records as they are, on the session as it is.
  Writer(kCan);
  const tBytes records = Join({Record(0x20000100, 0x33, 0x00, 0x05, 8, Pattern(8, 4), 24),
                               Record(0x7FF, 0, 0, 0, 3, {1, 2, 3}, 24)});
  SvHandle data = Keep(ByteArray(records));
  ASSERT_EQ(kvsvWriteFrameRaw(writer_, data, 1.0), 0);
  EXPECT_EQ(LastWrite(), records);
  // A closed session, with no slot, is the driver's to report; with frames the table is asked
  // first.
  const uint32_t closed = reader_;
  ASSERT_EQ(kvClear(closed), 0);
  EXPECT_EQ(kvsvWriteFrameRaw(closed, data, 0.0), kvsimErrInvalidSession);
  for (const tProtocol *p : {&kCan, &kLin, &kFlexRay}) {
    SCOPED_TRACE(p->name);
    cClusterArray empty(0, *p), one(1, *p);
    kvsimLogClear();
    EXPECT_EQ(p->write(closed, empty.handle(), 2.5), kvsimErrInvalidSession);
    EXPECT_EQ(p->write(closed, nullptr, 0.0), kvsimErrInvalidSession);
    EXPECT_EQ(kvsimCountCalls("kvWriteFrame"), 2);
    EXPECT_EQ(LastCall("kvWriteFrame").size1, 0u);
    EXPECT_EQ(p->write(closed, one.handle(), 0.0), kvErrInvalidSession);
  }
  EXPECT_EQ(svsimCleanupRegistrations(), 4);  // the calls with a time limit
}

TEST_F(FrameTest, WriteOfEthernetSendsOnlyThePayloadsUnlessAReservedFieldIsSet) {
  Writer(kEthernet);
  cClusterArray three(3, kEthernet);
  three.Payload(0, Pattern(60, 1)).Payload(2, Pattern(1500, 3));  // element 1: an empty frame
  ASSERT_EQ(kvsvWriteFrameEthernet(writer_, three.handle(), 1.0), 0);
  EXPECT_EQ(svsimCleanupRegistrations(), 1);
  const std::vector<tBytes> sent{Pattern(60, 1), {}, Pattern(1500, 3)};
  ASSERT_EQ(kvsimLastEthernetWriteCount(writer_), 3);
  for (uint32_t i = 0; i < 3; ++i) {
    tBytes bytes(2000);
    bytes.resize(static_cast<size_t>(kvsimLastEthernetWrite(writer_, i, bytes.data(), 2000)));
    EXPECT_EQ(bytes, sent[i]);
  }
  // Reserved set in the last element keeps every frame off the bus.
  three.Set<uint16_t>(2, 44, 0x0100);
  kvsimLogClear();
  EXPECT_EQ(kvsvWriteFrameEthernet(writer_, three.handle(), 0.0), kvErrEthernetFrameSize);
  EXPECT_EQ(kvsimCountCalls("kvhdnWriteFrameEthernet"), 0);
  // A missing array is reported before the guard is tried.
  cFakeErrorLog log;
  Slot(writer_)->guard = 1;
  EXPECT_EQ(kvsvWriteFrameEthernet(writer_, nullptr, 0.0), kvErrInternal);
  Slot(writer_)->guard = 0;
  EXPECT_EQ(log.Records().size(), 1u);
}

}  // namespace
