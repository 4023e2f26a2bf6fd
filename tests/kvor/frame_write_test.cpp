// Writes are checked whole before anything goes out, and never read past their buffer.
#include <sys/mman.h>
#include <unistd.h>

#include <algorithm>
#include <cmath>

#include "frame_test_support.h"

namespace {

using KvorFrameWrite = KvorTest;

// Bytes that end where an unreadable page begins, so that a read past them faults.
class PageEnd {
 public:
  explicit PageEnd(const std::vector<uint8_t> &bytes) {
    page_ = static_cast<size_t>(sysconf(_SC_PAGESIZE));
    base_ = static_cast<uint8_t *>(
        mmap(nullptr, 2 * page_, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0));
    EXPECT_NE(base_, MAP_FAILED);
    EXPECT_EQ(mprotect(base_ + page_, page_, PROT_NONE), 0);
    at_ = base_ + page_ - bytes.size();
    std::copy(bytes.begin(), bytes.end(), at_);
  }
  ~PageEnd() { munmap(base_, 2 * page_); }
  const uint8_t *data() const { return at_; }

 private:
  size_t page_ = 0;
  uint8_t *base_ = nullptr;
  uint8_t *at_ = nullptr;
};

TEST_F(KvorFrameWrite, AMalformedBufferIsRefusedWholeAndReadNoFurtherThanItsEnd) {
  struct Case {
    const char *name;
    const char *interfaceName;
    uint32_t canIoMode;
    std::vector<uint8_t> bytes;
  };
  std::vector<uint8_t> tooLongFixed = Pack({{1, {1}}, {2, Pattern(8, 0)}}, true);
  tooLongFixed[24 + 15] = 9;
  std::vector<uint8_t> claimsMore = Pack({{1, {1}}, {2, Pattern(16, 0)}});
  claimsMore[24 + 15] = 17;  // 17 bytes need 40, and the buffer ends after 32
  std::vector<uint8_t> longType = Pack({{1, Pattern(8, 0), 0xC0}});
  longType[14] = 1;  // 264 bytes in a record of 24
  std::vector<uint8_t> headerCut = Pack({{1, {1}}, {2, {2}}});
  headerCut.resize(24 + 10);
  std::vector<uint8_t> odd = Pack({{1, {1}}}, true);
  odd.push_back(0);
  const Case cases[] = {
      {"fixed size not a multiple of 24", "CAN1", 0, odd},
      {"fixed record over 8 bytes", "LIN1", 0, tooLongFixed},
      {"variable record past the end", "CAN1", 1, claimsMore},
      {"long record past the end", "FlexRay1", 0, longType},
      {"header past the end", "FlexRay1", 0, headerCut},
      {"payload over the maximum", "CAN1", 1, Pack({{1, Pattern(48, 0)}, {2, Pattern(56, 0)}})},
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(c.name);
    kvsimReset();
    const uint32_t writer = Create(c.interfaceName, kvMode_FrameOutQueued);
    const uint32_t own = Create(c.interfaceName, kvMode_FrameInQueued);
    SetEcho(writer);
    if (c.canIoMode != 0) {
      SetU32(writer, kvPropSession_IntfCanIoMode, c.canIoMode);
      SetU32(writer, kvPropSession_PayldLenMax, 48);
    }
    const std::vector<uint8_t> good = Pack({{9, {9}}}, true);
    ASSERT_EQ(kvWriteFrame(writer, good.data(), 24, 0.0), 0);
    const PageEnd bad(c.bytes);
    EXPECT_EQ(kvWriteFrame(writer, bad.data(), static_cast<uint32_t>(c.bytes.size()), 0.0),
              kvsimErrInvalidFrame);
    EXPECT_EQ(ReadU32(own, kvPropSession_NumPend), 1u) << "only the good write went out";
    std::vector<uint8_t> last(64);
    EXPECT_EQ(kvsimLastWrite(writer, last.data(), 64), 24) << "the last good write stays";
    EXPECT_EQ(last[8], 9);
  }
}

TEST_F(KvorFrameWrite, ASinkKeepsEveryWriteUncheckedAndSendsNothing) {
  const uint32_t writer = Create("CAN1", kvMode_FrameOutStream);
  const uint32_t reader = Create("CAN2", kvMode_FrameInStream);
  std::vector<uint8_t> bytes = Pack({{0x7, {1, 2}}}, true);
  bytes[15] = 40;  // a fixed record of 40 bytes, which a check refuses
  EXPECT_EQ(kvsimLastWrite(writer, nullptr, 0), 0) << "nothing written yet";
  ASSERT_EQ(kvsimSetWriteSink(writer, 1), 0);
  ASSERT_EQ(kvWriteFrame(writer, bytes.data(), static_cast<uint32_t>(bytes.size()), 0.0), 0);
  std::vector<uint8_t> copy(bytes.size());
  EXPECT_EQ(kvsimLastWrite(writer, copy.data(), static_cast<uint32_t>(copy.size())), 24);
  EXPECT_EQ(copy, bytes);
  uint8_t head[10] = {};
  EXPECT_EQ(kvsimLastWrite(writer, head, 10), 24) << "a short buffer gets the start";
  EXPECT_TRUE(std::equal(head, head + 10, bytes.begin()));
  EXPECT_EQ(kvsimLastWrite(reader, copy.data(), 1), -1) << "an input session writes nothing";
  uint32_t pending = 1;
  ASSERT_EQ(kvGetProperty(reader, kvPropSession_NumPend, sizeof pending, &pending), 0);
  EXPECT_EQ(pending, 0u) << "a sink delivers nothing";
  EXPECT_EQ(kvsimSetWriteSink(writer, 0), 0);
  EXPECT_EQ(kvWriteFrame(writer, bytes.data(), static_cast<uint32_t>(bytes.size()), 0.0),
            kvsimErrInvalidFrame);
  EXPECT_EQ(kvsimSetWriteSink(reader, 1), -1);
}

TEST_F(KvorFrameWrite, AnEthernetWriteIsRefusedWholeForAnyBadDescriptor) {
  const uint32_t writer = Create("ENET1", kvMode_FrameOutQueued);
  const uint32_t reader = Create("ENET1", kvMode_FrameInQueued);
  const std::vector<uint8_t> big = Pattern(1501, 0);
  const uint8_t small[] = {1, 2, 3};
  const EthernetOut tooLong[] = {Out(small, 3), Out(big.data(), 1501)};
  const EthernetOut nullData[] = {Out(small, 3), Out(nullptr, 3)};
  EXPECT_EQ(kvhdnWriteFrameEthernet(writer, tooLong, 2, 0.0), kvsimErrInvalidFrame);
  EXPECT_EQ(kvhdnWriteFrameEthernet(writer, nullData, 2, 0.0), kvsimErrInvalidFrame);
  EXPECT_EQ(kvhdnWriteFrameEthernet(writer, nullptr, 1, 0.0), kvsimErrNullPointer);
  EXPECT_EQ(ReadU32(reader, kvPropSession_NumPend), 0u);
  EXPECT_EQ(kvsimLastEthernetWriteCount(writer), 0);

  SetU32(writer, kvPropSession_PayldLenMax, 1501);
  const EthernetOut good[] = {Out(big.data(), 1501), Out(nullptr, 0), Out(small, 3)};
  ASSERT_EQ(kvhdnWriteFrameEthernet(writer, good, 3, 0.0), 0);
  EXPECT_EQ(ReadU32(reader, kvPropSession_NumPend), 3u);
  EXPECT_EQ(kvsimLastEthernetWriteCount(writer), 3);
  std::vector<uint8_t> copy(1600);
  EXPECT_EQ(kvsimLastEthernetWrite(writer, 0, copy.data(), 1600), 1501);
  EXPECT_EQ(std::vector<uint8_t>(copy.begin(), copy.begin() + 1501), big);
  EXPECT_EQ(kvsimLastEthernetWrite(writer, 1, copy.data(), 1600), 0);
  EXPECT_EQ(kvsimLastEthernetWrite(writer, 2, copy.data(), 2), 3);
  EXPECT_EQ(copy[0], 1);
  EXPECT_EQ(copy[1], 2);
  EXPECT_EQ(kvsimLastEthernetWrite(writer, 3, copy.data(), 1600), -1);
  // A descriptor without room takes the frame cut to nothing.
  copy.assign(4, 0xEE);
  EthernetSlot none = Room(copy.data(), 0);
  int32_t returned = 0;
  ASSERT_EQ(kvhdnReadFrameEthernet(reader, &none, 1, &returned, 0.0), 0);
  ASSERT_EQ(returned, 1);
  EXPECT_EQ(none.length, 0u);
  EXPECT_EQ(none.flags, 0x8u) << "bit 3: cut";
  EXPECT_EQ(none.wireLength, 1501u);
  EXPECT_EQ(copy[0], 0xEE) << "nothing stored without room";
}

TEST_F(KvorFrameWrite, WithTheLogOffCallsWorkAndLeaveNoRecordUntilAReset) {
  const uint32_t writer = Create("CAN1", kvMode_FrameOutStream);
  const uint32_t reader = Create("CAN2", kvMode_FrameInStream);
  kvsimLogClear();
  kvsimSetCallLog(0);
  const std::vector<uint8_t> one = Pack({{5, {5}}}, true);
  ASSERT_EQ(kvWriteFrame(writer, one.data(), 24, 0.0), 0);
  EXPECT_EQ(Drain(reader).size(), 1u);
  EXPECT_EQ(kvsimLogCount(), 0);
  kvsimReset();
  EXPECT_EQ(kvWriteFrame(writer, one.data(), 24, 0.0), kvsimErrInvalidSession);
  EXPECT_EQ(kvsimCountCalls("kvWriteFrame"), 1) << "a reset turns the log on";
}

}  // namespace
