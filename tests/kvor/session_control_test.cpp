// Session control in the driver: started and stopped sessions and interfaces by scope, flushing
// the signal values a session holds, terminal routes, and the FlexRay macrotick timing source.
#include <string>
#include <vector>

#include "kvor_test_support.h"

namespace {

using KvorSessionControl = KvorTest;

TEST_F(KvorSessionControl, ScopesStartAndStopSessionsAndTheirInterface) {
  // Two sessions on CAN1 and a bystander on CAN2, which no step may touch.
  const uint32_t a = Create("CAN1", kvMode_FrameInStream);
  const uint32_t b = Create("can1", kvMode_FrameOutQueued);
  const uint32_t bystander = Create("CAN2", kvMode_FrameInStream);
  constexpr int32_t kBad = kvsimErrInvalidScope;
  const struct Step {
    const char *what;
    int32_t (*call)(uint32_t, uint32_t);
    uint32_t session;
    uint32_t scope;
    int32_t status;
    int32_t aStarted, bStarted, can1Started;
  } steps[] = {
      {"unknown scope", kvStart, a, 3, kBad, 0, 0, 0},
      {"normal start of a", kvStart, a, kvsimScopeNormal, 0, 1, 0, 1},
      {"session-only start of b", kvStart, b, kvsimScopeSessionOnly, 0, 1, 1, 1},
      {"unknown scope", kvStop, b, 0x80000000u, kBad, 1, 1, 1},
      {"normal stop of a, b still runs", kvStop, a, kvsimScopeNormal, 0, 0, 1, 1},
      {"normal stop of b, the last", kvStop, b, kvsimScopeNormal, 0, 0, 0, 0},
      {"interface-only start", kvStart, a, kvsimScopeInterfaceOnly, 0, 0, 0, 1},
      {"session-only start of a", kvStart, a, kvsimScopeSessionOnly, 0, 1, 0, 1},
      {"starting again changes nothing", kvStart, a, kvsimScopeNormal, 0, 1, 0, 1},
      {"interface-only stop keeps a started", kvStop, a, kvsimScopeInterfaceOnly, 0, 1, 0, 0},
      {"unknown scope", kvStart, a, 0xFFFFFFFFu, kBad, 1, 0, 0},
      {"session-only stop", kvStop, a, kvsimScopeSessionOnly, 0, 0, 0, 0},
      {"normal start of b", kvStart, b, kvsimScopeNormal, 0, 0, 1, 1},
      {"session-only stop leaves the interface", kvStop, b, kvsimScopeSessionOnly, 0, 0, 0, 1},
      {"normal stop of a stopped session stops the interface", kvStop, a, kvsimScopeNormal, 0, 0, 0,
       0},
      {"stopping again changes nothing", kvStop, a, kvsimScopeNormal, 0, 0, 0, 0},
  };
  for (const Step &step : steps) {
    SCOPED_TRACE(step.what);
    ASSERT_EQ(step.call(step.session, step.scope), step.status);
    EXPECT_EQ(kvsimSessionStarted(a), step.aStarted);
    EXPECT_EQ(kvsimSessionStarted(b), step.bStarted);
    EXPECT_EQ(kvsimInterfaceStarted("CAN1"), step.can1Started);
    EXPECT_EQ(kvsimSessionStarted(bystander), 0);
    EXPECT_EQ(kvsimInterfaceStarted("CAN2"), 0);
  }
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

TEST_F(KvorSessionControl, TheInterfaceControlsKnowEveryInterfaceAndNothingElse) {
  for (const char *name : kInterfaceNames) {
    const uint32_t session = Create(name, kvMode_FrameInStream);
    ASSERT_EQ(kvStart(session, kvsimScopeInterfaceOnly), 0);
    EXPECT_EQ(kvsimInterfaceStarted(name), 1) << name;
    EXPECT_EQ(kvsimBlinkMode(name), kvsimBlinkOff) << name;
  }
  for (const char *name :
       {"CAN5", "", "CAN1 ", "FlexRay", "ENET1/monitor", static_cast<const char *>(nullptr)}) {
    EXPECT_EQ(kvsimInterfaceStarted(name), -1) << (name ? name : "(null)");
    EXPECT_EQ(kvsimBlinkMode(name), -1) << (name ? name : "(null)");
  }
  ASSERT_EQ(kvStop(Create("ENET1/monitor", kvMode_FrameInStream), kvsimScopeInterfaceOnly), 0);
  EXPECT_EQ(kvsimInterfaceStarted("enet1"), 0) << "a suffix names the interface itself";
}

// Values and timestamps, side by side, of a read of two signals.
std::vector<double> ReadPair(uint32_t session) {
  double values[2] = {-1.0, -1.0};
  uint64_t stamps[2] = {9, 9};
  EXPECT_EQ(kvReadSignalSinglePoint(session, values, sizeof values, stamps, sizeof stamps), 0);
  return {values[0], static_cast<double>(stamps[0]), values[1], static_cast<double>(stamps[1])};
}

TEST_F(KvorSessionControl, AFlushDropsTheValuesThatArrivedBeforeIt) {
  const uint32_t writer = Create("CAN1", kvMode_SignalOutSinglePoint, "Speed,Load");
  const uint32_t flushed = Create("CAN2", kvMode_SignalInSinglePoint, "Speed,Load");
  const uint32_t other = Create("CAN1", kvMode_SignalInSinglePoint, "Load,Speed");
  kvsimSetClock(1000);
  const double before[] = {11.0, 22.0};
  ASSERT_EQ(kvWriteSignalSinglePoint(writer, before, sizeof before), 0);
  ASSERT_EQ(kvFlush(flushed), 0);
  EXPECT_EQ(ReadPair(flushed), (std::vector<double>{0, 0, 0, 0}));
  EXPECT_EQ(ReadPair(other), (std::vector<double>{22, 1000, 11, 1000}))
      << "another session keeps what it received";
  double onNetwork[2] = {};
  ASSERT_EQ(kvsimGetSignalValues(flushed, onNetwork, 2), 2);
  EXPECT_EQ(onNetwork[1], 22.0) << "the network keeps its values";

  kvsimSetClock(2000);
  const double speed = 33.0;
  ASSERT_EQ(kvsimSetSignalValues(writer, &speed, 1), 1);
  EXPECT_EQ(ReadPair(flushed), (std::vector<double>{33, 2000, 0, 0}))
      << "a value that arrives after the flush is read; Load has not arrived again";
  ASSERT_EQ(kvFlush(writer), 0) << "an output session holds nothing, and may be flushed";
  EXPECT_EQ(ReadPair(flushed)[0], 33.0) << "flushing one session leaves the others alone";
}

// The FlexRay success is the library's forwarding test's; here the refusals.
TEST_F(KvorSessionControl, OnlyFlexRaySessionsGiveAMacrotickTimingSource) {
  for (const char *name : {"CAN1", "LIN2", "ENET1", "ENET1/monitor"}) {
    uint64_t token = 5;
    EXPECT_EQ(kvhdnCreateSvTiming_FlexRayMacrotick(Create(name, kvMode_FrameInStream), &token),
              kvsimErrWrongProtocol)
        << name;
    EXPECT_EQ(token, 5u) << name;
  }
  const uint32_t flexRay = Create("FlexRay2", kvMode_FrameInStream);
  EXPECT_EQ(kvhdnCreateSvTiming_FlexRayMacrotick(flexRay, nullptr), kvsimErrNullPointer);
}

using KvorTerminals = KvorTest;

constexpr const char *kTerminals[] = {
    "StartTrigger", "Interface/StartTrigger",
    "FrontPanel0",  "FrontPanel1",
    "PXI_Trig0",    "PXI_Trig1",
    "PXI_Trig2",    "PXI_Trig3",
    "PXI_Trig4",    "PXI_Trig5",
    "PXI_Trig6",    "PXI_Trig7",
};

TEST_F(KvorTerminals, EveryTerminalRoutesToEveryOtherAndNoOtherNameIsATerminal) {
  const uint32_t session = Create("CAN1", kvMode_FrameInStream);
  const struct {
    const char *source;
    const char *destination;
    int32_t status;
  } refused[] = {
      {"PXI_Trig8", "StartTrigger", kvsimErrInvalidTerminal},
      {"FrontPanel2", "StartTrigger", kvsimErrInvalidTerminal},
      {"starttrigger", "PXI_Trig0", kvsimErrInvalidTerminal},
      {"PXI_Trig0", "StartTrigger ", kvsimErrInvalidTerminal},
      {"", "StartTrigger", kvsimErrInvalidTerminal},
      {"PXI_Trig0", "", kvsimErrInvalidTerminal},
      {"Interface/", "StartTrigger", kvsimErrInvalidTerminal},
      {"PXI_Trig3", "PXI_Trig3", kvsimErrInvalidTerminal},
      {nullptr, "StartTrigger", kvsimErrNullPointer},
      {"PXI_Trig0", nullptr, kvsimErrNullPointer},
  };
  for (const auto &c : refused) {
    SCOPED_TRACE(std::string(c.source ? c.source : "(null)") + " -> " +
                 (c.destination ? c.destination : "(null)"));
    EXPECT_EQ(kvConnectTerminals(session, c.source, c.destination), c.status);
    EXPECT_EQ(kvDisconnectTerminals(session, c.source, c.destination), c.status);
  }
  EXPECT_EQ(kvsimTerminalConnectionCount(session), 0);
  int32_t routes = 0;
  for (const char *source : kTerminals) {
    for (const char *destination : kTerminals) {
      if (std::string(source) == destination) continue;
      ASSERT_EQ(kvConnectTerminals(session, source, destination), 0)
          << source << " -> " << destination;
      ++routes;
    }
  }
  EXPECT_EQ(kvsimTerminalConnectionCount(session), routes);
}

TEST_F(KvorTerminals, ARouteHasADirectionAndIsConnectedOnceForItsSessionOnly) {
  const uint32_t owner = Create("FlexRay1", kvMode_FrameInStream);
  const uint32_t other = Create("FlexRay1", kvMode_FrameInStream);
  ASSERT_EQ(kvConnectTerminals(owner, "FrontPanel0", "StartTrigger"), 0);
  ASSERT_EQ(kvConnectTerminals(owner, "FrontPanel0", "StartTrigger"), 0);
  ASSERT_EQ(kvConnectTerminals(owner, "PXI_Trig1", "StartTrigger"), 0);
  EXPECT_EQ(kvsimTerminalConnectionCount(owner), 2) << "connecting again changes nothing";
  EXPECT_EQ(kvDisconnectTerminals(owner, "StartTrigger", "FrontPanel0"), kvsimErrNotConnected);
  EXPECT_EQ(kvDisconnectTerminals(other, "FrontPanel0", "StartTrigger"), kvsimErrNotConnected);
  EXPECT_EQ(kvsimTerminalsConnected(other, "FrontPanel0", "StartTrigger"), 0);
  ASSERT_EQ(kvDisconnectTerminals(owner, "FrontPanel0", "StartTrigger"), 0);
  EXPECT_EQ(kvsimTerminalsConnected(owner, "PXI_Trig1", "StartTrigger"), 1);
  EXPECT_EQ(kvDisconnectTerminals(owner, "FrontPanel0", "StartTrigger"), kvsimErrNotConnected)
      << "a disconnected route is gone";

  ASSERT_EQ(kvClear(owner), 0);
  EXPECT_EQ(kvsimTerminalConnectionCount(owner), -1);
  const uint32_t next = Create("FlexRay1", kvMode_FrameInStream);
  EXPECT_EQ(kvsimTerminalConnectionCount(next), 0) << "a clear drops the session's routes";
  EXPECT_EQ(kvsimTerminalsConnected(next, nullptr, "StartTrigger"), -1);
}

}  // namespace
