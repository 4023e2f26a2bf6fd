// The relocation library present but relocating nothing: every key keeps its default.
#include <gtest/gtest.h>
#include <stdlib.h>

#include "paths/path_maker.h"
#include "paths/path_sysq_wrapper.h"

namespace {

TEST(RelocationUnset, DefaultsStand) {
  ASSERT_EQ(getenv("KVSV_TEST_RELOCATION_ROOT"), nullptr);
  kvpath::cSysqWrapper sysq;
  EXPECT_EQ(sysq.GetSharedStateDir(), "/var/lib");
  EXPECT_EQ(sysq.GetDataRootDir(), "/usr/share");
  EXPECT_EQ(sysq.GetMultiarchLibDir(), "/usr/lib/x86_64-linux-gnu");
  EXPECT_EQ(kvpath::cSvCgSupportLibraryPathMaker::MakePath(kvpath::eErrorLogDir)->GetUtf8(),
            "/var/lib/kvor/log");
}

}  // namespace
