// The driver's time: 100 ns units since 1601-01-01 00:00 UTC. It moves only when a test moves it,
// so that every timestamp a test sees is one it chose.
#ifndef KVOR_SIM_VIRTUAL_CLOCK_H
#define KVOR_SIM_VIRTUAL_CLOCK_H

#include <atomic>
#include <cstdint>

namespace nKvorSim {

class VirtualClock {
 public:
  uint64_t Now() const { return now_.load(); }
  void Set(uint64_t rawTime) { now_.store(rawTime); }
  void Advance(uint64_t delta) { now_.fetch_add(delta); }

 private:
  std::atomic<uint64_t> now_{0};
};

}  // namespace nKvorSim

#endif
