// Status texts belong to the driver: the library hands every request on as it stands.
#include <gtest/gtest.h>

#include <cstring>

#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"

namespace {

class StatusText : public testing::Test {
 protected:
  void SetUp() override { kvsimReset(); }
  void TearDown() override { kvsimReset(); }
};

TEST_F(StatusText, GivesTheDriversTextForEveryStatusAndSize) {
  const struct {
    int32_t status;
    uint32_t size;
  } cases[] = {
      {kvsimErrTimeout, 256},  {kvsimErrInvalidSession, 12},
      {kvErrSessionBusy, 256}, {kvErrInternal, 1},
      {kvsimErrTimeout, 0},    {0, 256},
      {0x3FF62040, 256},       {static_cast<int32_t>(0xDEADBEEF), 40},
  };
  for (const auto &c : cases) {
    char ours[300];
    char drivers[300];
    std::memset(ours, '#', sizeof ours);
    std::memset(drivers, '#', sizeof drivers);
    kvStatusToString(c.status, c.size, drivers);
    kvsimLogClear();

    kvsvStatusToString(c.status, c.size, ours);
    EXPECT_EQ(std::memcmp(ours, drivers, sizeof ours), 0) << std::hex << c.status;
    ASSERT_EQ(kvsimLogCount(), 1) << std::hex << c.status;
    kvsimCallRecord call{};
    ASSERT_EQ(kvsimLogEntry(0, &call), 1);
    EXPECT_STREQ(call.function, "kvStatusToString");
    EXPECT_EQ(call.object, static_cast<uint32_t>(c.status));
    EXPECT_EQ(call.size1, c.size);
  }
}

}  // namespace
