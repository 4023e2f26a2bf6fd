// The name of a failed property call, written into the caller's error information.
#ifndef KVSVAPI_PROPERTY_ANNOTATE_PROPERTY_STATUS_H
#define KVSVAPI_PROPERTY_ANNOTATE_PROPERTY_STATUS_H

#include <cstdint>

#include "core/status.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

// For a non-zero status (warnings too), stores a new 108-byte string handle through `info`
// holding "\nProperty: <name>" with the name cut behind its first '_', or the identifier in hex
// for an unnamed one. What `info` held before is left to the host, which owns it. Never changes
// the export's status, so it returns nothing.
void AnnotatePropertyStatus(Status status, uint32_t propertyId, SvHandle *info);

// Annotates `status` and gives it back, so that an export ends in one expression.
inline Status AnnotatedStatus(Status status, uint32_t propertyId, SvHandle *info) {
  AnnotatePropertyStatus(status, propertyId, info);
  return status;
}

// Setters that a family does not have: an internal report of source `file` at `line`, annotated
// as any failure.
Status ReportMissingSetter(uint32_t file, uint32_t line, uint32_t id, SvHandle *info);

}  // namespace nKVSVAPI100

#endif
