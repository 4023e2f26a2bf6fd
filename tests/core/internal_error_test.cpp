// The internal-error reporter: one status for the caller, one record for the log, and a log that
// is built at the first report and retried until it can be built.
#include "core/internal_error.h"

#include <gtest/gtest.h>

#include "support/fake_error_log.h"

namespace {

using namespace nKVSVAPI100;
using kvsvtest::cFakeErrorLog;
using kvsvtest::eBuild;

constexpr uint32_t kReportBase = 0x3FF63000;
constexpr uint32_t kReportMask = 0x7FFFC000;

TEST(ReportInternalError, WithoutALogStillReturnsInternal) {
  ASSERT_EQ(GetErrorLog(), nullptr);
  EXPECT_EQ(ReportInternalError(13, 16, 782, 0), kvErrInternal);
  EXPECT_EQ(ReportInternalError(13, 16, 782, 0), kvErrInternal);
}

TEST(ReportInternalError, WritesOneSystemServiceRecordWithTheReportersFamily) {
  cFakeErrorLog log;
  EXPECT_EQ(ReportInternalError(13, 16, 782, 0xBFFA0123), kvErrInternal);

  const auto records = log.Records();
  ASSERT_EQ(records.size(), 1u);
  const tInternalStatus &value = records[0].value;
  EXPECT_TRUE(value.Failed());
  EXPECT_EQ(value.Kind(), uint32_t{tInternalStatus::kSystemService});
  EXPECT_EQ(value.Component(), 13u);
  EXPECT_EQ(value.File(), 16u);
  EXPECT_EQ(value.Line(), 782u);
  EXPECT_EQ(value.info, 0xBFFA0123u);
  EXPECT_EQ(records[0].base, kReportBase);
  EXPECT_EQ(records[0].mask, kReportMask);
}

TEST(ReportInternalError, BuildsTheLogOnlyAtTheFirstReport) {
  cFakeErrorLog log;
  EXPECT_EQ(log.Builds(), 0);
  for (uint32_t line = 1; line <= 3; ++line)
    EXPECT_EQ(ReportInternalError(13, 9, line, 0), kvErrInternal);
  EXPECT_EQ(log.Builds(), 1);
  const auto records = log.Records();
  ASSERT_EQ(records.size(), 3u);
  for (uint32_t i = 0; i < 3; ++i) EXPECT_EQ(records[i].value.Line(), i + 1);
}

TEST(ReportInternalError, WhenTheBuildFailsReturnsInternalAndTheNextReportBuildsAgain) {
  const struct {
    const char *name;
    eBuild build;
    bool logged;  // whether the failed build's report is written nonetheless
  } cases[] = {
      {"standard exception", eBuild::kThrowStandard, false},
      {"foreign exception", eBuild::kThrowOther, false},
      {"negative code", eBuild::kNegativeCode, false},
      // A warning left by the builder is not a failure: the log counts as built.
      {"positive code", eBuild::kPositiveCode, true},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.name);
    cFakeErrorLog log;
    log.SetBuild(c.build);
    EXPECT_EQ(ReportInternalError(13, 10, 100, 7), kvErrInternal);
    EXPECT_EQ(log.Builds(), 1);
    EXPECT_EQ(log.Records().size(), c.logged ? 1u : 0u);

    log.SetBuild(eBuild::kSucceed);
    EXPECT_EQ(ReportInternalError(13, 10, 101, 8), kvErrInternal);
    EXPECT_EQ(log.Builds(), c.logged ? 1 : 2);
    const auto records = log.Records();
    ASSERT_FALSE(records.empty());
    EXPECT_EQ(records.back().value.Line(), 101u);
    EXPECT_EQ(records.back().value.info, 8u);
  }
}

TEST(ReportInternalError, NoRecordWhenTheLogObjectIsAbsentAndNoRebuild) {
  cFakeErrorLog log;
  log.SetAvailable(false);
  EXPECT_EQ(ReportInternalError(13, 2, 5, 0), kvErrInternal);
  log.SetAvailable(true);
  EXPECT_EQ(ReportInternalError(13, 2, 6, 0), kvErrInternal);
  EXPECT_EQ(log.Builds(), 1);
  const auto records = log.Records();
  ASSERT_EQ(records.size(), 1u);
  EXPECT_EQ(records[0].value.Line(), 6u);
}

TEST(ReportInternalError, ALogThatThrowsOnWritingDoesNotReachTheCaller) {
  cFakeErrorLog log;
  log.SetWriteThrows(true);
  EXPECT_EQ(ReportInternalError(13, 3, 9, 0), kvErrInternal);
  EXPECT_TRUE(log.Records().empty());
}

}  // namespace
