// The names by which the host holds the system objects that a property lists: devices by their
// serial numbers, interfaces and other objects by a text property of their own.
#ifndef KVSVAPI_PROPERTY_SYSTEM_REFS_FROM_PROPERTY_H
#define KVSVAPI_PROPERTY_SYSTEM_REFS_FROM_PROPERTY_H

#include <cstdint>

#include "core/status.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

// Where the names go: a new array of strings, or the one string of a single object.
enum eSystemRefsOutput : uint32_t { kSystemRefsArray = 0, kSystemRefsString = 1 };

// The list property that stands for `handle` alone.
constexpr uint32_t kSystemRefsSelf = 0xFFFFFFFFu;

// Names the objects that `listId` of `handle` lists (or `handle` alone) by `nameId` into `*out`.
// A failed or empty list leaves `*out` as it was. An object whose name cannot be read gets an
// empty string and the others go on; the result is the status of the last object's reads.
Status SystemRefsFromProperty(uint32_t handle, uint32_t listId, uint32_t nameId, SvHandle *out,
                              uint32_t mode);

}  // namespace nKVSVAPI100

#endif
