// System, device and interface references through the library's exports: counting, names, error
// handles for names not found, and the host references that closes remove.
#include <gtest/gtest.h>

#include <cstdint>
#include <string>

#include "session/system_fixture.h"

namespace {

constexpr uint32_t kClassMask = 0xFF000000u;
constexpr int32_t kNotFound = static_cast<int32_t>(0xBFF6308A);
constexpr int32_t kDriverFailure = kvsimErrInternal;
constexpr int32_t kDriverWarning = 0x3FF62001;

bool IsSystemObject(uint32_t handle) { return (handle & kClassMask) == 0x01000000u; }
bool IsErrorHandle(uint32_t handle) { return (handle & kClassMask) == 0x20000000u; }

using SystemObjects = SystemFixture;

TEST_F(SystemObjects, SystemAndChildrenShareOneCountedSystem) {
  uint32_t system = 0, first = 0, second = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  ASSERT_EQ(OpenDevice(kBusBoxCanLin, &first), 0);
  ASSERT_EQ(OpenDevice(kBusBoxFlexRayEnet, &second), 0);
  EXPECT_EQ(kvsvGetSystemRefCount(), 3u);
  EXPECT_EQ(kvsimOpenSystemCount(), 1);
  EXPECT_EQ(kvsimCountCalls("kvSystemOpen"), 1) << "later acquires lend the open handle";
  EXPECT_EQ(SerialNumber(first), 1001234);
  EXPECT_EQ(SerialNumber(second), 1001235);
  EXPECT_EQ(first & 0xFFFF0000u, system) << "children belong to the system handed out";

  const SvRefnum firstRef = RegisterHostRef(kBusBoxCanLin, first, "KVOR Device");
  const SvRefnum secondRef = RegisterHostRef(kBusBoxFlexRayEnet, second, "KVOR Device");

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

  // Closed: the next open asks the driver again.
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  EXPECT_EQ(kvsimCountCalls("kvSystemOpen"), 2);
  EXPECT_EQ(kvsvGetSystemRefCount(), 1u);
}

TEST_F(SystemObjects, NamesAreFoundWithoutRegardToCaseAndOthersGiveAnErrorHandle) {
  struct Case {
    const char *name;
    const char *driverName;  // of the interface that answers; none: not in the system
  } cases[] = {
      {"CAN1", "CAN1"},
      {"can2", "CAN2"},
      {"LiN2", "LIN2"},
      {"flexray1", "FlexRay1"},
      {"ENET1", "ENET1"},
      {"ENET1/monitor", "ENET1"},
      {"enet1/MONITOR", "ENET1"},
      // Only an Ethernet interface has a monitor name; a suffix on CAN is as unknown as a typo.
      {"CAN1/monitor", nullptr},
      {"CAN9", nullptr},
      {"ENET1/monitorx", nullptr},
      {"CAN", nullptr},
      {"LIN1 ", nullptr},
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(c.name);
    uint32_t handle = 0;
    const int32_t sessionsBefore = kvsimOpenSessionCount();
    ASSERT_EQ(OpenInterface(c.name, &handle), 0) << "a failure travels in the handle";
    if (c.driverName != nullptr) {
      ASSERT_TRUE(IsSystemObject(handle));
      EXPECT_EQ(InterfaceName(handle), c.driverName);
    } else {
      ASSERT_TRUE(IsErrorHandle(handle)) << std::hex << handle;
      EXPECT_EQ(FirstUse(handle), kNotFound);
      EXPECT_EQ(kvsimOpenSessionCount(), sessionsBefore + 1);
    }
  }
  uint32_t device = 0, missing = 0;
  ASSERT_EQ(OpenDevice("___KVORDEV#FFF0B8EC", &device), 0);
  EXPECT_EQ(SerialNumber(device), 1001235);
  ASSERT_EQ(OpenDevice("___kvorDev#00000000", &missing), 0);
  EXPECT_TRUE(IsErrorHandle(missing));
  EXPECT_EQ(FirstUse(missing), kNotFound);
  EXPECT_EQ(kvsvGetSystemRefCount(), 14u) << "an error child keeps its acquire";
  EXPECT_EQ(kvsimOpenSystemCount(), 1);
}

TEST_F(SystemObjects, SessionCloseOfAnErrorHandleEndsOnlyTheErrorSession) {
  uint32_t system = 0, handle = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  ASSERT_EQ(OpenInterface("CAN7", &handle), 0);
  ASSERT_TRUE(IsErrorHandle(handle));
  ASSERT_EQ(kvsimOpenSessionCount(), 1);
  kvsimLogClear();

  EXPECT_EQ(kvsvSessionClose(handle), 0);
  EXPECT_EQ(kvsimOpenSessionCount(), 0) << "the error session is cleared";
  EXPECT_EQ(CallsOn("kvClear", handle), 1);
  EXPECT_EQ(CallsOn("kvSystemClose", system), 0);
  EXPECT_EQ(kvsvGetSystemRefCount(), 2u) << "the open's acquire is not given back";
  EXPECT_EQ(kvsimOpenSystemCount(), 1);

  // A second close finds no error child: the system is not touched.
  kvsimLogClear();
  EXPECT_EQ(kvsvSessionClose(handle), 0);
  EXPECT_EQ(CallsOn("kvSystemClose", system), 0);
  EXPECT_EQ(kvsvGetSystemRefCount(), 2u);
}

TEST_F(SystemObjects, EveryCloseExportAcceptsEveryReference) {
  using Close = kvsvStatus (*)(uint32_t);
  for (Close close : {&kvsvSystemClose, &kvsvDeviceClose, &kvsvInterfaceClose}) {
    uint32_t system = 0, device = 0, intf = 0, missing = 0;
    ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
    ASSERT_EQ(OpenDevice(kBusBoxCanLin, &device), 0);
    ASSERT_EQ(OpenInterface("LIN1", &intf), 0);
    ASSERT_EQ(OpenInterface("nowhere", &missing), 0);
    const SvRefnum deviceRef = RegisterHostRef(kBusBoxCanLin, device, "KVOR Device");
    const SvRefnum intfRef = RegisterHostRef("LIN1", intf, "KVOR Interface");
    ASSERT_EQ(kvsvGetSystemRefCount(), 4u);

    EXPECT_EQ(close(device), 0);
    EXPECT_FALSE(HostHasRef(deviceRef));
    EXPECT_EQ(close(intf), 0);
    EXPECT_FALSE(HostHasRef(intfRef));
    EXPECT_EQ(close(missing), 0);
    EXPECT_EQ(kvsimOpenSessionCount(), 0) << "the error handle went to the session close";
    EXPECT_EQ(close(system), 0);
    EXPECT_EQ(kvsvGetSystemRefCount(), 1u) << "the error child's acquire stays";
    EXPECT_EQ(kvsimOpenSystemCount(), 1);
    uint64_t a = 0, b = 0;
    EXPECT_EQ(kvsvSystemManualClose(&a, &b), 0);
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
  RegisterHostRef(kBusBoxFlexRayEnet, device, "KVOR Device");
  RegisterHostRef("CAN3", can, "KVOR Interface");
  RegisterHostRef("ENET1/monitor", enet, "KVOR Interface");
  ASSERT_EQ(svsimRefCount(), 3);
  ASSERT_EQ(kvsvGetSystemRefCount(), 6u);

  uint64_t reserved1 = 0xAAAAAAAAAAAAAAAAu, reserved2 = 0x5555555555555555u;
  EXPECT_EQ(kvsvSystemManualClose(&reserved1, &reserved2), 0);
  EXPECT_EQ(reserved1, 0u);
  EXPECT_EQ(reserved2, 0u);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(svsimRefCount(), 0) << "every child's host reference is removed";
  EXPECT_EQ(kvsimOpenSystemCount(), 0);
  EXPECT_EQ(kvsimOpenSessionCount(), 0) << "the error child's session is cleared";

  // Closed already: a second manual close asks nothing of the driver.
  kvsimLogClear();
  EXPECT_EQ(kvsvSystemManualClose(nullptr, nullptr), 0);
  EXPECT_EQ(kvsimLogCount(), 0);
}

TEST_F(SystemObjects, ManualCloseGivesTheDriversStatus) {
  uint32_t system = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  ASSERT_EQ(kvsimFailCall("kvSystemClose", kDriverFailure, 1), 0);
  uint64_t a = 1, b = 1;
  EXPECT_EQ(kvsvSystemManualClose(&a, &b), kDriverFailure);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u) << "the manager counts the system closed all the same";
  EXPECT_EQ(a + b, 0u);
}

TEST_F(SystemObjects, LateCloseAfterManualCloseWrapsTheCount) {
  uint32_t device = 0;
  ASSERT_EQ(OpenDevice(kBusBoxCanLin, &device), 0);
  ASSERT_EQ(kvsvSystemManualClose(nullptr, nullptr), 0);
  kvsimLogClear();
  // The host closes the reference it still holds: a release without its acquire.
  EXPECT_EQ(kvsvDeviceClose(device), 0);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0xFFFFFFFFu);
  EXPECT_EQ(kvsimCountCalls("kvSystemClose"), 0);
}

TEST_F(SystemObjects, SecondOpenOfANameRemovesTheFirstHostReference) {
  uint32_t first = 0, second = 0;
  ASSERT_EQ(OpenInterface("CAN2", &first), 0);
  const SvRefnum firstRef = RegisterHostRef("CAN2", first, "KVOR Interface");
  ASSERT_EQ(OpenInterface("CAN2", &second), 0);
  EXPECT_EQ(second, first);
  EXPECT_FALSE(HostHasRef(firstRef)) << "the replaced child takes its reference along";
  const SvRefnum secondRef = RegisterHostRef("CAN2", second, "KVOR Interface");
  EXPECT_EQ(kvsvGetSystemRefCount(), 2u);

  EXPECT_EQ(kvsvInterfaceClose(second), 0);
  EXPECT_FALSE(HostHasRef(secondRef));
  EXPECT_EQ(kvsvGetSystemRefCount(), 1u);
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
    SvHandle *name;
    SvHandle *nextName;
  } cases[] = {
      {"system", &kvsvSystemOpen, nullptr, nullptr},
      {"device", &kvsvDeviceOpen, Name(kBusBoxCanLin), Name(kBusBoxFlexRayEnet)},
      {"interface", &kvsvInterfaceOpen, Name("CAN1"), Name("CAN4")},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.what);
    kvsimLogClear();
    ASSERT_EQ(kvsimFailCall("kvSystemOpen", kDriverFailure, 1), 0);
    uint32_t failed = 0;
    EXPECT_EQ(c.open(c.name, &failed), 0);
    ASSERT_TRUE(IsErrorHandle(failed)) << std::hex << failed;
    EXPECT_EQ(FirstUse(failed), kDriverFailure);
    EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
    EXPECT_EQ(kvsimOpenSystemCount(), 0);

    uint32_t next = 0;
    EXPECT_EQ(c.open(c.nextName, &next), 0);
    EXPECT_TRUE(IsSystemObject(next)) << std::hex << next;
    EXPECT_EQ(kvsvGetSystemRefCount(), 1u);
    EXPECT_EQ(kvsimCountCalls("kvSystemOpen"), 2);
    kvClear(failed);
    ASSERT_EQ(kvsvSystemManualClose(nullptr, nullptr), 0);
  }
}

TEST_F(SystemObjects, EmptyNamesAndMissingOutputsMakeNothing) {
  void *noBlock = nullptr;
  SvHandle blockless = &noBlock;
  SvHandle *empty = Name("");
  SvHandle *good = Name("CAN1");
  SvHandle nullHandle = nullptr;
  using Open = kvsvStatus (*)(SvHandle *, uint32_t *);
  struct Case {
    const char *what;
    Open open;
    SvHandle *name;
    bool withOutput;
    int32_t expected;
  } cases[] = {
      {"device, no name", &kvsvDeviceOpen, nullptr, true, static_cast<int32_t>(0xBFF630A5)},
      {"device, null handle", &kvsvDeviceOpen, &nullHandle, true, static_cast<int32_t>(0xBFF630A5)},
      {"device, no block", &kvsvDeviceOpen, &blockless, true, static_cast<int32_t>(0xBFF630A5)},
      {"device, empty text", &kvsvDeviceOpen, empty, true, static_cast<int32_t>(0xBFF630A5)},
      {"interface, no name", &kvsvInterfaceOpen, nullptr, true, kNotFound},
      {"interface, null handle", &kvsvInterfaceOpen, &nullHandle, true, kNotFound},
      {"interface, no block", &kvsvInterfaceOpen, &blockless, true, kNotFound},
      {"interface, empty text", &kvsvInterfaceOpen, empty, true, kNotFound},
      {"device, empty, no output", &kvsvDeviceOpen, empty, false, static_cast<int32_t>(0xBFF63001)},
      {"interface, empty, no output", &kvsvInterfaceOpen, nullptr, false,
       static_cast<int32_t>(0xBFF63001)},
      {"device, good, no output", &kvsvDeviceOpen, good, false, static_cast<int32_t>(0xBFF63001)},
      {"interface, good, no output", &kvsvInterfaceOpen, good, false,
       static_cast<int32_t>(0xBFF63001)},
      {"system, no output", &kvsvSystemOpen, nullptr, false, static_cast<int32_t>(0xBFF63001)},
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(c.what);
    uint32_t handle = 0x12345678u;
    EXPECT_EQ(c.open(c.name, c.withOutput ? &handle : nullptr), c.expected);
    EXPECT_EQ(handle, 0x12345678u);
    EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
    EXPECT_EQ(kvsimLogCount(), 0) << "nothing reaches the driver";
  }
  // A negative count holds no text either.
  SvHandle *negative = Name("CAN1");
  static_cast<SvStr *>(**negative)->cnt = -4;
  uint32_t handle = 0;
  EXPECT_EQ(kvsvDeviceOpen(negative, &handle), static_cast<int32_t>(0xBFF630A5));
  EXPECT_EQ(kvsimLogCount(), 0);
}

TEST_F(SystemObjects, FailedErrorSessionUndoesTheAcquire) {
  ASSERT_EQ(kvsimFailCall("kvhdnCreateErrorSession", kvsimErrOutOfMemory, 1), 0);
  uint32_t handle = 0x12345678u;
  EXPECT_EQ(OpenInterface("CAN5", &handle), kNotFound) << "the search's own status";
  EXPECT_EQ(handle, 0u);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
  EXPECT_EQ(kvsimOpenSystemCount(), 0) << "the undone acquire was the only one";

  // With a system held by someone else, only the open's own acquire goes.
  uint32_t system = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  ASSERT_EQ(kvsimFailCall("kvhdnCreateErrorSession", kvsimErrOutOfMemory, 1), 0);
  EXPECT_EQ(OpenDevice("___kvorDev#12345678", &handle), kNotFound);
  EXPECT_EQ(kvsvGetSystemRefCount(), 1u);
  EXPECT_EQ(kvsimOpenSystemCount(), 1);
}

TEST_F(SystemObjects, FailedElementsDoNotStopTheSearch) {
  // The first interface's name cannot be read: the others are still found.
  ASSERT_EQ(kvsimFailProperty("kvGetPropertySize", kvPropIntf_Name, kDriverFailure, 1), 0);
  uint32_t handle = 0;
  ASSERT_EQ(OpenInterface("CAN2", &handle), 0);
  EXPECT_EQ(InterfaceName(handle), "CAN2");

  // Its name counts as empty: it is not found, and the last element read well.
  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropIntf_Name, kDriverFailure, 1), 0);
  ASSERT_EQ(OpenInterface("CAN1", &handle), 0);
  ASSERT_TRUE(IsErrorHandle(handle));
  EXPECT_EQ(FirstUse(handle), kNotFound);

  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropDev_SerNum, kDriverFailure, 1), 0);
  ASSERT_EQ(OpenDevice(kBusBoxFlexRayEnet, &handle), 0);
  EXPECT_EQ(SerialNumber(handle), 1001235);
}

TEST_F(SystemObjects, AFailedLastElementOrListIsTheOpensFailure) {
  struct Case {
    const char *what;
    const char *function;
    uint32_t property;
    bool device;
    const char *name;
  } cases[] = {
      {"every interface name", "kvGetPropertySize", kvPropIntf_Name, false, "CAN1"},
      {"every serial number", "kvGetProperty", kvPropDev_SerNum, true, kBusBoxCanLin},
      {"the interface list", "kvGetPropertySize", kvPropSys_IntfRefs, false, "CAN1"},
      {"the device list", "kvGetProperty", kvPropSys_DevRefs, true, kBusBoxCanLin},
      {"every protocol, for a monitor", "kvGetProperty", kvPropIntf_Protocol, false,
       "ENET1/monitor"},
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(c.what);
    ASSERT_EQ(kvsimFailProperty(c.function, c.property, kDriverFailure, -1), 0);
    uint32_t handle = 0;
    ASSERT_EQ(c.device ? OpenDevice(c.name, &handle) : OpenInterface(c.name, &handle), 0);
    ASSERT_TRUE(IsErrorHandle(handle));
    kvsimClearFailures();
    EXPECT_EQ(FirstUse(handle), kDriverFailure);
  }
  // A direct match of a name needs no protocol.
  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropIntf_Protocol, kDriverFailure, -1), 0);
  uint32_t handle = 0;
  ASSERT_EQ(OpenInterface("CAN3", &handle), 0);
  EXPECT_EQ(InterfaceName(handle), "CAN3");
}

TEST_F(SystemObjects, AWarningOfTheNameReadComesBackWithTheHandle) {
  ASSERT_EQ(kvsimFailProperty("kvGetProperty", kvPropIntf_Name, kDriverWarning, -1), 0);
  uint32_t handle = 0;
  EXPECT_EQ(OpenInterface("FlexRay2", &handle), kDriverWarning);
  EXPECT_EQ(InterfaceName(handle), "FlexRay2");
  // A name not found ends in an error handle, not the warning.
  EXPECT_EQ(OpenInterface("FlexRay3", &handle), 0);
  ASSERT_TRUE(IsErrorHandle(handle));
  EXPECT_EQ(FirstUse(handle), kNotFound);
}

}  // namespace
