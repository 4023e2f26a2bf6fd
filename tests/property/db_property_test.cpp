// The database property exports against the driver stand-in's objects of a small database file:
// each shape's bytes and size protocol, reads that reuse the host's handle, the name that each
// reference property is known by, references set by text, a frame's PDU mapping, and refusals.
#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "core/host_handles.h"
#include "kvorproperties.h"
#include "kvsvapi.h"
#include "property/property_fixture.h"
#include "support/call_log.h"
#include "support/database_reads.h"
#include "support/scoped_env.h"
#include "support/temp_dir.h"

using namespace nKVSVAPI100;

namespace {

using kvsvtest::DbFind;
using kvsvtest::LastCall;
using kvsvtest::NumberArray;
using kvsvtest::Text;
using kvsvtest::Texts;

constexpr uint32_t kCluster = 0x10000, kFrame = 0x20000, kSignal = 0x30000, kEcu = 0x50000,
                   kSchedule = 0x60000, kEntry = 0x70000;

// Cluster Body: Speed sent by Engine and received by Dash, Brake, and Gear multiplexed by M.
const char kDbc[] =
    "VERSION \"\"\nNS_ :\nBS_:\nBU_: Engine Dash\n"
    "BO_ 256 Speed: 8 Engine\n SG_ Value : 0|16@1+ (1,0) [0|65535] \"km/h\" Dash\n"
    "BO_ 257 Brake: 8 Engine\n SG_ Level : 0|8@1+ (1,0) [0|255] \"\" Dash\n"
    "BO_ 258 Gear: 8 Engine\n SG_ M M : 0|8@1+ (1,0) [0|255] \"\" Dash\n"
    " SG_ G0 m0 : 8|8@1+ (1,0) [0|255] \"\" Dash\n"
    "BA_DEF_ \"DBName\" STRING ;\nBA_ \"DBName\" \"Body\";\n";

struct tMappingElement {
  SvHandle pdu;
  uint32_t startBit, updateBit;
};

tMappingElement *Mapping(SvHandle array) {
  return reinterpret_cast<tMappingElement *>(static_cast<char *>(*array) + 8);
}

class DbPropertyTest : public PropertyFixture {
 protected:
  void SetUp() override {
    PropertyFixture::SetUp();
    dir_.WriteFile("body", kDbc);
    database_ = kvsvtest::OpenDatabase("body");
    cluster_ = DbFind(database_, kCluster, "Body");
    speed_ = DbFind(cluster_, kFrame, "Speed");
    gear_ = DbFind(cluster_, kFrame, "Gear");
    ASSERT_EQ(kvdbCreateObject(cluster_, kSchedule, "Normal", &schedule_), 0);
    ASSERT_EQ(kvdbCreateObject(cluster_, kSchedule, "Fallback", &fallback_), 0);
    ASSERT_EQ(kvdbCreateObject(schedule_, kEntry, "First", &entry_), 0);
  }
  void TearDown() override {
    for (SvHandle &array : arrays_) DisposeHandleArray(&array);
    kvdbCloseDatabase(database_, 1);
    EXPECT_EQ(kvsimLoadedDatabaseCount(), 0);
    PropertyFixture::TearDown();
  }
  SvHandle Strings(const std::vector<const char *> &texts) {
    return arrays_.emplace_back(kvsvtest::StringArray(texts));
  }

  kvsvtest::cTempDir dir_;
  kvsvtest::cScopedEnv env_{"KVSIM_DATABASE_DIR", dir_.Path()};
  std::vector<SvHandle> arrays_;
  uint32_t database_ = 0, cluster_ = 0, speed_ = 0, gear_ = 0, schedule_ = 0, fallback_ = 0,
           entry_ = 0;
};

template <class tValue>
void ScalarRoundTrip(kvsvStatus (*set)(uint32_t, uint32_t, const tValue *, SvHandle *),
                     kvsvStatus (*get)(uint32_t, uint32_t, tValue *, SvHandle *), uint32_t object,
                     uint32_t id, tValue value) {
  SCOPED_TRACE(testing::Message() << std::hex << id);
  ASSERT_EQ(set(object, id, &value, nullptr), 0);
  EXPECT_EQ(LastCall("kvdbSetProperty").size1, sizeof value);
  tValue read{};
  ASSERT_EQ(get(object, id, &read, nullptr), 0);
  EXPECT_EQ(LastCall("kvdbGetProperty").size1, sizeof value);
  EXPECT_EQ(read, value);
}

// Each shape: the bytes a set sends, the handle a read sizes and fills, and a second read into
// the same handle, which makes and frees no host handle.
TEST_F(DbPropertyTest, EachShapeSendsItsBytesAndASteadyReadMakesNoHandle) {
  const uint32_t signal = DbFind(speed_, kSignal, "Value");
  ScalarRoundTrip(kvsvdbSetPropU32, kvsvdbGetPropU32, signal, kvPropSig_StartBit, 37u);
  ScalarRoundTrip(kvsvdbSetPropU64, kvsvdbGetPropU64, cluster_, kvPropClst_BaudRate64,
                  uint64_t{0x0123456789ABCDEFull});
  ScalarRoundTrip(kvsvdbSetPropF64, kvsvdbGetPropF64, signal, kvPropSig_ScaleOff, -2.5);
  ScalarRoundTrip(kvsvdbSetPropBool, kvsvdbGetPropBool, database_,
                  kvPropDatabase_ShowInvalidFromOpen, uint8_t{1});
  using tExport = kvsvStatus (*)(uint32_t, uint32_t, SvHandle *, SvHandle *);
  struct {
    tExport set, get;
    uint32_t object, id;
    SvHandle source;
    uint32_t sent, handleSize, compared;  // compared: bytes of count and value
  } rows[] = {
      {kvsvdbSetPropU8_1D, kvsvdbGetPropU8_1D, entry_, kvPropLINSchedEntry_NC_FF_DataBytes,
       Keep(NumberArray({0xA5, 0x5A, 0x01}, 1)), 3, 10, 7},
      {kvsvdbSetPropU32_1D, kvsvdbGetPropU32_1D, speed_, kvPropFrm_PDUStartBits,
       Keep(NumberArray({8}, 4)), 4, 8, 8},
      {kvsvdbSetPropString, kvsvdbGetPropString, signal, kvPropSig_Unit,
       Keep(svsimMakeString("km/h")), 5, 12, 8},
  };
  for (auto &row : rows) {
    SCOPED_TRACE(testing::Message() << std::hex << row.id);
    ASSERT_EQ(row.set(row.object, row.id, &row.source, &info_), 0);
    EXPECT_EQ(LastCall("kvdbSetProperty").size1, row.sent);
    SvHandle read = nullptr;
    ASSERT_EQ(row.get(row.object, row.id, &read, &info_), 0);
    svsimResetCounters();
    ASSERT_EQ(row.get(row.object, row.id, &read, &info_), 0);
    EXPECT_EQ(svsimAllocCount() + svsimFreeCount(), 0u);
    EXPECT_EQ(svGetHandleSize(Keep(read)), row.handleSize);
    EXPECT_EQ(std::memcmp(*read, *row.source, row.compared), 0);
    // Empty sources: no bytes for arrays, one NUL for text.
    SvHandle none = nullptr;
    ASSERT_EQ(row.set(row.object, row.id, &none, &info_), 0);
    EXPECT_EQ(LastCall("kvdbSetProperty").size1, row.get == kvsvdbGetPropString ? 1u : 0u);
  }
  EXPECT_EQ(info_, nullptr);
  // A text counts the driver's size less its NUL even when its read fails, where the session's
  // keeps the count it had.
  SvHandle string = Keep(svsimMakeString(""));
  ASSERT_EQ(kvsvdbSetPropString(signal, kvPropSig_Unit, &rows[2].source, &info_), 0);
  kvsimFailProperty("kvdbGetProperty", kvPropSig_Unit, kvsimErrInternal, 1);
  EXPECT_EQ(kvsvdbGetPropString(signal, kvPropSig_Unit, &string, &info_), kvsimErrInternal);
  EXPECT_EQ(static_cast<SvStr *>(*string)->cnt, 4);
  EXPECT_EQ(Annotation(), "\nProperty: Unit");
}

// What each kind of reference is known by: its object's name property, and its location.
TEST_F(DbPropertyTest, ReferencesReadAsTheNameTheirPropertyChooses) {
  const uint32_t value = DbFind(speed_, kSignal, "Value"), g0 = DbFind(gear_, kSignal, "G0");
  const uint32_t engine = DbFind(cluster_, kEcu, "Engine");
  const std::string at = "\nbody.Body";
  const struct {
    uint32_t object, id;
    std::vector<std::string> texts;  // one text for Ref, the array for Ref1D
  } rows[] = {
      {cluster_, kvPropClst_DatabaseRef, {"body"}},
      {value, 0x05030034, {"body.Body"}},
      {value, kvPropSig_FrameRef, {"Speed" + at}},
      {value, kvPropSig_PDURef, {"Speed" + at}},
      {g0, kvPropSig_MuxSubfrmRef, {"Gear.m0" + at}},
      {gear_, kvPropFrm_MuxDataMuxSigRef, {"Gear.M" + at}},
      {entry_, kvPropLINSchedEntry_Sched, {"Normal" + at}},
      {database_, kvPropDatabase_ClstRefs, {"body.Body"}},
      {speed_, kvPropFrm_SigRefs, {"Speed.Value" + at}},
      {engine, kvPropECU_TxFrmRefs, {"Speed" + at, "Brake" + at, "Gear" + at}},
      {speed_, kvPropFrm_PDURefs, {"Speed" + at}},
      {cluster_, kvPropClst_LINSchedules, {"Normal" + at, "Fallback" + at}},
      {schedule_, kvPropLINSched_Entries, {"Normal.First" + at}},
  };
  for (const auto &row : rows) {
    SCOPED_TRACE(testing::Message() << std::hex << row.id);
    SvHandle out = nullptr;
    if ((row.id >> 24) == 0x06) {
      ASSERT_EQ(kvsvdbGetPropRef1D(row.object, row.id, &out, &info_), 0) << Annotation();
      EXPECT_EQ(Texts(out), row.texts);
      DisposeHandleArray(&out);
    } else {
      ASSERT_EQ(kvsvdbGetPropRef(row.object, row.id, &out, &info_), 0) << Annotation();
      EXPECT_EQ(Text(Keep(out)), row.texts.at(0));
    }
  }
  // Names have a shape of their own; a property that refers to nothing is no reference.
  SvHandle out = nullptr;
  for (uint32_t id : {uint32_t{kvPropSig_Name}, uint32_t{kvPropSig_StartBit}}) {
    EXPECT_EQ(kvsvdbGetPropRef(value, id, &out, &info_), kvErrInternal);
    EXPECT_EQ(kvsvdbGetPropRef1D(value, id, &out, &info_), kvErrInternal);
    EXPECT_NE(Annotation(), "");
  }
  EXPECT_EQ(out, nullptr);
}

TEST_F(DbPropertyTest, ReferencesAreSetByTheirTextsAndEveryHandleMadeIsClosed) {
  const uint32_t engine = DbFind(cluster_, kEcu, "Engine");
  // The collision-resolving schedule alone is set by text, found as a LIN schedule.
  SvHandle fallback = Keep(svsimMakeString("Fallback\nbody.Body")), out = nullptr;
  kvsimLogClear();
  EXPECT_EQ(kvsvdbSetPropRef(entry_, kvPropLINSchedEntry_Sched, &fallback, &info_), kvErrInternal);
  EXPECT_EQ(Annotation(), "\nProperty: Sched");
  EXPECT_EQ(kvsvdbSetPropRef(entry_, kvPropLINSched_Name, &fallback, &info_), kvErrInternal);
  EXPECT_EQ(kvsimCountCalls("kvdbOpenDatabase") + kvsimCountCalls("kvdbSetProperty"), 0);
  ASSERT_EQ(kvsvdbSetPropRef(entry_, kvPropLINSchedEntry_CollisionResSched, &fallback, &info_), 0);
  EXPECT_EQ(LastCall("kvdbFindObject").size1, kSchedule);
  EXPECT_EQ(kvsimCountCalls("kvdbCloseDatabase"), 1);
  ASSERT_EQ(kvsvdbGetPropRef(entry_, kvPropLINSchedEntry_CollisionResSched, &out, &info_), 0);
  EXPECT_EQ(Text(Keep(out)), "Fallback\nbody.Body");
  out = nullptr;
  // Lists by the class of their elements; the first text that does not resolve ends the walk,
  // sets nothing and closes what was resolved (and the failed find its database).
  SvHandle frames = Strings({"Brake\nbody.Body", "Gear\nbody.Body"});
  SvHandle broken = Strings({"Speed\nbody.Body", "Nope\nbody.Body", "Brake\nbody.Body"});
  kvsimLogClear();
  EXPECT_EQ(kvsvdbSetPropRef1D(engine, kvPropECU_TxFrmRefs, &broken, &info_),
            kvsimErrObjectNotFound);
  EXPECT_EQ(Annotation(), "\nProperty: TxFrmRefs");
  EXPECT_EQ(kvsimCountCalls("kvdbSetProperty"), 0);
  EXPECT_EQ(kvsimCountCalls("kvdbFindObject"), 4);
  EXPECT_EQ(kvsimCountCalls("kvdbCloseDatabase"), 2);
  kvsimLogClear();
  ASSERT_EQ(kvsvdbSetPropRef1D(engine, kvPropECU_TxFrmRefs, &frames, &info_), 0) << Annotation();
  EXPECT_EQ(LastCall("kvdbSetProperty").size1, 8u);
  EXPECT_EQ(kvsimCountCalls("kvdbCloseDatabase"), 2);
  ASSERT_EQ(kvsvdbGetPropRef1D(engine, kvPropECU_TxFrmRefs, &out, &info_), 0);
  EXPECT_EQ(Texts(out), (std::vector<std::string>{"Brake\nbody.Body", "Gear\nbody.Body"}));
  DisposeHandleArray(&out);
  // Lists of unknown elements and text properties are refused untouched; empty sources clear.
  kvsimLogClear();
  EXPECT_EQ(kvsvdbSetPropRef1D(cluster_, kvPropClst_FrmRefs, &frames, &info_), kvErrInternal);
  EXPECT_EQ(kvsvdbSetPropRef1D(speed_, kvPropFrm_Name, &frames, &info_), kvErrInternal);
  EXPECT_EQ(kvsimCountCalls("kvdbOpenDatabase") + kvsimCountCalls("kvdbSetProperty"), 0);
  SvHandle empty = Keep(svsimMakeString(""));
  ASSERT_EQ(kvsvdbSetPropRef(entry_, kvPropLINSchedEntry_CollisionResSched, &empty, &info_), 0);
  EXPECT_EQ(LastCall("kvdbSetProperty").size1, 0u);
  ASSERT_EQ(kvsvdbSetPropRef1D(engine, kvPropECU_RxFrmRefs, &out, &info_), 0);
  EXPECT_EQ(LastCall("kvdbSetProperty").size1, 0u);
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 1);
}

TEST_F(DbPropertyTest, PduMappingJoinsThreeListsAndSplitsThemAgain) {
  SvHandle source = Keep(svNewHandleClr(8 + 2 * 16)), mapping = nullptr;
  ArrayCount(source) = 2;
  Mapping(source)[0] = {Keep(svsimMakeString("Brake\nbody.Body")), 0, 8};
  Mapping(source)[1] = {Keep(svsimMakeString("Gear\nbody.Body")), 16, 0xFFFFFFFFu};
  const uint64_t live = svsimLiveHandles();
  ASSERT_EQ(kvsvdbSetPropPDU_Mapping(speed_, kvPropFrm_PDU_Mapping, &source, &info_), 0);
  EXPECT_EQ(svsimLiveHandles(), live);  // the host's strings were lent, not copied or freed
  // Each element owns a copy of its string; a second read reuses them.
  for (int round = 0; round < 2; ++round) {
    ASSERT_EQ(kvsvdbGetPropPDU_Mapping(speed_, kvPropFrm_PDU_Mapping, &mapping, &info_), 0);
    EXPECT_EQ(svsimLiveHandles(), live + 3);
    ASSERT_EQ(ArrayCount(mapping), 2);
    EXPECT_EQ(svGetHandleSize(mapping), 40u);
    for (int i = 0; i < 2; ++i) {
      EXPECT_NE(Mapping(mapping)[i].pdu, Mapping(source)[i].pdu);
      EXPECT_EQ(Text(Mapping(mapping)[i].pdu), Text(Mapping(source)[i].pdu));
      EXPECT_EQ(Mapping(mapping)[i].startBit, Mapping(source)[i].startBit);
      EXPECT_EQ(Mapping(mapping)[i].updateBit, Mapping(source)[i].updateBit);
    }
  }
  // The shortest list wins; an element it drops takes its string along.
  const uint32_t three[] = {0, 16, 24}, one = 0;
  ASSERT_EQ(kvdbSetProperty(speed_, kvPropFrm_PDUStartBits, sizeof three, three), 0);
  ASSERT_EQ(kvsvdbGetPropPDU_Mapping(speed_, kvPropFrm_PDU_Mapping, &mapping, &info_), 0);
  EXPECT_EQ(ArrayCount(mapping), 2);
  ASSERT_EQ(kvdbSetProperty(speed_, kvPropFrm_PDUStartBits, sizeof one, &one), 0);
  ASSERT_EQ(kvsvdbGetPropPDU_Mapping(speed_, kvPropFrm_PDU_Mapping, &mapping, &info_), 0);
  EXPECT_EQ(ArrayCount(mapping), 1);
  EXPECT_EQ(svsimLiveHandles(), live + 2);
  // A null string reaches the resolve and sets nothing; an empty mapping clears the three lists.
  Mapping(source)[1].pdu = nullptr;
  kvsimLogClear();
  EXPECT_EQ(kvsvdbSetPropPDU_Mapping(speed_, kvPropFrm_PDU_Mapping, &source, &info_),
            kvErrDbReferenceEmpty);
  EXPECT_EQ(Annotation(), "\nProperty: PDU_Mapping");
  ArrayCount(source) = 0;
  ASSERT_EQ(kvsvdbSetPropPDU_Mapping(speed_, kvPropFrm_PDU_Mapping, &source, &info_), 0);
  std::vector<uint32_t> sets;
  kvsimCallRecord call{};
  for (int32_t i = 0; kvsimLogEntry(i, &call) == 1; ++i)
    if (call.function == std::string("kvdbSetProperty"))
      sets.push_back(call.propertyId + call.size1);
  EXPECT_EQ(sets, (std::vector<uint32_t>{kvPropFrm_PDURefs, kvPropFrm_PDUStartBits,
                                         kvPropFrm_PDUUpdateBits}));
  // Another identifier is refused without naming any property; String1D has no setter.
  EXPECT_EQ(kvsvdbGetPropPDU_Mapping(speed_, kvPropFrm_PDURefs, &mapping, &info_), kvErrInternal);
  EXPECT_EQ(kvsvdbSetPropPDU_Mapping(speed_, kvPropFrm_PDURefs, &source, &info_), kvErrInternal);
  EXPECT_EQ(info_, nullptr);
  EXPECT_EQ(kvsvdbSetPropString1D(speed_, kvPropFrm_SigRefs, &mapping, &info_), kvErrInternal);
  EXPECT_EQ(Annotation(), "\nProperty: SigRefs");
  DisposeHandleArray(&mapping);
}

// No database object has a comma list: the driver refuses an identifier it does not know, and the
// output stays as it was.
TEST_F(DbPropertyTest, UnknownIdentifiersAreTheDriversToRefuse) {
  SvHandle array = Strings({"kept"});
  EXPECT_EQ(kvsvdbGetPropString1D(speed_, 0x04020001, &array, &info_), kvsimErrPropertyUnknown);
  EXPECT_EQ(Texts(array), std::vector<std::string>{"kept"});
  EXPECT_EQ(Annotation(), "\nProperty: (unknown ID hex 04020001)");
}

}  // namespace
