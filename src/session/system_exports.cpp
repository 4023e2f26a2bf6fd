// The host's open and close of system, device and interface references.
#include "core/internal_error.h"
#include "kvsvapi.h"
#include "session/kvorutility.h"
#include "session/object_class.h"
#include "session/system_manager.h"

using namespace nKVSVAPI100;

namespace {

bool ManagerFailed() { return gSystemManager.status.code < 0; }

Status ReportFailedManager(uint32_t line) {
  return ReportInternalError(kComponentKvsvapi, nFile::kSessionOpenClose, line,
                             static_cast<uint32_t>(gSystemManager.status.code));
}

// Any reference may reach any close: one of another class goes to the close of its own.
Status CloseOfClass(uint32_t handle, uint32_t ownClass, uint32_t line) {
  const uint32_t objectClass = ClassFromHandle(static_cast<int32_t>(handle));
  if (objectClass != ownClass) {
    CloseDispatch(handle, objectClass);
    return 0;
  }
  if (ManagerFailed()) return ReportFailedManager(line);
  ReleaseChild(handle);
  return 0;
}

// OpenChild handles allocation failures itself; nothing else may reach the host either.
Status OpenOfClass(uint32_t refsProperty, uint32_t nameProperty, SvHandle *name, uint32_t *handle,
                   uint32_t line) {
  if (ManagerFailed()) return ReportFailedManager(line);
  try {
    return OpenChild(refsProperty, nameProperty, name, handle);
  } catch (...) {
    return ReportInternalError(kComponentKvsvapi, nFile::kSessionOpenClose, line, 0);
  }
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvSystemOpen(SvHandle *, uint32_t *system) {
  if (ManagerFailed()) return ReportFailedManager(__LINE__);
  // There is no handle to lend out without a place to put it.
  if (system == nullptr) return kvErrInternal;
  AcquireSystem(system);
  return 0;
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSystemClose(uint32_t system) {
  return CloseOfClass(system, kClassSystem, __LINE__);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSystemManualClose(uint64_t *reserved1, uint64_t *reserved2) {
  if (ManagerFailed()) return ReportFailedManager(__LINE__);
  if (reserved1 != nullptr) *reserved1 = 0;
  if (reserved2 != nullptr) *reserved2 = 0;
  return CloseAll();
}

extern "C" KVSV_EXPORT uint32_t kvsvGetSystemRefCount(void) {
  return gSystemManager.refCount.load(std::memory_order_relaxed);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvDeviceOpen(SvHandle *name, uint32_t *device) {
  return OpenOfClass(kvPropSys_DevRefs, kvPropDev_SerNum, name, device, __LINE__);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvDeviceClose(uint32_t device) {
  return CloseOfClass(device, kClassDevice, __LINE__);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvInterfaceOpen(SvHandle *name, uint32_t *interfaceRef) {
  return OpenOfClass(kvPropSys_IntfRefs, kvPropIntf_Name, name, interfaceRef, __LINE__);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvInterfaceClose(uint32_t interfaceRef) {
  return CloseOfClass(interfaceRef, kClassInterface, __LINE__);
}
