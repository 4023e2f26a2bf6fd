// The database life manager: holders of texts and handles, when the driver's close is due, open
// kinds, error objects standing for failed opens, and the walk over a database's texts.
#include "database/db_life_manager.h"

#include <gtest/gtest.h>

#include <map>
#include <string>
#include <tuple>

#include "database/db_life_test_support.h"
#include "kvsim.h"
#include "kvsvplatform.h"
#include "support/fake_error_log.h"

namespace {

using namespace nKVSVAPI100;
using kvsvtest::cHostText;
using kvsvtest::FreshDatabase;
using kvsvtest::Lookup;
using kvsvtest::Open;

constexpr uint32_t kFrame = 0x20000;
constexpr uint32_t kSignal = 0x30000;

class DbLife : public testing::Test {
 protected:
  void SetUp() override {
    kvsimReset();
    db_ = FreshDatabase();
    databasesBefore_ = m_.GetNumDatabases();
  }
  void TearDown() override { kvsimReset(); }

  Status ReleaseHandle(uint32_t handle, uint32_t &last) { return m_.ReleaseByHandle(handle, &last); }
  Status ReleaseName(const std::string &text, uint32_t handle, uint32_t &last) {
    cHostText name(text);
    return m_.ReleaseByName(name.Handle(), handle, &last);
  }
  // The texts of the database of `handle` with their objects, as a closing walk sees them.
  std::map<std::string, tDbObject> Walk(uint32_t handle, Status *begun = nullptr) {
    std::map<std::string, tDbObject> seen;
    uint32_t count = 99;
    const Status status = m_.BeginWalk(handle, &count);
    if (begun != nullptr) *begun = status;
    if (status != 0 || count == 0) return seen;
    for (uint32_t i = 0; i < count; ++i) {
      tDbObject object;
      std::string name;
      EXPECT_EQ(m_.NextInWalk(&object, &name), 0);
      seen[name] = object;
    }
    tDbObject end{1, 1, 1, 1};
    std::string endName = "x";
    EXPECT_EQ(m_.NextInWalk(&end, &endName), 0);
    EXPECT_EQ(end.object, 0u) << "a walk ends on object 0";
    EXPECT_EQ(endName, "");
    EXPECT_EQ(m_.EndWalk(), 0);
    return seen;
  }
  // The manager outlives each test: texts of their own keep tests apart.
  std::string T(const char *text) const {
    return std::string(text) + "@" + std::to_string(db_);
  }
  static int Calls(const char *function) { return kvsimCountCalls(function); }

  cDbLifeManager &m_ = GetDbLifeManager();
  uint32_t db_ = 0;
  uint32_t databasesBefore_ = 0;
};

TEST_F(DbLife, SameTextOpenedTwiceHasOneHolder) {
  ASSERT_EQ(Open(T("F1\ndb"), {db_ + 1, db_, kFrame, 0}), 0);
  EXPECT_EQ(m_.GetNumDatabases(), databasesBefore_ + 1);
  EXPECT_EQ(Lookup(T("F1\ndb")), db_ + 1) << "the second open finds the first's object";
  uint32_t last = 9;
  EXPECT_EQ(ReleaseName(T("F1\ndb"), db_ + 1, last), 0);
  EXPECT_EQ(last, 1u) << "the second open added no holder";
  EXPECT_EQ(Lookup(T("F1\ndb")), 0u);
  EXPECT_EQ(m_.GetNumDatabases(), databasesBefore_) << "the database went with its last text";
}

TEST_F(DbLife, CreateUnderAKnownTextAddsAHolder) {
  ASSERT_EQ(Open(T("F1"), {db_ + 1, db_, kFrame, 0}), 0);
  ASSERT_EQ(Open(T("F1"), {db_ + 1, db_, kFrame, 0}, 0, kDbOpenUndecided), 0);
  uint32_t last = 9;
  EXPECT_EQ(ReleaseName(T("F1"), db_ + 1, last), 0);
  EXPECT_EQ(last, 0u);
  EXPECT_EQ(ReleaseName(T("F1"), db_ + 1, last), 0);
  EXPECT_EQ(last, 1u);
}

TEST_F(DbLife, ReleaseByHandleEndsWhenNoTextOfTheHandleHasHolders) {
  ASSERT_EQ(Open(T("F1"), {db_ + 1, db_, kFrame, 0}), 0);
  ASSERT_EQ(Open(T("F1 again"), {db_ + 1, db_, kFrame, 0}), 0);
  ASSERT_EQ(Open(T("F2"), {db_ + 2, db_, kFrame, 0}), 0);
  uint32_t last = 9;
  EXPECT_EQ(ReleaseHandle(db_ + 1, last), 0);
  EXPECT_EQ(last, 0u);
  EXPECT_EQ(ReleaseHandle(db_ + 1, last), 0);
  EXPECT_EQ(last, 1u);
  EXPECT_EQ(Lookup(T("F1")), 0u);
  EXPECT_EQ(Lookup(T("F1 again")), 0u);
  EXPECT_EQ(Lookup(T("F2")), db_ + 2) << "other handles keep their texts";
  EXPECT_EQ(m_.GetNumDatabases(), databasesBefore_ + 1);
}

TEST_F(DbLife, UnknownHandles) {
  const uint32_t unknown = db_ + 0x55;
  uint32_t last = 9;
  EXPECT_EQ(ReleaseHandle(unknown, last), kvErrDbObjectNotFound);
  EXPECT_EQ(last, 1u) << "an unknown handle counts as the last: the caller closes it";
  last = 9;
  EXPECT_EQ(ReleaseName(T("F1"), unknown, last), kvErrDbObjectNotFound);
  EXPECT_EQ(last, 0u);
  uint32_t count = 9;
  EXPECT_EQ(m_.BeginWalk(unknown, &count), kvErrDbObjectNotFound);
  EXPECT_EQ(count, 0u);
  EXPECT_EQ(m_.RemoveChildren(unknown), kvErrDbObjectNotFound);
  EXPECT_EQ(m_.RemoveDatabase(unknown), kvErrDbObjectNotFound);
}

TEST_F(DbLife, ChildOfARemovedDatabaseIsKnownWithoutDatabase) {
  ASSERT_EQ(Open(T("db"), {db_, db_, 0, 0}), 0);
  ASSERT_EQ(Open(T("F1"), {db_ + 1, db_, kFrame, 0}), 0);
  ASSERT_EQ(m_.RemoveDatabase(db_), 0);
  EXPECT_EQ(m_.GetNumDatabases(), databasesBefore_);
  EXPECT_EQ(Lookup(T("F1")), 0u);
  Status begun = 1;
  EXPECT_TRUE(Walk(db_ + 1, &begun).empty());
  EXPECT_EQ(begun, 0);
  uint32_t last = 9;
  EXPECT_EQ(ReleaseHandle(db_ + 1, last), 0);
  EXPECT_EQ(last, 1u);
  EXPECT_EQ(ReleaseName(T("db"), db_, last), 0) << "the database's own entry stayed as well";
  EXPECT_EQ(last, 1u);
}

TEST_F(DbLife, OpenKindsOfADatabaseMustAgree) {
  struct Case {
    uint32_t first, second, third;
    Status expected;  // of the third open
  } cases[] = {
      {kDbOpenManual, kDbOpenManual, kDbOpenAutomatic, kvErrDatabaseModeConflict},
      {kDbOpenAutomatic, kDbOpenAutomatic, kDbOpenManual, kvErrDatabaseModeConflict},
      {kDbOpenUndecided, kDbOpenManual, kDbOpenAutomatic, kvErrDatabaseModeConflict},
      {kDbOpenUndecided, kDbOpenAutomatic, kDbOpenManual, kvErrDatabaseModeConflict},
      {kDbOpenUndecided, kDbOpenUndecided, kDbOpenManual, 0},
      {kDbOpenManual, kDbOpenUndecided, kDbOpenManual, 0},
      {kDbOpenAutomatic, kDbOpenUndecided, kDbOpenUndecided, 0},
  };
  for (const Case &c : cases) {
    const uint32_t db = FreshDatabase();
    SCOPED_TRACE(testing::Message() << c.first << c.second << c.third);
    ASSERT_EQ(Open(T("A"), {db + 1, db, kFrame, 0}, 0, c.first), 0);
    ASSERT_EQ(Open(T("B"), {db + 2, db, kFrame, 0}, 0, c.second), 0);
    EXPECT_EQ(Open(T("C"), {db + 3, db, kFrame, 0}, 0, c.third), c.expected);
    EXPECT_EQ(Lookup(T("C")), c.expected == 0 ? db + 3 : 0u);
    uint32_t last = 9;
    EXPECT_EQ(ReleaseHandle(db + 3, last), c.expected == 0 ? 0 : kvErrDbObjectNotFound);
    ASSERT_EQ(m_.RemoveDatabase(db + 1), 0);
  }
  EXPECT_EQ(Calls("kvdbCloseDatabase"), 0) << "objects of the driver are left to the caller";
}

TEST_F(DbLife, RefusedKindClosesTheErrorObjectMadeForIt) {
  ASSERT_EQ(Open(T("A"), {db_ + 1, db_, kFrame, 0}, 0, kDbOpenManual), 0);
  kvsimLogClear();
  tDbObject failed{0, db_, kFrame, 0};
  cHostText name(T("B"));
  m_.FindByName(name.Handle(), nullptr);
  EXPECT_EQ(m_.AddObject(name.Handle(), failed, kvsimErrObjectNotFound, kDbOpenAutomatic),
            kvErrDatabaseModeConflict);
  ASSERT_EQ(kvsimLogCount(), 2);
  kvsimCallRecord made{}, closed{};
  kvsimLogEntry(0, &made);
  kvsimLogEntry(1, &closed);
  EXPECT_STREQ(made.function, "kvhdndbCreateErrorObject");
  EXPECT_STREQ(closed.function, "kvdbCloseDatabase");
  EXPECT_EQ(closed.object, made.object);
  EXPECT_EQ(closed.size1, 1u);
  EXPECT_EQ(Lookup(T("B")), 0u);
}

TEST_F(DbLife, FailedOpenIsRegisteredAsAnErrorObject) {
  kvsimLogClear();
  tDbObject failed{0, db_, kSignal, 1};
  cHostText name(T("S1"));
  m_.FindByName(name.Handle(), nullptr);
  ASSERT_EQ(m_.AddObject(name.Handle(), failed, kvsimErrObjectNotFound, kDbOpenAutomatic), 0);
  ASSERT_NE(failed.object, 0u);
  EXPECT_EQ(failed.isErrorObject, 1u);
  kvsimCallRecord made{};
  ASSERT_EQ(kvsimLogEntry(0, &made), 1);
  EXPECT_STREQ(made.function, "kvhdndbCreateErrorObject");
  EXPECT_EQ(static_cast<Status>(made.size1), kvsimErrObjectNotFound);
  EXPECT_EQ(made.object, failed.object);
  uint32_t size = 0;
  EXPECT_EQ(kvdbGetPropertySize(failed.object, 0x03000001u, &size), kvsimErrObjectNotFound)
      << "the failure surfaces at the first use";
  const std::map<std::string, tDbObject> seen = Walk(failed.object);
  ASSERT_EQ(seen.count(T("S1")), 1u);
  EXPECT_EQ(seen.at(T("S1")).isErrorObject, 1u);

  EXPECT_EQ(Lookup(T("S1")), failed.object);
  uint32_t last = 9;
  kvsimLogClear();
  EXPECT_EQ(ReleaseHandle(failed.object, last), 0);
  EXPECT_EQ(last, 1u);
  kvsimCallRecord closed{};
  ASSERT_EQ(kvsimLogEntry(0, &closed), 1);
  EXPECT_STREQ(closed.function, "kvdbCloseDatabase");
  EXPECT_EQ(closed.object, failed.object);
  EXPECT_EQ(closed.size1, 1u);
  EXPECT_EQ(closed.status, 0);
  EXPECT_EQ(kvdbGetPropertySize(failed.object, 0x03000001u, &size), kvsimErrInvalidDatabase)
      << "the error object is gone";
}

TEST_F(DbLife, ErrorObjectTheDriverRefusesIsTheStatus) {
  ASSERT_EQ(kvsimFailCall("kvhdndbCreateErrorObject", kvsimErrInvalidArgument, 1), 0);
  tDbObject failed{0, db_, kFrame, 0};
  EXPECT_EQ(Open(T("F1"), failed, kvsimErrObjectNotFound), kvsimErrInvalidArgument);
  EXPECT_EQ(Lookup(T("F1")), 0u);
  EXPECT_EQ(m_.GetNumDatabases(), databasesBefore_);
}

TEST_F(DbLife, NothingToRegister) {
  cHostText empty("");
  void *nullBlock = nullptr;
  const struct {
    SvHandle name;
    uint32_t database;
  } cases[] = {{nullptr, db_}, {&nullBlock, db_}, {empty.Handle(), db_}, {nullptr, 0}};
  for (const auto &c : cases) {
    m_.FindByName(c.name, nullptr);
    tDbObject object{db_ + 1, c.database, kFrame, 1};
    EXPECT_EQ(m_.AddObject(c.name, object, 0, kDbOpenManual), 0);
    EXPECT_EQ(object.isErrorObject, 0u);
  }
  cHostText known(T("F1"));
  m_.FindByName(known.Handle(), nullptr);
  tDbObject reopened{db_ + 1, 0, kFrame, 0};
  EXPECT_EQ(m_.AddObject(known.Handle(), reopened, 0, kDbOpenManual), 0);
  EXPECT_EQ(m_.GetNumDatabases(), databasesBefore_);
  EXPECT_EQ(Calls("kvhdndbCreateErrorObject"), 0);
  uint32_t last = 9;
  EXPECT_EQ(ReleaseHandle(db_ + 1, last), kvErrDbObjectNotFound);
}

TEST_F(DbLife, ReleaseByNameEndsTheHandleWhateverItsOtherTexts) {
  ASSERT_EQ(Open(T("F1"), {db_ + 1, db_, kFrame, 0}), 0);
  ASSERT_EQ(Open(T("F1 alias"), {db_ + 1, db_, kFrame, 0}), 0);
  uint32_t last = 9;
  EXPECT_EQ(ReleaseName(T("F1"), db_ + 1, last), 0);
  EXPECT_EQ(last, 1u);
  EXPECT_EQ(Lookup(T("F1 alias")), db_ + 1) << "the other text keeps its holder";
  EXPECT_EQ(ReleaseHandle(db_ + 1, last), kvErrDbObjectNotFound) << "but the handle is gone";
  EXPECT_EQ(ReleaseName(T("F1 alias"), db_ + 1, last), kvErrDbObjectNotFound);
}

TEST_F(DbLife, ReleaseByNameOfAnUnknownTextReleasesByHandle) {
  ASSERT_EQ(Open(T("F1"), {db_ + 1, db_, kFrame, 0}), 0);
  uint32_t last = 9;
  EXPECT_EQ(ReleaseName(T("never opened"), db_ + 1, last), 0);
  EXPECT_EQ(last, 1u);
  EXPECT_EQ(Lookup(T("F1")), 0u);
}

TEST_F(DbLife, RemoveChildrenKeepsTheDatabasesOwnText) {
  ASSERT_EQ(Open(T("db"), {db_, db_, 0, 0}), 0);
  ASSERT_EQ(Open(T("F1"), {db_ + 1, db_, kFrame, 0}), 0);
  tDbObject failed{0, db_, kSignal, 0};
  ASSERT_EQ(Open(T("S1"), failed, kvsimErrObjectNotFound), 0);
  const uint32_t errorObject = Lookup(T("S1"));
  ASSERT_NE(errorObject, 0u);
  kvsimLogClear();
  ASSERT_EQ(m_.RemoveChildren(db_), 0);
  EXPECT_EQ(kvsimCountCalls("kvdbCloseDatabase"), 1) << "the error object, and only it";
  const std::map<std::string, tDbObject> seen = Walk(db_);
  ASSERT_EQ(seen.size(), 1u);
  EXPECT_EQ(seen.begin()->first, T("db"));
  uint32_t last = 9;
  EXPECT_EQ(ReleaseHandle(db_ + 1, last), kvErrDbObjectNotFound);
  EXPECT_EQ(ReleaseHandle(errorObject, last), kvErrDbObjectNotFound);
  EXPECT_EQ(ReleaseHandle(db_, last), 0);
  EXPECT_EQ(last, 1u);
}

TEST_F(DbLife, WalkListsEveryTextWithItsObject) {
  const std::map<std::string, tDbObject> opened = {
      {T("db"), {db_, db_, 0, 0}},
      {T("F1\ndb"), {db_ + 1, db_, kFrame, 0}},
      {T("S1\ndb"), {db_ + 2, db_, kSignal, 0}},
  };
  for (const auto &entry : opened) ASSERT_EQ(Open(entry.first, entry.second), 0);
  const std::map<std::string, tDbObject> seen = Walk(db_ + 2);
  ASSERT_EQ(seen.size(), opened.size());
  for (const auto &entry : opened) {
    SCOPED_TRACE(entry.first);
    ASSERT_EQ(seen.count(entry.first), 1u);
    const tDbObject &got = seen.at(entry.first);
    EXPECT_EQ(std::tie(got.object, got.database, got.objectClass, got.isErrorObject),
              std::tie(entry.second.object, entry.second.database, entry.second.objectClass,
                       entry.second.isErrorObject));
  }
}

TEST_F(DbLife, WalkSurvivesReleasesOnItsOwnThread) {
  // Unregistering the host's references during a walk runs their closes on the walking thread:
  // here the first entry's close takes every other text, the one under the cursor among them,
  // and then the last text with the database.
  const std::map<std::string, uint32_t> opened = {
      {T("db"), db_}, {T("F1"), db_ + 1}, {T("F2"), db_ + 2}, {T("S1"), db_ + 3}};
  for (const auto &entry : opened) ASSERT_EQ(Open(entry.first, {entry.second, db_, kFrame, 0}), 0);
  uint32_t count = 0;
  ASSERT_EQ(m_.BeginWalk(db_, &count), 0);
  ASSERT_EQ(count, 4u);
  tDbObject first;
  std::string firstName;
  ASSERT_EQ(m_.NextInWalk(&first, &firstName), 0);
  uint32_t last = 9;
  for (const auto &entry : opened) {
    if (entry.first == firstName) continue;
    EXPECT_EQ(ReleaseName(entry.first, entry.second, last), 0);
    EXPECT_EQ(last, 1u);
  }
  tDbObject next{1, 1, 1, 1};
  EXPECT_EQ(m_.NextInWalk(&next, nullptr), 0);
  EXPECT_EQ(next.object, 0u) << "nothing is left after the cursor";
  EXPECT_EQ(ReleaseHandle(first.object, last), 0);
  EXPECT_EQ(last, 1u);
  EXPECT_EQ(m_.NextInWalk(&next, nullptr), 0) << "the walked database is gone";
  EXPECT_EQ(next.object, 0u);
  EXPECT_EQ(m_.EndWalk(), 0);
  EXPECT_EQ(m_.GetNumDatabases(), databasesBefore_);
}

TEST_F(DbLife, MisuseIsReportedAsInternal) {
  kvsvtest::cFakeErrorLog log;
  tDbObject object{1, 1, 1, 1};
  std::string name = "x";
  EXPECT_EQ(m_.NextInWalk(&object, &name), kvErrInternal);
  EXPECT_EQ(object.object, 0u);

  ASSERT_EQ(Open(T("F1"), {db_ + 1, db_, kFrame, 0}), 0);
  cHostText text(T("F1"));
  m_.FindByName(text.Handle(), nullptr);
  tDbObject noObject{0, db_, kFrame, 0};
  EXPECT_EQ(m_.AddObject(text.Handle(), noObject, kvsimErrObjectNotFound, 0), kvErrInternal);

  const auto records = log.Records();
  ASSERT_EQ(records.size(), 2u);
  const struct {
    uint32_t line;
    uint32_t info;
  } expected[] = {{577, 0}, {189, static_cast<uint32_t>(kvsimErrObjectNotFound)}};
  for (size_t i = 0; i < 2; ++i) {
    EXPECT_EQ(records[i].value.Component(), 13u);
    EXPECT_EQ(records[i].value.File(), 18u);
    EXPECT_EQ(records[i].value.Line(), expected[i].line);
    EXPECT_EQ(records[i].value.info, expected[i].info);
  }
}

}  // namespace
