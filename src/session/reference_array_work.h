// What a builder of reference texts holds while it runs: the list of objects read from the driver
// and the handle of the text being made. Every way out of the builder frees both.
#ifndef KVSVAPI_SESSION_REFERENCE_ARRAY_WORK_H
#define KVSVAPI_SESSION_REFERENCE_ARRAY_WORK_H

#include <boost/noncopyable.hpp>
#include <boost/scoped_array.hpp>
#include <cstdint>

#include "core/host_handles.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

class cReferenceArrayWork : boost::noncopyable {
 public:
  ~cReferenceArrayWork() { DisposeHandle(&scratch); }

  boost::scoped_array<uint32_t> objects;
  uint32_t count = 0;
  SvHandle scratch = nullptr;  // the text being made, until the output takes it
};

}  // namespace nKVSVAPI100

#endif
