// Time conversions: one per frame in every decode and encode loop.
#include <benchmark/benchmark.h>

#include <cstdint>

#include "core/timestamps.h"

namespace {

using namespace nKVSVAPI100;

// Converts a value that moves on every round, so that nothing is folded away.
template <typename In, typename Out, void (*Conversion)(Out *, const In *), typename Step>
void Convert(benchmark::State &state, In value, Step step) {
  Out result{};
  for (auto _ : state) {
    Conversion(&result, &value);
    benchmark::DoNotOptimize(result);
    step(value);
  }
}

void AddRaw(uint64_t &v) { v += 12345; }
void AddNs(uint64_t &v) { v += 977; }
void AddFraction(SvTime &t) { t.fraction += 0x1000001; }

const SvTime kHostTime{0x123456789ABCDEFull, 3700000000};

void BM_RawTimeToSvTime(benchmark::State &state) {
  Convert<uint64_t, SvTime, RawTimeToSvTime>(state, 133000000000000000ull, AddRaw);
}
void BM_SvTimeToRawTime(benchmark::State &state) {
  Convert<SvTime, uint64_t, SvTimeToRawTime>(state, kHostTime, AddFraction);
}
void BM_NsTimeToSvTime(benchmark::State &state) {
  Convert<uint64_t, SvTime, NsTimeToSvTime>(state, 1700000000000000000ull, AddNs);
}
void BM_SvTimeToNsTime(benchmark::State &state) {
  Convert<SvTime, uint64_t, SvTimeToNsTime>(state, kHostTime, AddFraction);
}
BENCHMARK(BM_RawTimeToSvTime);
BENCHMARK(BM_SvTimeToRawTime);
BENCHMARK(BM_NsTimeToSvTime);
BENCHMARK(BM_SvTimeToNsTime);

}  // namespace
