// The in-place reader: value kinds, error codes and positions, key lookup, strings, integers and
// unescaping with surrogates. Text is placed at the very end of a heap block so that a read past
// its NUL is caught by the address sanitiser.
#include <gtest/gtest.h>

#include <clocale>
#include <cstring>
#include <memory>
#include <string>

#include "diagnostics/jsonz.h"

namespace {

// `text` with its NUL as the last bytes of an allocation of exactly that size.
class cExactText {
 public:
  explicit cExactText(const std::string &text) : bytes_(new char[text.size() + 1]) {
    std::memcpy(bytes_.get(), text.c_str(), text.size() + 1);
  }
  const char *Get() const { return bytes_.get(); }

 private:
  std::unique_ptr<char[]> bytes_;
};

TEST(JsonzReader, ValueKinds) {
  const struct {
    const char *text;
    uint32_t kind;
    uint64_t length;
    uint32_t isReal;
  } cases[] = {
      {"null", jsonz::kKindNull, 0, 0},      {"true", jsonz::kKindBoolean, 1, 0},
      {"false", jsonz::kKindBoolean, 0, 0},  {"-12", jsonz::kKindNumber, 3, 0},
      {"007", jsonz::kKindNumber, 3, 0},     {"1.5", jsonz::kKindNumber, 3, 1},
      {"2e-3", jsonz::kKindNumber, 4, 1},    {"\"a\\nb\"", jsonz::kKindString, 4, 0},
      {" [1, {\"a\": [ ]} ]", jsonz::kKindArray, 0, 0},
      {"{\"a\" : 1 , \"b\":\"x\"}", jsonz::kKindObject, 0, 0},
  };
  for (const auto &c : cases) {
    const cExactText text(c.text);
    const jsonz::tValue value = jsonz::ParseDocument(text.Get());
    EXPECT_EQ(value.kind, c.kind) << c.text;
    if (c.kind != jsonz::kKindArray && c.kind != jsonz::kKindObject) {
      EXPECT_EQ(value.length, c.length) << c.text;
    }
    EXPECT_EQ(value.isReal, c.isReal) << c.text;
  }
}

TEST(JsonzReader, ErrorsWithCodeAndPosition) {
  const struct {
    const char *text;
    uint64_t code;
    size_t position;
  } cases[] = {
      {"{\"a\":1,}", jsonz::kErrorTrailingComma, 7},
      {"[1,2, ]", jsonz::kErrorTrailingComma, 6},
      {"{\"a\" 1}", jsonz::kErrorColonExpected, 5},
      {"{\"a\":1 \"b\":2}", jsonz::kErrorCommaExpected, 7},
      {"[1 2]", jsonz::kErrorCommaExpected, 3},
      {"{\"a\":1", jsonz::kErrorObject, 6},
      {"[1,", jsonz::kErrorArray, 3},
      {"\"abc", jsonz::kErrorString, 4},
      {"\"a\x01\"", jsonz::kErrorEscape, 2},
      {"\"\\x\"", jsonz::kErrorEscape, 1},
      {"\"\\u12g4\"", jsonz::kErrorEscape, 1},
      {"\"\\u12", jsonz::kErrorEscape, 1},
      {"\"\\", jsonz::kErrorEscape, 1},
      {"-", jsonz::kErrorValueExpected, 1},
      {"1.", jsonz::kErrorValueExpected, 2},
      {"1e+", jsonz::kErrorValueExpected, 3},
      {"tru", jsonz::kErrorValueExpected, 3},
      {"nul", jsonz::kErrorValueExpected, 3},
      {"x", jsonz::kErrorString, 0},  // all fail at once: the first parser's error stands
      {"{} x", jsonz::kErrorTrailingChar, 3},
      {"", jsonz::kErrorString, 0},
  };
  for (const auto &c : cases) {
    const cExactText text(c.text);
    const jsonz::tValue value = jsonz::ParseDocument(text.Get());
    EXPECT_EQ(value.kind, jsonz::kKindError) << c.text;
    EXPECT_EQ(value.length, c.code) << c.text;
    EXPECT_EQ(value.start - text.Get(), static_cast<std::ptrdiff_t>(c.position)) << c.text;
  }
  const jsonz::tValue none = jsonz::ParseValue(nullptr);
  EXPECT_EQ(none.kind, jsonz::kKindError);
  EXPECT_EQ(none.length, jsonz::kErrorValueExpected);
}

TEST(JsonzReader, DeepNestingIsRefusedNotRecursedInto) {
  const std::string deep = std::string(100000, '[') + std::string(100000, ']');
  const cExactText text(deep);
  const jsonz::tValue value = jsonz::ParseDocument(text.Get());
  EXPECT_EQ(value.kind, jsonz::kKindError);
  EXPECT_EQ(value.start - text.Get(), 512) << "refused at the first bracket too deep";
  const std::string fine = std::string(100, '[') + std::string(100, ']');
  EXPECT_EQ(jsonz::ParseDocument(cExactText(fine).Get()).kind, jsonz::kKindArray);
}

TEST(JsonzReader, ErrorNames) {
  EXPECT_STREQ(jsonz::ErrorName(1), "jsonz_errorValueExpected");
  EXPECT_STREQ(jsonz::ErrorName(5), "jsonz_errorColonExpected");
  EXPECT_STREQ(jsonz::ErrorName(6), "jsonz_errorCommaExpected");
  EXPECT_STREQ(jsonz::ErrorName(8), "jsonz_errorTrailingComma");
  EXPECT_STREQ(jsonz::ErrorName(9), "jsonz_errorTrailingChar");
  EXPECT_STREQ(jsonz::ErrorName(2), "unknown");
  EXPECT_STREQ(jsonz::ErrorName(1000), "unknown");
}

TEST(JsonzFindKey, FindsTheFirstMatchComparedUnescapedAndNothingOutsideAnObject) {
  const std::string document =
      " {\"a\":1, \"n\":{\"a\":2}, \"t\\u0061b\":\"x\", \"a\":3, \"\\ud83d\\ude00\":4}";
  const struct {
    std::string text;
    const char *key;
    const char *valueStart;  // null: not found
  } cases[] = {
      {document, "a", "1,"},
      {document, "n", "{\"a\":2}"},
      {document, "tab", "\"x\""},
      {document, "\xf0\x9f\x98\x80", "4}"},
      {document, "t", nullptr},
      {document, "ta", nullptr},
      {document, "missing", nullptr},
      {"[{\"a\":1}]", "a", nullptr},
      {"x{\"a\":1}", "a", nullptr},
      {"{}", "a", nullptr},
      {"{\"b\":[1,}, \"a\":1}", "a", nullptr},
      {"{\"b\" 1}", "a", nullptr},
      {"{\"b\":1 \"a\":2}", "a", nullptr},
      {"{\"b\":1,", "a", nullptr},
      {"", "a", nullptr},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.text + " / " + c.key);
    const cExactText text(c.text);
    const char *found = jsonz::JsonFindKey(text.Get(), c.key);
    if (c.valueStart == nullptr) {
      EXPECT_EQ(found, nullptr);
    } else {
      ASSERT_NE(found, nullptr);
      EXPECT_EQ(std::strncmp(found, c.valueStart, std::strlen(c.valueStart)), 0);
    }
  }
  EXPECT_EQ(jsonz::JsonFindKey(nullptr, "a"), nullptr);
}

TEST(JsonzReadString, RawTextOrTheDefault) {
  const cExactText text("{\"s\":\"a\\\"b\",\"n\":5}");
  size_t length = 0;
  const char *end = nullptr;
  const char *s = jsonz::JsonReadString(jsonz::JsonFindKey(text.Get(), "s"), "def", &length, &end);
  EXPECT_EQ(std::string(s, length), "a\\\"b");
  ASSERT_NE(end, nullptr);
  EXPECT_EQ(*end, ',');
  const char *d = jsonz::JsonReadString(jsonz::JsonFindKey(text.Get(), "n"), "def", &length, &end);
  EXPECT_STREQ(d, "def");
  EXPECT_EQ(length, 3u);
  EXPECT_EQ(end, nullptr);
}

TEST(JsonzReadInt, NumbersOnlyOthersGiveTheDefault) {
  const struct {
    const char *value;
    int32_t result;
  } cases[] = {
      {"42", 42},     {"-17", -17},       {"1.9", 1},           {"-2.5e1", -25},
      {"1e3", 1000},  {"1e20", 2147483647}, {"010", 8},        {"\"7\"", -1},
      {"true", -1},   {"null", -1},       {"[1]", -1},
  };
  for (const auto &c : cases) {
    const cExactText text(c.value);
    const char *end = nullptr;
    EXPECT_EQ(jsonz::JsonReadInt(text.Get(), -1, &end), c.result) << c.value;
    EXPECT_EQ(end != nullptr, c.result != -1) << c.value;
  }
}

TEST(JsonzReadInt, RealNumbersFollowTheLocalesDecimalSign) {
  const char *chosen = nullptr;
  for (const char *name : {"de_DE.UTF-8", "de_DE.utf8", "fr_FR.UTF-8", "fr_FR.utf8"}) {
    if (std::setlocale(LC_NUMERIC, name) != nullptr) {
      chosen = name;
      break;
    }
  }
  if (chosen == nullptr) GTEST_SKIP() << "no locale with a decimal comma installed";
  const int32_t value = jsonz::JsonReadInt(cExactText("12.75").Get(), 0, nullptr);
  std::setlocale(LC_NUMERIC, "C");
  EXPECT_EQ(value, 12);
}

TEST(JsonzUnescape, DecodesEscapesAndSurrogatePairs) {
  const struct {
    const char *escaped;
    const char *decoded;  // null: a bad escape
  } cases[] = {
      {"plain", "plain"},
      {"\\\"\\\\\\/\\b\\f\\n\\r\\t", "\"\\/\b\f\n\r\t"},
      {"\\u0041\\u00e9\\u20ac", "A\xc3\xa9\xe2\x82\xac"},
      {"\\ud83d\\ude00", "\xf0\x9f\x98\x80"},
      {"\\uD83D\\uDE00!", "\xf0\x9f\x98\x80!"},
      // The halves are not checked: a low half first still combines if the result is in range.
      {"\\udc00\\ud800", "\xf4\x8f\xb0\x80"},
      {"\\ud83d", nullptr},
      {"\\ud83dx", nullptr},
      {"\\ud83d\\n", nullptr},
      {"\\udfff\\uffff", nullptr},  // above 0x1FFFFF
      {"\\x", nullptr},
      {"\\u12", nullptr},
      {"end\\", nullptr},
  };
  for (const auto &c : cases) {
    const size_t length = std::strlen(c.escaped);
    std::unique_ptr<char[]> target(new char[length + 1]);
    char *end = jsonz::JsonUnescape(c.escaped, length, target.get());
    if (c.decoded == nullptr) {
      EXPECT_EQ(end, nullptr) << c.escaped;
    } else {
      ASSERT_NE(end, nullptr) << c.escaped;
      EXPECT_STREQ(target.get(), c.decoded) << c.escaped;
      EXPECT_EQ(end, target.get() + std::strlen(c.decoded)) << c.escaped;
    }
  }
}

TEST(JsonzUnescape, ReadsOnlyTheGivenLength) {
  // The escape is cut by the length: the bytes behind it are not looked at.
  const char text[] = "ab\\u0041";
  char target[sizeof text];
  EXPECT_EQ(jsonz::JsonUnescape(text, 5, target), nullptr);
  ASSERT_NE(jsonz::JsonUnescape(text, 2, target), nullptr);
  EXPECT_STREQ(target, "ab");
}

}  // namespace
