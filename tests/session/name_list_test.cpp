// Name lists: cutting the driver's text and finding a name by whole or by qualifying prefix.
#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "session/name_list.h"

namespace {

using nKVSVAPI100::cNameList;

TEST(NameList, CutsAtCommasDropsEmptyEntriesAndNormalises) {
  const cNameList list(" EngineSpeed ,,\tGear\nPowertrain.CAN , Msg One.Sig,");
  ASSERT_TRUE(list.Valid());
  EXPECT_EQ(list.Names(), (std::vector<std::string>{"EngineSpeed", "Gear", "Msg"}))
      << "a blank or newline ends a name";
}

TEST(NameList, NullTextLeavesAnInvalidEmptyList) {
  const cNameList list(nullptr);
  EXPECT_FALSE(list.Valid());
  EXPECT_TRUE(list.Names().empty());
  EXPECT_EQ(list.Find("A", 1), -1);
}

TEST(NameList, FindsWholeNamesFirstThenThePartBeforeTheFirstDot) {
  const cNameList list("Brake.Front,Brake,Speed.Wheel.FL,Gear,Speedo");
  struct Case {
    const char *text;
    std::ptrdiff_t length;
    int expected;
  } cases[] = {
      {"Brake", 5, 1},         // the whole entry wins over an earlier prefix match
      {"Brake.Front", 11, 0},
      {"Speed", 5, 2},         // only the part before the first dot
      {"Speed.Wheel", 11, -1},
      {"Spee", 4, -1},         // a prefix of a part is no match
      {" Gear \n", 7, 3},      // the looked-up text is normalised too
      {"Gearbox", 4, 3},       // only `length` bytes count
      {"gear", 4, -1},         // case matters
      {"", 0, -1},
      {"Gear", -1, -1},
      {nullptr, 4, -1},
      {"Nothing", 7, -1},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.text ? c.text : "(null)");
    EXPECT_EQ(list.Find(c.text, c.length), c.expected);
  }
}

TEST(NameList, EmptyTextGivesAValidListThatFindsNothing) {
  const cNameList list("");
  EXPECT_TRUE(list.Valid());
  EXPECT_EQ(list.Find("A", 1), -1);
}

}  // namespace
