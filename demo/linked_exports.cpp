// Kept apart from the run-time lookup: only a program linked with the library may use it.
#include "library_exports.h"

namespace kvsvdemo {

tLibraryExports LinkedExports() {
  tLibraryExports e;
  e.statusToString = &kvsvStatusToString;
  e.svTimeToRawTime = &kvsvSvTimeToRawTime;
  e.sessionOpen = &kvsvSessionOpen;
  e.sessionGetPropU32 = &kvsvSessionGetPropU32;
  e.sessionGetPropString = &kvsvSessionGetPropString;
  e.writeSignalSinglePoint = &kvsvWriteSignalSinglePoint;
  e.readSignalSinglePoint = &kvsvReadSignalSinglePoint;
  e.readSignalXY = &kvsvReadSignalXY;
  e.readSignalWaveform = &kvsvReadSignalWaveform;
  e.readFrameCAN = &kvsvReadFrameCAN;
  e.convertSignalsToFrameCAN = &kvsvConvertSignalSinglePointToFrameCAN;
  e.convertFrameCANToSignals = &kvsvConvertFrameCANToSignalSinglePoint;
  e.dbAddAlias = &kvsvdbAddAlias;
  e.dbRemoveAlias = &kvsvdbRemoveAlias;
  e.dbManualOpen = &kvsvdbManualOpen;
  e.dbManualClose = &kvsvdbManualClose;
  e.dbGetPropRef1D = &kvsvdbGetPropRef1D;
  e.dbCreateObject = &kvsvdbCreateObject;
  e.dbDeleteObject = &kvsvdbDeleteObject;
  e.dbSave = &kvsvdbSave;
  e.dbGetDatabaseList = &kvsvdbGetDatabaseList;
  e.dbNumOpen = &kvsvGetNumOpenDatabases;
  e.dbGetPropU32 = &kvsvdbGetPropU32;
  e.dbGetPropF64 = &kvsvdbGetPropF64;
  e.dbSetPropF64 = &kvsvdbSetPropF64;
  e.dbGetPropString = &kvsvdbGetPropString;
  e.dbGetPropPDU_Mapping = &kvsvdbGetPropPDU_Mapping;
  e.dbSetPropPDU_Mapping = &kvsvdbSetPropPDU_Mapping;
  e.sessionManualCreate = &kvsvSessionManualCreate;
  e.sessionClear = &kvsvSessionClear;
  e.sessionGetPropExCluster1D = &kvsvSessionGetPropExCluster1D;
  e.sessionSetPropExCluster1D = &kvsvSessionSetPropExCluster1D;
  return e;
}

}  // namespace kvsvdemo
