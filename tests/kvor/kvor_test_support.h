// The fixture of the driver stand-in's tests: each starts and ends with a freshly reset driver.
#ifndef KVOR_TEST_SUPPORT_H
#define KVOR_TEST_SUPPORT_H

#include "support/database_reads.h"

class KvorTest : public ::testing::Test {
 protected:
  void SetUp() override { kvsimReset(); }
  void TearDown() override { kvsimReset(); }

  // A session that must be made; a failure fails the test and gives 0.
  static uint32_t Create(const char *interfaceName, uint32_t mode, const char *list = "") {
    uint32_t handle = 0;
    EXPECT_EQ(kvCreateSession("DB", "", list, interfaceName, mode, &handle), 0)
        << "creating a session on " << interfaceName;
    return handle;
  }
};

#endif
