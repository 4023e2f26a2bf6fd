// kvsvSessionGetPropRef, kvsvSessionSetPropRef, kvsvSessionGetPropRef1D, kvsvSessionSetPropRef1D
// and their Ex forms: properties whose values are objects. The host holds a device by its serial
// name, an interface by its name, a database object by its reference text; the driver sees
// handles.
#include <cstdint>

#include "core/internal_error.h"
#include "database/find_by_reference_string.h"
#include "database/resolved_references.h"
#include "kvorproperties.h"
#include "kvsvapi.h"
#include "property/session_property_call.h"
#include "property/system_refs_from_property.h"
#include "session/object_class.h"

using namespace nKVSVAPI100;

namespace {

constexpr uint32_t kLineRefUnknown = 2309;
constexpr uint32_t kLineSetRefUnknown = 2387;
constexpr uint32_t kLineRef1DUnknown = 2471;

constexpr bool IsText(uint32_t id) { return (id >> 24) == 0x03u; }
constexpr bool IsCommaList(uint32_t id) { return (id >> 24) == 0x04u; }

// The name that each listed object is held by, 0 for a list this family does not know.
uint32_t NameOfListed(uint32_t id) {
  switch (id) {
    case kvPropSys_DevRefs:
      return kvPropDev_SerNum;
    case kvPropSys_IntfRefsEthernet:
    case kvPropSys_IntfRefs:
    case kvPropSys_IntfRefsCAN:
    case kvPropSys_IntfRefsFlexRay:
    case kvPropSys_IntfRefsLIN:
    case kvPropSys_IntfRefsAll:
    case kvPropDev_IntfRefs:
    case kvPropDev_IntfRefsAll:
      return kvPropIntf_Name;
    default:
      return 0;
  }
}

// Names the objects of `id` with `nameId`; an unknown `nameId` (0) is reported first, and the
// report's status ends the read unless it is not an error.
Status ReadSystemRefs(uint32_t handle, uint32_t id, uint32_t nameId, uint32_t line, SvHandle *value,
                      uint32_t mode) {
  if (nameId == 0) {
    const Status reported =
        ReportInternalError(kComponentKvsvapi, nFile::kSessionOpenClose, line, id);
    if (reported < 0) return reported;
  }
  if (value == nullptr) return kvErrNullArgument;
  return SystemRefsFromProperty(handle, id, nameId, value, mode);
}

// The J1939 ECU of a session, from its reference text. The database opened to find it is closed
// again: the driver keeps the ECU for the session.
Status WriteEcu(uint32_t session, uint32_t id, const SvHandle *value) {
  uint32_t database = 0, ecu = 0;
  const Status found = FindDbObjectByReferenceString(value != nullptr ? *value : nullptr, kClassEcu,
                                                     &database, &ecu);
  if (found < 0) return found;
  const Status set = tSessionPropertyCalls::Set(session, id, sizeof ecu, &ecu);
  const Status closed = kvdbCloseDatabase(database, 0);
  if (closed < 0) return set < 0 ? set : closed;
  return set;
}

// Frames from their reference texts, as handles to the driver. A failed resolve ends the walk
// and nothing is written.
Status WriteFrames(uint32_t handle, uint32_t id, const SvHandle *value) {
  const int32_t count =
      value != nullptr && *value != nullptr && **value != nullptr ? ArrayCount(*value) : 0;
  if (count <= 0) return tSessionPropertyCalls::Set(handle, id, 0, nullptr);
  cResolvedReferences frames;
  Status status =
      frames.Resolve(ArrayData8<SvHandle>(*value), static_cast<uint32_t>(count), kClassFrame);
  if (status >= 0) status = tSessionPropertyCalls::Set(handle, id, frames.Bytes(), frames.Objects());
  return status;
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropExRef(uint32_t session, SvHandle *, uint32_t id,
                                                          SvHandle *value, SvHandle *info) {
  const uint32_t handle = RedirectSystemHandle(session, id);
  // A text is a name already, annotated by the string read itself.
  if (IsText(id)) return kvsvSessionGetPropString(handle, id, value, info);
  const uint32_t nameId = id == kvPropIntf_DevRef ? kvPropDev_SerNum : 0;
  return AnnotatedStatus(
      ReadSystemRefs(handle, id, nameId, kLineRefUnknown, value, kSystemRefsString), id, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropRef(uint32_t session, uint32_t id,
                                                        SvHandle *value, SvHandle *info) {
  return kvsvSessionGetPropExRef(session, nullptr, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropExRef(uint32_t session, SvHandle *, uint32_t id,
                                                          SvHandle *value, SvHandle *info) {
  if (id != kvPropSession_J1939ECU)
    return ReportMissingSetter(nFile::kSessionOpenClose, kLineSetRefUnknown, id, info);
  return AnnotatedStatus(WriteEcu(session, id, value), id, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropRef(uint32_t session, uint32_t id,
                                                        SvHandle *value, SvHandle *info) {
  return kvsvSessionSetPropExRef(session, nullptr, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropExRef1D(uint32_t session, SvHandle *,
                                                            uint32_t id, SvHandle *value,
                                                            SvHandle *info) {
  const uint32_t handle = RedirectSystemHandle(session, id);
  if (IsCommaList(id)) return kvsvSessionGetPropString1D(handle, id, value, info);
  return AnnotatedStatus(
      ReadSystemRefs(handle, id, NameOfListed(id), kLineRef1DUnknown, value, kSystemRefsArray), id,
      info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropRef1D(uint32_t session, uint32_t id,
                                                          SvHandle *value, SvHandle *info) {
  return kvsvSessionGetPropExRef1D(session, nullptr, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropExRef1D(uint32_t session, SvHandle *,
                                                            uint32_t id, SvHandle *value,
                                                            SvHandle *info) {
  return RunSessionPropertyCall(session, id, info,
                                [&](uint32_t handle) { return WriteFrames(handle, id, value); });
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropRef1D(uint32_t session, uint32_t id,
                                                          SvHandle *value, SvHandle *info) {
  return kvsvSessionSetPropExRef1D(session, nullptr, id, value, info);
}
