// Time conversions: one per frame in every decode and encode loop.
#include <benchmark/benchmark.h>

#include <cstdint>

#include "core/timestamps.h"

namespace {

using namespace nKVSVAPI100;

void BM_RawTimeToSvTime(benchmark::State &state) {
  uint64_t raw = 133000000000000000ull;
  SvTime t{};
  for (auto _ : state) {
    RawTimeToSvTime(&t, &raw);
    benchmark::DoNotOptimize(t);
    raw += 12345;
  }
}
BENCHMARK(BM_RawTimeToSvTime);

void BM_SvTimeToRawTime(benchmark::State &state) {
  SvTime t{0x123456789ABCDEFull, 3700000000};
  uint64_t raw = 0;
  for (auto _ : state) {
    SvTimeToRawTime(&raw, &t);
    benchmark::DoNotOptimize(raw);
    t.fraction += 0x1000001;
  }
}
BENCHMARK(BM_SvTimeToRawTime);

void BM_NsTimeToSvTime(benchmark::State &state) {
  uint64_t ns = 1700000000000000000ull;
  SvTime t{};
  for (auto _ : state) {
    NsTimeToSvTime(&t, &ns);
    benchmark::DoNotOptimize(t);
    ns += 977;
  }
}
BENCHMARK(BM_NsTimeToSvTime);

void BM_SvTimeToNsTime(benchmark::State &state) {
  SvTime t{0x123456789ABCDEFull, 3700000000};
  uint64_t ns = 0;
  for (auto _ : state) {
    SvTimeToNsTime(&ns, &t);
    benchmark::DoNotOptimize(ns);
    t.fraction += 0x1000001;
  }
}
BENCHMARK(BM_SvTimeToNsTime);

}  // namespace
