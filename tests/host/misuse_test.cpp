// Host data that is not live, or whose header lies, stops the process with a message that names
// the operation: a library fault shows where it happened instead of corrupting memory.
#include <gtest/gtest.h>

#include <iterator>

#include "host_fixture.h"

namespace {

using MisuseDeathTest = HostTest;

void *gForeign[1] = {nullptr};
char gElsewhere[8];
int gNotAVariant = 0;
void *gGarbageSlot = &gNotAVariant;
const unsigned char kName[] = {0x01, 'n'};

SvHandle Disposed() {
  SvHandle h = svNewHandleClr(8);
  svDisposeHandle(h);
  return h;
}

SvHandle WithBlock(void *block) {
  SvHandle h = svNewHandleClr(8);
  *h = block;
  return h;
}

// A string whose count says 5 where only 4 bytes of text fit.
SvHandle LyingString() {
  SvHandle h = svNewHandleClr(8);
  *static_cast<int32_t *>(*h) = 5;
  return h;
}

SvPath Destroyed() {
  SvPath path = svEmptyPath(0);
  svDestroyPath(path);
  return path;
}

TEST_F(MisuseDeathTest, EachOperationStopsOnDataThatIsNotLive) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  const struct {
    const char *message;
    void (*misuse)();
  } cases[] = {
      {"svDisposeHandle.*not a live handle", [] { svDisposeHandle(Disposed()); }},
      {"svSetHandleSizeClr.*not a live handle", [] { svSetHandleSizeClr(Disposed(), 16); }},
      {"svGetHandleSize.*not a live handle", [] { svGetHandleSize(gForeign); }},
      {"svCopyHandle.*not a live handle",
       [] {
         SvHandle target = Disposed();
         svCopyHandle(&target, svNewHandleClr(8));
       }},
      {"master pointer overwritten", [] { svGetHandleSize(WithBlock(nullptr)); }},
      {"master pointer overwritten", [] { svGetHandleSize(WithBlock(gElsewhere)); }},
      {"svStrPrintf.*count runs past", [] { svStrPrintf(svNewHandleClr(8), "%H", LyingString()); }},
      {"svVariantSetStringAttr.*neither null nor a live variant",
       [] { svVariantSetStringAttr(&gGarbageSlot, kName, nullptr); }},
      {"svDestroyPath.*not a live path", [] { svDestroyPath(Destroyed()); }},
  };
  for (size_t i = 0; i < std::size(cases); ++i) {
    SCOPED_TRACE(i);
    EXPECT_DEATH(cases[i].misuse(), cases[i].message);
  }
}

}  // namespace
