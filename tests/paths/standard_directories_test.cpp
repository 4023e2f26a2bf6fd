// The standard directories with no relocation library: the table's defaults, the temporary and
// configuration directories from the environment, and the share directory file.
#include <gtest/gtest.h>

#include <unistd.h>

#include <string>

#include "diagnostics/jsonz.h"
#include "diagnostics/overr_exception.h"
#include "paths/path_sysq_wrapper.h"
#include "paths/share_dir.h"
#include "paths/paths_test_support.h"

namespace {

using kvsvtest::cScopedEnv;
using kvsvtest::cTempDir;
using kvsvtest::IsDirectory;

// The text of `key` in the detail document's object `object`, or "" when absent.
std::string DetailText(const char *detail, const char *object, const char *key) {
  const char *inner = object != nullptr ? jsonz::JsonFindKey(detail, object) : detail;
  if (inner == nullptr) return "";
  const char *value = jsonz::JsonFindKey(inner, key);
  if (value == nullptr) return "";
  size_t length = 0;
  const char *text = jsonz::JsonReadString(value, "", &length, nullptr);
  return std::string(text, length);
}

TEST(DirectoryTable, DefaultsWithoutRelocation) {
  kvpath::cSysqWrapper sysq;
  const ovsysq::SysqWrapper_Linux &linux = sysq;
  EXPECT_EQ(linux.GetPrefixDir(), "/usr");
  EXPECT_EQ(linux.GetExecPrefixDir(), "/usr");
  EXPECT_EQ(linux.GetBinDir(), "/usr/bin");
  EXPECT_EQ(linux.GetSbinDir(), "/usr/sbin");
  EXPECT_EQ(linux.GetLibDir(), "/usr/lib");
  EXPECT_EQ(linux.GetLib32Dir(), "/usr/lib");
  EXPECT_EQ(linux.GetLib64Dir(), "/usr/lib64");
  EXPECT_EQ(linux.GetNativeLibDir(), "/usr/lib64");
  EXPECT_EQ(linux.GetMultiarchLibDir(), "/usr/lib/x86_64-linux-gnu");
  EXPECT_EQ(linux.GetLibexecDir(), "/usr/libexec");
  EXPECT_EQ(linux.GetSharedStateDir(), "/var/lib");
  EXPECT_EQ(linux.GetDataRootDir(), "/usr/share");
  EXPECT_EQ(linux.GetDataDir(), "/usr/share");
  EXPECT_EQ(linux.GetSysconfDir(), "/etc");
  EXPECT_EQ(linux.GetSystemLocalStateDir(), "/var");
  EXPECT_EQ(linux.GetRunStateDir(), "/var/run");
  EXPECT_EQ(linux.GetIncludeDir(), "/usr/include");
  EXPECT_EQ(linux.GetDocDir(), "/usr/share/doc");
  EXPECT_EQ(linux.GetInitdDir(), "/etc/init.d");
}

TEST(SysqWrapper, TempDirFromTmpdirAsItStands) {
  kvpath::cSysqWrapper sysq;
  const std::pair<std::optional<std::string>, std::string> cases[] = {
      {std::nullopt, "/tmp"}, {"/scratch/t", "/scratch/t"}, {"/scratch/t/", "/scratch/t/"}};
  for (const auto &c : cases) {
    cScopedEnv tmp("TMPDIR", c.first);
    EXPECT_EQ(sysq.GetTempDir(), c.second);
  }
}

TEST(SysqWrapper, TempFileNameIsFreshEachTime) {
  kvpath::cSysqWrapper sysq;
  const std::string first = sysq.GetTempFileName();
  EXPECT_FALSE(first.empty());
  EXPECT_NE(first, sysq.GetTempFileName());
}

TEST(ShareDir, FileContentNormalised) {
  cTempDir dir;
  const std::pair<std::string, std::string> cases[] = {
      {"/opt/orvane/share/\n", "/opt/orvane/share"},
      {"  /opt/orvane/share", "/opt/orvane/share"},
      {std::string("/opt/x\0", 7), "/opt/x"},
      {"/\n", ""},
      {"", ""},
  };
  for (const auto &c : cases) {
    dir.WriteFile("share.dir", c.first);
    EXPECT_EQ(ovsysq::ReadShareDir(dir.Sub("share.dir").c_str()), c.second);
  }
}

TEST(ShareDir, MissingOrUnreadableGivesTheDefault) {
  cTempDir dir;
  EXPECT_EQ(ovsysq::ReadShareDir(dir.Sub("absent").c_str()), "/usr/local/orvane/share");
  // A directory opens but does not read: the short read falls back too.
  EXPECT_EQ(ovsysq::ReadShareDir(dir.Path().c_str()), "/usr/local/orvane/share");
}

TEST(ShareDir, BothNamesReadTheSystemFileAtEachCall) {
  kvpath::cSysqWrapper sysq;
  const std::string expected = ovsysq::ReadShareDir("/etc/orvane/share/share.dir");
  EXPECT_EQ(sysq.GetShareDir(), expected);
  EXPECT_EQ(sysq.GetSharedDir(), expected);
  if (access("/etc/orvane/share/share.dir", F_OK) != 0) {
    EXPECT_EQ(expected, "/usr/local/orvane/share");
  }
}

class UserConfigDir : public ::testing::Test {
 protected:
  cTempDir dir_;
  cScopedEnv xdg_{"XDG_CONFIG_HOME", std::nullopt};
  cScopedEnv home_{"HOME", std::nullopt};
  kvpath::cSysqWrapper sysq_;
};

TEST_F(UserConfigDir, XdgLosesItsSlashesAndHomeGetsOneSlashAndConfig) {
  const struct {
    const char *variable;
    std::string value, dir;
  } cases[] = {
      {"XDG_CONFIG_HOME", dir_.Sub("conf"), dir_.Sub("conf")},
      {"XDG_CONFIG_HOME", dir_.Sub("conf/"), dir_.Sub("conf")},
      {"XDG_CONFIG_HOME", dir_.Sub("conf//\n"), dir_.Sub("conf")},
      {"HOME", dir_.Path(), dir_.Sub(".config")},
      {"HOME", dir_.Path() + "/", dir_.Sub(".config")},
      {"HOME", dir_.Path() + "// ", dir_.Sub(".config")},
  };
  for (const auto &c : cases) {
    cScopedEnv variable(c.variable, c.value);
    EXPECT_EQ(sysq_.GetUserConfigDir(false), c.dir) << c.variable << "=" << c.value;
  }
  EXPECT_FALSE(IsDirectory(dir_.Sub("conf"))) << "create false makes nothing";
  EXPECT_FALSE(IsDirectory(dir_.Sub(".config"))) << "create false makes nothing";
}

TEST_F(UserConfigDir, XdgCreateMakesParents) {
  cScopedEnv xdg("XDG_CONFIG_HOME", dir_.Sub("a/b/c/"));
  EXPECT_EQ(sysq_.GetUserConfigDir(true), dir_.Sub("a/b/c"));
  EXPECT_TRUE(IsDirectory(dir_.Sub("a/b/c")));
  EXPECT_EQ(sysq_.GetUserConfigDir(true), dir_.Sub("a/b/c")) << "an existing one is fine";
}

TEST_F(UserConfigDir, HomeCreateMakesOnlyTheLastDirectory) {
  {
    cScopedEnv home("HOME", dir_.Path());
    EXPECT_EQ(sysq_.GetUserConfigDir(true), dir_.Sub(".config"));
    EXPECT_TRUE(IsDirectory(dir_.Sub(".config")));
  }
  cScopedEnv home("HOME", dir_.Sub("missing/home"));
  try {
    sysq_.GetUserConfigDir(true);
    FAIL() << "a home that doesn't exist must fail";
  } catch (const overr::Exception &e) {
    EXPECT_EQ(e.Code(), -52006);
    EXPECT_EQ(DetailText(e.Detail(), nullptr, "error_constant"), "ovapalerr_resourceNotFound");
    EXPECT_EQ(DetailText(e.Detail(), "ovsysq_debug", "desc"), "parent not found");
    EXPECT_EQ(DetailText(e.Detail(), "ovsysq_debug", "path"), dir_.Sub("missing/home/.config"));
    EXPECT_EQ(DetailText(e.Detail(), "internal_error", "api"), "errno");
  }
  EXPECT_FALSE(IsDirectory(dir_.Sub("missing")));
}

TEST_F(UserConfigDir, WithoutHomeThePasswordEntryDecides) {
  const std::string dir = sysq_.GetUserConfigDir(false);
  ASSERT_GE(dir.size(), 8u);
  EXPECT_EQ(dir.substr(dir.size() - 8), "/.config");
  EXPECT_EQ(dir.find("//"), std::string::npos);
}

}  // namespace
