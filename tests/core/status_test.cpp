// The library's statuses: the internal status word and its public form, the managers' status
// block, the library's exception and what an export makes of whatever was thrown, the reporter of
// internal errors, and the status texts, which belong to the driver.
#include <gtest/gtest.h>

#include <array>
#include <cstring>
#include <exception>
#include <new>
#include <stdexcept>
#include <string>
#include <tuple>

#include "core/exception_base.h"
#include "core/exception_to_status.h"
#include "core/public_status.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "support/fake_error_log.h"

namespace {

using namespace nKVSVAPI100;
using kvsvtest::eBuild;
using E = cExceptionBase;

// The location word: failed | component << 26 | file << 16 | kind << 14 | line.
constexpr uint32_t At(uint32_t component, uint32_t file, uint32_t kind, uint32_t line) {
  return 1u << 31 | component << 26 | file << 16 | kind << 14 | line;
}

TEST(ExceptionBase, EachConstructorKeepsTheFirstFailureAndShowsItsInfoWord) {
  const std::tuple<E, uint32_t, uint32_t, const char *> cases[] = {
      {{E::tUser{}, 22, 1, 76, 0xBFF63258}, At(22, 1, 1, 76), 0xBFF63258, "0xBFF63258"},
      // The internal kind always carries info 1.
      {{E::tInternal{}, 22, 1, 59}, At(22, 1, 2, 59), 1, "0x00000001"},
      {{E::tSystemService{}, 13, 14, 154, 0xABC}, At(13, 14, 3, 154), 0xABC, "0x00000ABC"},
      // Fields wider than their bits are cut and do not spill into their neighbours.
      {{E::tUser{}, 33, 0x401, 0x4001, 7}, 0x84014001, 7, "0x00000007"}};
  for (const auto &[exception, location, info, text] : cases) {
    SCOPED_TRACE(text);
    EXPECT_STREQ(static_cast<const std::exception &>(exception).what(), text);
    tInternalStatus status = *exception.Status();
    status.SetSystemServiceFailure(1, 2, 3, 4);
    status.SetInternalFailure(1, 2, 3);
    status.SetUserFailure(1, 2, 3, 4);
    EXPECT_EQ(status.location, location);
    EXPECT_EQ(status.info, info);
  }
}

TEST(ToPublicStatus, ByKindAndFamily) {
  constexpr uint32_t kPath = 0x7FFFFC00, kReport = 0x7FFFC000;
  const uint32_t user = At(22, 1, 1, 76), service = At(22, 1, 3, 76);
  // location, info, mask, public status, kind afterwards
  const std::array<uint32_t, 5> cases[] = {
      {0, 0xBFF63258, kPath, 0, 0},
      // A user code of the family keeps its low bits; any other becomes the family's
      // internal error, and the value is marked internal from then on.
      {user, 0xBFF63259, kPath, 0xBFF63259, 1},
      {user, 0xBFF67258, kPath, 0xBFF63001, 2},
      {service, 0xBFF63258, kPath, 0xBFF63001, 3},
      // The reporter's wider mask keeps fourteen low bits and a family of its own.
      {user, 0xBFF63258, kReport, 0xBFF63258, 1},
      {service, 0, kReport, 0xBFF60001, 3},
      // Bit 31 of the result is the failed flag, not bit 31 of the code.
      {user, 0x3FF63258, kPath, 0xBFF63258, 1},
      {user & 0x7FFFFFFF, 0xBFF63258, kPath, 0x3FF63258, 1}};
  for (const auto &[location, info, mask, expected, kindAfter] : cases) {
    SCOPED_TRACE(testing::Message() << std::hex << location << " " << info);
    tInternalStatus value;
    value.location = location;
    value.info = info;
    EXPECT_EQ(static_cast<uint32_t>(ToPublicStatus(value, 0x3FF63000, mask)), expected);
    EXPECT_EQ(value.location, (location & ~(3u << 14)) | (kindAfter << 14));
    EXPECT_EQ(value.info, info);
  }
}

TEST(StatusBlock, WorstCodeWinsAndThePlaceGoesWithIt) {
  const std::tuple<int64_t, int64_t, bool> cases[] = {
      {0, -52003, true}, {0, 7, true},    {0, 0, false},  {7, -5, true}, {7, 9, false},
      {7, 0, false},     {-5, -9, false}, {-5, 7, false}, {-5, 0, false}};
  for (const auto &[held, given, stored] : cases) {
    SCOPED_TRACE(testing::Message() << held << " then " << given);
    tStatusBlock block;
    SetStatusBlock(block, held, "first", "first.cpp", 10);
    EXPECT_EQ(SetStatusBlock(block, given, "second", "second.cpp", 20), stored);
    EXPECT_EQ(block.code, stored ? given : held);
    const std::string place = stored ? "second" : held != 0 ? "first" : "";
    EXPECT_EQ(block.component, place);
    EXPECT_EQ(block.file, place.empty() ? place : place + ".cpp");
    EXPECT_EQ(block.line, stored ? 20u : held != 0 ? 10u : 0u);
  }
  // A block smaller than the full one takes the code but has no room for the place.
  tStatusBlock small;
  small.size = 16;
  EXPECT_TRUE(SetStatusBlock(small, -52003, "kvsvapi", "core.cpp", 655));
  EXPECT_EQ(small.code, -52003);
  EXPECT_EQ(small.line, 0u);
}

TEST(StatusBlock, ComponentAndPathAreCutToFit) {
  for (size_t length : {0, 100, 101, 4096}) {
    // Every character tells its position, so that a cut one off shows.
    std::string path;
    for (size_t i = 0; i < length; ++i) path += static_cast<char>('!' + i % 90);
    tStatusBlock block;
    ASSERT_TRUE(SetStatusBlock(block, -1, "kvsvapi-session", path.c_str(), 1));
    EXPECT_STREQ(block.component, "kvsvapi-s");
    // A long path keeps its start and its end around "..".
    EXPECT_EQ(block.file,
              length <= 100 ? path : path.substr(0, 49) + ".." + path.substr(length - 49));
  }
}

// Classifies `thrown` as an export's catch-all would.
Status Classify(const std::exception_ptr &thrown, Status (*form)()) {
  try {
    std::rethrow_exception(thrown);
  } catch (...) {
    return form();
  }
}

TEST(ExceptionToStatus, PathShowsFamilyCodesAndRunModeReportsWhatItDoesNotExpect) {
  const auto user = [](uint32_t code) {
    return std::make_exception_ptr(E(E::tUser{}, 22, 1, 63, code));
  };
  // thrown, status on the path, status in run mode, reported line (0: none) and info
  const std::tuple<std::exception_ptr, Status, Status, uint32_t, uint32_t> cases[] = {
      {user(0xBFF63258), kvErrBufferTooSmall, kvErrInternal, 154, 0xBFF63258},
      {user(0xBFF63259), kvErrNullBuffer, kvErrInternal, 154, 0xBFF63259},
      {user(0x80001234), kvErrInternal, kvErrInternal, 154, 0x80001234},
      {std::make_exception_ptr(E(E::tInternal{}, 22, 1, 59)), kvErrInternal, kvErrInternal, 154, 1},
      {std::make_exception_ptr(std::bad_alloc()), kvErrOutOfMemory, kvErrOutOfMemory, 0, 0},
      {std::make_exception_ptr(std::logic_error("x")), kvErrInternal, kvErrInternal, 162,
       0xBFF63001}};
  for (const auto &[thrown, path, runMode, line, info] : cases) {
    SCOPED_TRACE(path);
    kvsvtest::cFakeErrorLog log;
    EXPECT_EQ(Classify(thrown, &ExceptionToStatusPath), path);
    EXPECT_TRUE(log.Records().empty());
    EXPECT_EQ(Classify(thrown, &ExceptionToStatusRunMode), runMode);
    const auto records = log.Records();
    ASSERT_EQ(records.size(), line != 0 ? 1u : 0u);
    if (line == 0) continue;
    EXPECT_EQ(records[0].value.location, At(13, 14, 3, line));
    EXPECT_EQ(records[0].value.info, info);
  }
  // Whatever is no standard exception goes on to the host's own catch-all in run mode.
  EXPECT_EQ(Classify(std::make_exception_ptr(42), &ExceptionToStatusPath), kvErrInternal);
  EXPECT_THROW(Classify(std::make_exception_ptr(42), &ExceptionToStatusRunMode), int);
}

TEST(ReportInternalError, BuildsTheLogOnceAndRetriesALogThatCouldNotBeHad) {
  // what the build does, whether the log is there, whether it throws on writing, the builds and
  // records after a second report, which finds a working log
  const std::tuple<eBuild, bool, bool, int, size_t> cases[] = {
      {eBuild::kSucceed, true, false, 1, 2},      {eBuild::kThrowStandard, true, false, 2, 1},
      {eBuild::kThrowOther, true, false, 2, 1},   {eBuild::kNegativeCode, true, false, 2, 1},
      {eBuild::kPositiveCode, true, false, 1, 2},  // a warning: the log counts as built
      {eBuild::kSucceed, false, false, 1, 1},     {eBuild::kSucceed, true, true, 1, 1}};
  for (const auto &[build, available, writeThrows, builds, written] : cases) {
    SCOPED_TRACE(testing::Message() << int(build) << available << writeThrows);
    kvsvtest::cFakeErrorLog log;
    log.SetBuild(build);
    log.SetAvailable(available);
    log.SetWriteThrows(writeThrows);
    EXPECT_EQ(ReportInternalError(13, 10, 100, 7), kvErrInternal);
    log.SetBuild(eBuild::kSucceed);
    log.SetAvailable(true);
    log.SetWriteThrows(false);
    EXPECT_EQ(ReportInternalError(13, 16, 101, 0xBFFA0123), kvErrInternal);
    EXPECT_EQ(log.Builds(), builds);
    const auto records = log.Records();
    ASSERT_EQ(records.size(), written);
    EXPECT_EQ(records.back().value.location, At(13, 16, 3, 101));
    EXPECT_EQ(records.back().value.info, 0xBFFA0123u);
    // Shown in the library's family by the top bits only.
    EXPECT_EQ(records.back().base, 0x3FF63000u);
    EXPECT_EQ(records.back().mask, 0x7FFFC000u);
  }
}

TEST(StatusText, IsTheDriversTextForTheStatusAndSize) {
  for (const int32_t status : {int32_t{kvsimErrTimeout}, int32_t{kvErrInternal}}) {
    for (const uint32_t size : {256u, 6u, 0u}) {
      char ours[300], drivers[300];
      std::memset(ours, '#', sizeof ours);
      std::memset(drivers, '#', sizeof drivers);
      kvStatusToString(status, size, drivers);
      kvsvStatusToString(status, size, ours);
      EXPECT_EQ(std::memcmp(ours, drivers, sizeof ours), 0) << status << " " << size;
    }
  }
}

}  // namespace
