// A database life manager whose mutex could not be made: each operation that would lock reports
// the failure with its own line and locks nothing, and an unknown handle is still answered as one.
// This program refuses priority inheritance to every mutex made before its tests start, which is
// when the manager is built.
#include <gtest/gtest.h>

#include <vector>

#include "database/db_life_manager.h"
#include "support/fake_error_log.h"
#include "support/refused_mutexes.h"
#include "svsim.h"

namespace {

using namespace nKVSVAPI100;

TEST(DbLifeFailedMutex, EachLockingOperationReportsItsLine) {
  kvsvtest::gRefuseMutexes = false;
  cDbLifeManager &m = GetDbLifeManager();
  ASSERT_EQ(m.status.code, kMutexInitFailed);
  kvsvtest::cFakeErrorLog log;
  const SvHandle name = svsimMakeString("F1");
  tDbObject object{0x80000102u, 0x80000100u, 0x20000, 0};
  uint32_t known = 9, last = 9;
  EXPECT_EQ(m.FindByName(name, &known), kvErrInternal);
  EXPECT_EQ(known, 0u);
  EXPECT_EQ(m.AddObject(name, object, 0, kDbOpenManual), 0);
  known = object.object;
  for (Status s : {m.ReleaseByHandle(known, &last), m.ReleaseByName(name, known, &last),
                   m.BeginWalk(known, &last), m.RemoveDatabase(known), m.RemoveChildren(known)})
    EXPECT_EQ(s, kvErrInternal);
  EXPECT_EQ(m.ReleaseByHandle(known + 1, &last), kvErrDbObjectNotFound)
      << "an unknown handle is answered before the lock is wanted";
  EXPECT_EQ(last, 1u);
  svDisposeHandle(name);
  std::vector<uint32_t> lines;
  for (const kvsvtest::tLogRecord &r : log.Records()) {
    EXPECT_EQ(r.value.File(), 18u);
    EXPECT_EQ(r.value.info, static_cast<uint32_t>(kMutexInitFailed));
    lines.push_back(r.value.Line());
  }
  EXPECT_EQ(lines, (std::vector<uint32_t>{129, 300, 420, 544, 633, 672}));
}

}  // namespace
