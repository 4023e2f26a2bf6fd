// The in-place writer: placement of members and commas, escaping, and the room check against the
// sentinel down to the last byte.
#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "diagnostics/jsonz.h"

namespace {

// A buffer of exactly `size` bytes holding `document` in the sentinel layout.
struct tBuffer {
  tBuffer(size_t size, const char *document) : bytes(size, '?') {
    last = jsonz::StoreDocument(bytes.data(), size, document);
  }
  char *At(size_t offset) { return bytes.data() + offset; }
  std::string Text() const { return bytes.data(); }
  std::vector<char> bytes;
  char *last;
};

TEST(JsonzWriter, CommasAndPlacementByCursor) {
  const struct {
    const char *document;
    size_t cursor;
    const char *result;
    size_t next;  // where the returned cursor points
  } cases[] = {
      {"{}", 1, "{\"k\":1}", 6},                       // closing brace of an empty object
      {"{}", 0, "{\"k\":1}", 6},                       // opening brace of an empty object
      {"{ }", 2, "{ \"k\":1}", 7},                     // white space inside counts as empty
      {"{\"a\":1}", 6, "{\"a\":1,\"k\":1}", 12},       // closing brace: comma before
      {"{\"a\":1}", 0, "{\"k\":1,\"a\":1}", 6},        // opening brace: comma behind
      {"{\"a\":1,\"b\":2}", 6, "{\"a\":1,\"k\":1,\"b\":2}", 12},  // on a comma: between
      {"{\"o\":{}}", 6, "{\"o\":{\"k\":1}}", 11},      // inside a nested object
  };
  for (const auto &c : cases) {
    tBuffer buffer(64, c.document);
    char *next = jsonz::AddInt32(buffer.At(c.cursor), "k", 1);
    ASSERT_NE(next, nullptr) << c.document;
    EXPECT_EQ(buffer.Text(), c.result) << c.document << " at " << c.cursor;
    EXPECT_EQ(next - buffer.At(0), static_cast<std::ptrdiff_t>(c.next)) << c.document;
    EXPECT_EQ(buffer.bytes.back(), 'J');
  }
}

TEST(JsonzWriter, ValueForms) {
  tBuffer buffer(256, "{}");
  char *cursor = buffer.last;
  cursor = jsonz::AddString(cursor, "s", "text");
  cursor = jsonz::AddInt32(cursor, "i", -2147483647 - 1);
  cursor = jsonz::AddUint32(cursor, "u", 4294967295u);
  cursor = jsonz::AddUint64(cursor, "w", 18446744073709551615ull);
  char *inner = jsonz::AddObject(cursor, "o");
  ASSERT_NE(inner, nullptr);
  EXPECT_EQ(*inner, '}');
  inner = jsonz::AddString(inner, "x", "y");
  cursor = jsonz::AddInt32(jsonz::LeaveObject(inner), "after", 0);
  ASSERT_NE(cursor, nullptr);
  EXPECT_EQ(buffer.Text(),
            "{\"s\":\"text\",\"i\":-2147483648,\"u\":4294967295,\"w\":18446744073709551615,"
            "\"o\":{\"x\":\"y\"},\"after\":0}");
  EXPECT_EQ(jsonz::LeaveObject(nullptr), nullptr);
  // Null arguments give null and write nothing.
  const std::string before = buffer.Text();
  EXPECT_EQ(jsonz::AddString(nullptr, "k", "v"), nullptr);
  EXPECT_EQ(jsonz::AddString(cursor, nullptr, "v"), nullptr);
  EXPECT_EQ(jsonz::AddString(cursor, "k", nullptr), nullptr);
  EXPECT_EQ(buffer.Text(), before);
}

TEST(JsonzWriter, Escapes) {
  const struct {
    const char *raw;
    const char *escaped;
  } cases[] = {
      {"\b\t\n\f\r", "\\b\\t\\n\\f\\r"},
      {"q\"b\\", "q\\\"b\\\\"},
      {"\x01\x1f", "\\u0001\\u001f"},
      {"\x7f", "\\u007f"},
      {"/\xc3\xa9", "/\xc3\xa9"},  // slash and UTF-8 bytes as they are
  };
  for (const auto &c : cases) {
    tBuffer buffer(128, "{}");
    ASSERT_NE(jsonz::AddString(buffer.last, c.raw, c.raw), nullptr);
    EXPECT_EQ(buffer.Text(), std::string("{\"") + c.escaped + "\":\"" + c.escaped + "\"}");
    EXPECT_EQ(jsonz::EscapedSize(c.raw), std::strlen(c.escaped));
  }
}

// "{}" plus a member of `size` bytes: the buffer is the document, its NUL and the 'J'.
TEST(JsonzWriter, AMemberThatFillsTheBufferToTheLastByteFits) {
  // {"k":"vvvv"} is 12 characters: 12 + NUL + J = 14 bytes.
  tBuffer exact(14, "{}");
  char *cursor = jsonz::AddString(exact.last, "k", "vvvv");
  ASSERT_NE(cursor, nullptr);
  EXPECT_EQ(exact.Text(), "{\"k\":\"vvvv\"}");
  EXPECT_EQ(exact.bytes[12], '\0');
  EXPECT_EQ(exact.bytes[13], 'J');
  // Full: even the smallest member is refused, and nothing moves.
  const std::vector<char> before = exact.bytes;
  EXPECT_EQ(jsonz::AddInt32(cursor, "", 1), nullptr);
  EXPECT_EQ(jsonz::AddObject(exact.At(0), "o"), nullptr);
  EXPECT_EQ(exact.bytes, before);

  // One byte short.
  tBuffer tight(13, "{}");
  EXPECT_EQ(jsonz::AddString(tight.last, "k", "vvvv"), nullptr);
  EXPECT_EQ(tight.Text(), "{}");
  EXPECT_EQ(tight.bytes[12], 'J');
}

TEST(JsonzWriter, TheCommaAndEscapesCountInTheRoomCheck) {
  // {"a":1} + ,"\n":1 = 7 + 7 = 14 characters: 16 bytes fit, 15 do not.
  for (const size_t size : {size_t{15}, size_t{16}}) {
    tBuffer buffer(size, "{\"a\":1}");
    char *next = jsonz::AddInt32(buffer.At(6), "\n", 1);
    EXPECT_EQ(next != nullptr, size == 16) << size;
    EXPECT_EQ(buffer.Text(), size == 16 ? "{\"a\":1,\"\\n\":1}" : "{\"a\":1}");
  }
}

// A retry that hands over a bigger buffer once and then gives up.
struct tSwap {
  tBuffer *bigger;
  int calls = 0;
};

char *SwapOnce(char *, void *arg) {
  tSwap *swap = static_cast<tSwap *>(arg);
  ++swap->calls;
  if (swap->calls > 1) return nullptr;
  return swap->bigger->last;
}

TEST(JsonzWriter, RetryStopsWhenTheFunctionGivesUp) {
  tBuffer small(8, "{}");
  tBuffer bigger(64, "{}");
  tSwap swap{&bigger};
  const jsonz::tRetry retry{&SwapOnce, &swap};
  ASSERT_NE(jsonz::AddString(small.last, "key", "value", retry), nullptr);
  EXPECT_EQ(swap.calls, 1);
  EXPECT_EQ(bigger.Text(), "{\"key\":\"value\"}");
  const std::string huge(100, 'h');
  EXPECT_EQ(jsonz::AddString(bigger.last, "key", huge.c_str(), retry), nullptr);
  EXPECT_EQ(swap.calls, 2);
  EXPECT_EQ(jsonz::AddString(small.last, "key", "value", jsonz::tRetry{}), nullptr);
}

}  // namespace
