// Project sessions: the session file's two readers (one entry by name, the siblings of an
// interface) on files as a project writes them and damaged ones, and opens by name from the file
// in the driver's directory for temporary session files (relocated below a temporary root) or
// beside a built application: siblings, claims, closes, error sessions and retries, whose waits
// this program records instead of sleeping.
#include <gtest/gtest.h>

#include <array>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <optional>
#include <sstream>
#include <tuple>

#include "paths/paths_test_support.h"
#include "session/session_file_entry.h"
#include "session/session_file_path.h"
#include "session/session_file_siblings.h"
#include "support/session_fixture.h"
#include "support/sleep_recorder.h"

namespace {

using namespace nKVSVAPI100;

// The relocation library puts the driver's directory for temporary session files below this root,
// set at load, before anything builds the library's directory table.
const kvsvtest::cTempDir gRoot;
const int gRelocated = setenv("KVSV_TEST_RELOCATION_ROOT", gRoot.Path().c_str(), 1);
const std::string gFile = gRoot.Path() + "/var/lib/kvor/kvorSession.txt";

// One entry: the name line, the fields line and an empty third line, each ended by `end`.
std::string Entry(const std::string &name, const std::string &fields, const char *end = "\n") {
  return name + end + fields + end + end;
}

void WriteText(const std::string &path, const std::string &text) {
  std::filesystem::create_directories(std::filesystem::path(path).parent_path());
  std::ofstream(path, std::ios::binary) << text;
}

class Project : public SessionFixture {
 protected:
  // A file of the test's own directory, for the readers.
  std::string Write(const std::string &text, const std::string &name = "kvorSession.txt") {
    dir_.WriteFile(name, text);
    return dir_.Sub(name);
  }
  // kvsvSessionOpen as the host calls it; the host always gets 0, so only the handle is kept.
  uint32_t Open(const char *name) {
    uint32_t handle = 0;
    EXPECT_EQ(kvsvSessionOpen(Name(name), &handle, 0), 0);
    return handle;
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
  kvsvtest::cTempDir dir_;
  const std::string ab_ =
      Entry("A", "0 0 0 0 CAN1 Speed Body Vehicle") + Entry("B", "0 0 0 0 CAN1 Gear Body Vehicle");
};

TEST_F(Project, EntryFieldsAsWritten) {
  kvsvtest::cFakeErrorLog log;
  // Mode, resample rate and extra number, then interface, list, cluster and database.
  const std::tuple<std::string, const char *, const char *> cases[] = {
      {Entry("Speed In", "1 1000 500000 0 CAN1 - Body Vehicle Database.dbc"), "Speed In",
       "1 1000.5 0|CAN1||Body|Vehicle Database.dbc"},
      {Entry("A", "4 2 250000 -1 LIN1/x F1,F2 C D.ldf", "\r\n"), "A",
       "4 2.25 -1|LIN1/x|F1,F2|C|D.ldf"},
      {Entry("A", "2 0 0 7 - -list -c -db"), "A", "2 0 7||||"},
      // No line feed at the end: the database loses its last character all the same.
      {"A\n3 0 0 0 CAN1 L C Vehicle.dbc", "A", "3 0 0|CAN1|L|C|Vehicle.db"},
      // A name is a prefix of the first name line that begins with it.
      {Entry("CAN2", "6 0 0 0 CAN2 - - two") + Entry("CAN", "6 0 0 0 CAN1 - - one"), "CAN",
       "6 0 0|CAN2|||two"},
      {"X\n5 0 0 0 CAN3 - - x\n" + std::string(400, 'z') + "\n" + Entry("Y", "5 0 0 9 CAN4 - - y"),
       "Y", "5 0 9|CAN4|||y"},
  };
  for (const auto &[file, name, expected] : cases) {
    tSessionEntry entry;
    ASSERT_EQ(ReadSessionEntry(name, Write(file).c_str(), entry), 0) << file;
    std::ostringstream fields;
    fields << entry.mode << ' ' << entry.resampleRate << ' ' << entry.extra << '|'
           << entry.Interface() << '|' << entry.List() << '|' << entry.Cluster() << '|'
           << entry.Database();
    EXPECT_EQ(fields.str(), expected) << file;
  }
  EXPECT_TRUE(log.Records().empty());
}

TEST_F(Project, AFailedReadLeavesNoEntryAndReportsADamagedOne) {
  const std::string b = Entry("B", "1 0 0 0 CAN1 - C D"), longName(300, 'x');
  const std::string good = Write(b, "good");
  // The file, the name, the result and the line of its report (0: none).
  const std::tuple<std::string, std::string, Status, uint32_t> cases[] = {
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
  for (const auto &[file, name, status, line] : cases) {
    SCOPED_TRACE(file);
    ASSERT_EQ(ReadSessionEntry("B", good.c_str(), entry), 0);
    kvsvtest::cFakeErrorLog log;
    EXPECT_EQ(ReadSessionEntry(name.c_str(), Write(file).c_str(), entry), status);
    EXPECT_EQ(entry.text, nullptr) << "the entry read before is gone too";
    EXPECT_EQ(ReportLines(log), std::vector<uint32_t>(line != 0 ? 1 : 0, line));
  }
  EXPECT_EQ(ReadSessionEntry("A", dir_.Sub("absent").c_str(), entry), kvErrSessionFile);
}

TEST_F(Project, SiblingsShareInterfaceDatabaseAndCluster) {
  kvsvtest::cFakeErrorLog log;
  const std::string path = Write(
      Entry("A", "6 0 0 0 CAN1 - Body Vehicle DB") +
      Entry("Monitor", "6 0 0 0 CAN1/monitor F1 Body Vehicle DB", "\r\n") +
      Entry("OtherDb", "6 0 0 0 CAN1 - Body Other") +
      Entry("OtherCluster", "6 0 0 0 CAN1 - Chassis Vehicle DB") +
      Entry("OtherInterface", "6 0 0 0 CAN2 - Body Vehicle DB") +
      Entry("Case", "6 0 0 0 can1 - Body Vehicle DB") +
      Entry("", "0 0 0 0 CAN1/x/z - Body Vehicle DB") +  // no name: no open can claim it
      Entry("B", "0 0 0 0 CAN1/x/y Speed Body Vehicle DB") + Entry("L", "0 0 0 0 LIN1 - - -"));
  const std::tuple<const char *, const char *, const char *, std::vector<std::string>> cases[] = {
      {"CAN1", "Vehicle DB", "Body", {"A", "Monitor"}},
      {"CAN1/x", "Vehicle DB", "Body", {"B"}},
      {"CAN1", "Other", "Body", {"OtherDb"}},
      {"LIN1", "", "", {"L"}},
      {"CAN3", "Vehicle DB", "Body", {}},
  };
  for (const auto &[key, database, cluster, expected] : cases) {
    tMallocBlock names;
    ASSERT_EQ(ListSiblingSessions(key, database, cluster, path.c_str(), names), 0);
    std::vector<std::string> listed;
    for (const char *name = names.get(); *name != '\0'; name += listed.back().size() + 1)
      listed.emplace_back(name);
    EXPECT_EQ(listed, expected) << key << " " << database;
  }
  EXPECT_TRUE(log.Records().empty());
}

TEST_F(Project, AFailedHostPathIsReportedAndStopsAManualCreate) {
  svsimSetRunMode(1, 1, 0);
  for (uint32_t failing : {1u, 2u}) {  // the host path, then its text
    kvsvtest::cFakeErrorLog log;
    svsimFailAllocAt(failing);
    std::string path = "unchanged";
    EXPECT_EQ(GetSessionFilePath(path), kvErrInternal);
    EXPECT_EQ(path, "unchanged");
    EXPECT_EQ(ReportLines(log), std::vector<uint32_t>{154});
    EXPECT_EQ(svsimLivePaths(), 0u);
  }
  kvsvtest::cFakeErrorLog log;
  kvsvRefnum reference = 0;
  svsimFailAllocAt(1);
  EXPECT_EQ(kvsvSessionManualCreate(":memory:", "", "", "CAN1", 0, &reference), kvErrInternal);
  EXPECT_EQ(kvsimLogCount(), 0);
}

TEST_F(Project, TheFirstOpenCreatesTheSiblingsAndLaterOpensClaimThem) {
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
}

TEST_F(Project, ASiblingThatFailedTellsItsFailureOnce) {
  WriteText(gFile, ab_ + Entry("Bad", "0 0 0 0 CAN1 a,,b Body Vehicle"));
  const uint32_t a = Open("A");
  ExpectOpen(2, 1);
  const uint32_t bad = Open("Bad"), again = Open("Bad");
  EXPECT_EQ(UseStatus(bad), kvsimErrInvalidList);
  EXPECT_EQ(UseStatus(again), kvErrSessionNotInInterface);
  for (uint32_t handle : {again, bad, a}) kvsvSessionClose(handle);
  ExpectOpen(0, 0);
}

TEST_F(Project, TheLastClaimedCloseEndsTheRecordAndTheNextOpenStartsAfresh) {
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

TEST_F(Project, EntrySettingsReachTheDriverAndARefusedOneClearsTheNewSession) {
  // The setting that the driver refuses (a property; 1: the LIN schedule's state write), and
  // what it then has: resample rate, FlexRay key slot and LIN schedule, or a cleared session.
  const std::tuple<const char *, uint32_t, const char *> cases[] = {
      {"1 1000 500000 0 CAN1 - C D", 0, "rate 1000.5"},
      {"4 2 0 0 CAN1 - C D", 0, "rate 2"},
      {"2 1000 0 0 CAN1 - C D", 0, ""},
      {"0 0 0 0 FlexRay1 - C D", 0, ""},
      {"0 0 0 12 flexray1 - C D", 0, "slot 12"},
      {"0 0 0 -1 LIN1 - C D", 0, ""},
      {"0 0 0 0 LIN1 - C D", 0, "schedule 0"},
      {"0 0 0 3 lin2/x - C D", 0, "schedule 3"},
      {"0 0 0 5 CAN2 - C D", 0, ""},
      {"1 10 0 0 CAN1 - C D", kvPropSession_ResampRate, "cleared"},
      {"0 0 0 3 FlexRay1 - C D", kvPropSession_IntfFlexRayKeySlotID, "cleared"},
      {"0 0 0 1 LIN1 - C D", 1, "cleared"},
  };
  for (const auto &[fields, refused, expected] : cases) {
    WriteText(gFile, Entry("S", fields));
    const int32_t injected = refused == 0 ? 0
                             : refused == 1
                                 ? kvsimFailCall("kvWriteState", kRefused, 1)
                                 : kvsimFailProperty("kvSetProperty", refused, kRefused, 1);
    ASSERT_EQ(injected, 0);
    kvsimLogClear();
    const uint32_t s = Open("S");
    double rate = 0.0;
    int32_t slot = 0;
    uint32_t schedule = 0;
    std::ostringstream found;
    if (UseStatus(s) != 0)
      found << (UseStatus(s) == kRefused && kvsimCountCalls("kvClear") == 1 ? "cleared" : "failed");
    if (kvGetProperty(s, kvPropSession_ResampRate, 8, &rate) == 0) found << "rate " << rate;
    if (kvGetProperty(s, kvPropSession_IntfFlexRayKeySlotID, 4, &slot) == 0)
      found << "slot " << slot;
    if (kvsimLinSchedule(s, &schedule) == 1) found << "schedule " << schedule;
    EXPECT_EQ(found.str(), expected) << fields;
    kvsvSessionClose(s);
  }
}

TEST_F(Project, FailuresTravelInErrorSessions) {
  kvsvtest::cFakeErrorLog log;
  const std::string b = Entry("B", "0 0 0 0 CAN1 - C D");
  const std::tuple<std::optional<std::string>, const char *, int32_t> cases[] = {
      {std::nullopt, "B", kvErrSessionFile},  // no file at all
      {b, "A", kvErrSessionFile},
      {"B\n0 0 0 0 CAN1 -\n", "B", kvErrInternal},  // a token missing
      {Entry("B", "0 0 0 0 CAN9 - C D"), "B", kvsimErrUnknownInterface},
      {b, "", kvErrSessionNameEmpty},
      {b, "___kvorSesn#0000abcd", kvErrManualSessionName},
  };
  for (const auto &[file, name, expected] : cases) {
    std::filesystem::remove(gFile);
    if (file) WriteText(gFile, *file);
    const uint32_t s = Open(name);
    EXPECT_EQ(UseStatus(s), expected) << name;
    ExpectOpen(1, 0);
    kvsvSessionClose(s);
  }
  uint32_t handle = 0;
  EXPECT_EQ(kvsvSessionOpen(nullptr, &handle, 0), 0);
  EXPECT_EQ(UseStatus(handle), kvErrSessionNameEmpty);
  kvsimLogClear();
  EXPECT_EQ(kvsvSessionOpen(Name("B"), nullptr, 0), 0);
  EXPECT_EQ(kvsimLogCount(), 0);
}

TEST_F(Project, ADamagedSiblingFailsTheOpenButKeepsWhatWasMade) {
  kvsvtest::cFakeErrorLog log;
  WriteText(gFile, Entry("A", "0 0 0 0 CAN1 - - -") + Entry("B", "0 x 0 0 CAN1 - - -"));
  EXPECT_EQ(UseStatus(Open("A")), kvErrInternal);
  ExpectOpen(2, 1);
  EXPECT_EQ(ReportLines(log), std::vector<uint32_t>{590});
}

TEST_F(Project, OnlyABuiltApplicationReadsTheFileBesideItAndRetriesItsFirstCreation) {
  kvsvtest::cTempDir application;
  const std::string besideIt = application.Sub("kvorSession.txt");
  // Run mode (bound, run-time, full feature), creations refused (-1: every one), creations made.
  const std::tuple<std::array<int32_t, 3>, int32_t, int, int32_t> cases[] = {
      {{1, 1, 0}, 3, 4, 0},           {{7, 0, 7}, 799, 800, 0},     // taken at the last attempt
      {{1, 1, 0}, -1, 800, kRefused}, {{0, 1, 1}, 1, 1, kRefused},  // development environment
      {{1, 0, 0}, 1, 1, kRefused},  // bound, but under no run-time engine
  };
  for (const auto &[mode, refusals, creates, expected] : cases) {
    SCOPED_TRACE(testing::Message() << mode[0] << mode[1] << mode[2] << " " << refusals);
    const bool built = mode[0] != 0 && mode[1] + mode[2] != 0;
    kvsimReset();
    svsimReset();
    svsimSetAppPath(application.Path().c_str());
    svsimSetRunMode(mode[0], mode[1], mode[2]);
    // The file only where it belongs; a sibling that the driver refuses is tried once.
    std::filesystem::remove(besideIt);
    std::filesystem::remove(gFile);
    WriteText(built ? besideIt : gFile, Entry("A", "0 0 0 0 CAN1 Speed Body Vehicle") +
                                            Entry("Bad", "0 0 0 0 CAN1 ,, Body Vehicle"));
    ASSERT_EQ(kvsimFailCall("kvCreateSession", kRefused, refusals), 0);
    const size_t sleptBefore = kvsvtest::Sleeps().size();
    const uint32_t a = Open("A");
    const std::vector<timespec> sleeps = kvsvtest::Sleeps();
    EXPECT_EQ(UseStatus(a), expected);
    EXPECT_EQ(kvsimCountCalls("kvCreateSession"), creates + (expected == 0 ? 1 : 0));
    EXPECT_EQ(sleeps.size() - sleptBefore, static_cast<size_t>(creates - 1));
    for (size_t i = sleptBefore; i < sleeps.size(); ++i)
      EXPECT_EQ(sleeps[i].tv_sec * 1000000000L + sleeps[i].tv_nsec, 10000000L) << "every 10 ms";
    EXPECT_EQ(kvsvSessionClose(a), 0);
    EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);
  }
}

}  // namespace
