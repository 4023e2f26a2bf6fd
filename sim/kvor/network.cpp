#include "network.h"

namespace nKvorSim {

void Network::Publish(const std::vector<std::string> &names, const double *values, size_t count,
                      uint64_t timestamp) {
  std::lock_guard<std::mutex> lock(mutex_);
  for (size_t i = 0; i < count && i < names.size(); ++i) {
    samples_[names[i]] = SignalSample{values[i], timestamp};
  }
}

void Network::Sample(const std::vector<std::string> &names, size_t count, double *values,
                     uint64_t *timestamps) const {
  std::lock_guard<std::mutex> lock(mutex_);
  for (size_t i = 0; i < count && i < names.size(); ++i) {
    auto found = samples_.find(names[i]);
    const SignalSample sample = found == samples_.end() ? SignalSample{} : found->second;
    values[i] = sample.value;
    if (timestamps != nullptr) timestamps[i] = sample.timestamp;
  }
}

void Network::Clear() {
  std::lock_guard<std::mutex> lock(mutex_);
  samples_.clear();
}

}  // namespace nKvorSim
