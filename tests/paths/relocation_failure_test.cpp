// A relocation call that fails fails the table's build, and with it every lookup alike.
#include <gtest/gtest.h>

#include <cstring>

#include "core/exception_base.h"
#include "diagnostics/overr_exception.h"
#include "paths/directory_kind.h"
#include "paths/path.h"
#include "paths/relocation_root.h"

namespace {

const kvsvtest::cRelocationRoot gRoot("datadir");

TEST(RelocationFailure, EveryLookupFailsWithTheBuildsStatus) {
  kvpath::cSysqWrapper sysq;
  const ovsysq::SysqWrapper_Linux &table = sysq;
  for (auto getter : {&ovsysq::SysqWrapper_Linux::GetPrefixDir,
                      &ovsysq::SysqWrapper_Linux::GetSharedStateDir,
                      &ovsysq::SysqWrapper_Linux::GetDataDir}) {
    try {
      (table.*getter)();
      ADD_FAILURE() << "no exception";
    } catch (const overr::Exception &e) {
      EXPECT_EQ(e.Code(), -52006);
      EXPECT_NE(std::strstr(e.Detail(), "get_relocated_dir failed"), nullptr) << e.Detail();
      EXPECT_NE(std::strstr(e.Detail(), "datadir"), nullptr) << e.Detail();
    }
  }
}

TEST(RelocationFailure, APathBecomesLine59CarryingTheCode) {
  kvpath::cSysqWrapper sysq;
  try {
    kvpath::cPath path(kvpath::eErrorLogDir, sysq);
    FAIL() << "no exception";
  } catch (const nKVSVAPI100::cExceptionBase &e) {
    EXPECT_EQ(e.Status()->Component(), 22u);
    EXPECT_EQ(e.Status()->File(), 1u);
    EXPECT_EQ(e.Status()->Line(), 59u);
    EXPECT_EQ(e.Status()->info, static_cast<uint32_t>(-52006));
  }
  // Kind 16 asks the table nothing.
  EXPECT_EQ(kvpath::cPath(16, sysq).GetUtf8(), "/home/svuser");
}

}  // namespace
