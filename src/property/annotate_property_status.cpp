// The property's name in a failed or warned call's error information.
#include "property/annotate_property_status.h"

#include <cstring>

#include "core/internal_error.h"
#include "property/property_id_names.h"

namespace nKVSVAPI100 {

namespace {

// 4 bytes of count and 104 of text: room for every annotation, so printing never grows it.
constexpr size_t kAnnotationBytes = 108;

}  // namespace

void AnnotatePropertyStatus(Status status, uint32_t propertyId, SvHandle *info) {
  if (info == nullptr || status == 0) return;
  // What `info` held belongs to the host, which still refers to it: overwritten, never disposed.
  *info = svNewHandleClr(kAnnotationBytes);
  if (*info == nullptr) return;
  const char *name = PropertyIdToName(propertyId);
  const char *underscore = name != nullptr ? std::strchr(name, '_') : nullptr;
  // The print's result is ignored: the annotation never changes the export's status.
  if (underscore != nullptr)
    svStrPrintf(*info, "\nProperty: %s", underscore + 1);
  else
    svStrPrintf(*info, "\nProperty: (unknown ID hex %08lx)",
                static_cast<unsigned long>(propertyId));
}

Status ReportMissingSetter(uint32_t file, uint32_t line, uint32_t id, SvHandle *info) {
  return AnnotatedStatus(ReportInternalError(kComponentKvsvapi, file, line, 0), id, info);
}

}  // namespace nKVSVAPI100
