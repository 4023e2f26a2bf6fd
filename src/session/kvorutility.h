// The one door to the host's reference manager: registering and removing named references, and
// sending a close to the export that owns a handle's class.
#ifndef KVSVAPI_SESSION_KVORUTILITY_H
#define KVSVAPI_SESSION_KVORUTILITY_H

#include <atomic>
#include <cstdint>
#include <string>

#include <boost/noncopyable.hpp>

#include "core/recursive_mutex.h"
#include "core/status.h"
#include "core/status_block.h"
#include "kvsvplatform.h"
#include "session/object_class.h"

namespace nKVSVAPI100 {

// Serialises every call into the host's reference manager. Taken inside the session manager's
// and the system manager's mutex, never the other way round.
class cRegistrationLock : boost::noncopyable {
 public:
  cRegistrationLock();

  tStatusBlock status;  // negative code if the mutex could not be made
  cRecursiveMutex mutex;
};

extern cRegistrationLock gRegistrationLock;

// Non-zero: every close the dispatch performs on a database or system object is reported.
extern std::atomic<uint32_t> gReportImplicitClose;

// Registers `handle` with the host under `name` (a string handle) as an object of `objectClass`.
// 0xBFF63010 if the texts cannot be made; an unknown class or a host failure is reported.
Status RegisterReference(uint32_t objectClass, SvHandle name, uint32_t handle,
                         SvRefnum *referenceOut);

// Removes a reference by its cookie. 0 for cookie 0; a host warning is dropped.
Status UnregisterReference(SvRefnum reference);

// Removes the reference named `name` of `objectClass`. The host operation is looked up by name at
// run time; a host without it gives a report, and the next call looks again.
Status UnregisterReferenceByName(uint32_t objectClass, const std::string *name);

// Closes `handle` through the close export of `objectClass`; other classes are left alone.
void CloseDispatch(uint32_t handle, uint32_t objectClass);

}  // namespace nKVSVAPI100

#endif
