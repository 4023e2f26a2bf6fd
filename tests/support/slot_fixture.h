// A reset pair of stand-ins and driver sessions that hold slots in the library, for tests that
// reach the session table directly.
#ifndef KVSVAPI_TESTS_SLOT_FIXTURE_H
#define KVSVAPI_TESTS_SLOT_FIXTURE_H

#include <gtest/gtest.h>

#include <mutex>
#include <string>
#include <vector>

#include "kvsim.h"
#include "kvsvplatform.h"
#include "session/session_manager.h"
#include "svsim.h"

class SlotFixture : public testing::Test {
 protected:
  void SetUp() override {
    kvsimReset();
    svsimReset();
  }

  void TearDown() override {
    for (uint32_t index : slotsMade_) DropSlot(index);
    for (SvHandle h : handles_) svDisposeHandle(h);
    kvsimReset();
    svsimReset();
  }

  // A driver session on `interfaceName` with a slot in the library.
  uint32_t MakeSession(const std::string &list, uint32_t mode,
                       const char *interfaceName = "CAN1") {
    uint32_t session = 0;
    EXPECT_EQ(kvCreateSession(":memory:", "", list.c_str(), interfaceName, mode, &session), 0);
    PlaceSlot(session);
    return session;
  }

  // Makes the slot of `handle`, as every creation of a session ends.
  nKVSVAPI100::Status PlaceSlot(uint32_t handle, nKVSVAPI100::Status openStatus = 0) {
    using namespace nKVSVAPI100;
    std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
    const Status status = CreateSlot(gSessionManager, handle, openStatus);
    if (status == 0) slotsMade_.push_back(SlotIndex(handle));
    return status;
  }

  static nKVSVAPI100::tSessionSlot *Slot(uint32_t handle) {
    return nKVSVAPI100::gSessionManager.slots[nKVSVAPI100::SlotIndex(handle)].load();
  }

  // Keeps a host handle for disposal at the end of the test.
  SvHandle Keep(SvHandle h) {
    handles_.push_back(h);
    return h;
  }

 private:
  static void DropSlot(uint32_t index) {
    nKVSVAPI100::DestroySlot(nKVSVAPI100::gSessionManager.slots[index].exchange(nullptr));
  }

  std::vector<uint32_t> slotsMade_;
  std::vector<SvHandle> handles_;
};

#endif
