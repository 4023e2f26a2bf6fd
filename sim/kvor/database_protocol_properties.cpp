#include "database_protocol_properties.h"

#include <algorithm>
#include <iterator>

#include "kvorproperties.h"

namespace nKvorSim {

namespace {

constexpr uint32_t kFlexRayAndLin[] = {
    kvPropClst_FlexRayActPtOff,
    kvPropClst_FlexRayCASRxLMax,
    kvPropClst_FlexRayChannels,
    kvPropClst_FlexRayClstDriftDmp,
    kvPropClst_FlexRayColdStAts,
    kvPropClst_FlexRayCycle,
    kvPropClst_FlexRayDynSegStart,
    kvPropClst_FlexRayDynSlotIdlPh,
    kvPropClst_FlexRayLisNoise,
    kvPropClst_FlexRayMacroPerCycle,
    kvPropClst_FlexRayLatestUsableDyn,
    kvPropClst_FlexRayLatestGuarDyn,
    kvPropClst_FlexRayMacrotick,
    kvPropClst_FlexRayMaxWoClkCorFat,
    kvPropClst_FlexRayMaxWoClkCorPas,
    kvPropClst_FlexRayMinislotActPt,
    kvPropClst_FlexRayMinislot,
    kvPropClst_FlexRayNMVecLen,
    kvPropClst_FlexRayNIT,
    kvPropClst_FlexRayNITStart,
    kvPropClst_FlexRayNumMinislt,
    kvPropClst_FlexRayNumStatSlt,
    kvPropClst_FlexRayOffCorSt,
    kvPropClst_FlexRayPayldLenDynMax,
    kvPropClst_FlexRayPayldLenMax,
    kvPropClst_FlexRayPayldLenSt,
    kvPropClst_FlexRayStatSlot,
    kvPropClst_FlexRaySymWin,
    kvPropClst_FlexRaySymWinStart,
    kvPropClst_FlexRaySyncNodeMax,
    kvPropClst_FlexRayTSSTx,
    kvPropClst_FlexRayWakeSymRxIdl,
    kvPropClst_FlexRayWakeSymRxLow,
    kvPropClst_FlexRayWakeSymRxWin,
    kvPropClst_FlexRayWakeSymTxIdl,
    kvPropClst_FlexRayWakeSymTxLow,
    kvPropClst_FlexRayUseWakeup,
    kvPropClst_LINTick,
    kvPropClst_FlexRayAlwPassAct,

    kvPropFrm_FlexRayBaseCycle,
    kvPropFrm_FlexRayChAssign,
    kvPropFrm_FlexRayCycleRep,
    kvPropFrm_FlexRayPreamble,
    kvPropFrm_FlexRayStartup,
    kvPropFrm_FlexRaySync,
    kvPropFrm_FlexRayTimingType,
    kvPropFrm_FlexRayInCycRepEnabled,
    kvPropFrm_FlexRayInCycRepIDs,
    kvPropFrm_FlexRayInCycRepChAssigns,
    kvPropFrm_LINChecksum,

    kvPropECU_FlexRayIsColdstart,
    kvPropECU_FlexRayStartupFrameRef,
    kvPropECU_FlexRayWakeupPtrn,
    kvPropECU_FlexRayWakeupChs,
    kvPropECU_FlexRayConnectedChs,
    kvPropECU_LINMaster,
    kvPropECU_LINProtocolVer,
    kvPropECU_LINInitialNAD,
    kvPropECU_LINConfigNAD,
    kvPropECU_LINSupplierID,
    kvPropECU_LINFunctionID,
    kvPropECU_LINP2min,
    kvPropECU_LINSTmin,
};

}  // namespace

bool IsFlexRayOrLinProperty(uint32_t id) {
  return std::find(std::begin(kFlexRayAndLin), std::end(kFlexRayAndLin), id) !=
         std::end(kFlexRayAndLin);
}

}  // namespace nKvorSim
