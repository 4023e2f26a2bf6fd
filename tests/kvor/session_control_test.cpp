// Session control in the driver: started and stopped sessions and interfaces by scope, flushing
// the signal values a session holds, and the FlexRay macrotick timing source.
#include <cmath>
#include <vector>

#include "kvor_test_support.h"

namespace {

using KvorSessionControl = KvorTest;

TEST_F(KvorSessionControl, ScopesStartAndStopSessionsAndTheirInterface) {
  // Two sessions on CAN1 and a bystander on CAN2, which no step may touch.
  const uint32_t a = Create("CAN1", kvMode_FrameInStream);
  const uint32_t b = Create("can1", kvMode_FrameOutQueued);
  const uint32_t bystander = Create("CAN2", kvMode_FrameInStream);
  const struct Step {
    const char *what;
    int32_t (*call)(uint32_t, uint32_t);
    uint32_t session;
    uint32_t scope;
    int32_t aStarted, bStarted, can1Started;
  } steps[] = {
      {"normal start of a", kvStart, a, kvsimScopeNormal, 1, 0, 1},
      {"session-only start of b", kvStart, b, kvsimScopeSessionOnly, 1, 1, 1},
      {"normal stop of a, b still runs", kvStop, a, kvsimScopeNormal, 0, 1, 1},
      {"normal stop of b, the last", kvStop, b, kvsimScopeNormal, 0, 0, 0},
      {"interface-only start", kvStart, a, kvsimScopeInterfaceOnly, 0, 0, 1},
      {"session-only start of a", kvStart, a, kvsimScopeSessionOnly, 1, 0, 1},
      {"starting again changes nothing", kvStart, a, kvsimScopeNormal, 1, 0, 1},
      {"interface-only stop keeps a started", kvStop, a, kvsimScopeInterfaceOnly, 1, 0, 0},
      {"session-only stop", kvStop, a, kvsimScopeSessionOnly, 0, 0, 0},
      {"normal start of b", kvStart, b, kvsimScopeNormal, 0, 1, 1},
      {"session-only stop leaves the interface", kvStop, b, kvsimScopeSessionOnly, 0, 0, 1},
      {"normal stop of a stopped session stops the interface", kvStop, a, kvsimScopeNormal, 0, 0,
       0},
      {"stopping again changes nothing", kvStop, a, kvsimScopeNormal, 0, 0, 0},
  };
  for (const Step &step : steps) {
    SCOPED_TRACE(step.what);
    ASSERT_EQ(step.call(step.session, step.scope), 0);
    EXPECT_EQ(kvsimSessionStarted(a), step.aStarted);
    EXPECT_EQ(kvsimSessionStarted(b), step.bStarted);
    EXPECT_EQ(kvsimInterfaceStarted("CAN1"), step.can1Started);
    EXPECT_EQ(kvsimSessionStarted(bystander), 0);
    EXPECT_EQ(kvsimInterfaceStarted("CAN2"), 0);
  }
}

TEST_F(KvorSessionControl, AnInterfaceWithASuffixIsTheInterfaceItself) {
  const uint32_t monitor = Create("ENET1/monitor", kvMode_FrameInStream);
  ASSERT_EQ(kvStart(monitor, kvsimScopeNormal), 0);
  EXPECT_EQ(kvsimInterfaceStarted("ENET1"), 1);
  EXPECT_EQ(kvsimInterfaceStarted("enet1"), 1) << "names compare without regard to case";
  EXPECT_EQ(kvsimInterfaceStarted("ENET1/monitor"), -1) << "the control takes the bare name";
}

TEST_F(KvorSessionControl, AClearStopsTheSessionAsANormalStopDoes) {
  const uint32_t first = Create("LIN1", kvMode_FrameInStream);
  const uint32_t second = Create("LIN1", kvMode_FrameInStream);
  const uint32_t idle = Create("LIN2", kvMode_FrameInStream);
  ASSERT_EQ(kvStart(first, kvsimScopeNormal), 0);
  ASSERT_EQ(kvStart(second, kvsimScopeSessionOnly), 0);
  ASSERT_EQ(kvStart(idle, kvsimScopeInterfaceOnly), 0);

  ASSERT_EQ(kvClear(first), 0);
  EXPECT_EQ(kvsimSessionStarted(first), -1);
  EXPECT_EQ(kvsimInterfaceStarted("LIN1"), 1) << "another started session is on it";
  ASSERT_EQ(kvClear(second), 0);
  EXPECT_EQ(kvsimInterfaceStarted("LIN1"), 0) << "the last started session is gone";
  ASSERT_EQ(kvClear(idle), 0);
  EXPECT_EQ(kvsimInterfaceStarted("LIN2"), 1) << "a session that never started stops nothing";

  const uint32_t next = Create("LIN1", kvMode_FrameInStream);
  EXPECT_EQ(kvsimSessionStarted(next), 0) << "a new session begins stopped";
}

TEST_F(KvorSessionControl, AnUnknownScopeIsRefusedAndChangesNothing) {
  const uint32_t session = Create("CAN3", kvMode_FrameInStream);
  for (uint32_t scope : {3u, 0x80000000u, 0xFFFFFFFFu}) {
    EXPECT_EQ(kvStart(session, scope), kvsimErrInvalidScope) << scope;
    EXPECT_EQ(kvsimSessionStarted(session), 0);
    EXPECT_EQ(kvsimInterfaceStarted("CAN3"), 0);
  }
  ASSERT_EQ(kvStart(session, kvsimScopeNormal), 0);
  EXPECT_EQ(kvStop(session, 3), kvsimErrInvalidScope);
  EXPECT_EQ(kvsimSessionStarted(session), 1);
  EXPECT_EQ(kvsimInterfaceStarted("CAN3"), 1);
}

TEST_F(KvorSessionControl, CallsOnAHandleThatIsNoOpenSessionAreRefused) {
  const uint32_t cleared = Create("FlexRay1", kvMode_FrameInStream);
  ASSERT_EQ(kvClear(cleared), 0);
  for (uint32_t handle : {0u, cleared, 0x20FF1FFFu}) {
    uint64_t token = 7;
    EXPECT_EQ(kvStart(handle, kvsimScopeNormal), kvsimErrInvalidSession) << std::hex << handle;
    EXPECT_EQ(kvStop(handle, kvsimScopeNormal), kvsimErrInvalidSession);
    EXPECT_EQ(kvFlush(handle), kvsimErrInvalidSession);
    EXPECT_EQ(kvConnectTerminals(handle, "PXI_Trig0", "StartTrigger"), kvsimErrInvalidSession);
    EXPECT_EQ(kvDisconnectTerminals(handle, "PXI_Trig0", "StartTrigger"), kvsimErrInvalidSession);
    EXPECT_EQ(kvhdnCreateSvTiming_FlexRayMacrotick(handle, &token), kvsimErrInvalidSession);
    EXPECT_EQ(token, 7u);
    EXPECT_EQ(kvsimSessionStarted(handle), -1);
  }
  EXPECT_EQ(kvsimInterfaceStarted("FlexRay1"), 0);
}

TEST_F(KvorSessionControl, TheInterfaceControlsKnowEveryInterfaceAndNothingElse) {
  for (const char *name :
       {"CAN1", "CAN2", "CAN3", "CAN4", "LIN1", "LIN2", "FlexRay1", "FlexRay2", "ENET1"}) {
    const uint32_t session = Create(name, kvMode_FrameInStream);
    ASSERT_EQ(kvStart(session, kvsimScopeInterfaceOnly), 0);
    EXPECT_EQ(kvsimInterfaceStarted(name), 1) << name;
    ASSERT_EQ(kvStop(session, kvsimScopeInterfaceOnly), 0);
    EXPECT_EQ(kvsimInterfaceStarted(name), 0) << name;
    EXPECT_EQ(kvsimBlinkMode(name), kvsimBlinkOff) << name;
  }
  for (const char *name : {"CAN5", "", "CAN1 ", "FlexRay"}) {
    EXPECT_EQ(kvsimInterfaceStarted(name), -1) << name;
    EXPECT_EQ(kvsimBlinkMode(name), -1) << name;
  }
  EXPECT_EQ(kvsimInterfaceStarted(nullptr), -1);
  EXPECT_EQ(kvsimBlinkMode(nullptr), -1);
}

TEST_F(KvorSessionControl, AFlushDropsTheValuesThatArrivedBeforeIt) {
  const uint32_t writer = Create("CAN1", kvMode_SignalOutSinglePoint, "Speed,Load");
  const uint32_t flushed = Create("CAN2", kvMode_SignalInSinglePoint, "Speed,Load");
  const uint32_t other = Create("CAN1", kvMode_SignalInSinglePoint, "Load");
  kvsimSetClock(1000);
  const double before[] = {11.0, 22.0};
  ASSERT_EQ(kvWriteSignalSinglePoint(writer, before, sizeof before), 0);

  ASSERT_EQ(kvFlush(flushed), 0);
  double values[2] = {-1.0, -1.0};
  uint64_t stamps[2] = {9, 9};
  ASSERT_EQ(kvReadSignalSinglePoint(flushed, values, sizeof values, stamps, sizeof stamps), 0);
  EXPECT_EQ(values[0], 0.0);
  EXPECT_EQ(values[1], 0.0);
  EXPECT_EQ(stamps[0], 0u);
  EXPECT_EQ(stamps[1], 0u);
  double load = 0.0;
  ASSERT_EQ(kvReadSignalSinglePoint(other, &load, sizeof load, nullptr, 0), 0);
  EXPECT_EQ(load, 22.0) << "another session keeps what it received";
  double onNetwork[2] = {};
  ASSERT_EQ(kvsimGetSignalValues(flushed, onNetwork, 2), 2);
  EXPECT_EQ(onNetwork[1], 22.0) << "the network keeps its values";

  kvsimSetClock(2000);
  const double speed = 33.0;
  ASSERT_EQ(kvsimSetSignalValues(writer, &speed, 1), 1);
  ASSERT_EQ(kvReadSignalSinglePoint(flushed, values, sizeof values, stamps, sizeof stamps), 0);
  EXPECT_EQ(values[0], 33.0) << "a value that arrives after the flush is read";
  EXPECT_EQ(stamps[0], 2000u);
  EXPECT_EQ(values[1], 0.0) << "Load has not arrived again";

  ASSERT_EQ(kvFlush(writer), 0) << "an output session holds nothing, and may be flushed";
  ASSERT_EQ(kvReadSignalSinglePoint(flushed, values, sizeof values, nullptr, 0), 0);
  EXPECT_EQ(values[0], 33.0) << "flushing one session leaves the others alone";
}

TEST_F(KvorSessionControl, OnlyFlexRaySessionsGiveAMacrotickTimingSource) {
  for (const char *name : {"FlexRay1", "FlexRay2"}) {
    const uint32_t session = Create(name, kvMode_FrameInStream);
    uint64_t token = 0;
    ASSERT_EQ(kvhdnCreateSvTiming_FlexRayMacrotick(session, &token), 0) << name;
    EXPECT_EQ(token, KVSIM_MACROTICK_SOURCE(session));
    EXPECT_NE(token, 0u);
    EXPECT_EQ(kvhdnCreateSvTiming_FlexRayMacrotick(session, nullptr), kvsimErrNullPointer);
  }
  for (const char *name : {"CAN1", "LIN2", "ENET1", "ENET1/monitor"}) {
    const uint32_t session = Create(name, kvMode_FrameInStream);
    uint64_t token = 5;
    EXPECT_EQ(kvhdnCreateSvTiming_FlexRayMacrotick(session, &token), kvsimErrWrongProtocol) << name;
    EXPECT_EQ(token, 5u);
  }
}

TEST_F(KvorSessionControl, ResetStopsEveryInterfaceAndTurnsEveryLightOff) {
  const uint32_t session = Create("CAN4", kvMode_FrameInStream);
  ASSERT_EQ(kvStart(session, kvsimScopeNormal), 0);
  uint32_t system = 0;
  ASSERT_EQ(kvSystemOpen(&system), 0);
  const std::vector<uint32_t> interfaces = ReadHandles(system, kvPropSys_IntfRefsAll);
  ASSERT_FALSE(interfaces.empty());
  ASSERT_EQ(kvBlink(interfaces.front(), kvsimBlinkOn), 0);
  ASSERT_EQ(kvsimBlinkMode("CAN1"), kvsimBlinkOn);
  kvsimReset();
  EXPECT_EQ(kvsimInterfaceStarted("CAN4"), 0);
  EXPECT_EQ(kvsimBlinkMode("CAN1"), kvsimBlinkOff);
  const uint32_t next = Create("CAN4", kvMode_FrameInStream);
  EXPECT_EQ(kvsimSessionStarted(next), 0);
}

}  // namespace
