#include "core/public_status.h"

namespace nKVSVAPI100 {

Status ToPublicStatus(tInternalStatus &value, uint32_t base, uint32_t mask) {
  const uint32_t kind = value.Kind();
  if (kind == tInternalStatus::kEmpty) return 0;
  const uint32_t family = mask & base;
  uint32_t result = (value.Failed() ? 1u << 31 : 0u) | family;
  if (kind == tInternalStatus::kUser && (mask & value.info) == family)
    return static_cast<Status>((value.info & 0x7FFFFFFFu & ~mask) | result);
  // A code from outside the family cannot be shown to the host as it is: it becomes the family's
  // internal error, and the value says so from now on.
  result |= 1u;
  if (kind == tInternalStatus::kUser) value.SetKind(tInternalStatus::kInternal);
  return static_cast<Status>(result);
}

}  // namespace nKVSVAPI100
