// The system manager from inside: handle redirection, error children as session close sees them,
// a manager whose mutex could not be made, and what a manager leaves at exit.
#include "session/system_manager.h"

#include <gtest/gtest.h>

#include <memory>
#include <set>

#include "core/status.h"
#include "session/system_fixture.h"
#include "support/fake_error_log.h"

namespace {

using namespace nKVSVAPI100;

using SystemManager = SystemFixture;

TEST_F(SystemManager, FirstHandleReachesTheSystemOpenNow) {
  uint32_t opened = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &opened), 0);
  const uint32_t first = gSystemManager.firstSystemHandle;
  ASSERT_NE(first, 0u);
  EXPECT_EQ(RedirectSystemHandle(first, kvPropSys_DevRefs), opened);
  ASSERT_EQ(kvsvSystemClose(opened), 0);
  ASSERT_EQ(kvsimOpenSystemCount(), 0);

  uint32_t reopened = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &reopened), 0);
  ASSERT_NE(reopened, first) << "the driver gives a new handle";
  EXPECT_EQ(gSystemManager.firstSystemHandle, first) << "the first handle is never replaced";

  struct Case {
    uint32_t handle;
    uint32_t property;
    uint32_t expected;
  } cases[] = {
      // System properties through the first handle go to the one open now.
      {first, kvPropSys_DevRefs, reopened},
      {first, kvPropSys_VerMajor, reopened},
      // Device and interface properties, and other handles, are left alone.
      {first, kvPropDev_SerNum, first},
      {first, kvPropIntf_Name, first},
      {reopened, kvPropSys_DevRefs, reopened},
      {0x01FE0000u, kvPropSys_IntfRefs, 0x01FE0000u},
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(testing::Message() << std::hex << c.handle << " " << c.property);
    EXPECT_EQ(RedirectSystemHandle(c.handle, c.property), c.expected);
  }

  // What a property export does with the host's old reference.
  uint32_t size = 0;
  EXPECT_EQ(kvGetPropertySize(first, kvPropSys_DevRefs, &size), kvsimErrInvalidObject);
  EXPECT_EQ(
      kvGetPropertySize(RedirectSystemHandle(first, kvPropSys_DevRefs), kvPropSys_DevRefs, &size),
      0);
  EXPECT_EQ(size, 8u);

  ASSERT_EQ(kvsvSystemManualClose(nullptr, nullptr), 0);
  EXPECT_EQ(RedirectSystemHandle(first, kvPropSys_DevRefs), 0u) << "closed: no system in force";
  EXPECT_EQ(gSystemManager.firstSystemHandle, first);
}

TEST_F(SystemManager, RemoveErrorChildEndsOnlyAnErrorChild) {
  uint32_t missing = 0, intf = 0;
  ASSERT_EQ(OpenInterface("CAN0", &missing), 0);
  ASSERT_EQ(OpenInterface("CAN1", &intf), 0);
  ASSERT_EQ(gSystemManager.errorChildren->count(missing), 1u);
  ASSERT_EQ(kvsimOpenSessionCount(), 1);

  EXPECT_FALSE(RemoveErrorChild(intf));
  EXPECT_FALSE(RemoveErrorChild(missing + 1));
  EXPECT_EQ(kvsimOpenSessionCount(), 1);

  EXPECT_TRUE(RemoveErrorChild(missing));
  EXPECT_EQ(gSystemManager.errorChildren->count(missing), 0u);
  EXPECT_EQ(kvsimOpenSessionCount(), 0) << "its error session is cleared";
  EXPECT_EQ(kvsvGetSystemRefCount(), 2u);
  EXPECT_EQ(gSystemManager.children->size(), 1u);
  EXPECT_FALSE(RemoveErrorChild(missing));
}

TEST_F(SystemManager, ReleaseOfAnotherClassLeavesTheCount) {
  uint32_t system = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  ASSERT_EQ(kvsvSystemOpen(nullptr, &system), 0);
  for (uint32_t handle : {0u, 0x0F000000u, 0x83000001u}) {
    EXPECT_EQ(ReleaseChild(handle), 0);
    EXPECT_EQ(kvsvGetSystemRefCount(), 2u) << std::hex << handle;
  }
  EXPECT_EQ(kvsimOpenSystemCount(), 1);
}

TEST_F(SystemManager, AFailedSystemOpenIsClosedByTheNextReleaseOfAnyClass) {
  // No count is out, but the error handle is in force: any release ends it.
  ASSERT_EQ(kvsimFailCall("kvSystemOpen", kvsimErrInternal, 1), 0);
  uint32_t failed = 0;
  ASSERT_EQ(kvsvSystemOpen(nullptr, &failed), 0);
  ASSERT_EQ(gSystemManager.currentSystemHandle, failed);
  ASSERT_EQ(kvsimOpenSessionCount(), 1);
  kvsimLogClear();
  EXPECT_EQ(ReleaseChild(0x0F000000u), 0);
  EXPECT_EQ(kvsimCountCalls("kvSystemClose"), 1);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  EXPECT_EQ(gSystemManager.currentSystemHandle, 0u);
  EXPECT_EQ(kvsvGetSystemRefCount(), 0u);
}

// Makes the manager look as if its mutex could not be made, for the span of a test.
class cFailedManager {
 public:
  cFailedManager() { gSystemManager.status.code = kMutexInitFailed; }
  ~cFailedManager() { gSystemManager.status.code = 0; }
};

TEST_F(SystemManager, FailedManagerReportsAtEveryExportAndTouchesNothing) {
  uint32_t device = 0;
  ASSERT_EQ(OpenDevice(kBusBoxCanLin, &device), 0);
  kvsimLogClear();
  SvHandle *name = Name("CAN1");

  kvsvtest::cFakeErrorLog log;
  {
    cFailedManager failed;
    uint32_t out = 0x12345678u;
    uint64_t reserved1 = 7, reserved2 = 7;
    const int32_t results[] = {
        kvsvSystemOpen(nullptr, &out),
        kvsvSystemClose(device & 0xFFFF0000u),
        kvsvSystemManualClose(&reserved1, &reserved2),
        kvsvDeviceOpen(name, &out),
        kvsvDeviceClose(device),
        kvsvInterfaceOpen(name, &out),
        kvsvInterfaceClose(device | 1u),
    };
    for (int32_t result : results) EXPECT_EQ(result, kvErrInternal);
    EXPECT_EQ(out, 0x12345678u);
    EXPECT_EQ(reserved1 + reserved2, 14u);
    EXPECT_EQ(kvsvGetSystemRefCount(), 1u) << "the count is read without the manager";
    EXPECT_FALSE(RemoveErrorChild(device));
    EXPECT_EQ(RedirectSystemHandle(0x01990000u, kvPropSys_DevRefs), 0x01990000u);
  }
  EXPECT_EQ(kvsimLogCount(), 0) << "nothing reached the driver";
  EXPECT_EQ(kvsvGetSystemRefCount(), 1u);

  const auto records = log.Records();
  ASSERT_EQ(records.size(), 7u);
  std::set<uint32_t> lines;
  for (const auto &record : records) {
    EXPECT_EQ(record.value.Component(), kComponentKvsvapi);
    EXPECT_EQ(record.value.File(), nFile::kSessionOpenClose);
    EXPECT_EQ(record.value.info, static_cast<uint32_t>(kMutexInitFailed));
    EXPECT_NE(record.value.Line(), 0u);
    lines.insert(record.value.Line());
  }
  EXPECT_EQ(lines.size(), 7u) << "each export reports from its own line";
}

TEST_F(SystemManager, AtExitEntriesAreAbandonedAndEmptyMapsFreed) {
  const uint32_t handle = 0x01420201u;
  const SvRefnum reference = RegisterHostRef("CAN1", handle, "KVOR Interface");
  auto manager = std::make_unique<cSysLifeManager>();
  ASSERT_EQ(manager->status.code, 0);
  auto child = std::make_shared<cSysLifeChild>("CAN1", handle);
  (*manager->children)["CAN1"] = child;
  cSysLifeManager::tChildren *abandoned = manager->children.get();

  manager.reset();
  EXPECT_TRUE(HostHasRef(reference)) << "no child may call the host while the process ends";
  EXPECT_EQ(abandoned->size(), 1u);
  EXPECT_EQ(child.use_count(), 2);

  // The test owns what was abandoned; the empty error map was freed, as the leak checker sees.
  child->handle = 0;
  delete abandoned;
}

TEST_F(SystemManager, ClosingChildrenRemovesTheirReferencesWithoutReports) {
  kvsvtest::cFakeErrorLog log;
  uint32_t device = 0, intf = 0;
  ASSERT_EQ(OpenDevice(kBusBoxFlexRayEnet, &device), 0);
  ASSERT_EQ(OpenInterface("FlexRay1", &intf), 0);
  RegisterHostRef(kBusBoxFlexRayEnet, device, "KVOR Device");
  RegisterHostRef("FlexRay1", intf, "KVOR Interface");
  EXPECT_EQ(kvsvInterfaceClose(intf), 0);
  EXPECT_EQ(kvsvDeviceClose(device), 0);
  EXPECT_EQ(svsimRefCount(), 0);
  EXPECT_TRUE(log.Records().empty());
}

}  // namespace
