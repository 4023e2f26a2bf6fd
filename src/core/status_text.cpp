// kvsvStatusToString: the driver owns every status text, this library's included.
#include "kvsvapi.h"
#include "kvsvplatform.h"

extern "C" KVSV_EXPORT void kvsvStatusToString(int32_t status, uint32_t size, char *text) {
  kvStatusToString(status, size, text);
}
