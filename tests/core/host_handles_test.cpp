// Creating, growing and freeing host data, against the host stand-in: its counters show what the
// helpers asked of the host, its faults show what they do when the host says no.
#include "core/host_handles.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "support/fake_error_log.h"
#include "svsim.h"

namespace {

using namespace nKVSVAPI100;

class HostHandles : public testing::Test {
 protected:
  void SetUp() override {
    liveBefore_ = svsimReset();
    variantsBefore_ = svsimLiveVariants();
  }
  void TearDown() override {
    svsimReset();
    EXPECT_EQ(svsimLiveHandles(), liveBefore_) << "handles left alive";
    EXPECT_EQ(svsimLiveVariants(), variantsBefore_) << "variants left alive";
  }

  static std::string Text(SvHandle string) {
    const int32_t length = svsimReadString(string, nullptr, 0);
    std::string text(static_cast<size_t>(length) + 1, '\0');
    svsimReadString(string, &text[0], text.size());
    text.resize(static_cast<size_t>(length));
    return text;
  }

  static std::string Name(SvHandle array, int32_t index) {
    char text[64] = {};
    const int32_t length =
        svsimVariantGetStringAttr(ArrayData8<uint64_t>(array) + index, "n", text, sizeof text);
    return length < 0 ? "<none>" : std::string(text, static_cast<size_t>(length));
  }

  // An array of `capacity` 8-byte elements holding `count` of them, each set to its index + 1.
  static SvHandle MakeArray(uint32_t capacity, int32_t count) {
    SvHandle array = svNewHandleClr(8 + capacity * 8u);
    ArrayCount(array) = count;
    for (int32_t i = 0; i < count; ++i) ArrayData8<uint64_t>(array)[i] = i + 1u;
    return array;
  }

  static SvHandle MakeStringArray(const std::vector<const char *> &texts) {
    SvHandle array = svNewHandleClr(8 + texts.size() * 8);
    ArrayCount(array) = static_cast<int32_t>(texts.size());
    for (size_t i = 0; i < texts.size(); ++i)
      ArrayData8<SvHandle>(array)[i] = texts[i] != nullptr ? svsimMakeString(texts[i]) : nullptr;
    return array;
  }

  uint64_t liveBefore_ = 0;
  uint64_t variantsBefore_ = 0;
};

TEST_F(HostHandles, ResizeOrCreateMakesAZeroedHandle) {
  SvHandle handle = nullptr;
  EXPECT_EQ(ResizeOrCreateHandle(&handle, 24), 0);
  ASSERT_NE(handle, nullptr);
  EXPECT_EQ(svGetHandleSize(handle), 24u);
  const std::vector<unsigned char> zeros(24, 0);
  EXPECT_EQ(std::memcmp(*handle, zeros.data(), 24), 0);
  EXPECT_EQ(svsimAllocCount(), 1u);
  DisposeHandle(&handle);
}

TEST_F(HostHandles, ResizeOrCreateGrowsAnExistingHandleKeepingItsBytes) {
  SvHandle handle = MakeArray(2, 2);
  EXPECT_EQ(ResizeOrCreateHandle(&handle, 40), 0);
  EXPECT_EQ(svGetHandleSize(handle), 40u);
  EXPECT_EQ(ArrayCount(handle), 2);
  EXPECT_EQ(ArrayData8<uint64_t>(handle)[1], 2u);
  EXPECT_EQ(ArrayData8<uint64_t>(handle)[3], 0u);
  EXPECT_EQ(svsimAllocCount(), 1u);
  EXPECT_EQ(svsimResizeCount(), 1u);
  DisposeHandle(&handle);
}

TEST_F(HostHandles, ResizeOrCreateFailsWithoutTouchingTheHandle) {
  {
    SvHandle handle = nullptr;
    svsimFailAllocAt(1);
    EXPECT_EQ(ResizeOrCreateHandle(&handle, 24), kvErrOutOfMemory);
    EXPECT_EQ(handle, nullptr);
  }
  // Any non-zero answer of the host is a failure, whatever its sign.
  for (int32_t hostError : {SVSIM_ERR_MEMORY, SVSIM_ERR_ARGUMENT, -2}) {
    SvHandle handle = MakeArray(3, 3);
    const SvHandle before = handle;
    svsimSetResizeError(hostError);
    svsimFailResizeAt(1);
    const Status status = ResizeOrCreateHandle(&handle, 800);
    EXPECT_EQ(status, kvErrOutOfMemory) << hostError;
    EXPECT_EQ(RemapOutputStatus(status), kvErrOutputMemory) << hostError;
    EXPECT_EQ(handle, before) << hostError;
    EXPECT_EQ(svGetHandleSize(handle), 32u) << hostError;
    EXPECT_EQ(ArrayCount(handle), 3) << hostError;
    EXPECT_EQ(ArrayData8<uint64_t>(handle)[2], 3u) << hostError;
    DisposeHandle(&handle);
  }
}

TEST_F(HostHandles, OnlyTheLibrarysOutOfMemoryIsRemappedForOutputArrays) {
  const struct {
    Status given, returned;
  } cases[] = {
      {kvErrOutOfMemory, kvErrOutputMemory},
      {0, 0},
      {kvErrNullArgument, kvErrNullArgument},
      {kvErrInternal, kvErrInternal},
      {static_cast<Status>(0x3FF63010), static_cast<Status>(0x3FF63010)},
  };
  for (const auto &c : cases) EXPECT_EQ(RemapOutputStatus(c.given), c.returned) << c.given;
}

TEST_F(HostHandles, DisposeHandleFreesAndForgets) {
  EXPECT_EQ(DisposeHandle(nullptr), 0);
  SvHandle none = nullptr;
  EXPECT_EQ(DisposeHandle(&none), 0);
  EXPECT_EQ(svsimFreeCount(), 0u);

  SvHandle handle = svNewHandleClr(16);
  const uint64_t live = svsimLiveHandles();
  EXPECT_EQ(DisposeHandle(&handle), 0);
  EXPECT_EQ(handle, nullptr);
  EXPECT_EQ(svsimFreeCount(), 1u);
  EXPECT_EQ(svsimLiveHandles(), live - 1);
}

TEST_F(HostHandles, ReplaceScratchHandleMakesRoomForTheCountWord) {
  SvHandle scratch = nullptr;
  ReplaceScratchHandle(&scratch, 100);
  ASSERT_NE(scratch, nullptr);
  EXPECT_EQ(svGetHandleSize(scratch), 108u);

  const SvHandle first = scratch;
  ReplaceScratchHandle(&scratch, 4);
  EXPECT_EQ(svsimFreeCount(), 1u);
  ASSERT_NE(scratch, nullptr);
  EXPECT_NE(scratch, first);
  EXPECT_EQ(svGetHandleSize(scratch), 12u);

  svsimFailAllocAt(1);
  ReplaceScratchHandle(&scratch, 4);
  EXPECT_EQ(scratch, nullptr);
  EXPECT_EQ(svsimFreeCount(), 2u);
}

TEST_F(HostHandles, ZeroArrayCountNeedsAHandle) {
  ZeroArrayCount(nullptr);
  SvHandle array = MakeArray(5, 5);
  ZeroArrayCount(array);
  EXPECT_EQ(ArrayCount(array), 0);
  EXPECT_EQ(ArrayData8<uint64_t>(array)[4], 5u);
  DisposeHandle(&array);
}

struct tNewArrayCase {
  uint32_t extra;
  uint32_t capacity;
  size_t bytes;
};

TEST_F(HostHandles, GrowHandleArrayMakesANewArrayWithTheMargin) {
  const tNewArrayCase cases[] = {
      {3, 23, 192},
      {0, 20, 168},
      // The arithmetic is 32-bit: a huge request wraps round to a small one.
      {0xFFFFFFF0u, 4, 40},
  };
  for (const tNewArrayCase &c : cases) {
    SvHandle array = nullptr;
    uint32_t capacity = 0xDEAD;
    void *free = GrowHandleArray(&array, c.extra, &capacity);
    ASSERT_NE(array, nullptr) << c.extra;
    EXPECT_EQ(capacity, c.capacity) << c.extra;
    EXPECT_EQ(svGetHandleSize(array), c.bytes) << c.extra;
    EXPECT_EQ(ArrayCount(array), 0) << c.extra;
    EXPECT_EQ(free, static_cast<char *>(*array) + 8) << c.extra;
    DisposeHandle(&array);
  }
  // The host refuses the new array: nothing is made and no capacity claimed.
  SvHandle array = nullptr;
  uint32_t capacity = 0xDEAD;
  svsimFailAllocAt(1);
  EXPECT_EQ(GrowHandleArray(&array, 3, &capacity), nullptr);
  EXPECT_EQ(array, nullptr);
  EXPECT_EQ(capacity, 0u);
}

TEST_F(HostHandles, GrowHandleArrayKeepsRoomForTheRequestAndTheMargin) {
  const struct {
    int32_t count;
    uint32_t resizes, capacity;
  } cases[] = {
      {5, 0, 30},  // 5 + 20 free places are wanted, 25 are there: the host is asked nothing
      {6, 1, 55},  // 24 are there: the handle grows by 5 + 20
  };
  for (const auto &c : cases) {
    for (int32_t move : {0, 1}) {
      SCOPED_TRACE(testing::Message() << c.count << " " << move);
      svsimSetMoveOnResize(move);
      SvHandle array = MakeArray(30, c.count);
      svsimResetCounters();
      uint32_t capacity = 0;
      void *free = GrowHandleArray(&array, 5, &capacity);
      EXPECT_EQ(svsimResizeCount(), c.resizes);
      EXPECT_EQ(svsimAllocCount(), 0u);
      EXPECT_EQ(capacity, c.capacity);
      EXPECT_EQ(svGetHandleSize(array), 8u + c.capacity * 8);
      // The address is in the block as it is after the resize, moved or not.
      EXPECT_EQ(free, static_cast<char *>(*array) + 8 + c.count * 8);
      EXPECT_EQ(ArrayCount(array), c.count);
      EXPECT_EQ(ArrayData8<uint64_t>(array)[c.count - 1], static_cast<uint64_t>(c.count));
      EXPECT_EQ(ArrayData8<uint64_t>(array)[c.count], 0u);
      EXPECT_EQ(GrowHandleArray(&array, 5, nullptr), free);
      DisposeHandle(&array);
    }
  }
}

TEST_F(HostHandles, GrowHandleArrayFailsOnlyOnANegativeResizeResult) {
  SvHandle array = MakeArray(4, 4);
  const SvHandle before = array;
  const void *block = *array;
  svsimSetResizeError(-2);
  svsimFailResizeAt(1);
  uint32_t capacity = 0xDEAD;
  EXPECT_EQ(GrowHandleArray(&array, 1, &capacity), nullptr);
  EXPECT_EQ(capacity, 0u);
  EXPECT_EQ(array, before);
  EXPECT_EQ(*array, block);
  EXPECT_EQ(svGetHandleSize(array), 40u);
  EXPECT_EQ(ArrayCount(array), 4);

  // A positive answer is taken as success, unlike in ResizeOrCreateHandle.
  svsimSetResizeError(SVSIM_ERR_MEMORY);
  svsimFailResizeAt(1);
  EXPECT_EQ(GrowHandleArray(&array, 1, &capacity), static_cast<char *>(*array) + 8 + 4 * 8);
  EXPECT_EQ(capacity, 4u + 21);
  EXPECT_EQ(svsimInjectedFaults(), 2u);
  DisposeHandle(&array);
}

TEST_F(HostHandles, DisposeHandleArrayFreesEveryElementThenTheArray) {
  SvHandle array = MakeStringArray({"CAN1", nullptr, "LIN1", ""});
  const uint64_t live = svsimLiveHandles();
  svsimResetCounters();
  DisposeHandleArray(&array);
  EXPECT_EQ(array, nullptr);
  EXPECT_EQ(svsimFreeCount(), 4u);
  EXPECT_EQ(svsimLiveHandles(), live - 4);

  array = MakeStringArray({});
  DisposeHandleArray(&array);
  EXPECT_EQ(array, nullptr);
  EXPECT_EQ(svsimFreeCount(), 5u);

  // Nothing to free; a handle whose block is gone may not be asked about at all.
  DisposeHandleArray(nullptr);
  DisposeHandleArray(&array);
  void *noBlock = nullptr;
  SvHandle empty = &noBlock;
  DisposeHandleArray(&empty);
  EXPECT_EQ(empty, &noBlock);
  EXPECT_EQ(svsimFreeCount(), 5u);
}

TEST_F(HostHandles, StringFromSvStr) {
  std::string target = "left over";
  EXPECT_EQ(StringFromSvStr(target, nullptr), kvErrNullArgument);
  EXPECT_EQ(target, "left over");

  const struct {
    std::vector<unsigned char> block;
    std::string text;
  } cases[] = {
      {{5, 0, 0, 0, 'C', 'A', 'N', '1', '!'}, "CAN1!"},
      // The count decides, not a NUL and not the bytes behind it.
      {{3, 0, 0, 0, 'a', 0, 'b', 'c', 'd'}, std::string("a\0b", 3)},
      {{0, 0, 0, 0, 'x'}, ""},
      {{0xFF, 0xFF, 0xFF, 0xFF, 'x'}, ""},
  };
  for (const auto &c : cases) {
    target = "left over";
    EXPECT_EQ(StringFromSvStr(target, reinterpret_cast<const SvStr *>(c.block.data())), 0);
    EXPECT_EQ(target, c.text);
  }
}

TEST_F(HostHandles, CommaListOfAnEmptyTextIsAnEmptyNewArray) {
  SvHandle array = MakeStringArray({"old", "older"});
  const uint64_t live = svsimLiveHandles();
  char text[] = "";
  EXPECT_EQ(CommaListToStringArray(text, &array, 0), 0);
  ASSERT_NE(array, nullptr);
  EXPECT_EQ(ArrayCount(array), 0);
  EXPECT_EQ(svGetHandleSize(array), 8u);
  // The old array and its two strings went; one new array came.
  EXPECT_EQ(svsimLiveHandles(), live - 2);
  DisposeHandleArray(&array);
}

TEST_F(HostHandles, CommaListSplitsWithoutTrimming) {
  const struct {
    const char *text;
    std::vector<std::string> items;
  } cases[] = {
      {"A,,B", {"A", "", "B"}},
      {"CAN1", {"CAN1"}},
      {" CAN1 , LIN1", {" CAN1 ", " LIN1"}},
      {",", {"", ""}},
      {"Frame1,Frame2,", {"Frame1", "Frame2", ""}},
  };
  for (const auto &c : cases) {
    std::vector<char> text(c.text, c.text + std::strlen(c.text) + 1);
    SvHandle array = nullptr;
    EXPECT_EQ(CommaListToStringArray(text.data(), &array, 0), 0) << c.text;
    ASSERT_NE(array, nullptr);
    ASSERT_EQ(ArrayCount(array), static_cast<int32_t>(c.items.size())) << c.text;
    EXPECT_EQ(svGetHandleSize(array), 8 + 8 * c.items.size()) << c.text;
    for (size_t i = 0; i < c.items.size(); ++i) {
      SvHandle item = ArrayData8<SvHandle>(array)[i];
      ASSERT_NE(item, nullptr) << c.text << " " << i;
      EXPECT_EQ(Text(item), c.items[i]) << c.text << " " << i;
      EXPECT_EQ(svGetHandleSize(item), c.items[i].size() + 8) << c.text << " " << i;
    }
    // Every comma became a NUL, and nothing else changed.
    for (size_t i = 0; i < text.size(); ++i)
      EXPECT_EQ(text[i], c.text[i] == ',' ? '\0' : c.text[i]) << c.text << " " << i;
    DisposeHandleArray(&array);
  }
}

TEST_F(HostHandles, CommaListFailsWhenTheArrayCannotBeMade) {
  for (int32_t mode : {0, 2}) {
    char text[] = "A,B";
    SvHandle array = nullptr;
    svsimFailAllocAt(1);
    EXPECT_EQ(CommaListToStringArray(text, &array, mode), kvErrOutOfMemory) << mode;
    EXPECT_EQ(array, nullptr) << mode;
  }
}

TEST_F(HostHandles, CommaListAppendsNamedVariantsInMode2) {
  SvHandle array = nullptr;
  char first[] = "CAN1,CAN2";
  EXPECT_EQ(CommaListToStringArray(first, &array, 2), 0);
  char second[] = "LIN1,,FlexRay1";
  EXPECT_EQ(CommaListToStringArray(second, &array, 2), 0);

  ASSERT_EQ(ArrayCount(array), 5);
  const char *names[] = {"CAN1", "CAN2", "LIN1", "", "FlexRay1"};
  for (int32_t i = 0; i < 5; ++i) EXPECT_EQ(Name(array, i), names[i]) << i;
  EXPECT_EQ(svsimLiveVariants(), variantsBefore_ + 5);
  // The strings were only lent to the variants: the array is the one handle left.
  EXPECT_EQ(svsimLiveHandles(), liveBefore_ + 1);
  svsimDisposeVariantArray(array);
}

TEST_F(HostHandles, CommaListGoesOnPastAStringThatCannotBeMade) {
  for (int32_t mode : {0, 2}) {
    SCOPED_TRACE(mode);
    char text[] = "A,B,C";
    SvHandle array = nullptr;
    // The array is the first allocation, "A" the second, "B" the third.
    svsimFailAllocAt(3);
    EXPECT_EQ(CommaListToStringArray(text, &array, mode), 0);
    ASSERT_EQ(ArrayCount(array), 3);
    if (mode == 0) {
      EXPECT_EQ(Text(ArrayData8<SvHandle>(array)[0]), "A");
      EXPECT_EQ(ArrayData8<SvHandle>(array)[1], nullptr);
      EXPECT_EQ(Text(ArrayData8<SvHandle>(array)[2]), "C");
      DisposeHandleArray(&array);
    } else {
      // The variant is there, without a name.
      EXPECT_EQ(Name(array, 0), "A");
      EXPECT_EQ(Name(array, 1), "<none>");
      EXPECT_EQ(Name(array, 2), "C");
      svsimDisposeVariantArray(array);
    }
  }
}

TEST_F(HostHandles, CommaListInAnUnknownModeIsAnInternalError) {
  for (int32_t mode : {1, 3, -1}) {
    kvsvtest::cFakeErrorLog log;
    char text[] = "A,B";
    SvHandle array = nullptr;
    EXPECT_EQ(CommaListToStringArray(text, &array, mode), kvErrInternal) << mode;
    EXPECT_EQ(array, nullptr) << mode;
    EXPECT_EQ(svsimAllocCount(), 0u) << mode;
    const auto records = log.Records();
    ASSERT_EQ(records.size(), 1u) << mode;
    EXPECT_EQ(records[0].value.Component(), 13u);
    EXPECT_EQ(records[0].value.File(), 16u);
    EXPECT_EQ(records[0].value.Line(), 782u);
    EXPECT_EQ(records[0].value.info, 0u);
  }
}

}  // namespace
