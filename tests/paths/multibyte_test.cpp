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

TEST(Multibyte, RefusalsLeaveTheOutputAlone) {
  const auto kToUtf8 = &MultibyteToUtf8;
  const auto kToMultibyte = &Utf8ToMultibyte;
  const struct {
    const char *locale;
    int32_t (*convert)(const char *, bool, std::string &);
    const char *text;
    bool strict;
    int32_t result;
  } cases[] = {
      // Strict refuses any real conversion.
      {"C.UTF-8", kToUtf8, "caf\xC3\xA9", true, kvpath::kConversionStrict},
      {"C.UTF-8", kToMultibyte, "caf\xC3\xA9", true, kvpath::kConversionStrict},
      // Invalid UTF-8 fails before the strict test.
      {"C.UTF-8", kToMultibyte, "a\xC0\xAF", false, kvpath::kConversionFailed},
      {"C.UTF-8", kToMultibyte, "\xED\xA0\x80", true, kvpath::kConversionFailed},
      {"C.UTF-8", kToMultibyte, "x\xC3", true, kvpath::kConversionFailed},
      {"C.UTF-8", kToMultibyte, "\xF4\x90\x80\x80", false, kvpath::kConversionFailed},
      // Non-ASCII has no form in the C locale.
      {"C", kToUtf8, "caf\xC3\xA9", false, kvpath::kConversionFailed},
      {"C", kToMultibyte, "caf\xC3\xA9", false, kvpath::kConversionFailed},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(std::string(c.locale) + (c.convert == kToUtf8 ? " to UTF-8 " : " to multibyte ") +
                 c.text + (c.strict ? " strict" : ""));
    cLocale locale(c.locale);
    ASSERT_TRUE(locale.Ok());
    std::string output = "kept";
    EXPECT_EQ(c.convert(c.text, c.strict, output), c.result);
    EXPECT_EQ(output, "kept");
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

}  // namespace
