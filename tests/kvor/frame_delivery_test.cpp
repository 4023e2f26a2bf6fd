// Frames travel from output sessions to the input sessions of the same network only, with the
// clock's time, and as echoes on the writer's own interface when asked for; single-point sessions
// keep the latest frame of each item; frame sessions have their defaults before any is set.
#include <string>

#include "frame_test_support.h"

namespace {

using KvorFrameDelivery = KvorTest;

constexpr uint64_t kNoon = 133600000000000000ull;  // a raw time in 2024

TEST_F(KvorFrameDelivery, EveryJoinedPairCarriesFramesToTheOtherEndOnly) {
  struct Case {
    const char *from;
    const char *to;
    const char *bystander;  // another network
    Rec sent;
  };
  const Case cases[] = {
      {"CAN1", "CAN2", "CAN3", {0x20000123, {0xDE, 0xAD, 0xBE}, 0x05, 0x00, 0x00}},
      {"CAN2", "CAN1", "LIN1", {0x7FF, Pattern(8, 1), 0x00, 0x00, 0x00}},
      {"CAN4", "CAN3", "CAN1", {0x18FEF100, {}, 0x11, 0x00, 0x00}},
      {"LIN1", "LIN2", "CAN2", {0x3C, {1, 2}, 0x02, 0x01, 0x9A}},
      {"FlexRay2", "FlexRay1", "ENET1", {0x7F, Pattern(254, 9), 0x03, 0x37, 0x42}},
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(std::string(c.from) + " -> " + c.to);
    kvsimReset();
    const uint32_t writer = Create(c.from, kvMode_FrameOutStream);
    const uint32_t reader = Create(c.to, kvMode_FrameInStream);
    const uint32_t own = Create(c.from, kvMode_FrameInQueued);
    const uint32_t other = Create(c.bystander, kvMode_FrameInStream);
    kvsimSetClock(kNoon);
    Rec written = c.sent;
    written.timestamp = 77;                              // the driver stamps frames itself
    const std::vector<uint8_t> bytes = Pack({written});  // up to 8 bytes both forms agree
    ASSERT_EQ(kvWriteFrame(writer, bytes.data(), static_cast<uint32_t>(bytes.size()), 0.0), 0);
    Rec expected = c.sent;
    expected.timestamp = kNoon;
    EXPECT_EQ(Drain(reader), std::vector<Rec>{expected});
    EXPECT_TRUE(Drain(own).empty()) << "no echo unless asked for";
    if (std::string(c.bystander) != "ENET1") {
      EXPECT_TRUE(Drain(other).empty()) << "another network hears nothing";
    }
  }
}

TEST_F(KvorFrameDelivery, AnEchoReachesTheWritersOwnInterfaceMarked) {
  const uint32_t writer = Create("CAN1", kvMode_FrameOutQueued);
  const uint32_t own = Create("CAN1", kvMode_FrameInStream);
  const uint32_t far = Create("CAN2", kvMode_FrameInStream);
  SetEcho(writer);
  kvsimSetClock(kNoon + 5);
  const std::vector<uint8_t> bytes = Pack({{0x100, {7}, 0, 0x80}}, true);
  ASSERT_EQ(kvWriteFrame(writer, bytes.data(), 24, 0.0), 0);
  EXPECT_EQ(Drain(own), (std::vector<Rec>{{0x100, {7}, 0, 0x80, 0, kNoon + 5}}));
  EXPECT_EQ(Drain(far), (std::vector<Rec>{{0x100, {7}, 0, 0x00, 0, kNoon + 5}}))
      << "a written echo flag does not travel";
}

TEST_F(KvorFrameDelivery, ASinglePointSessionGivesTheLatestFrameOfEachItem) {
  const uint32_t writer = Create("CAN3", kvMode_FrameOutSinglePoint);
  const uint32_t reader =
      Create("CAN4", kvMode_FrameInSinglePoint, "0x123, 0x18FEF100x:4, 0x7FF:2");
  const std::vector<Rec> never = {{0x123, std::vector<uint8_t>(8)},
                                  {0x38FEF100, std::vector<uint8_t>(4)},
                                  {0x7FF, std::vector<uint8_t>(2)}};
  EXPECT_EQ(Drain(reader), never) << "time 0, zeros of the item's length";

  const auto send = [&](Rec r) {
    const std::vector<uint8_t> bytes = Pack({r}, true);
    ASSERT_EQ(kvWriteFrame(writer, bytes.data(), 24, 0.0), 0);
  };
  kvsimSetClock(kNoon);
  send({0x123, {1}});
  send({0x38FEF100, {2, 2}});
  kvsimAdvanceClock(100);
  send({0x123, {3, 3, 3}});
  send({0x18FEF100, {9}});  // standard-form twin of an extended item
  send({0x124, {9}});
  const std::vector<Rec> latest = {
      {0x123, {3, 3, 3}, 0, 0, 0, kNoon + 100}, {0x38FEF100, {2, 2}, 0, 0, 0, kNoon}, never[2]};
  EXPECT_EQ(Drain(reader), latest);
  EXPECT_EQ(Drain(reader), latest) << "reading does not use them up";

  uint8_t two[48];
  uint32_t got = 0;
  ASSERT_EQ(kvhdnReadFrame(reader, two, sizeof two, 1, 0.0, &got), 0);
  EXPECT_EQ(got, 24u) << "at most numFrames records";
  ASSERT_EQ(kvFlush(reader), 0);
  EXPECT_EQ(Drain(reader), never);
}

TEST_F(KvorFrameDelivery, FrameSessionsHaveTheirPropertiesBeforeAnyIsSet) {
  struct Case {
    const char *interfaceName;
    uint32_t canIoMode;
    uint32_t application;
    uint32_t payloadMax;
  };
  const Case cases[] = {{"CAN1", 0, 0, 8}, {"CAN1", 1, 0, 64},      {"CAN2", 1, 1, 1785},
                        {"LIN2", 0, 0, 8}, {"FlexRay1", 0, 0, 254}, {"ENET1", 0, 0, 1500}};
  for (const Case &c : cases) {
    SCOPED_TRACE(c.interfaceName);
    const uint32_t session = Create(c.interfaceName, kvMode_FrameInQueued, "0x10:5,0x11");
    if (c.canIoMode != 0) SetU32(session, kvPropSession_IntfCanIoMode, c.canIoMode);
    if (c.application != 0) SetU32(session, kvPropSession_ApplicationProtocol, c.application);
    EXPECT_EQ(ReadU32(session, kvPropSession_PayldLenMax), c.payloadMax);
    const uint32_t record = c.payloadMax <= 8 ? 24 : 16 + (c.payloadMax + 7) / 8 * 8;
    EXPECT_EQ(ReadU32(session, kvPropSession_QueueSize), 4096 * record);
    uint32_t length = 0;
    ASSERT_EQ(kvGetSubProperty(session, 0, kvPropHidden_FramePayloadLen, 4, &length), 0);
    EXPECT_EQ(length, 5u);
    ASSERT_EQ(kvGetSubProperty(session, 1, kvPropHidden_FramePayloadLen, 4, &length), 0);
    EXPECT_EQ(length, c.payloadMax) << "an item without a length has the maximum";
    EXPECT_EQ(kvGetSubProperty(session, 2, kvPropHidden_FramePayloadLen, 4, &length),
              kvsimErrInvalidSubIndex);
    EXPECT_EQ(ReadU32(session, kvPropSession_NumPend), 0u);
    uint8_t echo = 9;
    ASSERT_EQ(kvGetProperty(session, kvPropSession_IntfEchoTx, 1, &echo), 0);
    EXPECT_EQ(echo, 0);
  }
  const uint32_t session = Create("CAN1", kvMode_FrameInStream);
  SetU32(session, kvPropSession_PayldLenMax, 20);
  EXPECT_EQ(ReadU32(session, kvPropSession_PayldLenMax), 20u) << "a set value wins";
  EXPECT_EQ(ReadU32(session, kvPropSession_QueueSize), 4096u * 40);
  const uint32_t pending = 3;
  EXPECT_EQ(kvSetProperty(session, kvPropSession_NumPend, 4, &pending), kvsimErrPropertyReadOnly);
  const uint32_t signals = Create("CAN1", kvMode_SignalInSinglePoint, "Speed");
  uint32_t size = 0;
  EXPECT_EQ(kvGetPropertySize(signals, kvPropSession_PayldLenMax, &size), kvsimErrPropertyUnknown)
      << "only frame sessions have frame defaults";
}

}  // namespace
