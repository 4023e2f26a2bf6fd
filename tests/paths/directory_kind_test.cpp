#include "paths/directory_kind.h"

#include <gtest/gtest.h>

#include "core/exception_base.h"

namespace {

TEST(KindFromName, TheSixNames) {
  const std::pair<const char *, uint32_t> cases[] = {
      {"eAliasFileDir", 0},
      {"eDatabaseCacheDir", 1},
      {"eDatabaseEditorSettingsIniDir", 2},
      {"eErrorLogDir", 3},
      {"eTemporarySessionTextFileDir", 13},
      {"eDatabaseConfigDir", 14},
  };
  for (const auto &c : cases) EXPECT_EQ(kvpath::KindFromName(c.first), c.second) << c.first;
}

TEST(KindFromName, AnythingElseThrowsFromTheExportsFile) {
  const std::string unknown[] = {"", "eerrorlogdir", "ERRORLOGDIR", "eErrorLogDir ", " eErrorLogDir",
                                 "eErrorLogDi", std::string("eErrorLogDir\0", 13), "3"};
  for (const std::string &name : unknown) {
    try {
      kvpath::KindFromName(name);
      ADD_FAILURE() << "no exception for [" << name << "]";
    } catch (const nKVSVAPI100::cExceptionBase &e) {
      EXPECT_EQ(e.Status()->Component(), 13u);
      EXPECT_EQ(e.Status()->File(), 24u);
      EXPECT_EQ(e.Status()->Line(), 51u);
      EXPECT_TRUE(e.Status()->Failed());
    }
  }
}

}  // namespace
