// kvsvdbSetPropRef and kvsvdbSetPropRef1D: database properties that refer to other objects, set
// from the reference texts by which a host holds them. Each text is resolved to an object handle
// for the driver, and every handle so opened is closed again before the export returns.
#include <cstdint>

#include "core/host_handles.h"
#include "core/internal_error.h"
#include "core/status.h"
#include "database/find_by_reference_string.h"
#include "database/resolved_references.h"
#include "kvorproperties.h"
#include "kvsvapi.h"
#include "property/annotate_property_status.h"
#include "property/property_id_names.h"
#include "property/property_value_io.h"
#include "session/object_class.h"

using namespace nKVSVAPI100;

namespace {

constexpr uint32_t kLineRefIsText = 1590;
constexpr uint32_t kLineRefNotSchedule = 1621;
constexpr uint32_t kLineRef1DIsText = 1787;
constexpr uint32_t kLineRef1DUnknown = 1826;

Status Report(uint32_t line, uint32_t info) {
  return ReportInternalError(kComponentKvsvapi, nFile::kDatabaseProperties, line, info);
}

// The driver's status of closing is of no use to the caller, whose set has its own.
void CloseObject(uint32_t handle) {
  if (handle != 0) kvdbCloseDatabase(handle, 0);
}

bool IsEmptyText(const SvHandle *value) { return value == nullptr || !HasText(*value); }

bool IsEmptyArray(const SvHandle *value) {
  return value == nullptr || *value == nullptr || **value == nullptr || ArrayCount(*value) <= 0;
}

Status WriteReference(uint32_t object, uint32_t id, const SvHandle *value) {
  if (PropertyType(id) == kPropertyTypeText) return Report(kLineRefIsText, id);
  if (IsEmptyText(value)) return tDbPropertyCalls::Set(object, id, 0, nullptr);
  // A LIN schedule entry's collision-resolving schedule is the one reference set by text.
  if (id != kvPropLINSchedEntry_CollisionResSched) {
    const Status reported = Report(kLineRefNotSchedule, id);
    if (reported < 0) return reported;
  }
  uint32_t database = 0, schedule = 0;
  Status status = FindDbObjectByReferenceString(*value, kClassLinSchedule, &database, &schedule);
  if (status >= 0) status = tDbPropertyCalls::Set(object, id, sizeof schedule, &schedule);
  CloseObject(schedule);
  return status;
}

// What the elements of a list property are, or kClassNone for a list not set by text.
uint32_t ElementClass(uint32_t id) {
  switch (id) {
    case kvPropFrm_PDURefs:
      return kClassPdu;
    case kvPropECU_RxFrmRefs:
    case kvPropECU_TxFrmRefs:
    case kvPropLINSchedEntry_Frames:
      return kClassFrame;
    default:
      return kClassNone;
  }
}

Status WriteReferences(uint32_t object, uint32_t id, const SvHandle *value) {
  if (PropertyType(id) == kPropertyTypeText) return Report(kLineRef1DIsText, id);
  if (IsEmptyArray(value)) return tDbPropertyCalls::Set(object, id, 0, nullptr);
  const uint32_t elementClass = ElementClass(id);
  if (elementClass == kClassNone) {
    const Status reported = Report(kLineRef1DUnknown, id);
    if (reported < 0) return reported;
  }
  cResolvedReferences objects;
  Status status = objects.Resolve(ArrayData8<SvHandle>(*value),
                                  static_cast<uint32_t>(ArrayCount(*value)), elementClass);
  if (status >= 0) status = tDbPropertyCalls::Set(object, id, objects.Bytes(), objects.Objects());
  return status;
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvdbSetPropRef(uint32_t object, uint32_t id, SvHandle *value,
                                                   SvHandle *info) {
  return AnnotatedStatus(WriteReference(object, id, value), id, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbSetPropRef1D(uint32_t object, uint32_t id, SvHandle *value,
                                                     SvHandle *info) {
  return AnnotatedStatus(WriteReferences(object, id, value), id, info);
}
