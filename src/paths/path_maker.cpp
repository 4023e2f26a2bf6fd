#include "paths/path_maker.h"

#include <boost/make_shared.hpp>

#include "paths/path.h"
#include "paths/path_sysq_wrapper.h"

namespace kvpath {

boost::shared_ptr<cPathInterface> cSvCgSupportLibraryPathMaker::MakePath(uint32_t kind) {
  cSysqWrapper sysq;
  return boost::make_shared<cPath>(kind, sysq);
}

}  // namespace kvpath
