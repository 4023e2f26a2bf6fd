#include "support/sleep_recorder.h"

#include <cerrno>
#include <condition_variable>
#include <mutex>
#include <thread>
#include <utility>

namespace kvsvtest {

namespace {

std::mutex gMutex;
std::condition_variable gChanged;
std::vector<timespec> gRequests;
long gInterruptWith = -1;

}  // namespace

void InterruptNextSleep(long remainingNs) {
  std::lock_guard<std::mutex> lock(gMutex);
  gInterruptWith = remainingNs;
}

void WaitForSleeps(size_t count) {
  std::unique_lock<std::mutex> lock(gMutex);
  gChanged.wait(lock, [count] { return gRequests.size() >= count; });
}

std::vector<timespec> Sleeps() {
  std::lock_guard<std::mutex> lock(gMutex);
  return gRequests;
}

}  // namespace kvsvtest

extern "C" int nanosleep(const timespec *requested, timespec *remaining) {
  using namespace kvsvtest;
  long interruptWith = -1;
  {
    std::lock_guard<std::mutex> lock(gMutex);
    gRequests.push_back(*requested);
    std::swap(interruptWith, gInterruptWith);
  }
  gChanged.notify_all();
  if (interruptWith >= 0) {
    *remaining = timespec{0, interruptWith};
    errno = EINTR;
    return -1;
  }
  // A waiting thread spins on the library's lock: let the holder run.
  std::this_thread::yield();
  return 0;
}
