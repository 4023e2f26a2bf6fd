// Threads racing into the first build of the table and into the making of the same directory.
#include <gtest/gtest.h>

#include <string>
#include <thread>
#include <vector>

#include "paths/path_maker.h"
#include "paths/relocation_root.h"

namespace {

const kvsvtest::cRelocationRoot gRoot;
constexpr int kThreads = 8;

// Runs `kind` on every thread at once and returns what each got ("" for an exception).
std::vector<std::string> RaceFor(uint32_t kind) {
  std::vector<std::string> results(kThreads);
  std::vector<std::thread> threads;
  for (int i = 0; i < kThreads; ++i) {
    threads.emplace_back([&results, i, kind] {
      try {
        results[i] = kvpath::cSvCgSupportLibraryPathMaker::MakePath(kind)->GetUtf8();
      } catch (...) {
        results[i] = "";
      }
    });
  }
  for (auto &t : threads) t.join();
  return results;
}

TEST(PathConcurrency, FirstBuildOfTheTableRacedByEveryThread) {
  for (const std::string &result : RaceFor(kvpath::eErrorLogDir)) {
    EXPECT_EQ(result, gRoot.Path() + "/var/lib/kvor/log");
  }
}

TEST(PathConcurrency, MakingTheSameConfigurationDirectoryAtOnce) {
  kvsvtest::cTempDir dir;
  kvsvtest::cScopedEnv xdg("XDG_CONFIG_HOME", dir.Sub("a/b/c/d/e"));
  for (const std::string &result : RaceFor(kvpath::eDatabaseConfigDir)) {
    EXPECT_EQ(result, dir.Sub("a/b/c/d/e/kvor"));
  }
  EXPECT_TRUE(kvsvtest::IsDirectory(dir.Sub("a/b/c/d/e/kvor")));
}

}  // namespace
