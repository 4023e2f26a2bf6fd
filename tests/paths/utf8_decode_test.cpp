#include "paths/utf8_decode.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using kvpath::DecodeUtf8;
using kvpath::DecodeUtf8Unchecked;

const unsigned char *Bytes(const std::string &text) {
  return reinterpret_cast<const unsigned char *>(text.data());
}

TEST(DecodeUtf8, ResultCodePointAndPosition) {
  const struct {
    const char *name;
    std::string bytes;
    int result;
    uint32_t codePoint;  // when the result is 0
  } cases[] = {
      {"Ascii", "A", 0, 0x41},
      {"Nul", std::string(1, '\0'), 0, 0},
      {"TwoBytesLowest", "\xC2\x80", 0, 0x80},
      {"TwoBytesHighest", "\xDF\xBF", 0, 0x7FF},
      {"ThreeBytesLowest", "\xE0\xA0\x80", 0, 0x800},
      {"BeforeSurrogates", "\xED\x9F\xBF", 0, 0xD7FF},
      {"AfterSurrogates", "\xEE\x80\x80", 0, 0xE000},
      {"ThreeBytesHighest", "\xEF\xBF\xBF", 0, 0xFFFF},
      {"FourBytesLowest", "\xF0\x90\x80\x80", 0, 0x10000},
      {"Maximum", "\xF4\x8F\xBF\xBF", 0, 0x10FFFF},
      {"Empty", "", 1, 0},
      {"TruncatedTwo", "\xC3", 1, 0},
      {"TruncatedFour", "\xF0\x9F\x98", 1, 0},
      {"LoneContinuation", "\x80", 2, 0},
      {"LeadF8", "\xF8\x88\x80\x80\x80", 2, 0},
      {"LeadFF", "\xFF", 2, 0},
      {"BadSecondByte", "\xC3\x41", 3, 0},
      {"BadFourthByte", "\xF0\x9F\x98\xC0", 3, 0},
      {"OverlongSlash", "\xC0\xAF", 4, 0},
      {"OverlongNul", "\xC0\x80", 4, 0},
      {"OverlongThree", "\xE0\x9F\xBF", 4, 0},
      {"OverlongFour", "\xF0\x8F\xBF\xBF", 4, 0},
      {"AboveMaximum", "\xF4\x90\x80\x80", 5, 0},
      {"LeadF7", "\xF7\xBF\xBF\xBF", 5, 0},
      {"HighSurrogate", "\xED\xA0\x80", 6, 0},
      {"LowSurrogate", "\xED\xBF\xBF", 6, 0},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.name);
    const unsigned char *begin = Bytes(c.bytes);
    const unsigned char *position = begin;
    uint32_t codePoint = 0xFFFFFFFF;
    EXPECT_EQ(DecodeUtf8(position, begin + c.bytes.size(), codePoint), c.result);
    if (c.result == kvpath::kUtf8Ok) {
      EXPECT_EQ(codePoint, c.codePoint);
      EXPECT_EQ(position, begin + c.bytes.size());
    } else {
      EXPECT_EQ(position, begin) << "a failure leaves the position at the start of the sequence";
    }
  }
}

TEST(DecodeUtf8, AWalkStopsAtTheFailingSequenceAfterGoodOnes) {
  const std::string text = "a\xC3\xA9\xE2\x82\xAC\xED\xA0\x80z";
  const unsigned char *p = Bytes(text);
  const unsigned char *end = p + text.size();
  for (uint32_t expected : {0x61u, 0xE9u, 0x20ACu}) {
    uint32_t c = 0;
    ASSERT_EQ(DecodeUtf8(p, end, c), 0);
    EXPECT_EQ(c, expected);
  }
  const unsigned char *surrogate = p;
  uint32_t c = 0;
  EXPECT_EQ(DecodeUtf8(p, end, c), kvpath::kUtf8Surrogate);
  EXPECT_EQ(p, surrogate);
}

TEST(DecodeUtf8Unchecked, DecodesValidTextAndNeverReadsPastTheEnd) {
  const std::string text = "A\xC3\xA9\xE2\x82\xAC\xF0\x9F\x98\x80";
  const unsigned char *p = Bytes(text);
  const unsigned char *end = p + text.size();
  for (uint32_t value : {0x41u, 0xE9u, 0x20ACu, 0x1F600u}) {
    ASSERT_LT(p, end);
    EXPECT_EQ(DecodeUtf8Unchecked(p, end), value);
  }
  EXPECT_EQ(p, end);
  // A truncated sequence: the sanitiser catches a read of the byte behind the array.
  const unsigned char truncated[] = {0xF0, 0x9F};
  p = truncated;
  DecodeUtf8Unchecked(p, truncated + 2);
  EXPECT_EQ(p, truncated + 2);
}

}  // namespace
