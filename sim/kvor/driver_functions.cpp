#include "driver_functions.h"

namespace nKvorSim {

namespace {

constexpr DriverFunction kFunctions[] = {
    {"kvCreateSession", true, false},
    {"kvClear", true, false},
    {"kvhdnCreateErrorSession", true, false},
    {"kvWait", true, false},
    {"kvStatusToString", false, false},
    {"kvSystemOpen", true, false},
    {"kvSystemClose", true, false},
    {"kvGetPropertySize", true, true},
    {"kvGetProperty", true, true},
    {"kvSetProperty", true, true},
    {"kvGetSubProperty", true, true},
    {"kvSetSubProperty", true, true},
    {"kvReadSignalSinglePoint", true, false},
    {"kvWriteSignalSinglePoint", true, false},
    {"kvhdnReadSignalWaveform", true, false},
    {"kvhdnWriteSignalWaveform", true, false},
    {"kvReadSignalXY", true, false},
    {"kvWriteSignalXY", true, false},
    {"kvStart", true, false},
    {"kvStop", true, false},
    {"kvFlush", true, false},
    {"kvConnectTerminals", true, false},
    {"kvDisconnectTerminals", true, false},
    {"kvhdnCreateSvTiming_FlexRayMacrotick", true, false},
    {"kvBlink", true, false},
    {"kvdbOpenDatabase", true, false},
    {"kvdbCloseDatabase", true, false},
    {"kvdbFindObject", true, false},
    {"kvdbCreateObject", true, false},
    {"kvdbDeleteObject", true, false},
    {"kvdbGetPropertySize", true, true},
    {"kvdbGetProperty", true, true},
    {"kvdbSetProperty", true, true},
    {"kvdbSaveDatabase", true, false},
    {"kvdbAddAlias", true, false},
    {"kvdbAddAlias64", true, false},
    {"kvdbRemoveAlias", true, false},
    {"kvdbGetDatabaseListSizes", true, false},
    {"kvdbGetDatabaseList", true, false},
    {"kvhdndbCreateErrorObject", true, false},
    {"kvhdndbGetDatabaseRefFromObjRef", true, false},
    {"kvhdndbOpenDatabaseByRef", true, false},
    {"kvdbMerge", true, false},
    {"kvdbDeploy", true, false},
    {"kvdbUndeploy", true, false},
    {"kvdbGetDBCAttributeSize", true, false},
    {"kvdbGetDBCAttribute", true, false},
    {"kvWriteState", true, false},
    {"kvReadFrame", true, false},
    {"kvhdnReadFrame", true, false},
    {"kvWriteFrame", true, false},
    {"kvhdnReadFrameEthernet", true, false},
    {"kvhdnWriteFrameEthernet", true, false},
    {"kvConvertSignalsToFramesSinglePoint", true, false},
    {"kvConvertFramesToSignalsSinglePoint", true, false},
    {"kvConvertByteArrayToFramesSinglePoint", true, false},
    {"kvConvertFramesToByteArraySinglePoint", true, false},
    {"kvReadState", true, false},
    {"kvReadStateTimeTrigger", true, false},
    {"kvFutureTimeTrigger", true, false},
};

}  // namespace

const DriverFunction *FindDriverFunction(std::string_view name) {
  for (const DriverFunction &function : kFunctions) {
    if (name == function.name) return &function;
  }
  return nullptr;
}

}  // namespace nKvorSim
