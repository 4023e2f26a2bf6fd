// The driver's 100 ns and 1 ns times and the host's SvTime, converted in integer arithmetic.
#ifndef KVSVAPI_CORE_TIMESTAMPS_H
#define KVSVAPI_CORE_TIMESTAMPS_H

#include <cstdint>

#include "kvsvapi.h"

namespace nKVSVAPI100 {

void RawTimeToSvTime(SvTime *result, const uint64_t *value);
void SvTimeToRawTime(uint64_t *result, const SvTime *value);
void NsTimeToSvTime(SvTime *result, const uint64_t *value);
void SvTimeToNsTime(uint64_t *result, const SvTime *value);

}  // namespace nKVSVAPI100

#endif
