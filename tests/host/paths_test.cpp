// Host paths: empty paths, the application path, and the round trip through string handles.
#include <gtest/gtest.h>

#include <cstring>
#include <filesystem>
#include <string>

#include "host_fixture.h"

namespace {

using Paths = HostTest;

std::string PathText(SvPath path) {
  SvHandle text = nullptr;
  EXPECT_EQ(svPathToString(path, &text), 0);
  const std::string value = Text(text);
  svDisposeHandle(text);
  return value;
}

TEST_F(Paths, AnEmptyPathHasNoText) {
  SvPath path = svEmptyPath(0);
  ASSERT_NE(path, nullptr);
  EXPECT_EQ(svsimLivePaths(), 1u);
  EXPECT_EQ(PathText(path), "");
  EXPECT_EQ(svPathCText(path), nullptr);
  EXPECT_EQ(svDestroyPath(path), 0);
  EXPECT_EQ(svsimLivePaths(), 0u);
}

TEST_F(Paths, TheApplicationPathDefaultsToTheExecutablesDirectory) {
  const std::string expected = std::filesystem::read_symlink("/proc/self/exe").parent_path();
  SvPath path = svEmptyPath(0);
  ASSERT_EQ(svAppPath(path), 0);
  EXPECT_EQ(PathText(path), expected);

  svsimSetAppPath("/opt/built app");
  ASSERT_EQ(svAppPath(path), 0);
  EXPECT_EQ(PathText(path), "/opt/built app");

  svsimSetAppPath(nullptr);
  ASSERT_EQ(svAppPath(path), 0);
  EXPECT_EQ(PathText(path), expected);
  svDestroyPath(path);
}

TEST_F(Paths, TextsGoThroughPathsUnchanged) {
  for (const char *text : {"/tmp/kvorSession.txt", "relative/dir", "/a b/ü.txt"}) {
    SvHandle source = svsimMakeString(text);
    SvPath path = nullptr;
    ASSERT_EQ(svStringToPath(source, &path), 0) << text;
    ASSERT_NE(path, nullptr);
    EXPECT_EQ(PathText(path), text);

    SvHandle cText = svPathCText(path);
    ASSERT_NE(cText, nullptr);
    EXPECT_EQ(svGetHandleSize(cText), std::strlen(text) + 1);
    EXPECT_STREQ(static_cast<const char *>(*cText), text);
    svDisposeHandle(cText);
    svDisposeHandle(source);
    svDestroyPath(path);
  }
}

TEST_F(Paths, StringToPathReusesAGivenPath) {
  SvPath path = svEmptyPath(0);
  SvPath kept = path;
  SvHandle text = svsimMakeString("/etc/x");
  ASSERT_EQ(svStringToPath(text, &path), 0);
  EXPECT_EQ(path, kept);
  EXPECT_EQ(svsimLivePaths(), 1u);
  EXPECT_EQ(PathText(path), "/etc/x");
  ASSERT_EQ(svStringToPath(nullptr, &path), 0);
  EXPECT_EQ(PathText(path), "") << "a null handle is the empty text";
  svDisposeHandle(text);
  svDestroyPath(path);
}

TEST_F(Paths, PathToStringGrowsAnExistingHandle) {
  SvPath path = svEmptyPath(0);
  svsimSetAppPath("/a/rather/long/application/directory");
  ASSERT_EQ(svAppPath(path), 0);
  SvHandle text = svNewHandleClr(4);
  SvHandle kept = text;
  ASSERT_EQ(svPathToString(path, &text), 0);
  EXPECT_EQ(text, kept);
  EXPECT_EQ(Text(text), "/a/rather/long/application/directory");
  svDisposeHandle(text);
  svDestroyPath(path);
}

TEST_F(Paths, AllocationFaultsReachPaths) {
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
  svDisposeHandle(text);
  svDestroyPath(path);
}

TEST_F(Paths, NullArguments) {
  SvHandle text = nullptr;
  EXPECT_EQ(svAppPath(nullptr), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svPathToString(nullptr, &text), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svStringToPath(nullptr, nullptr), SVSIM_ERR_ARGUMENT);
  EXPECT_EQ(svPathCText(nullptr), nullptr);
  EXPECT_EQ(svDestroyPath(nullptr), 0);
}

using PathsDeathTest = HostTest;

TEST_F(PathsDeathTest, APathDestroyedTwiceStopsTheProcess) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  SvPath path = svEmptyPath(0);
  svDestroyPath(path);
  EXPECT_DEATH(svDestroyPath(path), "svDestroyPath.*not a live path");
}

}  // namespace
