// The status block of the global managers: worst code wins, and where it came from.
#include "core/status_block.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>

namespace {

using namespace nKVSVAPI100;

struct tWorstOfCase {
  int64_t held;
  int64_t given;
  bool stored;
};

TEST(StatusBlock, WorstOfRule) {
  const tWorstOfCase cases[] = {
      {0, -52003, true},  // nothing held: an error is taken
      {0, 7, true},       // nothing held: a warning is taken
      {0, 0, false},      // a zero code changes nothing
      {7, -5, true},      // an error displaces a warning
      {7, 9, false},      // a second warning does not
      {7, 0, false},      // nor does a zero code
      {-5, -9, false},    // the first error stays
      {-5, 7, false},     // against a warning too
      {-5, 0, false},     // and against a zero code
  };
  for (const tWorstOfCase &c : cases) {
    tStatusBlock block;
    SetStatusBlock(block, c.held, "first", "first.cpp", 10);
    EXPECT_EQ(SetStatusBlock(block, c.given, "second", "second.cpp", 20), c.stored)
        << c.held << " then " << c.given;
    EXPECT_EQ(block.code, c.stored ? c.given : c.held) << c.held << " then " << c.given;
    // The place goes with the code that is kept.
    const bool secondPlace = c.stored;
    const bool firstPlace = !c.stored && c.held != 0;
    if (secondPlace || firstPlace) {
      EXPECT_STREQ(block.component, secondPlace ? "second" : "first");
      EXPECT_STREQ(block.file, secondPlace ? "second.cpp" : "first.cpp");
      EXPECT_EQ(block.line, secondPlace ? 20u : 10u);
    } else {
      EXPECT_EQ(block.component[0], '\0');
      EXPECT_EQ(block.file[0], '\0');
      EXPECT_EQ(block.line, 0u);
    }
    EXPECT_EQ(block.detail, 0u);
  }
}

// A path whose every character tells its position, so that a cut one off shows.
std::string NumberedPath(size_t length) {
  std::string path;
  for (size_t i = 0; i < length; ++i) path += static_cast<char>('!' + i % 90);
  return path;
}

TEST(StatusBlock, LongPathsKeepTheirStartAndEnd) {
  for (size_t length : {0u, 1u, 49u, 99u, 100u, 101u, 102u, 180u, 4096u}) {
    const std::string path = NumberedPath(length);
    tStatusBlock block;
    ASSERT_TRUE(SetStatusBlock(block, -1, "kvsvapi", path.c_str(), 1));
    const std::string expected =
        length <= 100 ? path : path.substr(0, 49) + ".." + path.substr(length - 49);
    EXPECT_EQ(std::string(block.file), expected) << length;
    EXPECT_LE(std::strlen(block.file), 100u);
  }
}

TEST(StatusBlock, ComponentIsCutToNineCharacters) {
  const struct {
    const char *given;
    const char *kept;
  } cases[] = {
      {"kvsvapi", "kvsvapi"},
      {"123456789", "123456789"},
      {"0123456789", "012345678"},
      {"kvsvapi-session-manager", "kvsvapi-s"},
      {"", ""},
  };
  for (const auto &c : cases) {
    tStatusBlock block;
    SetStatusBlock(block, -1, c.given, "f.cpp", 1);
    EXPECT_STREQ(block.component, c.kept) << c.given;
  }
}

TEST(StatusBlock, ASmallerBlockTakesTheCodeButNotThePlace) {
  tStatusBlock block;
  EXPECT_EQ(block.size, 216u) << "a block starts with its full size";
  block.size = 16;
  EXPECT_TRUE(SetStatusBlock(block, -52003, "kvsvapi", "core.cpp", 655));
  EXPECT_EQ(block.code, -52003);
  EXPECT_EQ(block.component[0], '\0');
  EXPECT_EQ(block.file[0], '\0');
  EXPECT_EQ(block.line, 0u);
}

}  // namespace
