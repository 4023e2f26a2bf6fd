// The driver's time: 100 ns units since 1601-01-01 00:00 UTC. It moves only when a test moves it,
// so that every timestamp a test sees is one it chose.
#ifndef KVOR_SIM_VIRTUAL_CLOCK_H
#define KVOR_SIM_VIRTUAL_CLOCK_H

#include <atomic>
#include <cstdint>

namespace nKvorSim {

// The driver's 1 ns time since 1970 of a raw time, as Ethernet sessions count. A clock set before
// 1970 runs as a relative time, so that small test times stay small.
inline uint64_t NsTime(uint64_t rawTime) {
  constexpr uint64_t kRawTime1970 = 116444736000000000ull;
  constexpr uint64_t kNsPerRawTick = 100;
  if (rawTime < kRawTime1970) return rawTime * kNsPerRawTick;
  return (rawTime - kRawTime1970) * kNsPerRawTick;
}

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
