// Database objects as host programs hold them: reference texts parsed into driver handles, the
// manual and automatic roads of open and close with their end at the driver, the texts built for
// objects, and objects created and deleted under a reference.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "core/host_handles.h"
#include "database/db_life_manager.h"
#include "database/find_by_reference_string.h"
#include "kvorproperties.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "session/db_reference_strings.h"
#include "session/kvorutility.h"
#include "support/call_log.h"
#include "support/fake_error_log.h"
#include "support/host_strings.h"
#include "support/scoped_env.h"
#include "support/temp_dir.h"
#include "svsim.h"

namespace {

using namespace nKVSVAPI100;
using kvsvtest::LastCall;
using kvsvtest::Text;

constexpr uint32_t kCluster = 0x10000, kFrame = 0x20000, kSignal = 0x30000;

// A database file whose cluster is named `cluster`: one frame Speed with the signal Value, and a
// frame Brake.
std::string DbcText(const std::string &cluster) {
  return "VERSION \"\"\nNS_ :\nBS_:\nBU_: ECU1\n"
         "BO_ 256 Speed: 8 ECU1\n SG_ Value : 0|16@1+ (1,0) [0|65535] \"\" ECU1\n"
         "BO_ 257 Brake: 8 ECU1\n SG_ Level : 0|8@1+ (1,0) [0|255] \"\" ECU1\n"
         "BA_DEF_ \"DBName\" STRING ;\nBA_ \"DBName\" \"" + cluster + "\";\n";
}

// The host's string handle of a text, disposed of at the end of its scope.
struct cHostText {
  explicit cHostText(const std::string &text) : handle(svsimMakeString(text.c_str())) {}
  ~cHostText() { svDisposeHandle(handle); }
  SvHandle handle;
};

class DbReferences : public testing::Test {
 protected:
  void SetUp() override {
    kvsimReset();
    svsimReset();
    dir_.WriteFile("body", DbcText("Body"));
    dir_.WriteFile("plain", DbcText("Cluster"));
    dir_.WriteFile("My.Db", DbcText("Cl"));
  }
  void TearDown() override { EXPECT_EQ(kvsvGetNumOpenDatabases(), before_); }

  kvsvtest::cTempDir dir_;
  kvsvtest::cScopedEnv env_{"KVSIM_DATABASE_DIR", dir_.Path()};
  uint32_t before_ = kvsvGetNumOpenDatabases();
};

TEST_F(DbReferences, ReferenceTextsOpenTheirDatabaseAndFindTheirObject) {
  const int32_t notFound = kvsimErrObjectNotFound, noDb = kvsimErrDatabaseNotFound;
  struct {
    const char *text;
    uint32_t objectClass;
    int32_t status;
    const char *database;  // opened at the driver; null: nothing opened
    const char *finds;     // the names looked for, '|' between
  } const rows[] = {
      {"Speed\nbody.Body", kFrame, 0, "body", "Body|Speed"},
      {"Speed \n \nbody.Body", kFrame, 0, "body", "Body|Speed"},
      {"Speed.Value\nMy.Db.Cl", kSignal, 0, "My.Db", "Cl|Speed.Value"},
      {"Value\nbody.Body", kSignal, 0, "body", "Body|Value"},
      {"body.Body", kCluster, 0, "body", "Body"},
      {"body", kCluster, 0, "body", ""},
      {"My.Speed\nbody.Body", kFrame, kvErrDbReferenceTooDeep, nullptr, ""},
      {"A.B.C\nbody.Body", kSignal, kvErrDbReferenceTooDeep, nullptr, ""},
      {"My.Speed", kFrame, kvErrDbReferenceTooDeep, nullptr, ""},
      {"Speed", kFrame, kvErrDbReferenceSyntax, nullptr, ""},
      {"Speed\n \n", kFrame, kvErrDbReferenceSyntax, nullptr, ""},
      {"", kFrame, kvErrDbReferenceEmpty, nullptr, ""},
      {"\nbody.Body", kFrame, notFound, "body", "Body|"},
      {"Speed\nbody.Other", kFrame, notFound, "body", "Other"},
      {"Speed\nbody.", kFrame, noDb, "body.", ""},
      {"Speed\nnone", kFrame, noDb, "none", ""},
  };
  for (const auto &row : rows) {
    SCOPED_TRACE(testing::PrintToString(std::string(row.text)));
    kvsimLogClear();
    cHostText text(row.text);
    uint32_t database = 7, object = 7;
    EXPECT_EQ(FindDbObjectByReferenceString(text.handle, row.objectClass, &database, &object),
              row.status);
    EXPECT_EQ(object != 0, row.status == 0);
    EXPECT_EQ(kvsimCountCalls("kvdbOpenDatabase"), row.database != nullptr ? 1 : 0);
    if (row.database != nullptr) {
      EXPECT_STREQ(LastCall("kvdbOpenDatabase").text, row.database);
    }
    std::string finds;
    kvsimCallRecord call{};
    for (int32_t i = 0; kvsimLogEntry(i, &call) == 1; ++i)
      if (call.function == std::string("kvdbFindObject"))
        finds += (finds.empty() ? "" : "|") + std::string(call.text);
    EXPECT_EQ(finds, row.finds);
    if (object != 0) {
      EXPECT_EQ(kvdbCloseDatabase(object, 0), 0);
    }
    EXPECT_EQ(kvsimLoadedDatabaseCount(), 0) << "a failed find closes what it opened";
  }
  uint32_t database = 7, object = 7;
  EXPECT_EQ(FindDbObjectByReferenceString(nullptr, kFrame, &database, &object),
            kvErrDbReferenceEmpty);
  EXPECT_EQ(database + object, 0u);
}

// Two programs hold objects of one database through the host's references, one opened while the
// other ends: the driver's database stays loaded until the program that holds it last has ended.
TEST_F(DbReferences, TheDriverClosesWhenTheLastProgramHoldingTheDatabaseEnds) {
  for (const bool frameEndsFirst : {true, false}) {
    SCOPED_TRACE(frameEndsFirst);
    kvsimReset();
    const char *texts[] = {"Speed\nbody.Body", "Speed.Value\nbody.Body"};
    const char *opens[] = {"kvsvdbFrameOpen", "kvsvdbSignalOpen"};
    const char *closes[] = {"kvsvdbFrameClose", "kvsvdbSignalClose"};
    const int first = frameEndsFirst ? 0 : 1, second = 1 - first;
    uint32_t handles[2] = {};
    ASSERT_EQ(svsimOpenRefByText(opens[first], closes[first], "KVOR", texts[first],
                                 &handles[first]), 0);
    ASSERT_EQ(kvsimHold("kvdbCloseDatabase"), 0);
    ASSERT_EQ(svsimEndProgramAsync(), 0);
    ASSERT_EQ(kvsimWaitParked("kvdbCloseDatabase", 1), 1);
    ASSERT_EQ(svsimOpenRefByText(opens[second], closes[second], "KVOR", texts[second],
                                 &handles[second]), 0);
    EXPECT_EQ(ClassFromHandle(static_cast<int32_t>(handles[second])), first == 0 ? kSignal : kFrame);
    ASSERT_EQ(kvsimRelease("kvdbCloseDatabase"), 0);
    SvsimEndReport report{};
    ASSERT_EQ(svsimJoinEndProgram(&report), 0);
    EXPECT_EQ(report.closesCalled, 1);
    EXPECT_EQ(kvsimLoadedDatabaseCount(), 1) << "the second program still holds it";
    EXPECT_EQ(kvsvGetNumOpenDatabases(), before_ + 1);
    ASSERT_EQ(svsimEndProgram(&report), 0);
    EXPECT_EQ(report.closesCalled, 1);
    EXPECT_EQ(kvsimLoadedDatabaseCount(), 0);
    EXPECT_EQ(kvsimCountCalls("kvdbCloseDatabase"), 2);
  }
}

// The manual road: a text opened again is the same object, so that its one close ends it; a
// close of everything ends every reference of the database by its text.
TEST_F(DbReferences, ManualOpensAndTheirClosesOneByOneOrAllAtOnce) {
  cHostText frame("Speed\nbody.Body"), signal("Speed.Value\nbody.Body");
  kvsvRefnum refs[3] = {};
  ASSERT_EQ(kvsvdbManualOpen(kFrame, frame.handle, &refs[0]), 0);
  ASSERT_EQ(kvsvdbManualOpen(kFrame, frame.handle, &refs[1]), 0);
  SvsimRefInfo info[2];
  ASSERT_EQ(svsimGetRef(0, &info[0]) + svsimGetRef(1, &info[1]), 2);
  EXPECT_EQ(info[0].handle, info[1].handle);
  EXPECT_STREQ(info[0].closeName, "kvsvdbFrameClose");
  EXPECT_EQ(kvsimCountCalls("kvdbOpenDatabase"), 1);
  uint64_t out[2] = {9, 9};
  EXPECT_EQ(kvsvdbManualClose(info[0].handle, frame.handle, refs[0], 0, &out[0], &out[1]), 0);
  EXPECT_EQ(out[0] + out[1], 0u);
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 0) << "one holder for both opens";
  EXPECT_EQ(svsimRefCount(), 1);
  EXPECT_EQ(kvsvdbUnregisterWithSV(refs[1]), 0);

  ASSERT_EQ(kvsvdbManualOpen(kFrame, frame.handle, &refs[0]), 0);
  ASSERT_EQ(kvsvdbManualOpen(kSignal, signal.handle, &refs[1]), 0);
  ASSERT_EQ(svsimGetRef(0, &info[0]), 1);
  kvsvRefnum automatic = 0;
  uint32_t refused = 0;
  EXPECT_EQ(kvsvdbAutoOpenDbObject(&frame.handle, kFrame, &refused, 0), 0)
      << "a known text is answered from the account, whatever its road";
  cHostText brake("Brake\nbody.Body");
  EXPECT_EQ(kvsvdbAutoOpenDbObject(&brake.handle, kFrame, &refused, automatic),
            kvErrDatabaseModeConflict);
  uint32_t value = 0;
  EXPECT_EQ(kvdbGetProperty(refused, kvPropFrm_ID, sizeof value, &value),
            kvErrDatabaseModeConflict) << "the refusal travels in the handle";
  EXPECT_EQ(kvsvdbManualClose(info[0].handle, frame.handle, refs[0], 1, nullptr, nullptr), 0);
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 0);
  EXPECT_EQ(LastCall("kvdbCloseDatabase").size1, 1u);
  EXPECT_EQ(kvdbCloseDatabase(refused, 0), 0);
}

// A failed automatic open still hands the host an object, which answers with the failure; the
// account keeps it only where a database was found, and its close leaves nothing behind.
TEST_F(DbReferences, AFailedAutomaticOpenGivesAnObjectThatCarriesItsFailure) {
  const struct {
    const char *text;
    int32_t status;
    uint32_t kept;  // databases in the account while the object lives
  } cases[] = {{"Speed\nnowhere", kvsimErrDatabaseNotFound, 0},
               {"Nothing\nbody.Body", kvsimErrObjectNotFound, 1}};
  for (const auto &c : cases) {
    SCOPED_TRACE(c.text);
    cHostText text(c.text);
    uint32_t handle = 0;
    EXPECT_EQ(kvsvdbAutoOpenDbObject(&text.handle, kFrame, &handle, 0), c.status);
    ASSERT_NE(handle, 0u);
    uint32_t value = 0;
    EXPECT_EQ(kvdbGetProperty(handle, kvPropFrm_ID, sizeof value, &value), c.status);
    EXPECT_EQ(kvsvGetNumOpenDatabases(), before_ + c.kept);
    kvsvdbAutoCloseDbObject(handle);
    EXPECT_EQ(kvdbGetProperty(handle, kvPropFrm_ID, sizeof value, &value),
              kvsimErrInvalidDatabase) << "closed";
  }
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 0);
}

TEST_F(DbReferences, ManualCloseGivesTheFirstFailureInItsOrder) {
  const int32_t driverFailure = kvsimErrInternal;
  struct {
    int32_t closeAll;
    bool unknownHandle, closeFails, hostFails;
    int32_t status;
  } const rows[] = {
      {0, false, false, false, 0},
      {0, false, true, true, driverFailure},
      {0, false, false, true, kvErrInternal},
      {0, true, false, false, kvErrDbObjectNotFound},
      {1, false, true, true, driverFailure},
      {1, false, false, true, kvErrInternal},
      {1, true, false, false, kvErrDbObjectNotFound},
  };
  kvsvtest::cFakeErrorLog log;
  for (const auto &row : rows) {
    SCOPED_TRACE(testing::Message() << row.closeAll << row.unknownHandle << row.closeFails
                                    << row.hostFails);
    cHostText text("Speed\nbody.Body");
    kvsvRefnum ref = 0;
    ASSERT_EQ(kvsvdbManualOpen(kFrame, text.handle, &ref), 0);
    SvsimRefInfo info;
    ASSERT_EQ(svsimGetRef(0, &info), 1);
    uint32_t handle = info.handle;
    if (row.unknownHandle) {
      EXPECT_EQ(kvsvdbAutoCloseDbObject(handle), 0);
      EXPECT_EQ(kvdbOpenDatabase("body", &handle), 0);
    }
    if (row.closeFails) kvsimFailCall("kvdbCloseDatabase", driverFailure, 1);
    if (row.hostFails) svsimSetRefStatus(SVSIM_REF_NOT_FOUND);
    EXPECT_EQ(kvsvdbManualClose(handle, text.handle, ref, row.closeAll, nullptr, nullptr),
              row.status);
    svsimReset();
    kvsimReset();
  }
}

// Created objects are named by their reference text, which finds them again; an object that
// could not be created still gets a reference, which names what was asked for.
TEST_F(DbReferences, CreateRegistersTheTextOfTheObjectOrOfWhatCouldNotBeMade) {
  kvsvtest::cFakeErrorLog log;
  uint32_t database = 0, cluster = 0;
  ASSERT_EQ(kvdbOpenDatabase("body", &database), 0);
  ASSERT_EQ(kvdbFindObject(database, kCluster, "Body", &cluster), 0);
  struct {
    uint32_t objectClass;
    const char *name;
    int32_t failCreate;
    int32_t status;
    const char *reference;
  } const rows[] = {
      {kFrame, "Gear", 0, 0, "Gear\nbody.Body"},
      {kFrame, "Gear2", kvsimErrInvalidName, kvsimErrInvalidName, "___kvorInvalid__Gear2"},
      {0x90000, "Odd", 0, kvErrInternal, nullptr},  // a class the host cannot be told of
  };
  for (const auto &row : rows) {
    SCOPED_TRACE(row.name);
    if (row.failCreate != 0) kvsimFailCall("kvdbCreateObject", row.failCreate, 1);
    kvsvRefnum ref = 0;
    EXPECT_EQ(kvsvdbCreateObject(cluster, row.objectClass, row.name, &ref), row.status);
    SvsimRefInfo info;
    if (row.reference == nullptr) {
      EXPECT_EQ(svsimRefCount(), 2);
      continue;
    }
    ASSERT_EQ(svsimFindRef(row.reference, &info), 1);
    EXPECT_EQ(info.cookie, ref);
    EXPECT_EQ(info.handle == 0x0FFFFFFFu, row.status != 0);
  }
  ASSERT_EQ(log.Records().size(), 2u) << "the unknown class, and its registration";
  EXPECT_EQ(log.Records()[0].value.File() * 10000 + log.Records()[0].value.Line(), 20546u);
  EXPECT_EQ(log.Records()[1].value.File() * 10000 + log.Records()[1].value.Line(), 162451u);

  // The created frame is found by its text; 150 holders are more than a delete gives back one
  // by one, and it is deleted all the same.
  SvsimRefInfo gear;
  ASSERT_EQ(svsimFindRef("Gear\nbody.Body", &gear), 1);
  cHostText text("Gear\nbody.Body");
  cDbLifeManager &manager = GetDbLifeManager();
  for (int i = 1; i < 150; ++i) {
    tDbObject more{gear.handle, database, kFrame, 0};
    manager.FindByName(text.handle, nullptr);
    ASSERT_EQ(manager.AddObject(text.handle, more, 0, kDbOpenUndecided), 0);
  }
  // The close after the delete gives back the open that the create's reference took.
  EXPECT_EQ(kvsvdbDeleteObject(gear.handle, gear.cookie), 0);
  EXPECT_EQ(LastCall("kvdbDeleteObject").status, 0);
  EXPECT_EQ(LastCall("kvdbCloseDatabase").object, gear.handle);
  ASSERT_EQ(log.Records().size(), 3u);
  EXPECT_EQ(log.Records()[2].value.Line(), 683u);
  EXPECT_EQ(svsimFindRef("Gear\nbody.Body", &gear), 0);
  uint32_t gone = 0;
  EXPECT_EQ(kvdbFindObject(cluster, kFrame, "Gear", &gone), kvsimErrObjectNotFound);
  uint32_t last = 0;
  for (int held = 50; held > 0; --held) {
    ASSERT_EQ(manager.ReleaseByHandle(gear.handle, &last), 0);
    EXPECT_EQ(last, held == 1 ? 1u : 0u) << "the holders beyond the hundredth stay";
  }
  EXPECT_EQ(kvdbCloseDatabase(database, 0), 0);
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 0) << "one open left, the test's own";
}

// A reference text carries its location: the database, and the cluster unless it is "Cluster".
TEST_F(DbReferences, TextsOfObjectsInEveryOutputMode) {
  struct {
    const char *file, *cluster, *location;
  } const rows[] = {{"body", "Body", "\nbody.Body"}, {"plain", "Cluster", "\nplain"}};
  for (const auto &row : rows) {
    SCOPED_TRACE(row.file);
    uint32_t database = 0, cluster = 0;
    ASSERT_EQ(kvdbOpenDatabase(row.file, &database), 0);
    ASSERT_EQ(kvdbFindObject(database, kCluster, row.cluster, &cluster), 0);
    const std::string speed = std::string("Speed") + row.location;
    const std::string brake = std::string("Brake") + row.location;

    SvHandle array = nullptr;
    tReferenceOutput output;
    output.handle = &array;
    ASSERT_EQ(BuildReferenceStrings(cluster, kvPropClst_FrmRefs, kvPropFrm_Name, output,
                                    kReferenceArray, 1), 0);
    EXPECT_EQ(kvsvtest::Texts(array), (std::vector<std::string>{speed, brake}));
    DisposeHandleArray(&array);

    ASSERT_EQ(BuildReferenceStrings(cluster, kvPropClst_FrmRefs, kvPropFrm_Name, output,
                                    kReferenceVariants, 1), 0);
    ASSERT_EQ(ArrayCount(array), 2);
    char name[64];
    svsimVariantGetStringAttr(ArrayData8<uint64_t>(array) + 1, "n", name, sizeof name);
    EXPECT_EQ(name, brake);
    svsimDisposeVariantArray(array);
    array = nullptr;

    std::string text;
    output.text = &text;
    ASSERT_EQ(BuildReferenceStrings(cluster, kvPropClst_FrmRefs, kvPropFrm_Name, output,
                                    kReferenceText, 0), 0);
    EXPECT_EQ(text, "Speed,Brake") << "unqualified";

    ASSERT_EQ(BuildReferenceStrings(cluster, kReferenceListSelf, kvPropClst_Name, output,
                                    kReferenceString, 1), 0);
    EXPECT_EQ(Text(array), std::string(row.file) + "." + row.cluster);
    DisposeHandle(&array);
    EXPECT_EQ(kvdbCloseDatabase(database, 1), 0);
  }
}

TEST_F(DbReferences, AnImplicitCloseOfAFrameIsReportedWithItsClass) {
  kvsvtest::cFakeErrorLog log;
  cHostText frame("Speed\nbody.Body");
  uint32_t handle = 0;
  ASSERT_EQ(kvsvdbAutoOpenDbObject(&frame.handle, kFrame, &handle, 0), 0);
  gReportImplicitClose = 1;
  EXPECT_EQ(kvsvdbDatabaseClose(handle), 0) << "a close of another class sends it on";
  gReportImplicitClose = 0;
  ASSERT_EQ(log.Records().size(), 1u);
  EXPECT_EQ(log.Records()[0].value.Line(), 2232u);
  EXPECT_EQ(log.Records()[0].value.info, kFrame);
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 0);
}

}  // namespace
