// Session handles: the low 16 bits are a table index that callers rely on, the high bits tell a
// stale handle from a live one.
#include <map>
#include <random>
#include <set>
#include <vector>

#include "kvor_test_support.h"

namespace {

using KvorSessionHandles = KvorTest;

constexpr uint32_t kMaxSessions = 8192;

uint32_t LowBits(uint32_t handle) { return handle & 0xFFFFu; }

// The form every session handle must have: an index the library can use, and a top byte that
// the library does not take for a system object, a database object or "no class".
void ExpectSessionForm(uint32_t handle) {
  EXPECT_GE(LowBits(handle), 1u) << std::hex << handle;
  EXPECT_LE(LowBits(handle), kMaxSessions) << std::hex << handle;
  const uint32_t top = handle >> 24;
  EXPECT_NE(top, 0x01u) << std::hex << handle;
  EXPECT_NE(top, 0x0Fu) << std::hex << handle;
  EXPECT_EQ(top & 0x80u, 0u) << std::hex << handle;
}

TEST_F(KvorSessionHandles, HandlesOfEveryInterfaceAndErrorSessionsHaveTheSessionForm) {
  for (const char *name : {"CAN1", "CAN2", "CAN3", "CAN4", "LIN1", "LIN2", "FlexRay1", "FlexRay2",
                           "ENET1", "ENET1/monitor"}) {
    ExpectSessionForm(Create(name, kvMode_FrameInStream));
  }
  uint32_t error = 0;
  ASSERT_EQ(kvhdnCreateErrorSession(kvsimErrUnknownInterface, &error), 0);
  ExpectSessionForm(error);
}

TEST_F(KvorSessionHandles, LowBitsStayUniqueAmongOpenSessionsThroughCreatesAndClears) {
  std::mt19937 random(20240917);
  std::map<uint32_t, uint32_t> openByLowBits;
  std::set<uint32_t> everHanded;
  for (int step = 0; step < 20000; ++step) {
    const bool create = openByLowBits.empty() || random() % 3 != 0;
    if (create) {
      uint32_t handle = 0;
      const int32_t status =
          step % 5 == 0 ? kvhdnCreateErrorSession(kvsimErrInternal, &handle)
                        : kvCreateSession("", "", "A", "CAN1", kvMode_SignalInSinglePoint, &handle);
      ASSERT_EQ(status, 0) << "step " << step;
      ExpectSessionForm(handle);
      ASSERT_TRUE(openByLowBits.emplace(LowBits(handle), handle).second)
          << "low bits of " << std::hex << handle << " already in use at step " << std::dec << step;
      ASSERT_TRUE(everHanded.insert(handle).second)
          << "handle " << std::hex << handle << " handed out twice";
    } else {
      auto victim = openByLowBits.begin();
      std::advance(victim, random() % openByLowBits.size());
      ASSERT_EQ(kvClear(victim->second), 0);
      openByLowBits.erase(victim);
    }
    ASSERT_EQ(kvsimOpenSessionCount(), static_cast<int32_t>(openByLowBits.size()));
  }
}

TEST_F(KvorSessionHandles, AFullTableRefusesTheNextSessionUntilOneIsCleared) {
  std::vector<uint32_t> handles;
  for (uint32_t i = 0; i < kMaxSessions; ++i) {
    uint32_t handle = 0;
    ASSERT_EQ(kvCreateSession("", "", "", "LIN1", kvMode_FrameInQueued, &handle), 0) << i;
    handles.push_back(handle);
  }
  uint32_t refused = 0x12345678;
  EXPECT_EQ(kvCreateSession("", "", "", "LIN1", kvMode_FrameInQueued, &refused),
            kvsimErrTooManySessions);
  EXPECT_EQ(refused, 0x12345678u) << "a refused creation hands out nothing";
  uint32_t refusedError = 0;
  EXPECT_EQ(kvhdnCreateErrorSession(kvsimErrInternal, &refusedError), kvsimErrTooManySessions);

  const uint32_t freed = handles[4321];
  ASSERT_EQ(kvClear(freed), 0);
  uint32_t reused = 0;
  ASSERT_EQ(kvCreateSession("", "", "", "LIN1", kvMode_FrameInQueued, &reused), 0);
  EXPECT_EQ(LowBits(reused), LowBits(freed)) << "the only free index is the freed one";
  EXPECT_NE(reused, freed) << "the high bits must tell the new session from the cleared one";
  EXPECT_EQ(kvGetProperty(freed, kvPropSession_Mode, 4, &refused), kvsimErrInvalidSession);
  EXPECT_EQ(ReadU32(reused, kvPropSession_Mode), static_cast<uint32_t>(kvMode_FrameInQueued));
}

TEST_F(KvorSessionHandles, AClearedHandleFailsEveryCall) {
  const uint32_t stale = Create("CAN1", kvMode_SignalInSinglePoint, "A");
  ASSERT_EQ(kvClear(stale), 0);

  double value = 0;
  uint32_t word = 0;
  const struct {
    const char *call;
    int32_t status;
  } calls[] = {
      {"kvClear", kvClear(stale)},
      {"kvGetPropertySize", kvGetPropertySize(stale, kvPropSession_Mode, &word)},
      {"kvGetProperty", kvGetProperty(stale, kvPropSession_Mode, 4, &word)},
      {"kvSetProperty", kvSetProperty(stale, kvPropSession_IntfBaudRate, 4, &word)},
      {"kvGetSubProperty", kvGetSubProperty(stale, 0, kvPropSessionSub_CANTxTime, 8, &value)},
      {"kvSetSubProperty", kvSetSubProperty(stale, 0, kvPropSessionSub_CANTxTime, 8, &value)},
      {"kvReadSignalSinglePoint", kvReadSignalSinglePoint(stale, &value, 8, nullptr, 0)},
      {"kvWriteSignalSinglePoint", kvWriteSignalSinglePoint(stale, &value, 8)},
      {"kvWait", kvWait(stale, kvsimConditionIntfCommunicating, 0, &word, 5.0)},
  };
  for (const auto &call : calls) {
    EXPECT_EQ(call.status, kvsimErrInvalidSession) << call.call;
  }
}

TEST_F(KvorSessionHandles, HandlesThatNeverNamedASessionAreInvalid) {
  const uint32_t live = Create("CAN1", kvMode_SignalInSinglePoint, "A");
  uint32_t word = 0;
  for (uint32_t forged : {0u, live + 1, live ^ 0x00010000u, 0x0F000001u, 0x80000001u}) {
    EXPECT_EQ(kvGetProperty(forged, kvPropSession_Mode, 4, &word), kvsimErrInvalidSession)
        << std::hex << forged;
    EXPECT_EQ(kvClear(forged), kvsimErrInvalidSession) << std::hex << forged;
  }
  EXPECT_EQ(kvsimOpenSessionCount(), 1);
}

TEST_F(KvorSessionHandles, ResetEndsEverySessionAndTheirHandlesStayInvalid) {
  const uint32_t before = Create("CAN3", kvMode_SignalInSinglePoint, "A");
  kvsimReset();
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  const uint32_t after = Create("CAN3", kvMode_SignalInSinglePoint, "A");
  EXPECT_NE(after, before);
  uint32_t word = 0;
  EXPECT_EQ(kvGetProperty(before, kvPropSession_Mode, 4, &word), kvsimErrInvalidSession);
}

}  // namespace
