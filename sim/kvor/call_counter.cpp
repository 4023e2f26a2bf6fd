#include "call_counter.h"

namespace nKvorSim {

void CallCounter::Enter(std::string_view function) {
  std::lock_guard<std::mutex> lock(mutex_);
  auto found = counts_.find(function);
  if (found == counts_.end()) found = counts_.emplace(std::string(function), 0).first;
  ++found->second;
  changed_.notify_all();
}

void CallCounter::Leave(std::string_view function) {
  std::lock_guard<std::mutex> lock(mutex_);
  auto found = counts_.find(function);
  if (found != counts_.end()) --found->second;
}

bool CallCounter::WaitFor(std::string_view function, int count, std::chrono::milliseconds limit) {
  std::unique_lock<std::mutex> lock(mutex_);
  return changed_.wait_for(lock, limit, [&] {
    auto found = counts_.find(function);
    return found != counts_.end() && found->second >= count;
  });
}

}  // namespace nKvorSim
