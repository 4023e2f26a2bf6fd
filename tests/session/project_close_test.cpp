// Closing sessions that belong to an interface record: siblings, claims and the record's end.
#include <gtest/gtest.h>

#include <map>
#include <mutex>
#include <string>

#include "session/teardown_slot.h"
#include "support/slot_fixture.h"

namespace {

using namespace nKVSVAPI100;

class ProjectClose : public SlotFixture {
 protected:
  void TearDown() override {
    {
      std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
      while (!gSessionManager.interfaces.empty())
        gSessionManager.EraseInterface(gSessionManager.interfaces.begin()->first);
    }
    SlotFixture::TearDown();
  }

  // An interface record as a project open leaves it: sessions by name, with state and handle.
  void MakeRecord(const std::string &key, const std::map<std::string, uint32_t> &states,
                  const char *driverInterface) {
    auto *record = new cSnLifeInterface();
    for (const auto &entry : states) {
      auto *session = new cSnLifeSession();
      session->state = entry.second;
      if (entry.second != cSnLifeSession::kGone)
        session->handle = MakeSession(entry.first, kvMode_SignalInSinglePoint, driverInterface);
      handles_[entry.first] = session->handle;
      record->sessions[entry.first] = session;
    }
    std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
    gSessionManager.InsertInterface(key, record);
  }

  Status Teardown(uint32_t handle) {
    std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
    return TeardownSlot(gSessionManager, handle);
  }

  uint32_t StateOf(const std::string &key, const std::string &name) {
    return gSessionManager.interfaces.at(key)->sessions.at(name)->state;
  }

  std::map<std::string, uint32_t> handles_;
};

TEST_F(ProjectClose, TwoClaimedSessionsEndOneAfterTheOther) {
  MakeRecord("CAN1", {{"A", cSnLifeSession::kClaimed}, {"B", cSnLifeSession::kClaimed}}, "CAN1");
  EXPECT_EQ(Teardown(handles_["A"]), 0);
  EXPECT_EQ(kvsimOpenSessionCount(), 1);
  EXPECT_EQ(StateOf("CAN1", "A"), cSnLifeSession::kGone);
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 1);
  EXPECT_EQ(Slot(handles_["A"]), nullptr);
  EXPECT_NE(Slot(handles_["B"]), nullptr);

  EXPECT_EQ(Teardown(handles_["B"]), 0);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);
}

TEST_F(ProjectClose, LastClaimedSessionTakesItsUnclaimedSiblingsAlong) {
  MakeRecord("CAN1",
             {{"A", cSnLifeSession::kClaimed}, {"B", cSnLifeSession::kCreated},
              {"C", cSnLifeSession::kCreated}, {"D", cSnLifeSession::kGone}},
             "CAN1");
  ASSERT_EQ(kvsimOpenSessionCount(), 3);
  kvsimLogClear();
  EXPECT_EQ(Teardown(handles_["A"]), 0);
  EXPECT_EQ(kvsimCountCalls("kvClear"), 3);
  kvsimCallRecord first{};
  ASSERT_EQ(kvsimLogEntry(2, &first), 1);  // size read, name read, then the closed session
  EXPECT_STREQ(first.function, "kvClear");
  EXPECT_EQ(first.object, handles_["A"]);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);
}

TEST_F(ProjectClose, FirstSiblingFailureIsTheResult) {
  MakeRecord("CAN1", {{"A", cSnLifeSession::kClaimed}, {"B", cSnLifeSession::kCreated}}, "CAN1");
  const int32_t failure = static_cast<int32_t>(0xBFF62099);
  ASSERT_EQ(kvsimFailCall("kvClear", 0x3FF62001, 1), 0);  // the closed session warns
  ASSERT_EQ(kvsimFailCall("kvClear", failure, 1), 0);
  EXPECT_EQ(Teardown(handles_["A"]), failure);
  EXPECT_EQ(kvsvGetIsProjectSessionOpen(), 0);
}

TEST_F(ProjectClose, SessionsOutsideTheRecordAreOnlyCleared) {
  MakeRecord("CAN1", {{"A", cSnLifeSession::kClaimed}}, "CAN1");
  struct Case {
    const char *what;
    const char *driverInterface;
  } cases[] = {
      {"manual session on the record's interface", "CAN1"},
      {"interface name with a suffix that the record's key lacks", "CAN1/monitor"},
      {"interface without a record", "CAN3"},
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(c.what);
    const uint32_t manual = MakeSession("M", kvMode_SignalInSinglePoint, c.driverInterface);
    kvsimLogClear();
    EXPECT_EQ(Teardown(manual), 0);
    EXPECT_EQ(kvsimCountCalls("kvClear"), 1);
    EXPECT_EQ(StateOf("CAN1", "A"), cSnLifeSession::kClaimed);
    EXPECT_EQ(Slot(manual), nullptr);
  }
}

TEST_F(ProjectClose, UnreadableInterfaceNameOnlyClearsTheSession) {
  MakeRecord("CAN1", {{"A", cSnLifeSession::kClaimed}}, "CAN1");
  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropSession_IntfName, kvsimErrInternal, 1), 0);
  EXPECT_EQ(Teardown(handles_["A"]), 0);
  EXPECT_EQ(StateOf("CAN1", "A"), cSnLifeSession::kClaimed);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
}

TEST_F(ProjectClose, HandleOutsideTheTableReportsItsCloseOrInvalidSession) {
  EXPECT_EQ(Teardown(0), kvErrInvalidSession);
  uint32_t error = 0;
  ASSERT_EQ(kvhdnCreateErrorSession(static_cast<int32_t>(0xBFF62010), &error), 0);
  ASSERT_EQ(kvsimFailCall("kvClear", kvsimErrInternal, 1), 0);
  // A failed clear is the result even where no slot can be.
  EXPECT_EQ(Teardown((error & 0xFFFF0000u) | 0x2001u), kvsimErrInternal);
}

}  // namespace
