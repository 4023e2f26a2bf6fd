#include "core/internal_error.h"

#include <atomic>
#include <cstdlib>

#include "core/sleep.h"

namespace nKVSVAPI100 {

namespace {

// Once-only construction of the log. A failed construction leaves gInitDone at 0, so that the
// next report tries again.
std::atomic<uint32_t> gInitDone{0};
std::atomic<uint32_t> gInitLock{0};
constexpr uint32_t kInitSleepMs = 1;

std::atomic<tErrorLogInit> gLogInit{nullptr};
std::atomic<tErrorLogGet> gLogGet{nullptr};

// A builder that throws is recorded as a lock that could not be made, against the utility module,
// where the log is first needed.
constexpr int64_t kLogInitFailed = kMutexInitFailed;
constexpr char kLogInitSource[] = "src/session/kvorutility.cpp";
constexpr uint64_t kLogInitLine = 166;

// Statuses of the reports are shown in the family of this library, by their top bits only.
constexpr uint32_t kReportBase = 0x3FF63000;
constexpr uint32_t kReportMask = 0x7FFFC000;

void InitErrorLog(tStatusBlock &block) {
  try {
    const tErrorLogInit init = gLogInit.load();
    if (init != nullptr) init(block);
  } catch (...) {
    SetStatusBlock(block, kLogInitFailed, "kvsvapi", kLogInitSource, kLogInitLine);
  }
}

// At exit the log counts as unbuilt again, so that a report from a later static destructor builds
// it afresh. The log has no finish step of its own.
void OnProcessExit() {
  uint32_t done = 1;
  gInitDone.compare_exchange_strong(done, 0);
}

struct tExitHook {
  tExitHook() { std::atexit(&OnProcessExit); }
} gExitHook;

}  // namespace

void SetErrorLogProvider(tErrorLogInit init, tErrorLogGet get) {
  gLogInit.store(init);
  gLogGet.store(get);
}

iErrorLog *GetErrorLog() {
  const tErrorLogGet get = gLogGet.load();
  return get != nullptr ? get() : nullptr;
}

void ResetErrorLogInit() { gInitDone.exchange(0); }

Status ReportInternalError(uint32_t component, uint32_t file, uint32_t line, uint32_t info) {
  tStatusBlock block;
  if (gInitDone.load() == 0) {
    uint32_t unlocked = 0;
    while (!gInitLock.compare_exchange_strong(unlocked, 1)) {
      unlocked = 0;
      SleepMs(kInitSleepMs);
    }
    if (gInitDone.load() == 0) {
      InitErrorLog(block);
      if (block.code >= 0) gInitDone.exchange(1);
    }
    gInitLock.exchange(0);
  }
  // A log that cannot be had never fails the report itself.
  if (block.code < 0) return kvErrInternal;
  iErrorLog *log = GetErrorLog();
  if (log == nullptr) return kvErrInternal;
  tInternalStatus status;
  status.SetSystemServiceFailure(component, file, line, info);
  try {
    log->Write(status, kReportBase, kReportMask);
  } catch (...) {
    // The reporter is called from exports, which must not see an exception from the log.
  }
  return kvErrInternal;
}

}  // namespace nKVSVAPI100
