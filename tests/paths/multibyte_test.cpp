#include "paths/multibyte.h"

#include <gtest/gtest.h>

#include <clocale>
#include <string>

namespace {

using kvpath::MultibyteToUtf8;
using kvpath::Utf8ToMultibyte;

// Runs a test body under one locale and restores the C locale after it.
class cLocale {
 public:
  explicit cLocale(const char *name) : ok_(std::setlocale(LC_ALL, name) != nullptr) {}
  ~cLocale() { std::setlocale(LC_ALL, "C"); }
  bool Ok() const { return ok_; }

 private:
  bool ok_;
};

TEST(Multibyte, NullAndEmptyLeaveTheOutputAlone) {
  for (auto convert : {&MultibyteToUtf8, &Utf8ToMultibyte}) {
    std::string output = "kept";
    EXPECT_EQ(convert(nullptr, false, output), 0);
    EXPECT_EQ(convert("", true, output), 0);
    EXPECT_EQ(output, "kept");
  }
}

TEST(Multibyte, SevenBitTextPassesInTheCLocaleEvenWhenStrict) {
  cLocale locale("C");
  for (auto convert : {&MultibyteToUtf8, &Utf8ToMultibyte}) {
    for (bool strict : {false, true}) {
      std::string output;
      EXPECT_EQ(convert("/var/lib/kvor log\t~", strict, output), 0);
      EXPECT_EQ(output, "/var/lib/kvor log\t~");
    }
  }
}

TEST(Multibyte, StrictRefusesAnyRealConversion) {
  cLocale locale("C.UTF-8");
  ASSERT_TRUE(locale.Ok());
  std::string output = "kept";
  EXPECT_EQ(MultibyteToUtf8("caf\xC3\xA9", true, output), kvpath::kConversionStrict);
  EXPECT_EQ(Utf8ToMultibyte("caf\xC3\xA9", true, output), kvpath::kConversionStrict);
  EXPECT_EQ(output, "kept");
}

TEST(Multibyte, InvalidUtf8FailsBeforeTheStrictTest) {
  cLocale locale("C.UTF-8");
  ASSERT_TRUE(locale.Ok());
  for (const char *bad : {"a\xC0\xAF", "\xED\xA0\x80", "x\xC3", "\xF4\x90\x80\x80"}) {
    for (bool strict : {false, true}) {
      std::string output;
      EXPECT_EQ(Utf8ToMultibyte(bad, strict, output), kvpath::kConversionFailed) << bad;
    }
  }
}

TEST(Multibyte, RoundTripInAUtf8LocaleForEveryLength) {
  cLocale locale("C.UTF-8");
  ASSERT_TRUE(locale.Ok());
  // One, two, three and four bytes per character.
  const std::string text = "/d/\x41\xC3\xA9\xE2\x82\xAC\xF0\x9F\x98\x80";
  std::string multibyte;
  ASSERT_EQ(Utf8ToMultibyte(text.c_str(), false, multibyte), 0);
  EXPECT_EQ(multibyte, text);
  std::string utf8;
  ASSERT_EQ(MultibyteToUtf8(multibyte.c_str(), false, utf8), 0);
  EXPECT_EQ(utf8, text);
}

TEST(Multibyte, NonAsciiHasNoFormInTheCLocale) {
  cLocale locale("C");
  std::string output = "kept";
  EXPECT_EQ(MultibyteToUtf8("caf\xC3\xA9", false, output), kvpath::kConversionFailed);
  EXPECT_EQ(Utf8ToMultibyte("caf\xC3\xA9", false, output), kvpath::kConversionFailed);
}

}  // namespace
