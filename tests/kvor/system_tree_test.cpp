// The system, its devices and interfaces: their properties, handles that the library's
// classification by bits (top byte 0x01; low 4 bits interface, bits 4-15 device, else system)
// puts in the right class, and the identification light of each interface (kvBlink).
#include <algorithm>
#include <iterator>
#include <set>
#include <string>
#include <vector>

#include "kvor_test_support.h"

namespace {

using KvorSystemTree = KvorTest;

enum HandleClass : uint32_t { kOther, kSystem, kDevice, kInterface };

// The classification by which the library tells the kind of a system object.
HandleClass ClassOf(uint32_t handle) {
  if ((handle >> 24) != 0x01) return kOther;
  if (handle & 0xFu) return kInterface;
  return (handle & 0xFFF0u) ? kDevice : kSystem;
}

TEST_F(KvorSystemTree, DevicesAndInterfacesTellWhatTheyAreAndWhereTheyBelong) {
  const uint32_t system = OpenSystem();
  EXPECT_EQ(ClassOf(system), kSystem) << std::hex << system;
  const std::vector<uint32_t> devices = ReadHandles(system, kvPropSys_DevRefs);
  ASSERT_EQ(devices.size(), 2u);
  const struct {
    const char *name;
    uint32_t serial, ports;
  } expectedDevices[] = {{"BusBox 6 CAN/LIN", 1001234, 6},
                         {"BusBox 3 FlexRay/Ethernet", 1001235, 3}};
  for (size_t i = 0; i < 2; ++i) {
    SCOPED_TRACE(expectedDevices[i].name);
    EXPECT_EQ(ClassOf(devices[i]), kDevice) << std::hex << devices[i];
    EXPECT_EQ(ReadText(devices[i], kvPropDev_Name), expectedDevices[i].name);
    EXPECT_EQ(ReadU32(devices[i], kvPropDev_SerNum), expectedDevices[i].serial);
    EXPECT_EQ(ReadU32(devices[i], kvPropDev_NumPorts), expectedDevices[i].ports);
    EXPECT_EQ(ReadHandles(devices[i], kvPropDev_IntfRefs).size(), expectedDevices[i].ports);
  }

  const std::vector<uint32_t> interfaces = ReadHandles(system, kvPropSys_IntfRefs);
  const uint32_t protocols[] = {kvProtocol_CAN,     kvProtocol_CAN,     kvProtocol_CAN,
                                kvProtocol_CAN,     kvProtocol_LIN,     kvProtocol_LIN,
                                kvProtocol_FlexRay, kvProtocol_FlexRay, kvProtocol_Ethernet};
  ASSERT_EQ(interfaces.size(), std::size(kInterfaceNames));
  EXPECT_EQ(std::set<uint32_t>(interfaces.begin(), interfaces.end()).size(), interfaces.size());
  for (size_t i = 0; i < interfaces.size(); ++i) {
    SCOPED_TRACE(kInterfaceNames[i]);
    const uint32_t intf = interfaces[i];
    EXPECT_EQ(ClassOf(intf), kInterface) << std::hex << intf;
    EXPECT_EQ(ReadText(intf, kvPropIntf_Name), kInterfaceNames[i]);
    EXPECT_EQ(ReadU32(intf, kvPropIntf_Protocol), protocols[i]);
    const uint32_t device = devices[i < 6 ? 0 : 1];
    EXPECT_EQ(ReadU32(intf, kvPropIntf_DevRef), device);
    const std::vector<uint32_t> siblings = ReadHandles(device, kvPropDev_IntfRefs);
    EXPECT_NE(std::find(siblings.begin(), siblings.end(), intf), siblings.end());
  }
  EXPECT_EQ(ReadHandles(system, kvPropSys_IntfRefsAll), interfaces);
  std::vector<uint32_t> room(9, 0xEEEEEEEE);
  EXPECT_EQ(kvGetProperty(system, kvPropSys_IntfRefs, 8 * 4, room.data()), kvsimErrBufferTooSmall);
  EXPECT_EQ(room, std::vector<uint32_t>(9, 0xEEEEEEEE)) << "an array needs room for every handle";

  const struct {
    uint32_t id, protocol;
    size_t count;
  } lists[] = {
      {kvPropSys_IntfRefsCAN, kvProtocol_CAN, 4},
      {kvPropSys_IntfRefsLIN, kvProtocol_LIN, 2},
      {kvPropSys_IntfRefsFlexRay, kvProtocol_FlexRay, 2},
      {kvPropSys_IntfRefsEthernet, kvProtocol_Ethernet, 1},
  };
  for (const auto &list : lists) {
    const std::vector<uint32_t> listed = ReadHandles(system, list.id);
    EXPECT_EQ(listed.size(), list.count) << std::hex << list.id;
    for (uint32_t intf : listed) {
      EXPECT_EQ(ReadU32(intf, kvPropIntf_Protocol), list.protocol) << std::hex << list.id;
    }
  }
}

TEST_F(KvorSystemTree, HardwarePropertiesAreReadOnlyAndOnlyHandlesOfTheOpenTreeAreKnown) {
  const uint32_t first = OpenSystem();
  const uint32_t system = OpenSystem();
  EXPECT_NE(first, system);
  EXPECT_EQ(kvsimOpenSystemCount(), 2);
  const uint32_t device = ReadHandles(system, kvPropSys_DevRefs).at(1);
  const uint32_t intf = ReadHandles(system, kvPropSys_IntfRefs).at(8);
  const uint32_t firstDevice = ReadHandles(first, kvPropSys_DevRefs).at(1);
  const uint32_t firstIntf = ReadHandles(first, kvPropSys_IntfRefs).at(8);
  EXPECT_NE(firstIntf, intf) << "each system lists its own handles";
  const uint32_t value = 9;
  EXPECT_EQ(kvSetProperty(system, kvPropSys_VerMajor, 4, &value), kvsimErrPropertyReadOnly);
  EXPECT_EQ(kvSetProperty(device, kvPropDev_SerNum, 4, &value), kvsimErrPropertyReadOnly);
  EXPECT_EQ(kvSetProperty(intf, kvPropIntf_Name, 2, "X"), kvsimErrPropertyReadOnly);
  EXPECT_EQ(kvSetProperty(system, kvPropSession_IntfBaudRate, 4, &value), kvsimErrPropertyUnknown);
  uint32_t size = 0;
  EXPECT_EQ(kvGetPropertySize(device, kvPropIntf_Name, &size), kvsimErrPropertyUnknown);
  EXPECT_EQ(kvGetPropertySize(intf, kvPropDev_SerNum, &size), kvsimErrPropertyUnknown);
  EXPECT_EQ(kvGetSubProperty(intf, 0, kvPropIntf_Name, 8, &size), kvsimErrPropertyUnknown);
  EXPECT_EQ(kvSetSubProperty(intf, 0, kvPropIntf_Name, 2, "X"), kvsimErrPropertyUnknown);

  EXPECT_EQ(kvSystemClose(firstIntf), kvsimErrInvalidObject) << "only a system can be closed";
  EXPECT_EQ(kvSystemClose(firstDevice), kvsimErrInvalidObject);
  ASSERT_EQ(kvSystemClose(first), 0);
  EXPECT_EQ(kvsimOpenSystemCount(), 1);
  EXPECT_EQ(kvSystemClose(first), kvsimErrInvalidObject) << "closed twice";
  const uint32_t unknown[] = {
      first,
      firstDevice,
      firstIntf,             // closed with their system
      system | 0x00000300u,  // a third device
      system | 0x00000107u,  // port 7 of a six-port device
      system | 0x00000204u,  // port 4 of a three-port device
      system | 0x00000010u,  // bits the tree does not use
      system | 0x00000001u,  // an interface without a device
      0x01000000u,           // system number 0
      system + 0x00010000u,  // a system that was never opened
  };
  for (uint32_t handle : unknown) {
    EXPECT_EQ(kvGetPropertySize(handle, kvPropIntf_Name, &size), kvsimErrInvalidObject)
        << std::hex << handle;
  }
  EXPECT_EQ(ReadText(intf, kvPropIntf_Name), "ENET1");
  EXPECT_EQ(kvSystemOpen(nullptr), kvsimErrNullPointer);
}

using KvorBlink = KvorTest;

TEST_F(KvorBlink, EachInterfaceOfAnOpenSystemSetsItsOwnLightWhichOutlivesTheSystem) {
  const uint32_t system = OpenSystem();
  const std::vector<uint32_t> interfaces = ReadHandles(system, kvPropSys_IntfRefsAll);
  ASSERT_EQ(interfaces.size(), 9u);
  for (uint32_t lit : interfaces) {
    const std::string litName = ReadText(lit, kvPropIntf_Name);
    SCOPED_TRACE(litName);
    ASSERT_EQ(kvBlink(lit, kvsimBlinkOn), 0);
    for (const char *name : kInterfaceNames) {
      EXPECT_EQ(kvsimBlinkMode(name), name == litName ? kvsimBlinkOn : kvsimBlinkOff) << name;
    }
    EXPECT_EQ(kvBlink(lit, 2), kvsimErrInvalidArgument);
    EXPECT_EQ(kvsimBlinkMode(litName.c_str()), kvsimBlinkOn) << "an unknown mode changes nothing";
    ASSERT_EQ(kvBlink(lit, kvsimBlinkOff), 0);
  }
  const uint32_t device = ReadHandles(system, kvPropSys_DevRefs).front();
  const uint32_t session = Create("CAN1", kvMode_FrameInStream);
  for (uint32_t handle : {0u, system, device, session, 0x01FF0101u}) {
    EXPECT_EQ(kvBlink(handle, kvsimBlinkOn), kvsimErrInvalidObject) << std::hex << handle;
  }
  EXPECT_EQ(kvsimBlinkMode("CAN1"), kvsimBlinkOff);

  const uint32_t closed = OpenSystem();
  const uint32_t closedInterface = ReadHandles(closed, kvPropSys_IntfRefsFlexRay).at(1);
  ASSERT_EQ(kvBlink(closedInterface, kvsimBlinkOn), 0);
  ASSERT_EQ(kvSystemClose(closed), 0);
  EXPECT_EQ(kvsimBlinkMode("FlexRay2"), kvsimBlinkOn);
  EXPECT_EQ(kvBlink(closedInterface, kvsimBlinkOff), kvsimErrInvalidObject);
  EXPECT_EQ(kvsimBlinkMode("FlexRay2"), kvsimBlinkOn);
}

}  // namespace
