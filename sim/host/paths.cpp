#include "paths.h"

#include <unistd.h>

#include <cstring>
#include <mutex>
#include <new>
#include <string>
#include <unordered_set>

#include "counted_text.h"
#include "fatal.h"
#include "fault_plan.h"
#include "handle_store.h"
#include "kvsvplatform.h"
#include "svsim.h"

struct SvPathRecord {
  std::string text;
};

namespace svhost {

namespace {

// The directory of the running executable, or "" if the process cannot tell.
std::string ExecutableDirectory() {
  std::string target(4096, '\0');
  const ssize_t length = readlink("/proc/self/exe", &target[0], target.size());
  if (length <= 0) return std::string();
  target.resize(static_cast<size_t>(length));
  const size_t slash = target.rfind('/');
  return slash == std::string::npos ? std::string() : target.substr(0, slash == 0 ? 1 : slash);
}

class PathStore {
 public:
  static PathStore &Instance() {
    // Never destroyed: paths may be destroyed from static destructors at exit.
    static PathStore *store = new PathStore;
    return *store;
  }

  // A new empty path, or null when the allocation fails.
  SvPath Create() {
    if (FaultPlan::Instance().AllocationFails()) return nullptr;
    auto *path = new (std::nothrow) SvPathRecord;
    if (path == nullptr) return nullptr;
    std::lock_guard<std::mutex> lock(mutex_);
    try {
      live_.insert(path);
    } catch (const std::bad_alloc &) {
      delete path;
      return nullptr;
    }
    return path;
  }

  void Destroy(SvPath path) {
    std::lock_guard<std::mutex> lock(mutex_);
    Check(path, "svDestroyPath");
    live_.erase(path);
    delete path;
  }

  std::string Text(SvPath path, const char *operation) {
    std::lock_guard<std::mutex> lock(mutex_);
    Check(path, operation);
    return path->text;
  }

  void SetText(SvPath path, std::string text, const char *operation) {
    std::lock_guard<std::mutex> lock(mutex_);
    Check(path, operation);
    path->text = std::move(text);
  }

  std::string AppPath() {
    std::lock_guard<std::mutex> lock(mutex_);
    return appPath_;
  }

  void SetAppPath(std::string text) {
    std::lock_guard<std::mutex> lock(mutex_);
    appPath_ = std::move(text);
  }

  uint64_t Live() {
    std::lock_guard<std::mutex> lock(mutex_);
    return live_.size();
  }

 private:
  void Check(SvPath path, const char *operation) {
    if (live_.count(path) == 0) Fatal(operation, path, "not a live path");
  }

  std::mutex mutex_;
  std::unordered_set<SvPath> live_;
  std::string appPath_ = ExecutableDirectory();
};

}  // namespace

void ResetAppPath() { PathStore::Instance().SetAppPath(ExecutableDirectory()); }

}  // namespace svhost

using svhost::PathStore;

extern "C" {

SvPath svEmptyPath(int32_t) { return PathStore::Instance().Create(); }

int32_t svAppPath(SvPath path) {
  if (path == nullptr) return SVSIM_ERR_ARGUMENT;
  try {
    PathStore::Instance().SetText(path, PathStore::Instance().AppPath(), "svAppPath");
  } catch (const std::bad_alloc &) {
    return SVSIM_ERR_MEMORY;
  }
  return 0;
}

int32_t svDestroyPath(SvPath path) {
  if (path != nullptr) PathStore::Instance().Destroy(path);
  return 0;
}

int32_t svPathToString(SvPath path, SvHandle *text) {
  if (path == nullptr || text == nullptr) return SVSIM_ERR_ARGUMENT;
  try {
    const std::string value = PathStore::Instance().Text(path, "svPathToString");
    return svhost::StoreText(text, value.data(), value.size(), "svPathToString");
  } catch (const std::bad_alloc &) {
    return SVSIM_ERR_MEMORY;
  }
}

int32_t svStringToPath(SvHandle text, SvPath *path) {
  if (path == nullptr) return SVSIM_ERR_ARGUMENT;
  try {
    std::string value = svhost::HandleText(text, "svStringToPath");
    if (*path == nullptr) {
      SvPath made = PathStore::Instance().Create();
      if (made == nullptr) return SVSIM_ERR_MEMORY;
      *path = made;
    }
    PathStore::Instance().SetText(*path, std::move(value), "svStringToPath");
  } catch (const std::bad_alloc &) {
    return SVSIM_ERR_MEMORY;
  }
  return 0;
}

SvHandle svPathCText(SvPath path) {
  if (path == nullptr) return nullptr;
  try {
    const std::string value = PathStore::Instance().Text(path, "svPathCText");
    if (value.empty()) return nullptr;
    // A plain C text: the block begins with the characters, not with a count.
    SvHandle handle = svhost::HandleStore::Instance().Create(value.size() + 1);
    if (handle != nullptr) std::memcpy(*handle, value.c_str(), value.size() + 1);
    return handle;
  } catch (const std::bad_alloc &) {
    return nullptr;
  }
}

void svsimSetAppPath(const char *path) {
  if (path == nullptr)
    svhost::ResetAppPath();
  else
    PathStore::Instance().SetAppPath(path);
}

uint64_t svsimLivePaths(void) { return PathStore::Instance().Live(); }

}  // extern "C"
