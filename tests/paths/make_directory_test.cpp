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

// Cases run in order on one directory, so that a later one may find what an earlier one made.
TEST(MakeDirectory, OutcomesOfBothForms) {
  cTempDir dir;
  dir.WriteFile("file", "x");
  constexpr auto kOne = &ovsysq::MakeDirectory;
  constexpr auto kParents = &ovsysq::MakeDirectoryWithParents;
  const struct {
    void (*make)(const std::string &, int32_t *, tJsonStatus &);
    std::string path;
    bool flag;          // a flag is handed in
    int32_t code;
    int32_t created;    // when the code is 0 and a flag is handed in
    const char *desc;   // when the code is not 0; null: not looked at
    bool detailed;      // the path and errno are in the detail too
  } cases[] = {
      {kOne, dir.Sub("new"), true, 0, 0, nullptr, false},
      {kOne, dir.Sub("new"), true, 0, 1, nullptr, false},
      {kOne, dir.Sub("file"), true, -52013, 0, "path exist but not a dir", true},
      {kOne, dir.Sub("no/such"), true, -52006, 0, "parent not found", true},
      {kOne, dir.Sub("file/below"), true, -52008, 0, "mkdir failed", true},
      {kParents, dir.Sub("a/b/c/d"), true, 0, 0, nullptr, false},
      {kParents, dir.Sub("a/b/c/d"), true, 0, 1, nullptr, false},  // an existing one folds in
      {kParents, dir.Sub("x/y"), false, 0, 0, nullptr, false},
      {kParents, dir.Sub("file/a/b"), false, -52008, 0, "mkdir failed", false},  // stops the walk
      {kParents, dir.Sub("file"), false, -52013, 0, nullptr, false},
      // No '/' to walk up from: the failure of the first attempt stands.
      {kParents, "", false, -52006, 0, "parent not found", false},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE((c.make == kOne ? "one: [" : "with parents: [") + c.path + "]");
    tStatus s;
    // The single form sets the flag; the walk folds its steps into what the flag held.
    int32_t created = c.make == kOne ? 7 : 0;
    c.make(c.path, c.flag ? &created : nullptr, s.status);
    EXPECT_EQ(s.status.code, c.code);
    if (c.code == 0) {
      if (c.flag) {
        EXPECT_EQ(created, c.created);
      }
      EXPECT_TRUE(IsDirectory(c.path));
      continue;
    }
    if (c.desc != nullptr) {
      EXPECT_EQ(s.Debug("desc"), c.desc);
    }
    if (c.detailed) {
      EXPECT_EQ(s.Debug("path"), c.path);
      EXPECT_GT(s.ErrnoCode(), 0);
    }
  }
}

}  // namespace
