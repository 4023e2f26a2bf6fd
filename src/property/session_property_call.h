// What every session property export does around its own work: the handle that the driver must
// see, the sub-indexed write for the identifiers that address one entry of the session's list,
// and the property's name in the caller's error information.
#ifndef KVSVAPI_PROPERTY_SESSION_PROPERTY_CALL_H
#define KVSVAPI_PROPERTY_SESSION_PROPERTY_CALL_H

#include <cstddef>
#include <cstdint>

#include "core/status.h"
#include "kvsvplatform.h"
#include "property/annotate_property_status.h"
#include "property/property_value_io.h"
#include "session/system_manager.h"

namespace nKVSVAPI100 {

// Runs `work(handle)` with the handle the driver must see (a host reference to the system kept
// from an earlier open reaches the system open now) and annotates the resulting status with `id`
// as the work leaves it: an export that reads another identifier in its place names that one.
template <class tWork>
Status RunSessionPropertyCall(uint32_t session, uint32_t &id, SvHandle *info, tWork work) {
  const Status status = work(RedirectSystemHandle(session, id));
  AnnotatePropertyStatus(status, id, info);
  return status;
}

// Identifiers of one write form that address an entry of the session's list.
struct tSubPropertyIds {
  const uint32_t *ids;
  size_t count;
};

// Sends `source` for `id`: to the list entry that `subId` names when `id` is among `subIds`,
// else to the session as a whole.
Status SetSessionPropertyValue(uint32_t handle, const SvHandle *subId, uint32_t id,
                               const tPropertySource &source, tSubPropertyIds subIds);

}  // namespace nKVSVAPI100

#endif
