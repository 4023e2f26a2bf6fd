// Where the project session file lies, by the host's run mode, and the exports that stand for no
// driver session.
#include <gtest/gtest.h>

#include <string>

#include "paths/paths_test_support.h"
#include "paths/relocation_root.h"
#include "session/project_session_support.h"
#include "session/run_mode.h"
#include "session/session_file_path.h"
#include "support/fake_error_log.h"

namespace {

using namespace nKVSVAPI100;

const kvsvtest::cRelocationRoot gRoot;

class ProjectLocation : public testing::Test {
 protected:
  void SetUp() override {
    kvsimReset();
    svsimReset();
    svsimSetAppPath(application_.Path().c_str());
  }
  void TearDown() override {
    kvsimReset();
    svsimReset();
  }

  kvsvtest::cTempDir application_;
};

TEST_F(ProjectLocation, BuiltApplicationsKeepTheFileBesideThemselves) {
  const std::string development = gRoot.Path() + "/var/lib/kvor/kvorSession.txt";
  const std::string beside = application_.Path() + "/kvorSession.txt";
  struct Case {
    int32_t bound, runTime, fullFeature;
    bool built;
  } cases[] = {
      {0, 0, 0, false}, {1, 0, 0, false}, {0, 1, 1, false},
      {1, 1, 0, true},  {1, 0, 1, true},  {7, 7, 7, true},
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(testing::Message() << c.bound << c.runTime << c.fullFeature);
    svsimSetRunMode(c.bound, c.runTime, c.fullFeature);
    bool built = !c.built;
    EXPECT_EQ(GetRunMode(built), 0);
    EXPECT_EQ(built, c.built);
    std::string path;
    EXPECT_EQ(GetSessionFilePath(path), 0);
    EXPECT_EQ(path, c.built ? beside : development);
    EXPECT_EQ(svsimLivePaths(), 0u);
  }
}

TEST_F(ProjectLocation, HostPathFailuresAreReported) {
  svsimSetRunMode(1, 1, 0);
  const uint64_t liveHandles = svsimLiveHandles();
  // The first allocation is the host path, the second the text of it.
  for (uint32_t failing : {1u, 2u}) {
    SCOPED_TRACE(failing);
    kvsvtest::cFakeErrorLog log;
    svsimFailAllocAt(failing);
    std::string path = "unchanged";
    EXPECT_EQ(GetSessionFilePath(path), kvErrInternal);
    EXPECT_EQ(path, "unchanged");
    const auto records = log.Records();
    ASSERT_EQ(records.size(), 1u);
    EXPECT_EQ(records[0].value.File(), 14u);
    EXPECT_EQ(svsimLivePaths(), 0u);
    EXPECT_EQ(svsimLiveHandles(), liveHandles);
  }
}

TEST_F(ProjectLocation, ManualCreateNeedsTheFileLocation) {
  svsimSetRunMode(1, 1, 0);
  kvsvtest::cFakeErrorLog log;
  kvsvRefnum reference = 0;
  svsimFailAllocAt(1);
  EXPECT_EQ(kvsvSessionManualCreate(":memory:", "", "Speed", "CAN1", kvMode_SignalInSinglePoint,
                                    &reference),
            kvErrInternal);
  EXPECT_EQ(kvsimCountCalls("kvCreateSession"), 0);
  EXPECT_EQ(svsimRefCount(), 0);

  EXPECT_EQ(kvsvSessionManualCreate(":memory:", "", "Speed", "CAN1", kvMode_SignalInSinglePoint,
                                    &reference),
            0);
  EXPECT_EQ(kvsimOpenSessionCount(), 1);
  SvsimRefInfo info{};
  ASSERT_EQ(svsimGetRef(0, &info), 1);
  EXPECT_EQ(kvsvSessionClear(info.handle, reference), 0);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
}

TEST_F(ProjectLocation, InternalSessionExports) {
  uint32_t session = 0;
  EXPECT_EQ(kvsvSessionInternalOpen(nullptr, &session), 0);
  EXPECT_EQ(session, 0xDEADFAB4u);
  EXPECT_EQ(kvsvSessionInternalClose(), 0);
  EXPECT_EQ(kvsimLogCount(), 0);

  SvHandle source = svsimMakeString("CAN1 session");
  SvHandle target = nullptr;
  EXPECT_EQ(kvsvInternalHandleToRef(nullptr, &source, nullptr, &target), 0);
  char text[32] = {};
  EXPECT_EQ(svsimReadString(target, text, sizeof text), 12);
  EXPECT_STREQ(text, "CAN1 session");
  EXPECT_NE(target, source);
  EXPECT_EQ(kvsvInternalHandleToRef(nullptr, nullptr, nullptr, &target), kvErrNullArgument);
  svDisposeHandle(source);
  svDisposeHandle(target);
}

}  // namespace
