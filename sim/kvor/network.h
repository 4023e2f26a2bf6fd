// A virtual network: the wire that joined interfaces share. It carries the latest value of each
// signal by name, so that a value written by a session on one interface is read by sessions on
// every interface of the network. Each publication is numbered, so that a session can leave out
// what arrived before it was flushed.
#ifndef KVOR_SIM_NETWORK_H
#define KVOR_SIM_NETWORK_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <mutex>
#include <string>
#include <unordered_map>
#include <vector>

#include "inventory.h"

namespace nKvorSim {

class Network {
 public:
  // The first `count` names take the values, all with one timestamp and one publication number.
  void Publish(const std::vector<std::string> &names, const double *values, size_t count,
               uint64_t timestamp);
  // The latest value (and timestamp, if `timestamps` is not null) of the first `count` names. A
  // signal never published, or last published with a number up to `after`, reads 0.0 at time 0.
  void Sample(const std::vector<std::string> &names, size_t count, double *values,
              uint64_t *timestamps, uint64_t after = 0) const;
  // The number of the latest publication; 0 before the first.
  uint64_t LastPublication() const;
  // Forgets every value. Numbering goes on, so that a number taken before stays meaningful.
  void Clear();

 private:
  struct SignalSample {
    double value = 0.0;
    uint64_t timestamp = 0;
    uint64_t publication = 0;
  };

  mutable std::mutex mutex_;
  std::unordered_map<std::string, SignalSample> samples_;
  uint64_t publications_ = 0;
};

using NetworkSet = std::array<Network, kNetworkCount>;

}  // namespace nKvorSim

#endif
