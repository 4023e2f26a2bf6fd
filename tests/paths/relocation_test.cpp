// The directory table relocated by the test library: sharedstatedir and datarootdir move below a
// temporary root, every other key keeps its default.
#include <gtest/gtest.h>

#include <string>

#include "paths/path_maker.h"
#include "paths/path_sysq_wrapper.h"
#include "paths/relocation_root.h"

namespace {

const kvsvtest::cRelocationRoot gRoot;

TEST(Relocation, OnlyTheRelocatedKeysChange) {
  kvpath::cSysqWrapper sysq;
  EXPECT_EQ(sysq.GetSharedStateDir(), gRoot.Path() + "/var/lib");
  EXPECT_EQ(sysq.GetDataRootDir(), gRoot.Path() + "/usr/share");
  EXPECT_EQ(sysq.GetDataDir(), "/usr/share");
  EXPECT_EQ(sysq.GetPrefixDir(), "/usr");
  EXPECT_EQ(sysq.GetInitdDir(), "/etc/init.d");
}

TEST(Relocation, DriverDirectoriesFollow) {
  const std::pair<uint32_t, std::string> cases[] = {
      {0, gRoot.Path() + "/var/lib/kvor"},
      {1, gRoot.Path() + "/var/lib/kvor/dbCache"},
      {3, gRoot.Path() + "/var/lib/kvor/log"},
      {4, gRoot.Path() + "/usr/share/kvor/firmware"},
      {5, gRoot.Path() + "/usr/share/kvor"},
      {13, gRoot.Path() + "/var/lib/kvor"},
      {16, "/home/svuser"},
  };
  for (const auto &c : cases) {
    EXPECT_EQ(kvpath::cSvCgSupportLibraryPathMaker::MakePath(c.first)->GetUtf8(), c.second)
        << "kind " << c.first;
  }
}

TEST(Relocation, TheTableIsBuiltOnce) {
  kvpath::cSysqWrapper sysq;
  const std::string before = sysq.GetSharedStateDir();
  kvsvtest::cScopedEnv moved("KVSV_TEST_RELOCATION_ROOT", std::string("/elsewhere"));
  EXPECT_EQ(sysq.GetSharedStateDir(), before);
}

}  // namespace
