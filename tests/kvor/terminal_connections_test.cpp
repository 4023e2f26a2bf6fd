// Terminal routes of a session: which names are terminals, connecting and disconnecting routes,
// and routes that belong to one session only.
#include <string>

#include "kvor_test_support.h"

namespace {

using KvorTerminals = KvorTest;

constexpr const char *kTerminals[] = {
    "StartTrigger", "Interface/StartTrigger",
    "FrontPanel0",  "FrontPanel1",
    "PXI_Trig0",    "PXI_Trig1",
    "PXI_Trig2",    "PXI_Trig3",
    "PXI_Trig4",    "PXI_Trig5",
    "PXI_Trig6",    "PXI_Trig7",
};

TEST_F(KvorTerminals, EveryTerminalCanBeRoutedToEveryOther) {
  const uint32_t session = Create("CAN1", kvMode_FrameInStream);
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
  EXPECT_EQ(kvsimTerminalsConnected(session, "PXI_Trig7", "Interface/StartTrigger"), 1);
}

TEST_F(KvorTerminals, NamesThatAreNoTerminalsAreRefused) {
  const uint32_t session = Create("CAN1", kvMode_FrameInStream);
  const struct {
    const char *source;
    const char *destination;
    int32_t status;
  } cases[] = {
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
  for (const auto &c : cases) {
    SCOPED_TRACE(std::string(c.source ? c.source : "(null)") + " -> " +
                 (c.destination ? c.destination : "(null)"));
    EXPECT_EQ(kvConnectTerminals(session, c.source, c.destination), c.status);
    EXPECT_EQ(kvDisconnectTerminals(session, c.source, c.destination), c.status);
  }
  EXPECT_EQ(kvsimTerminalConnectionCount(session), 0);
}

TEST_F(KvorTerminals, ARouteIsConnectedOnceAndDisconnectedOnce) {
  const uint32_t session = Create("FlexRay1", kvMode_FrameInStream);
  ASSERT_EQ(kvConnectTerminals(session, "FrontPanel0", "StartTrigger"), 0);
  ASSERT_EQ(kvConnectTerminals(session, "FrontPanel0", "StartTrigger"), 0);
  EXPECT_EQ(kvsimTerminalConnectionCount(session), 1) << "connecting again changes nothing";
  EXPECT_EQ(kvsimTerminalsConnected(session, "StartTrigger", "FrontPanel0"), 0)
      << "a route has a direction";
  EXPECT_EQ(kvDisconnectTerminals(session, "StartTrigger", "FrontPanel0"), kvsimErrNotConnected);
  EXPECT_EQ(kvDisconnectTerminals(session, "PXI_Trig1", "StartTrigger"), kvsimErrNotConnected);

  ASSERT_EQ(kvConnectTerminals(session, "PXI_Trig1", "StartTrigger"), 0);
  ASSERT_EQ(kvDisconnectTerminals(session, "FrontPanel0", "StartTrigger"), 0);
  EXPECT_EQ(kvsimTerminalsConnected(session, "FrontPanel0", "StartTrigger"), 0);
  EXPECT_EQ(kvsimTerminalsConnected(session, "PXI_Trig1", "StartTrigger"), 1);
  EXPECT_EQ(kvsimTerminalConnectionCount(session), 1);
  EXPECT_EQ(kvDisconnectTerminals(session, "FrontPanel0", "StartTrigger"), kvsimErrNotConnected)
      << "a disconnected route is gone";
}

TEST_F(KvorTerminals, RoutesBelongToTheirSessionAndGoWithIt) {
  const uint32_t owner = Create("LIN1", kvMode_FrameInStream);
  const uint32_t other = Create("LIN1", kvMode_FrameInStream);
  ASSERT_EQ(kvConnectTerminals(owner, "PXI_Trig2", "Interface/StartTrigger"), 0);
  EXPECT_EQ(kvsimTerminalsConnected(other, "PXI_Trig2", "Interface/StartTrigger"), 0);
  EXPECT_EQ(kvDisconnectTerminals(other, "PXI_Trig2", "Interface/StartTrigger"),
            kvsimErrNotConnected);
  EXPECT_EQ(kvsimTerminalsConnected(owner, "PXI_Trig2", "Interface/StartTrigger"), 1);

  ASSERT_EQ(kvClear(owner), 0);
  EXPECT_EQ(kvsimTerminalsConnected(owner, "PXI_Trig2", "Interface/StartTrigger"), -1);
  EXPECT_EQ(kvsimTerminalConnectionCount(owner), -1);
  const uint32_t next = Create("LIN1", kvMode_FrameInStream);
  EXPECT_EQ(kvsimTerminalConnectionCount(next), 0);
  EXPECT_EQ(kvsimTerminalsConnected(next, nullptr, "StartTrigger"), -1);
}

}  // namespace
