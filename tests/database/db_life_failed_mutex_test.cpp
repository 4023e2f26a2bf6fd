// A database life manager whose mutex could not be made: each operation that would lock reports
// the failure with its own line and locks nothing, and an unknown handle is still answered as one.
// This program refuses priority inheritance to every mutex made before its tests start, which is
// when the manager is built.
#include <gtest/gtest.h>

#include "database/db_life_manager.h"
#include "database/db_life_test_support.h"
#include "kvsim.h"
#include "support/fake_error_log.h"
#include "support/refused_mutexes.h"

namespace {

using namespace nKVSVAPI100;
using kvsvtest::cHostText;

TEST(DbLifeFailedMutex, EachLockingOperationReportsItsLine) {
  kvsvtest::gRefuseMutexes = false;
  kvsimReset();
  cDbLifeManager &m = GetDbLifeManager();
  ASSERT_EQ(m.status.code, kMutexInitFailed);
  kvsvtest::cFakeErrorLog log;

  cHostText name("F1");
  uint32_t found = 9;
  EXPECT_EQ(m.FindByName(name.Handle(), &found), kvErrInternal);
  EXPECT_EQ(found, 0u);
  tDbObject object{0x80000102u, 0x80000100u, 0x20000, 0};
  EXPECT_EQ(m.AddObject(name.Handle(), object, 0, kDbOpenManual), 0);

  const uint32_t known = object.object;
  uint32_t last = 9;
  uint32_t count = 9;
  EXPECT_EQ(m.ReleaseByHandle(known, &last), kvErrInternal);
  EXPECT_EQ(m.ReleaseByName(name.Handle(), known, &last), kvErrInternal);
  EXPECT_EQ(m.BeginWalk(known, &count), kvErrInternal);
  EXPECT_EQ(m.RemoveDatabase(known), kvErrInternal);
  EXPECT_EQ(m.RemoveChildren(known), kvErrInternal);
  EXPECT_EQ(m.ReleaseByHandle(known + 1, &last), kvErrDbObjectNotFound)
      << "an unknown handle is answered before the lock is wanted";
  EXPECT_EQ(last, 1u);

  const uint32_t lines[] = {129, 300, 420, 544, 633, 672};
  const auto records = log.Records();
  ASSERT_EQ(records.size(), 6u);
  for (size_t i = 0; i < 6; ++i) {
    EXPECT_EQ(records[i].value.File(), 18u);
    EXPECT_EQ(records[i].value.Line(), lines[i]);
    EXPECT_EQ(records[i].value.info, static_cast<uint32_t>(kMutexInitFailed));
  }
}

}  // namespace
