#include "library_exports.h"

#include <dlfcn.h>

namespace kvsvdemo {

namespace {

template <typename T>
void Find(void *library, const char *name, T &function, std::string &error) {
  function = reinterpret_cast<T>(dlsym(library, name));
  if (function == nullptr && error.empty()) error = std::string("no export ") + name;
}

}  // namespace

tLibraryExports ExportsOf(void *library, std::string &error) {
  tLibraryExports e;
  Find(library, "kvsvStatusToString", e.statusToString, error);
  Find(library, "kvsvSvTimeToRawTime", e.svTimeToRawTime, error);
  Find(library, "kvsvSessionOpen", e.sessionOpen, error);
  Find(library, "kvsvSessionGetPropU32", e.sessionGetPropU32, error);
  Find(library, "kvsvSessionGetPropString", e.sessionGetPropString, error);
  Find(library, "kvsvWriteSignalSinglePoint", e.writeSignalSinglePoint, error);
  Find(library, "kvsvReadSignalSinglePoint", e.readSignalSinglePoint, error);
  Find(library, "kvsvReadSignalXY", e.readSignalXY, error);
  Find(library, "kvsvReadSignalWaveform", e.readSignalWaveform, error);
  Find(library, "kvsvReadFrameCAN", e.readFrameCAN, error);
  Find(library, "kvsvConvertSignalSinglePointToFrameCAN", e.convertSignalsToFrameCAN, error);
  Find(library, "kvsvConvertFrameCANToSignalSinglePoint", e.convertFrameCANToSignals, error);
  Find(library, "kvsvdbAddAlias", e.dbAddAlias, error);
  Find(library, "kvsvdbRemoveAlias", e.dbRemoveAlias, error);
  Find(library, "kvsvdbManualOpen", e.dbManualOpen, error);
  Find(library, "kvsvdbManualClose", e.dbManualClose, error);
  Find(library, "kvsvdbGetPropRef1D", e.dbGetPropRef1D, error);
  Find(library, "kvsvdbCreateObject", e.dbCreateObject, error);
  Find(library, "kvsvdbDeleteObject", e.dbDeleteObject, error);
  Find(library, "kvsvdbSave", e.dbSave, error);
  Find(library, "kvsvdbGetDatabaseList", e.dbGetDatabaseList, error);
  Find(library, "kvsvGetNumOpenDatabases", e.dbNumOpen, error);
  Find(library, "kvsvdbGetPropU32", e.dbGetPropU32, error);
  Find(library, "kvsvdbGetPropF64", e.dbGetPropF64, error);
  Find(library, "kvsvdbSetPropF64", e.dbSetPropF64, error);
  Find(library, "kvsvdbGetPropString", e.dbGetPropString, error);
  Find(library, "kvsvdbGetPropPDU_Mapping", e.dbGetPropPDU_Mapping, error);
  Find(library, "kvsvdbSetPropPDU_Mapping", e.dbSetPropPDU_Mapping, error);
  Find(library, "kvsvSessionManualCreate", e.sessionManualCreate, error);
  Find(library, "kvsvSessionClear", e.sessionClear, error);
  Find(library, "kvsvSessionGetPropExCluster1D", e.sessionGetPropExCluster1D, error);
  Find(library, "kvsvSessionSetPropExCluster1D", e.sessionSetPropExCluster1D, error);
  return e;
}

}  // namespace kvsvdemo
