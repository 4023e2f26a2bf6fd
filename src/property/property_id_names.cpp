// The names of the property identifiers, kept per class and looked up class first. Each entry is
// made from the driver header's enumerator, so that a name and its value cannot drift apart.
#include "property/property_id_names.h"

#include <algorithm>
#include <cstddef>

#include "kvorproperties.h"

namespace nKVSVAPI100 {

namespace {

struct tNamedId {
  uint32_t id;
  const char *name;
};

#define KVSV_NAME(enumerator) \
  tNamedId { enumerator, #enumerator }

// Within a class the entries go by number, then by type: the number alone does not decide, since
// a 64-bit twin or an unrelated property may share it under another type.
constexpr uint32_t OrderKey(uint32_t id) { return ((id & 0xFFFFu) << 8) | (id >> 24); }

// Database (class 0x00).
constexpr tNamedId kDatabase[] = {
    KVSV_NAME(kvPropDatabase_Name),
    KVSV_NAME(kvPropDatabase_ClstRefs),
    KVSV_NAME(kvPropDatabase_ShowInvalidFromOpen),
};

// Cluster (class 0x01).
constexpr tNamedId kCluster[] = {
    KVSV_NAME(kvPropClst_BaudRate),
    KVSV_NAME(kvPropClst_BaudRate64),
    KVSV_NAME(kvPropClst_DatabaseRef),
    KVSV_NAME(kvPropClst_ECURefs),
    KVSV_NAME(kvPropClst_FrmRefs),
    KVSV_NAME(kvPropClst_Name),
    KVSV_NAME(kvPropClst_Protocol),
    KVSV_NAME(kvPropClst_SigRefs),
    KVSV_NAME(kvPropClst_Comment),
    KVSV_NAME(kvPropClst_PDURefs),
    KVSV_NAME(kvPropClst_ConfigStatus),
    KVSV_NAME(kvPropClst_PDUsReqd),
    KVSV_NAME(kvPropClst_CanIoMode),
    KVSV_NAME(kvPropClst_CanFdBaudRate),
    KVSV_NAME(kvPropClst_CanFdBaudRate64),
    KVSV_NAME(kvPropClst_FlexRayActPtOff),
    KVSV_NAME(kvPropClst_FlexRayCASRxLMax),
    KVSV_NAME(kvPropClst_FlexRayChannels),
    KVSV_NAME(kvPropClst_FlexRayClstDriftDmp),
    KVSV_NAME(kvPropClst_FlexRayColdStAts),
    KVSV_NAME(kvPropClst_FlexRayCycle),
    KVSV_NAME(kvPropClst_FlexRayDynSegStart),
    KVSV_NAME(kvPropClst_FlexRayDynSlotIdlPh),
    KVSV_NAME(kvPropClst_FlexRayLisNoise),
    KVSV_NAME(kvPropClst_FlexRayMacroPerCycle),
    KVSV_NAME(kvPropClst_FlexRayLatestUsableDyn),
    KVSV_NAME(kvPropClst_FlexRayLatestGuarDyn),
    KVSV_NAME(kvPropClst_FlexRayMacrotick),
    KVSV_NAME(kvPropClst_FlexRayMaxWoClkCorFat),
    KVSV_NAME(kvPropClst_FlexRayMaxWoClkCorPas),
    KVSV_NAME(kvPropClst_FlexRayMinislotActPt),
    KVSV_NAME(kvPropClst_FlexRayMinislot),
    KVSV_NAME(kvPropClst_FlexRayNMVecLen),
    KVSV_NAME(kvPropClst_FlexRayNIT),
    KVSV_NAME(kvPropClst_FlexRayNITStart),
    KVSV_NAME(kvPropClst_FlexRayNumMinislt),
    KVSV_NAME(kvPropClst_FlexRayNumStatSlt),
    KVSV_NAME(kvPropClst_FlexRayOffCorSt),
    KVSV_NAME(kvPropClst_FlexRayPayldLenDynMax),
    KVSV_NAME(kvPropClst_FlexRayPayldLenMax),
    KVSV_NAME(kvPropClst_FlexRayPayldLenSt),
    KVSV_NAME(kvPropClst_FlexRayStatSlot),
    KVSV_NAME(kvPropClst_FlexRaySymWin),
    KVSV_NAME(kvPropClst_FlexRaySymWinStart),
    KVSV_NAME(kvPropClst_FlexRaySyncNodeMax),
    KVSV_NAME(kvPropClst_FlexRayTSSTx),
    KVSV_NAME(kvPropClst_FlexRayWakeSymRxIdl),
    KVSV_NAME(kvPropClst_FlexRayWakeSymRxLow),
    KVSV_NAME(kvPropClst_FlexRayWakeSymRxWin),
    KVSV_NAME(kvPropClst_FlexRayWakeSymTxIdl),
    KVSV_NAME(kvPropClst_FlexRayWakeSymTxLow),
    KVSV_NAME(kvPropClst_FlexRayUseWakeup),
    KVSV_NAME(kvPropClst_LINSchedules),
    KVSV_NAME(kvPropClst_LINTick),
    KVSV_NAME(kvPropClst_FlexRayAlwPassAct),
    KVSV_NAME(kvPropClst_ApplicationProtocol),
    KVSV_NAME(kvPropClst_CanFdIsoMode),
};

// Frame (class 0x02).
constexpr tNamedId kFrame[] = {
    KVSV_NAME(kvPropFrm_ClusterRef),
    KVSV_NAME(kvPropFrm_Comment),
    KVSV_NAME(kvPropFrm_ID),
    KVSV_NAME(kvPropFrm_Name),
    KVSV_NAME(kvPropFrm_DefaultPayload),
    KVSV_NAME(kvPropFrm_PayloadLen),
    KVSV_NAME(kvPropFrm_SigRefs),
    KVSV_NAME(kvPropFrm_ConfigStatus),
    KVSV_NAME(kvPropFrm_CANExtID),
    KVSV_NAME(kvPropFrm_CANTimingType),
    KVSV_NAME(kvPropFrm_CANTxTime),
    KVSV_NAME(kvPropFrm_FlexRayBaseCycle),
    KVSV_NAME(kvPropFrm_FlexRayChAssign),
    KVSV_NAME(kvPropFrm_FlexRayCycleRep),
    KVSV_NAME(kvPropFrm_FlexRayPreamble),
    KVSV_NAME(kvPropFrm_FlexRayStartup),
    KVSV_NAME(kvPropFrm_FlexRaySync),
    KVSV_NAME(kvPropFrm_FlexRayTimingType),
    KVSV_NAME(kvPropFrm_FlexRayInCycRepEnabled),
    KVSV_NAME(kvPropFrm_FlexRayInCycRepIDs),
    KVSV_NAME(kvPropFrm_FlexRayInCycRepChAssigns),
    KVSV_NAME(kvPropFrm_MuxIsMuxed),
    KVSV_NAME(kvPropFrm_MuxDataMuxSigRef),
    KVSV_NAME(kvPropFrm_MuxStaticSigRefs),
    KVSV_NAME(kvPropFrm_MuxSubframeRefs),
    KVSV_NAME(kvPropFrm_LINChecksum),
    KVSV_NAME(kvPropFrm_PDURefs),
    KVSV_NAME(kvPropFrm_PDUStartBits),
    KVSV_NAME(kvPropFrm_PDUUpdateBits),
    KVSV_NAME(kvPropFrm_ApplicationProtocol),
    KVSV_NAME(kvPropFrm_CANioMode),
    KVSV_NAME(kvPropFrm_PDU_Mapping),
};

// Signal (class 0x03).
constexpr tNamedId kSignal[] = {
    KVSV_NAME(kvPropSig_ByteOrdr),     KVSV_NAME(kvPropSig_Comment),
    KVSV_NAME(kvPropSig_DataType),     KVSV_NAME(kvPropSig_Default),
    KVSV_NAME(kvPropSig_FrameRef),     KVSV_NAME(kvPropSig_Max),
    KVSV_NAME(kvPropSig_Min),          KVSV_NAME(kvPropSig_Name),
    KVSV_NAME(kvPropSig_ConfigStatus), KVSV_NAME(kvPropSig_NameUniqueToCluster),
    KVSV_NAME(kvPropSig_PDURef),       KVSV_NAME(kvPropSig_NumBits),
    KVSV_NAME(kvPropSig_ScaleFac),     KVSV_NAME(kvPropSig_ScaleOff),
    KVSV_NAME(kvPropSig_StartBit),     KVSV_NAME(kvPropSig_Unit),
    KVSV_NAME(kvPropSig_MuxIsDataMux), KVSV_NAME(kvPropSig_MuxIsDynamic),
    KVSV_NAME(kvPropSig_MuxValue),     KVSV_NAME(kvPropSig_MuxSubfrmRef),
};

// Subframe (class 0x04).
constexpr tNamedId kSubframe[] = {
    KVSV_NAME(kvPropSubfrm_DynSigRefs),   KVSV_NAME(kvPropSubfrm_FrmRef),
    KVSV_NAME(kvPropSubfrm_MuxValue),     KVSV_NAME(kvPropSubfrm_Name),
    KVSV_NAME(kvPropSubfrm_PDURef),       KVSV_NAME(kvPropSubfrm_NameUniqueToCluster),
    KVSV_NAME(kvPropSubfrm_ConfigStatus),
};

// ECU (class 0x05).
constexpr tNamedId kEcu[] = {
    KVSV_NAME(kvPropECU_ClstRef),
    KVSV_NAME(kvPropECU_Name),
    KVSV_NAME(kvPropECU_RxFrmRefs),
    KVSV_NAME(kvPropECU_TxFrmRefs),
    KVSV_NAME(kvPropECU_Comment),
    KVSV_NAME(kvPropECU_ConfigStatus),
    KVSV_NAME(kvPropECU_FlexRayIsColdstart),
    KVSV_NAME(kvPropECU_FlexRayStartupFrameRef),
    KVSV_NAME(kvPropECU_FlexRayWakeupPtrn),
    KVSV_NAME(kvPropECU_FlexRayWakeupChs),
    KVSV_NAME(kvPropECU_FlexRayConnectedChs),
    KVSV_NAME(kvPropECU_LINMaster),
    KVSV_NAME(kvPropECU_LINProtocolVer),
    KVSV_NAME(kvPropECU_LINInitialNAD),
    KVSV_NAME(kvPropECU_LINConfigNAD),
    KVSV_NAME(kvPropECU_LINSupplierID),
    KVSV_NAME(kvPropECU_LINFunctionID),
    KVSV_NAME(kvPropECU_LINP2min),
    KVSV_NAME(kvPropECU_LINSTmin),
    KVSV_NAME(kvPropECU_J1939PreferredAddress),
    KVSV_NAME(kvPropECU_J1939NodeName),
};

// LIN schedule (class 0x06).
constexpr tNamedId kLinSchedule[] = {
    KVSV_NAME(kvPropLINSched_Entries),      KVSV_NAME(kvPropLINSched_Name),
    KVSV_NAME(kvPropLINSched_Priority),     KVSV_NAME(kvPropLINSched_RunMode),
    KVSV_NAME(kvPropLINSched_ClstRef),      KVSV_NAME(kvPropLINSched_Comment),
    KVSV_NAME(kvPropLINSched_ConfigStatus),
};

// LIN schedule entry (class 0x07).
constexpr tNamedId kLinScheduleEntry[] = {
    KVSV_NAME(kvPropLINSchedEntry_CollisionResSched),
    KVSV_NAME(kvPropLINSchedEntry_Delay),
    KVSV_NAME(kvPropLINSchedEntry_EventID),
    KVSV_NAME(kvPropLINSchedEntry_Frames),
    KVSV_NAME(kvPropLINSchedEntry_Type),
    KVSV_NAME(kvPropLINSchedEntry_Name),
    KVSV_NAME(kvPropLINSchedEntry_Sched),
    KVSV_NAME(kvPropLINSchedEntry_NameUniqueToCluster),
    KVSV_NAME(kvPropLINSchedEntry_NC_FF_DataBytes),
};

// PDU (class 0x08).
constexpr tNamedId kPdu[] = {
    KVSV_NAME(kvPropPDU_Name),
    KVSV_NAME(kvPropPDU_Comment),
    KVSV_NAME(kvPropPDU_PayloadLen),
    KVSV_NAME(kvPropPDU_ClusterRef),
    KVSV_NAME(kvPropPDU_SigRefs),
    KVSV_NAME(kvPropPDU_DefaultPayload),
    KVSV_NAME(kvPropPDU_FrmRefs),
    KVSV_NAME(kvPropPDU_ConfigStatus),
    KVSV_NAME(kvPropPDU_MuxIsMuxed),
    KVSV_NAME(kvPropPDU_MuxDataMuxSigRef),
    KVSV_NAME(kvPropPDU_MuxStaticSigRefs),
    KVSV_NAME(kvPropPDU_MuxSubframeRefs),
};

// Session (class 0x10).
constexpr tNamedId kSession[] = {
    KVSV_NAME(kvPropSession_AutoStart),
    KVSV_NAME(kvPropSession_DatabaseName),
    KVSV_NAME(kvPropSession_List),
    KVSV_NAME(kvPropSession_Mode),
    KVSV_NAME(kvPropSession_NumInList),
    KVSV_NAME(kvPropSession_NumPend),
    KVSV_NAME(kvPropSession_ResampRate),
    KVSV_NAME(kvPropSession_Protocol),
    KVSV_NAME(kvPropSession_PayldLenMax),
    KVSV_NAME(kvPropSession_ClusterName),
    KVSV_NAME(kvPropSession_NumUnused),
    KVSV_NAME(kvPropSession_QueueSize),
    KVSV_NAME(kvPropSession_NumFrames),
    KVSV_NAME(kvPropSession_IntfEchoTx),
    KVSV_NAME(kvPropSession_IntfOutStrmList),
    KVSV_NAME(kvPropSession_IntfOutStrmTimng),
    KVSV_NAME(kvPropSession_IntfName),
    KVSV_NAME(kvPropSession_IntfStartTrigToInStrm),
    KVSV_NAME(kvPropSession_IntfBusErrToInStrm),
    KVSV_NAME(kvPropSession_IntfBaudRate),
    KVSV_NAME(kvPropSession_IntfBaudRate64),
    KVSV_NAME(kvPropSession_IntfCANPendTxOrder),
    KVSV_NAME(kvPropSession_IntfCANOutStrmListById),
    KVSV_NAME(kvPropSession_IntfCANLstnOnly),
    KVSV_NAME(kvPropSession_IntfCANExtTcvrConfig),
    KVSV_NAME(kvPropSession_IntfCANSingShot),
    KVSV_NAME(kvPropSession_IntfCANTerm),
    KVSV_NAME(kvPropSession_IntfCanIoMode),
    KVSV_NAME(kvPropSession_IntfCanFdBaudRate),
    KVSV_NAME(kvPropSession_IntfCanFdBaudRate64),
    KVSV_NAME(kvPropSession_IntfCANTcvrState),
    KVSV_NAME(kvPropSession_IntfCANTcvrType),
    KVSV_NAME(kvPropSession_IntfFlexRayAccStartRng),
    KVSV_NAME(kvPropSession_IntfFlexRayAlwHltClk),
    KVSV_NAME(kvPropSession_IntfFlexRayAlwPassAct),
    KVSV_NAME(kvPropSession_IntfFlexRayClstDriftDmp),
    KVSV_NAME(kvPropSession_IntfFlexRayColdstart),
    KVSV_NAME(kvPropSession_IntfFlexRayDecCorr),
    KVSV_NAME(kvPropSession_IntfFlexRayDelayCompA),
    KVSV_NAME(kvPropSession_IntfFlexRayDelayCompB),
    KVSV_NAME(kvPropSession_IntfFlexRayKeySlotID),
    KVSV_NAME(kvPropSession_IntfCanTxIoMode),
    KVSV_NAME(kvPropSession_IntfFlexRayAutoAslpWhnStp),
    KVSV_NAME(kvPropSession_IntfFlexRaySleep),
    KVSV_NAME(kvPropSession_IntfFlexRayConnectedChs),
    KVSV_NAME(kvPropSession_IntfFlexRaySymToInStrm),
    KVSV_NAME(kvPropSession_IntfCanFdIsoMode),
    KVSV_NAME(kvPropSession_IntfFlexRayLatestTx),
    KVSV_NAME(kvPropSession_IntfFlexRayListTimo),
    KVSV_NAME(kvPropSession_IntfFlexRayMacInitOffA),
    KVSV_NAME(kvPropSession_IntfFlexRayMacInitOffB),
    KVSV_NAME(kvPropSession_IntfFlexRayMicInitOffA),
    KVSV_NAME(kvPropSession_IntfFlexRayMicInitOffB),
    KVSV_NAME(kvPropSession_IntfFlexRayMaxDrift),
    KVSV_NAME(kvPropSession_IntfFlexRayMicrotick),
    KVSV_NAME(kvPropSession_IntfFlexRayNullToInStrm),
    KVSV_NAME(kvPropSession_IntfFlexRayOffCorrOut),
    KVSV_NAME(kvPropSession_IntfFlexRayRateCorrOut),
    KVSV_NAME(kvPropSession_IntfFlexRaySampPerMicro),
    KVSV_NAME(kvPropSession_IntfFlexRaySingSlotEn),
    KVSV_NAME(kvPropSession_IntfFlexRayWakeupCh),
    KVSV_NAME(kvPropSession_IntfFlexRayWakeupPtrn),
    KVSV_NAME(kvPropSession_IntfFlexRayTerm),
    KVSV_NAME(kvPropSession_IntfFlexRayOffCorr),
    KVSV_NAME(kvPropSession_IntfFlexRayRateCorr),
    KVSV_NAME(kvPropSession_IntfFlexRayStatisticsEn),
    KVSV_NAME(kvPropSession_IntfFlexRaySyncChAEven),
    KVSV_NAME(kvPropSession_IntfFlexRaySyncChAOdd),
    KVSV_NAME(kvPropSession_IntfFlexRaySyncChBEven),
    KVSV_NAME(kvPropSession_IntfFlexRaySyncChBOdd),
    KVSV_NAME(kvPropSession_IntfFlexRaySyncStatus),
    KVSV_NAME(kvPropSession_IntfLINBreakLength),
    KVSV_NAME(kvPropSession_IntfLINMaster),
    KVSV_NAME(kvPropSession_IntfLINSleep),
    KVSV_NAME(kvPropSession_IntfLINTerm),
    KVSV_NAME(kvPropSession_IntfLINSchedNames),
    KVSV_NAME(kvPropSession_IntfLINDiagSTmin),
    KVSV_NAME(kvPropSession_IntfLINDiagP2min),
    KVSV_NAME(kvPropSession_IntfLINAlwStartWoBusPwr),
    KVSV_NAME(kvPropSession_IntfLINOStrSlvRspLstByNAD),
    KVSV_NAME(kvPropSession_IntfLINNoResponseToInStrm),
    KVSV_NAME(kvPropSessionSub_CANStartTimeOff),
    KVSV_NAME(kvPropSession_IntfLINChecksumToInStrm),
    KVSV_NAME(kvPropSessionSub_CANTxTime),
    KVSV_NAME(kvPropSessionSub_SkipNCyclicFrames),
    KVSV_NAME(kvPropSessionSub_OutputQueueUpdateFreq),
    KVSV_NAME(kvPropSessionSub_LINTxNCorruptedChksums),
    KVSV_NAME(kvPropSessionSub_J1939_AddrFilter),
    KVSV_NAME(kvPropSession_IntfSrcTermStartTrigger),
    KVSV_NAME(kvPropSession_ApplicationProtocol),
    KVSV_NAME(kvPropSession_J1939Address),
    KVSV_NAME(kvPropSession_J1939ECU),
    KVSV_NAME(kvPropSession_J1939Name),
    KVSV_NAME(kvPropSession_J1939TimeoutT1),
    KVSV_NAME(kvPropSession_J1939TimeoutT2),
    KVSV_NAME(kvPropSession_J1939TimeoutT3),
    KVSV_NAME(kvPropSession_J1939TimeoutT4),
    KVSV_NAME(kvPropSession_J1939ResponseTimeTrSD),
    KVSV_NAME(kvPropSession_J1939ResponseTimeTrGD),
    KVSV_NAME(kvPropSession_J1939HoldTimeTh),
    KVSV_NAME(kvPropSession_J1939NumPacketsRecv),
    KVSV_NAME(kvPropSession_J1939NumPacketsResp),
    KVSV_NAME(kvPropSession_J1939MaxRepeatCTS),
    KVSV_NAME(kvPropSession_J1939FillByte),
    KVSV_NAME(kvPropSession_J1939WriteQueueSize),
    KVSV_NAME(kvPropSession_J1939ECUBusy),
    KVSV_NAME(kvPropSession_IntfCanEdgeFilter),
    KVSV_NAME(kvPropSession_IntfCanTransmitPause),
    KVSV_NAME(kvPropSession_IntfCanDisableProtExceptionHandling),
    KVSV_NAME(kvPropSession_J1939IncludeDestAddrInPGN),
    KVSV_NAME(kvPropSession_IntfEnetPortMode),
    KVSV_NAME(kvPropSession_IntfEnetPhyState),
    KVSV_NAME(kvPropSession_IntfEnetMacAddress),
    KVSV_NAME(kvPropSession_EnetSourceMacAddressAuto),
    KVSV_NAME(kvPropSession_IntfEnetOperationalStatus),
    KVSV_NAME(kvPropSession_IntfEnetAdjustLocalTime),
    KVSV_NAME(kvPropSession_IntfEnetStatsCounterNames),
    KVSV_NAME(kvPropSession_IntfEnetStatsCounterValues),
    KVSV_NAME(kvPropSession_IntfEnetStatsRxBytes),
    KVSV_NAME(kvPropSession_IntfEnetStatsRxGoodFrames),
    KVSV_NAME(kvPropSession_IntfEnetStatsRxBadFrames),
    KVSV_NAME(kvPropSession_IntfEnetStatsTxBytes),
    KVSV_NAME(kvPropSession_IntfEnetStatsTxGoodFrames),
    KVSV_NAME(kvPropSession_EnetLogMode),
    KVSV_NAME(kvPropSession_EnetLogFile),
    KVSV_NAME(kvPropSession_EnetLogOperation),
    KVSV_NAME(kvPropSession_IntfEnetEptReceiveFilter),
    KVSV_NAME(kvPropSession_IntfEnetEptTransmitBandwidth),
    KVSV_NAME(kvPropSession_IntfEnetTimeProtocol),
    KVSV_NAME(kvPropSession_IntfEnetTimeProtocolEnabled),
    KVSV_NAME(kvPropSession_IntfEnetTimeBMCAEnabled),
    KVSV_NAME(kvPropSession_IntfEnetTimeOffsetFromMaster),
    KVSV_NAME(kvPropSession_IntfEnetTimeClkID),
    KVSV_NAME(kvPropSession_IntfEnetTimeClkClass),
    KVSV_NAME(kvPropSession_IntfEnetTimeClkAccuracy),
    KVSV_NAME(kvPropSession_IntfEnetTimeClkOffsetVar),
    KVSV_NAME(kvPropSession_IntfEnetTimePriority1),
    KVSV_NAME(kvPropSession_IntfEnetTimePriority2),
    KVSV_NAME(kvPropSession_IntfEnetTimeStepsToGM),
    KVSV_NAME(kvPropSession_IntfEnetTimeGMClkID),
    KVSV_NAME(kvPropSession_IntfEnetTimeGMClkClass),
    KVSV_NAME(kvPropSession_IntfEnetTimeGMClkAccuracy),
    KVSV_NAME(kvPropSession_IntfEnetTimeGMClkOffsetVar),
    KVSV_NAME(kvPropSession_IntfEnetTimeGMPriority1),
    KVSV_NAME(kvPropSession_IntfEnetTimeGMPriority2),
    KVSV_NAME(kvPropSession_IntfEnetTimeAdjustNetworkTime),
    KVSV_NAME(kvPropSession_IntfEnetTimePortStateConfigured),
    KVSV_NAME(kvPropSession_IntfEnetTimePortState),
    KVSV_NAME(kvPropSession_IntfEnetTimePortPropDelay),
    KVSV_NAME(kvPropSession_IntfEnetTimePortPropDelayConfigured),
    KVSV_NAME(kvPropSession_IntfEnetTimePortPropDelayThreshold),
    KVSV_NAME(kvPropSession_IntfEnetTimePortPdelayEnabled),
    KVSV_NAME(kvPropSession_IntfEnetTimePortLogPdelayIntervalConfigured),
    KVSV_NAME(kvPropSession_IntfEnetTimePortLogPdelayInterval),
    KVSV_NAME(kvPropSession_IntfEnetTimePortLogSyncIntervalConfigured),
    KVSV_NAME(kvPropSession_IntfEnetTimePortLogSyncInterval),
    KVSV_NAME(kvPropSession_IntfEnetTimePortSyncReceiptTimeout),
    KVSV_NAME(kvPropSession_IntfEnetTimePortLogAnnounceIntervalConfigured),
    KVSV_NAME(kvPropSession_IntfEnetTimePortLogAnnounceInterval),
    KVSV_NAME(kvPropSession_IntfEnetTimePortAnnounceTransmitEnabled),
    KVSV_NAME(kvPropSession_IntfEnetTimePortAnnounceReceiptTimeout),
    KVSV_NAME(kvPropSession_IntfEnetTimePortASCapable),
    KVSV_NAME(kvPropSession_IntfEnetTimePortSynced),
    KVSV_NAME(kvPropSession_IntfEnetTimePortStatsCounterNames),
    KVSV_NAME(kvPropSession_IntfEnetTimePortStatsCounterValues),
    KVSV_NAME(kvPropSession_IntfEnetTimePortStatsRxSync),
    KVSV_NAME(kvPropSession_IntfEnetTimePortStatsRxAnnounce),
    KVSV_NAME(kvPropSession_IntfEnetTimePortStatsRxPdelayRequest),
    KVSV_NAME(kvPropSession_IntfEnetTimePortStatsTxSync),
    KVSV_NAME(kvPropSession_IntfEnetTimePortStatsTxAnnounce),
    KVSV_NAME(kvPropSession_IntfEnetTimePortStatsTxPdelayRequest),
    KVSV_NAME(kvPropSession_IntfEnetIpV4Address),
    KVSV_NAME(kvPropSession_IntfEnetOsNetworkAdapterName),
    KVSV_NAME(kvPropSession_IntfEnetOsNetworkAdapterDescription),
    KVSV_NAME(kvPropSession_IntfEnetSleepState),
    KVSV_NAME(kvPropSession_EnetNumFramesReceived),
    KVSV_NAME(kvPropSession_IntfCustCodeFile),
    KVSV_NAME(kvPropSession_IntfCustCodeData),
    KVSV_NAME(kvPropSessionSub_CustCodeData),
};

// System (class 0x11).
constexpr tNamedId kSystem[] = {
    KVSV_NAME(kvPropSys_IntfRefsEthernet), KVSV_NAME(kvPropSys_DevRefs),
    KVSV_NAME(kvPropSys_IntfRefs),         KVSV_NAME(kvPropSys_IntfRefsCAN),
    KVSV_NAME(kvPropSys_IntfRefsFlexRay),  KVSV_NAME(kvPropSys_VerBuild),
    KVSV_NAME(kvPropSys_IntfRefsLIN),      KVSV_NAME(kvPropSys_VerMajor),
    KVSV_NAME(kvPropSys_VerMinor),         KVSV_NAME(kvPropSys_VerPhase),
    KVSV_NAME(kvPropSys_VerUpdate),        KVSV_NAME(kvPropSys_QBOXPktTime),
    KVSV_NAME(kvPropSys_IntfRefsAll),
};

// Device (class 0x12).
constexpr tNamedId kDevice[] = {
    KVSV_NAME(kvPropDev_FormFac),     KVSV_NAME(kvPropDev_IntfRefs),
    KVSV_NAME(kvPropDev_Name),        KVSV_NAME(kvPropDev_NumPorts),
    KVSV_NAME(kvPropDev_SerNum),      KVSV_NAME(kvPropDev_SlotNum),
    KVSV_NAME(kvPropDev_NumPortsAll), KVSV_NAME(kvPropDev_ProductNum),
    KVSV_NAME(kvPropDev_IntfRefsAll),
};

// Interface (class 0x13).
constexpr tNamedId kInterface[] = {
    KVSV_NAME(kvPropIntf_DevRef),
    KVSV_NAME(kvPropIntf_Name),
    KVSV_NAME(kvPropIntf_Num),
    KVSV_NAME(kvPropIntf_PortNum),
    KVSV_NAME(kvPropIntf_Protocol),
    KVSV_NAME(kvPropIntf_CANTcvrCap),
    KVSV_NAME(kvPropIntf_CANTermCap),
    KVSV_NAME(kvPropIntf_DongleState),
    KVSV_NAME(kvPropIntf_DongleID),
    KVSV_NAME(kvPropIntf_DongleRevision),
    KVSV_NAME(kvPropIntf_DongleFirmwareVersion),
    KVSV_NAME(kvPropIntf_DongleCompatibleRevision),
    KVSV_NAME(kvPropIntf_DongleCompatibleFirmwareVersion),
};

#undef KVSV_NAME

struct tClassRow {
  const tNamedId *first;
  size_t count;
};

template <size_t N>
constexpr tClassRow Row(const tNamedId (&names)[N]) {
  return tClassRow{names, N};
}

// Indexed by the class field; a class without names has an empty row.
constexpr uint32_t kClassCount = 0x14;
constexpr tClassRow kClasses[kClassCount] = {
    Row(kDatabase),
    Row(kCluster),
    Row(kFrame),
    Row(kSignal),
    Row(kSubframe),
    Row(kEcu),
    Row(kLinSchedule),
    Row(kLinScheduleEntry),
    Row(kPdu),
    {},
    {},
    {},
    {},
    {},
    {},
    {},
    Row(kSession),
    Row(kSystem),
    Row(kDevice),
    Row(kInterface),
};

// The binary search needs every row strictly ordered and holding only its own class.
constexpr bool RowsAreOrdered() {
  for (uint32_t c = 0; c < kClassCount; ++c) {
    const tClassRow &row = kClasses[c];
    for (size_t i = 0; i < row.count; ++i) {
      if (((row.first[i].id >> 16) & 0xFFu) != c) return false;
      if (i > 0 && OrderKey(row.first[i - 1].id) >= OrderKey(row.first[i].id)) return false;
    }
  }
  return true;
}
static_assert(RowsAreOrdered(), "a class row is out of order or holds another class");

constexpr size_t NamedCount() {
  size_t total = 0;
  for (const tClassRow &row : kClasses) total += row.count;
  return total;
}
static_assert(NamedCount() == 382, "the table names 382 identifiers");

}  // namespace

const char *PropertyIdToName(uint32_t id) {
  const uint32_t classField = (id >> 16) & 0xFFu;
  if (classField >= kClassCount) return nullptr;
  const tClassRow &row = kClasses[classField];
  const tNamedId *last = row.first + row.count;
  const uint32_t key = OrderKey(id);
  const tNamedId *found = std::lower_bound(
      row.first, last, key,
      [](const tNamedId &entry, uint32_t wanted) { return OrderKey(entry.id) < wanted; });
  return found != last && found->id == id ? found->name : nullptr;
}

}  // namespace nKVSVAPI100
