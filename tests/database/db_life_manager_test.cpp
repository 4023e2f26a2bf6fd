// The database life manager: holders of texts and handles, when the driver's close is due, open
// kinds, error objects standing for failed opens, and the walk over a database's texts.
#include "database/db_life_manager.h"

#include <gtest/gtest.h>

#include <array>
#include <map>
#include <memory>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

#include "kvsim.h"
#include "support/fake_error_log.h"
#include "svsim.h"

namespace {

using namespace nKVSVAPI100;
using tRelease = std::pair<Status, uint32_t>;                  // status, last flag
using tSeen = std::map<std::string, std::array<uint32_t, 4>>;  // text: its tDbObject

constexpr uint32_t kFrame = 0x20000;
const tRelease kHeld{0, 0}, kLast{0, 1}, kUnknown{kvErrDbObjectNotFound, 1};
uint32_t gNextDatabase = 0x80000100u;  // in the driver's form, with room below for objects

// A string handle of the host's, disposed of at the end of its scope.
std::unique_ptr<void *, int32_t (*)(SvHandle)> HostText(const std::string &text) {
  return {svsimMakeString(text.c_str()), &svDisposeHandle};
}

// The driver's calls since the log was cleared.
using tCall = std::tuple<std::string, uint32_t, int32_t>;  // function, object, status or closeAll
std::vector<tCall> DriverCalls() {
  std::vector<tCall> calls;
  kvsimCallRecord r{};
  for (int32_t i = 0; kvsimLogEntry(i, &r) == 1; ++i)
    calls.emplace_back(r.function, r.object, r.size1);
  return calls;
}
// The error object `o` made for kvsimErrObjectNotFound, then closed.
std::vector<tCall> MadeAndClosed(uint32_t o) {
  return {{"kvhdndbCreateErrorObject", o, kvsimErrObjectNotFound}, {"kvdbCloseDatabase", o, 1}};
}

class DbLife : public testing::Test {
 protected:
  void SetUp() override { kvsimReset(); }
  std::string T(const std::string &text) const { return text + "@" + std::to_string(db_); }
  tDbObject Frame(uint32_t offset) const { return {db_ + offset, db_, kFrame, 0}; }
  // An open as the host makes it: the lookup, whose find goes to `found_`, then the add of what
  // the driver gave, which leaves the registered object in `made_`.
  Status Open(const std::string &text, tDbObject object, Status status = 0, uint32_t kind = 0) {
    const auto name = HostText(T(text));
    m_.FindByName(name.get(), &found_);
    made_ = object;
    return m_.AddObject(name.get(), made_, status, kind);
  }
  // Database 0: an open of a text that the manager knew. What the lookup found.
  uint32_t Lookup(const char *text) { return Open(text, tDbObject()) == 0 ? found_ : ~0u; }
  tRelease Release(uint32_t handle, const char *text = nullptr) {
    uint32_t last = 9;
    const Status status = text == nullptr
                              ? m_.ReleaseByHandle(handle, &last)
                              : m_.ReleaseByName(HostText(T(text)).get(), handle, &last);
    return {status, last};
  }
  // The texts of the database of `handle` with their objects, as a closing walk sees them.
  tSeen Walk(uint32_t handle) {
    tSeen seen;
    uint32_t count = 99;
    EXPECT_EQ(m_.BeginWalk(handle, &count), 0);
    if (count == 0) return seen;  // a walk over no database has ended already
    tDbObject o;
    std::string name;
    for (uint32_t i = 0; i <= count; ++i) {  // and one past the last: object 0, no text
      EXPECT_EQ(m_.NextInWalk(&o, &name), 0);
      if (i < count) seen[name] = {o.object, o.database, o.objectClass, o.isErrorObject};
    }
    EXPECT_EQ(o.object + name.size(), 0u) << "the end";
    EXPECT_EQ(m_.EndWalk(), 0);
    return seen;
  }

  cDbLifeManager &m_ = GetDbLifeManager();
  // The manager outlives each test: handles and texts of its own keep them apart.
  uint32_t db_ = gNextDatabase += 0x100u, before_ = m_.GetNumDatabases(), found_ = 0;
  tDbObject made_;
};

TEST_F(DbLife, HoldersOfTextsAndHandles) {
  ASSERT_EQ(Open("F1", Frame(1)), 0);
  EXPECT_EQ(m_.GetNumDatabases(), before_ + 1);
  EXPECT_EQ(Lookup("F1"), db_ + 1) << "an open that finds the text adds no holder";
  ASSERT_EQ(Open("F1", Frame(1), 0, kDbOpenUndecided), 0) << "a create under it adds one";
  EXPECT_EQ(Release(db_ + 1, "F1"), kHeld);
  EXPECT_EQ(Release(db_ + 1, "F1"), kLast);
  EXPECT_EQ(m_.GetNumDatabases(), before_) << "the database went with its last text";
  // By handle: the last holder of all the handle's texts ends it; so does a text unknown.
  ASSERT_EQ(Open("F1", Frame(1)), 0);
  ASSERT_EQ(Open("F1 again", Frame(1)), 0);
  ASSERT_EQ(Open("F2", Frame(2)), 0);
  ASSERT_EQ(Open("F2 alias", Frame(2)), 0);
  EXPECT_EQ(Release(db_ + 1), kHeld);
  EXPECT_EQ(Release(db_ + 1, "never opened"), kLast);
  EXPECT_EQ(Lookup("F1") + Lookup("F1 again"), 0u);
  // By name: a text's last holder ends the handle, whatever its other texts hold.
  EXPECT_EQ(Release(db_ + 2, "F2"), kLast);
  EXPECT_EQ(Lookup("F2 alias"), db_ + 2);
  EXPECT_EQ(Release(db_ + 2), kUnknown);
}

TEST_F(DbLife, AFailedOpenIsAnErrorObjectOfAKindThatMustAgree) {
  // Two opens, then a failed one, of one database, by the codes of their kinds (0 automatic,
  // 1 manual, 2 undecided); '!': the kinds disagree and the third is refused. The error object
  // made for the failure is closed either way: at once when refused, else at its last release.
  for (const std::string kinds : {"110!", "001!", "210!", "201!", "221", "121", "022"}) {
    SCOPED_TRACE(kinds);
    const bool refused = kinds.size() > 3;
    kvsimLogClear();
    for (int i = 0; i < 2; ++i)
      ASSERT_EQ(Open(std::to_string(i), Frame(i + 1), 0, kinds[i] - '0'), 0);
    EXPECT_EQ(Open("C", {0, db_, kFrame, 0}, kvsimErrObjectNotFound, kinds[2] - '0'),
              refused ? kvErrDatabaseModeConflict : 0);
    const uint32_t error = made_.object;
    EXPECT_EQ(Lookup("C"), refused ? 0u : error);
    EXPECT_EQ(Release(error), refused ? kUnknown : kLast);
    EXPECT_EQ(DriverCalls(), MadeAndClosed(error)) << "the driver's objects are its own";
    ASSERT_EQ(m_.RemoveDatabase(db_ + 1), 0);
  }
}

TEST_F(DbLife, WalkAndRemovals) {
  ASSERT_EQ(Open("db", {db_, db_, 0, 0}), 0);
  ASSERT_EQ(Open("F1\ndb", Frame(1)), 0);
  ASSERT_EQ(Open("S1", {0, db_, 0x30000, 0}, kvsimErrObjectNotFound), 0);
  const uint32_t error = made_.object;
  EXPECT_EQ(Walk(db_ + 1), tSeen({{T("db"), {db_, db_, 0, 0}},
                                  {T("F1\ndb"), {db_ + 1, db_, kFrame, 0}},
                                  {T("S1"), {error, db_, 0x30000, 1}}}));
  ASSERT_EQ(m_.RemoveChildren(db_), 0);
  EXPECT_EQ(DriverCalls(), MadeAndClosed(error)) << "the error object, and it alone, closed";
  EXPECT_EQ(Walk(db_), tSeen({{T("db"), {db_, db_, 0, 0}}})) << "the database's own text stays";
  EXPECT_EQ(Release(db_ + 1), kUnknown);
  EXPECT_EQ(Release(error), kUnknown);
  // A removed database leaves its objects known, and each release of them is the last.
  ASSERT_EQ(Open("F2", Frame(2)), 0);
  ASSERT_EQ(m_.RemoveDatabase(db_ + 2), 0);
  EXPECT_EQ(m_.GetNumDatabases(), before_);
  EXPECT_EQ(Walk(db_ + 2), tSeen());
  EXPECT_EQ(Release(db_ + 2), kLast);
  EXPECT_EQ(Release(db_, "db"), kLast);
}

TEST_F(DbLife, WalkSurvivesReleasesOnItsOwnThread) {
  // A close that unregistering runs on the walking thread may take texts, the one under the
  // cursor among them, or the whole database: here the first text's close takes every other
  // text, then the last one ends the database.
  for (uint32_t i = 0; i < 4; ++i) ASSERT_EQ(Open(std::to_string(i), Frame(i)), 0);
  uint32_t count = 0;
  tDbObject first, next;
  ASSERT_EQ(m_.BeginWalk(db_, &count), 0);
  ASSERT_EQ(m_.NextInWalk(&first, nullptr), 0);
  for (uint32_t i = 0; i < 4; ++i) {
    if (db_ + i == first.object) continue;
    EXPECT_EQ(Release(db_ + i, std::to_string(i).c_str()), kLast) << i;
  }
  EXPECT_EQ(m_.NextInWalk(&next, nullptr), 0);
  EXPECT_EQ(next.object, 0u) << "nothing is left after the cursor";
  EXPECT_EQ(Release(first.object), kLast);
  EXPECT_EQ(m_.NextInWalk(&first, nullptr), 0);
  EXPECT_EQ(first.object, 0u) << "the walked database is gone";
  EXPECT_EQ(m_.EndWalk(), 0);
  EXPECT_EQ(m_.GetNumDatabases(), before_);
}

TEST_F(DbLife, UnknownHandlesTextlessOpensAndMisuse) {
  uint32_t count = 9;
  for (Status s :
       {m_.BeginWalk(db_ + 5, &count), m_.RemoveChildren(db_ + 5), m_.RemoveDatabase(db_ + 5)})
    EXPECT_EQ(s, kvErrDbObjectNotFound);
  EXPECT_EQ(count, 0u);
  EXPECT_EQ(Release(db_ + 5), kUnknown) << "the caller closes it at the driver";
  EXPECT_EQ(Release(db_ + 5, "F1"), tRelease(kvErrDbObjectNotFound, 0));
  const auto empty = HostText("");
  void *nullBlock = nullptr;
  for (SvHandle name : {SvHandle(), SvHandle(&nullBlock), empty.get()}) {
    m_.FindByName(name, nullptr);
    tDbObject object{db_ + 1, db_, kFrame, 1};
    EXPECT_EQ(m_.AddObject(name, object, 0, kDbOpenManual), 0) << "no text, nothing registered";
    EXPECT_EQ(object.isErrorObject, 0u);
  }
  ASSERT_EQ(kvsimFailCall("kvhdndbCreateErrorObject", kvsimErrInvalidArgument, 1), 0);
  EXPECT_EQ(Open("F1", {0, db_, kFrame, 0}, kvsimErrObjectNotFound), kvsimErrInvalidArgument)
      << "an error object that the driver refuses is the open's status";
  EXPECT_EQ(m_.GetNumDatabases(), before_);

  kvsvtest::cFakeErrorLog log;
  tDbObject object{1, 1, 1, 1};
  EXPECT_EQ(m_.NextInWalk(&object, nullptr), kvErrInternal) << "no walk is open";
  EXPECT_EQ(object.object, 0u);
  ASSERT_EQ(Open("F1", Frame(1)), 0);
  EXPECT_EQ(Open("F1", {0, db_, kFrame, 0}, kvsimErrObjectNotFound), kvErrInternal)
      << "a known text's open gave no object";
  std::vector<std::array<uint32_t, 4>> got;  // component, file, line, info
  for (const auto &r : log.Records())
    got.push_back({r.value.Component(), r.value.File(), r.value.Line(), r.value.info});
  const auto status = static_cast<uint32_t>(kvsimErrObjectNotFound);
  EXPECT_EQ(got, (std::vector<std::array<uint32_t, 4>>{{13, 18, 577, 0}, {13, 18, 189, status}}));
}

}  // namespace
