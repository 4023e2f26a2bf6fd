// Shared pieces of the signal tests: host arrays of XY clusters as a host program makes and reads
// them (per signal, the handle of its timestamp array, then the handle of its value array), and
// the driver calls that the stand-in logged.
#ifndef KVSVAPI_TESTS_SIGNAL_SIGNAL_TEST_SUPPORT_H
#define KVSVAPI_TESTS_SIGNAL_SIGNAL_TEST_SUPPORT_H

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "svsim.h"

namespace kvsvtest {

constexpr int32_t kDriverFault = -1074388990;  // an error status that the driver is made to give

struct tXY {
  std::vector<uint64_t> times;  // raw times, as the driver counts them
  std::vector<double> values;
  bool operator==(const tXY &o) const { return times == o.times && values == o.values; }
};

inline uint64_t RawTime(const SvTime &time) {
  uint64_t raw = 0;
  kvsvSvTimeToRawTime(&raw, &time);
  return raw;
}

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
  char *cluster = static_cast<char *>(*clusters) + 8 + signal * 16;
  return reinterpret_cast<SvHandle *>(cluster + (values ? 8 : 0));
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
      signals[i].times.push_back(RawTime(time));
    }
    signals[i].values = ReadArray<double>(*Element(clusters, i, true));
  }
  return signals;
}

// Disposes of the clusters and of every element handle that the outer handle's size holds.
inline void DisposeClusters(SvHandle clusters) {
  if (clusters == nullptr) return;
  for (size_t i = 0; i < (svGetHandleSize(clusters) - 8) / 16; ++i) {
    for (bool values : {false, true}) {
      if (*Element(clusters, i, values) != nullptr) svDisposeHandle(*Element(clusters, i, values));
    }
  }
  svDisposeHandle(clusters);
}

// Failures to arm before a call, for tables of failure cases.
inline void NoFailure() {}
inline void FailSignalCount() {
  kvsimFailProperty("kvGetProperty", kvPropSession_NumInList, kDriverFault, 1);
}
inline void FailFirstAllocation() { svsimFailAllocAt(1); }
inline void FailFirstLock() { svsimFailWaveformLockAt(1); }

// The latest logged call of `function`.
inline kvsimCallRecord LastCall(const char *function) {
  kvsimCallRecord record{};
  for (int32_t i = kvsimLogCount() - 1; i >= 0; --i) {
    if (kvsimLogEntry(i, &record) == 1 && std::string(record.function) == function) return record;
  }
  ADD_FAILURE() << "no call of " << function;
  return record;
}

}  // namespace kvsvtest

#endif
