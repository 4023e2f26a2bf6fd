// kvdbCloseDatabase: a handle of no loaded database is refused, whatever else it names; an error
// handle answers with its failure.
#include "kvor_test_support.h"

namespace {

using KvorDatabaseClose = KvorTest;

TEST_F(KvorDatabaseClose, HandlesOfOtherObjectsAreNoDatabases) {
  uint32_t system = 0;
  ASSERT_EQ(kvSystemOpen(&system), 0);
  const uint32_t session = Create("CAN1", kvMode_FrameInStream);
  for (uint32_t handle : {0u, 1u, 0x03000001u, system, session, 0xFFFFFFFFu}) {
    for (uint32_t closeAll : {0u, 1u}) {
      kvsimLogClear();
      EXPECT_EQ(kvdbCloseDatabase(handle, closeAll), kvsimErrInvalidDatabase)
          << std::hex << handle << " closeAll " << closeAll;
      kvsimCallRecord record;
      ASSERT_EQ(kvsimLogEntry(0, &record), 1);
      EXPECT_STREQ(record.function, "kvdbCloseDatabase");
      EXPECT_EQ(record.object, handle);
      EXPECT_EQ(record.size1, closeAll);
      EXPECT_EQ(record.status, kvsimErrInvalidDatabase);
    }
  }
  EXPECT_EQ(kvsimOpenSessionCount(), 1) << "a session handle is not closed as a database";
  EXPECT_EQ(kvsimOpenSystemCount(), 1);
}

}  // namespace
