#include "property/session_property_call.h"

#include <algorithm>

#include "property/session_name_to_index.h"

namespace nKVSVAPI100 {

Status SetSessionPropertyValue(uint32_t handle, const SvHandle *subId, uint32_t id,
                               const tPropertySource &source, tSubPropertyIds subIds) {
  const uint32_t *end = subIds.ids + subIds.count;
  if (std::find(subIds.ids, end, id) == end)
    return tSessionPropertyCalls::Set(handle, id, source.size, source.buffer);
  int32_t index = 0;
  const Status status = SessionNameToIndex(handle, subId, &index);
  if (status < 0) return status;
  return kvSetSubProperty(handle, static_cast<uint32_t>(index), id, source.size, source.buffer);
}

}  // namespace nKVSVAPI100
