// Reading and writing the counted text of host string handles, for every host operation that
// takes or gives one.
#ifndef SVHOST_COUNTED_TEXT_H
#define SVHOST_COUNTED_TEXT_H

#include <cstddef>
#include <cstdint>
#include <string>

#include "kvsvapi.h"

namespace svhost {

// Text of a counted string block; a null block or a count of 0 or less is "".
std::string BlockText(const SvStr *block);

// Text of a string handle; a null handle is "". Aborts on a handle that is not live or whose
// count runs past its block. Throws std::bad_alloc.
std::string HandleText(SvHandle string, const char *operation);

// Stores `length` bytes as the text of `*string`, making the handle if it is null and growing it
// if it is too small. 0, SVSIM_ERR_ARGUMENT for a length that a count cannot hold, or the memory
// error of the failed allocation or resize, with the handle as it was.
int32_t StoreText(SvHandle *string, const char *bytes, size_t length, const char *operation);

}  // namespace svhost

#endif
