#include "core/sleep.h"

#include <cerrno>
#include <ctime>

namespace nKVSVAPI100 {

void SleepMs(uint32_t ms) {
  timespec wanted{static_cast<time_t>(ms / 1000),
                  static_cast<long>((static_cast<uint64_t>(ms) * 1000000u) % 1000000000u)};
  timespec remaining{};
  while (nanosleep(&wanted, &remaining) != 0 && errno == EINTR) wanted = remaining;
}

}  // namespace nKVSVAPI100
