// The project session file: where it lies by the host's run mode, and its two readers, one entry
// by name and the siblings of an interface, on files as a project writes them and damaged ones.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "paths/paths_test_support.h"
#include "paths/relocation_root.h"
#include "session/project_session_support.h"
#include "session/run_mode.h"
#include "session/session_file_entry.h"
#include "session/session_file_path.h"
#include "session/session_file_siblings.h"
#include "support/fake_error_log.h"

namespace {

using namespace nKVSVAPI100;
using kvsvtest::Entry;

const kvsvtest::cRelocationRoot gRoot;

class ProjectFile : public testing::Test {
 protected:
  void SetUp() override {
    svsimReset();
    svsimSetAppPath(dir_.Path().c_str());
  }
  void TearDown() override { svsimReset(); }

  std::string Write(const std::string &text, const std::string &name = "kvorSession.txt") {
    dir_.WriteFile(name, text);
    return dir_.Sub(name);
  }
  static std::vector<std::string> Names(const tMallocBlock &names) {
    std::vector<std::string> list;
    for (const char *name = names.get(); *name != '\0'; name += list.back().size() + 1)
      list.emplace_back(name);
    return list;
  }
  // The one report that `log` holds is of this file at `line`; line 0: no report.
  static void ExpectReport(const kvsvtest::cFakeErrorLog &log, uint32_t file, uint32_t line) {
    const auto records = log.Records();
    ASSERT_EQ(records.size(), line != 0 ? 1u : 0u);
    if (line != 0) {
      EXPECT_EQ(records[0].value.File(), file);
      EXPECT_EQ(records[0].value.Line(), line);
    }
  }

  kvsvtest::cTempDir dir_;
};

TEST_F(ProjectFile, BuiltApplicationsKeepTheFileBesideThemselves) {
  const struct {
    int32_t bound, runTime, fullFeature;
    bool built;
  } cases[] = {{0, 0, 0, false}, {1, 0, 0, false}, {0, 1, 1, false},
               {1, 1, 0, true},  {1, 0, 1, true},  {7, 7, 7, true}};
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << c.bound << c.runTime << c.fullFeature);
    svsimSetRunMode(c.bound, c.runTime, c.fullFeature);
    bool built = !c.built;
    std::string path;
    EXPECT_EQ(GetRunMode(built), 0);
    EXPECT_EQ(built, c.built);
    EXPECT_EQ(GetSessionFilePath(path), 0);
    EXPECT_EQ(path, c.built ? dir_.Sub("kvorSession.txt")
                            : gRoot.Path() + "/var/lib/kvor/kvorSession.txt");
    EXPECT_EQ(svsimLivePaths(), 0u);
  }
}

TEST_F(ProjectFile, HostPathFailuresAreReportedAndStopAManualCreate) {
  svsimSetRunMode(1, 1, 0);
  const uint64_t liveHandles = svsimLiveHandles();
  for (uint32_t failing : {1u, 2u}) {  // the host path, then its text
    kvsvtest::cFakeErrorLog log;
    svsimFailAllocAt(failing);
    std::string path = "unchanged";
    EXPECT_EQ(GetSessionFilePath(path), kvErrInternal);
    EXPECT_EQ(path, "unchanged");
    ExpectReport(log, 14, 154);
    EXPECT_EQ(svsimLivePaths(), 0u);
    EXPECT_EQ(svsimLiveHandles(), liveHandles);
  }
  kvsvtest::cFakeErrorLog log;
  kvsimLogClear();
  kvsvRefnum reference = 0;
  svsimFailAllocAt(1);
  EXPECT_EQ(kvsvSessionManualCreate(":memory:", "", "", "CAN1", 0, &reference), kvErrInternal);
  EXPECT_EQ(kvsimLogCount(), 0);
  EXPECT_EQ(svsimRefCount(), 0);
}

TEST_F(ProjectFile, EntryFieldsAsWritten) {
  const struct {
    std::string file;
    const char *name;
    int32_t mode;
    double rate;
    int32_t extra;
    const char *fields[4];  // interface, list, cluster, database
  } cases[] = {
      {Entry("Speed In", "1 1000 500000 0 CAN1 - Body Vehicle Database.dbc"), "Speed In", 1,
       1000.5, 0, {"CAN1", "", "Body", "Vehicle Database.dbc"}},
      {Entry("A", "4 2 250000 -1 LIN1/x F1,F2 C D.ldf", "\r\n"), "A", 4, 2.25, -1,
       {"LIN1/x", "F1,F2", "C", "D.ldf"}},
      {Entry("A", "2 0 0 7 - -list -c -db"), "A", 2, 0.0, 7, {"", "", "", ""}},
      // No line feed at the end: the database loses its last character all the same.
      {"A\n3 0 0 0 CAN1 L C Vehicle.dbc", "A", 3, 0.0, 0, {"CAN1", "L", "C", "Vehicle.db"}},
      // A name is a prefix of the first name line that begins with it.
      {Entry("CAN2", "6 0 0 0 CAN2 - - two") + Entry("CAN", "6 0 0 0 CAN1 - - one"), "CAN", 6,
       0.0, 0, {"CAN2", "", "", "two"}},
      {Entry("X", "5 0 0 0 CAN3 - - x") + Entry("Y", "5 0 0 0 CAN4 - - y"), "", 5, 0.0, 0,
       {"CAN3", "", "", "x"}},
      {"X\n5 0 0 0 CAN3 - - x\n" + std::string(400, 'z') + "\n" + Entry("Y", "5 0 0 9 CAN4 - - y"),
       "Y", 5, 0.0, 9, {"CAN4", "", "", "y"}},
  };
  kvsvtest::cFakeErrorLog log;
  for (const auto &c : cases) {
    SCOPED_TRACE(c.file);
    tSessionEntry entry;
    ASSERT_EQ(ReadSessionEntry(c.name, Write(c.file).c_str(), entry), 0);
    EXPECT_EQ(entry.mode, c.mode);
    EXPECT_DOUBLE_EQ(entry.resampleRate, c.rate);
    EXPECT_EQ(entry.extra, c.extra);
    EXPECT_EQ((std::vector<std::string>{entry.Interface(), entry.List(), entry.Cluster(),
                                        entry.Database()}),
              (std::vector<std::string>(c.fields, c.fields + 4)));
  }
  ExpectReport(log, 11, 0);
}

TEST_F(ProjectFile, EntryFailures) {
  const std::string b = Entry("B", "1 0 0 0 CAN1 - C D"), longName(300, 'x');
  const struct {
    std::string file, name;
    Status status;
    uint32_t reportLine;  // 0: no report
  } cases[] = {
      {"", "A", kvErrSessionFile, 0},
      {b, "A", kvErrSessionFile, 0},
      // Only 255 characters of a name line are its name; the rest counts as the next line.
      {Entry(longName, "1 0 0 0 CAN1 - C D") + b, "B", kvErrSessionFile, 0},
      {Entry(longName, "1 0 0 0 CAN1 - C D"), longName.substr(0, 255), kvErrInternal, 421},
      {Entry("A", "one 0 0 0 CAN1 - C D"), "A", kvErrInternal, 421},
      {"A\n", "A", kvErrInternal, 421},
      {"A\n1 0 0 0\n", "A", kvErrInternal, 421},
      {"A\n1 0 0 0 CAN1\n", "A", kvErrInternal, 442},
      {"A\n1 0 0 0 CAN1 -\n", "A", kvErrInternal, 451},
      {"A\n1 0 0 0 CAN1 - C", "A", kvErrInternal, 469},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.file);
    kvsvtest::cFakeErrorLog log;
    tSessionEntry entry;
    EXPECT_EQ(ReadSessionEntry(c.name.c_str(), Write(c.file).c_str(), entry), c.status);
    EXPECT_EQ(entry.text, nullptr);
    ExpectReport(log, 11, c.reportLine);
  }
  tSessionEntry entry;
  EXPECT_EQ(ReadSessionEntry("A", dir_.Sub("absent").c_str(), entry), kvErrSessionFile);
}

TEST_F(ProjectFile, SiblingsShareInterfaceDatabaseAndCluster) {
  const std::string path = Write(
      Entry("A", "6 0 0 0 CAN1 - Body Vehicle DB") +
      Entry("Monitor", "6 0 0 0 CAN1/monitor F1 Body Vehicle DB", "\r\n") +
      Entry("OtherDb", "6 0 0 0 CAN1 - Body Other") +
      Entry("OtherCluster", "6 0 0 0 CAN1 - Chassis Vehicle DB") +
      Entry("OtherInterface", "6 0 0 0 CAN2 - Body Vehicle DB") +
      Entry("Case", "6 0 0 0 can1 - Body Vehicle DB") +
      Entry("", "0 0 0 0 CAN1/x/z - Body Vehicle DB") +  // no name: no open can claim it
      Entry("B", "0 0 0 0 CAN1/x/y Speed Body Vehicle DB") + Entry("L", "0 0 0 0 LIN1 - - -"));
  const struct {
    const char *interfaceKey, *database, *cluster;
    std::vector<std::string> names;
  } cases[] = {
      {"CAN1", "Vehicle DB", "Body", {"A", "Monitor"}},
      {"CAN1/x", "Vehicle DB", "Body", {"B"}},
      {"CAN1", "Other", "Body", {"OtherDb"}},
      {"LIN1", "", "", {"L"}},
      {"CAN3", "Vehicle DB", "Body", {}},
  };
  kvsvtest::cFakeErrorLog log;
  for (const auto &c : cases) {
    SCOPED_TRACE(c.interfaceKey);
    tMallocBlock names;
    ASSERT_EQ(ListSiblingSessions(c.interfaceKey, c.database, c.cluster, path.c_str(), names), 0);
    EXPECT_EQ(Names(names), c.names);
  }
  ExpectReport(log, 11, 0);

  const std::string good = Entry("A", "6 0 0 0 CAN1 - C D");
  const std::pair<std::string, uint32_t> failures[] = {
      {dir_.Sub("absent"), 0},
      {Write(good + Entry("B", "x 0 0 0 CAN1 - C D"), "late"), 590},
      {Write(good + Entry(std::string(300, 'n'), "6 0 0 0 CAN1 - C D"), "long"), 590},
  };
  for (const auto &f : failures) {
    SCOPED_TRACE(f.first);
    kvsvtest::cFakeErrorLog failureLog;
    tMallocBlock names;
    EXPECT_EQ(ListSiblingSessions("CAN1", "D", "C", f.first.c_str(), names),
              f.second != 0 ? kvErrInternal : kvErrSessionFile);
    EXPECT_EQ(names, nullptr);
    ExpectReport(failureLog, 11, f.second);
  }
}

TEST_F(ProjectFile, InternalSessionExportsStandForNoDriverSession) {
  uint32_t session = 0;
  EXPECT_EQ(kvsvSessionInternalOpen(nullptr, &session), 0);
  EXPECT_EQ(session, 0xDEADFAB4u);
  EXPECT_EQ(kvsvSessionInternalClose(), 0);
  SvHandle source = svsimMakeString("CAN1 session"), target = nullptr;
  EXPECT_EQ(kvsvInternalHandleToRef(nullptr, &source, nullptr, &target), 0);
  char text[32] = {};
  EXPECT_EQ(svsimReadString(target, text, sizeof text), 12);
  EXPECT_STREQ(text, "CAN1 session");
  EXPECT_EQ(kvsvInternalHandleToRef(nullptr, nullptr, nullptr, &target), kvErrNullArgument);
  svDisposeHandle(source);
  svDisposeHandle(target);
}

}  // namespace
