// The directory table relocated by the test library: sharedstatedir and datarootdir move below the
// root that this program gives it, every other key keeps its default, and the driver's
// directories follow, through the path maker as through the exports.
#include <gtest/gtest.h>
#include <stdlib.h>

#include <string>

#include "kvsvapi.h"
#include "paths/path_sysq_wrapper.h"

namespace {

// At program start, before anything can build the directory table.
constexpr char kRoot[] = "/kvsv/relocated";
[[maybe_unused]] const int gRootSet = setenv("KVSV_TEST_RELOCATION_ROOT", kRoot, 1);

TEST(Relocation, OnlyTheRelocatedKeysMoveAndTheDriversDirectoriesFollow) {
  const std::string root = kRoot;
  kvpath::cSysqWrapper sysq;
  EXPECT_EQ(sysq.GetSharedStateDir(), root + "/var/lib");
  EXPECT_EQ(sysq.GetDataRootDir(), root + "/usr/share");
  EXPECT_EQ(sysq.GetDataDir(), "/usr/share");
  char text[256] = "";
  ASSERT_EQ(kvsvPathGetMultibyteString("eErrorLogDir", 12, sizeof text, text), 0);
  EXPECT_EQ(text, root + "/var/lib/kvor/log");
  // The table is built once: a later change of the relocation is not seen.
  setenv("KVSV_TEST_RELOCATION_ROOT", "/elsewhere", 1);
  EXPECT_EQ(sysq.GetSharedStateDir(), root + "/var/lib");
}

}  // namespace
