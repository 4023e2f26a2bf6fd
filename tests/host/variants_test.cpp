// Variants in arrays of references: string attributes set through the host operation and read
// back through the control API, freed with their array.
#include <gtest/gtest.h>

#include <string>

#include "host_fixture.h"

namespace {

using Variants = HostTest;

const unsigned char kNameAttribute[] = {0x01, 'n'};

// A zeroed array of references with room for `count` elements and its count set.
SvHandle NewReferenceArray(int32_t count) {
  SvHandle array = svNewHandleClr(8 + static_cast<size_t>(count) * 8);
  *static_cast<int32_t *>(*array) = count;
  return array;
}

void *Element(SvHandle array, int32_t i) { return static_cast<char *>(*array) + 8 + i * 8; }

std::string Attribute(const void *variant, const char *name) {
  char text[64] = {0};
  const int32_t length = svsimVariantGetStringAttr(variant, name, text, sizeof text);
  return length < 0 ? std::string("<none>") : std::string(text, static_cast<size_t>(length));
}

TEST_F(Variants, EachElementGetsItsOwnNameText) {
  SvHandle array = NewReferenceArray(3);
  const char *names[] = {"CAN1", "LIN1", "ENET1"};
  for (int32_t i = 0; i < 3; ++i) {
    SvHandle text = svsimMakeString(names[i]);
    ASSERT_EQ(svVariantSetStringAttr(Element(array, i), kNameAttribute, text), 0);
    svDisposeHandle(text);  // The caller keeps and frees its string: the variant has a copy.
  }
  EXPECT_EQ(svsimLiveVariants(), 3u);
  for (int32_t i = 0; i < 3; ++i) EXPECT_EQ(Attribute(Element(array, i), "n"), names[i]);
  svsimDisposeVariantArray(array);
  EXPECT_EQ(svsimLiveVariants(), 0u);
}

TEST_F(Variants, SettingAgainReplacesOnlyThatAttribute) {
  SvHandle array = NewReferenceArray(1);
  const unsigned char kindAttribute[] = {0x04, 'k', 'i', 'n', 'd'};
  SvHandle first = svsimMakeString("first");
  SvHandle second = svsimMakeString("second");
  SvHandle kind = svsimMakeString("kvor");
  ASSERT_EQ(svVariantSetStringAttr(Element(array, 0), kNameAttribute, first), 0);
  ASSERT_EQ(svVariantSetStringAttr(Element(array, 0), kindAttribute, kind), 0);
  ASSERT_EQ(svVariantSetStringAttr(Element(array, 0), kNameAttribute, second), 0);
  EXPECT_EQ(svsimLiveVariants(), 1u) << "one slot, one variant";
  EXPECT_EQ(Attribute(Element(array, 0), "n"), "second");
  EXPECT_EQ(Attribute(Element(array, 0), "kind"), "kvor");
  EXPECT_EQ(Attribute(Element(array, 0), "x"), "<none>");
  svDisposeHandle(first);
  svDisposeHandle(second);
  svDisposeHandle(kind);
  svsimDisposeVariantArray(array);
}

TEST_F(Variants, TheNameIsAsLongAsItsLengthByteSays) {
  SvHandle array = NewReferenceArray(1);
  const unsigned char prefixed[] = {0x01, 'n', 'X', 'Y'};
  SvHandle text = svsimMakeString("Speed");
  ASSERT_EQ(svVariantSetStringAttr(Element(array, 0), prefixed, text), 0);
  EXPECT_EQ(Attribute(Element(array, 0), "n"), "Speed");
  EXPECT_EQ(Attribute(Element(array, 0), "nXY"), "<none>");
  svDisposeHandle(text);
  svsimDisposeVariantArray(array);
}

TEST_F(Variants, EmptyTextsAndBadArguments) {
  SvHandle array = NewReferenceArray(1);
  ASSERT_EQ(svVariantSetStringAttr(Element(array, 0), kNameAttribute, nullptr), 0);
  EXPECT_EQ(Attribute(Element(array, 0), "n"), "");
  const unsigned char emptyName[] = {0x00};
  EXPECT_EQ(svVariantSetStringAttr(Element(array, 0), emptyName, nullptr), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svVariantSetStringAttr(nullptr, kNameAttribute, nullptr), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svsimVariantGetStringAttr(Element(array, 0), "n", nullptr, 0), 0);
  svsimDisposeVariantArray(array);
}

TEST_F(Variants, ReadBackTruncatesToTheBuffer) {
  SvHandle array = NewReferenceArray(1);
  SvHandle text = svsimMakeString("Powertrain");
  ASSERT_EQ(svVariantSetStringAttr(Element(array, 0), kNameAttribute, text), 0);
  char small[6] = {'#', '#', '#', '#', '#', '#'};
  EXPECT_EQ(svsimVariantGetStringAttr(Element(array, 0), "n", small, sizeof small), 10);
  EXPECT_STREQ(small, "Power");
  svDisposeHandle(text);
  svsimDisposeVariantArray(array);
}

TEST_F(Variants, VariantsSurviveTheirArrayMoving) {
  svsimSetMoveOnResize(1);
  SvHandle array = NewReferenceArray(1);
  SvHandle text = svsimMakeString("Frame1");
  ASSERT_EQ(svVariantSetStringAttr(Element(array, 0), kNameAttribute, text), 0);
  ASSERT_EQ(svSetHandleSizeClr(array, 8 + 2 * 8), 0);
  *static_cast<int32_t *>(*array) = 2;
  EXPECT_EQ(Attribute(Element(array, 0), "n"), "Frame1");
  EXPECT_EQ(Attribute(Element(array, 1), "n"), "<none>") << "growth is an empty slot";
  svDisposeHandle(text);
  svsimDisposeVariantArray(array);
}

TEST_F(Variants, FreeingOneVariantZeroesItsSlot) {
  SvHandle array = NewReferenceArray(1);
  SvHandle text = svsimMakeString("x");
  ASSERT_EQ(svVariantSetStringAttr(Element(array, 0), kNameAttribute, text), 0);
  svsimVariantFree(Element(array, 0));
  EXPECT_EQ(*static_cast<void **>(Element(array, 0)), nullptr);
  EXPECT_EQ(svsimLiveVariants(), 0u);
  svsimVariantFree(Element(array, 0));  // An empty slot: nothing to free.
  svDisposeHandle(text);
  svsimDisposeVariantArray(array);
}

using VariantsDeathTest = HostTest;

TEST_F(VariantsDeathTest, ASlotWithSomethingElseStopsTheProcess) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  SvHandle array = NewReferenceArray(1);
  int notAVariant = 0;
  void *garbage = &notAVariant;
  *static_cast<void **>(Element(array, 0)) = garbage;
  EXPECT_DEATH(svVariantSetStringAttr(Element(array, 0), kNameAttribute, nullptr),
               "svVariantSetStringAttr.*neither null nor a live variant");
  *static_cast<void **>(Element(array, 0)) = nullptr;
  svsimDisposeVariantArray(array);
}

}  // namespace
