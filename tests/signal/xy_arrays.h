// Host arrays of XY clusters as a host program makes and reads them: one cluster per signal, the
// handle of its timestamp array, then the handle of its value array.
#ifndef KVSVAPI_TESTS_SIGNAL_XY_ARRAYS_H
#define KVSVAPI_TESTS_SIGNAL_XY_ARRAYS_H

#include <cstring>
#include <vector>

#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "svsim.h"

namespace kvsvtest {

struct tXY {
  std::vector<uint64_t> times;  // raw times, as the driver counts them
  std::vector<double> values;
};

inline SvTime HostTime(uint64_t raw) {
  SvTime time{};
  kvsvRawTimeToSvTime(&time, raw);
  return time;
}

inline uint64_t RawTime(const SvTime &time) {
  uint64_t raw = 0;
  kvsvSvTimeToRawTime(&raw, &time);
  return raw;
}

inline int32_t Count(SvHandle array) {
  int32_t count = 0;
  std::memcpy(&count, *array, 4);
  return count;
}

template <typename T>
SvHandle MakeArray(const std::vector<T> &elements) {
  SvHandle array = svNewHandleClr(8 + elements.size() * sizeof(T));
  const int32_t count = static_cast<int32_t>(elements.size());
  std::memcpy(*array, &count, 4);
  if (!elements.empty()) {
    std::memcpy(static_cast<char *>(*array) + 8, elements.data(), elements.size() * sizeof(T));
  }
  return array;
}

template <typename T>
std::vector<T> ReadArray(SvHandle array) {
  std::vector<T> elements(static_cast<size_t>(Count(array)));
  if (!elements.empty()) {
    std::memcpy(elements.data(), static_cast<char *>(*array) + 8, elements.size() * sizeof(T));
  }
  return elements;
}

inline SvHandle *Element(SvHandle clusters, size_t signal, bool values) {
  return reinterpret_cast<SvHandle *>(static_cast<char *>(*clusters) + 8 + signal * 16 +
                                      (values ? 8 : 0));
}

inline SvHandle MakeClusters(const std::vector<tXY> &signals) {
  std::vector<SvHandle> handles;
  for (const tXY &signal : signals) {
    std::vector<SvTime> times;
    for (uint64_t raw : signal.times) times.push_back(HostTime(raw));
    handles.push_back(MakeArray(times));
    handles.push_back(MakeArray(signal.values));
  }
  SvHandle clusters = MakeArray(handles);
  const int32_t count = static_cast<int32_t>(signals.size());
  std::memcpy(*clusters, &count, 4);
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

// Disposes of the clusters and of every element handle that the handle's size holds.
inline void DisposeClusters(SvHandle clusters) {
  if (clusters == nullptr) return;
  const size_t held = (svGetHandleSize(clusters) - 8) / 16;
  for (size_t i = 0; i < held; ++i) {
    for (bool values : {false, true}) {
      if (*Element(clusters, i, values) != nullptr) svDisposeHandle(*Element(clusters, i, values));
    }
  }
  svDisposeHandle(clusters);
}

}  // namespace kvsvtest

#endif
