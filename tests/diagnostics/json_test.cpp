// The JSON status record and its in-place writer and reader: the buffer's growth, sentinel and
// worst-of rule, members written down to the last byte, and documents read back, with text placed
// at the very end of a heap block so that a read past its NUL is caught by the address sanitiser.
#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <stdexcept>
#include <string>
#include <tuple>
#include <vector>

#include "diagnostics/json_status.h"
#include "diagnostics/json_status_guard.h"
#include "diagnostics/jsonz.h"
#include "diagnostics/overr_exception.h"

namespace {

using namespace nKVSVAPI100;

// The layout that every buffer keeps: document, NUL, zeros, 'J' in the last byte.
void ExpectLayout(const char *buffer, size_t size, const std::string &document) {
  ASSERT_NE(buffer, nullptr);
  EXPECT_EQ(std::string(buffer, size),
            document + std::string(size - document.size() - 1, '\0') + "J");
}

// `text` with its NUL as the last byte of an allocation of exactly that size.
std::unique_ptr<char[]> Exact(const std::string &text) {
  std::unique_ptr<char[]> bytes(new char[text.size() + 1]);
  std::memcpy(bytes.get(), text.c_str(), text.size() + 1);
  return bytes;
}

TEST(JsonStatus, BuffersGrowInPowersOfTwoFrom512KeepingTheDocument) {
  tJsonStatus status;
  for (const auto &[request, capacity] : std::vector<std::pair<size_t, uint32_t>>{
           {1, 512}, {512, 512}, {513, 1024}, {1025, 2048}, {70000, 131072}}) {
    ASSERT_TRUE(GrowJsonStatusBuffer(&status, request)) << request;
    EXPECT_EQ(status.capacity, capacity) << request;
    ExpectLayout(status.buffer, status.capacity, "{}");
    ReleaseJsonStatus(status);
  }
  // Reserving room grows an existing buffer too; a request from 2^31 on fails and leaves it.
  ASSERT_NE(jsonz::AddString(ReserveJsonRoom(status, 20), "k", "v"), nullptr);
  const char *cursor = ReserveJsonRoom(status, 600);
  EXPECT_EQ(cursor, status.buffer + 8);
  EXPECT_EQ(status.capacity, 1024u);
  EXPECT_FALSE(GrowJsonStatusBuffer(&status, size_t{1} << 31));
  EXPECT_EQ(ReserveJsonRoom(status, 0x7FFFFFFE), nullptr);
  ExpectLayout(status.buffer, 1024, "{\"k\":\"v\"}");
  ReleaseJsonStatus(status);
  // A document must leave a byte for the sentinel.
  char buffer[8];
  EXPECT_EQ(jsonz::StoreDocument(buffer, sizeof buffer, "[12345]"), nullptr);
}

TEST(JsonStatus, WorstCodeWinsAndAnAcceptedCodeResetsTheDocument) {
  const std::tuple<int32_t, int32_t, bool> cases[] = {
      {0, 0, false}, {0, 5, true},    {0, -3, true},  {5, 7, false},
      {5, -3, true}, {-3, -4, false}, {-3, 5, false}, {5, 0, false}};
  for (const auto &[current, offered, accepted] : cases) {
    tJsonStatus status;
    ASSERT_NE(jsonz::AddInt32(ReserveJsonRoom(status, 10), "x", 1), nullptr);
    status.code = current;
    EXPECT_EQ(SetJsonStatus(status, offered), accepted) << current << " then " << offered;
    EXPECT_EQ(status.code, accepted ? offered : current) << current << " then " << offered;
    EXPECT_STREQ(status.buffer, accepted ? "{}" : "{\"x\":1}");
    ReleaseJsonStatus(status);
  }
}

bool NeverGrows(tJsonStatus *status, size_t size) {
  return size == 0 && GrowJsonStatusBuffer(status, 0);
}

// A second heap grower, so that two statuses count as differently grown.
bool OtherGrow(tJsonStatus *status, size_t size) { return GrowJsonStatusBuffer(status, size); }

TEST(JsonStatus, AnErrorHasItsHeaderMembersGrowsUntilAMemberFitsAndMovesWithItsCode) {
  tJsonStatus status;
  char *cursor = SetJsonStatusError(status, -52006, "ovapalerr_resourceNotFound", "src/x.cpp", 42);
  const std::string value(3000, 'v');
  const std::string document =
      "{\"error_constant\":\"ovapalerr_resourceNotFound\",\"file\":\"src/x.cpp\",\"line\":42,"
      "\"component\":\"kvsvapi\",\"long\":\"" +
      value + "\"}";
  cursor = jsonz::AddString(cursor, "long", value.c_str(), {&GrowJsonStatusRetry, &status});
  EXPECT_EQ(cursor, status.buffer + document.size() - 1);
  ExpectLayout(status.buffer, 4096, document);
  // A second error is refused by the worst-of rule and writes nothing.
  EXPECT_EQ(SetJsonStatusError(status, -1, "other", "y", 1), nullptr);
  // A status of another grower gets a copy; one of the same grower takes the buffer over.
  tJsonStatus copied, taken;
  copied.grow = &OtherGrow;
  const char *buffer = status.buffer;
  for (tJsonStatus *target : {&copied, &taken}) {
    bool kept = false;
    MoveJsonStatus(*target, status, &kept);
    EXPECT_TRUE(kept);
    EXPECT_EQ(target->code, -52006);
    ExpectLayout(target->buffer, target->capacity, document);
  }
  EXPECT_NE(copied.buffer, buffer);
  EXPECT_EQ(taken.buffer, buffer);
  EXPECT_EQ(status.buffer, nullptr);
  // A member that does not fit writes nothing once the buffer cannot grow.
  taken.grow = &NeverGrows;
  EXPECT_EQ(jsonz::AddString(cursor, "more", value.c_str(), {&GrowJsonStatusRetry, &taken}),
            nullptr);
  ExpectLayout(taken.buffer, 4096, document);
  ReleaseJsonStatus(copied);
  ReleaseJsonStatus(taken);
}

TEST(JsonStatusGuard, ANegativeCodeThrowsTheDocumentAtTheEndOfTheScope) {
  std::string detail = "not thrown";
  try {
    cJsonStatusGuard guard;
    SetJsonStatusError(guard.Status(), -52008, "ovapalerr_osFault", "f.cpp", 9);
  } catch (const overr::Exception &error) {
    EXPECT_EQ(error.Code(), -52008);
    detail = error.what();
  }
  EXPECT_EQ(detail,
            "{\"error_constant\":\"ovapalerr_osFault\",\"file\":\"f.cpp\",\"line\":9,"
            "\"component\":\"kvsvapi\"}");
  // No throw while another exception is in flight.
  EXPECT_THROW(
      {
        cJsonStatusGuard guard;
        SetJsonStatus(guard.Status(), -1);
        throw std::runtime_error("first");
      },
      std::runtime_error);
}

TEST(JsonzWriter, CommasPlacementAndRoomDownToTheLastByte) {
  // Buffer size, document, cursor, key, result (null: no room, and nothing moves), and where the
  // returned cursor points. A member may fill the buffer up to the NUL and the 'J'; its comma and
  // the escapes of its key count.
  using tCase = std::tuple<size_t, const char *, size_t, const char *, const char *, size_t>;
  // clang-format off
  const tCase cases[] = {
      {64, "{}", 1, "k", "{\"k\":1}", 6},                  // closing brace of an empty object
      {64, "{}", 0, "k", "{\"k\":1}", 6},                  // opening brace of an empty object
      {64, "{ }", 2, "k", "{ \"k\":1}", 7},                // white space counts as empty
      {64, "{\"a\":1}", 6, "k", "{\"a\":1,\"k\":1}", 12},   // closing brace: comma before
      {64, "{\"a\":1}", 0, "k", "{\"k\":1,\"a\":1}", 6},    // opening brace: comma behind
      {64, "{\"a\":1,\"b\":2}", 6, "k", "{\"a\":1,\"k\":1,\"b\":2}", 12},  // on a comma
      {64, "{\"o\":{}}", 6, "k", "{\"o\":{\"k\":1}}", 11},  // inside a nested object
      {9, "{}", 1, "k", "{\"k\":1}", 6},  {8, "{}", 1, "k", nullptr, 0},
      {16, "{\"a\":1}", 6, "\n", "{\"a\":1,\"\\n\":1}", 13},
      {15, "{\"a\":1}", 6, "\n", nullptr, 0}};
  // clang-format on
  for (const auto &[size, document, cursor, key, result, next] : cases) {
    SCOPED_TRACE(testing::Message() << size << " " << document << " at " << cursor);
    std::vector<char> buffer(size);
    jsonz::StoreDocument(buffer.data(), size, document);
    EXPECT_EQ(jsonz::AddInt32(buffer.data() + cursor, key, 1),
              result != nullptr ? buffer.data() + next : nullptr);
    ExpectLayout(buffer.data(), size, result != nullptr ? result : document);
  }
}

TEST(JsonzWriter, ValueFormsAndEscapes) {
  char buffer[256];
  char *cursor = jsonz::StoreDocument(buffer, sizeof buffer, "{}");
  cursor = jsonz::AddString(cursor, "s\b\t\n\f\r", "q\"b\\/\xc3\xa9\x01\x1f\x7f");
  cursor = jsonz::AddInt32(cursor, "i", -2147483647 - 1);
  cursor = jsonz::AddUint32(cursor, "u", 4294967295u);
  cursor = jsonz::AddUint64(cursor, "w", 18446744073709551615ull);
  char *inner = jsonz::AddString(jsonz::AddObject(cursor, "o"), "x", "y");
  ASSERT_NE(jsonz::AddInt32(jsonz::LeaveObject(inner), "after", 0), nullptr);
  const std::string document =
      "{\"s\\b\\t\\n\\f\\r\":\"q\\\"b\\\\/\xc3\xa9\\u0001\\u001f\\u007f\",\"i\":-2147483648,"
      "\"u\":4294967295,\"w\":18446744073709551615,\"o\":{\"x\":\"y\"},\"after\":0}";
  ExpectLayout(buffer, sizeof buffer, document);
  EXPECT_EQ(jsonz::EscapedSize("\b\"\x01\x7f/a"), 2u + 2 + 6 + 6 + 1 + 1);
  // A missing value writes nothing.
  EXPECT_EQ(jsonz::AddString(buffer + 1, "k", nullptr), nullptr);
  EXPECT_EQ(buffer, document);
}

TEST(JsonzReader, ValueKindsAndErrorsWithTheirPosition) {
  using namespace jsonz;
  const std::string deep(100000, '[');
  // Text, kind, its length (the error code for an error), whether a number is real (where an
  // error stands). When every parser fails at once the first one's error stands; nesting too deep
  // is refused at the first bracket too many, not recursed into.
  using tCase = std::tuple<const char *, uint32_t, uint64_t, size_t>;
  // clang-format off
  const tCase cases[] = {
      {"null", kKindNull, 0, 0},                      {"true", kKindBoolean, 1, 0},
      {"false", kKindBoolean, 0, 0},                  {"-12", kKindNumber, 3, 0},
      {"1.5", kKindNumber, 3, 1},                     {"2e-3", kKindNumber, 4, 1},
      {"\"a b\\n\\u00e9\"", kKindString, 11, 0},        {" [1, {\"a\": [ ]} ]", kKindArray, 0, 0},
      {"{\"a\" : 1 , \"b\":\"x\"}", kKindObject, 0, 0},
      {"{\"a\":1,}", kKindError, kErrorTrailingComma, 7},
      {"{\"a\" 1}", kKindError, kErrorColonExpected, 5},
      {"{\"a\":1 \"b\":2}", kKindError, kErrorCommaExpected, 7},
      {"{\"a\":1", kKindError, kErrorObject, 6},      {"[1,", kKindError, kErrorArray, 3},
      {"\"abc", kKindError, kErrorString, 4},        {"\"a\x01\"", kKindError, kErrorEscape, 2},
      {"\"\\x\"", kKindError, kErrorEscape, 1},       {"\"\\u12g4\"", kKindError, kErrorEscape, 1},
      {"1e+", kKindError, kErrorValueExpected, 3},    {"tru", kKindError, kErrorValueExpected, 3},
      {"{} x", kKindError, kErrorTrailingChar, 3},    {"x", kKindError, kErrorString, 0},
      {"", kKindError, kErrorString, 0},
      {deep.c_str(), kKindError, kErrorString, 512}};
  // clang-format on
  for (const auto &[text, kind, length, where] : cases) {
    SCOPED_TRACE(std::string(text).substr(0, 20));
    const auto exact = Exact(text);
    const tValue value = ParseDocument(exact.get());
    EXPECT_EQ(value.kind, kind);
    EXPECT_EQ(value.length, length);
    EXPECT_EQ(kind == kKindError ? size_t(value.start - exact.get()) : value.isReal, where);
  }
  EXPECT_EQ(ParseValue(nullptr).length, kErrorValueExpected);
}

TEST(JsonzReader, KeysAreComparedUnescapedAndValuesReadAsStringsOrIntegers) {
  const auto document = Exact(
      " {\"a\":1, \"n\":{\"a\":2}, \"t\\u0061b\":\"x\\\"y\", \"a\":3, \"r\":-2.5e1, \"big\":1e20, "
      "\"o\":010, \"\\ud83d\\ude00\":\"7\"}");
  // key, the string read raw (or "-" for none), the integer read (-1 for none)
  using tCase = std::tuple<const char *, const char *, int32_t>;
  // clang-format off
  const tCase cases[] = {{"a", "-", 1},    {"n", "-", -1},          {"tab", "x\\\"y", -1},
                         {"r", "-", -25},  {"big", "-", 2147483647}, {"o", "-", 8},
                         {"\xf0\x9f\x98\x80", "7", -1},          {"t", "-", -1}};
  // clang-format on
  for (const auto &[key, string, integer] : cases) {
    SCOPED_TRACE(key);
    const char *value = jsonz::JsonFindKey(document.get(), key);
    size_t length = 0;
    const char *end = nullptr;
    const char *raw = jsonz::JsonReadString(value, "-", &length, &end);
    EXPECT_EQ(std::string(raw, length), string);
    EXPECT_EQ(end != nullptr, std::strcmp(string, "-") != 0);
    EXPECT_EQ(jsonz::JsonReadInt(value, -1, &end), integer);
    EXPECT_EQ(end != nullptr, integer != -1);
  }
  // Nothing is found outside an object, nor behind a member that cannot be read.
  for (const char *text : {"[{\"a\":1}]", "{}", "{\"b\":[1,}, \"a\":1}", "{\"b\" 1}",
                           "{\"b\":1 \"a\":2}", "{\"b\":1,", ""}) {
    EXPECT_EQ(jsonz::JsonFindKey(Exact(text).get(), "a"), nullptr) << text;
  }
  EXPECT_EQ(jsonz::JsonFindKey(nullptr, "a"), nullptr);
}

TEST(JsonzUnescape, DecodesEscapesAndSurrogatePairsWithinTheGivenLength) {
  // escaped text, decoded text (null: a bad escape)
  // The halves of a pair are not checked: a low half first still combines if the result is in
  // range, up to 0x1FFFFF.
  // clang-format off
  const std::tuple<const char *, const char *> cases[] = {
      {"plain", "plain"},  {"\\\"\\\\\\/\\b\\f\\n\\r\\t", "\"\\/\b\f\n\r\t"},
      {"\\u0041\\u00e9\\u20AC", "A\xc3\xa9\xe2\x82\xac"},  {"\\ud83d\\ude00!", "\xf0\x9f\x98\x80!"},
      {"\\udc00\\ud800", "\xf4\x8f\xb0\x80"},  {"\\udfff\\uffff", nullptr},
      {"\\ud83d", nullptr},  {"\\ud83dx", nullptr},  {"\\ud83d\\n", nullptr},
      {"\\x", nullptr},      {"\\u12g4", nullptr},   {"end\\", nullptr}};
  // clang-format on
  for (const auto &[escaped, decoded] : cases) {
    const size_t length = std::strlen(escaped);
    std::unique_ptr<char[]> target(new char[length + 1]);
    char *end = jsonz::JsonUnescape(escaped, length, target.get());
    EXPECT_EQ(end == nullptr ? "<bad>" : std::string(target.get(), end),
              decoded ? decoded : "<bad>")
        << escaped;
  }
  // An escape cut by the length is bad: the bytes behind it are not looked at.
  char target[16];
  EXPECT_EQ(jsonz::JsonUnescape("ab\\u0041", 5, target), nullptr);
  EXPECT_EQ(jsonz::JsonUnescape("ab\\u0041", 2, target), target + 2);
  EXPECT_STREQ(target, "ab");
}

}  // namespace
