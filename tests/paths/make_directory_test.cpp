#include "paths/make_directory.h"

#include <gtest/gtest.h>

#include <string>

#include "diagnostics/jsonz.h"
#include "paths/paths_test_support.h"

namespace {

using kvsvtest::cTempDir;
using kvsvtest::IsDirectory;
using nKVSVAPI100::tJsonStatus;

// Owns a status for one call and reads its detail.
struct tStatus {
  tJsonStatus status;
  ~tStatus() { nKVSVAPI100::ReleaseJsonStatus(status); }
  std::string Debug(const char *key) const {
    if (status.buffer == nullptr) return "";
    const char *debug = jsonz::JsonFindKey(status.buffer, "ovsysq_debug");
    const char *value = debug != nullptr ? jsonz::JsonFindKey(debug, key) : nullptr;
    if (value == nullptr) return "";
    size_t length = 0;
    const char *text = jsonz::JsonReadString(value, "", &length, nullptr);
    return std::string(text, length);
  }
  int32_t ErrnoCode() const {
    const char *error = jsonz::JsonFindKey(status.buffer, "internal_error");
    return error != nullptr ? jsonz::JsonReadInt(jsonz::JsonFindKey(error, "code"), -1, nullptr)
                            : -1;
  }
};

TEST(MakeDirectory, Outcomes) {
  cTempDir dir;
  dir.WriteFile("file", "x");
  struct tCase {
    std::string path;
    int32_t code;
    int32_t created;        // when the code is 0
    const char *desc;       // when it is not
  } cases[] = {
      {dir.Sub("new"), 0, 0, ""},
      {dir.Sub("new"), 0, 1, ""},
      {dir.Sub("file"), -52013, 0, "path exist but not a dir"},
      {dir.Sub("no/such"), -52006, 0, "parent not found"},
      {dir.Sub("file/below"), -52008, 0, "mkdir failed"},
  };
  for (const tCase &c : cases) {
    tStatus s;
    int32_t created = 7;
    ovsysq::MakeDirectory(c.path, &created, s.status);
    EXPECT_EQ(s.status.code, c.code) << c.path;
    if (c.code == 0) {
      EXPECT_EQ(created, c.created) << c.path;
      EXPECT_TRUE(IsDirectory(c.path));
    } else {
      EXPECT_EQ(s.Debug("desc"), c.desc);
      EXPECT_EQ(s.Debug("path"), c.path);
      EXPECT_GT(s.ErrnoCode(), 0);
    }
  }
}

TEST(MakeDirectoryWithParents, MakesEveryMissingParent) {
  cTempDir dir;
  tStatus s;
  int32_t created = 0;
  ovsysq::MakeDirectoryWithParents(dir.Sub("a/b/c/d"), &created, s.status);
  EXPECT_EQ(s.status.code, 0);
  EXPECT_EQ(created, 0);
  EXPECT_TRUE(IsDirectory(dir.Sub("a/b/c/d")));
  tStatus again;
  ovsysq::MakeDirectoryWithParents(dir.Sub("a/b/c/d"), &created, again.status);
  EXPECT_EQ(again.status.code, 0);
  EXPECT_EQ(created, 1) << "an existing directory folds in its flag";
}

TEST(MakeDirectoryWithParents, NullFlagIsAllowed) {
  cTempDir dir;
  tStatus s;
  ovsysq::MakeDirectoryWithParents(dir.Sub("x/y"), nullptr, s.status);
  EXPECT_EQ(s.status.code, 0);
  EXPECT_TRUE(IsDirectory(dir.Sub("x/y")));
}

TEST(MakeDirectoryWithParents, AFileInTheWayStopsTheWalk) {
  cTempDir dir;
  dir.WriteFile("f", "x");
  tStatus s;
  ovsysq::MakeDirectoryWithParents(dir.Sub("f/a/b"), nullptr, s.status);
  EXPECT_EQ(s.status.code, -52008);
  EXPECT_EQ(s.Debug("desc"), "mkdir failed");
}

TEST(MakeDirectoryWithParents, AFileAtTheEndCollides) {
  cTempDir dir;
  dir.WriteFile("f", "x");
  tStatus s;
  ovsysq::MakeDirectoryWithParents(dir.Sub("f"), nullptr, s.status);
  EXPECT_EQ(s.status.code, -52013);
}

TEST(MakeDirectoryWithParents, ARelativeTextWithoutSlashKeepsParentNotFound) {
  cTempDir dir;
  tStatus s;
  // No '/' to walk up from: the failure of the first attempt stands.
  ovsysq::MakeDirectoryWithParents("", nullptr, s.status);
  EXPECT_EQ(s.status.code, -52006);
  EXPECT_EQ(s.Debug("desc"), "parent not found");
}

}  // namespace
