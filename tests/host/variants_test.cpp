// Variants in arrays of references: string attributes set through the host operation and read
// back through the control API, freed with their array.
#include <gtest/gtest.h>

#include <string>

#include "host_fixture.h"

namespace {

using Variants = HostTest;

const unsigned char kName[] = {0x01, 'n'};

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

// Sets the attribute from a string handle of the caller's, which the variant must copy.
int32_t Set(void *variant, const unsigned char *name, const char *text) {
  SvHandle string = text == nullptr ? nullptr : svsimMakeString(text);
  const int32_t status = svVariantSetStringAttr(variant, name, string);
  if (string != nullptr) svDisposeHandle(string);
  return status;
}

TEST_F(Variants, EachElementKeepsItsOwnAttributes) {
  SvHandle array = NewReferenceArray(3);
  const char *names[] = {"CAN1", "LIN1", "ENET1"};
  for (int32_t i = 0; i < 3; ++i) ASSERT_EQ(Set(Element(array, i), kName, names[i]), 0);
  const unsigned char kind[] = {0x04, 'k', 'i', 'n', 'd'};
  const unsigned char prefixed[] = {0x01, 'n', 'X', 'Y'};  // The length byte says "n".
  ASSERT_EQ(Set(Element(array, 0), kind, "kvor"), 0);
  ASSERT_EQ(Set(Element(array, 0), prefixed, "again"), 0);
  ASSERT_EQ(Set(Element(array, 2), kName, nullptr), 0);
  EXPECT_EQ(svsimLiveVariants(), 3u) << "one slot, one variant";
  EXPECT_EQ(Attribute(Element(array, 0), "n"), "again");
  EXPECT_EQ(Attribute(Element(array, 0), "kind"), "kvor");
  EXPECT_EQ(Attribute(Element(array, 0), "nXY"), "<none>");
  EXPECT_EQ(Attribute(Element(array, 1), "n"), "LIN1");
  EXPECT_EQ(Attribute(Element(array, 1), "kind"), "<none>");
  EXPECT_EQ(Attribute(Element(array, 2), "n"), "") << "a null string is the empty text";

  char small[6] = {'#', '#', '#', '#', '#', '#'};
  EXPECT_EQ(svsimVariantGetStringAttr(Element(array, 1), "n", small, 3), 4);
  EXPECT_STREQ(small, "LI") << "cut to the buffer and terminated";
  EXPECT_EQ(small[3], '#');
  const unsigned char emptyName[] = {0x00};
  EXPECT_EQ(svVariantSetStringAttr(Element(array, 0), emptyName, nullptr), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svVariantSetStringAttr(nullptr, kName, nullptr), SVSIM_ERR_ARGUMENT);
  svsimDisposeVariantArray(array);
  EXPECT_EQ(svsimLiveVariants(), 0u);
}

TEST_F(Variants, VariantsSurviveTheirArrayMovingAndFreeingOneZeroesItsSlot) {
  svsimSetMoveOnResize(1);
  SvHandle array = NewReferenceArray(1);
  ASSERT_EQ(Set(Element(array, 0), kName, "Frame1"), 0);
  ASSERT_EQ(svSetHandleSizeClr(array, 8 + 2 * 8), 0);
  *static_cast<int32_t *>(*array) = 2;
  EXPECT_EQ(Attribute(Element(array, 0), "n"), "Frame1");
  EXPECT_EQ(Attribute(Element(array, 1), "n"), "<none>") << "growth is an empty slot";
  svsimVariantFree(Element(array, 0));
  EXPECT_EQ(*static_cast<void **>(Element(array, 0)), nullptr);
  EXPECT_EQ(svsimLiveVariants(), 0u);
  svsimVariantFree(Element(array, 0));  // An empty slot: nothing to free.
  svsimDisposeVariantArray(array);
}

}  // namespace
