// Two threads that open the same text are served one after the other: the lookup leaves the lock
// held across the driver's open until the add, so the second finds the first's record and never
// opens the database itself.
#include <gtest/gtest.h>

#include <future>
#include <thread>

#include "database/db_life_manager.h"
#include "database/db_life_test_support.h"
#include "kvsim.h"
#include "kvsvplatform.h"

namespace {

using namespace nKVSVAPI100;
using kvsvtest::cHostText;

// What a host open by text does: look up, open at the driver if not found, register.
uint32_t OpenByText(const char *text, std::promise<void> *lookingUp = nullptr) {
  cDbLifeManager &m = GetDbLifeManager();
  cHostText name(text);
  if (lookingUp != nullptr) lookingUp->set_value();
  uint32_t found = 0;
  EXPECT_EQ(m.FindByName(name.Handle(), &found), 0);
  tDbObject object;
  Status status = 0;
  if (found == 0) {
    status = kvdbOpenDatabase(":memory:", &object.object);
    object.database = object.object;
  } else {
    object.object = found;  // database 0: a known text costs no holder
  }
  EXPECT_EQ(m.AddObject(name.Handle(), object, status, kDbOpenManual), 0);
  return object.object;
}

TEST(DbLifeConcurrency, SecondOpenOfATextWaitsForTheFirst) {
  kvsimReset();
  ASSERT_EQ(kvsimHold("kvdbOpenDatabase"), 0);
  std::future<uint32_t> first = std::async(std::launch::async, [] { return OpenByText("db"); });
  ASSERT_EQ(kvsimWaitParked("kvdbOpenDatabase", 1), 1);

  std::promise<void> lookingUp;
  std::future<void> secondStarted = lookingUp.get_future();
  std::future<uint32_t> second =
      std::async(std::launch::async, [&lookingUp] { return OpenByText("db", &lookingUp); });
  secondStarted.wait();
  ASSERT_EQ(kvsimRelease("kvdbOpenDatabase"), 0);

  const uint32_t opened = first.get();
  ASSERT_NE(opened, 0u);
  EXPECT_EQ(second.get(), opened);
  EXPECT_EQ(kvsimCountCalls("kvdbOpenDatabase"), 1) << "the second found the first's record";

  uint32_t last = 9;
  EXPECT_EQ(GetDbLifeManager().ReleaseByHandle(opened, &last), 0);
  EXPECT_EQ(last, 1u) << "one holder for both opens";
  kvsimReset();
}

}  // namespace
