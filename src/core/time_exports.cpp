// The time conversions for host programs. The 100 ns names are the raw ones under a second name.
#include "core/timestamps.h"
#include "kvsvapi.h"

using namespace nKVSVAPI100;

extern "C" KVSV_EXPORT void kvsvRawTimeToSvTime(SvTime *result, uint64_t value) {
  RawTimeToSvTime(result, &value);
}

extern "C" KVSV_EXPORT void kvsvSvTimeToRawTime(uint64_t *result, const SvTime *value) {
  SvTimeToRawTime(result, value);
}

extern "C" KVSV_EXPORT void kvsv100nsTimeToSvTime(SvTime *result, uint64_t value)
    __attribute__((alias("kvsvRawTimeToSvTime")));

extern "C" KVSV_EXPORT void kvsvSvTimeTo100nsTime(uint64_t *result, const SvTime *value)
    __attribute__((alias("kvsvSvTimeToRawTime")));

extern "C" KVSV_EXPORT void kvsv1nsTimeToSvTime(SvTime *result, uint64_t value) {
  NsTimeToSvTime(result, &value);
}

extern "C" KVSV_EXPORT void kvsvSvTimeTo1nsTime(uint64_t *result, const SvTime *value) {
  SvTimeToNsTime(result, value);
}
