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
  for (int32_t i = 0; i < ArrayCount(array); ++i) texts.push_back(Text(ArrayData8<SvHandle>(array)[i]));
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
struct tScalarCase {
  const char *shape;
  uint32_t id;
  uint32_t setBytes;
  uint32_t getBytes;
  std::function<kvsvStatus(uint32_t, SvHandle *)> set;
  std::function<kvsvStatus(uint32_t, SvHandle *, uint64_t *)> get;
  uint64_t expected;
};

std::vector<tScalarCase> ScalarCases() {
  static uint32_t byteWord = 0x5Au;
  static uint32_t u32 = 0xDEADBEEFu;
  static uint64_t u64 = 0x0123456789ABCDEFull;
  static double f64 = -2.5;
  static uint8_t flag = 1;
  uint64_t f64Bits;
  std::memcpy(&f64Bits, &f64, sizeof f64Bits);
  return {
      {"U8", kvPropSession_IntfLINBreakLength, 4, 1,
       [](uint32_t s, SvHandle *info) {
         return kvsvSessionSetPropU8(s, kvPropSession_IntfLINBreakLength,
                                     reinterpret_cast<const uint8_t *>(&byteWord), info);
       },
       [](uint32_t s, SvHandle *info, uint64_t *out) {
         uint8_t v = 0;
         const kvsvStatus status = kvsvSessionGetPropU8(s, kvPropSession_IntfLINBreakLength, &v, info);
         *out = v;
         return status;
       },
       0x5A},
      {"U32", kvPropSession_IntfOutStrmTimng, 4, 4,
       [](uint32_t s, SvHandle *info) {
         return kvsvSessionSetPropU32(s, kvPropSession_IntfOutStrmTimng, &u32, info);
       },
       [](uint32_t s, SvHandle *info, uint64_t *out) {
         uint32_t v = 0;
         const kvsvStatus status = kvsvSessionGetPropU32(s, kvPropSession_IntfOutStrmTimng, &v, info);
         *out = v;
         return status;
       },
       0xDEADBEEFu},
      {"U64", kvPropSession_J1939Name, 8, 8,
       [](uint32_t s, SvHandle *info) {
         return kvsvSessionSetPropU64(s, kvPropSession_J1939Name, &u64, info);
       },
       [](uint32_t s, SvHandle *info, uint64_t *out) {
         return kvsvSessionGetPropU64(s, kvPropSession_J1939Name, out, info);
       },
       0x0123456789ABCDEFull},
      {"F64", kvPropSession_J1939TimeoutT1, 8, 8,
       [](uint32_t s, SvHandle *info) {
         return kvsvSessionSetPropF64(s, kvPropSession_J1939TimeoutT1, &f64, info);
       },
       [](uint32_t s, SvHandle *info, uint64_t *out) {
         double v = 0;
         const kvsvStatus status = kvsvSessionGetPropF64(s, kvPropSession_J1939TimeoutT1, &v, info);
         std::memcpy(out, &v, sizeof v);
         return status;
       },
       f64Bits},
      {"Bool", kvPropSession_IntfEchoTx, 1, 1,
       [](uint32_t s, SvHandle *info) {
         return kvsvSessionSetPropBool(s, kvPropSession_IntfEchoTx, &flag, info);
       },
       [](uint32_t s, SvHandle *info, uint64_t *out) {
         uint8_t v = 0;
         const kvsvStatus status = kvsvSessionGetPropBool(s, kvPropSession_IntfEchoTx, &v, info);
         *out = v;
         return status;
       },
       1},
  };
}

TEST_F(SessionPropertyTest, ScalarShapesSendTheirByteCountsAndAllocateNothing) {
  const uint32_t session = MakeSession("A,B", 0);
  for (const tScalarCase &c : ScalarCases()) {
    SCOPED_TRACE(c.shape);
    kvsimLogClear();
    svsimResetCounters();
    ASSERT_EQ(c.set(session, &info_), 0);
    uint64_t read = 0;
    ASSERT_EQ(c.get(session, &info_, &read), 0);
    EXPECT_EQ(read, c.expected);
    const kvsimCallRecord set = LastCall("kvSetProperty");
    EXPECT_EQ(set.propertyId, c.id);
    EXPECT_EQ(set.size1, c.setBytes);
    EXPECT_EQ(LastCall("kvGetProperty").size1, c.getBytes);
    EXPECT_EQ(svsimAllocCount(), 0u);
    EXPECT_EQ(svsimResizeCount(), 0u);
    EXPECT_EQ(info_, nullptr);
  }
}

TEST_F(SessionPropertyTest, ByteWriteSendsFourBytesFromTheCallersPointer) {
  const uint32_t session = MakeSession("A", 0);
  const uint8_t bytes[4] = {0x11, 0x22, 0x33, 0x44};
  ASSERT_EQ(kvsvSessionSetPropU8(session, kvPropSession_IntfLINBreakLength, bytes, &info_), 0);
  uint32_t stored = 0;
  ASSERT_EQ(kvGetProperty(session, kvPropSession_IntfLINBreakLength, 4, &stored), 0);
  EXPECT_EQ(stored, 0x44332211u);
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
  EXPECT_EQ(kvsvSessionSetPropTime(session, kvPropSession_IntfEnetAdjustLocalTime, &time,
                                   &timeInfo),
            kvErrInternal);
  SvHandle list = Keep(svsimMakeString("A"));
  EXPECT_EQ(kvsvSessionSetPropString1D(session, kvPropSession_List, &list, &info_), kvErrInternal);
  EXPECT_EQ(kvsimLogCount(), 0);
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
  struct tCase {
    const char *name;
    uint32_t mode;
    uint32_t id;
    std::vector<std::string> expected;  // empty: the array stays as it was
  } cases[] = {
      {"list of a signal session", 0, kvPropSession_List, {"Frm.Sig\nPowertrain.Body", "Frm.Two\nPowertrain.Body"}},
      {"list of a frame session", 7, kvPropSession_List, {}},
      {"frame list of a frame session", 7, kvPropHidden_FrameList, {"Frm.Sig\nPowertrain.Body", "Frm.Two\nPowertrain.Body"}},
      {"frame list of an output frame session", 11, kvPropHidden_FrameList, {"Frm.Sig\nPowertrain.Body", "Frm.Two\nPowertrain.Body"}},
      {"frame list of a stream session", 6, kvPropHidden_FrameList, {}},
      {"frame list of a signal session", 0, kvPropHidden_FrameList, {}},
  };
  for (const tCase &c : cases) {
    SCOPED_TRACE(c.name);
    const uint32_t session = MakeSessionIn("Frm.Sig,Frm.Two", c.mode);
    SvHandle array = nullptr;
    ASSERT_EQ(CommaListToStringArray(std::vector<char>{'o', 'l', 'd', '\0'}.data(), &array, 0), 0);
    void *block = *array;
    ASSERT_EQ(kvsvSessionGetPropString1D(session, c.id, &array, &info_), 0);
    if (c.expected.empty()) {
      EXPECT_EQ(*array, block);
      EXPECT_EQ(ReadStringArray(array), std::vector<std::string>{"old"});
    } else {
      EXPECT_EQ(ReadStringArray(array), c.expected);
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
  struct tCase {
    const char *name;
    uint32_t id;
    uint32_t size;
    std::function<kvsvStatus(SvHandle *)> set;
  } cases[] = {
      {"U32", kvPropSessionSub_SkipNCyclicFrames, 4,
       [&](SvHandle *sub) { return kvsvSessionSetPropExU32(session, sub, kvPropSessionSub_SkipNCyclicFrames, &u32, &info_); }},
      {"U32 queue update", kvPropSessionSub_OutputQueueUpdateFreq, 4,
       [&](SvHandle *sub) { return kvsvSessionSetPropExU32(session, sub, kvPropSessionSub_OutputQueueUpdateFreq, &u32, &info_); }},
      {"U32 checksums", kvPropSessionSub_LINTxNCorruptedChksums, 4,
       [&](SvHandle *sub) { return kvsvSessionSetPropExU32(session, sub, kvPropSessionSub_LINTxNCorruptedChksums, &u32, &info_); }},
      {"U32 frame setting", kvPropHidden_FrameSub, 4,
       [&](SvHandle *sub) { return kvsvSessionSetPropExU32(session, sub, kvPropHidden_FrameSub, &u32, &info_); }},
      {"F64 start offset", kvPropSessionSub_CANStartTimeOff, 8,
       [&](SvHandle *sub) { return kvsvSessionSetPropExF64(session, sub, kvPropSessionSub_CANStartTimeOff, &f64, &info_); }},
      {"F64 transmit time", kvPropSessionSub_CANTxTime, 8,
       [&](SvHandle *sub) { return kvsvSessionSetPropExF64(session, sub, kvPropSessionSub_CANTxTime, &f64, &info_); }},
      {"String", kvPropSessionSub_J1939_AddrFilter, 5,
       [&](SvHandle *sub) { return kvsvSessionSetPropExString(session, sub, kvPropSessionSub_J1939_AddrFilter, &text, &info_); }},
      {"U8_1D", kvPropSessionSub_CustCodeData, 2,
       [&](SvHandle *sub) { return kvsvSessionSetPropExU8_1D(session, sub, kvPropSessionSub_CustCodeData, &bytes, &info_); }},
      {"U16_1D", kvPropSessionSub_CustCodeData, 4,
       [&](SvHandle *sub) { return kvsvSessionSetPropExU16_1D(session, sub, kvPropSessionSub_CustCodeData, &words, &info_); }},
      {"U32_1D", kvPropSessionSub_CustCodeData, 8,
       [&](SvHandle *sub) { return kvsvSessionSetPropExU32_1D(session, sub, kvPropSessionSub_CustCodeData, &longs, &info_); }},
  };
  for (const tCase &c : cases) {
    SCOPED_TRACE(c.name);
    for (auto [sub, index] : {std::pair<SvHandle *, uint32_t>{&byName, 1}, {&byIndex, 3}, {nullptr, 0}}) {
      kvsimLogClear();
      ASSERT_EQ(c.set(sub), 0);
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
  ASSERT_EQ(kvsvSessionSetPropExU32(session, &byName, kvPropSession_IntfOutStrmTimng, &u32, &info_), 0);
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
    EXPECT_EQ(kvsvSessionSetPropExU32(session, &sub, kvPropSessionSub_SkipNCyclicFrames, &value, &info),
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
  const uint32_t id = kvPropSession_IntfCustCodeFile;
  SvHandle source = Keep(svsimMakeString("code.bin"));
  ASSERT_EQ(kvsvSessionSetPropString(session, id, &source, &info_), 0);
  const struct {
    const char *name;
    bool existing;
    std::function<kvsvStatus(SvHandle *, SvHandle *)> get;
  } cases[] = {
      {"new array", false, [&](SvHandle *v, SvHandle *info) { return kvsvSessionGetPropExU8_1D(session, nullptr, id, v, info); }},
      {"grown array", true, [&](SvHandle *v, SvHandle *info) { return kvsvSessionGetPropExU8_1D(session, nullptr, id, v, info); }},
      {"new string", false, [&](SvHandle *v, SvHandle *info) { return kvsvSessionGetPropString(session, id, v, info); }},
      {"grown string", true, [&](SvHandle *v, SvHandle *info) { return kvsvSessionGetPropString(session, id, v, info); }},
      {"new cluster name", false, [&](SvHandle *v, SvHandle *info) { return kvsvSessionGetPropString(session, kvPropSession_ClusterName, v, info); }},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.name);
    SvHandle value = c.existing ? Keep(svsimMakeString("")) : nullptr;
    SvHandle info = nullptr;
    if (c.existing)
      svsimFailResizeAt(1);
    else
      svsimFailAllocAt(1);
    EXPECT_EQ(c.get(&value, &info), kvErrOutOfMemory);
    if (!c.existing) {
      EXPECT_EQ(value, nullptr);
    }
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
