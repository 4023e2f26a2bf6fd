// The signal tests' fixture, and host arrays as a host program makes and reads them: arrays of
// values, and arrays of XY clusters (per signal, the handle of its timestamp array, then the
// handle of its value array).
#ifndef KVSVAPI_TESTS_SIGNAL_SIGNAL_TEST_SUPPORT_H
#define KVSVAPI_TESTS_SIGNAL_SIGNAL_TEST_SUPPORT_H

#include <gtest/gtest.h>

#include <climits>
#include <cstring>
#include <tuple>
#include <vector>

#include "support/call_log.h"
#include "support/slot_fixture.h"

namespace kvsvtest {

constexpr int32_t kDriverFault = -1074388990;  // an error status that the driver is made to give

struct tXY {
  std::vector<uint64_t> times;  // raw times, as the driver counts them
  std::vector<double> values;
  bool operator==(const tXY &o) const { return times == o.times && values == o.values; }
};

inline int32_t Count(SvHandle array) { return *static_cast<int32_t *>(*array); }

template <typename T>
SvHandle MakeArray(const std::vector<T> &elements) {
  SvHandle array = svNewHandleClr(8 + elements.size() * sizeof(T));
  *static_cast<int32_t *>(*array) = static_cast<int32_t>(elements.size());
  if (!elements.empty()) {
    std::memcpy(static_cast<char *>(*array) + 8, elements.data(), elements.size() * sizeof(T));
  }
  return array;
}

template <typename T>
std::vector<T> ReadArray(SvHandle array) {
  const T *first = reinterpret_cast<const T *>(static_cast<char *>(*array) + 8);
  return std::vector<T>(first, first + Count(array));
}

inline SvHandle *Element(SvHandle clusters, size_t signal, bool values) {
  return reinterpret_cast<SvHandle *>(static_cast<char *>(*clusters) + 8 + signal * 16 +
                                      (values ? 8 : 0));
}

inline SvHandle MakeClusters(const std::vector<tXY> &signals) {
  SvHandle clusters = MakeArray(std::vector<SvHandle>(2 * signals.size()));
  *static_cast<int32_t *>(*clusters) = static_cast<int32_t>(signals.size());
  for (size_t i = 0; i < signals.size(); ++i) {
    std::vector<SvTime> times(signals[i].times.size());
    for (size_t k = 0; k < times.size(); ++k) kvsvRawTimeToSvTime(&times[k], signals[i].times[k]);
    *Element(clusters, i, false) = MakeArray(times);
    *Element(clusters, i, true) = MakeArray(signals[i].values);
  }
  return clusters;
}

inline std::vector<tXY> ReadClusters(SvHandle clusters) {
  std::vector<tXY> signals(static_cast<size_t>(Count(clusters)));
  for (size_t i = 0; i < signals.size(); ++i) {
    for (const SvTime &time : ReadArray<SvTime>(*Element(clusters, i, false))) {
      kvsvSvTimeToRawTime(&signals[i].times.emplace_back(), &time);
    }
    signals[i].values = ReadArray<double>(*Element(clusters, i, true));
  }
  return signals;
}

// Disposes of the clusters and of every element handle that the outer handle's size holds.
inline void DisposeClusters(SvHandle clusters) {
  if (clusters == nullptr) return;
  SvHandle *elements = Element(clusters, 0, false);
  for (size_t i = 0; i < (svGetHandleSize(clusters) - 8) / 8; ++i) {
    if (elements[i] != nullptr) svDisposeHandle(elements[i]);
  }
  svDisposeHandle(clusters);
}

// Host handles made, resized and disposed of since the host stand-in's counters were reset.
inline std::tuple<uint64_t, uint64_t, uint64_t> HostCounts() {
  return {svsimAllocCount(), svsimResizeCount(), svsimFreeCount()};
}

// The two sizes of the latest driver call of `function` (of any, for null).
inline std::pair<uint32_t, uint32_t> Sizes(const char *function = nullptr) {
  const kvsimCallRecord call = LastCall(function);
  return {call.size1, call.size2};
}

// Failures to arm before a call, for tables of failure cases.
inline void NoFailure() {}
inline void FailSignalCount() {
  kvsimFailProperty("kvGetProperty", kvPropSession_NumInList, kDriverFault, 1);
}
inline void FailFirstAllocation() { svsimFailAllocAt(1); }
inline void FailFirstResize() { svsimFailResizeAt(1); }
inline void FailFirstLock() { svsimFailWaveformLockAt(1); }

// Sessions with slots, and the host arrays of a test, disposed of at its end: the value array
// `values_`, the clusters `clusters_` and every waveform array made by Waveforms. The host stand-in
// stops the process on a waveform array left locked.
class SignalTest : public SlotFixture {
 protected:
  void TearDown() override {
    if (values_ != nullptr) svDisposeHandle(values_);
    DisposeClusters(clusters_);
    for (SvWaveformArray *array : waveforms_) svsimDisposeWaveformArray(array);
    EXPECT_EQ(svsimStrayWaveformUnlocks(), strayUnlocks_);
    SlotFixture::TearDown();
  }
  // A session whose reads the driver fills whatever they are given.
  uint32_t Filling(const char *list, uint32_t mode) {
    const uint32_t session = MakeSession(list, mode);
    EXPECT_EQ(kvsimSetSignalReadFill(session, INT32_MAX), 0);
    return session;
  }
  SvWaveformArray *Waveforms(int32_t count = 0, int32_t samples = 0) {
    return waveforms_.emplace_back(svsimMakeWaveformArray(count, samples));
  }

  SvHandle values_ = nullptr;
  SvHandle clusters_ = nullptr;
  std::vector<SvWaveformArray *> waveforms_;
  uint64_t strayUnlocks_ = 0;  // unlocks after a failed Lock that a test expects
};

}  // namespace kvsvtest

#endif
