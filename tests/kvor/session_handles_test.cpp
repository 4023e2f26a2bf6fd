// Session handles: the low 16 bits are a table index that callers rely on, the high bits tell a
// stale handle from a live one, and a handle that names no open session is refused by every call.
// Error sessions stand for a failed open: every use answers with the failure, and clearing them
// ends them quietly.
#include <iterator>
#include <map>
#include <random>
#include <set>
#include <vector>

#include "control_calls.h"
#include "kvor_test_support.h"

namespace {

using KvorSessionHandles = KvorTest;

constexpr uint32_t kMaxSessions = 8192;
constexpr int32_t kOpenFailure = static_cast<int32_t>(0xBFF6308A);

uint32_t LowBits(uint32_t handle) { return handle & 0xFFFFu; }

TEST_F(KvorSessionHandles, LowBitsStayUniqueAmongOpenSessionsThroughCreatesAndClears) {
  std::mt19937 random(20240917);
  std::map<uint32_t, uint32_t> openByLowBits;
  std::set<uint32_t> everHanded;
  for (int step = 0; step < 20000; ++step) {
    if (openByLowBits.empty() || random() % 3 != 0) {
      uint32_t handle = 0;
      const char *name = step % 10 == 0 ? "ENET1/monitor" : kInterfaceNames[step % 9];
      const int32_t status =
          step % 5 == 0 ? kvhdnCreateErrorSession(kvsimErrInternal, &handle)
                        : kvCreateSession("", "", "A", name, kvMode_SignalInSinglePoint, &handle);
      ASSERT_EQ(status, 0) << "step " << step;
      // An index the library can use, and a top byte it does not take for a system object
      // (0x01), a database object (bit 7) or "no class" (0x0F).
      const uint32_t top = handle >> 24;
      ASSERT_TRUE(LowBits(handle) >= 1 && LowBits(handle) <= kMaxSessions && top != 0x01u &&
                  top != 0x0Fu && (top & 0x80u) == 0)
          << std::hex << handle;
      ASSERT_TRUE(openByLowBits.emplace(LowBits(handle), handle).second)
          << "low bits of " << std::hex << handle << " already in use at step " << std::dec << step;
      ASSERT_TRUE(everHanded.insert(handle).second) << std::hex << handle << " handed out twice";
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
  EXPECT_EQ(kvhdnCreateErrorSession(kvsimErrInternal, &refused), kvsimErrTooManySessions);

  const uint32_t freed = handles[4321];
  ASSERT_EQ(kvClear(freed), 0);
  uint32_t reused = 0;
  ASSERT_EQ(kvCreateSession("", "", "", "LIN1", kvMode_FrameInQueued, &reused), 0);
  EXPECT_EQ(LowBits(reused), LowBits(freed)) << "the only free index is the freed one";
  EXPECT_NE(reused, freed) << "the high bits must tell the new session from the cleared one";
  EXPECT_EQ(kvGetProperty(freed, kvPropSession_Mode, 4, &refused), kvsimErrInvalidSession);
}

// Handles that name no open session get each call's refusal; error sessions get their failure.
TEST_F(KvorSessionHandles, EveryCallAnswersAHandleThatIsNoWorkingSessionAndTouchesNothing) {
  // Error sessions first, so that no session takes the index next to the live one; all of
  // them made before any is used, since each must keep its own failure.
  const int32_t failures[] = {kOpenFailure, kvsimErrUnknownInterface, -1};
  uint32_t errors[3] = {};
  for (int i = 0; i < 3; ++i) ASSERT_EQ(kvhdnCreateErrorSession(failures[i], &errors[i]), 0);
  const uint32_t cleared = Create("CAN1", kvMode_SignalInSinglePoint, "A");
  ASSERT_EQ(kvClear(cleared), 0);
  const uint32_t live = Create("CAN1", kvMode_SignalInSinglePoint, "A");
  const struct {
    uint32_t handle;
    int32_t failure;  // 0: no session at all
  } cases[] = {{0u, 0},
               {cleared, 0},
               {live + 1, 0},
               {live ^ 0x00010000u, 0},
               {0x0F000001u, 0},
               {0x80000001u, 0},
               {0x20FF1FFFu, 0},
               {errors[0], failures[0]},
               {errors[1], failures[1]},
               {errors[2], failures[2]}};
  UseOutputs outputs;
  const std::vector<HandleUse> uses = HandleUses(outputs);
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << std::hex << c.handle << " failure " << c.failure);
    for (const HandleUse &use : uses) {
      outputs = UseOutputs();
      EXPECT_EQ(use.run(c.handle), c.failure != 0 ? c.failure : use.notOpenStatus) << use.call;
      EXPECT_TRUE(outputs.Untouched()) << use.call;
    }
    // The controls do not take either for a session.
    double value = 1.0;
    EXPECT_EQ(kvsimSetSignalValues(c.handle, &value, 1), -1);
    EXPECT_EQ(kvsimGetSignalValues(c.handle, &value, 1), -1);
    EXPECT_EQ(kvsimRaiseCondition(c.handle, kvsimConditionIntfCommunicating, 1), -1);
    EXPECT_EQ(kvsimSessionStarted(c.handle), -1);
    if (c.failure == 0) {
      EXPECT_EQ(kvClear(c.handle), kvsimErrInvalidSession);
    }
  }
  EXPECT_EQ(kvsimOpenSessionCount(), 4) << "the live session and three error sessions";
  EXPECT_EQ(kvsimSessionStarted(live), 0);
  EXPECT_EQ(ReadText(live, kvPropSession_IntfName), "CAN1");
  EXPECT_EQ(kvSystemClose(live), kvsimErrInvalidObject) << "a real session is not a system";
}

TEST_F(KvorSessionHandles, AnErrorSessionKeepsOnlyAnErrorAndEndsByClearOrSystemClose) {
  const struct {
    const char *call;
    int32_t (*end)(uint32_t);
    int32_t again;  // what the same call answers once the handle is gone
  } ends[] = {{"kvClear", kvClear, kvsimErrInvalidSession},
              {"kvSystemClose", kvSystemClose, kvsimErrInvalidObject}};
  for (const auto &end : ends) {
    SCOPED_TRACE(end.call);
    uint32_t handle = 0;
    ASSERT_EQ(kvhdnCreateErrorSession(kOpenFailure, &handle), 0);
    EXPECT_EQ(end.end(handle), 0);
    EXPECT_EQ(kvsimOpenSessionCount(), 0);
    uint32_t size = 0;
    EXPECT_EQ(kvGetPropertySize(handle, kvPropSession_IntfName, &size), kvsimErrInvalidSession);
    EXPECT_EQ(end.end(handle), end.again) << "a second time";
  }
  uint32_t handle = 0x77;
  EXPECT_EQ(kvhdnCreateErrorSession(0, &handle), kvsimErrInvalidArgument);
  EXPECT_EQ(kvhdnCreateErrorSession(0x3FF60001, &handle), kvsimErrInvalidArgument);
  EXPECT_EQ(kvhdnCreateErrorSession(kOpenFailure, nullptr), kvsimErrNullPointer);
  EXPECT_EQ(handle, 0x77u);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
}

}  // namespace
