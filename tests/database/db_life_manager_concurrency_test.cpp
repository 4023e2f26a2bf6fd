// Two threads that open the same text are served one after the other: the lookup leaves the lock
// held across the driver's open until the add, so the second finds the first's record and never
// opens the database itself.
#include <gtest/gtest.h>

#include <functional>
#include <future>

#include "database/db_life_manager.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "svsim.h"

namespace {

using namespace nKVSVAPI100;

constexpr uint32_t kDbClassDatabase = 0;

// What a host open by text does: look up, open at the driver if not found, register.
uint32_t OpenByText(std::promise<void> &lookingUp) {
  const SvHandle name = svsimMakeString("db");
  lookingUp.set_value();
  tDbObject object;
  EXPECT_EQ(GetDbLifeManager().FindByName(name, &object.object), 0);
  const Status status = object.object != 0 ? 0 : kvdbOpenDatabase(":memory:", &object.database);
  if (object.object == 0) object.object = object.database;  // else database 0: no holder more
  EXPECT_EQ(GetDbLifeManager().AddObject(name, object, status, kDbOpenManual), 0);
  svDisposeHandle(name);
  return object.object;
}

TEST(DbLifeConcurrency, SecondOpenOfATextWaitsForTheFirst) {
  ASSERT_EQ(kvsimHold("kvdbOpenDatabase"), 0);
  std::promise<void> started[2];
  std::future<uint32_t> first = std::async(std::launch::async, OpenByText, std::ref(started[0]));
  ASSERT_EQ(kvsimWaitParked("kvdbOpenDatabase", 1), 1);
  std::future<uint32_t> second = std::async(std::launch::async, OpenByText, std::ref(started[1]));
  started[1].get_future().wait();
  ASSERT_EQ(kvsimRelease("kvdbOpenDatabase"), 0);
  const uint32_t opened = first.get();
  EXPECT_EQ(second.get(), opened);
  EXPECT_EQ(kvsimCountCalls("kvdbOpenDatabase"), 1) << "the second found the first's record";
  uint32_t last = 9;
  EXPECT_EQ(GetDbLifeManager().ReleaseByHandle(opened, &last), 0);
  EXPECT_EQ(last, 1u) << "one holder for both opens";
}

// The host's own opens of one text on two threads: one driver open, and the first close ends it.
TEST(DbLifeConcurrency, TwoAutomaticOpensOfOneTextMakeOneDriverOpen) {
  kvsimReset();
  ASSERT_EQ(kvsimHold("kvdbOpenDatabase"), 0);
  const auto open = [](std::promise<void> &started) {
    SvHandle name = svsimMakeString(":memory:");
    uint32_t handle = 0;
    started.set_value();
    EXPECT_EQ(kvsvdbAutoOpenDbObject(&name, kDbClassDatabase, &handle, 0), 0);
    svDisposeHandle(name);
    return handle;
  };
  std::promise<void> started[2];
  std::future<uint32_t> first = std::async(std::launch::async, open, std::ref(started[0]));
  ASSERT_EQ(kvsimWaitParked("kvdbOpenDatabase", 1), 1);
  std::future<uint32_t> second = std::async(std::launch::async, open, std::ref(started[1]));
  started[1].get_future().wait();
  ASSERT_EQ(kvsimRelease("kvdbOpenDatabase"), 0);
  const uint32_t opened = first.get();
  EXPECT_EQ(second.get(), opened);
  EXPECT_EQ(kvsimCountCalls("kvdbOpenDatabase"), 1);
  EXPECT_EQ(kvsvdbAutoCloseDbObject(opened), 0);
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 0);
}

}  // namespace
