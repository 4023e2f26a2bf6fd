// Host paths: empty paths, the application path, and the round trip through string handles.
#include <gtest/gtest.h>

#include <cstring>
#include <filesystem>
#include <string>

#include "host_fixture.h"

namespace {

using Paths = HostTest;

// The path's text through a handle that starts too small, so that it must grow in place.
std::string PathText(SvPath path) {
  SvHandle text = svNewHandleClr(4);
  SvHandle kept = text;
  EXPECT_EQ(svPathToString(path, &text), 0);
  EXPECT_EQ(text, kept);
  const std::string value = Text(text);
  svDisposeHandle(text);
  return value;
}

TEST_F(Paths, TheApplicationPathDefaultsToTheExecutablesDirectory) {
  const std::string expected = std::filesystem::read_symlink("/proc/self/exe").parent_path();
  SvPath path = svEmptyPath(0);
  EXPECT_EQ(svsimLivePaths(), 1u);
  EXPECT_EQ(PathText(path), "");
  EXPECT_EQ(svPathCText(path), nullptr) << "an empty path has no text";
  for (const char *set :
       {"/a/rather/long/application/directory", static_cast<const char *>(nullptr)}) {
    svsimSetAppPath(set);
    ASSERT_EQ(svAppPath(path), 0);
    EXPECT_EQ(PathText(path), set != nullptr ? set : expected);
  }
  EXPECT_EQ(svDestroyPath(path), 0);
  EXPECT_EQ(svsimLivePaths(), 0u);
}

TEST_F(Paths, TextsGoThroughPathsUnchangedAndAGivenPathIsReused) {
  SvPath reused = svEmptyPath(0);
  for (const char *text : {"/tmp/kvorSession.txt", "relative/dir", "/a b/ü.txt"}) {
    SCOPED_TRACE(text);
    SvHandle source = svsimMakeString(text);
    SvPath path = nullptr;
    ASSERT_EQ(svStringToPath(source, &path), 0);
    EXPECT_EQ(PathText(path), text);
    SvHandle cText = svPathCText(path);
    ASSERT_NE(cText, nullptr);
    EXPECT_EQ(svGetHandleSize(cText), std::strlen(text) + 1);
    EXPECT_STREQ(static_cast<const char *>(*cText), text);

    SvPath kept = reused;
    ASSERT_EQ(svStringToPath(source, &reused), 0);
    EXPECT_EQ(reused, kept);
    EXPECT_EQ(PathText(reused), text);
    svDisposeHandle(cText);
    svDisposeHandle(source);
    svDestroyPath(path);
  }
  EXPECT_EQ(svsimLivePaths(), 1u);
  ASSERT_EQ(svStringToPath(nullptr, &reused), 0);
  EXPECT_EQ(PathText(reused), "") << "a null handle is the empty text";
  svDestroyPath(reused);
}

TEST_F(Paths, AllocationFaultsAndNullArgumentsAreReported) {
  svsimFailAllocAt(1);
  EXPECT_EQ(svEmptyPath(0), nullptr);
  SvHandle text = svsimMakeString("/x");
  SvPath path = nullptr;
  svsimFailAllocAt(1);
  EXPECT_EQ(svStringToPath(text, &path), SVSIM_ERR_MEMORY);
  EXPECT_EQ(path, nullptr);
  ASSERT_EQ(svStringToPath(text, &path), 0);
  svsimFailAllocAt(1);
  EXPECT_EQ(svPathCText(path), nullptr);
  SvHandle out = nullptr;
  svsimFailAllocAt(1);
  EXPECT_EQ(svPathToString(path, &out), SVSIM_ERR_MEMORY);
  EXPECT_EQ(out, nullptr);
  ASSERT_EQ(svPathToString(path, &out), 0) << "a null handle is made";
  EXPECT_EQ(Text(out), "/x");
  svDisposeHandle(out);

  EXPECT_EQ(svAppPath(nullptr), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svPathToString(nullptr, &text), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svStringToPath(nullptr, nullptr), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svPathCText(nullptr), nullptr);
  EXPECT_EQ(svDestroyPath(nullptr), 0);
  svDisposeHandle(text);
  svDestroyPath(path);
}

}  // namespace
