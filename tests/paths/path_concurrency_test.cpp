// Threads racing into the first build of the relocated directory table, and into the making of
// the same configuration directory.
#include <gtest/gtest.h>
#include <stdlib.h>

#include <filesystem>
#include <string>
#include <thread>
#include <vector>

#include "paths/path_maker.h"
#include "support/scoped_env.h"
#include "support/temp_dir.h"

namespace {

// At program start, before anything can build the directory table.
constexpr char kRoot[] = "/kvsv/relocated";
[[maybe_unused]] const int gRootSet = setenv("KVSV_TEST_RELOCATION_ROOT", kRoot, 1);

// What eight threads started at once got for `kind`.
std::vector<std::string> RaceFor(uint32_t kind) {
  std::vector<std::string> results(8);
  std::vector<std::thread> threads;
  for (std::string &result : results) {
    threads.emplace_back([&result, kind] {
      result = kvpath::cSvCgSupportLibraryPathMaker::MakePath(kind)->GetUtf8();
    });
  }
  for (std::thread &thread : threads) thread.join();
  return results;
}

TEST(PathConcurrency, FirstBuildOfTheTableAndOneDirectoryMadeByAll) {
  EXPECT_EQ(RaceFor(kvpath::eErrorLogDir),
            std::vector<std::string>(8, std::string(kRoot) + "/var/lib/kvor/log"));
  kvsvtest::cTempDir dir;
  const std::string config = dir.Path() + "/a/b/c/d/e";
  kvsvtest::cScopedEnv xdg("XDG_CONFIG_HOME", config);
  EXPECT_EQ(RaceFor(kvpath::eDatabaseConfigDir), std::vector<std::string>(8, config + "/kvor"));
  EXPECT_TRUE(std::filesystem::is_directory(config + "/kvor"));
}

}  // namespace
