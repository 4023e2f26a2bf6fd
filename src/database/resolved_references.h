// A list of database objects resolved from the reference texts of a host array, for a property
// write that sends their handles. Each text opens what it names; every object resolved is closed
// again when the list goes, since the driver keeps what it was given.
#ifndef KVSVAPI_DATABASE_RESOLVED_REFERENCES_H
#define KVSVAPI_DATABASE_RESOLVED_REFERENCES_H

#include <cstdint>
#include <memory>

#include <boost/noncopyable.hpp>

#include "core/status.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

class cResolvedReferences : boost::noncopyable {
 public:
  ~cResolvedReferences();

  // Resolves the `count` texts of `texts` to objects of `objectClass`, in order, up to the first
  // failure, whose status it gives. 0xBFF63010 if there is no memory for the list.
  Status Resolve(const SvHandle *texts, uint32_t count, uint32_t objectClass);

  const uint32_t *Objects() const { return objects_.get(); }
  uint32_t Bytes() const { return count_ * uint32_t{sizeof(uint32_t)}; }

 private:
  struct tFree {
    void operator()(uint32_t *block) const;
  };
  std::unique_ptr<uint32_t, tFree> objects_;
  uint32_t count_ = 0;
  uint32_t tried_ = 0;  // only these entries were written
};

}  // namespace nKVSVAPI100

#endif
