// The factory through which the library gets the directories of the driver's files.
#ifndef KVSVAPI_PATHS_PATH_MAKER_H
#define KVSVAPI_PATHS_PATH_MAKER_H

#include <cstdint>

#include <boost/shared_ptr.hpp>

#include "paths/directory_kind.h"
#include "paths/path_interface.h"

namespace kvpath {

// Stateless: every call computes the directory afresh from the standard directories, so a change
// of environment or of the relocation between calls is seen by the next call.
class cSvCgSupportLibraryPathMaker {
 public:
  // A new path of `kind` (see eDirectoryKind; eErrorLogDir is the error log's directory). Kinds
  // 2 and 14 also create their directory with its parents. Throws cExceptionBase on failure
  // (a kind of 17 or above: component 22, file 1, line 154) or std::bad_alloc.
  static boost::shared_ptr<cPathInterface> MakePath(uint32_t kind);
};

}  // namespace kvpath

#endif
