#include "database/resolved_references.h"

#include <cstdlib>

#include "database/find_by_reference_string.h"

namespace nKVSVAPI100 {

void cResolvedReferences::tFree::operator()(uint32_t *block) const { std::free(block); }

cResolvedReferences::~cResolvedReferences() {
  // The closes' statuses are not the write's.
  for (uint32_t i = 0; i < tried_; ++i) {
    if (objects_.get()[i] != 0) kvdbCloseDatabase(objects_.get()[i], 0);
  }
}

Status cResolvedReferences::Resolve(const SvHandle *texts, uint32_t count, uint32_t objectClass) {
  objects_.reset(static_cast<uint32_t *>(std::malloc(count * sizeof(uint32_t))));
  if (!objects_) return kvErrOutOfMemory;
  count_ = count;
  Status status = 0;
  for (tried_ = 0; tried_ < count && status >= 0; ++tried_) {
    uint32_t database = 0;
    status = FindDbObjectByReferenceString(texts[tried_], objectClass, &database,
                                           &objects_.get()[tried_]);
  }
  return status;
}

}  // namespace nKVSVAPI100
