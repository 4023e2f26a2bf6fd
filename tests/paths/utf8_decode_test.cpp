#include "paths/utf8_decode.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using kvpath::DecodeUtf8;
using kvpath::DecodeUtf8Unchecked;

struct tDecodeCase {
  const char *name;
  std::string bytes;
  int result;
  uint32_t codePoint;   // when the result is 0
};

class DecodeUtf8Test : public ::testing::TestWithParam<tDecodeCase> {};

TEST_P(DecodeUtf8Test, ResultCodePointAndPosition) {
  const tDecodeCase &c = GetParam();
  const unsigned char *begin = reinterpret_cast<const unsigned char *>(c.bytes.data());
  const unsigned char *end = begin + c.bytes.size();
  const unsigned char *position = begin;
  uint32_t codePoint = 0xFFFFFFFF;
  EXPECT_EQ(DecodeUtf8(position, end, codePoint), c.result);
  if (c.result == kvpath::kUtf8Ok) {
    EXPECT_EQ(codePoint, c.codePoint);
    EXPECT_EQ(position, end);
  } else {
    EXPECT_EQ(position, begin) << "a failure leaves the position at the start of the sequence";
  }
}

INSTANTIATE_TEST_SUITE_P(
    Sequences, DecodeUtf8Test,
    ::testing::Values(
        tDecodeCase{"Ascii", "A", 0, 0x41},
        tDecodeCase{"Nul", std::string(1, '\0'), 0, 0},
        tDecodeCase{"TwoBytesLowest", "\xC2\x80", 0, 0x80},
        tDecodeCase{"TwoBytesHighest", "\xDF\xBF", 0, 0x7FF},
        tDecodeCase{"ThreeBytesLowest", "\xE0\xA0\x80", 0, 0x800},
        tDecodeCase{"BeforeSurrogates", "\xED\x9F\xBF", 0, 0xD7FF},
        tDecodeCase{"AfterSurrogates", "\xEE\x80\x80", 0, 0xE000},
        tDecodeCase{"ThreeBytesHighest", "\xEF\xBF\xBF", 0, 0xFFFF},
        tDecodeCase{"FourBytesLowest", "\xF0\x90\x80\x80", 0, 0x10000},
        tDecodeCase{"Maximum", "\xF4\x8F\xBF\xBF", 0, 0x10FFFF},
        tDecodeCase{"Empty", "", 1, 0},
        tDecodeCase{"TruncatedTwo", "\xC3", 1, 0},
        tDecodeCase{"TruncatedFour", "\xF0\x9F\x98", 1, 0},
        tDecodeCase{"LoneContinuation", "\x80", 2, 0},
        tDecodeCase{"LeadF8", "\xF8\x88\x80\x80\x80", 2, 0},
        tDecodeCase{"LeadFF", "\xFF", 2, 0},
        tDecodeCase{"BadSecondByte", "\xC3\x41", 3, 0},
        tDecodeCase{"BadFourthByte", "\xF0\x9F\x98\xC0", 3, 0},
        tDecodeCase{"OverlongSlash", "\xC0\xAF", 4, 0},
        tDecodeCase{"OverlongNul", "\xC0\x80", 4, 0},
        tDecodeCase{"OverlongThree", "\xE0\x9F\xBF", 4, 0},
        tDecodeCase{"OverlongFour", "\xF0\x8F\xBF\xBF", 4, 0},
        tDecodeCase{"AboveMaximum", "\xF4\x90\x80\x80", 5, 0},
        tDecodeCase{"LeadF7", "\xF7\xBF\xBF\xBF", 5, 0},
        tDecodeCase{"HighSurrogate", "\xED\xA0\x80", 6, 0},
        tDecodeCase{"LowSurrogate", "\xED\xBF\xBF", 6, 0}),
    [](const ::testing::TestParamInfo<tDecodeCase> &info) { return info.param.name; });

TEST(DecodeUtf8Walk, StopsAtTheFailingSequenceAfterGoodOnes) {
  const std::string text = "a\xC3\xA9\xE2\x82\xAC\xED\xA0\x80z";
  const unsigned char *p = reinterpret_cast<const unsigned char *>(text.data());
  const unsigned char *end = p + text.size();
  uint32_t c = 0;
  ASSERT_EQ(DecodeUtf8(p, end, c), 0);
  EXPECT_EQ(c, 0x61u);
  ASSERT_EQ(DecodeUtf8(p, end, c), 0);
  EXPECT_EQ(c, 0xE9u);
  ASSERT_EQ(DecodeUtf8(p, end, c), 0);
  EXPECT_EQ(c, 0x20ACu);
  const unsigned char *surrogate = p;
  EXPECT_EQ(DecodeUtf8(p, end, c), kvpath::kUtf8Surrogate);
  EXPECT_EQ(p, surrogate);
}

TEST(DecodeUtf8Unchecked, DecodesValidTextLikeTheCheckedDecoder) {
  const std::string text = "A\xC3\xA9\xE2\x82\xAC\xF0\x9F\x98\x80";
  const uint32_t expected[] = {0x41, 0xE9, 0x20AC, 0x1F600};
  const unsigned char *p = reinterpret_cast<const unsigned char *>(text.data());
  const unsigned char *end = p + text.size();
  for (uint32_t value : expected) {
    ASSERT_LT(p, end);
    EXPECT_EQ(DecodeUtf8Unchecked(p, end), value);
  }
  EXPECT_EQ(p, end);
}

TEST(DecodeUtf8Unchecked, NeverReadsPastTheEndOfATruncatedSequence) {
  const unsigned char text[] = {0xF0, 0x9F};
  const unsigned char *p = text;
  DecodeUtf8Unchecked(p, text + 2);
  EXPECT_EQ(p, text + 2);
}

}  // namespace
