// The made-up values that signal reads hand out while a fill is set (kvsimSetSignalReadFill), so
// that the driver's part of a read is no more than writing its regions: value k of signal i is
// 1000 i + k, stamped with the clock plus k.
#ifndef KVOR_SIM_SIGNAL_FILL_H
#define KVOR_SIM_SIGNAL_FILL_H

#include <cstdint>

namespace nKvorSim {

inline double FillValue(uint32_t signal, uint32_t sample) { return 1000.0 * signal + sample; }
inline uint64_t FillTime(uint64_t now, uint32_t sample) { return now + sample; }

}  // namespace nKvorSim

#endif
