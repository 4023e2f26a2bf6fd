// cPath and its maker with the table's defaults (no relocation library in this program).
#include "paths/path.h"

#include <gtest/gtest.h>

#include <clocale>
#include <cstring>
#include <string>
#include <vector>

#include "core/exception_base.h"
#include "diagnostics/overr_exception.h"
#include "kvsvapi.h"
#include "paths/path_maker.h"
#include "paths/paths_test_support.h"
#include "paths/share_dir.h"

namespace {

using kvpath::cPath;
using kvpath::cSvCgSupportLibraryPathMaker;
using kvsvtest::cScopedEnv;
using kvsvtest::cTempDir;
using kvsvtest::IsDirectory;
using nKVSVAPI100::cExceptionBase;

// Runs `action` and checks that it throws cExceptionBase from the given place.
template <typename F>
void ExpectThrowAt(F action, uint32_t component, uint32_t file, uint32_t line, uint32_t kind,
                   uint32_t info) {
  try {
    action();
    ADD_FAILURE() << "no exception, expected line " << line;
  } catch (const cExceptionBase &e) {
    EXPECT_EQ(e.Status()->Component(), component);
    EXPECT_EQ(e.Status()->File(), file);
    EXPECT_EQ(e.Status()->Line(), line);
    EXPECT_EQ(e.Status()->Kind(), kind);
    EXPECT_EQ(e.Status()->info, info);
  }
}

std::string PathOf(uint32_t kind) {
  return cSvCgSupportLibraryPathMaker::MakePath(kind)->GetUtf8();
}

class PathKinds : public ::testing::Test {
 protected:
  cTempDir dir_;
  cScopedEnv xdg_{"XDG_CONFIG_HOME", dir_.Sub("config")};
};

TEST_F(PathKinds, EachKindWithTheDefaults) {
  const std::string share = ovsysq::ReadShareDir(ovsysq::kShareDirFile);
  const std::pair<uint32_t, std::string> cases[] = {
      {0, "/var/lib/kvor"},
      {1, "/var/lib/kvor/dbCache"},
      {2, dir_.Sub("config/kvor")},
      {3, "/var/lib/kvor/log"},
      {4, "/usr/share/kvor/firmware"},
      {5, "/usr/share/kvor"},
      {6, "/var/lib/kvor"},
      {7, share + "/errors/English"},
      {8, share + "/errors/German"},
      {9, share + "/errors/French"},
      {10, share + "/errors/Japanese"},
      {11, "/var/lib/kvor/log"},
      {12, "/var/lib/kvor/log"},
      {13, "/var/lib/kvor"},
      {14, dir_.Sub("config/kvor")},
      {15, "/usr/share/kvor"},
      {16, "/home/svuser"},
  };
  for (const auto &c : cases) EXPECT_EQ(PathOf(c.first), c.second) << "kind " << c.first;
}

TEST_F(PathKinds, OnlyKindsTwoAndFourteenMakeTheirDirectoryWithParents) {
  cScopedEnv xdg("XDG_CONFIG_HOME", dir_.Sub("deep/er/config/"));
  for (uint32_t kind = 0; kind < 17; ++kind) {
    if (kind != 2 && kind != 14) PathOf(kind);
  }
  EXPECT_FALSE(IsDirectory(dir_.Sub("deep")));
  for (uint32_t kind : {2u, 14u}) {
    EXPECT_EQ(PathOf(kind), dir_.Sub("deep/er/config/kvor")) << kind;
    EXPECT_TRUE(IsDirectory(dir_.Sub("deep/er/config/kvor"))) << kind;
    std::filesystem::remove_all(dir_.Sub("deep"));
  }
}

TEST_F(PathKinds, FileSystemFailuresAndKindsFromSeventeenOnThrow) {
  kvpath::cSysqWrapper sysq;
  for (uint32_t kind : {17u, 18u, 0xFFFFFFFFu}) {
    ExpectThrowAt([&] { cPath path(kind, sysq); }, 22, 1, 154, 2, 1);
  }
  dir_.WriteFile("file", "x");
  cScopedEnv xdg("XDG_CONFIG_HOME", dir_.Sub("file"));
  ExpectThrowAt([&] { cPath path(2, sysq); }, 22, 1, 59, 3, static_cast<uint32_t>(-52008));
}

TEST_F(PathKinds, AnEmptyFirstComponentLetsTheNextStartThePath) {
  // "/" normalises to "": the configuration directory gives nothing and "kvor" starts a relative
  // path, made in the working directory.
  cScopedEnv xdg("XDG_CONFIG_HOME", std::string("/"));
  const std::string oldCwd = std::filesystem::current_path();
  std::filesystem::current_path(dir_.Path());
  const std::string path = PathOf(2);
  std::filesystem::current_path(oldCwd);
  EXPECT_EQ(path, "kvor");
  EXPECT_TRUE(IsDirectory(dir_.Sub("kvor")));
}

class PathAppend : public ::testing::Test {
 protected:
  kvpath::cSysqWrapper sysq_;
};

TEST_F(PathAppend, JoiningRules) {
  const std::pair<std::vector<std::string>, std::string> cases[] = {
      {{"a"}, "/home/svuser/a"},
      {{"a/"}, "/home/svuser/a"},
      {{"  a"}, "/home/svuser/a"},
      {{"a b \n"}, "/home/svuser/a b"},
      {{"/abs//"}, "/home/svuser//abs"},
      {{"caf\xC3\xA9"}, "/home/svuser/caf\xC3\xA9"},
      {{""}, "/home/svuser/"},
      // Trailing slashes on both sides join with one; the stored path keeps a trailing slash of
      // its last component only until the next append.
      {{"dir/", "sub/"}, "/home/svuser/dir/sub"},
      {{"dir/", "sub/", "x"}, "/home/svuser/dir/sub/x"},
  };
  for (const auto &c : cases) {
    cPath path(16, sysq_);
    for (const std::string &component : c.first) path.AppendUtf8(component);
    EXPECT_EQ(path.GetUtf8(), c.second) << "components [" << c.first.front() << "]...";
  }
}

TEST_F(PathAppend, InvalidUtf8ThrowsWhereverItStandsAndChangesNothing) {
  const std::string bad[] = {"\xC3", "ok\xC3(", "\x80" "abc", "abc\xC0\xAF", "a\xED\xA0\x80",
                             "\xF4\x90\x80\x80z", "\xFF"};
  for (const std::string &component : bad) {
    cPath path(16, sysq_);
    ExpectThrowAt([&] { path.AppendUtf8(component); }, 22, 1, 413, 2, 1);
    EXPECT_EQ(path.GetUtf8(), "/home/svuser");
  }
}

TEST_F(PathAppend, CopyNeedsRoomForTheNul) {
  cPath path(16, sysq_);
  const std::string text = "/home/svuser";
  for (auto copy : {&cPath::CopyUtf8, &cPath::CopyMultibyte}) {
    char buffer[32];
    std::memset(buffer, 'x', sizeof buffer);
    ExpectThrowAt([&] { (path.*copy)(buffer, text.size()); }, 22, 1, 76, 1,
                  static_cast<uint32_t>(kvErrBufferTooSmall));
    ExpectThrowAt([&] { (path.*copy)(buffer, 0); }, 22, 1, 76, 1,
                  static_cast<uint32_t>(kvErrBufferTooSmall));
    EXPECT_EQ(buffer[0], 'x') << "a refused copy writes nothing";
    ExpectThrowAt([&] { (path.*copy)(nullptr, 5); }, 22, 1, 71, 1,
                  static_cast<uint32_t>(kvErrNullBuffer));
    (path.*copy)(buffer, text.size() + 1);
    EXPECT_STREQ(buffer, text.c_str());
  }
}

TEST_F(PathAppend, MultibyteAppendsInAUtf8AndInTheCLocale) {
  const struct {
    const char *locale, *component, *path;
  } cases[] = {{"C.UTF-8", "m\xC3\xBCnchen/", "/home/svuser/m\xC3\xBCnchen"},
               {"C", " plain/", "/home/svuser/plain"}};
  for (const auto &c : cases) {
    ASSERT_NE(std::setlocale(LC_ALL, c.locale), nullptr);
    cPath path(16, sysq_);
    path.AppendMultibyte(c.component);
    EXPECT_EQ(path.GetUtf8(), c.path) << c.locale;
    EXPECT_EQ(path.GetMultibyte(), c.path) << c.locale;
  }
  std::setlocale(LC_ALL, "C");
}

TEST_F(PathAppend, ConversionFailuresThrowTheInHouseException) {
  std::setlocale(LC_ALL, "C");
  cPath path(16, sysq_);
  try {
    path.AppendMultibyte("caf\xC3\xA9");
    FAIL() << "no exception";
  } catch (const overr::Exception &e) {
    EXPECT_EQ(e.Code(), -52027);
    EXPECT_NE(std::strstr(e.Detail(), "\"file\":\"mbsToUtf8\""), nullptr) << e.Detail();
    EXPECT_NE(std::strstr(e.Detail(), "\"line\":77"), nullptr) << e.Detail();
    EXPECT_NE(std::strstr(e.Detail(), "\"error_constant\":\"err\""), nullptr) << e.Detail();
  }
  path.AppendUtf8("caf\xC3\xA9");
  EXPECT_THROW(path.GetMultibyte(), overr::Exception);
  char buffer[64];
  EXPECT_THROW(path.CopyMultibyte(buffer, sizeof buffer), overr::Exception);
  path.CopyUtf8(buffer, sizeof buffer);
  EXPECT_STREQ(buffer, "/home/svuser/caf\xC3\xA9");
}

}  // namespace
