// A relocation call that fails fails the table's build, and with it every lookup alike: a path
// that asks the table throws, kind 16 asks it nothing.
#include <gtest/gtest.h>
#include <stdlib.h>

#include <cstring>

#include "core/exception_base.h"
#include "diagnostics/overr_exception.h"
#include "paths/directory_kind.h"
#include "paths/path.h"

namespace {

// At program start, before anything can build the directory table.
[[maybe_unused]] const int gFailing = setenv("KVSV_TEST_RELOCATION_FAIL", "datadir", 1);

TEST(RelocationFailure, EveryLookupFailsWithTheBuildsStatus) {
  kvpath::cSysqWrapper sysq;
  for (auto getter : {&kvpath::cSysqWrapper::GetPrefixDir, &kvpath::cSysqWrapper::GetDataDir}) {
    try {
      (sysq.*getter)();
      ADD_FAILURE() << "no exception";
    } catch (const overr::Exception &e) {
      EXPECT_EQ(e.Code(), -52006);
      EXPECT_NE(std::strstr(e.Detail(), "\"desc\":\"get_relocated_dir failed\""), nullptr);
      EXPECT_NE(std::strstr(e.Detail(), "\"key\":\"datadir\""), nullptr) << e.Detail();
    }
  }
  EXPECT_THROW(kvpath::cPath(kvpath::eErrorLogDir, sysq), nKVSVAPI100::cExceptionBase);
  EXPECT_EQ(kvpath::cPath(16, sysq).GetUtf8(), "/home/svuser");
}

}  // namespace
