// The system, its devices and interfaces: their properties, and handles that the library's
// classification by bits (top byte 0x01; low 4 bits interface, bits 4-15 device, else system)
// puts in the right class.
#include <algorithm>
#include <set>
#include <string>
#include <vector>

#include "kvor_test_support.h"

namespace {

using KvorSystemTree = KvorTest;

enum HandleClass : uint32_t {
  kSessionClass = 0x100000,
  kSystemClass = 0x110000,
  kDeviceClass = 0x120000,
  kInterfaceClass = 0x130000,
  kNoClass = 0xFF0000
};

// The classification by which the library tells the kind of a handle.
uint32_t ClassOf(uint32_t handle) {
  if (handle == 0) return kNoClass;
  if (handle & 0x80000000u) return (handle >> 8) & 0xF0000u;
  if ((handle >> 24) == 0x01) {
    if (handle & 0xFu) return kInterfaceClass;
    if (handle & 0xFFF0u) return kDeviceClass;
    return kSystemClass;
  }
  if ((handle >> 24) == 0x0F) return kNoClass;
  return kSessionClass;
}

uint32_t OpenSystem() {
  uint32_t system = 0;
  EXPECT_EQ(kvSystemOpen(&system), 0);
  return system;
}

TEST_F(KvorSystemTree, TheSystemTellsTheDriverVersion) {
  const uint32_t system = OpenSystem();
  EXPECT_EQ(ClassOf(system), kSystemClass) << std::hex << system;
  const struct {
    uint32_t id;
    uint32_t value;
  } versions[] = {
      {kvPropSys_VerMajor, KVSIM_VERSION_MAJOR},   {kvPropSys_VerMinor, KVSIM_VERSION_MINOR},
      {kvPropSys_VerUpdate, KVSIM_VERSION_UPDATE}, {kvPropSys_VerPhase, KVSIM_VERSION_PHASE},
      {kvPropSys_VerBuild, KVSIM_VERSION_BUILD},
  };
  for (const auto &v : versions) {
    uint32_t size = 0;
    ASSERT_EQ(kvGetPropertySize(system, v.id, &size), 0) << std::hex << v.id;
    EXPECT_EQ(size, 4u);
    EXPECT_EQ(ReadU32(system, v.id), v.value) << std::hex << v.id;
  }
}

TEST_F(KvorSystemTree, TwoDevicesWithDistinctSerialNumbers) {
  const uint32_t system = OpenSystem();
  const std::vector<uint32_t> devices = ReadHandles(system, kvPropSys_DevRefs);
  ASSERT_EQ(devices.size(), 2u);
  const struct {
    const char *name;
    uint32_t serial;
    uint32_t ports;
  } expected[] = {{"BusBox 6 CAN/LIN", 1001234, 6}, {"BusBox 3 FlexRay/Ethernet", 1001235, 3}};
  for (size_t i = 0; i < devices.size(); ++i) {
    EXPECT_EQ(ClassOf(devices[i]), kDeviceClass) << std::hex << devices[i];
    EXPECT_EQ(ReadText(devices[i], kvPropDev_Name), expected[i].name);
    EXPECT_EQ(ReadU32(devices[i], kvPropDev_SerNum), expected[i].serial);
    EXPECT_EQ(ReadU32(devices[i], kvPropDev_NumPorts), expected[i].ports);
    EXPECT_EQ(ReadHandles(devices[i], kvPropDev_IntfRefs).size(), expected[i].ports);
  }
}

TEST_F(KvorSystemTree, InterfacesHaveTheirNamesProtocolsAndDevice) {
  const uint32_t system = OpenSystem();
  const std::vector<uint32_t> interfaces = ReadHandles(system, kvPropSys_IntfRefs);
  const std::vector<uint32_t> devices = ReadHandles(system, kvPropSys_DevRefs);
  ASSERT_EQ(devices.size(), 2u);
  const struct {
    const char *name;
    uint32_t protocol;
    uint32_t device;  // index in kvPropSys_DevRefs
  } expected[] = {
      {"CAN1", kvProtocol_CAN, 0},         {"CAN2", kvProtocol_CAN, 0},
      {"CAN3", kvProtocol_CAN, 0},         {"CAN4", kvProtocol_CAN, 0},
      {"LIN1", kvProtocol_LIN, 0},         {"LIN2", kvProtocol_LIN, 0},
      {"FlexRay1", kvProtocol_FlexRay, 1}, {"FlexRay2", kvProtocol_FlexRay, 1},
      {"ENET1", kvProtocol_Ethernet, 1},
  };
  ASSERT_EQ(interfaces.size(), std::size(expected));
  std::set<uint32_t> distinct(interfaces.begin(), interfaces.end());
  EXPECT_EQ(distinct.size(), interfaces.size());
  for (size_t i = 0; i < interfaces.size(); ++i) {
    const uint32_t intf = interfaces[i];
    EXPECT_EQ(ClassOf(intf), kInterfaceClass) << std::hex << intf;
    uint32_t size = 0;
    ASSERT_EQ(kvGetPropertySize(intf, kvPropIntf_Name, &size), 0);
    EXPECT_EQ(size, std::string(expected[i].name).size() + 1) << "the size counts the NUL";
    EXPECT_EQ(ReadText(intf, kvPropIntf_Name), expected[i].name);
    EXPECT_EQ(ReadU32(intf, kvPropIntf_Protocol), expected[i].protocol) << expected[i].name;
    const uint32_t device = devices[expected[i].device];
    EXPECT_EQ(ReadU32(intf, kvPropIntf_DevRef), device) << expected[i].name;
    const std::vector<uint32_t> siblings = ReadHandles(device, kvPropDev_IntfRefs);
    EXPECT_NE(std::find(siblings.begin(), siblings.end(), intf), siblings.end())
        << expected[i].name << " is listed by its device";
  }
  EXPECT_EQ(ReadHandles(system, kvPropSys_IntfRefsAll), interfaces);
}

TEST_F(KvorSystemTree, InterfaceListsByProtocol) {
  const uint32_t system = OpenSystem();
  const struct {
    uint32_t id;
    uint32_t protocol;
    size_t count;
  } lists[] = {
      {kvPropSys_IntfRefsCAN, kvProtocol_CAN, 4},
      {kvPropSys_IntfRefsLIN, kvProtocol_LIN, 2},
      {kvPropSys_IntfRefsFlexRay, kvProtocol_FlexRay, 2},
      {kvPropSys_IntfRefsEthernet, kvProtocol_Ethernet, 1},
  };
  for (const auto &list : lists) {
    const std::vector<uint32_t> interfaces = ReadHandles(system, list.id);
    EXPECT_EQ(interfaces.size(), list.count) << std::hex << list.id;
    for (uint32_t intf : interfaces) {
      EXPECT_EQ(ReadU32(intf, kvPropIntf_Protocol), list.protocol) << std::hex << list.id;
    }
  }
}

TEST_F(KvorSystemTree, AnArrayNeedsRoomForEveryHandle) {
  const uint32_t system = OpenSystem();
  uint32_t size = 0;
  ASSERT_EQ(kvGetPropertySize(system, kvPropSys_IntfRefs, &size), 0);
  EXPECT_EQ(size, 9u * 4u);
  std::vector<uint32_t> handles(9, 0xEEEEEEEE);
  EXPECT_EQ(kvGetProperty(system, kvPropSys_IntfRefs, size - 4, handles.data()),
            kvsimErrBufferTooSmall);
  EXPECT_EQ(handles, std::vector<uint32_t>(9, 0xEEEEEEEE));
}

TEST_F(KvorSystemTree, HardwarePropertiesCannotBeSetAndUnknownOnesAreRefused) {
  const uint32_t system = OpenSystem();
  const uint32_t device = ReadHandles(system, kvPropSys_DevRefs).at(0);
  const uint32_t intf = ReadHandles(system, kvPropSys_IntfRefs).at(0);
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
  EXPECT_EQ(ReadText(intf, kvPropIntf_Name), "CAN1");
}

TEST_F(KvorSystemTree, ClosingASystemEndsItsDevicesAndInterfacesOnly) {
  const uint32_t first = OpenSystem();
  const uint32_t second = OpenSystem();
  EXPECT_NE(first, second);
  EXPECT_EQ(kvsimOpenSystemCount(), 2);
  const uint32_t firstDevice = ReadHandles(first, kvPropSys_DevRefs).at(1);
  const uint32_t firstIntf = ReadHandles(first, kvPropSys_IntfRefs).at(8);
  const uint32_t secondIntf = ReadHandles(second, kvPropSys_IntfRefs).at(8);
  EXPECT_NE(firstIntf, secondIntf) << "each system lists its own handles";

  EXPECT_EQ(kvSystemClose(firstIntf), kvsimErrInvalidObject) << "only a system can be closed";
  EXPECT_EQ(kvSystemClose(firstDevice), kvsimErrInvalidObject);
  ASSERT_EQ(kvSystemClose(first), 0);
  EXPECT_EQ(kvsimOpenSystemCount(), 1);
  uint32_t size = 0;
  for (uint32_t gone : {first, firstDevice, firstIntf}) {
    EXPECT_EQ(kvGetPropertySize(gone, kvPropIntf_Name, &size), kvsimErrInvalidObject)
        << std::hex << gone;
  }
  EXPECT_EQ(kvSystemClose(first), kvsimErrInvalidObject) << "closed twice";
  EXPECT_EQ(ReadText(secondIntf, kvPropIntf_Name), "ENET1");
}

TEST_F(KvorSystemTree, HandlesOutsideTheTreeAreRefused) {
  const uint32_t system = OpenSystem();
  uint32_t size = 0;
  const uint32_t forged[] = {
      system | 0x00000300u,  // a third device
      system | 0x00000107u,  // port 7 of a six-port device
      system | 0x00000204u,  // port 4 of a three-port device
      system | 0x00000010u,  // bits the tree does not use
      system | 0x00000001u,  // an interface without a device
      0x01000000u,           // system number 0
      system + 0x00010000u,  // a system that was never opened
  };
  for (uint32_t handle : forged) {
    EXPECT_EQ(kvGetPropertySize(handle, kvPropIntf_Name, &size), kvsimErrInvalidObject)
        << std::hex << handle;
  }
  EXPECT_EQ(kvSystemOpen(nullptr), kvsimErrNullPointer);
}

TEST_F(KvorSystemTree, SessionHandlesAreOfTheSessionClass) {
  const uint32_t session = Create("FlexRay2", kvMode_FrameInStream);
  EXPECT_EQ(ClassOf(session), kSessionClass) << std::hex << session;
  uint32_t error = 0;
  ASSERT_EQ(kvhdnCreateErrorSession(kvsimErrInternal, &error), 0);
  EXPECT_EQ(ClassOf(error), kSessionClass) << std::hex << error;
}

TEST_F(KvorSystemTree, ResetClosesEverySystem) {
  const uint32_t system = OpenSystem();
  kvsimReset();
  EXPECT_EQ(kvsimOpenSystemCount(), 0);
  uint32_t size = 0;
  EXPECT_EQ(kvGetPropertySize(system, kvPropSys_VerMajor, &size), kvsimErrInvalidObject);
}

}  // namespace
