// The time conversions for host programs. The 100 ns names are the raw ones under a second name.
// A null result is ignored and a null input reads as "no time", so that no bad pointer from a
// program can bring the host process down.
#include "core/timestamps.h"
#include "kvsvapi.h"

using namespace nKVSVAPI100;

namespace {

const SvTime kNoTime = {0, 0};

}  // namespace

extern "C" KVSV_EXPORT void kvsvRawTimeToSvTime(SvTime *result, uint64_t value) {
  if (result != nullptr) RawTimeToSvTime(result, &value);
}

extern "C" KVSV_EXPORT void kvsvSvTimeToRawTime(uint64_t *result, const SvTime *value) {
  if (result != nullptr) SvTimeToRawTime(result, value != nullptr ? value : &kNoTime);
}

extern "C" KVSV_EXPORT void kvsv100nsTimeToSvTime(SvTime *result, uint64_t value)
    __attribute__((alias("kvsvRawTimeToSvTime")));

extern "C" KVSV_EXPORT void kvsvSvTimeTo100nsTime(uint64_t *result, const SvTime *value)
    __attribute__((alias("kvsvSvTimeToRawTime")));

extern "C" KVSV_EXPORT void kvsv1nsTimeToSvTime(SvTime *result, uint64_t value) {
  if (result != nullptr) NsTimeToSvTime(result, &value);
}

extern "C" KVSV_EXPORT void kvsvSvTimeTo1nsTime(uint64_t *result, const SvTime *value) {
  if (result != nullptr) SvTimeToNsTime(result, value != nullptr ? value : &kNoTime);
}
