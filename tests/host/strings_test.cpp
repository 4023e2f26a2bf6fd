// Counted strings: the host's printf dialect, case-insensitive comparison, strings from bytes.
#include <gtest/gtest.h>

#include <string>

#include "host_fixture.h"

namespace {

using Strings = HostTest;

struct PrintfCase {
  int32_t (*print)(SvHandle target, SvHandle inserted);
  const char *expected;
};

// One row: the format and arguments given to svStrPrintf, and the text it must give.
#define PRINTF_ROW(expected, ...)                                                         \
  {                                                                                       \
    [](SvHandle t, SvHandle h) { return (void)h, svStrPrintf(t, __VA_ARGS__); }, expected \
  }

TEST_F(Strings, PrintfFormatsEachDirective) {
  // The host string has room past its count, so that a text read by size rather than by count
  // shows.
  SvHandle inserted = svsimMakeString("Powertrain");
  ASSERT_EQ(svSetHandleSizeClr(inserted, 64), 0);
  const PrintfCase cases[] = {
      PRINTF_ROW("<>", "<%s>", static_cast<const char *>(nullptr)),
      PRINTF_ROW("___kvorSesn#00010002", "%s%08lx", "___kvorSesn#", 0x00010002UL),
      PRINTF_ROW("[   a|a   |00BE]", "[%4x|%-4x|%04X]", 0xaU, 0xaU, 0xbeU),
      PRINTF_ROW("4294967295 -42|-0042|   42", "%u %d|%05d|%5d", 4294967295U, -42, -42, 42),
      PRINTF_ROW("-9000000000 18446744073709551615 123456789abc", "%ld %lu %llx", -9000000000L,
                 18446744073709551615UL, 0x123456789abcULL),
      PRINTF_ROW("100% [    ab|ab]", "100%% [%6s|%.2s]", "ab", "abcdef"),
      PRINTF_ROW("Speed\nPowertrain.CAN_A", "Speed\n%H.%s", h, "CAN_A"),
      PRINTF_ROW("[Powertrain  ]<>", "[%-12H]<%H>", h, static_cast<SvHandle>(nullptr)),
      PRINTF_ROW("a 7 Powertrain z 9", "%s %d %H %c %lu", "a", 7, h, 'z', 9UL),
  };
  for (const PrintfCase &c : cases) {
    SCOPED_TRACE(c.expected);
    SvHandle target = svNewHandleClr(8);
    EXPECT_EQ(c.print(target, inserted), static_cast<int32_t>(std::string(c.expected).size()));
    EXPECT_EQ(Text(target), c.expected);
    EXPECT_GE(svGetHandleSize(target), 4 + std::string(c.expected).size());
    svDisposeHandle(target);
  }
  svDisposeHandle(inserted);
}

TEST_F(Strings, PrintfGrowsOnlyWhenNeededAndRefusesMalformedDirectivesKeepingTheOldText) {
  SvHandle target = svNewHandleClr(4);
  svsimSetMoveOnResize(1);
  svsimResetCounters();
  ASSERT_EQ(svStrPrintf(target, "%s", "a long text that needs room"), 27);
  ASSERT_EQ(svStrPrintf(target, "kept"), 4);
  EXPECT_EQ(svsimResizeCount(), 1u) << "a text that fits needs no resize";
  for (const char *format : {"%q", "tail %", "%ls", "%l", "%99999999999d"}) {
    EXPECT_EQ(svStrPrintf(target, format, 1), SVSIM_PRINTF_BAD_FORMAT) << format;
    EXPECT_EQ(Text(target), "kept") << format;
  }
  EXPECT_EQ(svStrPrintf(nullptr, "x"), SVSIM_PRINTF_BAD_FORMAT);
  EXPECT_EQ(svStrPrintf(target, nullptr), SVSIM_PRINTF_BAD_FORMAT);
  svsimFailResizeAt(1);
  EXPECT_EQ(svStrPrintf(target, "%s", "a text longer than the handle"), SVSIM_PRINTF_NO_MEMORY);
  EXPECT_EQ(Text(target), "kept");
  svsimFailAll(1);
  EXPECT_EQ(svStrPrintf(target, "%040lx", 1UL), SVSIM_PRINTF_NO_MEMORY);
  EXPECT_EQ(svStrPrintf(target, "ab"), 2) << "a text that fits needs no memory";
  svDisposeHandle(target);
}

int Sign(int32_t v) { return (v > 0) - (v < 0); }

TEST_F(Strings, CaseCompareIgnoresCaseAndOrdersByText) {
  const struct {
    const char *a;  // Null: a null block.
    const char *b;
    int sign;
  } cases[] = {
      {"abc", "ABC", 0},  {"Session", "sESSION", 0}, {"abc", "abd", -1}, {"b", "A", 1},
      {"ab", "abc", -1},  {"abc", "AB", 1},          {nullptr, "", 0},   {nullptr, nullptr, 0},
      {nullptr, "a", -1}, {"CAN1", "can2", -1},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message() << (c.a ? c.a : "(null)") << " vs " << (c.b ? c.b : "(null)"));
    SvHandle a = c.a == nullptr ? nullptr : svsimMakeString(c.a);
    SvHandle b = c.b == nullptr ? nullptr : svsimMakeString(c.b);
    const SvStr *blockA = a == nullptr ? nullptr : static_cast<const SvStr *>(*a);
    const SvStr *blockB = b == nullptr ? nullptr : static_cast<const SvStr *>(*b);
    EXPECT_EQ(Sign(svStrCaseCmp(blockA, blockB)), c.sign);
    EXPECT_EQ(Sign(svStrCaseCmp(blockB, blockA)), -c.sign);
    if (a != nullptr) svDisposeHandle(a);
    if (b != nullptr) svDisposeHandle(b);
  }
}

TEST_F(Strings, StrFromPtrMakesGrowsOrEmptiesTheString) {
  SvHandle made = nullptr;
  ASSERT_EQ(svStrFromPtr(&made, 5, "CAN1x"), 0);
  EXPECT_EQ(Text(made), "CAN1x");
  SvHandle small = svNewHandleClr(4);
  ASSERT_EQ(svStrFromPtr(&small, 9, "FlexRay1!"), 0);
  EXPECT_EQ(Text(small), "FlexRay1!");
  SvHandle large = svNewHandleClr(64);
  SvHandle kept = large;
  ASSERT_EQ(svStrFromPtr(&large, 0, nullptr), 0);
  EXPECT_EQ(large, kept);
  EXPECT_EQ(*static_cast<int32_t *>(*large), 0);
  EXPECT_EQ(svGetHandleSize(large), 64u);
  for (SvHandle h : {made, small, large}) svDisposeHandle(h);

  SvHandle string = nullptr;
  EXPECT_EQ(svStrFromPtr(nullptr, 1, "a"), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svStrFromPtr(&string, -1, "a"), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svStrFromPtr(&string, 3, nullptr), SVSIM_ERR_ARGUMENT);
  svsimFailAllocAt(1);
  EXPECT_EQ(svStrFromPtr(&string, 3, "abc"), SVSIM_ERR_MEMORY);
  EXPECT_EQ(string, nullptr);
}

}  // namespace
