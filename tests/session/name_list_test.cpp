// Name lists: cutting the driver's text and finding a name by whole or by qualifying prefix.
#include "session/name_list.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

namespace {

using nKVSVAPI100::cNameList;

TEST(NameList, CutsAtCommasDropsEmptyEntriesAndNormalises) {
  const struct {
    const char *text;
    bool valid;
    std::vector<std::string> names;
  } cases[] = {
      // A blank or newline ends a name.
      {" EngineSpeed ,,\tGear\nPowertrain.CAN , Msg One.Sig,",
       true,
       {"EngineSpeed", "Gear", "Msg"}},
      {"", true, {}},
      {nullptr, false, {}},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.text ? c.text : "(null)");
    const cNameList list(c.text);
    EXPECT_EQ(list.Valid(), c.valid);
    EXPECT_EQ(list.Names(), c.names);
    EXPECT_EQ(list.Find("A", 1), -1);
  }
}

TEST(NameList, FindsWholeNamesFirstThenThePartBeforeTheFirstDot) {
  const cNameList list("Brake.Front,Brake,Speed.Wheel.FL,Gear,Speedo");
  struct Case {
    const char *text;
    std::ptrdiff_t length;
    int expected;
  } cases[] = {
      {"Brake", 5, 1},  // the whole entry wins over an earlier prefix match
      {"Brake.Front", 11, 0},
      {"Speed", 5, 2},  // only the part before the first dot
      {"Speed.Wheel", 11, -1},
      {"Spee", 4, -1},     // a prefix of a part is no match
      {" Gear \n", 7, 3},  // the looked-up text is normalised too
      {"Gearbox", 4, 3},   // only `length` bytes count
      {"gear", 4, -1},     // case matters
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

}  // namespace
