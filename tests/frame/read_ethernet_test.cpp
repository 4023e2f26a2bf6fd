// Ethernet frame reads through the library against the driver stand-in's ENET1, which hears what
// it sends: the driver writes each frame straight into a host payload handle.
#include "frame/frame_read_support.h"
#include "support/fake_error_log.h"

namespace {

using namespace kvsvtest;
using nKVSVAPI100::kUnknown;

// tFrameClusterEthernet: the second timestamp, Word, Reserved, then Flag0 to Flag3.
constexpr uint32_t kSecond = 16, kWord = 40, kReserved = 44, kFlag0 = 46;

struct tWriteDescriptor {
  uint64_t data;
  uint32_t length;
  uint32_t padding;
};

class ReadEthernet : public FrameReadTest {
 protected:
  ReadEthernet() : FrameReadTest(kvsvReadFrameEthernet, 56, 32) {}
  void SetUp() override {
    FrameReadTest::SetUp();
    Bus("ENET1", "ENET1");
  }
  void Send(const std::vector<tBytes> &payloads) {
    std::vector<tWriteDescriptor> descriptors;
    for (const tBytes &p : payloads)
      descriptors.push_back({reinterpret_cast<uintptr_t>(p.data()), uint32_t(p.size()), 0});
    ASSERT_EQ(kvhdnWriteFrameEthernet(writer_, descriptors.data(),
                                      static_cast<uint32_t>(descriptors.size()), 0.0),
              0);
  }
};

TEST_F(ReadEthernet, FramesOfSixtyAndFifteenHundredBytes) {
  const uint8_t echo = 1;
  ASSERT_EQ(kvSetProperty(writer_, kvPropSession_IntfEchoTx, 1, &echo), 0);
  kvsimSetClock(116444736000000000ull + 10002500000ull);  // 1000.25 s past 1970
  Send({Pattern(60, 1), Pattern(1500, 2)});
  ASSERT_EQ(Read(2), 0);
  ASSERT_EQ(Count(frames_), 2);
  for (int32_t i = 0; i < 2; ++i) {
    SCOPED_TRACE(i);
    for (uint32_t offset : {0u, kSecond}) ExpectTime(i, offset, 4611686018500000000ull, 2082845800);
    EXPECT_EQ(At<uint32_t>(i, kWord), static_cast<uint32_t>(i + 1));  // frame numbers
    EXPECT_EQ(At<uint16_t>(i, kReserved), 0);
    EXPECT_EQ(Bytes(i, kFlag0, 4), (tBytes{1, 0, 0, 0}));  // an echo of the session's own frame
    EXPECT_GE(svGetHandleSize(Payload(i)), 1507u);
  }
  EXPECT_EQ(PayloadOf(0), Pattern(60, 1));
  EXPECT_EQ(PayloadOf(1), Pattern(1500, 2));
}

TEST_F(ReadEthernet, CutFrameKeepsTheDriversLengthAndReservedIsCleared) {
  SetU32(reader_, kvPropSession_PayldLenMax, 60);
  Send({Pattern(10, 0)});
  ASSERT_EQ(Read(1), 0);
  std::memset(static_cast<uint8_t *>(*frames_) + 8 + kReserved, 0xFF, 2);
  Send({Pattern(100, 5)});
  ASSERT_EQ(Read(1), 0);
  EXPECT_EQ(PayloadOf(0), Pattern(60, 5));
  EXPECT_EQ(Bytes(0, kFlag0, 4), (tBytes{0, 0, 0, 1}));
  EXPECT_EQ(At<uint16_t>(0, kReserved), 0);
  EXPECT_EQ(svGetHandleSize(Payload(0)), 67u);
}

TEST_F(ReadEthernet, NegativeCountReadsWhatIsPendingNow) {
  Send({Pattern(1, 1), Pattern(2, 2), Pattern(3, 3)});
  EXPECT_EQ(Read(-1, 2.0), kvErrInvalidTimeout);
  EXPECT_EQ(frames_, nullptr);
  EXPECT_EQ(kvsimCountCalls("kvhdnReadFrameEthernet"), 0);
  ASSERT_EQ(Read(-1), 0);
  EXPECT_EQ(Count(frames_), 3);
  EXPECT_EQ(PayloadOf(2), Pattern(3, 3));
  EXPECT_EQ(LastCallOf("kvhdnReadFrameEthernet").size1, 3u);
}

TEST_F(ReadEthernet, HandlesGoToSparesAndComeBackLastInFirstOutWithNoAllocation) {
  Send({Pattern(4, 0), Pattern(4, 1), Pattern(4, 2)});
  ASSERT_EQ(Read(3), 0);
  const SvHandle second = Payload(1), third = Payload(2);
  svsimResetCounters();
  kvsimLogClear();
  Send({Pattern(4, 3)});
  ASSERT_EQ(Read(3), 0);
  EXPECT_EQ(Count(frames_), 1);
  ASSERT_EQ(Count(spares_), 2);
  EXPECT_EQ(SpareAt(spares_, 0), second);
  EXPECT_EQ(SpareAt(spares_, 1), third);
  Send({Pattern(4, 4), Pattern(4, 5), Pattern(4, 6)});
  ASSERT_EQ(Read(3), 0);
  EXPECT_EQ(Count(frames_), 3);
  EXPECT_EQ(Payload(1), third);
  EXPECT_EQ(Payload(2), second);
  EXPECT_EQ(PayloadOf(2), Pattern(4, 6));
  EXPECT_EQ(svsimAllocCount() + svsimResizeCount(), 0u);
  EXPECT_EQ(kvsimCountCalls("kvhdnReadFrameEthernet"), 2);
  EXPECT_EQ(kvsimCountCalls("kvGetProperty"), 0);

  // A read of one hands elements 1 and 2 back in index order; spares taken for frames that do
  // not come then stay in their elements, above the count, the top of the stack first.
  Send({Pattern(4, 7)});
  ASSERT_EQ(Read(1), 0);
  ASSERT_EQ(Count(spares_), 2);
  EXPECT_EQ(SpareAt(spares_, 0), third);
  EXPECT_EQ(SpareAt(spares_, 1), second);
  Send({Pattern(4, 8)});
  ASSERT_EQ(Read(3), 0);
  EXPECT_EQ(Count(frames_), 1);
  EXPECT_EQ(Count(spares_), 0);
  EXPECT_EQ(Payload(1), second);
  EXPECT_EQ(Payload(2), third);
}

TEST_F(ReadEthernet, FailedReadEmptiesTheArrayIntoTheSpares) {
  Send({Pattern(8, 0), Pattern(8, 1)});
  ASSERT_EQ(Read(2), 0);
  const SvHandle first = Payload(0), second = Payload(1);
  ASSERT_EQ(kvsimFailCall("kvhdnReadFrameEthernet", kvsimErrInternal, 1), 0);
  EXPECT_EQ(Read(2), kvsimErrInternal);
  EXPECT_EQ(Count(frames_), 0);
  ASSERT_EQ(Count(spares_), 2);
  EXPECT_EQ(SpareAt(spares_, 0), first);
  EXPECT_EQ(SpareAt(spares_, 1), second);
  EXPECT_EQ(Slot(reader_)->cachedCount, kUnknown);
}

TEST_F(ReadEthernet, NullArrayPointerIsReportedBeforeTheGuard) {
  cFakeErrorLog log;
  Slot(reader_)->guard = 1;
  EXPECT_EQ(kvsvReadFrameEthernet(reader_, 1, nullptr, &spares_, 0.0), kvErrInternal);
  EXPECT_EQ(kvsvReadFrameEthernet(reader_, 1, &frames_, nullptr, 0.0), kvErrInternal);
  EXPECT_EQ(log.Records().size(), 2u);
  EXPECT_EQ(Read(1), kvErrSessionBusy);
  const uint8_t skip = 1;
  EXPECT_EQ(kvsvReadFrameEthernetEx(reader_, 1, nullptr, nullptr, &skip, 0.0), 0);
  EXPECT_EQ(log.Records().size(), 2u);
  Slot(reader_)->guard = 0;
}

}  // namespace
