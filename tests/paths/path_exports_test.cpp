// The path text exports through the shared library, with the table's defaults.
#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "kvsvapi.h"
#include "paths/paths_test_support.h"
#include "svsim.h"

namespace {

using kvsvtest::cScopedEnv;
using kvsvtest::cTempDir;
using kvsvtest::IsDirectory;

constexpr kvsvStatus kInternal = static_cast<kvsvStatus>(0xBFF63001);

kvsvStatus SizeOf(const std::string &name, uint64_t *size) {
  return kvsvPathGetMultibyteStringSizeInBytes(name.data(), name.size(), size);
}

std::string ReadHostString(SvHandle handle) {
  char text[512];
  svsimReadString(handle, text, sizeof text);
  return text;
}

class PathExports : public ::testing::Test {
 protected:
  void SetUp() override { svsimReset(); }
  cTempDir dir_;
  cScopedEnv xdg_{"XDG_CONFIG_HOME", dir_.Sub("cfg/")};
};

TEST_F(PathExports, SizeIsLengthPlusOneForEachName) {
  const std::pair<std::string, std::string> cases[] = {
      {"eAliasFileDir", "/var/lib/kvor"},
      {"eDatabaseCacheDir", "/var/lib/kvor/dbCache"},
      {"eDatabaseEditorSettingsIniDir", dir_.Sub("cfg/kvor")},
      {"eErrorLogDir", "/var/lib/kvor/log"},
      {"eTemporarySessionTextFileDir", "/var/lib/kvor"},
      {"eDatabaseConfigDir", dir_.Sub("cfg/kvor")},
  };
  for (const auto &c : cases) {
    uint64_t size = 0;
    ASSERT_EQ(SizeOf(c.first, &size), 0) << c.first;
    EXPECT_EQ(size, c.second.size() + 1) << c.first;
    std::vector<char> buffer(size, 'x');
    ASSERT_EQ(kvsvPathGetMultibyteString(c.first.data(), c.first.size(), size, buffer.data()), 0);
    EXPECT_EQ(std::string(buffer.data()), c.second);
  }
  EXPECT_TRUE(IsDirectory(dir_.Sub("cfg/kvor")));
}

TEST_F(PathExports, BufferOfExactSizeWorksAndOneLessIsRefusedUntouched) {
  const std::string name = "eErrorLogDir";
  uint64_t size = 0;
  ASSERT_EQ(SizeOf(name, &size), 0);
  std::vector<char> buffer(size + 8, 'x');
  EXPECT_EQ(kvsvPathGetMultibyteString(name.data(), name.size(), size - 1, buffer.data()),
            kInternal);
  EXPECT_EQ(std::string(buffer.data(), buffer.size()), std::string(buffer.size(), 'x'));
  EXPECT_EQ(kvsvPathGetMultibyteString(name.data(), name.size(), size, buffer.data()), 0);
  EXPECT_STREQ(buffer.data(), "/var/lib/kvor/log");
  EXPECT_EQ(buffer[size], 'x') << "nothing beyond bufferSize is written";
}

TEST_F(PathExports, TheRestOfALargeBufferIsFilledWithNul) {
  const std::string name = "eErrorLogDir";
  std::vector<char> buffer(64, 'x');
  ASSERT_EQ(kvsvPathGetMultibyteString(name.data(), name.size(), buffer.size(), buffer.data()), 0);
  for (size_t i = std::strlen("/var/lib/kvor/log"); i < buffer.size(); ++i) {
    ASSERT_EQ(buffer[i], '\0') << i;
  }
}

TEST_F(PathExports, OnlyNameLengthBytesAreRead) {
  const char text[] = "eErrorLogDirAndMore";
  uint64_t size = 0;
  EXPECT_EQ(kvsvPathGetMultibyteStringSizeInBytes(text, 12, &size), 0);
  EXPECT_EQ(size, std::strlen("/var/lib/kvor/log") + 1);
  EXPECT_EQ(kvsvPathGetMultibyteStringSizeInBytes(text, 11, &size), kInternal);
  EXPECT_EQ(kvsvPathGetMultibyteStringSizeInBytes(text, 19, &size), kInternal);
}

TEST_F(PathExports, UnknownAndEmptyNamesAreInternalErrors) {
  for (const std::string &name : {std::string(), std::string("eerrorlogdir"),
                                  std::string("eErrorLogDir "), std::string("kind3")}) {
    uint64_t size = 99;
    EXPECT_EQ(SizeOf(name, &size), kInternal) << name;
    EXPECT_EQ(size, 99u);
    char buffer[64] = "untouched";
    EXPECT_EQ(kvsvPathGetMultibyteString(name.data(), name.size(), sizeof buffer, buffer),
              kInternal);
    EXPECT_STREQ(buffer, "untouched");
  }
  uint64_t size = 0;
  EXPECT_EQ(kvsvPathGetMultibyteStringSizeInBytes(nullptr, 0, &size), kInternal);
}

TEST_F(PathExports, NullPointersGiveNullArgument) {
  uint64_t size = 0;
  char buffer[8];
  EXPECT_EQ(kvsvPathGetMultibyteStringSizeInBytes("eErrorLogDir", 12, nullptr), kvErrNullArgument);
  EXPECT_EQ(kvsvPathGetMultibyteStringSizeInBytes(nullptr, 12, &size), kvErrNullArgument);
  EXPECT_EQ(kvsvPathGetMultibyteString("eErrorLogDir", 12, 64, nullptr), kvErrNullArgument);
  EXPECT_EQ(kvsvPathGetMultibyteString(nullptr, 3, sizeof buffer, buffer), kvErrNullArgument);
}

TEST_F(PathExports, AFileSystemFailureOnTheConfigurationKindsIsAnInternalError) {
  dir_.WriteFile("plain", "x");
  cScopedEnv xdg("XDG_CONFIG_HOME", dir_.Sub("plain/below"));
  for (const std::string name : {"eDatabaseEditorSettingsIniDir", "eDatabaseConfigDir"}) {
    uint64_t size = 0;
    EXPECT_EQ(SizeOf(name, &size), kInternal) << name;
    char buffer[256];
    EXPECT_EQ(kvsvPathGetMultibyteString(name.data(), name.size(), sizeof buffer, buffer),
              kInternal);
  }
  // The same kinds with a usable directory work again at the next call: nothing is cached.
  cScopedEnv good("XDG_CONFIG_HOME", dir_.Sub("good"));
  uint64_t size = 0;
  EXPECT_EQ(SizeOf("eDatabaseConfigDir", &size), 0);
  EXPECT_EQ(size, dir_.Sub("good/kvor").size() + 1);
}

TEST_F(PathExports, HostStringReceivesTheText) {
  SvHandle name = svsimMakeString("eDatabaseCacheDir");
  SvHandle text = svsimMakeString("old");
  ASSERT_NE(name, nullptr);
  ASSERT_NE(text, nullptr);
  EXPECT_EQ(kvsvGetPathMultibyteStringAsSvStr(name, text), 0);
  EXPECT_EQ(ReadHostString(text), "/var/lib/kvor/dbCache");
  svDisposeHandle(name);
  svDisposeHandle(text);
}

TEST_F(PathExports, HostStringNameFailures) {
  SvHandle text = svsimMakeString("old");
  ASSERT_NE(text, nullptr);
  EXPECT_EQ(kvsvGetPathMultibyteStringAsSvStr(nullptr, text), kInternal);
  SvHandle empty = svsimMakeString("");
  EXPECT_EQ(kvsvGetPathMultibyteStringAsSvStr(empty, text), kInternal);
  SvHandle lower = svsimMakeString("eerrorlogdir");
  EXPECT_EQ(kvsvGetPathMultibyteStringAsSvStr(lower, text), kInternal);
  EXPECT_EQ(ReadHostString(text), "old");
  svDisposeHandle(empty);
  svDisposeHandle(lower);
  svDisposeHandle(text);
}

TEST_F(PathExports, AHostStringThatCannotBeStoredIsAnInternalError) {
  SvHandle name = svsimMakeString("eErrorLogDir");
  SvHandle text = svsimMakeString("old");
  ASSERT_NE(name, nullptr);
  ASSERT_NE(text, nullptr);
  svsimFailAll(1);
  EXPECT_EQ(kvsvGetPathMultibyteStringAsSvStr(name, text), kInternal);
  svsimFailAll(0);
  EXPECT_GT(svsimInjectedFaults(), 0u);
  svDisposeHandle(name);
  svDisposeHandle(text);
}

}  // namespace
