// Creating, growing and freeing host data, against the host stand-in: its counters show what the
// helpers asked of the host, its faults show what they do when the host says no.
#include "core/host_handles.h"

#include <gtest/gtest.h>

#include <string>
#include <tuple>

#include "support/fake_error_log.h"
#include "svsim.h"

namespace {

using namespace nKVSVAPI100;

class HostHandles : public testing::Test {
 protected:
  void SetUp() override { liveBefore_ = svsimReset(); }
  // Every test frees what it made: the helpers leave nothing behind.
  void TearDown() override {
    svsimReset();
    EXPECT_EQ(svsimLiveHandles(), liveBefore_);
    EXPECT_EQ(svsimLiveVariants(), 0u);
  }

  // The elements of an array of strings (mode 0) or the names of an array of variants (mode 2),
  // each followed by '|'. A string handle holds its count word and its text.
  static std::string Items(SvHandle array, int32_t mode) {
    std::string items;
    for (int32_t i = 0; i < ArrayCount(array); ++i) {
      char text[64] = {};
      const SvHandle string = ArrayData8<SvHandle>(array)[i];
      const int32_t length =
          mode == 2 ? svsimVariantGetStringAttr(ArrayData8<uint64_t>(array) + i, "n", text, 64)
          : string  ? svsimReadString(string, text, sizeof text)
                    : -1;
      items += (length < 0 ? "<none>" : std::string(text, static_cast<size_t>(length))) + "|";
      if (mode == 0 && string != nullptr) {
        EXPECT_EQ(svGetHandleSize(string), 8u + length);
      }
    }
    return items;
  }
  // An array of `capacity` 8-byte elements holding `count` of them, each its index + 1.
  static SvHandle MakeArray(uint32_t capacity, int32_t count) {
    SvHandle array = svNewHandleClr(8 + capacity * 8u);
    ArrayCount(array) = count;
    for (int32_t i = 0; i < count; ++i) ArrayData8<uint64_t>(array)[i] = i + 1u;
    return array;
  }

  uint64_t liveBefore_ = 0;
};

TEST_F(HostHandles, ResizeOrCreateHandleLeavesTheHandleAsItWasOnAnyRefusal) {
  SvHandle handle = nullptr;
  svsimFailAllocAt(1);
  EXPECT_EQ(ResizeOrCreateHandle(&handle, 24), kvErrOutOfMemory);
  EXPECT_EQ(handle, nullptr);
  EXPECT_EQ(ResizeOrCreateHandle(&handle, 24), 0);
  EXPECT_EQ(ResizeOrCreateHandle(&handle, 40), 0);
  // Any non-zero answer of the host is a failure, whatever its sign.
  for (int32_t hostError : {SVSIM_ERR_MEMORY, -2}) {
    svsimSetResizeError(hostError);
    svsimFailResizeAt(1);
    EXPECT_EQ(ResizeOrCreateHandle(&handle, 800), kvErrOutOfMemory) << hostError;
  }
  EXPECT_EQ(svGetHandleSize(handle), 40u);
  EXPECT_EQ(svsimAllocCount(), 1u);
  // A scratch handle replaces the old one and has room for the count word.
  ReplaceScratchHandle(&handle, 100);
  EXPECT_EQ(svGetHandleSize(handle), 108u);
  EXPECT_EQ(DisposeHandle(&handle), 0);
  EXPECT_EQ(handle, nullptr);
  EXPECT_EQ(DisposeHandle(&handle) + DisposeHandle(nullptr), 0);
  EXPECT_EQ(svsimFreeCount(), 2u);
}

TEST_F(HostHandles, GrowHandleArrayKeepsRoomForTheRequestAndAMarginOf20) {
  // capacity (0: no array yet), count, extra, the host's answer to a resize, capacity after (0:
  // no room) and block size after
  const std::tuple<uint32_t, int32_t, uint32_t, int32_t, uint32_t, size_t> cases[] = {
      {0, 0, 3, 0, 23, 192},
      {0, 0, 0xFFFFFFF0u, 0, 4, 40},  // the arithmetic is 32-bit: a huge request wraps round
      {30, 5, 5, 0, 30, 248},         // 25 free places are there: the host is asked nothing
      {30, 6, 5, 0, 55, 448},         // 24 are there: the handle grows by 5 + 20
      // Only a negative answer is a refusal, unlike in ResizeOrCreateHandle.
      {4, 4, 1, -2, 0, 40},
      {4, 4, 1, SVSIM_ERR_MEMORY, 25, 40}};
  for (const auto &[before, count, extra, hostAnswer, grown, size] : cases) {
    for (int32_t move : {0, 1}) {
      SCOPED_TRACE(testing::Message()
                   << before << " " << count << " " << hostAnswer << " " << move);
      svsimSetMoveOnResize(move);
      SvHandle array = before != 0 ? MakeArray(before, count) : nullptr;
      svsimSetResizeError(hostAnswer);
      svsimFailResizeAt(hostAnswer != 0 ? 1 : 0);
      uint32_t capacity = 0xDEAD;
      void *free = GrowHandleArray(&array, extra, &capacity);
      EXPECT_EQ(capacity, grown);
      EXPECT_EQ(svGetHandleSize(array), size);
      // The address is in the block as it is after the resize, moved or not.
      EXPECT_EQ(free, grown != 0 ? static_cast<char *>(*array) + 8 + count * 8 : nullptr);
      // The elements stay, and the free places are zero.
      for (int32_t i = 0; 8u + 8 * i < size; ++i)
        EXPECT_EQ(ArrayData8<uint64_t>(array)[i], i < count ? i + 1u : 0u) << i;
      DisposeHandle(&array);
    }
  }
}

TEST_F(HostHandles, StringFromSvStrCopiesByTheCount) {
  std::string target = "kept";
  EXPECT_EQ(StringFromSvStr(target, nullptr), kvErrNullArgument);
  EXPECT_EQ(target, "kept");
  // The count decides, not a NUL nor the bytes behind it; a negative count is empty.
  alignas(4) const unsigned char aNulB[] = {3, 0, 0, 0, 'a', 0, 'b', 'c'};
  alignas(4) const unsigned char negative[] = {0xFF, 0xFF, 0xFF, 0xFF, 'x'};
  EXPECT_EQ(StringFromSvStr(target, reinterpret_cast<const SvStr *>(aNulB)), 0);
  EXPECT_EQ(target, std::string("a\0b", 3));
  EXPECT_EQ(StringFromSvStr(target, reinterpret_cast<const SvStr *>(negative)), 0);
  EXPECT_EQ(target, "");
}

TEST_F(HostHandles, CommaListMakesANewArrayOfStringsWithoutTrimming) {
  // text, allocation refused (the array is the first), the strings made
  const std::tuple<const char *, uint32_t, const char *> cases[] = {
      {"", 0, ""},
      {" CAN1 ,, LIN1", 0, " CAN1 || LIN1|"},
      {"F1,F2,", 0, "F1|F2||"},
      // A string that cannot be made leaves its element empty; the others still arrive.
      {"A,B,C", 3, "A|<none>|C|"}};
  for (const auto &[given, failAt, items] : cases) {
    SCOPED_TRACE(given);
    std::string text = given;
    // The old array and its strings go.
    SvHandle array = nullptr;
    char old[] = "old,older";
    ASSERT_EQ(CommaListToStringArray(old, &array, 0), 0);
    svsimFailAllocAt(failAt);
    EXPECT_EQ(CommaListToStringArray(&text[0], &array, 0), 0);
    EXPECT_EQ(Items(array, 0), items);
    EXPECT_EQ(svGetHandleSize(array), 8 + 8u * ArrayCount(array));
    // Every comma became a NUL, and nothing else changed.
    std::string expected = given;
    for (char &ch : expected) ch = ch == ',' ? '\0' : ch;
    EXPECT_EQ(text, expected);
    // Every string goes with the array: nothing is left alive at the end.
    DisposeHandleArray(&array);
  }
  // A handle whose block is gone may not be asked about at all.
  void *noBlock = nullptr;
  SvHandle empty = &noBlock;
  DisposeHandleArray(&empty);
  EXPECT_EQ(empty, &noBlock);
}

TEST_F(HostHandles, CommaListAppendsNamedVariantsInMode2) {
  SvHandle array = nullptr;
  char first[] = "CAN1,CAN2", second[] = "LIN1,,FlexRay1";
  EXPECT_EQ(CommaListToStringArray(first, &array, 2), 0);
  // The array has room already: the first allocation is the string "LIN1".
  svsimFailAllocAt(1);
  EXPECT_EQ(CommaListToStringArray(second, &array, 2), 0);
  EXPECT_EQ(Items(array, 2), "CAN1|CAN2|<none>||FlexRay1|");
  // The strings were only lent to the variants: they are gone with the array.
  svsimDisposeVariantArray(array);
}

TEST_F(HostHandles, CommaListFailsWithoutAnArrayOrAKnownMode) {
  for (int32_t mode : {0, 2, 1, -1}) {
    SCOPED_TRACE(mode);
    kvsvtest::cFakeErrorLog log;
    char text[] = "A,B";
    SvHandle array = nullptr;
    svsimFailAllocAt(1);
    const bool known = mode == 0 || mode == 2;
    EXPECT_EQ(CommaListToStringArray(text, &array, mode), known ? kvErrOutOfMemory : kvErrInternal);
    EXPECT_EQ(array, nullptr);
    svsimFailAllocAt(0);
    // An unknown mode is reported: component 13, file 16, line 782, without info.
    const auto records = log.Records();
    ASSERT_EQ(records.size(), known ? 0u : 1u);
    if (known) continue;
    EXPECT_EQ(records[0].value.location, 0xB410C30Eu);
    EXPECT_EQ(records[0].value.info, 0u);
  }
  EXPECT_EQ(svsimAllocCount(), 0u);
}

}  // namespace
