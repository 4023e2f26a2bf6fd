// The status record's buffer: growth sizes, the sentinel layout, the worst-of rule, moving, and
// the guard that turns an error into an exception.
#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "diagnostics/json_status.h"
#include "diagnostics/json_status_guard.h"
#include "diagnostics/jsonz.h"
#include "diagnostics/overr_exception.h"

namespace {

using namespace nKVSVAPI100;

// The layout that every buffer keeps: document, NUL, zeros, 'J' in the last byte.
void ExpectLayout(const tJsonStatus &status, const std::string &document) {
  ASSERT_NE(status.buffer, nullptr);
  EXPECT_STREQ(status.buffer, document.c_str());
  for (size_t i = document.size(); i + 1 < status.capacity; ++i) {
    ASSERT_EQ(status.buffer[i], '\0') << "byte " << i;
  }
  EXPECT_EQ(status.buffer[status.capacity - 1], 'J');
}

TEST(JsonStatusGrowth, RequestsAreRoundedToPowersOfTwoFrom512) {
  const struct {
    size_t request;
    uint32_t capacity;
  } cases[] = {{1, 512}, {512, 512}, {513, 1024}, {1024, 1024}, {1025, 2048}, {70000, 131072}};
  for (const auto &c : cases) {
    tJsonStatus status;
    ASSERT_TRUE(GrowJsonStatusBuffer(&status, c.request)) << c.request;
    EXPECT_EQ(status.capacity, c.capacity) << c.request;
    ExpectLayout(status, "{}");
    ReleaseJsonStatus(status);
    EXPECT_EQ(status.buffer, nullptr);
    EXPECT_EQ(status.capacity, 0u);
  }
}

TEST(JsonStatusGrowth, ANewBlockKeepsTheDocumentAndRequestsFrom2To31FailLeavingItAlone) {
  tJsonStatus status;
  char *cursor = ReserveJsonRoom(status, 20);
  ASSERT_NE(jsonz::AddString(cursor, "k", "v"), nullptr);
  ASSERT_TRUE(GrowJsonStatusBuffer(&status, 3000));
  EXPECT_EQ(status.capacity, 4096u);
  ExpectLayout(status, "{\"k\":\"v\"}");
  char *before = status.buffer;
  EXPECT_FALSE(GrowJsonStatusBuffer(&status, size_t{1} << 31));
  EXPECT_EQ(status.buffer, before);
  EXPECT_EQ(status.capacity, 4096u);
  ExpectLayout(status, "{\"k\":\"v\"}");
  ReleaseJsonStatus(status);
}

TEST(JsonStatusStore, TheDocumentMustLeaveOneByteForTheSentinel) {
  char buffer[8];
  std::memset(buffer, 'x', sizeof buffer);
  // Six characters, their NUL and the 'J' fill eight bytes exactly.
  ASSERT_NE(jsonz::StoreDocument(buffer, sizeof buffer, "[1234]"), nullptr);
  EXPECT_STREQ(buffer, "[1234]");
  EXPECT_EQ(buffer[7], 'J');
  EXPECT_EQ(jsonz::StoreDocument(buffer, sizeof buffer, "[12345]"), nullptr);
  char *last = jsonz::StoreDocument(buffer, sizeof buffer, "{}");
  ASSERT_NE(last, nullptr);
  EXPECT_EQ(*last, '}');
  EXPECT_EQ(std::string(buffer, 8), std::string("{}\0\0\0\0\0J", 8));
}

TEST(JsonStatusCode, WorstOfRule) {
  const struct {
    int32_t current;
    int32_t offered;
    bool accepted;
    int32_t result;
  } cases[] = {
      {0, 0, false, 0},   {0, 5, true, 5},     {0, -3, true, -3},  {5, 7, false, 5},
      {5, -3, true, -3},  {-3, -4, false, -3}, {-3, 5, false, -3}, {5, 0, false, 5},
  };
  for (const auto &c : cases) {
    tJsonStatus status;
    status.code = c.current;
    EXPECT_EQ(SetJsonStatus(status, c.offered), c.accepted) << c.current << " " << c.offered;
    EXPECT_EQ(status.code, c.result) << c.current << " " << c.offered;
  }
}

TEST(JsonStatusCode, AnAcceptedCodeResetsTheDocument) {
  tJsonStatus status;
  ASSERT_NE(SetJsonStatusError(status, 5, "warning", "f.cpp", 1), nullptr);
  ASSERT_STRNE(status.buffer, "{}");
  ASSERT_TRUE(SetJsonStatus(status, -1));
  ExpectLayout(status, "{}");
  ASSERT_NE(jsonz::AddInt32(ReserveJsonRoom(status, 10), "x", 1), nullptr);
  EXPECT_FALSE(SetJsonStatus(status, -2));
  EXPECT_STREQ(status.buffer, "{\"x\":1}");
  ReleaseJsonStatus(status);
}

TEST(JsonStatusReserve, LimitsAndGrowth) {
  tJsonStatus status;
  EXPECT_EQ(ReserveJsonRoom(status, 0x7FFFFFFE), nullptr);
  EXPECT_EQ(status.buffer, nullptr);
  char *cursor = ReserveJsonRoom(status, 600);
  ASSERT_NE(cursor, nullptr);
  EXPECT_EQ(status.capacity, 1024u);
  EXPECT_EQ(cursor, status.buffer + 1);
  EXPECT_EQ(*cursor, '}');
  tJsonStatus fixed;
  fixed.grow = nullptr;
  EXPECT_EQ(ReserveJsonRoom(fixed, 1), nullptr);
  ReleaseJsonStatus(status);
}

TEST(JsonStatusRetry, AddsGrowTheBufferUntilTheyFit) {
  tJsonStatus status;
  char *cursor = ReserveJsonRoom(status, 1);
  const jsonz::tRetry retry{&GrowJsonStatusRetry, &status};
  const std::string value(3000, 'v');
  cursor = jsonz::AddString(cursor, "long", value.c_str(), retry);
  ASSERT_NE(cursor, nullptr);
  EXPECT_EQ(status.capacity, 4096u);
  ExpectLayout(status, "{\"long\":\"" + value + "\"}");
  EXPECT_EQ(*cursor, '}');
  ReleaseJsonStatus(status);
}

bool NeverGrows(tJsonStatus *status, size_t size) { return size == 0 && GrowJsonStatusBuffer(status, 0); }

TEST(JsonStatusRetry, AGrowThatFailsLeavesAValidDocument) {
  tJsonStatus status;
  ASSERT_NE(ReserveJsonRoom(status, 1), nullptr);
  status.grow = &NeverGrows;
  const jsonz::tRetry retry{&GrowJsonStatusRetry, &status};
  const std::string value(600, 'v');
  char *cursor = jsonz::AddString(status.buffer + 1, "a", "b", retry);
  ASSERT_NE(cursor, nullptr);
  EXPECT_EQ(jsonz::AddString(cursor, "long", value.c_str(), retry), nullptr);
  ExpectLayout(status, "{\"a\":\"b\"}");
  EXPECT_EQ(jsonz::ParseDocument(status.buffer).kind, jsonz::kKindObject);
  ReleaseJsonStatus(status);
}

// A second heap grower, so that two statuses count as differently grown.
bool OtherGrow(tJsonStatus *status, size_t size) { return GrowJsonStatusBuffer(status, size); }

TEST(JsonStatusMove, SameGrowerHandsTheBufferOverOtherwiseTheTextIsCopied) {
  for (const bool sameGrower : {true, false}) {
    tJsonStatus source;
    ASSERT_NE(SetJsonStatusError(source, -7, "e", "f.cpp", 3), nullptr);
    const std::string document = source.buffer;
    char *sourceBuffer = source.buffer;
    tJsonStatus target;
    if (!sameGrower) target.grow = &OtherGrow;
    bool kept = false;
    MoveJsonStatus(target, source, &kept);
    EXPECT_TRUE(kept);
    EXPECT_EQ(target.code, -7);
    EXPECT_STREQ(target.buffer, document.c_str());
    EXPECT_EQ(target.buffer == sourceBuffer, sameGrower);
    EXPECT_EQ(source.buffer == nullptr, sameGrower);
    ReleaseJsonStatus(source);
    ReleaseJsonStatus(target);
  }
}

TEST(JsonStatusError, HeaderMembersInOrder) {
  tJsonStatus status;
  char *cursor = SetJsonStatusError(status, -52006, "ovapalerr_resourceNotFound", "src/x.cpp", 42);
  ASSERT_NE(cursor, nullptr);
  EXPECT_STREQ(status.buffer,
               "{\"error_constant\":\"ovapalerr_resourceNotFound\",\"file\":\"src/x.cpp\","
               "\"line\":42,\"component\":\"kvsvapi\"}");
  EXPECT_EQ(status.code, -52006);
  EXPECT_EQ(SetJsonStatusError(status, -1, "other", "y", 1), nullptr);
  ReleaseJsonStatus(status);
}

TEST(JsonStatusGuard, ANegativeCodeThrowsACopyAtTheEndOfTheScope) {
  std::string detail;
  try {
    cJsonStatusGuard guard;
    SetJsonStatusError(guard.Status(), -52008, "ovapalerr_osFault", "f.cpp", 9);
    detail = guard.Status().buffer;
  } catch (const overr::Exception &error) {
    EXPECT_EQ(error.Code(), -52008);
    EXPECT_EQ(error.Detail(), detail);
    EXPECT_STREQ(error.what(), detail.c_str());
    const overr::ExceptionBase &base = error;
    EXPECT_EQ(base.Code(), -52008);
    return;
  }
  FAIL() << "no exception";
}

TEST(JsonStatusGuard, NoThrowForSuccessWarningOrAnExceptionInFlight) {
  EXPECT_NO_THROW({
    cJsonStatusGuard guard;
    SetJsonStatusError(guard.Status(), 3, "warning", "f.cpp", 1);
  });
  EXPECT_THROW(
      {
        cJsonStatusGuard guard;
        SetJsonStatus(guard.Status(), -1);
        throw std::runtime_error("first");
      },
      std::runtime_error);
}

TEST(OverrException, CopiesOwnTheirDocument) {
  tJsonStatus status;
  SetJsonStatusError(status, -3, "e", "f", 1);
  overr::Exception first(status);
  ReleaseJsonStatus(status);
  overr::Exception second(first);
  EXPECT_NE(first.Status().buffer, second.Status().buffer);
  EXPECT_STREQ(first.Detail(), second.Detail());
  EXPECT_NE(std::string(second.Detail()).find("\"error_constant\":\"e\""), std::string::npos);
  tJsonStatus bare;
  bare.code = -9;
  overr::Exception noDocument(bare);
  EXPECT_STREQ(noDocument.Detail(), "");
  EXPECT_EQ(noDocument.Code(), -9);
}

}  // namespace
