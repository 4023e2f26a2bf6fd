// The library's only wait that is not on a driver call: short sleeps while another thread finishes.
#ifndef KVSVAPI_CORE_SLEEP_H
#define KVSVAPI_CORE_SLEEP_H

#include <cstdint>

namespace nKVSVAPI100 {

// Sleeps `ms` milliseconds; a sleep cut by a signal resumes with the time remaining, any other
// failure ends it.
void SleepMs(uint32_t ms);

}  // namespace nKVSVAPI100

#endif
