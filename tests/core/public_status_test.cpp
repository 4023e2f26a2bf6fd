// From an internal status to the status that an export returns.
#include "core/public_status.h"

#include <gtest/gtest.h>

namespace {

using namespace nKVSVAPI100;

constexpr uint32_t kPathBase = 0x3FF63000;
constexpr uint32_t kPathMask = 0x7FFFFC00;
constexpr uint32_t kReportMask = 0x7FFFC000;

struct tPublicCase {
  const char *name;
  uint32_t location;
  uint32_t info;
  uint32_t mask;
  uint32_t expected;
  uint32_t kindAfter;
};

// Locations as the setters leave them: failed, component 22, file 1, line 76, and the kind.
constexpr uint32_t kUserAt = 0xD801404C;
constexpr uint32_t kInternalAt = 0xD801804C;
constexpr uint32_t kServiceAt = 0xD801C04C;

TEST(ToPublicStatus, ByKindAndFamily) {
  const tPublicCase cases[] = {
      {"empty", 0, 0xBFF63258, kPathMask, 0, 0},
      {"family user code keeps its low bits", kUserAt, 0xBFF63258, kPathMask, 0xBFF63258, 1},
      {"family user code 0x259", kUserAt, 0xBFF63259, kPathMask, 0xBFF63259, 1},
      {"foreign user code turns internal", kUserAt, 0xBFFA4001, kPathMask, 0xBFF63001, 2},
      {"user code outside the mask's family", kUserAt, 0xBFF67258, kPathMask, 0xBFF63001, 2},
      {"internal kind", kInternalAt, 1, kPathMask, 0xBFF63001, 2},
      {"system service with a family code", kServiceAt, 0xBFF63258, kPathMask, 0xBFF63001, 3},
      // The reporter's wider mask keeps fourteen low bits and a family of its own.
      {"reporter mask, user code", kUserAt, 0xBFF63258, kReportMask, 0xBFF63258, 1},
      {"reporter mask, system service", kServiceAt, 0, kReportMask, 0xBFF60001, 3},
      // Bit 31 of the result is the failed flag, not bit 31 of the code.
      {"user code without its top bit", kUserAt, 0x3FF63258, kPathMask, 0xBFF63258, 1},
      {"kind set but not failed", 0x0000404C, 0xBFF63258, kPathMask, 0x3FF63258, 1},
  };
  for (const tPublicCase &c : cases) {
    tInternalStatus value;
    value.location = c.location;
    value.info = c.info;
    EXPECT_EQ(static_cast<uint32_t>(ToPublicStatus(value, kPathBase, c.mask)), c.expected)
        << c.name;
    EXPECT_EQ(value.Kind(), c.kindAfter) << c.name;
    // Only the kind may change; location and info stay.
    EXPECT_EQ(value.location & ~(3u << 14), c.location & ~(3u << 14)) << c.name;
    EXPECT_EQ(value.info, c.info) << c.name;
  }
}

}  // namespace
