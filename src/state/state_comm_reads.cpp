// kvsvReadStateCANComm, LINComm, FlexRayComm, J1939Comm: one driver read of a packed state, then
// its fields spread over the bytes of the host's cluster.
#include <cstddef>
#include <cstring>

#include "core/status.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"

using namespace nKVSVAPI100;

namespace {

// The largest packed state, the J1939 record.
constexpr uint32_t kLongestState = 16;

// One byte of a cluster: a field of a 32-bit word of the state, shifted down and masked.
struct tBitField {
  uint8_t offset;
  uint8_t word;
  uint8_t shift;
  uint8_t mask;
};

constexpr tBitField kCanFields[] = {
    {5, 0, 0, 0x0F},  {6, 0, 8, 0x0F}, {7, 0, 24, 0xFF},
    {8, 0, 16, 0xFF}, {9, 0, 4, 0x01}, {10, 0, 5, 0x01},
};

constexpr tBitField kLinFields[] = {
    {5, 0, 2, 0x03},  {6, 0, 4, 0x0F},  {7, 0, 8, 0xFF},   {8, 0, 16, 0xFF},
    {9, 0, 24, 0x3F}, {10, 0, 1, 0x01}, {11, 0, 31, 0x01}, {12, 1, 0, 0xFF},
};

constexpr tBitField kFlexRayFields[] = {
    {5, 0, 0, 0x0F}, {6, 0, 4, 0x0F}, {7, 0, 8, 0x1F}, {8, 0, 13, 0x01}, {9, 0, 14, 0x01},
};

template <size_t N>
void UnpackBitFields(const tBitField (&fields)[N], const uint8_t *state, uint8_t *cluster) {
  for (const tBitField &field : fields) {
    uint32_t word = 0;
    std::memcpy(&word, state + field.word * sizeof word, sizeof word);
    cluster[field.offset] = static_cast<uint8_t>((word >> field.shift) & field.mask);
  }
}

void UnpackCan(const uint8_t *state, uint8_t *cluster) {
  UnpackBitFields(kCanFields, state, cluster);
}

void UnpackLin(const uint8_t *state, uint8_t *cluster) {
  UnpackBitFields(kLinFields, state, cluster);
}

void UnpackFlexRay(const uint8_t *state, uint8_t *cluster) {
  UnpackBitFields(kFlexRayFields, state, cluster);
}

// The first word at byte 8 and the next four bytes one by one behind it: both keep the record's
// byte order, so a copy does both. The second half of the record is not shown.
void UnpackJ1939(const uint8_t *state, uint8_t *cluster) { std::memcpy(cluster + 8, state, 8); }

using tUnpack = void (*)(const uint8_t *state, uint8_t *cluster);

Status ReadCommState(uint32_t session, uint32_t stateId, uint32_t size, tUnpack unpack,
                     void *cluster) {
  if (cluster == nullptr) return kvErrNullArgument;
  uint8_t state[kLongestState] = {};
  uint32_t fault = 0;
  const Status status = kvReadState(session, stateId, size, state, &fault);
  // Unpacked whatever the status: the host program looks at the status before the cluster.
  auto *bytes = static_cast<uint8_t *>(cluster);
  std::memcpy(bytes, &fault, sizeof fault);
  bytes[4] = fault != 0 ? 1 : 0;
  unpack(state, bytes);
  return status;
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvReadStateCANComm(uint32_t session, void *cluster) {
  return ReadCommState(session, kvState_CANComm, 4, UnpackCan, cluster);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvReadStateLINComm(uint32_t session, void *cluster) {
  return ReadCommState(session, kvState_LINComm, 8, UnpackLin, cluster);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvReadStateFlexRayComm(uint32_t session, void *cluster) {
  return ReadCommState(session, kvState_FlexRayComm, 4, UnpackFlexRay, cluster);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvReadStateJ1939Comm(uint32_t session, void *cluster) {
  return ReadCommState(session, kvState_J1939Comm, kLongestState, UnpackJ1939, cluster);
}
