// The open and close exports that the host's reference machinery calls by name for each class of
// database object. Their statuses travel in the handles: the host is always told 0.
#include "kvsvapi.h"
#include "session/kvorutility.h"
#include "session/object_class.h"

using namespace nKVSVAPI100;

namespace {

kvsvStatus OpenAs(uint32_t objectClass, SvHandle *name, uint32_t *handleOut, uint64_t context) {
  kvsvdbAutoOpenDbObject(name, objectClass, handleOut, context);
  return 0;
}

// The host may call any close with any reference: a handle of another class goes to the close
// that owns it. An error object, which stands for any class, is this class's to close.
kvsvStatus CloseAs(uint32_t objectClass, uint32_t handle) {
  const uint32_t handleClass = ClassFromHandle(static_cast<int32_t>(handle));
  if (handleClass != objectClass && handleClass != kClassBareDatabase)
    CloseDispatch(handle, handleClass);
  else
    kvsvdbAutoCloseDbObject(handle);
  return 0;
}

}  // namespace

#define KVSV_DB_REFERENCE_CLASS(openExport, closeExport, objectClass)                             \
  extern "C" KVSV_EXPORT kvsvStatus openExport(SvHandle *name, uint32_t *handleOut,               \
                                               uint64_t context) {                                \
    return OpenAs(objectClass, name, handleOut, context);                                         \
  }                                                                                               \
  extern "C" KVSV_EXPORT kvsvStatus closeExport(uint32_t handle) {                                \
    return CloseAs(objectClass, handle);                                                          \
  }

KVSV_DB_REFERENCE_CLASS(kvsvdbDatabaseOpen, kvsvdbDatabaseClose, kClassDatabase)
KVSV_DB_REFERENCE_CLASS(kvsvdbClusterOpen, kvsvdbClusterClose, kClassCluster)
KVSV_DB_REFERENCE_CLASS(kvsvdbFrameOpen, kvsvdbFrameClose, kClassFrame)
KVSV_DB_REFERENCE_CLASS(kvsvdbSignalOpen, kvsvdbSignalClose, kClassSignal)
KVSV_DB_REFERENCE_CLASS(kvsvdbSubframeOpen, kvsvdbSubframeClose, kClassSubframe)
KVSV_DB_REFERENCE_CLASS(kvsvdbEcuOpen, kvsvdbEcuClose, kClassEcu)
KVSV_DB_REFERENCE_CLASS(kvsvdbLINSchedOpen, kvsvdbLINSchedClose, kClassLinSchedule)
KVSV_DB_REFERENCE_CLASS(kvsvdbLINSchedEntryOpen, kvsvdbLINSchedEntryClose, kClassLinScheduleEntry)
KVSV_DB_REFERENCE_CLASS(kvsvdbPDUOpen, kvsvdbPDUClose, kClassPdu)
