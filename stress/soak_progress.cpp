#include "soak_progress.h"

#include <chrono>
#include <cstdio>
#include <cstdlib>

namespace nKvsvSoak {

void tTally::Merge(const tTally &other) {
  calls += other.calls;
  framesWritten += other.framesWritten;
  framesRead += other.framesRead;
  sessionsEnded += other.sessionsEnded;
  closedProbes += other.closedProbes;
  settledTransfers += other.settledTransfers;
  for (const auto &entry : other.statuses) statuses[entry.first] += entry.second;
}

cWatchdog::cWatchdog(std::vector<cSoakThread *> threads, double limitSeconds)
    : threads_(std::move(threads)), limit_(limitSeconds) {
  runner_.emplace_back([this] { Run(); });
}

cWatchdog::~cWatchdog() {
  stop_.store(true);
  for (std::thread &t : runner_) t.join();
}

void cWatchdog::Run() {
  using tClock = std::chrono::steady_clock;
  std::vector<uint64_t> seen(threads_.size());
  std::vector<tClock::time_point> since(threads_.size(), tClock::now());
  while (!stop_.load()) {
    std::this_thread::sleep_for(std::chrono::milliseconds(200));
    const tClock::time_point now = tClock::now();
    bool hung = false;
    for (size_t i = 0; i < threads_.size(); ++i) {
      const uint64_t beats = threads_[i]->Beats();
      if (beats != seen[i] || threads_[i]->Done()) {
        seen[i] = beats;
        since[i] = now;
      } else if (std::chrono::duration<double>(now - since[i]).count() > limit_) {
        hung = true;
      }
    }
    if (!hung) continue;
    std::fprintf(stderr, "soak: no progress for %.0f s; where each thread stands:\n", limit_);
    for (size_t i = 0; i < threads_.size(); ++i) {
      const char *call = threads_[i]->CurrentCall();
      std::fprintf(stderr, "  %-14s %-34s idle %.1f s%s\n", threads_[i]->Name().c_str(),
                   call != nullptr ? call : "(between calls)",
                   std::chrono::duration<double>(now - since[i]).count(),
                   threads_[i]->Done() ? " (done)" : "");
    }
    std::fflush(stderr);
    std::_Exit(3);
  }
}

}  // namespace nKvsvSoak
