// How many calls of each driver function are in some state right now (parked by a hold, blocked
// in a wait), and a way for a test to wait until enough of them are.
#ifndef KVOR_SIM_CALL_COUNTER_H
#define KVOR_SIM_CALL_COUNTER_H

#include <chrono>
#include <condition_variable>
#include <map>
#include <mutex>
#include <string>
#include <string_view>

namespace nKvorSim {

class CallCounter {
 public:
  void Enter(std::string_view function);
  void Leave(std::string_view function);
  // True once at least `count` calls of `function` are in the state at the same time; false if
  // that has not happened within `limit`.
  bool WaitFor(std::string_view function, int count, std::chrono::milliseconds limit);

 private:
  std::mutex mutex_;
  std::condition_variable changed_;
  std::map<std::string, int, std::less<>> counts_;
};

}  // namespace nKvorSim

#endif
