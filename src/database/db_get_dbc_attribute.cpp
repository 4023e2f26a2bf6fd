// kvsvdbGetDBCAttribute: an attribute of a database file, as the driver gives it in text, into a
// host string.
#include <cstdint>

#include "core/host_handles.h"
#include "core/status.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "property/property_value_io.h"

using namespace nKVSVAPI100;

extern "C" KVSV_EXPORT kvsvStatus kvsvdbGetDBCAttribute(uint32_t object, uint32_t mode,
                                                        const char *name, SvHandle *value,
                                                        uint32_t *isDefault) {
  if (value == nullptr) return kvErrNullArgument;
  uint32_t size = 0;
  Status status = kvdbGetDBCAttributeSize(object, mode, name, &size);
  if (status < 0) return status;
  if (ResizeOrCreateHandle(value, uint64_t{size} + kStringSlack) < 0) return kvErrOutOfMemory;
  SvStr *text = static_cast<SvStr *>(**value);
  status = kvdbGetDBCAttribute(object, mode, name, size,
                               reinterpret_cast<char *>(text) + kHostCountBytes, isDefault);
  if (status < 0) {
    KeepStringCountInBlock(*value);
    return status;
  }
  // The driver's size counts the NUL, which the host's count does not.
  text->cnt = size == 0 ? 0 : static_cast<int32_t>(size - 1);
  return status;
}
