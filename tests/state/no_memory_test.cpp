// A LIN schedule named by text: the slot's list of schedule names cannot be made for lack of
// memory. The program's operator new fails the one request armed by size, so that the list's own
// memory runs out while everything else goes on.
#include <gtest/gtest.h>

#include <atomic>
#include <cstdlib>
#include <new>
#include <string>

#include "kvorproperties.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "support/slot_fixture.h"
#include "svsim.h"

namespace {

std::atomic<size_t> gFailSize{0};

}  // namespace

void *operator new(std::size_t size) {
  size_t armed = gFailSize.load();
  if (armed != 0 && size == armed && gFailSize.compare_exchange_strong(armed, 0))
    throw std::bad_alloc();
  if (void *memory = std::malloc(size != 0 ? size : 1)) return memory;
  throw std::bad_alloc();
}

void *operator new(std::size_t size, const std::nothrow_t &) noexcept {
  try {
    return operator new(size);
  } catch (const std::bad_alloc &) {
    return nullptr;
  }
}

// This program's operator new takes its memory from malloc, so free is the matching release.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wmismatched-new-delete"
void operator delete(void *memory) noexcept { std::free(memory); }
void operator delete(void *memory, std::size_t) noexcept { std::free(memory); }
#pragma GCC diagnostic pop

namespace {

using StateNoMemory = SlotFixture;

TEST_F(StateNoMemory, NoMemoryForTheScheduleNamesIsAStatusAndTheNextChangeFindsThem) {
  // The normalised 300-byte name is the only request of 301 bytes on the way.
  const std::string name(300, 'S');
  const uint32_t session = MakeSession("", kvMode_FrameOutStream, "LIN1");
  const std::string names = "Normal,  " + name + "  ";
  ASSERT_EQ(kvSetProperty(session, kvPropSession_IntfLINSchedNames,
                          static_cast<uint32_t>(names.size() + 1), names.c_str()),
            0);
  SvHandle schedule = Keep(svsimMakeString(name.c_str()));
  gFailSize = name.size() + 1;
  EXPECT_EQ(kvsvWriteStateLINScheduleChange(session, &schedule), kvErrOutOfMemory);
  EXPECT_EQ(gFailSize.load(), 0u) << "the list asked for no such block";
  EXPECT_EQ(Slot(session)->nameList, nullptr);
  EXPECT_EQ(Slot(session)->listGuard.load(), 0u);
  uint32_t selected = 0;
  EXPECT_EQ(kvsimLinSchedule(session, &selected), 0) << "no schedule written";
  EXPECT_EQ(kvsvWriteStateLINScheduleChange(session, &schedule), 0);
  ASSERT_EQ(kvsimLinSchedule(session, &selected), 1);
  EXPECT_EQ(selected, 1u);
}

}  // namespace
