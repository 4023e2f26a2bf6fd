// The library's exports that the drive calls, reached through a table so that a host program can
// take them from a library it loaded itself, and a test from the library it was linked with.
#ifndef KVSVDEMO_LIBRARY_EXPORTS_H
#define KVSVDEMO_LIBRARY_EXPORTS_H

#include <string>

#include "kvsvapi.h"

namespace kvsvdemo {

struct tLibraryExports {
  decltype(&kvsvStatusToString) statusToString = nullptr;
  decltype(&kvsvSvTimeToRawTime) svTimeToRawTime = nullptr;
  decltype(&kvsvSessionOpen) sessionOpen = nullptr;
  decltype(&kvsvSessionGetPropU32) sessionGetPropU32 = nullptr;
  decltype(&kvsvSessionGetPropString) sessionGetPropString = nullptr;
  decltype(&kvsvWriteSignalSinglePoint) writeSignalSinglePoint = nullptr;
  decltype(&kvsvReadSignalSinglePoint) readSignalSinglePoint = nullptr;
  decltype(&kvsvReadSignalXY) readSignalXY = nullptr;
  decltype(&kvsvReadSignalWaveform) readSignalWaveform = nullptr;
  decltype(&kvsvReadFrameCAN) readFrameCAN = nullptr;
  decltype(&kvsvConvertSignalSinglePointToFrameCAN) convertSignalsToFrameCAN = nullptr;
  decltype(&kvsvConvertFrameCANToSignalSinglePoint) convertFrameCANToSignals = nullptr;
  decltype(&kvsvdbAddAlias) dbAddAlias = nullptr;
  decltype(&kvsvdbRemoveAlias) dbRemoveAlias = nullptr;
  decltype(&kvsvdbManualOpen) dbManualOpen = nullptr;
  decltype(&kvsvdbManualClose) dbManualClose = nullptr;
  decltype(&kvsvdbGetPropRef1D) dbGetPropRef1D = nullptr;
  decltype(&kvsvdbCreateObject) dbCreateObject = nullptr;
  decltype(&kvsvdbDeleteObject) dbDeleteObject = nullptr;
  decltype(&kvsvdbSave) dbSave = nullptr;
  decltype(&kvsvdbGetDatabaseList) dbGetDatabaseList = nullptr;
  decltype(&kvsvGetNumOpenDatabases) dbNumOpen = nullptr;
  decltype(&kvsvdbGetPropU32) dbGetPropU32 = nullptr;
  decltype(&kvsvdbGetPropF64) dbGetPropF64 = nullptr;
  decltype(&kvsvdbSetPropF64) dbSetPropF64 = nullptr;
  decltype(&kvsvdbGetPropString) dbGetPropString = nullptr;
  decltype(&kvsvdbGetPropPDU_Mapping) dbGetPropPDU_Mapping = nullptr;
  decltype(&kvsvdbSetPropPDU_Mapping) dbSetPropPDU_Mapping = nullptr;
  decltype(&kvsvSessionManualCreate) sessionManualCreate = nullptr;
  decltype(&kvsvSessionClear) sessionClear = nullptr;
  decltype(&kvsvSessionGetPropExCluster1D) sessionGetPropExCluster1D = nullptr;
  decltype(&kvsvSessionSetPropExCluster1D) sessionSetPropExCluster1D = nullptr;
};

// The exports of the library this program was linked with.
tLibraryExports LinkedExports();

// The exports of a library loaded at run time; on failure `error` names what is missing and the
// result is incomplete.
tLibraryExports ExportsOf(void *library, std::string &error);

}  // namespace kvsvdemo

#endif
