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

TEST_F(PathExports, BufferOfExactSizeWorksOneLessIsRefusedUntouchedAndMoreIsFilledWithNul) {
  const std::string name = "eErrorLogDir";
  const size_t length = std::strlen("/var/lib/kvor/log");
  uint64_t size = 0;
  ASSERT_EQ(SizeOf(name, &size), 0);
  std::vector<char> buffer(64, 'x');
  EXPECT_EQ(kvsvPathGetMultibyteString(name.data(), name.size(), size - 1, buffer.data()),
            kInternal);
  EXPECT_EQ(std::string(buffer.data(), buffer.size()), std::string(buffer.size(), 'x'));
  EXPECT_EQ(kvsvPathGetMultibyteString(name.data(), name.size(), size, buffer.data()), 0);
  EXPECT_STREQ(buffer.data(), "/var/lib/kvor/log");
  EXPECT_EQ(buffer[size], 'x') << "nothing beyond bufferSize is written";
  ASSERT_EQ(kvsvPathGetMultibyteString(name.data(), name.size(), buffer.size(), buffer.data()), 0);
  EXPECT_EQ(std::string(buffer.data() + length, buffer.size() - length),
            std::string(buffer.size() - length, '\0'));
}

TEST_F(PathExports, OnlyNameLengthBytesAreReadAndRefusedCallsTouchNothing) {
  const char text[] = "eErrorLogDirAndMore";
  uint64_t size = 0;
  EXPECT_EQ(kvsvPathGetMultibyteStringSizeInBytes(text, 12, &size), 0);
  EXPECT_EQ(size, std::strlen("/var/lib/kvor/log") + 1);
  const struct {
    const char *name;
    size_t length;
    kvsvStatus status;
  } cases[] = {
      {text, 11, kInternal},         {text, 19, kInternal},           {"", 0, kInternal},
      {"eerrorlogdir", 12, kInternal}, {"eErrorLogDir ", 13, kInternal}, {"kind3", 5, kInternal},
      {nullptr, 0, kInternal},       {nullptr, 3, kvErrNullArgument},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(std::string(c.name != nullptr ? c.name : "null").substr(0, c.length));
    size = 99;
    EXPECT_EQ(kvsvPathGetMultibyteStringSizeInBytes(c.name, c.length, &size), c.status);
    EXPECT_EQ(size, 99u);
    char buffer[64] = "untouched";
    EXPECT_EQ(kvsvPathGetMultibyteString(c.name, c.length, sizeof buffer, buffer), c.status);
    EXPECT_STREQ(buffer, "untouched");
  }
  EXPECT_EQ(kvsvPathGetMultibyteStringSizeInBytes(text, 12, nullptr), kvErrNullArgument);
  EXPECT_EQ(kvsvPathGetMultibyteString(text, 12, 64, nullptr), kvErrNullArgument);
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

TEST_F(PathExports, HostStringReceivesTheTextOrStaysAsItWas) {
  SvHandle text = svsimMakeString("old");
  ASSERT_NE(text, nullptr);
  // The name as a host string: none, empty, of the wrong case, and one that the host cannot store.
  const struct {
    const char *name;  // null: no handle
    bool failAll;
  } refused[] = {{nullptr, false}, {"", false}, {"eerrorlogdir", false}, {"eErrorLogDir", true}};
  for (const auto &c : refused) {
    SCOPED_TRACE(c.name != nullptr ? c.name : "null");
    SvHandle name = c.name != nullptr ? svsimMakeString(c.name) : nullptr;
    svsimFailAll(c.failAll ? 1 : 0);
    EXPECT_EQ(kvsvGetPathMultibyteStringAsSvStr(name, text), kInternal);
    svsimFailAll(0);
    EXPECT_EQ(svsimInjectedFaults() > 0, c.failAll);
    if (!c.failAll) {
      EXPECT_EQ(ReadHostString(text), "old");
    }
    if (name != nullptr) svDisposeHandle(name);
  }
  SvHandle name = svsimMakeString("eDatabaseCacheDir");
  EXPECT_EQ(kvsvGetPathMultibyteStringAsSvStr(name, text), 0);
  EXPECT_EQ(ReadHostString(text), "/var/lib/kvor/dbCache");
  svDisposeHandle(name);
  svDisposeHandle(text);
}

}  // namespace
