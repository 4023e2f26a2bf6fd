// The whole-database exports: each forward reaches its own driver call with the caller's
// arguments and status; the list read over its rounds and host arrays; a DBC attribute into a host
// string.
#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

#include "core/host_handles.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "support/call_log.h"
#include "support/host_strings.h"
#include "support/temp_dir.h"
#include "svsim.h"

namespace {

using kvsvtest::LastCall;
using kvsvtest::Text;
using kvsvtest::Texts;

constexpr int32_t kScripted = static_cast<int32_t>(0xBFF62ABC);

class DbEdit : public testing::Test {
 protected:
  void SetUp() override {
    kvsimReset();
    svsimReset();
  }
  void TearDown() override {
    nKVSVAPI100::DisposeHandleArray(&aliases_);
    nKVSVAPI100::DisposeHandleArray(&paths_);
    if (value_ != nullptr) svDisposeHandle(value_);
    kvsimReset();
  }

  SvHandle aliases_ = nullptr;
  SvHandle paths_ = nullptr;
  SvHandle value_ = nullptr;
};

TEST_F(DbEdit, EachForwardReachesItsDriverCallWithTheCallersArgumentsAndStatus) {
  uint32_t percent = 7;
  const struct {
    const char *driverCall;
    std::function<int32_t()> call;
    uint32_t object;  // as the call log records it
    const char *text;
  } forwards[] = {
      {"kvdbMerge", [&] { return kvsvdbMerge(0x81000003, 0x81000009, 1, "X_", 1, &percent); },
       0x81000003, "X_"},
      {"kvdbSaveDatabase", [] { return kvsvdbSave(0x80000004, "/tmp/a.dbc"); }, 0x80000004,
       "/tmp/a.dbc"},
      {"kvdbSaveDatabase", [] { return kvsvdbExport(0x80000005, "/tmp/b.dbc"); }, 0x80000005,
       "/tmp/b.dbc"},
      {"kvdbAddAlias", [] { return kvsvdbAddAlias("one", "/tmp/c.dbc", 250000); }, 0, "one"},
      {"kvdbAddAlias64", [] { return kvsvdbAddAlias64("two", "/tmp/d.dbc", 500000); }, 0, "two"},
      {"kvdbRemoveAlias", [] { return kvsvdbRemoveAlias("three"); }, 0, "three"},
      {"kvdbDeploy", [&] { return kvsvdbDeploy("10.1.2.3", "four", 1, &percent); }, 0, "four"},
      {"kvdbUndeploy", [] { return kvsvdbUndeploy("10.1.2.3", "five"); }, 0, "five"},
  };
  for (const auto &f : forwards) {
    SCOPED_TRACE(f.driverCall);
    kvsimLogClear();
    ASSERT_EQ(kvsimFailCall(f.driverCall, kScripted, 1), 0);
    EXPECT_EQ(f.call(), kScripted);
    EXPECT_EQ(kvsimLogCount(), 1);
    const kvsimCallRecord call = LastCall(f.driverCall);
    EXPECT_EQ(call.object, f.object);
    EXPECT_STREQ(call.text, f.text);
  }
}

TEST_F(DbEdit, TheListIsReadAgainWhileItChangesUpToElevenRounds) {
  const kvsvtest::cTempDir directory;
  directory.WriteFile("a.dbc", "VERSION \"\"\n");
  ASSERT_EQ(kvsvdbAddAlias("alpha", directory.Sub("a.dbc").c_str(), 500000), 0);
  ASSERT_EQ(kvsvdbAddAlias("beta", directory.Sub("a.dbc").c_str(), 500000), 0);
  const struct {
    int32_t changes;  // list reads answered with a changed list
    int32_t status;
    int32_t rounds;
  } cases[] = {{0, 0, 1}, {10, 0, 11}, {11, kvErrDatabaseListChanged, 11}};
  for (const auto &c : cases) {
    SCOPED_TRACE(c.changes);
    kvsimLogClear();
    if (c.changes > 0) {
      ASSERT_EQ(kvsimFailCall("kvdbGetDatabaseList", kvErrDatabaseListChanged, c.changes), 0);
    }
    EXPECT_EQ(kvsvdbGetDatabaseList(0, &aliases_, &paths_), c.status);
    EXPECT_EQ(kvsimCountCalls("kvdbGetDatabaseListSizes"), c.rounds);
    if (c.status == 0) {
      EXPECT_EQ(Texts(aliases_), (std::vector<std::string>{"alpha", "beta"}));
      EXPECT_EQ(Texts(paths_), std::vector<std::string>(2, directory.Sub("a.dbc")));
    }
  }
  // Another failure ends the read at once.
  kvsimLogClear();
  ASSERT_EQ(kvsimFailCall("kvdbGetDatabaseList", kScripted, 1), 0);
  EXPECT_EQ(kvsvdbGetDatabaseList(0, &aliases_, &paths_), kScripted);
  EXPECT_EQ(kvsimCountCalls("kvdbGetDatabaseListSizes"), 1);
  EXPECT_EQ(kvsvdbRemoveAlias("alpha"), 0);
  EXPECT_EQ(kvsvdbRemoveAlias("beta"), 0);
}

TEST_F(DbEdit, NoAliasLeavesBothHostArraysAsTheyWere) {
  aliases_ = kvsvtest::StringArray({"stale"});
  const SvHandle before = aliases_;
  const uint64_t made = svsimAllocCount();
  EXPECT_EQ(kvsvdbGetDatabaseList(0, &aliases_, &paths_), 0);
  EXPECT_EQ(aliases_, before);
  EXPECT_EQ(Texts(aliases_), std::vector<std::string>{"stale"});
  EXPECT_EQ(paths_, nullptr);
  EXPECT_EQ(svsimAllocCount(), made);
  EXPECT_EQ(kvsimCountCalls("kvdbGetDatabaseList"), 0);
}

TEST_F(DbEdit, AnAttributeArrivesWithoutItsNulAndAFailedReadKeepsTheCount) {
  const kvsvtest::cTempDir directory;
  directory.WriteFile("attributes.dbc",
                      "VERSION \"\"\n\nBU_: ECU1\n\n"
                      "BA_DEF_ BU_ \"NodeLayer\" STRING ;\n"
                      "BA_DEF_ BU_ \"Note\" STRING ;\n"
                      "BA_DEF_DEF_ \"NodeLayer\" \"\";\n"
                      "BA_DEF_DEF_ \"Note\" \"\";\n"
                      "BA_ \"Note\" BU_ ECU1 \"front axle\";\n");
  uint32_t database = 0, cluster = 0, ecu = 0;
  ASSERT_EQ(kvdbOpenDatabase(directory.Sub("attributes.dbc").c_str(), &database), 0);
  ASSERT_EQ(kvdbFindObject(database, 0x10000, "", &cluster), 0);
  ASSERT_EQ(kvdbFindObject(cluster, 0x50000, "ECU1", &ecu), 0);

  const struct {
    const char *name;
    std::string text;
    uint32_t isDefault;
  } cases[] = {{"Note", "front axle", 0}, {"NodeLayer", "", 1}};
  for (const auto &c : cases) {
    SCOPED_TRACE(c.name);
    uint32_t isDefault = 9;
    EXPECT_EQ(kvsvdbGetDBCAttribute(ecu, 0, c.name, &value_, &isDefault), 0);
    EXPECT_EQ(Text(value_), c.text);
    EXPECT_EQ(isDefault, c.isDefault);
  }
  ASSERT_EQ(kvsvdbGetDBCAttribute(ecu, 0, "Note", &value_, nullptr), 0);
  ASSERT_EQ(kvsimFailCall("kvdbGetDBCAttribute", kScripted, 1), 0);
  EXPECT_EQ(kvsvdbGetDBCAttribute(ecu, 0, "NodeLayer", &value_, nullptr), kScripted);
  // The string shrank to the empty value's size: its old count would run past its end.
  EXPECT_EQ(Text(value_), "");
  ASSERT_EQ(kvsvdbGetDBCAttribute(ecu, 0, "Note", &value_, nullptr), 0);
  ASSERT_EQ(kvsimFailCall("kvdbGetDBCAttribute", kScripted, 1), 0);
  EXPECT_EQ(kvsvdbGetDBCAttribute(ecu, 0, "Note", &value_, nullptr), kScripted);
  EXPECT_EQ(Text(value_), "front axle");
  ASSERT_EQ(kvsimFailCall("kvdbGetDBCAttributeSize", kScripted, 1), 0);
  EXPECT_EQ(kvsvdbGetDBCAttribute(ecu, 0, "NodeLayer", &value_, nullptr), kScripted);
  EXPECT_EQ(kvsvdbGetDBCAttribute(ecu, 0, "Note", nullptr, nullptr), kvErrNullArgument);
  EXPECT_EQ(kvdbCloseDatabase(database, 1), 0);
}

}  // namespace
