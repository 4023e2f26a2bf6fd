#include "end_program.h"

#include <dlfcn.h>

#include <mutex>
#include <system_error>
#include <thread>
#include <utility>
#include <vector>

#include "cleanups.h"
#include "references.h"
#include "svsim.h"

namespace svhost {

namespace {

// The close export that a library names at registration.
using CloseExport = int32_t (*)(uint32_t handle);

void RunEnd(std::vector<Cleanup> cleanups, std::vector<Reference> references,
            SvsimEndReport &report) {
  // Clean-ups first: they release calls still blocked in the program, which the closes may wait
  // for.
  for (const Cleanup &c : cleanups) {
    c.procedure(c.argument);
    ++report.cleanupsRun;
  }
  for (const Reference &r : references) {
    void *symbol = dlsym(RTLD_DEFAULT, r.closeName.c_str());
    if (symbol == nullptr) {
      ++report.closesMissing;
      continue;
    }
    reinterpret_cast<CloseExport>(symbol)(r.handle);
    ++report.closesCalled;
  }
}

class ProgramEnd {
 public:
  static ProgramEnd &Instance() {
    // Never destroyed: a thread left unjoined at exit must not meet a destroyed std::thread.
    static ProgramEnd *end = new ProgramEnd;
    return *end;
  }

  int32_t Start() {
    std::lock_guard<std::mutex> lock(mutex_);
    if (started_) return -1;
    report_ = SvsimEndReport{0, 0, 0};
    std::vector<Cleanup> cleanups = TakePendingCleanups();
    std::vector<Reference> references = TakeAllReferences();
    try {
      worker_ = std::thread(RunEnd, std::move(cleanups), std::move(references), std::ref(report_));
    } catch (const std::system_error &) {
      return -1;
    }
    started_ = true;
    return 0;
  }

  // The thread is joined outside the lock, so that a clean-up or close may itself call into the
  // host. The end counts as started until the join is over, so no second end can overlap it.
  int32_t Join(SvsimEndReport *report) {
    std::thread worker;
    {
      std::lock_guard<std::mutex> lock(mutex_);
      if (!started_ || !worker_.joinable()) return -1;
      worker = std::move(worker_);
    }
    worker.join();
    std::lock_guard<std::mutex> lock(mutex_);
    if (report != nullptr) *report = report_;
    started_ = false;
    return 0;
  }

 private:
  std::mutex mutex_;
  std::thread worker_;
  bool started_ = false;
  SvsimEndReport report_{0, 0, 0};
};

}  // namespace

void JoinPendingEnd() { ProgramEnd::Instance().Join(nullptr); }

}  // namespace svhost

extern "C" {

int32_t svsimEndProgramAsync(void) { return svhost::ProgramEnd::Instance().Start(); }

int32_t svsimJoinEndProgram(SvsimEndReport *report) {
  return svhost::ProgramEnd::Instance().Join(report);
}

int32_t svsimEndProgram(SvsimEndReport *report) {
  const int32_t status = svsimEndProgramAsync();
  if (status != 0) return status;
  return svsimJoinEndProgram(report);
}

}  // extern "C"
