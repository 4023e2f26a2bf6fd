#include "known_states.h"

#include "inventory.h"
#include "kvsim.h"
#include "kvsvplatform.h"

namespace nKvorSim {

namespace {

struct KnownState {
  uint32_t id;
  uint32_t size;
  bool ethernetOnly;
};

constexpr KnownState kStates[] = {
    {kvState_CANComm, 4, false},
    {kvState_FlexRayComm, 4, false},
    {kvState_LINComm, 8, false},
    {kvState_J1939Comm, 16, false},
    {kvState_FlexRayStats, 24, false},
    {kvState_TimeCurrent, 8, false},
    {kvState_TimeStart, 8, false},
    {kvState_TimeComm, 8, false},
    {kvState_TimeCurrentLong, kTimeRecordSize, true},
    {kvState_TimeStartLong, kTimeRecordSize, true},
    {kvState_TimeCommLong, kTimeRecordSize, true},
};

}  // namespace

Status CheckStateRead(uint32_t protocol, uint32_t stateId, uint32_t size) {
  for (const KnownState &state : kStates) {
    if (state.id != stateId) continue;
    if (state.ethernetOnly && protocol != kProtocolEthernet) return kvsimErrWrongProtocol;
    return size == state.size ? 0 : kvsimErrInvalidArgument;
  }
  return kvsimErrUnknownState;
}

}  // namespace nKvorSim
