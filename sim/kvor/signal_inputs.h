// What a signal input session holds of the values that reached it: the latest value of each
// signal, the pairs of value and time that no read has taken yet, and where the session's
// resampling stands. An XY read takes pairs; a waveform read samples the values in force at
// evenly spaced instants, which takes the pairs up to the last instant sampled. Pairs are kept in
// time order, so that pairs stamped ahead of the clock wait for their time. Safe for many threads.
#ifndef KVOR_SIM_SIGNAL_INPUTS_H
#define KVOR_SIM_SIGNAL_INPUTS_H

#include <atomic>
#include <cstdint>
#include <deque>
#include <mutex>
#include <optional>
#include <vector>

namespace nKvorSim {

struct tSignalPair {
  uint64_t time = 0;
  double value = 0.0;
};

class SignalInputs {
 public:
  // Value `value` of item `index` (of `count` items) arrived stamped `time`. A pair that finds
  // `capacity` pairs of its signal waiting is dropped; the latest value is kept all the same.
  void Receive(uint32_t count, uint32_t index, uint64_t time, double value, uint32_t capacity);

  // The latest value and time of the first `count` items; 0.0 at time 0 for one that has had
  // none since the session was made or flushed. `times` may be null.
  void Latest(uint32_t count, double *values, uint64_t *times);

  // Pairs of item `index` stamped no later than `limit` (none: any), at most `most`.
  uint32_t CountPairs(uint32_t index, std::optional<uint64_t> limit, uint32_t most);
  // Takes those pairs, oldest first, into `values` and `times`; returns how many.
  uint32_t TakePairs(uint32_t index, std::optional<uint64_t> limit, uint32_t most, double *values,
                     uint64_t *times);

  // Instants from the next one to sample up to `now`, on a grid of `rate` samples per second
  // that starts at `origin` (the session's creation) or at the latest flush. A change of rate
  // starts the grid again at the next instant.
  uint64_t InstantsDue(uint64_t now, double rate, uint64_t origin);
  // Samples the first `count` items at the next `samples` instants into buffers[i][k]: the
  // latest value stamped no later than each instant (0.0 before any). Returns the first instant.
  uint64_t Sample(uint32_t count, uint32_t samples, double rate, uint64_t origin,
                  double *const *buffers);

  // Forgets every value and pair; resampling starts again at `now`.
  void Flush(uint64_t now);

  // While not negative, reads hand out made-up values instead of what arrived: at most this many
  // per signal (see kvsimSetSignalReadFill).
  void SetFill(int32_t pairs) { fill_.store(pairs); }
  std::optional<uint32_t> Fill() const;

 private:
  struct tGrid {
    bool started = false;
    uint64_t start = 0;  // raw time of instant 0
    uint64_t next = 0;   // index of the next instant to sample
    double rate = 0.0;   // 0: take the next read's rate as it is
  };

  void Size(uint32_t count);
  void PrepareGrid(double rate, uint64_t origin);
  uint64_t InstantAt(uint64_t index) const;
  uint64_t DueLocked(uint64_t now) const;

  std::mutex mutex_;
  std::vector<std::optional<tSignalPair>> latest_;
  std::vector<std::deque<tSignalPair>> pending_;
  std::vector<double> held_;  // the value of each item at the last instant sampled
  tGrid grid_;
  std::atomic<int32_t> fill_{-1};
};

}  // namespace nKvorSim

#endif
