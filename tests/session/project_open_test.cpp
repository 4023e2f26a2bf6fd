// Opening project sessions by name, from a session file in the driver's directory for temporary
// session files (relocated below a temporary root): siblings, claims, closes and error sessions.
#include <gtest/gtest.h>

#include <cstdio>
#include <mutex>
#include <optional>
#include <string>

#include "paths/relocation_root.h"
#include "session/project_session_support.h"
#include "session/session_manager.h"
#include "support/fake_error_log.h"

namespace {

using namespace nKVSVAPI100;
using kvsvtest::Entry;
using kvsvtest::UseStatus;

const kvsvtest::cRelocationRoot gRoot;
const std::string gFile = gRoot.Path() + "/var/lib/kvor/kvorSession.txt";
const int32_t kRefused = static_cast<int32_t>(0xBFF62099);
const std::string kAB = Entry("A", "0 0 0 0 CAN1 Speed Body Vehicle") +
                        Entry("B", "0 0 0 0 CAN1 Gear Body Vehicle");

class ProjectOpen : public testing::Test {
 protected:
  void SetUp() override {
    kvsimReset();
    svsimReset();
    liveHandles_ = svsimLiveHandles();
  }
  void TearDown() override {
    // Slots and records that a test left, a failed sibling listing's on purpose, go; the
    // stand-in's reset ends their driver sessions.
    std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
    for (auto &slot : gSessionManager.slots) DestroySlot(slot.exchange(nullptr));
    while (!gSessionManager.interfaces.empty())
      gSessionManager.EraseInterface(gSessionManager.interfaces.begin()->first);
    kvsimReset();
    svsimReset();
  }
  static std::string Text(uint32_t handle, uint32_t id) {
    char text[64] = {};
    kvGetProperty(handle, id, sizeof text, text);
    return text;
  }
  static void ExpectOpenCounts(int driverSessions, int projectOpen) {
    EXPECT_EQ(kvsimOpenSessionCount(), driverSessions);
    EXPECT_EQ(kvsvGetIsProjectSessionOpen(), projectOpen);
  }
  uint64_t liveHandles_ = 0;
};

TEST_F(ProjectOpen, FirstOpenCreatesTheSiblingsAndLaterOpensClaimThem) {
  kvsvtest::WriteText(gFile, kAB + Entry("M", "6 0 0 0 CAN1/monitor - Body Vehicle") +
                                 Entry("X", "0 0 0 0 CAN1 Speed Body Other"));
  const uint32_t a = kvsvtest::Open("A");
  EXPECT_EQ(Text(a, kvPropSession_List), "Speed");
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 3);
  ExpectOpenCounts(3, 1);
  kvsimLogClear();
  EXPECT_EQ(Text(kvsvtest::Open("B"), kvPropSession_List), "Gear");
  EXPECT_EQ(Text(kvsvtest::Open("M"), kvPropSession_IntfName), "CAN1/monitor");
  // Another database is no sibling; a claimed name is not handed out twice.
  EXPECT_EQ(UseStatus(kvsvtest::Open("X")), kvErrSessionNotInInterface);
  EXPECT_EQ(UseStatus(kvsvtest::Open("A")), kvErrSessionAlreadyOpen);
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 0);
  EXPECT_EQ(UseStatus(a), 0);
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_EQ(svsimLiveHandles(), liveHandles_);
}

TEST_F(ProjectOpen, SiblingThatFailedTellsItsFailureOnce) {
  const std::pair<const char *, int32_t> cases[] = {
      {"0 0 0 0 CAN1 a,,b Body Vehicle", kvsimErrInvalidList},
      {"1 10 0 0 CAN1 Gear Body Vehicle", kRefused},  // its resample rate is refused
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.first);
    kvsvtest::WriteText(gFile, Entry("A", "0 0 0 0 CAN1 Speed Body Vehicle") + Entry("Bad", c.first));
    ASSERT_EQ(kvsimFailProperty("kvSetProperty", kvPropSession_ResampRate, kRefused, 1), 0);
    const uint32_t a = kvsvtest::Open("A");
    ExpectOpenCounts(1, 1);
    const uint32_t bad = kvsvtest::Open("Bad"), again = kvsvtest::Open("Bad");
    EXPECT_EQ(UseStatus(bad), c.second);
    EXPECT_EQ(UseStatus(again), kvErrSessionNotInInterface);
    for (uint32_t handle : {again, bad, a}) kvsvSessionClose(handle);
    ExpectOpenCounts(0, 0);
    kvsimClearFailures();
  }
}

TEST_F(ProjectOpen, LastClaimedCloseEndsTheRecordAndTheNextOpenStartsAfresh) {
  kvsvtest::WriteText(gFile, kAB + Entry("C", "0 0 0 0 CAN1 Rpm Body Vehicle"));
  const uint32_t a = kvsvtest::Open("A"), b = kvsvtest::Open("B");
  kvsvSessionClose(a);
  ExpectOpenCounts(2, 1);
  const uint32_t closedName = kvsvtest::Open("A");
  EXPECT_EQ(UseStatus(closedName), kvErrSessionAlreadyOpen);
  kvsvSessionClose(closedName);
  // B was the last claimed session: C, never claimed, goes with it.
  kvsvSessionClose(b);
  ExpectOpenCounts(0, 0);
  kvsimLogClear();
  EXPECT_EQ(UseStatus(kvsvtest::Open("A")), 0);
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 3);
}

TEST_F(ProjectOpen, EntrySettingsReachTheDriver) {
  struct Case {
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
  for (const Case &c : cases) {
    SCOPED_TRACE(c.fields);
    kvsvtest::WriteText(gFile, Entry("S", c.fields));
    const uint32_t s = kvsvtest::Open("S");
    ASSERT_EQ(UseStatus(s), 0);
    double rate = 0.0;
    int32_t keySlot = 0;
    uint32_t schedule = 0;
    const bool hasRate = kvGetProperty(s, kvPropSession_ResampRate, 8, &rate) == 0;
    const bool hasKeySlot = kvGetProperty(s, kvPropSession_IntfFlexRayKeySlotID, 4, &keySlot) == 0;
    const bool hasSchedule = kvsimLinSchedule(s, &schedule) == 1;
    EXPECT_EQ(hasRate ? std::optional<double>(rate) : std::nullopt, c.rate);
    EXPECT_EQ(hasKeySlot ? std::optional<int32_t>(keySlot) : std::nullopt, c.keySlot);
    EXPECT_EQ(hasSchedule ? std::optional<uint32_t>(schedule) : std::nullopt, c.schedule);
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
    kvsvtest::WriteText(gFile, Entry("S", c.first));
    ASSERT_EQ(c.second != 0 ? kvsimFailProperty("kvSetProperty", c.second, kRefused, 1)
                            : kvsimFailCall("kvWriteState", kRefused, 1),
              0);
    kvsimLogClear();
    const uint32_t s = kvsvtest::Open("S");
    EXPECT_EQ(UseStatus(s), kRefused);
    EXPECT_EQ(kvsimCountCalls("kvClear"), 1);
    ExpectOpenCounts(1, 0);  // the error session alone
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
      {"", "B", kvErrSessionFile},
      {b, "A", kvErrSessionFile},
      {Entry(std::string(300, 'x'), "0 0 0 0 CAN1 - C D") + b, "B", kvErrSessionFile},
      {Entry("B", "x 0 0 0 CAN1 - C D"), "B", kvErrInternal},  // mode not numeric
      {"B\n0 0 0 0 CAN1 -\n", "B", kvErrInternal},             // a token missing
      {"B\n0 0 0", "B", kvErrInternal},                        // truncated
      {Entry("B", "0 0 0 0 CAN9 - C D"), "B", kvsimErrUnknownInterface},
      {b, "", kvErrSessionNameEmpty},
      {b, "___kvorSesn#0000abcd", kvErrManualSessionName},
  };
  kvsvtest::cFakeErrorLog log;
  for (const auto &c : cases) {
    SCOPED_TRACE(c.file.value_or("(none)") + "/" + c.name);
    std::remove(gFile.c_str());
    if (c.file) kvsvtest::WriteText(gFile, *c.file);
    const uint32_t s = kvsvtest::Open(c.name);
    EXPECT_EQ(UseStatus(s), c.expected);
    ExpectOpenCounts(1, 0);
    EXPECT_EQ(svsimLiveHandles(), liveHandles_);
    EXPECT_EQ(svsimLivePaths(), 0u);
    kvsvSessionClose(s);
    EXPECT_EQ(kvsimOpenSessionCount(), 0);
  }
  uint32_t handle = 0;
  EXPECT_EQ(kvsvSessionOpen(nullptr, &handle, 0), 0);
  EXPECT_EQ(UseStatus(handle), kvErrSessionNameEmpty);
  SvHandle name = svsimMakeString("B");
  kvsimLogClear();
  EXPECT_EQ(kvsvSessionOpen(&name, nullptr, 0), 0);
  EXPECT_EQ(kvsimLogCount(), 0);
  svDisposeHandle(name);
}

TEST_F(ProjectOpen, DamagedSiblingFailsTheOpenButKeepsWhatWasMade) {
  kvsvtest::cFakeErrorLog log;
  kvsvtest::WriteText(gFile, Entry("A", "0 0 0 0 CAN1 - - -") + Entry("B", "0 x 0 0 CAN1 - - -"));
  EXPECT_EQ(UseStatus(kvsvtest::Open("A")), kvErrInternal);
  ExpectOpenCounts(2, 1);
  ASSERT_EQ(log.Records().size(), 1u);
  EXPECT_EQ(log.Records()[0].value.Line(), 590u);
}

TEST_F(ProjectOpen, ClaimsOfRecordsLeftByEarlierOpens) {
  kvsvtest::WriteText(gFile, Entry("Bad", "0 0 0 0 CAN1 - C D"));
  // The last failed sibling takes its record along; a record of another tag is not this one's.
  const std::pair<const char *, int32_t> cases[] = {{"", kRefused},
                                                    {"other", kvErrInterfaceTagMismatch}};
  for (const auto &c : cases) {
    SCOPED_TRACE(c.first);
    auto *record = new cSnLifeInterface();
    record->tag = c.first;
    record->sessions["Bad"] = new cSnLifeSession{cSnLifeSession::kGone, 0, kRefused};
    gSessionManager.InsertInterface("CAN1", record);
    EXPECT_EQ(UseStatus(kvsvtest::Open("Bad")), c.second);
    EXPECT_EQ(kvsvGetIsProjectSessionOpen(), c.second == kRefused ? 0 : 1);
    EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 0);
    gSessionManager.EraseInterface("CAN1");
  }
}

}  // namespace
