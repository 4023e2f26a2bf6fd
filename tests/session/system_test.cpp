// System, device and interface references: the counted system, names, error handles for names not
// found, the host references that closes remove, and the system manager from inside.
#include <gtest/gtest.h>

#include <memory>
#include <tuple>

#include "session/system_manager.h"
#include "support/session_fixture.h"

namespace {

using namespace nKVSVAPI100;

using SystemObjects = SessionFixture;

TEST_F(SystemObjects, ChildrenShareOneCountedSystemThatAManualCloseEndsWhateverTheCount) {
  kvsvtest::cFakeErrorLog log;
  uint32_t system = 0, first = 0, second = 0, intf = 0, missing = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  ASSERT_EQ(OpenDevice(kBusBoxCanLin, &first), 0);
  ASSERT_EQ(OpenDevice(kBusBoxFlexRayEnet, &second), 0);
  EXPECT_EQ(kvsvGetSystemRefCount(), 3u);
  EXPECT_EQ(first & 0xFFFF0000u, system) << "children belong to the system handed out";
  const SvRefnum firstRef = HostRef(kBusBoxCanLin, first, true);
  const SvRefnum secondRef = HostRef(kBusBoxFlexRayEnet, second, true);
  EXPECT_EQ(kvsvDeviceClose(first), 0);
  EXPECT_FALSE(HostHasRef(firstRef));
  EXPECT_TRUE(HostHasRef(secondRef));
  EXPECT_EQ(kvsvSystemClose(system), 0);
  EXPECT_EQ(kvsimOpenSystemCount(), 1);
  EXPECT_EQ(kvsvDeviceClose(second), 0);
  EXPECT_EQ(kvsimOpenSystemCount(), 0) << "the last release closes the driver's system";
  EXPECT_TRUE(log.Records().empty());
  // Only the first open of a system asks the driver.
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  EXPECT_EQ(kvsimCountCalls("kvSystemOpen"), 2);
  ASSERT_EQ(OpenInterface("ENET1/monitor", &intf), 0);
  ASSERT_EQ(OpenInterface("CAN33", &missing), 0);
  HostRef("ENET1/monitor", intf, false);
  uint64_t reserved1 = ~0ull, reserved2 = ~0ull;
  EXPECT_EQ(kvsvSystemManualClose(&reserved1, &reserved2), 0);
  EXPECT_EQ(reserved1 + reserved2, 0u);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(svsimRefCount(), 0) << "every child's host reference is removed";
  EXPECT_EQ(kvsimOpenSystemCount() + kvsimOpenSessionCount(), 0) << "the error child's too";
  kvsimLogClear();
  EXPECT_EQ(kvsvSystemManualClose(nullptr, nullptr), 0);
  EXPECT_EQ(kvsimLogCount(), 0) << "closed already: nothing is asked of the driver";
  // The driver's failure is the result; the manager counts the system closed all the same.
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  ASSERT_EQ(kvsimFailCall("kvSystemClose", kvsimErrInternal, 1), 0);
  EXPECT_EQ(kvsvSystemManualClose(nullptr, nullptr), kvsimErrInternal);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
}

TEST_F(SystemObjects, WhatAnOpenByNameGives) {
  // A driver failure injected first (function, property, status, count; none: no function), the
  // open and its name, what it returns, and what the handle then gives: the interface's name or
  // the device's serial number, the failure that an error handle carries, or no handle at all.
  const std::string notFound = "error " + std::to_string(kNotFound);
  const std::string failed = "error " + std::to_string(kvsimErrInternal);
  const char *size = "kvGetPropertySize", *get = "kvGetProperty";
  const std::tuple<const char *, uint32_t, int32_t, int32_t, bool, const char *, int32_t,
                   std::string>
      cases[] = {
          // Names match without regard to case; only an Ethernet interface has a monitor name.
          {nullptr, 0, 0, 0, false, "LiN2", 0, "LIN2"},
          {nullptr, 0, 0, 0, false, "enet1/MONITOR", 0, "ENET1"},
          {nullptr, 0, 0, 0, false, "CAN1/monitor", 0, notFound},
          {nullptr, 0, 0, 0, false, "ENET1/monitorx", 0, notFound},
          {nullptr, 0, 0, 0, true, "___KVORDEV#FFF0B8EC", 0, "1001235"},
          {nullptr, 0, 0, 0, true, "___kvorDev#00000000", 0, notFound},
          // A failed element does not stop the search: its name matches nothing.
          {size, kvPropIntf_Name, kvsimErrInternal, 1, false, "CAN2", 0, "CAN2"},
          {get, kvPropIntf_Name, kvsimErrInternal, 1, false, "CAN1", 0, notFound},
          {get, kvPropDev_SerNum, kvsimErrInternal, 1, true, kBusBoxFlexRayEnet, 0, "1001235"},
          // A warning of the name read comes back; a name not found is still an error handle.
          {get, kvPropIntf_Name, 0x3FF62001, -1, false, "FlexRay2", 0x3FF62001, "FlexRay2"},
          {get, kvPropIntf_Name, 0x3FF62001, -1, false, "FlexRay3", 0, notFound},
          // A failed last element, or list, is the failure; a direct match needs no protocol.
          {size, kvPropIntf_Name, kvsimErrInternal, -1, false, "CAN1", 0, failed},
          {get, kvPropDev_SerNum, kvsimErrInternal, -1, true, kBusBoxCanLin, 0, failed},
          {size, kvPropSys_IntfRefs, kvsimErrInternal, -1, false, "CAN1", 0, failed},
          {get, kvPropSys_DevRefs, kvsimErrInternal, -1, true, kBusBoxCanLin, 0, failed},
          {get, kvPropIntf_Protocol, kvsimErrInternal, -1, false, "ENET1/monitor", 0, failed},
          {get, kvPropIntf_Protocol, kvsimErrInternal, -1, false, "CAN3", 0, "CAN3"},
          // An empty name; an error session that cannot be made: the search's own status.
          {nullptr, 0, 0, 0, true, "", kvErrDeviceNameEmpty, "none"},
          {nullptr, 0, 0, 0, false, "", kNotFound, "none"},
          {"kvhdnCreateErrorSession", 0, kvsimErrOutOfMemory, 1, false, "CAN5", kNotFound, "none"},
      };
  for (const auto &[function, property, status, count, device, name, returned, gives] : cases) {
    SCOPED_TRACE(name);
    ASSERT_EQ(kvsvSystemManualClose(nullptr, nullptr), 0);
    kvsimReset();
    const int32_t injected = function == nullptr ? 0
                             : property != 0 ? kvsimFailProperty(function, property, status, count)
                                             : kvsimFailCall(function, status, count);
    ASSERT_EQ(injected, 0);
    uint32_t h = 0;
    EXPECT_EQ(device ? OpenDevice(name, &h) : OpenInterface(name, &h), returned);
    kvsimClearFailures();
    EXPECT_EQ(h == 0             ? "none"
              : IsErrorHandle(h) ? "error " + std::to_string(UseStatus(h))
              : device           ? std::to_string(SerialNumber(h))
                                 : InterfaceName(h),
              gives);
    // An error child keeps its acquire; a failed open gives its own back.
    EXPECT_EQ(kvsvGetSystemRefCount(), h == 0 ? 0u : 1u);
  }
}

TEST_F(SystemObjects, ASecondOpenOfANameRemovesTheFirstHostReference) {
  uint32_t first = 0, second = 0;
  ASSERT_EQ(OpenInterface("CAN2", &first), 0);
  const SvRefnum firstRef = HostRef("CAN2", first, false);
  ASSERT_EQ(OpenInterface("CAN2", &second), 0);
  EXPECT_EQ(second, first);
  EXPECT_FALSE(HostHasRef(firstRef)) << "the replaced child takes its reference along";
  EXPECT_EQ(kvsvInterfaceClose(second), 0);
  EXPECT_EQ(kvsimOpenSystemCount(), 1) << "each open holds its acquire";
}

TEST_F(SystemObjects, AnOpenWhileTheSystemFailsCarriesTheFailureAndTheNextOpenRetries) {
  ASSERT_EQ(kvsimFailCall("kvSystemOpen", kvsimErrInternal, 1), 0);
  uint32_t failed = 0, next = 0;
  EXPECT_EQ(OpenInterface("CAN1", &failed), 0);
  EXPECT_EQ(UseStatus(failed), kvsimErrInternal);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(OpenDevice(kBusBoxCanLin, &next), 0);
  EXPECT_EQ(SerialNumber(next), 1001234);
  EXPECT_EQ(kvsvGetSystemRefCount(), 1u);
  EXPECT_EQ(kvsimCountCalls("kvSystemOpen"), 2);
}

TEST_F(SystemObjects, NoNameOrNoOutputMakesNothing) {
  void *noBlock = nullptr;
  SvHandle blockless = &noBlock, nullHandle = nullptr;
  SvHandle *negative = Name("CAN1");
  static_cast<SvStr *>(**negative)->cnt = -4;  // a negative count holds no text either
  uint32_t handle = 0x12345678u;
  EXPECT_EQ(kvsvDeviceOpen(nullptr, &handle), kvErrDeviceNameEmpty);
  EXPECT_EQ(kvsvDeviceOpen(&nullHandle, &handle), kvErrDeviceNameEmpty);
  EXPECT_EQ(kvsvDeviceOpen(negative, &handle), kvErrDeviceNameEmpty);
  EXPECT_EQ(kvsvInterfaceOpen(&blockless, &handle), kNotFound);
  EXPECT_EQ(handle, 0x12345678u);
  EXPECT_EQ(kvsvDeviceOpen(Name(kBusBoxCanLin), nullptr), kvErrInternal);
  EXPECT_EQ(kvsvSystemOpen(nullptr, nullptr), kvErrInternal);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(kvsimLogCount(), 0) << "nothing reaches the driver";
}

using SystemManager = SessionFixture;

TEST_F(SystemManager, TheFirstSystemHandleReachesTheSystemOpenNow) {
  uint32_t opened = 0, reopened = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &opened), 0);
  const uint32_t first = gSystemManager.firstSystemHandle;
  EXPECT_EQ(RedirectSystemHandle(first, kvPropSys_DevRefs), opened);
  ASSERT_EQ(kvsvSystemClose(opened), 0);
  ASSERT_EQ(kvsvSystemOpen(nullptr, &reopened), 0);
  // System properties through the first handle go to the one open now; nothing else does.
  const uint32_t cases[][3] = {{first, kvPropSys_DevRefs, reopened},
                               {first, kvPropDev_SerNum, first},
                               {0x01FE0000u, kvPropSys_IntfRefs, 0x01FE0000u}};
  for (const auto &c : cases)
    EXPECT_EQ(RedirectSystemHandle(c[0], c[1]), c[2]) << std::hex << c[0] << " " << c[1];
  ASSERT_EQ(kvsvSystemManualClose(nullptr, nullptr), 0);
  EXPECT_EQ(RedirectSystemHandle(first, kvPropSys_DevRefs), 0u) << "closed: no system in force";
}

TEST_F(SystemManager, AFailedSystemOpenEndsAtTheNextReleaseOfAnyClass) {
  ASSERT_EQ(kvsimFailCall("kvSystemOpen", kvsimErrInternal, 1), 0);
  uint32_t failed = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &failed), 0);
  ASSERT_EQ(gSystemManager.currentSystemHandle, failed);
  // No count is out, but the error handle is in force: any release ends it, and counts nothing.
  kvsimLogClear();
  EXPECT_EQ(ReleaseChild(0x0F000000u), 0);
  EXPECT_EQ(kvsimCountCalls("kvSystemClose"), 1);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_EQ(gSystemManager.currentSystemHandle, 0u);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
}

TEST_F(SystemManager, AtExitEntriesAreAbandonedAndEmptyMapsFreed) {
  const SvRefnum reference = HostRef("CAN1", 0x01420201u, false);
  auto manager = std::make_unique<cSysLifeManager>();
  auto child = std::make_shared<cSysLifeChild>("CAN1", 0x01420201u);
  (*manager->children)["CAN1"] = child;
  cSysLifeManager::tChildren *abandoned = manager->children.get();
  manager.reset();
  EXPECT_TRUE(HostHasRef(reference)) << "no child may call the host while the process ends";
  EXPECT_EQ(child.use_count(), 2);
  // The test owns what was abandoned; the empty error map was freed, as the leak checker sees.
  child->handle = 0;
  delete abandoned;
}

}  // namespace
