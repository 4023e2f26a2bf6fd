// The system manager: the one driver system handle, lent out with a count, and the devices and
// interfaces opened by name from it.
#ifndef KVSVAPI_SESSION_SYSTEM_MANAGER_H
#define KVSVAPI_SESSION_SYSTEM_MANAGER_H

#include <atomic>
#include <boost/noncopyable.hpp>
#include <boost/unordered_map.hpp>
#include <cstdint>
#include <memory>
#include <string>

#include "core/recursive_mutex.h"
#include "core/status.h"
#include "core/status_block.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

// A device or interface that a host reference names. Its end removes that reference, so that the
// host never holds a name whose object is gone.
class cSysLifeChild : boost::noncopyable {
 public:
  cSysLifeChild(std::string name, uint32_t handle);
  virtual ~cSysLifeChild();

  uint32_t handle;
  std::string name;
};

// Stands for a name that could not be opened: an error session in the driver that answers every
// call with the failure, so that it surfaces at the first node that uses the handle.
class cSysLifeErrorChild : public cSysLifeChild {
 public:
  // Throws std::bad_alloc if the driver cannot make the error session.
  cSysLifeErrorChild(std::string name, Status status);
  ~cSysLifeErrorChild() override;
};

class cSysLifeManager : boost::noncopyable {
 public:
  using tChildren = boost::unordered_map<std::string, std::shared_ptr<cSysLifeChild>>;
  using tErrorChildren = boost::unordered_map<uint32_t, std::shared_ptr<cSysLifeErrorChild>>;

  cSysLifeManager();
  // Maps that still hold entries are abandoned: no child may call the host or the driver while
  // the process ends.
  ~cSysLifeManager();

  tStatusBlock status;  // negative code if the mutex could not be made
  cRecursiveMutex mutex;
  std::unique_ptr<tChildren> children;
  std::unique_ptr<tErrorChildren> errorChildren;
  uint32_t firstSystemHandle = 0;    // first successful open; kept so that old references work
  uint32_t currentSystemHandle = 0;  // handle in force, an error handle, or 0 when closed
  std::atomic<uint32_t> refCount{0};
};

extern cSysLifeManager gSystemManager;

// Each takes the manager's mutex. Callers test the manager's status block first, except for
// RemoveErrorChild and RedirectSystemHandle, which test it themselves.

// Lends out the system handle, opening the driver's system for the first reference. A failed
// open gives an error handle and leaves the count at 0, so that the next acquire retries.
void AcquireSystem(uint32_t *handleOut) noexcept;

// Opens the device or interface named by the string handle `*nameRef`. A name not found gives
// status 0 and an error handle in `*handleOut`.
Status OpenChild(uint32_t refsProperty, uint32_t nameProperty, SvHandle *nameRef,
                 uint32_t *handleOut);

// Looks `*nameRef` up among the objects that `refsProperty` of `system` lists, by `nameProperty`
// and without regard to case. The reference goes to `*handleOut` (0 if not found).
Status FindSystemObject(uint32_t system, uint32_t refsProperty, uint32_t nameProperty,
                        SvHandle *nameRef, uint32_t *handleOut) noexcept;

// Gives back one reference of any system-object class; the last one closes everything.
Status ReleaseChild(uint32_t handle) noexcept;

// Ends every child and closes the driver's system whatever the count. The driver's status.
Status CloseAll() noexcept;

// Forgets the error child of `handle`, ending its error session. True if there was one.
bool RemoveErrorChild(uint32_t handle) noexcept;

// A host reference to the system may be older than the system now open: a system-class property
// given the first handle ever opened goes to the current one.
uint32_t RedirectSystemHandle(uint32_t handle, uint32_t propertyId) noexcept;

}  // namespace nKVSVAPI100

#endif
