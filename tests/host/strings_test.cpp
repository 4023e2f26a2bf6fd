// Counted strings: the host's printf dialect, case-insensitive comparison, strings from bytes.
#include <gtest/gtest.h>

#include <functional>
#include <string>

#include "host_fixture.h"

namespace {

using Strings = HostTest;

struct PrintfCase {
  const char *name;
  std::function<int32_t(SvHandle target, SvHandle inserted)> print;
  const char *expected;
};

// `inserted` is a string handle holding "Powertrain", for the %H rows.
const PrintfCase kPrintfCases[] = {
    {"PlainText", [](SvHandle t, SvHandle) { return svStrPrintf(t, "kvor"); }, "kvor"},
    {"CString", [](SvHandle t, SvHandle) { return svStrPrintf(t, "%s", "kvsvapi.*"); },
     "kvsvapi.*"},
    {"NullCString",
     [](SvHandle t, SvHandle) { return svStrPrintf(t, "<%s>", (const char *)nullptr); }, "<>"},
    {"LongHexPadded",
     [](SvHandle t, SvHandle) { return svStrPrintf(t, "%08lx", (unsigned long)0xdeadbeefUL); },
     "deadbeef"},
    {"LongHexShortValue", [](SvHandle t, SvHandle) { return svStrPrintf(t, "%08lx", 0x1fUL); },
     "0000001f"},
    {"ReferenceName",
     [](SvHandle t, SvHandle) { return svStrPrintf(t, "%s%08lx", "___kvorSesn#", 0x00010002UL); },
     "___kvorSesn#00010002"},
    {"UpperHex", [](SvHandle t, SvHandle) { return svStrPrintf(t, "%X", 0xabcU); }, "ABC"},
    {"HexWidthSpaces", [](SvHandle t, SvHandle) { return svStrPrintf(t, "[%4x]", 0xaU); },
     "[   a]"},
    {"HexLeftAligned", [](SvHandle t, SvHandle) { return svStrPrintf(t, "[%-4x]", 0xaU); },
     "[a   ]"},
    {"ZeroPaddedUpperHex", [](SvHandle t, SvHandle) { return svStrPrintf(t, "%04X", 0xbeU); },
     "00BE"},
    {"Character", [](SvHandle t, SvHandle) { return svStrPrintf(t, "%c%c", 'O', 'K'); }, "OK"},
    {"Unsigned", [](SvHandle t, SvHandle) { return svStrPrintf(t, "%u", 4294967295U); },
     "4294967295"},
    {"Signed", [](SvHandle t, SvHandle) { return svStrPrintf(t, "%d", -42); }, "-42"},
    {"SignedZeroPadded", [](SvHandle t, SvHandle) { return svStrPrintf(t, "%05d", -42); }, "-0042"},
    {"SignedWidth", [](SvHandle t, SvHandle) { return svStrPrintf(t, "%5d", 42); }, "   42"},
    {"LongSigned", [](SvHandle t, SvHandle) { return svStrPrintf(t, "%ld", -9000000000L); },
     "-9000000000"},
    {"LongUnsigned",
     [](SvHandle t, SvHandle) { return svStrPrintf(t, "%lu", 18446744073709551615UL); },
     "18446744073709551615"},
    {"LongLongHex", [](SvHandle t, SvHandle) { return svStrPrintf(t, "%llx", 0x123456789abcULL); },
     "123456789abc"},
    {"Percent", [](SvHandle t, SvHandle) { return svStrPrintf(t, "100%%"); }, "100%"},
    {"StringWidth", [](SvHandle t, SvHandle) { return svStrPrintf(t, "[%6s]", "ab"); }, "[    ab]"},
    {"StringPrecision", [](SvHandle t, SvHandle) { return svStrPrintf(t, "%.2s", "abcdef"); },
     "ab"},
    {"HostString", [](SvHandle t, SvHandle h) { return svStrPrintf(t, "%H", h); }, "Powertrain"},
    {"HostStringInText",
     [](SvHandle t, SvHandle h) { return svStrPrintf(t, "Speed\n%H.%s", h, "CAN_A"); },
     "Speed\nPowertrain.CAN_A"},
    {"HostStringLeftAligned", [](SvHandle t, SvHandle h) { return svStrPrintf(t, "[%-12H]", h); },
     "[Powertrain  ]"},
    {"NullHostString",
     [](SvHandle t, SvHandle) { return svStrPrintf(t, "<%H>", (SvHandle) nullptr); }, "<>"},
    {"Mixed",
     [](SvHandle t, SvHandle h) { return svStrPrintf(t, "%s %d %H %c %lu", "a", 7, h, 'z', 9UL); },
     "a 7 Powertrain z 9"},
};

TEST_F(Strings, PrintfFormatsEachDirective) {
  SvHandle inserted = svsimMakeString("Powertrain");
  for (const PrintfCase &c : kPrintfCases) {
    SvHandle target = svNewHandleClr(8);
    const int32_t written = c.print(target, inserted);
    EXPECT_EQ(written, static_cast<int32_t>(std::string(c.expected).size())) << c.name;
    EXPECT_EQ(Text(target), c.expected) << c.name;
    EXPECT_GE(svGetHandleSize(target), 4 + std::string(c.expected).size()) << c.name;
    svDisposeHandle(target);
  }
  svDisposeHandle(inserted);
}

TEST_F(Strings, PrintfTreatsEmptyHostStringsAsEmpty) {
  SvHandle noBlockCount = svNewHandleClr(8);  // Count 0.
  SvHandle target = svNewHandleClr(8);
  EXPECT_EQ(svStrPrintf(target, "<%H>", noBlockCount), 2);
  EXPECT_EQ(Text(target), "<>");
  svDisposeHandle(target);
  svDisposeHandle(noBlockCount);
}

TEST_F(Strings, PrintfReplacesTheTextAndGrowsOnlyWhenNeeded) {
  SvHandle target = svNewHandleClr(4);
  svsimSetMoveOnResize(1);
  svsimResetCounters();
  ASSERT_EQ(svStrPrintf(target, "%s", "a long text that needs room"), 27);
  EXPECT_EQ(svsimResizeCount(), 1u);
  ASSERT_EQ(svStrPrintf(target, "ab"), 2);
  EXPECT_EQ(Text(target), "ab");
  EXPECT_EQ(svsimResizeCount(), 1u) << "a text that fits needs no resize";
  svDisposeHandle(target);
}

TEST_F(Strings, PrintfRejectsMalformedDirectives) {
  SvHandle target = svsimMakeString("kept");
  for (const char *format : {"%q", "tail %", "%ls", "%l", "%99999999999d"}) {
    EXPECT_EQ(svStrPrintf(target, format, 1), SVSIM_PRINTF_BAD_FORMAT) << format;
    EXPECT_EQ(Text(target), "kept") << format;
  }
  EXPECT_EQ(svStrPrintf(nullptr, "x"), SVSIM_PRINTF_BAD_FORMAT);
  EXPECT_EQ(svStrPrintf(target, nullptr), SVSIM_PRINTF_BAD_FORMAT);
  svDisposeHandle(target);
}

TEST_F(Strings, PrintfFailsOnAFailedResizeAndKeepsTheOldText) {
  SvHandle target = svsimMakeString("old");
  svsimFailResizeAt(1);
  EXPECT_EQ(svStrPrintf(target, "%s", "a text longer than the handle"), SVSIM_PRINTF_NO_MEMORY);
  EXPECT_EQ(Text(target), "old");
  svsimFailAll(1);
  EXPECT_EQ(svStrPrintf(target, "%08lx", 1UL), SVSIM_PRINTF_NO_MEMORY);
  EXPECT_EQ(svStrPrintf(target, "ab"), 2) << "a text that fits needs no memory";
  svDisposeHandle(target);
}

struct CompareCase {
  const char *a;  // Null: a null block.
  const char *b;
  int sign;
};

int Sign(int32_t v) { return (v > 0) - (v < 0); }

TEST_F(Strings, CaseCompareIgnoresCaseAndOrdersByText) {
  const CompareCase cases[] = {
      {"abc", "ABC", 0},  {"Session", "sESSION", 0}, {"abc", "abd", -1}, {"b", "A", 1},
      {"ab", "abc", -1},  {"abc", "AB", 1},          {nullptr, "", 0},   {nullptr, nullptr, 0},
      {nullptr, "a", -1}, {"CAN1", "can2", -1},
  };
  for (const CompareCase &c : cases) {
    SvHandle a = c.a == nullptr ? nullptr : svsimMakeString(c.a);
    SvHandle b = c.b == nullptr ? nullptr : svsimMakeString(c.b);
    const SvStr *blockA = a == nullptr ? nullptr : static_cast<const SvStr *>(*a);
    const SvStr *blockB = b == nullptr ? nullptr : static_cast<const SvStr *>(*b);
    const char *nameA = c.a ? c.a : "(null)";
    const char *nameB = c.b ? c.b : "(null)";
    EXPECT_EQ(Sign(svStrCaseCmp(blockA, blockB)), c.sign) << nameA << " vs " << nameB;
    EXPECT_EQ(Sign(svStrCaseCmp(blockB, blockA)), -c.sign) << nameB << " vs " << nameA;
    if (a != nullptr) svDisposeHandle(a);
    if (b != nullptr) svDisposeHandle(b);
  }
}

TEST_F(Strings, StrFromPtrMakesOrGrowsTheString) {
  SvHandle made = nullptr;
  ASSERT_EQ(svStrFromPtr(&made, 5, "CAN1x"), 0);
  ASSERT_NE(made, nullptr);
  EXPECT_EQ(Text(made), "CAN1x");

  SvHandle small = svNewHandleClr(4);
  ASSERT_EQ(svStrFromPtr(&small, 9, "FlexRay1!"), 0);
  EXPECT_EQ(Text(small), "FlexRay1!");

  SvHandle large = svNewHandleClr(64);
  SvHandle kept = large;
  ASSERT_EQ(svStrFromPtr(&large, 0, nullptr), 0);
  EXPECT_EQ(large, kept);
  EXPECT_EQ(Count(large), 0);
  EXPECT_EQ(svGetHandleSize(large), 64u);

  svDisposeHandle(made);
  svDisposeHandle(small);
  svDisposeHandle(large);
}

TEST_F(Strings, StrFromPtrRefusesBadArgumentsAndReportsFaults) {
  SvHandle string = nullptr;
  EXPECT_EQ(svStrFromPtr(nullptr, 1, "a"), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svStrFromPtr(&string, -1, "a"), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svStrFromPtr(&string, 3, nullptr), SVSIM_ERR_ARGUMENT);
  svsimFailAllocAt(1);
  EXPECT_EQ(svStrFromPtr(&string, 3, "abc"), SVSIM_ERR_MEMORY);
  EXPECT_EQ(string, nullptr);
}

using StringsDeathTest = HostTest;

TEST_F(StringsDeathTest, ACountPastTheHandleStopsTheProcess) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  SvHandle lying = svNewHandleClr(8);
  *static_cast<int32_t *>(*lying) = 5;  // Only 4 bytes of text fit.
  SvHandle target = svNewHandleClr(8);
  EXPECT_DEATH(svStrPrintf(target, "%H", lying), "svStrPrintf.*count runs past");
  svDisposeHandle(target);
  svDisposeHandle(lying);
}

}  // namespace
