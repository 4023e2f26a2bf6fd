// The internal status word: where the first failure happened, packed into 32 bits.
#include "core/internal_status.h"

#include <gtest/gtest.h>

namespace {

using namespace nKVSVAPI100;

enum class eSetter { kSystemService, kInternal, kUser };

void Set(tInternalStatus &status, eSetter setter, uint32_t component, uint32_t file, uint32_t line,
         uint32_t number) {
  switch (setter) {
    case eSetter::kSystemService:
      status.SetSystemServiceFailure(component, file, line, number);
      break;
    case eSetter::kInternal:
      status.SetInternalFailure(component, file, line);
      break;
    case eSetter::kUser:
      status.SetUserFailure(component, file, line, number);
      break;
  }
}

struct tSetterCase {
  eSetter setter;
  uint32_t component, file, line, number;
  uint32_t location, info;
};

TEST(InternalStatus, SettersPackTheLocationWord) {
  const tSetterCase cases[] = {
      // failed | component 13 << 26 | file 16 << 16 | kind 3 << 14 | line 782
      {eSetter::kSystemService, 13, 16, 782, 0xBFFA1234, 0xB410C30E, 0xBFFA1234},
      // The internal setter always carries info 1, whatever number is at hand.
      {eSetter::kInternal, 22, 1, 76, 99, 0xD801804C, 1},
      {eSetter::kUser, 22, 1, 71, 0xBFF63259, 0xD8014047, 0xBFF63259},
      // Fields wider than their bits are cut and do not spill into their neighbours.
      {eSetter::kUser, 33, 0x401, 0x4001, 7, 0x84014001, 7},
      {eSetter::kSystemService, 31, 1023, 16383, 0, 0xFFFFFFFF, 0},
  };
  for (const tSetterCase &c : cases) {
    tInternalStatus status;
    ASSERT_FALSE(status.Failed());
    ASSERT_EQ(status.Kind(), uint32_t{tInternalStatus::kEmpty});
    ASSERT_EQ(status.info, 0u);
    Set(status, c.setter, c.component, c.file, c.line, c.number);
    EXPECT_EQ(status.location, c.location) << std::hex << c.location;
    EXPECT_EQ(status.info, c.info) << std::hex << c.location;
  }
}

TEST(InternalStatus, TheFirstFailureStays) {
  for (eSetter first : {eSetter::kSystemService, eSetter::kInternal, eSetter::kUser}) {
    tInternalStatus status;
    Set(status, first, 13, 9, 100, 0xBFF63010);
    const tInternalStatus before = status;
    for (eSetter later : {eSetter::kSystemService, eSetter::kInternal, eSetter::kUser}) {
      Set(status, later, 22, 1, 413, 0xBFF63258);
      EXPECT_EQ(status.location, before.location);
      EXPECT_EQ(status.info, before.info);
    }
  }
}

TEST(InternalStatus, ASetKindWithoutTheFailedFlagIsOverwritten) {
  tInternalStatus status;
  status.SetKind(tInternalStatus::kUser);
  status.SetInternalFailure(13, 2, 10);
  EXPECT_TRUE(status.Failed());
  EXPECT_EQ(status.Kind(), uint32_t{tInternalStatus::kInternal});
  EXPECT_EQ(status.Line(), 10u);
}

TEST(InternalStatus, KindNamesAndSeveritiesOfTheLog) {
  struct {
    uint32_t kind;
    const char *name;
    uint32_t severity;
  } const cases[] = {
      {tInternalStatus::kUser, "User", 1},
      {tInternalStatus::kInternal, "Internal", 2},
      {tInternalStatus::kSystemService, "System Service", 2},
  };
  for (const auto &c : cases) {
    EXPECT_STREQ(KindName(c.kind), c.name);
    EXPECT_EQ(KindSeverity(c.kind), c.severity) << c.name;
  }
}

}  // namespace
