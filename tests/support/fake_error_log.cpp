#include "support/fake_error_log.h"

#include <atomic>
#include <cstdlib>
#include <filesystem>
#include <stdexcept>
#include <string>
#include <utility>

#include "diagnostics/error_log.h"

namespace kvsvtest {

namespace {

std::atomic<cFakeErrorLog *> gInstalled{nullptr};

}  // namespace

cFakeErrorLog::cFakeErrorLog() {
  gInstalled.store(this);
  nKVSVAPI100::SetErrorLogProvider(&Build, &Get);
  nKVSVAPI100::ResetErrorLogInit();
}

cFakeErrorLog::~cFakeErrorLog() {
  nKVSVAPI100::InstallErrorLog();
  nKVSVAPI100::ResetErrorLogInit();
  gInstalled.store(nullptr);
}

nKVSVAPI100::Status cFakeErrorLog::Write(nKVSVAPI100::tInternalStatus &value, uint32_t base,
                                         uint32_t mask) {
  std::lock_guard<std::mutex> lock(mutex_);
  if (writeThrows_) throw std::runtime_error("log write failed");
  records_.push_back({value, base, mask});
  return 0;
}

void cFakeErrorLog::SetBuild(eBuild build) {
  std::lock_guard<std::mutex> lock(mutex_);
  build_ = build;
}

void cFakeErrorLog::SetBuildHook(std::function<void()> hook) {
  std::lock_guard<std::mutex> lock(mutex_);
  hook_ = std::move(hook);
}

void cFakeErrorLog::SetAvailable(bool available) {
  std::lock_guard<std::mutex> lock(mutex_);
  available_ = available;
}

void cFakeErrorLog::SetWriteThrows(bool throws) {
  std::lock_guard<std::mutex> lock(mutex_);
  writeThrows_ = throws;
}

int cFakeErrorLog::Builds() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return builds_;
}

std::vector<tLogRecord> cFakeErrorLog::Records() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return records_;
}

void cFakeErrorLog::Build(nKVSVAPI100::tStatusBlock &block) {
  cFakeErrorLog *self = gInstalled.load();
  std::function<void()> hook;
  eBuild build;
  {
    std::lock_guard<std::mutex> lock(self->mutex_);
    ++self->builds_;
    hook = self->hook_;
    build = self->build_;
  }
  // Outside the lock: a hook may wait for another reporting thread.
  if (hook) hook();
  switch (build) {
    case eBuild::kSucceed:
      break;
    case eBuild::kThrowStandard:
      throw std::runtime_error("log file cannot be opened");
    case eBuild::kThrowOther:
      throw 42;
    case eBuild::kNegativeCode:
      nKVSVAPI100::SetStatusBlock(block, -1, "log", "log.cpp", 1);
      break;
    case eBuild::kPositiveCode:
      nKVSVAPI100::SetStatusBlock(block, 5, "log", "log.cpp", 1);
      break;
  }
}

nKVSVAPI100::iErrorLog *cFakeErrorLog::Get() {
  cFakeErrorLog *self = gInstalled.load();
  if (self == nullptr) return nullptr;
  std::lock_guard<std::mutex> lock(self->mutex_);
  return self->available_ ? self : nullptr;
}

}  // namespace kvsvtest
