#include "network.h"

namespace nKvorSim {

void Network::Publish(const std::vector<std::string> &names, const double *values, size_t count,
                      uint64_t timestamp) {
  std::lock_guard<std::mutex> lock(mutex_);
  const uint64_t publication = ++publications_;
  for (size_t i = 0; i < count && i < names.size(); ++i) {
    samples_[names[i]] = SignalSample{values[i], timestamp, publication};
  }
}

void Network::Sample(const std::vector<std::string> &names, size_t count, double *values,
                     uint64_t *timestamps, uint64_t after) const {
  std::lock_guard<std::mutex> lock(mutex_);
  for (size_t i = 0; i < count && i < names.size(); ++i) {
    auto found = samples_.find(names[i]);
    const bool fresh = found != samples_.end() && found->second.publication > after;
    const SignalSample sample = fresh ? found->second : SignalSample{};
    values[i] = sample.value;
    if (timestamps != nullptr) timestamps[i] = sample.timestamp;
  }
}

uint64_t Network::LastPublication() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return publications_;
}

void Network::Clear() {
  std::lock_guard<std::mutex> lock(mutex_);
  samples_.clear();
}

}  // namespace nKvorSim
