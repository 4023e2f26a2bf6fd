// The session table: which handles make a slot, which reach one, and what a slot owns.
#include <gtest/gtest.h>

#include <cstdlib>

#include "session/name_list.h"
#include "session/slot_guard.h"
#include "support/slot_fixture.h"

namespace {

using namespace nKVSVAPI100;

class SessionTable : public SlotFixture {};

TEST_F(SessionTable, HandlesOutsideTheTableMakeNoSlot) {
  struct Case {
    uint32_t handle;
    Status openStatus;
    Status expected;
  } cases[] = {
      {0x00000000u, 0, kvErrInvalidSession},
      {0x7F000000u, 0, kvErrInvalidSession},
      {0x00002001u, 0, kvErrInvalidSession},
      {0x0000FFFFu, 0, kvErrInvalidSession},
      {0x00002001u, static_cast<Status>(0xBFF62020), static_cast<Status>(0xBFF62020)},
      {0x00002001u, 0x3FF62001, kvErrInvalidSession},  // a warning is no open error
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(c.handle);
    EXPECT_EQ(PlaceSlot(c.handle, c.openStatus), c.expected);
    cSlotGuard guard(c.handle);
    EXPECT_EQ(guard.status(), kvErrInvalidSession);
  }
  EXPECT_EQ(gSessionManager.slots[0].load(), nullptr);
}

TEST_F(SessionTable, LastIndexWorksAndHighBitsAreIgnored) {
  ASSERT_EQ(PlaceSlot(0x00002000u), 0);
  tSessionSlot *slot = Slot(0x2000u);
  ASSERT_NE(slot, nullptr);
  EXPECT_EQ(slot->slotValid.load(), 1u);
  EXPECT_EQ(slot->cachedCount, kUnknown);
  EXPECT_EQ(slot->cachedSamples, kUnknown);
  EXPECT_EQ(slot->sessionMode, 0xFFFFFFFFu);
  for (uint32_t handle : {0x00002000u, 0x12342000u, 0xFFFF2000u}) {
    cSlotGuard guard(handle);
    ASSERT_TRUE(guard) << std::hex << handle;
    EXPECT_EQ(&guard.slot(), slot);
    EXPECT_EQ(slot->guard.load(), 1u);
  }
  EXPECT_EQ(slot->guard.load(), 0u);
}

TEST_F(SessionTable, GuardIsReleasedOnlyIfStillHeld) {
  ASSERT_EQ(PlaceSlot(0x00000123u), 0);
  tSessionSlot *slot = Slot(0x123u);
  {
    cSlotGuard guard(0x123u);
    ASSERT_TRUE(guard);
    cSlotGuard second(0x123u);
    EXPECT_EQ(second.status(), kvErrSessionBusy);
  }
  EXPECT_EQ(slot->guard.load(), 0u);
  {
    cSlotGuard guard(0x123u, &tSessionSlot::listGuard);
    ASSERT_TRUE(guard);
    EXPECT_EQ(slot->listGuard.load(), 1u);
    // The list guard is its own word: a read may run beside a name lookup.
    cSlotGuard read(0x123u);
    EXPECT_TRUE(read);
    slot->listGuard = 0;  // as an abort would
  }
  EXPECT_EQ(slot->listGuard.load(), 0u);
}

TEST_F(SessionTable, DestroySlotFreesEverythingItOwns) {
  // Under the leak checker, every block the slot points to must be gone with it.
  auto *slot = new tSessionSlot();
  slot->frameBuffer = std::malloc(64);
  slot->waveformScratch = static_cast<tWaveformScratch *>(std::malloc(sizeof(tWaveformScratch)));
  slot->waveformScratch->sampleBuffers = static_cast<double **>(std::malloc(16));
  slot->waveformScratch->descriptors = static_cast<SvWaveformDescriptor *>(std::malloc(160));
  slot->flexRayTimeCache = std::malloc(32);
  slot->sessionNameList = new cNameList("A,B");
  slot->nameList = new cNameList("S1");
  DestroySlot(slot);
  DestroySlot(nullptr);
}

}  // namespace
