// Project sessions: where the session file lies by the host's run mode, its two readers (one entry
// by name, the siblings of an interface) on files as a project writes them and damaged ones, and
// opens by name from the file in the driver's directory for temporary session files (relocated
// below a temporary root): siblings, claims, closes, error sessions and the retry of a built
// application. This program's nanosleep returns at once and adds up the time asked for.
#include <gtest/gtest.h>

#include <cstdio>
#include <ctime>
#include <filesystem>
#include <fstream>
#include <optional>
#include <string>
#include <vector>

#include "paths/paths_test_support.h"
#include "paths/relocation_root.h"
#include "session/run_mode.h"
#include "session/session_file_entry.h"
#include "session/session_file_path.h"
#include "session/session_file_siblings.h"
#include "session/session_fixture.h"
#include "support/fake_error_log.h"

namespace {
int gSleeps = 0;
long long gSleptNs = 0;
}  // namespace

extern "C" int nanosleep(const timespec *requested, timespec *) {
  ++gSleeps;
  gSleptNs += requested->tv_sec * 1000000000LL + requested->tv_nsec;
  return 0;
}

namespace {

using namespace nKVSVAPI100;

const kvsvtest::cRelocationRoot gRoot;
const std::string gFile = gRoot.Path() + "/var/lib/kvor/kvorSession.txt";

// One entry: the name line, the fields line and an empty third line, each ended by `end`.
std::string Entry(const std::string &name, const std::string &fields, const std::string &end = "\n") {
  return name + end + fields + end + end;
}

void WriteText(const std::string &path, const std::string &text) {
  std::filesystem::create_directories(std::filesystem::path(path).parent_path());
  std::ofstream(path, std::ios::binary) << text;
}

// kvsvSessionOpen as the host calls it; the host always gets 0, so only the handle is kept.
uint32_t Open(const char *name) {
  uint32_t handle = 0;
  SvHandle text = svsimMakeString(name);
  EXPECT_EQ(kvsvSessionOpen(&text, &handle, 0), 0);
  svDisposeHandle(text);
  return handle;
}

// The lines of the reports that `log` holds.
std::vector<uint32_t> Lines(const kvsvtest::cFakeErrorLog &log) {
  std::vector<uint32_t> lines;
  for (const auto &record : log.Records()) lines.push_back(record.value.Line());
  return lines;
}

class ProjectFile : public SessionFixture {
 protected:
  void SetUp() override {
    SessionFixture::SetUp();
    svsimSetAppPath(dir_.Path().c_str());
  }
  std::string Write(const std::string &text, const std::string &name = "kvorSession.txt") {
    dir_.WriteFile(name, text);
    return dir_.Sub(name);
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
    EXPECT_EQ(path, c.built ? dir_.Sub("kvorSession.txt") : gFile);
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
    EXPECT_EQ(Lines(log), std::vector<uint32_t>{154});
    EXPECT_EQ(log.Records()[0].value.File(), nFile::kRunMode);
    EXPECT_EQ(svsimLivePaths(), 0u);
    EXPECT_EQ(svsimLiveHandles(), liveHandles);
  }
  kvsvtest::cFakeErrorLog log;
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
    std::vector<std::string> fields;  // interface, list, cluster, database
  } cases[] = {
      {Entry("Speed In", "1 1000 500000 0 CAN1 - Body Vehicle Database.dbc"), "Speed In", 1,
       1000.5, 0, {"CAN1", "", "Body", "Vehicle Database.dbc"}},
      {Entry("A", "4 2 250000 -1 LIN1/x F1,F2 C D.ldf", "\r\n"), "A", 4, 2.25, -1,
       {"LIN1/x", "F1,F2", "C", "D.ldf"}},
      {Entry("A", "2 0 0 7 - -list -c -db"), "A", 2, 0.0, 7, {"", "", "", ""}},
      // No line feed at the end: the database loses its last character all the same.
      {"A\n3 0 0 0 CAN1 L C Vehicle.dbc", "A", 3, 0.0, 0, {"CAN1", "L", "C", "Vehicle.db"}},
      // A name is a prefix of the first name line that begins with it; none: the first entry.
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
              c.fields);
  }
  EXPECT_TRUE(log.Records().empty());
}

TEST_F(ProjectFile, AFailedReadLeavesNoEntryAndReportsADamagedOne) {
  const std::string b = Entry("B", "1 0 0 0 CAN1 - C D"), longName(300, 'x');
  const std::string good = Write(b, "good");
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
      {"A\n1 0 0 0 CAN1\n", "A", kvErrInternal, 442},
      {"A\n1 0 0 0 CAN1 -\n", "A", kvErrInternal, 451},
      {"A\n1 0 0 0 CAN1 - C", "A", kvErrInternal, 469},
      {"A\n1 0 0 0 CAN1 - C ", "A", kvErrInternal, 469},  // a blank, then nothing
  };
  tSessionEntry entry;
  for (const auto &c : cases) {
    SCOPED_TRACE(c.file);
    ASSERT_EQ(ReadSessionEntry("B", good.c_str(), entry), 0);
    kvsvtest::cFakeErrorLog log;
    EXPECT_EQ(ReadSessionEntry(c.name.c_str(), Write(c.file).c_str(), entry), c.status);
    EXPECT_EQ(entry.text, nullptr) << "the entry read before is gone too";
    EXPECT_EQ(Lines(log), c.reportLine != 0 ? std::vector<uint32_t>{c.reportLine}
                                             : std::vector<uint32_t>{});
  }
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
    std::vector<std::string> listed;
    for (const char *name = names.get(); *name != '\0'; name += listed.back().size() + 1)
      listed.emplace_back(name);
    EXPECT_EQ(listed, c.names);
  }
  EXPECT_TRUE(log.Records().empty());
  const std::string good = Entry("A", "6 0 0 0 CAN1 - C D");
  const std::pair<std::string, Status> failures[] = {
      {dir_.Sub("absent"), kvErrSessionFile},
      {Write(good + Entry("B", "x 0 0 0 CAN1 - C D"), "late"), kvErrInternal},
      {Write(good + Entry(std::string(300, 'n'), "6 0 0 0 CAN1 - C D"), "long"), kvErrInternal},
  };
  for (const auto &f : failures) {
    SCOPED_TRACE(f.first);
    kvsvtest::cFakeErrorLog failureLog;
    tMallocBlock names;
    EXPECT_EQ(ListSiblingSessions("CAN1", "D", "C", f.first.c_str(), names), f.second);
    EXPECT_EQ(names, nullptr);
    EXPECT_EQ(Lines(failureLog),
              f.second == kvErrInternal ? std::vector<uint32_t>{590} : std::vector<uint32_t>{});
  }
}

TEST_F(ProjectFile, HandleToRefCopiesTheHostsHandle) {
  SvHandle source = Keep(svsimMakeString("CAN1 session")), target = nullptr;
  EXPECT_EQ(kvsvInternalHandleToRef(nullptr, &source, nullptr, &target), 0);
  char text[32] = {};
  EXPECT_EQ(svsimReadString(Keep(target), text, sizeof text), 12);
  EXPECT_STREQ(text, "CAN1 session");
  EXPECT_EQ(kvsvInternalHandleToRef(nullptr, nullptr, nullptr, &target), kvErrNullArgument);
}

class ProjectOpen : public SessionFixture {
 protected:
  void SetUp() override {
    SessionFixture::SetUp();
    liveHandles_ = svsimLiveHandles();
  }
  static std::string Text(uint32_t handle, uint32_t id) {
    char text[64] = {};
    kvGetProperty(handle, id, sizeof text, text);
    return text;
  }
  static void ExpectOpen(int driverSessions, int projectOpen) {
    EXPECT_EQ(kvsimOpenSessionCount(), driverSessions);
    EXPECT_EQ(kvsvGetIsProjectSessionOpen(), projectOpen);
  }
  uint64_t liveHandles_ = 0;
  const std::string ab_ = Entry("A", "0 0 0 0 CAN1 Speed Body Vehicle") +
                          Entry("B", "0 0 0 0 CAN1 Gear Body Vehicle");
};

TEST_F(ProjectOpen, TheFirstOpenCreatesTheSiblingsAndLaterOpensClaimThem) {
  WriteText(gFile, ab_ + Entry("M", "6 0 0 0 CAN1/monitor - Body Vehicle") +
                       Entry("X", "0 0 0 0 CAN1 Speed Body Other"));
  const uint32_t a = Open("A");
  EXPECT_EQ(Text(a, kvPropSession_List), "Speed");
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 3);
  ExpectOpen(3, 1);
  kvsimLogClear();
  EXPECT_EQ(Text(Open("B"), kvPropSession_List), "Gear");
  EXPECT_EQ(Text(Open("M"), kvPropSession_IntfName), "CAN1/monitor");
  // Another database is no sibling; a claimed name is not handed out twice.
  EXPECT_EQ(UseStatus(Open("X")), kvErrSessionNotInInterface);
  EXPECT_EQ(UseStatus(Open("A")), kvErrSessionAlreadyOpen);
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 0);
  EXPECT_EQ(UseStatus(a), 0);
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(svsimLiveHandles(), liveHandles_);
}

TEST_F(ProjectOpen, ASiblingThatFailedTellsItsFailureOnce) {
  const std::pair<const char *, int32_t> cases[] = {
      {"0 0 0 0 CAN1 a,,b Body Vehicle", kvsimErrInvalidList},
      {"1 10 0 0 CAN1 Gear Body Vehicle", kRefused},  // its resample rate is refused
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.first);
    WriteText(gFile, Entry("A", "0 0 0 0 CAN1 Speed Body Vehicle") + Entry("Bad", c.first));
    ASSERT_EQ(kvsimFailProperty("kvSetProperty", kvPropSession_ResampRate, kRefused, 1), 0);
    const uint32_t a = Open("A");
    ExpectOpen(1, 1);
    const uint32_t bad = Open("Bad"), again = Open("Bad");
    EXPECT_EQ(UseStatus(bad), c.second);
    EXPECT_EQ(UseStatus(again), kvErrSessionNotInInterface);
    for (uint32_t handle : {again, bad, a}) kvsvSessionClose(handle);
    ExpectOpen(0, 0);
    kvsimClearFailures();
  }
}

TEST_F(ProjectOpen, TheLastClaimedCloseEndsTheRecordAndTheNextOpenStartsAfresh) {
  WriteText(gFile, ab_ + Entry("C", "0 0 0 0 CAN1 Rpm Body Vehicle"));
  const uint32_t a = Open("A"), b = Open("B");
  kvsvSessionClose(a);
  ExpectOpen(2, 1);
  const uint32_t closedName = Open("A");
  EXPECT_EQ(UseStatus(closedName), kvErrSessionAlreadyOpen);
  kvsvSessionClose(closedName);
  // B was the last claimed session: C, never claimed, goes with it.
  kvsvSessionClose(b);
  ExpectOpen(0, 0);
  kvsimLogClear();
  EXPECT_EQ(UseStatus(Open("A")), 0);
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 3);
}

TEST_F(ProjectOpen, EntrySettingsReachTheDriver) {
  const struct {
    const char *fields;
    std::optional<double> rate;
    std::optional<int32_t> keySlot;
    std::optional<uint32_t> schedule;
  } cases[] = {
      {"1 1000 500000 0 CAN1 - C D", 1000.5, {}, {}}, {"4 2 0 0 CAN1 - C D", 2.0, {}, {}},
      {"2 1000 0 0 CAN1 - C D", {}, {}, {}},          {"0 0 0 0 FlexRay1 - C D", {}, {}, {}},
      {"0 0 0 12 flexray1 - C D", {}, 12, {}},        {"0 0 0 -1 LIN1 - C D", {}, {}, {}},
      {"0 0 0 0 LIN1 - C D", {}, {}, 0u},             {"0 0 0 3 lin2/x - C D", {}, {}, 3u},
      {"0 0 0 5 CAN2 - C D", {}, {}, {}},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.fields);
    WriteText(gFile, Entry("S", c.fields));
    const uint32_t s = Open("S");
    ASSERT_EQ(UseStatus(s), 0);
    double rate = 0.0;
    int32_t keySlot = 0;
    uint32_t schedule = 0;
    const bool hasRate = kvGetProperty(s, kvPropSession_ResampRate, 8, &rate) == 0;
    const bool hasKeySlot = kvGetProperty(s, kvPropSession_IntfFlexRayKeySlotID, 4, &keySlot) == 0;
    EXPECT_EQ(hasRate ? std::optional<double>(rate) : std::nullopt, c.rate);
    EXPECT_EQ(hasKeySlot ? std::optional<int32_t>(keySlot) : std::nullopt, c.keySlot);
    EXPECT_EQ(kvsimLinSchedule(s, &schedule) == 1 ? std::optional<uint32_t>(schedule) : std::nullopt,
              c.schedule);
    kvsvSessionClose(s);
  }
}

TEST_F(ProjectOpen, RefusedSettingsClearTheNewSession) {
  const std::pair<const char *, uint32_t> cases[] = {
      {"1 10 0 0 CAN1 - C D", kvPropSession_ResampRate},
      {"0 0 0 3 FlexRay1 - C D", kvPropSession_IntfFlexRayKeySlotID},
      {"0 0 0 1 LIN1 - C D", 0},  // the schedule's state write
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.first);
    WriteText(gFile, Entry("S", c.first));
    ASSERT_EQ(c.second != 0 ? kvsimFailProperty("kvSetProperty", c.second, kRefused, 1)
                            : kvsimFailCall("kvWriteState", kRefused, 1),
              0);
    kvsimLogClear();
    const uint32_t s = Open("S");
    EXPECT_EQ(UseStatus(s), kRefused);
    EXPECT_EQ(kvsimCountCalls("kvClear"), 1);
    ExpectOpen(1, 0);  // the error session alone
    kvsvSessionClose(s);
  }
}

TEST_F(ProjectOpen, FailuresTravelInErrorSessions) {
  const std::string b = Entry("B", "0 0 0 0 CAN1 - C D");
  const struct {
    std::optional<std::string> file;  // none: no file at all
    const char *name;
    int32_t expected;
  } cases[] = {
      {std::nullopt, "B", kvErrSessionFile},
      {b, "A", kvErrSessionFile},
      {"B\n0 0 0 0 CAN1 -\n", "B", kvErrInternal},  // a token missing
      {Entry("B", "0 0 0 0 CAN9 - C D"), "B", kvsimErrUnknownInterface},
      {b, "", kvErrSessionNameEmpty},
      {b, "___kvorSesn#0000abcd", kvErrManualSessionName},
  };
  kvsvtest::cFakeErrorLog log;
  for (const auto &c : cases) {
    SCOPED_TRACE(c.file.value_or("(none)") + "/" + c.name);
    std::remove(gFile.c_str());
    if (c.file) WriteText(gFile, *c.file);
    const uint32_t s = Open(c.name);
    EXPECT_EQ(UseStatus(s), c.expected);
    ExpectOpen(1, 0);
    EXPECT_EQ(svsimLiveHandles(), liveHandles_);
    EXPECT_EQ(svsimLivePaths(), 0u);
    kvsvSessionClose(s);
    EXPECT_EQ(kvsimOpenSessionCount(), 0);
  }
  uint32_t handle = 0;
  EXPECT_EQ(kvsvSessionOpen(nullptr, &handle, 0), 0);
  EXPECT_EQ(UseStatus(handle), kvErrSessionNameEmpty);
  kvsimLogClear();
  EXPECT_EQ(kvsvSessionOpen(Name("B"), nullptr, 0), 0);
  EXPECT_EQ(kvsimLogCount(), 0);
}

TEST_F(ProjectOpen, ADamagedSiblingFailsTheOpenButKeepsWhatWasMade) {
  kvsvtest::cFakeErrorLog log;
  WriteText(gFile, Entry("A", "0 0 0 0 CAN1 - - -") + Entry("B", "0 x 0 0 CAN1 - - -"));
  EXPECT_EQ(UseStatus(Open("A")), kvErrInternal);
  ExpectOpen(2, 1);
  EXPECT_EQ(Lines(log), std::vector<uint32_t>{590});
}

TEST_F(ProjectOpen, ClaimsOfRecordsLeftByEarlierOpens) {
  WriteText(gFile, Entry("Bad", "0 0 0 0 CAN1 - C D"));
  // The last failed sibling takes its record along; a record of another tag is not this one's.
  const std::pair<const char *, int32_t> cases[] = {{"", kRefused},
                                                    {"other", kvErrInterfaceTagMismatch}};
  for (const auto &c : cases) {
    SCOPED_TRACE(c.first);
    auto *record = new cSnLifeInterface();
    record->tag = c.first;
    record->sessions["Bad"] = new cSnLifeSession{cSnLifeSession::kGone, 0, kRefused};
    gSessionManager.InsertInterface("CAN1", record);
    EXPECT_EQ(UseStatus(Open("Bad")), c.second);
    EXPECT_EQ(kvsvGetIsProjectSessionOpen(), c.second == kRefused ? 0 : 1);
    EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 0);
    gSessionManager.EraseInterface("CAN1");
  }
}

TEST_F(ProjectOpen, OnlyABuiltApplicationRetriesAndOnlyItsFirstCreation) {
  kvsvtest::cTempDir application;
  const struct {
    int32_t bound, runTime, fullFeature;
    int32_t refusals;  // -1: every creation
    int creates;
    int32_t expected;
  } cases[] = {
      {1, 1, 0, 3, 4, 0},
      {1, 0, 1, 799, 800, 0},  // taken at the last attempt
      {1, 1, 0, -1, 800, kRefused},
      {0, 0, 0, 1, 1, kRefused},  // development environment
      {1, 0, 0, 1, 1, kRefused},  // bound, but under no run-time engine
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << c.bound << c.runTime << c.fullFeature << " " << c.refusals);
    kvsimReset();
    svsimReset();
    svsimSetAppPath(application.Path().c_str());
    svsimSetRunMode(c.bound, c.runTime, c.fullFeature);
    // The file beside the application and in the development directory; a sibling that the
    // driver refuses is tried once.
    const std::string file =
        Entry("A", "0 0 0 0 CAN1 Speed Body Vehicle") + Entry("Bad", "0 0 0 0 CAN1 ,, Body Vehicle");
    application.WriteFile("kvorSession.txt", file);
    WriteText(gFile, file);
    ASSERT_EQ(kvsimFailCall("kvCreateSession", kRefused, c.refusals), 0);
    gSleeps = 0;
    gSleptNs = 0;
    const uint32_t a = Open("A");
    EXPECT_EQ(UseStatus(a), c.expected);
    EXPECT_EQ(kvsimCountCalls("kvCreateSession"), c.creates + (c.expected == 0 ? 1 : 0));
    EXPECT_EQ(gSleeps, c.creates - 1);
    EXPECT_EQ(gSleptNs, (c.creates - 1) * 10000000LL);
    EXPECT_EQ(kvsvSessionClose(a), 0);
    EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);
  }
}

}  // namespace
