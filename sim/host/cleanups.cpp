#include "cleanups.h"

#include <algorithm>
#include <mutex>
#include <new>

#include "svsim.h"

namespace svhost {

namespace {

class CleanupRegistry {
 public:
  static CleanupRegistry &Instance() {
    // Never destroyed: a library may register from static destructors at exit.
    static CleanupRegistry *registry = new CleanupRegistry;
    return *registry;
  }

  // The same procedure with the same argument again replaces the earlier registration, as the
  // host does: a program that makes blocking calls in a loop holds one registration, not one per
  // call.
  void Add(const Cleanup &cleanup) {
    std::lock_guard<std::mutex> lock(mutex_);
    const auto same = std::find_if(pending_.begin(), pending_.end(), [&](const Cleanup &held) {
      return held.procedure == cleanup.procedure && held.argument == cleanup.argument;
    });
    if (same != pending_.end()) {
      *same = cleanup;
    } else {
      pending_.push_back(cleanup);
    }
    last_ = cleanup;
    ++registrations_;
  }

  std::vector<Cleanup> TakePending() {
    std::lock_guard<std::mutex> lock(mutex_);
    std::vector<Cleanup> taken;
    taken.swap(pending_);
    return taken;
  }

  int32_t Registrations() {
    std::lock_guard<std::mutex> lock(mutex_);
    return registrations_;
  }

  int32_t Pending() {
    std::lock_guard<std::mutex> lock(mutex_);
    return static_cast<int32_t>(pending_.size());
  }

  bool Last(Cleanup &last) {
    std::lock_guard<std::mutex> lock(mutex_);
    last = last_;
    return registrations_ != 0;
  }

  void Reset() {
    std::lock_guard<std::mutex> lock(mutex_);
    pending_.clear();
    last_ = Cleanup();
    registrations_ = 0;
  }

 private:
  std::mutex mutex_;
  std::vector<Cleanup> pending_;
  Cleanup last_;
  int32_t registrations_ = 0;
};

}  // namespace

std::vector<Cleanup> TakePendingCleanups() { return CleanupRegistry::Instance().TakePending(); }

void ResetCleanups() { CleanupRegistry::Instance().Reset(); }

}  // namespace svhost

using svhost::CleanupRegistry;

extern "C" {

int32_t svSetCleanupProc(SvCleanupProc procedure, uint64_t argument, int32_t mode) {
  if (procedure == nullptr) return SVSIM_ERR_ARGUMENT;
  try {
    CleanupRegistry::Instance().Add(svhost::Cleanup{procedure, argument, mode});
  } catch (const std::bad_alloc &) {
    return SVSIM_ERR_MEMORY;
  }
  return 0;
}

int32_t svsimCleanupRegistrations(void) { return CleanupRegistry::Instance().Registrations(); }

int32_t svsimPendingCleanups(void) { return CleanupRegistry::Instance().Pending(); }

int32_t svsimLastCleanup(SvCleanupProc *procedure, uint64_t *argument, int32_t *mode) {
  svhost::Cleanup last;
  if (!CleanupRegistry::Instance().Last(last)) return 0;
  if (procedure != nullptr) *procedure = last.procedure;
  if (argument != nullptr) *argument = last.argument;
  if (mode != nullptr) *mode = last.mode;
  return 1;
}

}  // extern "C"
