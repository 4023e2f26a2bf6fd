// Property names and the error information they go into, list entries named by index or name, and
// the session property exports against the driver stand-in, one table per shape of value: the
// bytes each shape sends and reads, the size protocol of arrays and strings, lists of objects in
// their modes, sub-indexed writes, the system handle kept across a reopen, host refusals; objects
// as the host names them, paths and the Ethernet receive filter.
#include <gtest/gtest.h>

#include <cstring>
#include <functional>
#include <string>
#include <tuple>
#include <vector>

#include "core/host_handles.h"
#include "property/annotate_property_status.h"
#include "property/enet_rx_filter_record.h"
#include "property/property_fixture.h"
#include "property/property_id_names.h"
#include "property/session_name_to_index.h"
#include "session/kvorutility.h"
#include "session/system_manager.h"
#include "support/call_log.h"

using namespace nKVSVAPI100;

namespace {

using kvsvtest::LastCall;
using kvsvtest::NumberArray;
using kvsvtest::StringArray;
using kvsvtest::Text;
using kvsvtest::Texts;

class PropertyTest : public PropertyFixture {
 protected:
  // A session of `mode` in database Powertrain, cluster Body.
  uint32_t Session(const char *list, uint32_t mode = 0) {
    uint32_t session = 0;
    EXPECT_EQ(kvCreateSession("Powertrain", "Body", list, "CAN1", mode, &session), 0);
    PlaceSlot(session);
    return session;
  }
};

// Identifiers that share a number under two types, 64-bit twins, names whose neighbours have
// none; and identifiers without a name: no row for the class, no names for the type, an unknown
// number, a named number under another type, the hidden ones.
TEST_F(PropertyTest, IdentifiersAreNamedEachOnItsOwnAndTheNameGoesIntoTheErrorInformation) {
  const struct {
    uint32_t id;
    const char *name;
  } cases[] = {
      {0x03010008, "kvPropClst_Comment"},
      {0x06010008, "kvPropClst_PDURefs"},
      {0x09010001, "kvPropClst_BaudRate64"},
      {0x0802FFFC, "kvPropFrm_PDU_Mapping"},
      {0x03000001, "kvPropDatabase_Name"},
      {0x0013000F, "kvPropIntf_DongleCompatibleFirmwareVersion"},
      {0x00090000, nullptr},
      {0x00140001, nullptr},
      {0xFF100003, nullptr},
      {0x00120009, nullptr},
      {0x0111000A, nullptr},
      {0x0013FFFF, nullptr},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << std::hex << c.id);
    const char *name = PropertyIdToName(c.id);
    EXPECT_EQ(name == nullptr ? "" : std::string(name), c.name == nullptr ? "" : c.name);
    // The name behind its first underscore, into a new handle of a fixed width; what the host
    // passed in stays its own, alive and unchanged.
    SvHandle earlier = Keep(svsimMakeString("earlier"));
    info_ = earlier;
    svsimResetCounters();
    AnnotatePropertyStatus(-1, c.id, &info_);
    char unknown[48];
    std::snprintf(unknown, sizeof unknown, "(unknown ID hex %08x)", c.id);
    EXPECT_EQ(svGetHandleSize(info_), 108u);
    EXPECT_EQ(Annotation(), std::string("\nProperty: ") +
                                (c.name != nullptr ? std::strchr(c.name, '_') + 1 : unknown));
    EXPECT_EQ(Text(earlier), "earlier");
    EXPECT_EQ(svsimAllocCount() + svsimResizeCount() + svsimFreeCount(), 1u);
  }
  // Success and no information leave it alone; a warning is annotated as an error is; a failed
  // allocation leaves null.
  SvHandle earlier = Keep(svsimMakeString("earlier"));
  info_ = earlier;
  AnnotatePropertyStatus(0, 0x04100003, &info_);
  AnnotatePropertyStatus(-1, 0x04100003, nullptr);
  EXPECT_EQ(info_, earlier);
  AnnotatePropertyStatus(0x3FF60001, 0x04100003, &info_);
  EXPECT_EQ(Annotation(), "\nProperty: List");
  svsimFailAllocAt(1);
  AnnotatePropertyStatus(-1, 0x04100003, &info_);
  EXPECT_EQ(info_, nullptr);
}

TEST_F(PropertyTest, ListEntriesByIndexOrByNameTheListReadOncePerSlot) {
  const uint32_t session = Session("3,Frm.Sig,Frm.Two,Gear,Gear.Sig,Body.A,Body.B");
  const struct {
    const char *text;  // null: no handle at all
    Status status;
    int32_t index;
  } cases[] = {
      {nullptr, 0, 0},
      {"", 0, 0},
      {"3", 0, 3},  // a number, even though entry 0 bears that name
      {"007", 0, 7},
      {"4294967299", 0, 3},  // the digits wrap in 32 bits
      {"3x", kvErrSubIdNumberInvalid, -1},
      {"2147483648", kvErrSubIdNumberInvalid, INT32_MIN},
      {"Frm", 0, 1},   // the first entry of that prefix
      {"Gear", 0, 3},  // an exact entry before a prefix
      {"Frm.Two\nPowertrain.Body", 0, 2},
      {"Fr", kvErrSubIdNameUnknown, -1},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.text == nullptr ? "null" : c.text);
    SvHandle sub = c.text != nullptr ? Keep(svsimMakeString(c.text)) : nullptr;
    int32_t index = 99;
    EXPECT_EQ(SessionNameToIndex(session, c.text != nullptr ? &sub : nullptr, &index), c.status);
    EXPECT_EQ(index, c.index);
  }
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_List), 2);  // its size, then its text, once
  // Handles without a block or with a negative count mean entry 0 too.
  const uint32_t other = Session("A,B");
  void *noBlock = nullptr;
  SvHandle blockless = &noBlock, none = nullptr, negative = Keep(svsimMakeString("B"));
  static_cast<SvStr *>(*negative)->cnt = -1;
  for (SvHandle *sub : {&none, &blockless, &negative}) {
    int32_t index = 99;
    EXPECT_EQ(SessionNameToIndex(other, sub, &index), 0);
    EXPECT_EQ(index, 0);
  }
  // Failures of the list's reads keep no list; the list guard is given back on every way out.
  SvHandle name = Keep(svsimMakeString("B"));
  int32_t index = 0;
  for (const char *function : {"kvGetPropertySize", "kvGetProperty"}) {
    kvsimFailProperty(function, kvPropSession_List, kvsimErrInternal, 1);
    EXPECT_EQ(SessionNameToIndex(other, &name, &index), kvsimErrInternal) << function;
    EXPECT_EQ(Slot(other)->sessionNameList, nullptr) << function;
  }
  EXPECT_EQ(Slot(other)->listGuard.load(), 0u);
  ASSERT_EQ(SessionNameToIndex(other, &name, &index), 0);
  EXPECT_EQ(index, 1);
}

// A scalar shape: what Set and Get hand the driver, and the value coming back unchanged.
struct tScalarCase {
  const char *shape;
  uint32_t id, setBytes, getBytes;
  std::function<void(uint32_t, SvHandle *)> roundTrip;
};

template <class tValue>
tScalarCase Scalar(const char *shape, uint32_t id, uint32_t setBytes, uint32_t getBytes,
                   kvsvStatus (*set)(uint32_t, uint32_t, const tValue *, SvHandle *),
                   kvsvStatus (*get)(uint32_t, uint32_t, tValue *, SvHandle *), tValue value) {
  return {shape, id, setBytes, getBytes, [=](uint32_t session, SvHandle *info) {
            alignas(8) unsigned char source[8] = {};  // a U8 write reads a whole word
            std::memcpy(source, &value, sizeof value);
            ASSERT_EQ(set(session, id, reinterpret_cast<const tValue *>(source), info), 0);
            tValue read{};
            ASSERT_EQ(get(session, id, &read, info), 0);
            EXPECT_EQ(read, value);
          }};
}

TEST_F(PropertyTest, ScalarShapesSendTheirByteCountsAndAllocateNothing) {
  const uint32_t session = Session("A,B");
  const auto setU8 = kvsvSessionSetPropU8;
  const auto getU8 = kvsvSessionGetPropU8;
  const tScalarCase cases[] = {
      Scalar<uint8_t>("U8", kvPropSession_IntfLINBreakLength, 4, 1, setU8, getU8, 0x5A),
      // The J1939 address and fill byte travel as words.
      Scalar<uint8_t>("J1939 address", kvPropSession_J1939Address, 4, 4, setU8, getU8, 0xA7),
      Scalar<uint8_t>("J1939 fill byte", kvPropSession_J1939FillByte, 4, 4, setU8, getU8, 0xC3),
      Scalar<uint32_t>("U32", kvPropSession_IntfOutStrmTimng, 4, 4, kvsvSessionSetPropU32,
                       kvsvSessionGetPropU32, 0xDEADBEEFu),
      Scalar<uint64_t>("U64", kvPropSession_J1939Name, 8, 8, kvsvSessionSetPropU64,
                       kvsvSessionGetPropU64, 0x0123456789ABCDEFull),
      Scalar<double>("F64", kvPropSession_J1939TimeoutT1, 8, 8, kvsvSessionSetPropF64,
                     kvsvSessionGetPropF64, -2.5),
      Scalar<uint8_t>("Bool", kvPropSession_IntfEchoTx, 1, 1, kvsvSessionSetPropBool,
                      kvsvSessionGetPropBool, 1),
  };
  for (const tScalarCase &c : cases) {
    SCOPED_TRACE(c.shape);
    kvsimLogClear();
    svsimResetCounters();
    c.roundTrip(session, &info_);
    const kvsimCallRecord set = LastCall("kvSetProperty");
    EXPECT_EQ(std::make_tuple(set.propertyId, set.size1, LastCall("kvGetProperty").size1),
              std::make_tuple(c.id, c.setBytes, c.getBytes));
    EXPECT_EQ(svsimAllocCount() + svsimResizeCount(), 0u);
  }
  // A wide byte is its word's low byte, stored even when the read fails: then 0.
  const uint32_t wide = 0x1234u;
  uint8_t read = 0;
  ASSERT_EQ(kvSetProperty(session, kvPropSession_J1939Address, 4, &wide), 0);
  ASSERT_EQ(kvsvSessionGetPropU8(session, kvPropSession_J1939Address, &read, &info_), 0);
  EXPECT_EQ(read, 0x34);
  kvsimFailProperty("kvGetProperty", kvPropSession_J1939Address, kvsimErrInternal, 1);
  EXPECT_EQ(kvsvSessionGetPropU8(session, kvPropSession_J1939Address, &read, &info_),
            kvsimErrInternal);
  EXPECT_EQ(read, 0);
  Annotation();
  // Times are converted whatever the read gave: 3e9 s and a half after 1904, or 0.
  const uint32_t time = kvPropSession_IntfEnetAdjustLocalTime;
  const uint64_t raw = 95616288000000000ull + 30000000000000000ull + 5000000ull;
  ASSERT_EQ(kvSetProperty(session, time, 8, &raw), 0);
  SvTime value{};
  ASSERT_EQ(kvsvSessionGetPropTime(session, time, &value, &info_), 0);
  EXPECT_EQ(value.seconds, 3000000000);
  EXPECT_NEAR(static_cast<double>(value.fraction), 9223372036854775808.0, 1e7);
  kvsimFailProperty("kvGetProperty", time, kvsimErrInternal, 1);
  EXPECT_EQ(kvsvSessionGetPropTime(session, time, &value, &info_), kvsimErrInternal);
  EXPECT_EQ(std::make_pair(value.seconds, value.fraction), std::make_pair(int64_t{0}, uint64_t{0}));
  // The forms without a setter report and annotate.
  Annotation();
  EXPECT_EQ(kvsvSessionSetPropTime(session, time, &value, &info_), kvErrInternal);
  EXPECT_EQ(Annotation(), "\nProperty: IntfEnetAdjustLocalTime");
  SvHandle list = Keep(svsimMakeString("A"));
  EXPECT_EQ(kvsvSessionSetPropString1D(session, kvPropSession_List, &list, &info_), kvErrInternal);
  EXPECT_EQ(Annotation(), "\nProperty: List");
}

// Each array shape, then strings: the bytes a write sends, the handle a read sizes, the value back.
TEST_F(PropertyTest, ArraysAndStringsFollowTheSizeProtocol) {
  const uint32_t session = Session("A");
  const uint32_t id = kvPropSession_IntfCustCodeData;
  const struct {
    size_t width;
    uint32_t slack;
    kvsvStatus (*set)(uint32_t, SvHandle *, uint32_t, SvHandle *, SvHandle *);
    kvsvStatus (*get)(uint32_t, SvHandle *, uint32_t, SvHandle *, SvHandle *);
  } cases[] = {
      {1, 7, kvsvSessionSetPropExU8_1D, kvsvSessionGetPropExU8_1D},
      {2, 6, kvsvSessionSetPropExU16_1D, kvsvSessionGetPropExU16_1D},
      {4, 4, kvsvSessionSetPropExU32_1D, kvsvSessionGetPropExU32_1D},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << c.width << "-byte elements");
    const std::vector<uint32_t> values = {0x01, 0x7F, 0xFE};
    SvHandle source = Keep(NumberArray(values, c.width)), read = nullptr;
    ASSERT_EQ(c.set(session, nullptr, id, &source, &info_), 0);
    EXPECT_EQ(LastCall("kvSetProperty").size1, 3 * c.width);
    ASSERT_EQ(c.get(session, nullptr, id, &read, &info_), 0);
    EXPECT_EQ(svGetHandleSize(Keep(read)), 3 * c.width + c.slack);
    EXPECT_EQ(LastCall("kvGetProperty").size1, 3 * c.width);
    EXPECT_EQ(kvsvtest::ArrayNumbers(read, c.width), values);
    // A failed read stores the driver's count all the same; a failed size leaves the array.
    const size_t size = svGetHandleSize(read);
    for (const char *failing : {"kvGetProperty", "kvGetPropertySize"}) {
      kvsimFailProperty(failing, id, kvsimErrInternal, 1);
      ArrayCount(read) = 1;
      EXPECT_EQ(c.get(session, nullptr, id, &read, &info_), kvsimErrInternal);
      EXPECT_EQ(ArrayCount(read), std::string(failing) == "kvGetProperty" ? 3 : 1);
      EXPECT_EQ(svGetHandleSize(read), size);
      EXPECT_EQ(Annotation(), "\nProperty: IntfCustCodeData");
    }
    // Empty arrays, missing ones included, are sent as nothing.
    SvHandle empty = Keep(NumberArray({}, c.width)), none = nullptr;
    for (SvHandle *value : {static_cast<SvHandle *>(nullptr), &none, &empty}) {
      ASSERT_EQ(c.set(session, nullptr, id, value, &info_), 0);
      EXPECT_EQ(LastCall("kvSetProperty").size1, 0u);
    }
  }
  // Strings travel with their NUL.
  const uint32_t file = kvPropSession_IntfCustCodeFile;
  SvHandle text = Keep(svsimMakeString("code.bin")), read = nullptr;
  ASSERT_EQ(kvsvSessionSetPropString(session, file, &text, &info_), 0);
  EXPECT_EQ(LastCall("kvSetProperty").size1, 9u);
  ASSERT_EQ(kvsvSessionGetPropString(session, file, &read, &info_), 0);
  EXPECT_EQ(Text(Keep(read)), "code.bin");
  // The count follows the text, not the size the driver gave.
  ASSERT_EQ(kvSetProperty(session, file, 8, "ab\0cdef"), 0);
  ASSERT_EQ(kvsvSessionGetPropString(session, file, &read, &info_), 0);
  EXPECT_EQ(Text(read), "ab");
  EXPECT_EQ(svGetHandleSize(read), 8u + 7u);
  SvHandle empty = Keep(svsimMakeString(""));
  for (SvHandle *value : {static_cast<SvHandle *>(nullptr), &empty}) {
    ASSERT_EQ(kvsvSessionSetPropString(session, file, value, &info_), 0);
    EXPECT_EQ(LastCall("kvSetProperty").size1, 1u);
    ASSERT_EQ(kvsvSessionGetPropString(session, file, &read, &info_), 0);
    EXPECT_EQ(Text(read), "");
  }
  // A failed read keeps the count while the block still holds that many bytes; after a resize
  // left it smaller, the string is empty instead of reaching past its block.
  for (const char *held : {"CA", "a text much longer than the name of an interface"}) {
    SvHandle value = Keep(svsimMakeString(held));
    kvsimFailProperty("kvGetProperty", kvPropSession_IntfName, kvsimErrInternal, 1);
    EXPECT_EQ(kvsvSessionGetPropString(session, kvPropSession_IntfName, &value, &info_),
              kvsimErrInternal);
    EXPECT_EQ(Text(value), std::strlen(held) == 2 ? held : "") << held;
    Annotation();
  }
}

TEST_F(PropertyTest, ListsOfObjectsComeAsReferenceStringsInTheirModes) {
  const std::vector<std::string> references = {"Frm.Sig\nPowertrain.Body",
                                               "Frm.Two\nPowertrain.Body"};
  const struct {
    uint32_t mode, id;
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
    const uint32_t session = Session("Frm.Sig,Frm.Two", c.mode);
    ASSERT_EQ(kvSetProperty(session, kvPropSession_IntfLINSchedNames, 16, "Frm.Sig,Frm.Two"), 0);
    SvHandle array = StringArray({"old"});
    ASSERT_EQ(kvsvSessionGetPropString1D(session, c.id, &array, &info_), 0);
    EXPECT_EQ(Texts(array), c.answered ? references : std::vector<std::string>{"old"});
    DisposeHandleArray(&array);
  }
  // Other lists are split without a mode or a reference.
  const uint32_t session = Session("A,B", 7);
  const uint32_t counters = kvPropSession_IntfEnetStatsCounterNames;
  ASSERT_EQ(kvSetProperty(session, counters, 10, "rx,tx,err"), 0);
  SvHandle array = nullptr;
  kvsimLogClear();
  ASSERT_EQ(kvsvSessionGetPropString1D(session, counters, &array, &info_), 0);
  EXPECT_EQ(Texts(array), (std::vector<std::string>{"rx", "tx", "err"}));
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_Mode), 0);
  DisposeHandleArray(&array);
}

// Writes addressed to one entry of the session's list, by form, by name, by index or by none.
TEST_F(PropertyTest, SubPropertiesGoToTheNamedEntry) {
  const uint32_t session = Session("Frm.Sig,Frm2.Sig,Frm3,Other");
  SvHandle byName = Keep(svsimMakeString("Frm2")), byIndex = Keep(svsimMakeString("3"));
  const uint32_t u32 = 17;
  const double f64 = 0.25;
  SvHandle text = Keep(svsimMakeString("0x1F")), bytes = Keep(NumberArray({1, 2}, 1));
  const auto set = [&](int form, SvHandle *sub, uint32_t id) {
    return form == 0   ? kvsvSessionSetPropExU32(session, sub, id, &u32, &info_)
           : form == 1 ? kvsvSessionSetPropExF64(session, sub, id, &f64, &info_)
           : form == 2 ? kvsvSessionSetPropExString(session, sub, id, &text, &info_)
                       : kvsvSessionSetPropExU8_1D(session, sub, id, &bytes, &info_);
  };
  const struct {
    int form;
    uint32_t id, size;
  } cases[] = {{0, kvPropSessionSub_SkipNCyclicFrames, 4},
               {1, kvPropSessionSub_CANTxTime, 8},
               {2, kvPropSessionSub_J1939_AddrFilter, 5},
               {3, kvPropSessionSub_CustCodeData, 2}};
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << std::hex << c.id << " size " << c.size);
    for (auto [sub, index] :
         {std::pair<SvHandle *, uint32_t>{&byName, 1}, {&byIndex, 3}, {nullptr, 0}}) {
      kvsimLogClear();
      ASSERT_EQ(set(c.form, sub, c.id), 0);
      const kvsimCallRecord call = LastCall("kvSetSubProperty");
      EXPECT_EQ(std::make_tuple(call.propertyId, call.size2, call.size1),
                std::make_tuple(c.id, index, c.size));
    }
  }
  // Other identifiers ignore the entry and go to the session; bad entries end the write.
  ASSERT_EQ(set(0, &byName, kvPropSession_IntfOutStrmTimng), 0);
  EXPECT_EQ(LastCall().function, std::string("kvSetProperty"));
  SvHandle bad = Keep(svsimMakeString("Nope"));
  kvsimLogClear();
  EXPECT_EQ(set(0, &bad, kvPropSessionSub_SkipNCyclicFrames), kvErrSubIdNameUnknown);
  EXPECT_EQ(kvsimCountCalls("kvSetSubProperty"), 0);
  EXPECT_EQ(Annotation(), "\nProperty: SkipNCyclicFrames");
}

TEST_F(PropertyTest, TheHiddenSwitchTheSystemHandleAndHostRefusals) {
  const uint32_t session = Session("A");
  // The library's own switch never reaches the driver.
  for (uint32_t value : {1u, 0u}) {
    kvsimLogClear();
    EXPECT_EQ(kvsvSessionSetPropU32(session, kvPropHidden_ReportImplicitClose, &value, &info_), 0);
    EXPECT_EQ(gReportImplicitClose.load(), value);
    EXPECT_EQ(kvsimLogCount(), 0);
  }
  // A system handle from before a reopen reaches the system open now, for system identifiers.
  uint32_t system = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  const uint32_t first = gSystemManager.firstSystemHandle;
  ASSERT_EQ(kvsvSystemClose(system), 0);
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  ASSERT_NE(system, first);
  uint32_t major = 0;
  EXPECT_EQ(kvsvSessionGetPropU32(first, kvPropSys_VerMajor, &major, &info_), 0);
  EXPECT_EQ(major, KVSIM_VERSION_MAJOR);
  EXPECT_EQ(LastCall("kvGetProperty").object, system);
  EXPECT_NE(kvsvSessionGetPropU32(first, kvPropSession_Mode, &major, &info_), 0);
  EXPECT_EQ(LastCall("kvGetProperty").object, first);
  Annotation();
  kvsvSystemManualClose(nullptr, nullptr);
  // A host that grows no handle gives no memory, annotated.
  const uint32_t file = kvPropSession_IntfCustCodeFile;
  SvHandle source = Keep(svsimMakeString("code.bin"));
  ASSERT_EQ(kvsvSessionSetPropString(session, file, &source, &info_), 0);
  const auto array = kvsvSessionGetPropExU8_1D, string = kvsvSessionGetPropExString;
  for (const auto &[get, id] : {std::make_pair(array, file), std::make_pair(string, file),
                                std::make_pair(string, uint32_t{kvPropSession_ClusterName})}) {
    SCOPED_TRACE(testing::Message() << std::hex << id);
    SvHandle value = Keep(svsimMakeString(""));
    svsimFailResizeAt(1);
    EXPECT_EQ(get(session, nullptr, id, &value, &info_), kvErrOutOfMemory);
    EXPECT_NE(Annotation().find("\nProperty: "), std::string::npos);
  }
}

// The driver's handles of one kind, listed by `list` of `object`.
std::vector<uint32_t> Handles(uint32_t object, uint32_t list) {
  uint32_t size = 0;
  EXPECT_EQ(kvGetPropertySize(object, list, &size), 0);
  std::vector<uint32_t> handles(size / 4);
  EXPECT_EQ(kvGetProperty(object, list, size, handles.data()), 0);
  return handles;
}

// Objects named as the host holds them: devices by serial, interfaces by name, texts and comma
// lists as their own forms; a serial that cannot be read; identifiers the shapes do not serve.
TEST_F(PropertyTest, SystemObjectsComeAsTheNamesTheHostHoldsThemBy) {
  uint32_t system = 0;
  ASSERT_EQ(kvSystemOpen(&system), 0);
  const uint32_t device2 = Handles(system, kvPropSys_DevRefs)[1];
  const uint32_t enet = Handles(device2, kvPropDev_IntfRefs)[2];
  const uint32_t session = Session("A");
  ASSERT_EQ(kvSetProperty(session, kvPropSession_IntfEnetStatsCounterNames, 6, "rx,tx"), 0);
  using tNames = std::vector<std::string>;
  const struct {
    bool array;
    uint32_t object, id;
    bool failSerial;
    Status status;
    tNames names;  // {"old"}: what the host held stays
  } cases[] = {
      {false, session, kvPropSession_IntfName, false, 0, {"CAN1"}},
      {false, enet, kvPropIntf_DevRef, false, 0, {"___kvorDev#fff0b8ec"}},
      {false, enet, kvPropIntf_DevRef, true, kvsimErrInternal, {""}},
      {true, system, kvPropSys_DevRefs, false, 0, {"___kvorDev#fff0b8ed", "___kvorDev#fff0b8ec"}},
      // The device behind one without a serial is nameless too.
      {true, system, kvPropSys_DevRefs, true, 0, {"", ""}},
      {true, system, kvPropSys_IntfRefsLIN, false, 0, {"LIN1", "LIN2"}},
      {true, device2, kvPropDev_IntfRefs, false, 0, {"FlexRay1", "FlexRay2", "ENET1"}},
      {true, session, kvPropSession_IntfEnetStatsCounterNames, false, 0, {"rx", "tx"}},
      {false, session, kvPropSession_J1939ECU, false, kvErrInternal, {"old"}},
      {true, session, kvPropSession_IntfOutStrmList, false, kvErrInternal, {"old"}},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << std::hex << c.id << (c.failSerial ? " no serial" : ""));
    if (c.failSerial) kvsimFailProperty("kvGetProperty", kvPropDev_SerNum, kvsimErrInternal, 1);
    SvHandle value = c.array ? StringArray({"old"}) : svsimMakeString("old");
    const auto get = c.array ? kvsvSessionGetPropRef1D : kvsvSessionGetPropRef;
    EXPECT_EQ(get(c.object, c.id, &value, &info_), c.status);
    EXPECT_EQ(c.array ? Texts(value) : tNames{Text(value)}, c.names);
    if (c.array)
      DisposeHandleArray(&value);
    else
      svDisposeHandle(value);
    EXPECT_EQ(Annotation().empty(), c.status == 0);
  }
  kvSystemClose(system);
}

// The J1939 ECU and a list of frames from their reference texts: the handles the driver gets, the
// databases opened to find them all closed again, and texts that do not resolve.
TEST_F(PropertyTest, DatabaseObjectsAreWrittenFromTheirReferenceTexts) {
  uint32_t database = 0, cluster = 0, gear = 0, speed = 0, dash = 0;
  ASSERT_EQ(kvdbOpenDatabase(":memory:", &database), 0);
  ASSERT_EQ(kvdbCreateObject(database, 0x10000, "Body", &cluster), 0);
  ASSERT_EQ(kvdbCreateObject(cluster, 0x20000, "Gear", &gear), 0);
  ASSERT_EQ(kvdbCreateObject(cluster, 0x20000, "Speed", &speed), 0);
  ASSERT_EQ(kvdbCreateObject(cluster, 0x50000, "Dash", &dash), 0);
  const uint32_t session = Session("A");
  const uint32_t ecuId = kvPropSession_J1939ECU, framesId = kvPropSession_IntfOutStrmList;
  const struct {
    uint32_t id;
    std::vector<const char *> texts;
    Status status;
    std::vector<uint32_t> sent;  // empty: nothing sent
  } cases[] = {
      {ecuId, {"Dash\n:memory:.Body"}, 0, {dash}},
      {ecuId, {"Gear\n:memory:.Body"}, kvsimErrObjectNotFound, {}},
      {kvPropSession_IntfName, {"Dash\n:memory:.Body"}, kvErrInternal, {}},
      {framesId, {"Speed\n:memory:.Body", "Gear  :memory:.Body"}, 0, {speed, gear}},
      {framesId,
       {"Gear\n:memory:.Body", "Dash\n:memory:.Body", "Speed\n:memory:.Body"},
       kvsimErrObjectNotFound,
       {}},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.texts[0]);
    kvsimLogClear();
    SvHandle value = nullptr;
    Status status = 0;
    if (c.id == framesId) {
      value = StringArray(c.texts);
      status = kvsvSessionSetPropRef1D(session, c.id, &value, &info_);
      DisposeHandleArray(&value);
    } else {
      value = svsimMakeString(c.texts[0]);
      status = kvsvSessionSetPropRef(session, c.id, &value, &info_);
      svDisposeHandle(value);
    }
    EXPECT_EQ(status, c.status);
    EXPECT_EQ(Annotation().empty(), c.status == 0);
    EXPECT_EQ(kvsimCountCalls("kvSetProperty"), c.sent.empty() ? 0 : 1);
    if (!c.sent.empty()) {
      EXPECT_EQ(Handles(session, c.id), c.sent);
    }
    EXPECT_EQ(kvsimCountCalls("kvdbCloseDatabase"), kvsimCountCalls("kvdbOpenDatabase"));
  }
  // An empty list is written as empty.
  SvHandle none = nullptr;
  ASSERT_EQ(kvsvSessionSetPropRef1D(session, framesId, &none, &info_), 0);
  EXPECT_EQ(LastCall("kvSetProperty").size1, 0u);
  kvdbCloseDatabase(database, 0);
}

TEST_F(PropertyTest, PathsTravelAsTheirText) {
  const uint32_t session = Session("A");
  const uint32_t id = kvPropSession_EnetLogFile;
  SvHandle text = Keep(svsimMakeString("/var/log/enet.pcap"));
  SvPath written = nullptr, read = nullptr;
  ASSERT_EQ(svStringToPath(text, &written), 0);
  ASSERT_EQ(kvsvSessionSetPropExPath(session, nullptr, id, &written, &info_), 0);
  EXPECT_EQ(LastCall("kvSetProperty").size1, 19u);
  ASSERT_EQ(kvsvSessionGetPropExPath(session, nullptr, id, &read, &info_), 0);
  SvHandle back = nullptr;
  ASSERT_EQ(svPathToString(read, &back), 0);
  EXPECT_EQ(Text(Keep(back)), "/var/log/enet.pcap");
  // No path is the empty text; a failed read leaves the host's path.
  SvPath none = nullptr;
  ASSERT_EQ(kvsvSessionSetPropExPath(session, nullptr, id, &none, &info_), 0);
  EXPECT_EQ(LastCall("kvSetProperty").size1, 1u);
  kvsimFailProperty("kvGetProperty", id, kvsimErrInternal, 1);
  EXPECT_EQ(kvsvSessionGetPropExPath(session, nullptr, id, &read, &info_), kvsimErrInternal);
  EXPECT_EQ(Annotation(), "\nProperty: EnetLogFile");
  ASSERT_EQ(svPathToString(read, &back), 0);
  EXPECT_EQ(Text(back), "/var/log/enet.pcap");
  svDestroyPath(written);
  svDestroyPath(read);
}

// Each flag bit alone and names about the driver's limit, as the driver gets them and as they come
// back.
TEST_F(PropertyTest, TheReceiveFilterKeepsEachFieldAndRefusesLongNames) {
  const uint32_t session = MakeSession("", 7, "ENET1");
  const uint32_t id = kvPropSession_IntfEnetEptReceiveFilter;
  const struct {
    uint8_t use16, use8, useName;
    size_t nameLength;
    Status status;
    uint32_t flags;
  } cases[] = {
      {1, 0, 0, 0, 0, 1},
      {0, 7, 0, 0, 0, 2},
      {0, 0, 1, 18, 0, 4},
      {0, 0, 0, 19, kvErrNameTooLong, 0},
      {1, 1, 1, 40, kvErrNameTooLong, 0},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << "flags " << c.flags << " name " << c.nameLength);
    const std::string name(c.nameLength, 'n');
    SvHandle array = Keep(svNewHandleClr(8 + 2 * 16)), read = nullptr;
    ArrayCount(array) = 2;  // the second element empty
    auto *element = reinterpret_cast<tEnetRxFilterCluster *>(static_cast<char *>(*array) + 8);
    element->useValue16 = c.use16, element->useValue8 = c.use8, element->useName = c.useName;
    element->value16 = 0xBEEF, element->value8 = 0x5A;
    element->filterName = Keep(svsimMakeString(name.c_str()));
    kvsimLogClear();
    EXPECT_EQ(kvsvSessionSetPropExCluster1D(session, nullptr, id, &array, &info_), c.status);
    if (c.status != 0) {
      EXPECT_EQ(kvsimCountCalls("kvSetProperty"), 0);
      EXPECT_EQ(Annotation(), "\nProperty: IntfEnetEptReceiveFilter");
      continue;
    }
    tEnetRxFilterRecord records[2];
    ASSERT_EQ(kvGetProperty(session, id, sizeof records, records), 0);
    EXPECT_EQ(std::make_tuple(records[0].flags, records[0].value16, records[0].value8,
                              std::string(records[0].filterName), records[1].flags),
              std::make_tuple(c.flags, uint16_t{0xBEEF}, uint8_t{0x5A}, name, 0u));
    ASSERT_EQ(kvsvSessionGetPropExCluster1D(session, nullptr, id, &read, &info_), 0);
    const auto *back = reinterpret_cast<tEnetRxFilterCluster *>(static_cast<char *>(*read) + 8);
    EXPECT_EQ(ArrayCount(read), 2);
    EXPECT_EQ(std::make_tuple(back->useValue16, back->useValue8, back->useName, back->value16,
                              back->value8, Text(back->filterName), Text(back[1].filterName)),
              std::make_tuple(uint8_t{c.use16 != 0}, uint8_t{c.use8 != 0}, c.useName,
                              uint16_t{0xBEEF}, uint8_t{0x5A}, name, std::string()));
    svDisposeHandle(back[0].filterName);
    svDisposeHandle(back[1].filterName);
    svDisposeHandle(read);
  }
  // An empty array writes nothing at all.
  SvHandle empty = Keep(svNewHandleClr(8));
  kvsimLogClear();
  EXPECT_EQ(kvsvSessionSetPropExCluster1D(session, nullptr, id, &empty, &info_), 0);
  EXPECT_EQ(kvsimLogCount(), 0);
}

}  // namespace
