// The session property exports against the driver stand-in: the bytes each shape sends and
// reads, sub-indexed writes, the cluster name and object lists, the system handle kept across a
// reopen, the hidden switch, host refusals and the error information.
#include <gtest/gtest.h>

#include <cstring>
#include <functional>
#include <string>
#include <vector>

#include "core/host_handles.h"
#include "kvorproperties.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "property/property_value_io.h"
#include "session/kvorutility.h"
#include "session/system_manager.h"
#include "support/slot_fixture.h"
#include "svsim.h"

using namespace nKVSVAPI100;

namespace {

std::string Text(SvHandle string) {
  char text[256];
  svsimReadString(string, text, sizeof text);
  return text;
}

// The last logged call of `function`.
kvsimCallRecord LastCall(const char *function) {
  kvsimCallRecord found{};
  for (int32_t i = 0; i < kvsimLogCount(); ++i) {
    kvsimCallRecord entry{};
    if (kvsimLogEntry(i, &entry) == 1 && std::strcmp(entry.function, function) == 0) found = entry;
  }
  return found;
}

// A host number array of `count` elements of `width` bytes, count at byte 0.
SvHandle MakeNumberArray(const std::vector<uint32_t> &values, size_t width) {
  SvHandle array = svNewHandleClr(4 + values.size() * width + 4);
  ArrayCount(array) = static_cast<int32_t>(values.size());
  for (size_t i = 0; i < values.size(); ++i)
    std::memcpy(static_cast<char *>(*array) + 4 + i * width, &values[i], width);
  return array;
}

std::vector<uint32_t> ReadNumberArray(SvHandle array, size_t width) {
  std::vector<uint32_t> values(static_cast<size_t>(ArrayCount(array)));
  for (size_t i = 0; i < values.size(); ++i)
    std::memcpy(&values[i], static_cast<char *>(*array) + 4 + i * width, width);
  return values;
}

std::vector<std::string> ReadStringArray(SvHandle array) {
  std::vector<std::string> texts;
  for (int32_t i = 0; i < ArrayCount(array); ++i)
    texts.push_back(Text(ArrayData8<SvHandle>(array)[i]));
  return texts;
}

class SessionPropertyTest : public SlotFixture {
 protected:
  // A session of `mode` in database Powertrain, cluster Body.
  uint32_t MakeSessionIn(const char *list, uint32_t mode) {
    uint32_t session = 0;
    EXPECT_EQ(kvCreateSession("Powertrain", "Body", list, "CAN1", mode, &session), 0);
    PlaceSlot(session);
    return session;
  }

  SvHandle info_ = nullptr;

  void TearDown() override {
    if (info_ != nullptr) svDisposeHandle(info_);
    SlotFixture::TearDown();
  }
};

// Each scalar shape: what Set and Get hand the driver, and the value coming back unchanged.
template <class tValue>
using tSetForm = kvsvStatus (*)(uint32_t, uint32_t, const tValue *, SvHandle *);
template <class tValue>
using tGetForm = kvsvStatus (*)(uint32_t, uint32_t, tValue *, SvHandle *);

// Each scalar shape: what Set and Get hand the driver, and the value coming back unchanged.
struct tScalarCase {
  const char *shape;
  uint32_t id;
  uint32_t setBytes;
  uint32_t getBytes;
  std::function<void(uint32_t, SvHandle *)> roundTrip;
};

template <class tValue>
tScalarCase Scalar(const char *shape, uint32_t id, uint32_t setBytes, tSetForm<tValue> set,
                   tGetForm<tValue> get, tValue value) {
  return {shape, id, setBytes, sizeof(tValue), [=](uint32_t session, SvHandle *info) {
            // A U8 write reads a whole word from the pointer.
            alignas(8) unsigned char source[8] = {};
            std::memcpy(source, &value, sizeof value);
            ASSERT_EQ(set(session, id, reinterpret_cast<const tValue *>(source), info), 0);
            tValue read{};
            ASSERT_EQ(get(session, id, &read, info), 0);
            EXPECT_EQ(read, value);
          }};
}

TEST_F(SessionPropertyTest, ScalarShapesSendTheirByteCountsAndAllocateNothing) {
  const uint32_t session = MakeSession("A,B", 0);
  const tScalarCase cases[] = {
      Scalar<uint8_t>("U8", kvPropSession_IntfLINBreakLength, 4, kvsvSessionSetPropU8,
                      kvsvSessionGetPropU8, 0x5A),
      Scalar<uint32_t>("U32", kvPropSession_IntfOutStrmTimng, 4, kvsvSessionSetPropU32,
                       kvsvSessionGetPropU32, 0xDEADBEEFu),
      Scalar<uint64_t>("U64", kvPropSession_J1939Name, 8, kvsvSessionSetPropU64,
                       kvsvSessionGetPropU64, 0x0123456789ABCDEFull),
      Scalar<double>("F64", kvPropSession_J1939TimeoutT1, 8, kvsvSessionSetPropF64,
                     kvsvSessionGetPropF64, -2.5),
      Scalar<uint8_t>("Bool", kvPropSession_IntfEchoTx, 1, kvsvSessionSetPropBool,
                      kvsvSessionGetPropBool, 1),
  };
  for (const tScalarCase &c : cases) {
    SCOPED_TRACE(c.shape);
    kvsimLogClear();
    svsimResetCounters();
    c.roundTrip(session, &info_);
    const kvsimCallRecord set = LastCall("kvSetProperty");
    EXPECT_EQ(set.propertyId, c.id);
    EXPECT_EQ(set.size1, c.setBytes);
    EXPECT_EQ(LastCall("kvGetProperty").size1, c.getBytes);
    EXPECT_EQ(svsimAllocCount(), 0u);
    EXPECT_EQ(svsimResizeCount(), 0u);
    EXPECT_EQ(info_, nullptr);
  }
}

TEST_F(SessionPropertyTest, J1939AddressAndFillByteTravelAsWords) {
  const uint32_t session = MakeSession("A", 0);
  for (uint32_t id : {kvPropSession_J1939Address, kvPropSession_J1939FillByte}) {
    SCOPED_TRACE(id);
    const uint8_t address = 0xA7;
    kvsimLogClear();
    ASSERT_EQ(kvsvSessionSetPropU8(session, id, &address, &info_), 0);
    EXPECT_EQ(LastCall("kvSetProperty").size1, 4u);
    uint32_t stored = 0;
    ASSERT_EQ(kvGetProperty(session, id, 4, &stored), 0);
    EXPECT_EQ(stored, 0xA7u);

    const uint32_t wide = 0x1234u;
    ASSERT_EQ(kvSetProperty(session, id, 4, &wide), 0);
    uint8_t read = 0;
    ASSERT_EQ(kvsvSessionGetPropU8(session, id, &read, &info_), 0);
    EXPECT_EQ(LastCall("kvGetProperty").size1, 4u);
    EXPECT_EQ(read, 0x34);

    // The low byte of the untouched word is stored even when the read fails.
    kvsimFailProperty("kvGetProperty", id, kvsimErrInternal, 1);
    EXPECT_EQ(kvsvSessionGetPropU8(session, id, &read, &info_), kvsimErrInternal);
    EXPECT_EQ(read, 0);
  }
}

TEST_F(SessionPropertyTest, TimeIsConvertedWhateverTheReadGave) {
  const uint32_t session = MakeSession("A", 0);
  const uint32_t id = kvPropSession_IntfEnetAdjustLocalTime;
  // 3e9 s and a half after 1904-01-01, in 100 ns units since 1601.
  const uint64_t raw = 95616288000000000ull + 30000000000000000ull + 5000000ull;
  ASSERT_EQ(kvSetProperty(session, id, 8, &raw), 0);
  SvTime time{};
  ASSERT_EQ(kvsvSessionGetPropTime(session, id, &time, &info_), 0);
  EXPECT_EQ(time.seconds, 3000000000);
  EXPECT_NEAR(static_cast<double>(time.fraction), 9223372036854775808.0, 1e7);
  EXPECT_EQ(LastCall("kvGetProperty").size1, 8u);

  time = SvTime{7, 7};
  kvsimFailProperty("kvGetProperty", id, kvsimErrInternal, 1);
  EXPECT_EQ(kvsvSessionGetPropTime(session, id, &time, &info_), kvsimErrInternal);
  EXPECT_EQ(time.seconds, 0);
  EXPECT_EQ(time.fraction, 0u);
}

TEST_F(SessionPropertyTest, MissingSettersReportAndAnnotateWithoutADriverCall) {
  const uint32_t session = MakeSession("A", 0);
  kvsimLogClear();
  const SvTime time{1, 1};
  SvHandle timeInfo = nullptr;
  EXPECT_EQ(
      kvsvSessionSetPropTime(session, kvPropSession_IntfEnetAdjustLocalTime, &time, &timeInfo),
      kvErrInternal);
  SvHandle list = Keep(svsimMakeString("A"));
  EXPECT_EQ(kvsvSessionSetPropString1D(session, kvPropSession_List, &list, &info_), kvErrInternal);
  EXPECT_EQ(kvsimCountCalls("kvSetProperty"), 0);
  EXPECT_NE(Text(timeInfo).find("IntfEnetAdjustLocalTime"), std::string::npos);
  EXPECT_NE(Text(info_).find("\nProperty: List"), std::string::npos);
  Keep(timeInfo);
}

// Each array shape: the bytes it writes, the handle it sizes for a read and the elements back.
struct tArrayCase {
  const char *shape;
  size_t width;
  uint32_t slack;
  kvsvStatus (*set)(uint32_t, SvHandle *, uint32_t, SvHandle *, SvHandle *);
  kvsvStatus (*get)(uint32_t, SvHandle *, uint32_t, SvHandle *, SvHandle *);
};

const tArrayCase kArrayCases[] = {
    {"U8_1D", 1, 7, kvsvSessionSetPropExU8_1D, kvsvSessionGetPropExU8_1D},
    {"U16_1D", 2, 6, kvsvSessionSetPropExU16_1D, kvsvSessionGetPropExU16_1D},
    {"U32_1D", 4, 4, kvsvSessionSetPropExU32_1D, kvsvSessionGetPropExU32_1D},
};

TEST_F(SessionPropertyTest, ArrayShapesRoundTripThroughTheSizeProtocol) {
  const uint32_t session = MakeSession("A", 0);
  const uint32_t id = kvPropSession_IntfCustCodeData;
  for (const tArrayCase &c : kArrayCases) {
    SCOPED_TRACE(c.shape);
    const std::vector<uint32_t> values = {0x01, 0x7F, 0xFE};
    SvHandle source = Keep(MakeNumberArray(values, c.width));
    kvsimLogClear();
    ASSERT_EQ(c.set(session, nullptr, id, &source, &info_), 0);
    EXPECT_EQ(LastCall("kvSetProperty").size1, 3 * c.width);

    SvHandle read = nullptr;
    ASSERT_EQ(c.get(session, nullptr, id, &read, &info_), 0);
    Keep(read);
    EXPECT_EQ(svGetHandleSize(read), 3 * c.width + c.slack);
    EXPECT_EQ(LastCall("kvGetProperty").size1, 3 * c.width);
    EXPECT_EQ(ReadNumberArray(read, c.width), values);
    EXPECT_EQ(info_, nullptr);
  }
}

TEST_F(SessionPropertyTest, ArrayReadStoresTheCountAfterAFailedReadButNotAfterAFailedSize) {
  const uint32_t session = MakeSession("A", 0);
  const uint32_t id = kvPropSession_IntfCustCodeData;
  const uint8_t bytes[8] = {1, 2, 3, 4, 5, 6, 7, 8};
  ASSERT_EQ(kvSetProperty(session, id, 8, bytes), 0);
  for (const tArrayCase &c : kArrayCases) {
    SCOPED_TRACE(c.shape);
    SvHandle read = Keep(MakeNumberArray({9}, c.width));
    kvsimFailProperty("kvGetProperty", id, kvsimErrInternal, 1);
    EXPECT_EQ(c.get(session, nullptr, id, &read, &info_), kvsimErrInternal);
    EXPECT_EQ(ArrayCount(read), static_cast<int32_t>(8 / c.width));

    ArrayCount(read) = 1;
    const size_t before = svGetHandleSize(read);
    kvsimFailProperty("kvGetPropertySize", id, kvsimErrInternal, 1);
    EXPECT_EQ(c.get(session, nullptr, id, &read, &info_), kvsimErrInternal);
    EXPECT_EQ(ArrayCount(read), 1);
    EXPECT_EQ(svGetHandleSize(read), before);
  }
}

// A failed text read keeps the string's count while the block still holds that many bytes;
// after the resize left it smaller, the string is empty instead of reaching past its block.
TEST_F(SessionPropertyTest, AFailedStringReadNeverCountsPastTheBlock) {
  const uint32_t session = MakeSession("A", 0);
  const struct {
    const char *held;
    int32_t count;
  } cases[] = {{"CA", 2}, {"a text much longer than the name of an interface", 0}};
  for (const auto &c : cases) {
    SCOPED_TRACE(c.held);
    SvHandle read = Keep(svsimMakeString(c.held));
    kvsimFailProperty("kvGetProperty", kvPropSession_IntfName, kvsimErrInternal, 1);
    EXPECT_EQ(kvsvSessionGetPropString(session, kvPropSession_IntfName, &read, &info_),
              kvsimErrInternal);
    EXPECT_EQ(static_cast<SvStr *>(*read)->cnt, c.count);
    EXPECT_LE(static_cast<size_t>(static_cast<SvStr *>(*read)->cnt) + 4, svGetHandleSize(read));
  }
}

TEST_F(SessionPropertyTest, EmptyArraysAreSentAsNothing) {
  const uint32_t session = MakeSession("A", 0);
  const uint32_t id = kvPropSession_IntfCustCodeData;
  SvHandle empty = Keep(MakeNumberArray({}, 1));
  SvHandle none = nullptr;
  for (const tArrayCase &c : kArrayCases) {
    for (SvHandle *source : {static_cast<SvHandle *>(nullptr), &none, &empty}) {
      SCOPED_TRACE(c.shape);
      kvsimLogClear();
      ASSERT_EQ(c.set(session, nullptr, id, source, &info_), 0);
      EXPECT_EQ(LastCall("kvSetProperty").size1, 0u);
      SvHandle read = nullptr;
      ASSERT_EQ(c.get(session, nullptr, id, &read, &info_), 0);
      EXPECT_EQ(ArrayCount(Keep(read)), 0);
    }
  }
}

TEST(PropertySourceTest, EmptySourcesGiveNoBufferOrASingleNul) {
  void *noBlock = nullptr;
  SvHandle blockless = &noBlock;
  SvHandle none = nullptr;
  SvHandle zero = MakeNumberArray({}, 2);
  SvHandle negative = MakeNumberArray({}, 2);
  ArrayCount(negative) = -3;
  SvHandle emptyText = svsimMakeString("");
  for (SvHandle *value : {static_cast<SvHandle *>(nullptr), &none, &blockless, &zero, &negative}) {
    const tPropertySource array = ArraySource<uint16_t>(value);
    EXPECT_EQ(array.size, 0u);
    EXPECT_EQ(array.buffer, nullptr);
  }
  for (SvHandle *value : {static_cast<SvHandle *>(nullptr), &none, &blockless, &emptyText}) {
    const cTextSource text(value);
    EXPECT_EQ(text.status(), 0);
    ASSERT_EQ(text.source().size, 1u);
    EXPECT_EQ(*static_cast<const char *>(text.source().buffer), '\0');
  }
  SvHandle filled = MakeNumberArray({5, 6}, 2);
  EXPECT_EQ(ArraySource<uint16_t>(&filled).size, 4u);
  EXPECT_EQ(ArraySource<uint16_t>(&filled).buffer, static_cast<char *>(*filled) + 4);
  SvHandle word = svsimMakeString("abc");
  const cTextSource text(&word);
  ASSERT_EQ(text.source().size, 4u);
  EXPECT_EQ(std::memcmp(text.source().buffer, "abc", 4), 0);
  for (SvHandle h : {zero, negative, emptyText, filled, word}) svDisposeHandle(h);
}

TEST_F(SessionPropertyTest, StringsRoundTripWithTheirNulAndTextLength) {
  const uint32_t session = MakeSession("A", 0);
  const uint32_t id = kvPropSession_IntfCustCodeFile;
  SvHandle source = Keep(svsimMakeString("code.bin"));
  kvsimLogClear();
  ASSERT_EQ(kvsvSessionSetPropString(session, id, &source, &info_), 0);
  EXPECT_EQ(LastCall("kvSetProperty").size1, 9u);
  SvHandle read = nullptr;
  ASSERT_EQ(kvsvSessionGetPropString(session, id, &read, &info_), 0);
  EXPECT_EQ(Text(Keep(read)), "code.bin");

  // The length follows the text, not the size the driver gave.
  ASSERT_EQ(kvSetProperty(session, id, 8, "ab\0cdef"), 0);
  ASSERT_EQ(kvsvSessionGetPropString(session, id, &read, &info_), 0);
  EXPECT_EQ(static_cast<SvStr *>(*read)->cnt, 2);
  EXPECT_EQ(svGetHandleSize(read), 8u + 7u);

  SvHandle empty = Keep(svsimMakeString(""));
  for (SvHandle *value : {static_cast<SvHandle *>(nullptr), &empty}) {
    kvsimLogClear();
    ASSERT_EQ(kvsvSessionSetPropString(session, id, value, &info_), 0);
    EXPECT_EQ(LastCall("kvSetProperty").size1, 1u);
    ASSERT_EQ(kvsvSessionGetPropString(session, id, &read, &info_), 0);
    EXPECT_EQ(static_cast<SvStr *>(*read)->cnt, 0);
  }
  EXPECT_EQ(info_, nullptr);
}

TEST_F(SessionPropertyTest, ClusterNameJoinsDatabaseAndCluster) {
  const uint32_t session = MakeSessionIn("A", 0);
  SvHandle read = nullptr;
  ASSERT_EQ(kvsvSessionGetPropString(session, kvPropSession_ClusterName, &read, &info_), 0);
  Keep(read);
  EXPECT_EQ(Text(read), "Powertrain.Body");
  EXPECT_EQ(static_cast<SvStr *>(*read)->cnt, 15);

  kvsimFailProperty("kvGetPropertySize", kvPropSession_DatabaseName, kvsimErrInternal, 1);
  EXPECT_EQ(kvsvSessionGetPropString(session, kvPropSession_ClusterName, &read, &info_),
            kvsimErrInternal);
  EXPECT_EQ(Text(read), "Powertrain.Body");
}

TEST_F(SessionPropertyTest, ListsOfObjectsComeAsReferenceStringsInTheirModes) {
  const std::vector<std::string> references = {"Frm.Sig\nPowertrain.Body",
                                               "Frm.Two\nPowertrain.Body"};
  const struct {
    uint32_t mode;
    uint32_t id;
    bool answered;  // else the array stays as it was
  } cases[] = {
      {0, kvPropSession_List, true},
      {5, kvPropSession_List, true},
      {7, kvPropSession_List, false},
      {7, kvPropHidden_FrameList, true},
      {8, kvPropHidden_FrameList, true},
      {10, kvPropHidden_FrameList, true},
      {11, kvPropHidden_FrameList, true},
      {6, kvPropHidden_FrameList, false},
      {9, kvPropHidden_FrameList, false},
      {0, kvPropHidden_FrameList, false},
      {7, kvPropSession_IntfLINSchedNames, true},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << "mode " << c.mode << " id " << std::hex << c.id);
    const uint32_t session = MakeSessionIn("Frm.Sig,Frm.Two", c.mode);
    ASSERT_EQ(kvSetProperty(session, kvPropSession_IntfLINSchedNames, 16, "Frm.Sig,Frm.Two"), 0);
    SvHandle array = nullptr;
    ASSERT_EQ(CommaListToStringArray(std::vector<char>{'o', 'l', 'd', '\0'}.data(), &array, 0), 0);
    void *block = *array;
    ASSERT_EQ(kvsvSessionGetPropString1D(session, c.id, &array, &info_), 0);
    if (c.answered) {
      EXPECT_EQ(ReadStringArray(array), references);
    } else {
      EXPECT_EQ(*array, block);
      EXPECT_EQ(ReadStringArray(array), std::vector<std::string>{"old"});
    }
    DisposeHandleArray(&array);
  }
}

TEST_F(SessionPropertyTest, OtherStringListsAreSplitWithoutModeOrReference) {
  const uint32_t session = MakeSessionIn("A", 7);
  const uint32_t id = kvPropSession_IntfEnetStatsCounterNames;
  ASSERT_EQ(kvSetProperty(session, id, 10, "rx,tx,err"), 0);
  SvHandle array = nullptr;
  kvsimLogClear();
  ASSERT_EQ(kvsvSessionGetPropString1D(session, id, &array, &info_), 0);
  EXPECT_EQ(ReadStringArray(array), (std::vector<std::string>{"rx", "tx", "err"}));
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_Mode), 0);
  DisposeHandleArray(&array);
}

TEST_F(SessionPropertyTest, ListReadFailuresEndTheExport) {
  const uint32_t session = MakeSessionIn("A,B", 0);
  SvHandle array = nullptr;
  kvsimFailProperty("kvGetProperty", kvPropSession_Mode, kvsimErrInternal, 1);
  EXPECT_EQ(kvsvSessionGetPropString1D(session, kvPropSession_List, &array, &info_),
            kvsimErrInternal);
  EXPECT_EQ(array, nullptr);
  EXPECT_NE(Text(info_).find("Property: List"), std::string::npos);

  // The cluster name's own failure is annotated first, then the list's over it.
  SvHandle first = nullptr;
  std::swap(first, info_);
  Keep(first);
  kvsimFailProperty("kvGetPropertySize", kvPropSession_DatabaseName, kvsimErrInternal, 1);
  const uint64_t liveBefore = svsimLiveHandles();
  EXPECT_EQ(kvsvSessionGetPropString1D(session, kvPropSession_List, &array, &info_),
            kvsimErrInternal);
  EXPECT_EQ(array, nullptr);
  EXPECT_NE(Text(info_).find("Property: List"), std::string::npos);
  // The cluster name's annotation and the temporary's handle are left: two annotations, and the
  // temporary disposed.
  EXPECT_EQ(svsimLiveHandles(), liveBefore + 2);
  Keep(info_);
  info_ = nullptr;
}

// Writes addressed to one entry of the session's list, by form.
TEST_F(SessionPropertyTest, SubPropertiesGoToTheNamedEntry) {
  const uint32_t session = MakeSession("Frm.Sig,Frm2.Sig,Frm3,Other", 0);
  SvHandle byName = Keep(svsimMakeString("Frm2"));
  SvHandle byIndex = Keep(svsimMakeString("3"));
  const uint32_t u32 = 17;
  const double f64 = 0.25;
  SvHandle text = Keep(svsimMakeString("0x1F"));
  SvHandle bytes = Keep(MakeNumberArray({1, 2}, 1));
  SvHandle words = Keep(MakeNumberArray({1, 2}, 2));
  SvHandle longs = Keep(MakeNumberArray({1, 2}, 4));
  using tSet = std::function<kvsvStatus(SvHandle *, uint32_t)>;
  const tSet setU32 = [&](SvHandle *sub, uint32_t id) {
    return kvsvSessionSetPropExU32(session, sub, id, &u32, &info_);
  };
  const tSet setF64 = [&](SvHandle *sub, uint32_t id) {
    return kvsvSessionSetPropExF64(session, sub, id, &f64, &info_);
  };
  const struct tCase {
    uint32_t id;
    uint32_t size;
    tSet set;
  } cases[] = {
      {kvPropSessionSub_SkipNCyclicFrames, 4, setU32},
      {kvPropSessionSub_OutputQueueUpdateFreq, 4, setU32},
      {kvPropSessionSub_LINTxNCorruptedChksums, 4, setU32},
      {kvPropHidden_FrameSub, 4, setU32},
      {kvPropSessionSub_CANStartTimeOff, 8, setF64},
      {kvPropSessionSub_CANTxTime, 8, setF64},
      {kvPropSessionSub_J1939_AddrFilter, 5,
       [&](SvHandle *sub, uint32_t id) {
         return kvsvSessionSetPropExString(session, sub, id, &text, &info_);
       }},
      {kvPropSessionSub_CustCodeData, 2,
       [&](SvHandle *sub, uint32_t id) {
         return kvsvSessionSetPropExU8_1D(session, sub, id, &bytes, &info_);
       }},
      {kvPropSessionSub_CustCodeData, 4,
       [&](SvHandle *sub, uint32_t id) {
         return kvsvSessionSetPropExU16_1D(session, sub, id, &words, &info_);
       }},
      {kvPropSessionSub_CustCodeData, 8,
       [&](SvHandle *sub, uint32_t id) {
         return kvsvSessionSetPropExU32_1D(session, sub, id, &longs, &info_);
       }},
  };
  for (const tCase &c : cases) {
    SCOPED_TRACE(testing::Message() << std::hex << c.id << " size " << c.size);
    for (auto [sub, index] :
         {std::pair<SvHandle *, uint32_t>{&byName, 1}, {&byIndex, 3}, {nullptr, 0}}) {
      kvsimLogClear();
      ASSERT_EQ(c.set(sub, c.id), 0);
      EXPECT_EQ(kvsimCountCalls("kvSetProperty"), 0);
      const kvsimCallRecord call = LastCall("kvSetSubProperty");
      EXPECT_EQ(call.propertyId, c.id);
      EXPECT_EQ(call.size2, index);
      EXPECT_EQ(call.size1, c.size);
      std::vector<char> stored(c.size + 1);
      EXPECT_EQ(kvGetSubProperty(session, index, c.id, c.size + 1, stored.data()), 0);
    }
  }
  // The plain forms address entry 0.
  kvsimLogClear();
  ASSERT_EQ(kvsvSessionSetPropU32(session, kvPropSessionSub_SkipNCyclicFrames, &u32, &info_), 0);
  EXPECT_EQ(LastCall("kvSetSubProperty").size2, 0u);
  // Other identifiers ignore the entry and go to the session.
  kvsimLogClear();
  ASSERT_EQ(kvsvSessionSetPropExU32(session, &byName, kvPropSession_IntfOutStrmTimng, &u32, &info_),
            0);
  EXPECT_EQ(kvsimCountCalls("kvSetSubProperty"), 0);
  EXPECT_EQ(kvsimCountCalls("kvSetProperty"), 1);
  EXPECT_EQ(info_, nullptr);
}

TEST_F(SessionPropertyTest, BadEntryNamesEndTheWriteAnnotated) {
  const uint32_t session = MakeSession("Frm.Sig,Other", 0);
  const uint32_t value = 1;
  const struct {
    const char *text;
    kvsvStatus status;
  } cases[] = {{"3x", kvErrSubIdNumberInvalid}, {"Nope", kvErrSubIdNameUnknown}};
  for (const auto &c : cases) {
    SCOPED_TRACE(c.text);
    SvHandle sub = Keep(svsimMakeString(c.text));
    kvsimLogClear();
    SvHandle info = nullptr;
    EXPECT_EQ(
        kvsvSessionSetPropExU32(session, &sub, kvPropSessionSub_SkipNCyclicFrames, &value, &info),
        c.status);
    EXPECT_EQ(kvsimCountCalls("kvSetSubProperty"), 0);
    EXPECT_NE(Text(Keep(info)).find("Property: SkipNCyclicFrames"), std::string::npos);
  }
}

TEST_F(SessionPropertyTest, HiddenSwitchNeverReachesTheDriver) {
  const uint32_t session = MakeSession("A", 0);
  for (uint32_t value : {1u, 0u}) {
    kvsimLogClear();
    EXPECT_EQ(kvsvSessionSetPropU32(session, kvPropHidden_ReportImplicitClose, &value, &info_), 0);
    EXPECT_EQ(gReportImplicitClose.load(), value);
    EXPECT_EQ(kvsimLogCount(), 0);
  }
}

TEST_F(SessionPropertyTest, AnOldSystemHandleReachesTheSystemOpenNow) {
  uint32_t system = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  const uint32_t first = gSystemManager.firstSystemHandle;
  ASSERT_EQ(kvsvSystemClose(system), 0);
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  ASSERT_NE(system, first);

  kvsimLogClear();
  uint32_t major = 0;
  EXPECT_EQ(kvsvSessionGetPropU32(first, kvPropSys_VerMajor, &major, &info_), 0);
  EXPECT_EQ(major, KVSIM_VERSION_MAJOR);
  EXPECT_EQ(LastCall("kvGetProperty").object, system);
  SvHandle devices = nullptr;
  EXPECT_EQ(kvsvSessionGetPropU32_1D(first, kvPropSys_DevRefs, &devices, &info_), 0);
  EXPECT_EQ(ArrayCount(Keep(devices)), 2);
  EXPECT_EQ(LastCall("kvGetPropertySize").object, system);

  // Identifiers of other classes keep the handle they are given.
  kvsimLogClear();
  EXPECT_NE(kvsvSessionGetPropU32(first, kvPropSession_Mode, &major, &info_), 0);
  EXPECT_EQ(LastCall("kvGetProperty").object, first);
  Keep(info_);
  info_ = nullptr;
  kvsvSystemManualClose(nullptr, nullptr);
}

TEST_F(SessionPropertyTest, HostRefusalsGiveNoMemoryAnnotated) {
  const uint32_t session = MakeSession("A", 0);
  const uint32_t file = kvPropSession_IntfCustCodeFile;
  SvHandle source = Keep(svsimMakeString("code.bin"));
  ASSERT_EQ(kvsvSessionSetPropString(session, file, &source, &info_), 0);
  const struct {
    kvsvStatus (*get)(uint32_t, SvHandle *, uint32_t, SvHandle *, SvHandle *);
    uint32_t id;
    bool existing;  // a resize refused, else a new handle
  } cases[] = {
      {kvsvSessionGetPropExU8_1D, file, false},
      {kvsvSessionGetPropExU8_1D, file, true},
      {kvsvSessionGetPropExString, file, false},
      {kvsvSessionGetPropExString, file, true},
      {kvsvSessionGetPropExString, kvPropSession_ClusterName, false},
      {kvsvSessionGetPropExString, kvPropSession_ClusterName, true},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << std::hex << c.id << (c.existing ? " resized" : " new"));
    SvHandle value = c.existing ? Keep(svsimMakeString("")) : nullptr;
    SvHandle info = nullptr;
    c.existing ? svsimFailResizeAt(1) : svsimFailAllocAt(1);
    EXPECT_EQ(c.get(session, nullptr, c.id, &value, &info), kvErrOutOfMemory);
    EXPECT_EQ(value == nullptr, !c.existing);
    EXPECT_NE(Text(Keep(info)).find("\nProperty: "), std::string::npos);
  }
}

TEST_F(SessionPropertyTest, StatusZeroLeavesInfoAloneAndEveryOtherStatusAnnotates) {
  const uint32_t session = MakeSession("A", 0);
  SvHandle earlier = Keep(svsimMakeString("earlier"));
  SvHandle info = earlier;
  const uint8_t flag = 1;
  ASSERT_EQ(kvsvSessionSetPropBool(session, kvPropSession_IntfEchoTx, &flag, &info), 0);
  EXPECT_EQ(info, earlier);
  EXPECT_EQ(Text(info), "earlier");

  // A warning is annotated as an error is; the handle that was there stays the caller's.
  kvsimFailProperty("kvSetProperty", kvPropSession_IntfEchoTx, 0x3FF62001, 1);
  EXPECT_EQ(kvsvSessionSetPropBool(session, kvPropSession_IntfEchoTx, &flag, &info), 0x3FF62001);
  EXPECT_NE(info, earlier);
  EXPECT_EQ(Text(Keep(info)), "\nProperty: IntfEchoTx");
  EXPECT_EQ(Text(earlier), "earlier");

  info = nullptr;
  uint32_t value = 0;
  EXPECT_EQ(kvsvSessionGetPropU32(session, 0x00101234u, &value, &info), kvsimErrPropertyUnknown);
  EXPECT_NE(Text(Keep(info)).find("00101234"), std::string::npos);
}

}  // namespace
