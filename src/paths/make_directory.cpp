#include "paths/make_directory.h"

#include <sys/stat.h>

#include <cerrno>
#include <cstring>
#include <vector>

namespace ovsysq {

namespace {

void Fail(tJsonStatus &status, int32_t code, uint32_t line, int err, const char *desc,
          const char *path) {
  char *cursor = SetOsFault(status, code, __FILE__, line, err, desc);
  jsonz::AddString(cursor, "path", path, RetryFor(status));
}

// One mkdir on a NUL-terminated text; the same outcomes as MakeDirectory.
void MakeOne(const char *path, int32_t *created, tJsonStatus &status) {
  if (mkdir(path, 0700) == 0) {
    if (created != nullptr) *created = 0;
    return;
  }
  const int err = errno;
  if (err == EEXIST) {
    struct stat info;
    if (stat(path, &info) != 0) return;  // vanished or unreadable meanwhile: nothing to add
    if (S_ISDIR(info.st_mode)) {
      if (created != nullptr) *created = 1;
      return;
    }
    Fail(status, kObjectNameCollision, __LINE__, err, "path exist but not a dir", path);
  } else if (err == ENOENT) {
    Fail(status, kResourceNotFound, __LINE__, err, "parent not found", path);
  } else {
    Fail(status, kOsFault, __LINE__, err, "mkdir failed", path);
  }
}

}  // namespace

void MakeDirectory(const std::string &path, int32_t *created, tJsonStatus &status) {
  MakeOne(path.c_str(), created, status);
}

void MakeDirectoryWithParents(const std::string &path, int32_t *created, tJsonStatus &status) {
  std::vector<char> work(path.c_str(), path.c_str() + path.size() + 1);
  std::vector<std::size_t> cuts;
  int32_t flag = 0;
  // Walk up until a directory can be made: each missing parent leaves its '/' on the list.
  for (;;) {
    tJsonStatus attempt;
    MakeOne(work.data(), &flag, attempt);
    if (attempt.code != kResourceNotFound) {
      if (attempt.code != 0) nKVSVAPI100::MoveJsonStatus(status, attempt, nullptr);
      nKVSVAPI100::ReleaseJsonStatus(attempt);
      if (status.code < 0) return;
      break;
    }
    char *slash = std::strrchr(work.data(), '/');
    if (slash == nullptr || slash == work.data()) {
      nKVSVAPI100::MoveJsonStatus(status, attempt, nullptr);
      nKVSVAPI100::ReleaseJsonStatus(attempt);
      return;
    }
    nKVSVAPI100::ReleaseJsonStatus(attempt);
    cuts.push_back(static_cast<std::size_t>(slash - work.data()));
    *slash = '\0';
  }
  if (created != nullptr) *created |= flag;
  // Back down again, one directory at a time.
  for (auto cut = cuts.rbegin(); cut != cuts.rend(); ++cut) {
    work[*cut] = '/';
    flag = 0;
    MakeOne(work.data(), &flag, status);
    if (status.code < 0) return;
    if (created != nullptr) *created |= flag;
  }
}

}  // namespace ovsysq
