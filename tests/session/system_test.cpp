// System, device and interface references: the counted system, names, error handles for names not
// found, the host references that closes remove, and the system manager from inside.
#include <gtest/gtest.h>

#include <cstdint>
#include <memory>
#include <string>

#include "session/session_fixture.h"
#include "session/system_manager.h"
#include "support/fake_error_log.h"

namespace {

using namespace nKVSVAPI100;

using SystemObjects = SessionFixture;

TEST_F(SystemObjects, SystemAndChildrenShareOneCountedSystem) {
  kvsvtest::cFakeErrorLog log;
  uint32_t system = 0, first = 0, second = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  ASSERT_EQ(OpenDevice(kBusBoxCanLin, &first), 0);
  ASSERT_EQ(OpenDevice(kBusBoxFlexRayEnet, &second), 0);
  EXPECT_EQ(kvsvGetSystemRefCount(), 3u);
  EXPECT_EQ(kvsimCountCalls("kvSystemOpen"), 1) << "later acquires lend the open handle";
  EXPECT_EQ(SerialNumber(first), 1001234);
  EXPECT_EQ(SerialNumber(second), 1001235);
  EXPECT_EQ(first & 0xFFFF0000u, system) << "children belong to the system handed out";
  const SvRefnum firstRef = HostRef(kBusBoxCanLin, first, true);
  const SvRefnum secondRef = HostRef(kBusBoxFlexRayEnet, second, true);
  EXPECT_EQ(kvsvDeviceClose(first), 0);
  EXPECT_FALSE(HostHasRef(firstRef));
  EXPECT_TRUE(HostHasRef(secondRef));
  EXPECT_EQ(kvsvSystemClose(system), 0);
  EXPECT_EQ(kvsvGetSystemRefCount(), 1u);
  EXPECT_EQ(kvsimOpenSystemCount(), 1);
  EXPECT_EQ(kvsvDeviceClose(second), 0);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(kvsimOpenSystemCount(), 0) << "the last release closes the driver's system";
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_TRUE(log.Records().empty());
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  EXPECT_EQ(kvsimCountCalls("kvSystemOpen"), 2) << "closed: the next open asks the driver again";
}

TEST_F(SystemObjects, NamesAreFoundWithoutRegardToCaseAndOthersGiveAnErrorHandle) {
  const struct {
    const char *name, *driverName;  // no driver name: not in the system
  } cases[] = {
      {"CAN1", "CAN1"}, {"LiN2", "LIN2"}, {"flexray1", "FlexRay1"},
      {"ENET1/monitor", "ENET1"}, {"enet1/MONITOR", "ENET1"},
      // Only an Ethernet interface has a monitor name; a suffix on CAN is as unknown as a typo.
      {"CAN1/monitor", nullptr}, {"ENET1/monitorx", nullptr}, {"CAN", nullptr}, {"LIN1 ", nullptr},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.name);
    uint32_t handle = 0;
    ASSERT_EQ(OpenInterface(c.name, &handle), 0) << "a failure travels in the handle";
    if (c.driverName != nullptr) {
      EXPECT_EQ(InterfaceName(handle), c.driverName);
    } else {
      ASSERT_TRUE(IsErrorHandle(handle)) << std::hex << handle;
      EXPECT_EQ(UseStatus(handle), kNotFound);
    }
  }
  uint32_t device = 0, missing = 0;
  ASSERT_EQ(OpenDevice("___KVORDEV#FFF0B8EC", &device), 0);
  EXPECT_EQ(SerialNumber(device), 1001235);
  ASSERT_EQ(OpenDevice("___kvorDev#00000000", &missing), 0);
  EXPECT_EQ(UseStatus(missing), kNotFound);
  EXPECT_EQ(kvsvGetSystemRefCount(), 11u) << "an error child keeps its acquire";
  EXPECT_EQ(kvsimOpenSystemCount(), 1);
  EXPECT_EQ(kvsimOpenSessionCount(), 5) << "one error session per name not found";
}

TEST_F(SystemObjects, SessionCloseOfAnErrorHandleEndsOnlyTheErrorSession) {
  uint32_t system = 0, handle = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  ASSERT_EQ(OpenInterface("CAN7", &handle), 0);
  ASSERT_EQ(kvsimOpenSessionCount(), 1);
  for (int close = 0; close < 2; ++close) {  // the second finds no error child
    EXPECT_EQ(kvsvSessionClose(handle), 0);
    EXPECT_EQ(kvsimOpenSessionCount(), 0);
    EXPECT_EQ(kvsimOpenSystemCount(), 1);
    EXPECT_EQ(kvsvGetSystemRefCount(), 2u) << "the open's acquire is not given back";
  }
}

TEST_F(SystemObjects, EveryCloseExportAcceptsEveryReference) {
  for (auto close : {&kvsvSystemClose, &kvsvDeviceClose, &kvsvInterfaceClose}) {
    uint32_t system = 0, device = 0, intf = 0, missing = 0;
    ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
    ASSERT_EQ(OpenDevice(kBusBoxCanLin, &device), 0);
    ASSERT_EQ(OpenInterface("LIN1", &intf), 0);
    ASSERT_EQ(OpenInterface("nowhere", &missing), 0);
    const SvRefnum deviceRef = HostRef(kBusBoxCanLin, device, true);
    const SvRefnum intfRef = HostRef("LIN1", intf, false);
    EXPECT_EQ(close(device), 0);
    EXPECT_FALSE(HostHasRef(deviceRef));
    EXPECT_EQ(close(intf), 0);
    EXPECT_FALSE(HostHasRef(intfRef));
    EXPECT_EQ(close(missing), 0);
    EXPECT_EQ(kvsimOpenSessionCount(), 0) << "the error handle went to the session close";
    EXPECT_EQ(close(system), 0);
    EXPECT_EQ(kvsvGetSystemRefCount(), 1u) << "the error child's acquire stays";
    EXPECT_EQ(kvsvSystemManualClose(nullptr, nullptr), 0);
  }
}

TEST_F(SystemObjects, ManualCloseEndsEverythingWhateverTheCount) {
  uint32_t system = 0, again = 0, device = 0, can = 0, enet = 0, missing = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  ASSERT_EQ(kvsvSystemOpen(nullptr, &again), 0);
  EXPECT_EQ(again, system);
  ASSERT_EQ(OpenDevice(kBusBoxFlexRayEnet, &device), 0);
  ASSERT_EQ(OpenInterface("CAN3", &can), 0);
  ASSERT_EQ(OpenInterface("ENET1/monitor", &enet), 0);
  ASSERT_EQ(OpenInterface("CAN33", &missing), 0);
  HostRef(kBusBoxFlexRayEnet, device, true);
  HostRef("CAN3", can, false);
  HostRef("ENET1/monitor", enet, false);
  ASSERT_EQ(kvsvGetSystemRefCount(), 6u);
  uint64_t reserved1 = ~0ull, reserved2 = ~0ull;
  EXPECT_EQ(kvsvSystemManualClose(&reserved1, &reserved2), 0);
  EXPECT_EQ(reserved1 + reserved2, 0u);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(svsimRefCount(), 0) << "every child's host reference is removed";
  EXPECT_EQ(kvsimOpenSystemCount(), 0);
  EXPECT_EQ(kvsimOpenSessionCount(), 0) << "the error child's session is cleared";
  kvsimLogClear();
  EXPECT_EQ(kvsvSystemManualClose(nullptr, nullptr), 0);
  EXPECT_EQ(kvsimLogCount(), 0) << "closed already: nothing is asked of the driver";
  // The host closes the reference it still holds: a release without its acquire.
  EXPECT_EQ(kvsvDeviceClose(device), 0);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0xFFFFFFFFu);
  EXPECT_EQ(kvsimCountCalls("kvSystemClose"), 0);
  // The driver's failure is the result; the manager counts the system closed all the same.
  ASSERT_EQ(kvsvSystemManualClose(nullptr, nullptr), 0);
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  ASSERT_EQ(kvsimFailCall("kvSystemClose", kvsimErrInternal, 1), 0);
  EXPECT_EQ(kvsvSystemManualClose(nullptr, nullptr), kvsimErrInternal);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
}

TEST_F(SystemObjects, ASecondOpenOfANameRemovesTheFirstHostReference) {
  uint32_t first = 0, second = 0;
  ASSERT_EQ(OpenInterface("CAN2", &first), 0);
  const SvRefnum firstRef = HostRef("CAN2", first, false);
  ASSERT_EQ(OpenInterface("CAN2", &second), 0);
  EXPECT_EQ(second, first);
  EXPECT_FALSE(HostHasRef(firstRef)) << "the replaced child takes its reference along";
  const SvRefnum secondRef = HostRef("CAN2", second, false);
  EXPECT_EQ(kvsvInterfaceClose(second), 0);
  EXPECT_FALSE(HostHasRef(secondRef));
  EXPECT_EQ(kvsimOpenSystemCount(), 1);
  EXPECT_EQ(kvsvInterfaceClose(first), 0);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(kvsimOpenSystemCount(), 0);
}

TEST_F(SystemObjects, OpenWhileTheSystemFailsCarriesTheFailureAndTheNextOpenRetries) {
  using Open = kvsvStatus (*)(SvHandle *, uint32_t *);
  const struct {
    const char *what;
    Open open;
    SvHandle *name, *nextName;
  } cases[] = {
      {"system", &kvsvSystemOpen, nullptr, nullptr},
      {"device", &kvsvDeviceOpen, Name(kBusBoxCanLin), Name(kBusBoxFlexRayEnet)},
      {"interface", &kvsvInterfaceOpen, Name("CAN1"), Name("CAN4")},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.what);
    kvsimLogClear();
    ASSERT_EQ(kvsimFailCall("kvSystemOpen", kvsimErrInternal, 1), 0);
    uint32_t failed = 0, next = 0;
    EXPECT_EQ(c.open(c.name, &failed), 0);
    ASSERT_TRUE(IsErrorHandle(failed)) << std::hex << failed;
    EXPECT_EQ(UseStatus(failed), kvsimErrInternal);
    EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
    EXPECT_EQ(c.open(c.nextName, &next), 0);
    EXPECT_EQ(next >> 24, 0x01u) << std::hex << next;
    EXPECT_EQ(kvsvGetSystemRefCount(), 1u);
    EXPECT_EQ(kvsimCountCalls("kvSystemOpen"), 2);
    kvClear(failed);
    ASSERT_EQ(kvsvSystemManualClose(nullptr, nullptr), 0);
  }
}

TEST_F(SystemObjects, EmptyNamesAndMissingOutputsMakeNothing) {
  void *noBlock = nullptr;
  SvHandle blockless = &noBlock, nullHandle = nullptr;
  SvHandle *negative = Name("CAN1");
  static_cast<SvStr *>(**negative)->cnt = -4;  // a negative count holds no text either
  using Open = kvsvStatus (*)(SvHandle *, uint32_t *);
  const struct {
    const char *what;
    Open open;
    SvHandle *name;
    bool withOutput;
    int32_t expected;
  } cases[] = {
      {"device, no name", &kvsvDeviceOpen, nullptr, true, kvErrDeviceNameEmpty},
      {"device, null handle", &kvsvDeviceOpen, &nullHandle, true, kvErrDeviceNameEmpty},
      {"device, negative count", &kvsvDeviceOpen, negative, true, kvErrDeviceNameEmpty},
      {"interface, no block", &kvsvInterfaceOpen, &blockless, true, kNotFound},
      {"interface, empty text", &kvsvInterfaceOpen, Name(""), true, kNotFound},
      {"interface, empty, no output", &kvsvInterfaceOpen, nullptr, false, kvErrInternal},
      {"device, good, no output", &kvsvDeviceOpen, Name(kBusBoxCanLin), false, kvErrInternal},
      {"system, no output", &kvsvSystemOpen, nullptr, false, kvErrInternal},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.what);
    uint32_t handle = 0x12345678u;
    EXPECT_EQ(c.open(c.name, c.withOutput ? &handle : nullptr), c.expected);
    EXPECT_EQ(handle, 0x12345678u);
    EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
    EXPECT_EQ(kvsimLogCount(), 0) << "nothing reaches the driver";
  }
}

TEST_F(SystemObjects, AFailedErrorSessionUndoesTheAcquire) {
  ASSERT_EQ(kvsimFailCall("kvhdnCreateErrorSession", kvsimErrOutOfMemory, 1), 0);
  uint32_t handle = 0x12345678u, system = 0;
  EXPECT_EQ(OpenInterface("CAN5", &handle), kNotFound) << "the search's own status";
  EXPECT_EQ(handle, 0u);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(kvsimOpenSystemCount(), 0) << "the undone acquire was the only one";
  // With a system held by someone else, only the open's own acquire goes.
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  ASSERT_EQ(kvsimFailCall("kvhdnCreateErrorSession", kvsimErrOutOfMemory, 1), 0);
  EXPECT_EQ(OpenDevice("___kvorDev#12345678", &handle), kNotFound);
  EXPECT_EQ(kvsvGetSystemRefCount(), 1u);
  EXPECT_EQ(kvsimOpenSystemCount(), 1);
}

TEST_F(SystemObjects, AFailedElementDoesNotStopTheSearch) {
  uint32_t handle = 0;
  // The first interface's name cannot be read: the others are still found.
  ASSERT_EQ(kvsimFailProperty("kvGetPropertySize", kvPropIntf_Name, kvsimErrInternal, 1), 0);
  ASSERT_EQ(OpenInterface("CAN2", &handle), 0);
  EXPECT_EQ(InterfaceName(handle), "CAN2");
  // Its name counts as empty: it is not found, and the last element read well.
  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropIntf_Name, kvsimErrInternal, 1), 0);
  ASSERT_EQ(OpenInterface("CAN1", &handle), 0);
  EXPECT_EQ(UseStatus(handle), kNotFound);
  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropDev_SerNum, kvsimErrInternal, 1), 0);
  ASSERT_EQ(OpenDevice(kBusBoxFlexRayEnet, &handle), 0);
  EXPECT_EQ(SerialNumber(handle), 1001235);
  // A warning of the name read comes back with the handle.
  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropIntf_Name, 0x3FF62001, -1), 0);
  EXPECT_EQ(OpenInterface("FlexRay2", &handle), 0x3FF62001);
  EXPECT_EQ(InterfaceName(handle), "FlexRay2");
  EXPECT_EQ(OpenInterface("FlexRay3", &handle), 0);
  EXPECT_EQ(UseStatus(handle), kNotFound) << "not found: an error handle, not the warning";
}

TEST_F(SystemObjects, AFailedLastElementOrListIsTheOpensFailure) {
  const struct {
    const char *what, *function;
    uint32_t property;
    bool device;
    const char *name;
  } cases[] = {
      {"every interface name", "kvGetPropertySize", kvPropIntf_Name, false, "CAN1"},
      {"every serial number", "kvGetProperty", kvPropDev_SerNum, true, kBusBoxCanLin},
      {"the interface list", "kvGetPropertySize", kvPropSys_IntfRefs, false, "CAN1"},
      {"the device list", "kvGetProperty", kvPropSys_DevRefs, true, kBusBoxCanLin},
      {"every protocol, for a monitor", "kvGetProperty", kvPropIntf_Protocol, false, "ENET1/monitor"},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.what);
    ASSERT_EQ(kvsimFailProperty(c.function, c.property, kvsimErrInternal, -1), 0);
    uint32_t handle = 0;
    ASSERT_EQ(c.device ? OpenDevice(c.name, &handle) : OpenInterface(c.name, &handle), 0);
    kvsimClearFailures();
    EXPECT_EQ(UseStatus(handle), kvsimErrInternal);
  }
  // A direct match of a name needs no protocol.
  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropIntf_Protocol, kvsimErrInternal, -1), 0);
  uint32_t handle = 0;
  ASSERT_EQ(OpenInterface("CAN3", &handle), 0);
  EXPECT_EQ(InterfaceName(handle), "CAN3");
}

using SystemManager = SessionFixture;

TEST_F(SystemManager, TheFirstSystemHandleReachesTheSystemOpenNow) {
  uint32_t opened = 0, reopened = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &opened), 0);
  const uint32_t first = gSystemManager.firstSystemHandle;
  EXPECT_EQ(RedirectSystemHandle(first, kvPropSys_DevRefs), opened);
  ASSERT_EQ(kvsvSystemClose(opened), 0);
  ASSERT_EQ(kvsvSystemOpen(nullptr, &reopened), 0);
  ASSERT_NE(reopened, first) << "the driver gives a new handle";
  EXPECT_EQ(gSystemManager.firstSystemHandle, first) << "the first handle is never replaced";
  const uint32_t cases[][3] = {
      // System properties through the first handle go to the one open now.
      {first, kvPropSys_DevRefs, reopened},
      {first, kvPropSys_VerMajor, reopened},
      // Device and interface properties, and other handles, are left alone.
      {first, kvPropDev_SerNum, first},
      {first, kvPropIntf_Name, first},
      {0x01FE0000u, kvPropSys_IntfRefs, 0x01FE0000u},
  };
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
  const uint32_t handle = 0x01420201u;
  const SvRefnum reference = HostRef("CAN1", handle, false);
  auto manager = std::make_unique<cSysLifeManager>();
  ASSERT_EQ(manager->status.code, 0);
  auto child = std::make_shared<cSysLifeChild>("CAN1", handle);
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
