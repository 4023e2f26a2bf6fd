// Shared pieces of the driver stand-in's tests: a fixture that starts and ends each test from a
// freshly reset driver, and readers for property values.
#ifndef KVOR_TEST_SUPPORT_H
#define KVOR_TEST_SUPPORT_H

#include <gtest/gtest.h>

#include <cstdint>
#include <string>
#include <vector>

#include "kvsim.h"
#include "kvsvplatform.h"

class KvorTest : public ::testing::Test {
 protected:
  // The interfaces of the stand-in's system, in the order the system lists them.
  static constexpr const char *kInterfaceNames[] = {"CAN1", "CAN2",     "CAN3",     "CAN4", "LIN1",
                                                    "LIN2", "FlexRay1", "FlexRay2", "ENET1"};

  void SetUp() override { kvsimReset(); }
  void TearDown() override { kvsimReset(); }

  // A session that must be made; a failure fails the test and gives 0.
  static uint32_t Create(const char *interfaceName, uint32_t mode, const char *list = "") {
    uint32_t handle = 0;
    const int32_t status = kvCreateSession("DB", "Cluster", list, interfaceName, mode, &handle);
    EXPECT_EQ(status, 0) << "creating a session on " << interfaceName;
    return handle;
  }

  static uint32_t OpenSystem() {
    uint32_t system = 0;
    EXPECT_EQ(kvSystemOpen(&system), 0);
    return system;
  }

  static uint32_t ReadU32(uint32_t object, uint32_t id) {
    uint32_t value = 0xDEADBEEF;
    EXPECT_EQ(kvGetProperty(object, id, sizeof value, &value), 0) << std::hex << id;
    return value;
  }

  // Text through the size the driver gives, which counts the NUL.
  static std::string ReadText(uint32_t object, uint32_t id) {
    uint32_t size = 0;
    EXPECT_EQ(kvGetPropertySize(object, id, &size), 0) << std::hex << id;
    if (size == 0) return "<no size>";
    std::vector<char> text(size, 'X');
    EXPECT_EQ(kvGetProperty(object, id, size, text.data()), 0) << std::hex << id;
    EXPECT_EQ(text.back(), '\0') << "text property " << std::hex << id << " lacks its NUL";
    return std::string(text.data());
  }

  static std::vector<uint32_t> ReadHandles(uint32_t object, uint32_t id) {
    uint32_t size = 0;
    EXPECT_EQ(kvGetPropertySize(object, id, &size), 0) << std::hex << id;
    EXPECT_EQ(size % 4, 0u);
    std::vector<uint32_t> handles(size / 4);
    if (!handles.empty()) {
      EXPECT_EQ(kvGetProperty(object, id, size, handles.data()), 0) << std::hex << id;
    }
    return handles;
  }
};

#endif
