// One thread of the soak: what it is doing now, how often it has finished a call, and what it
// counted. The watchdog reads the first two from its own thread; the counts are the thread's own
// until it has been joined.
#ifndef KVSVAPI_STRESS_SOAK_PROGRESS_H
#define KVSVAPI_STRESS_SOAK_PROGRESS_H

#include <atomic>
#include <cstdint>
#include <map>
#include <string>
#include <thread>
#include <vector>

namespace nKvsvSoak {

struct tTally {
  uint64_t calls = 0;
  uint64_t framesWritten = 0;
  uint64_t framesRead = 0;
  uint64_t sessionsEnded = 0;
  uint64_t closedProbes = 0;
  // Successful transfers after the session changes had stopped: proof that the thread carried on.
  uint64_t settledTransfers = 0;
  std::map<int32_t, uint64_t> statuses;

  void Merge(const tTally &other);
};

class cSoakThread {
 public:
  explicit cSoakThread(std::string name) : name_(std::move(name)) {}
  cSoakThread(const cSoakThread &) = delete;
  cSoakThread &operator=(const cSoakThread &) = delete;

  // Runs `call`, named `what` for the watchdog, and counts its status.
  template <typename F>
  int32_t Call(const char *what, F &&call) {
    call_.store(what);
    const int32_t status = call();
    call_.store(nullptr);
    beats_.fetch_add(1);
    ++tally.calls;
    ++tally.statuses[status];
    return status;
  }
  // Work that is no export call but may take a while.
  void Doing(const char *what) { call_.store(what); }
  void Beat() { beats_.fetch_add(1); }
  void Finish() { done_.store(true); }

  const std::string &Name() const { return name_; }
  const char *CurrentCall() const { return call_.load(); }
  uint64_t Beats() const { return beats_.load(); }
  bool Done() const { return done_.load(); }

  tTally tally;

 private:
  std::string name_;
  std::atomic<const char *> call_{nullptr};
  std::atomic<uint64_t> beats_{0};
  std::atomic<bool> done_{false};
};

// Watches threads from a thread of its own. A thread that is not done and has finished no call
// for `limitSeconds` is taken as hung: the watchdog prints where every thread stands and ends
// the process with status 3, since a hung call cannot be unwound.
class cWatchdog {
 public:
  cWatchdog(std::vector<cSoakThread *> threads, double limitSeconds);
  ~cWatchdog();
  cWatchdog(const cWatchdog &) = delete;
  cWatchdog &operator=(const cWatchdog &) = delete;

 private:
  void Run();

  std::vector<cSoakThread *> threads_;
  double limit_;
  std::atomic<bool> stop_{false};
  std::vector<std::thread> runner_;
};

}  // namespace nKvsvSoak

#endif
