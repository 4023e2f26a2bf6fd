// Loading libraries and symbols: the handle or address on success, the detail document on failure.
#include <gtest/gtest.h>

#include <dlfcn.h>

#include <string>

#include "diagnostics/json_status.h"
#include "diagnostics/jsonz.h"
#include "diagnostics/ovdynlib.h"

namespace {

using namespace nKVSVAPI100;

// The decoded text of a string member, or "<absent>".
std::string Member(const char *object, const char *key) {
  const char *value = jsonz::JsonFindKey(object, key);
  if (value == nullptr) return "<absent>";
  size_t length = 0;
  const char *end = nullptr;
  const char *raw = jsonz::JsonReadString(value, nullptr, &length, &end);
  if (end == nullptr) return std::to_string(jsonz::JsonReadInt(value, -1, nullptr));
  std::string decoded(length + 1, '\0');
  if (jsonz::JsonUnescape(raw, length, &decoded[0]) == nullptr) return "<bad>";
  return decoded.c_str();
}

constexpr int kLoadNowGlobal = RTLD_NOW | RTLD_GLOBAL;

TEST(Ovdynlib, LoadsALibraryAndFindsASymbol) {
  tJsonStatus status;
  void *library = ovdynlib_load("libm.so.6", kLoadNowGlobal, status);
  ASSERT_NE(library, nullptr);
  EXPECT_NE(ovdynlib_symbol(library, "cos", status), nullptr);
  EXPECT_EQ(status.code, 0);
  EXPECT_EQ(status.buffer, nullptr);
  ovdynlib_close(library);
}

TEST(Ovdynlib, AMissingLibraryOrSymbolIsDescribed) {
  tJsonStatus status;
  EXPECT_EQ(ovdynlib_load("libkvsv-no-such-library.so.9", kLoadNowGlobal, status), nullptr);
  EXPECT_EQ(status.code, -52005);
  ASSERT_NE(status.buffer, nullptr);
  ASSERT_EQ(jsonz::ParseDocument(status.buffer).kind, jsonz::kKindObject) << status.buffer;
  EXPECT_EQ(Member(status.buffer, "error_constant"), "ovapalerr_invalidParameter");
  EXPECT_EQ(Member(status.buffer, "file"), "src/diagnostics/ovdynlib.cpp");
  EXPECT_EQ(Member(status.buffer, "line"), "110");
  EXPECT_EQ(Member(status.buffer, "component"), "kvsvapi");
  const char *debug = jsonz::JsonFindKey(status.buffer, "ovdynlib_debug");
  EXPECT_EQ(Member(debug, "debug"), "failed to ovdynlib_load library");
  EXPECT_EQ(Member(debug, "path"), "libkvsv-no-such-library.so.9");
  const char *internal = jsonz::JsonFindKey(status.buffer, "internal_error");
  EXPECT_EQ(Member(internal, "api"), "dlerror");
  EXPECT_NE(Member(internal, "string").find("libkvsv-no-such-library.so.9"), std::string::npos);
  // Order of the members as written.
  const std::string text = status.buffer;
  EXPECT_LT(text.find("\"error_constant\""), text.find("\"file\""));
  EXPECT_LT(text.find("\"component\""), text.find("\"ovdynlib_debug\""));
  EXPECT_LT(text.find("\"ovdynlib_debug\""), text.find("\"internal_error\""));
  ReleaseJsonStatus(status);

  tJsonStatus symbol;
  void *library = ovdynlib_load("libm.so.6", kLoadNowGlobal, symbol);
  ASSERT_NE(library, nullptr);
  EXPECT_EQ(ovdynlib_symbol(library, "kvsv_no_such_symbol", symbol), nullptr);
  EXPECT_EQ(symbol.code, -52005);
  EXPECT_EQ(Member(symbol.buffer, "line"), "185");
  debug = jsonz::JsonFindKey(symbol.buffer, "ovdynlib_debug");
  EXPECT_EQ(Member(debug, "debug"), "failed to ovdynlib_load library");
  EXPECT_EQ(Member(debug, "ovdynlib_symbol"), "kvsv_no_such_symbol");
  EXPECT_EQ(Member(debug, "path"), "<absent>");
  internal = jsonz::JsonFindKey(symbol.buffer, "internal_error");
  EXPECT_NE(Member(internal, "string").find("kvsv_no_such_symbol"), std::string::npos);
  ovdynlib_close(library);
  ReleaseJsonStatus(symbol);
}

TEST(Ovdynlib, AnEarlierErrorStopsBothAndStaysAnEarlierWarningGivesWay) {
  tJsonStatus failed;
  failed.code = -7;
  EXPECT_EQ(ovdynlib_load("libm.so.6", kLoadNowGlobal, failed), nullptr);
  EXPECT_EQ(ovdynlib_symbol(RTLD_DEFAULT, "cos", failed), nullptr);
  EXPECT_EQ(failed.code, -7);
  EXPECT_EQ(failed.buffer, nullptr);
  tJsonStatus warned;
  warned.code = 4;
  EXPECT_EQ(ovdynlib_load("libkvsv-no-such-library.so.9", kLoadNowGlobal, warned), nullptr);
  EXPECT_EQ(warned.code, -52005);
  EXPECT_EQ(Member(warned.buffer, "line"), "110");
  ReleaseJsonStatus(warned);
}

}  // namespace
