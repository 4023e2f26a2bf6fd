// kvBlink: the identification light of an interface, set through an interface handle of an open
// system.
#include <string>
#include <vector>

#include "kvor_test_support.h"

namespace {

using KvorBlink = KvorTest;

TEST_F(KvorBlink, EachInterfaceHandleSetsTheLightOfItsOwnInterface) {
  uint32_t system = 0;
  ASSERT_EQ(kvSystemOpen(&system), 0);
  const std::vector<uint32_t> interfaces = ReadHandles(system, kvPropSys_IntfRefsAll);
  ASSERT_EQ(interfaces.size(), 9u);
  for (uint32_t lit : interfaces) {
    const std::string litName = ReadText(lit, kvPropIntf_Name);
    ASSERT_EQ(kvBlink(lit, kvsimBlinkOn), 0) << litName;
    for (uint32_t other : interfaces) {
      const std::string name = ReadText(other, kvPropIntf_Name);
      EXPECT_EQ(kvsimBlinkMode(name.c_str()), other == lit ? kvsimBlinkOn : kvsimBlinkOff)
          << name << " while " << litName << " blinks";
    }
    ASSERT_EQ(kvBlink(lit, kvsimBlinkOff), 0);
    EXPECT_EQ(kvsimBlinkMode(litName.c_str()), kvsimBlinkOff);
  }
}

TEST_F(KvorBlink, OnlyInterfacesOfAnOpenSystemBlink) {
  uint32_t closed = 0;
  ASSERT_EQ(kvSystemOpen(&closed), 0);
  const uint32_t closedInterface = ReadHandles(closed, kvPropSys_IntfRefsAll).front();
  ASSERT_EQ(kvSystemClose(closed), 0);
  uint32_t system = 0;
  ASSERT_EQ(kvSystemOpen(&system), 0);
  const uint32_t device = ReadHandles(system, kvPropSys_DevRefs).front();
  const uint32_t session = Create("CAN1", kvMode_FrameInStream);
  for (uint32_t handle : {0u, system, device, closedInterface, session, 0x01FF0101u}) {
    EXPECT_EQ(kvBlink(handle, kvsimBlinkOn), kvsimErrInvalidObject) << std::hex << handle;
  }
  EXPECT_EQ(kvsimBlinkMode("CAN1"), kvsimBlinkOff);
}

TEST_F(KvorBlink, AnUnknownModeIsRefusedAndTheLightStaysAsItWas) {
  uint32_t system = 0;
  ASSERT_EQ(kvSystemOpen(&system), 0);
  const uint32_t can1 = ReadHandles(system, kvPropSys_IntfRefsAll).front();
  ASSERT_EQ(kvBlink(can1, kvsimBlinkOn), 0);
  for (uint32_t mode : {2u, 0xFFFFFFFFu}) {
    EXPECT_EQ(kvBlink(can1, mode), kvsimErrInvalidArgument) << mode;
    EXPECT_EQ(kvsimBlinkMode("CAN1"), kvsimBlinkOn);
  }
}

TEST_F(KvorBlink, TheLightOutlivesTheSystemHandle) {
  uint32_t system = 0;
  ASSERT_EQ(kvSystemOpen(&system), 0);
  const std::vector<uint32_t> interfaces = ReadHandles(system, kvPropSys_IntfRefsFlexRay);
  ASSERT_EQ(interfaces.size(), 2u);
  ASSERT_EQ(kvBlink(interfaces[1], kvsimBlinkOn), 0);
  ASSERT_EQ(kvSystemClose(system), 0);
  EXPECT_EQ(kvsimBlinkMode("FlexRay2"), kvsimBlinkOn);
  EXPECT_EQ(kvBlink(interfaces[1], kvsimBlinkOff), kvsimErrInvalidObject);
}

}  // namespace
