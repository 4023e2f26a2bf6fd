// kvsvSessionGetProp and kvsvSessionSetProp of single values: U8, U32, U64, F64, Bool and Time,
// each with its Ex form. None of them allocates.
#include <cstdint>
#include <iterator>

#include "core/timestamps.h"
#include "kvorproperties.h"
#include "kvsvapi.h"
#include "property/session_property_call.h"
#include "session/kvorutility.h"

using namespace nKVSVAPI100;

namespace {

// Setters that the family refuses, by the line they report.
constexpr uint32_t kNoTimeSetterLine = 1717;

// Identifiers written per list entry.
constexpr uint32_t kU32SubIds[] = {kvPropSessionSub_SkipNCyclicFrames,
                                   kvPropSessionSub_OutputQueueUpdateFreq,
                                   kvPropSessionSub_LINTxNCorruptedChksums, kvPropHidden_FrameSub};
constexpr uint32_t kF64SubIds[] = {kvPropSessionSub_CANStartTimeOff, kvPropSessionSub_CANTxTime};
constexpr tSubPropertyIds kNoSubIds{nullptr, 0};

// The driver keeps these bytes in 32-bit words.
bool IsWideByte(uint32_t id) {
  return id == kvPropSession_J1939Address || id == kvPropSession_J1939FillByte;
}

template <class tValue>
Status GetScalar(uint32_t session, uint32_t id, tValue *value, SvHandle *info) {
  return RunSessionPropertyCall(session, id, info, [&](uint32_t handle) {
    return tSessionPropertyCalls::Get(handle, id, sizeof(tValue), value);
  });
}

template <class tValue>
Status SetScalar(uint32_t session, const SvHandle *subId, uint32_t id, const tValue *value,
                 SvHandle *info, tSubPropertyIds subIds) {
  return RunSessionPropertyCall(session, id, info, [&](uint32_t handle) {
    return SetSessionPropertyValue(handle, subId, id, {sizeof(tValue), value}, subIds);
  });
}

Status GetU8(uint32_t session, uint32_t id, uint8_t *value, SvHandle *info) {
  if (!IsWideByte(id)) return GetScalar(session, id, value, info);
  return RunSessionPropertyCall(session, id, info, [&](uint32_t handle) -> Status {
    if (value == nullptr) return kvErrNullArgument;
    uint32_t wide = 0;
    const Status status = tSessionPropertyCalls::Get(handle, id, sizeof wide, &wide);
    *value = static_cast<uint8_t>(wide);
    return status;
  });
}

Status SetU8(uint32_t session, uint32_t id, const uint8_t *value, SvHandle *info) {
  return RunSessionPropertyCall(session, id, info, [&](uint32_t handle) -> Status {
    // Other bytes go to the driver as 32-bit words read straight from the caller's pointer.
    if (!IsWideByte(id)) return tSessionPropertyCalls::Set(handle, id, sizeof(uint32_t), value);
    if (value == nullptr) return kvErrNullArgument;
    const uint32_t wide = *value;
    return tSessionPropertyCalls::Set(handle, id, sizeof wide, &wide);
  });
}

Status SetU32(uint32_t session, const SvHandle *subId, uint32_t id, const uint32_t *value,
              SvHandle *info) {
  if (id != kvPropHidden_ReportImplicitClose)
    return SetScalar(session, subId, id, value, info, {kU32SubIds, std::size(kU32SubIds)});
  // The library's own switch: it never reaches the driver.
  return RunSessionPropertyCall(session, id, info, [&](uint32_t) -> Status {
    if (value == nullptr) return kvErrNullArgument;
    gReportImplicitClose.store(*value, std::memory_order_relaxed);
    return 0;
  });
}

Status GetTime(uint32_t session, uint32_t id, SvTime *value, SvHandle *info) {
  return RunSessionPropertyCall(session, id, info, [&](uint32_t handle) -> Status {
    if (value == nullptr) return kvErrNullArgument;
    uint64_t raw = 0;
    const Status status = tSessionPropertyCalls::Get(handle, id, sizeof raw, &raw);
    RawTimeToSvTime(value, &raw);
    return status;
  });
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropExU8(uint32_t session, SvHandle *, uint32_t id,
                                                         uint8_t *value, SvHandle *info) {
  return GetU8(session, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropU8(uint32_t session, uint32_t id,
                                                       uint8_t *value, SvHandle *info) {
  return kvsvSessionGetPropExU8(session, nullptr, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropExU8(uint32_t session, SvHandle *, uint32_t id,
                                                         const uint8_t *value, SvHandle *info) {
  return SetU8(session, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropU8(uint32_t session, uint32_t id,
                                                       const uint8_t *value, SvHandle *info) {
  return kvsvSessionSetPropExU8(session, nullptr, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropExU32(uint32_t session, SvHandle *, uint32_t id,
                                                          uint32_t *value, SvHandle *info) {
  return GetScalar(session, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropU32(uint32_t session, uint32_t id,
                                                        uint32_t *value, SvHandle *info) {
  return kvsvSessionGetPropExU32(session, nullptr, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropExU32(uint32_t session, SvHandle *subId,
                                                          uint32_t id, const uint32_t *value,
                                                          SvHandle *info) {
  return SetU32(session, subId, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropU32(uint32_t session, uint32_t id,
                                                        const uint32_t *value, SvHandle *info) {
  return kvsvSessionSetPropExU32(session, nullptr, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropExU64(uint32_t session, SvHandle *, uint32_t id,
                                                          uint64_t *value, SvHandle *info) {
  return GetScalar(session, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropU64(uint32_t session, uint32_t id,
                                                        uint64_t *value, SvHandle *info) {
  return kvsvSessionGetPropExU64(session, nullptr, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropExU64(uint32_t session, SvHandle *subId,
                                                          uint32_t id, const uint64_t *value,
                                                          SvHandle *info) {
  return SetScalar(session, subId, id, value, info, kNoSubIds);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropU64(uint32_t session, uint32_t id,
                                                        const uint64_t *value, SvHandle *info) {
  return kvsvSessionSetPropExU64(session, nullptr, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropExF64(uint32_t session, SvHandle *, uint32_t id,
                                                          double *value, SvHandle *info) {
  return GetScalar(session, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropF64(uint32_t session, uint32_t id,
                                                        double *value, SvHandle *info) {
  return kvsvSessionGetPropExF64(session, nullptr, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropExF64(uint32_t session, SvHandle *subId,
                                                          uint32_t id, const double *value,
                                                          SvHandle *info) {
  return SetScalar(session, subId, id, value, info, {kF64SubIds, std::size(kF64SubIds)});
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropF64(uint32_t session, uint32_t id,
                                                        const double *value, SvHandle *info) {
  return kvsvSessionSetPropExF64(session, nullptr, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropExBool(uint32_t session, SvHandle *,
                                                           uint32_t id, uint8_t *value,
                                                           SvHandle *info) {
  return GetScalar(session, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropBool(uint32_t session, uint32_t id,
                                                         uint8_t *value, SvHandle *info) {
  return kvsvSessionGetPropExBool(session, nullptr, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropExBool(uint32_t session, SvHandle *subId,
                                                           uint32_t id, const uint8_t *value,
                                                           SvHandle *info) {
  return SetScalar(session, subId, id, value, info, kNoSubIds);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropBool(uint32_t session, uint32_t id,
                                                         const uint8_t *value, SvHandle *info) {
  return kvsvSessionSetPropExBool(session, nullptr, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropExTime(uint32_t session, SvHandle *,
                                                           uint32_t id, SvTime *value,
                                                           SvHandle *info) {
  return GetTime(session, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropTime(uint32_t session, uint32_t id,
                                                         SvTime *value, SvHandle *info) {
  return kvsvSessionGetPropExTime(session, nullptr, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropExTime(uint32_t, SvHandle *, uint32_t id,
                                                           const SvTime *, SvHandle *info) {
  return ReportMissingSetter(nFile::kSessionOpenClose, kNoTimeSetterLine, id, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropTime(uint32_t session, uint32_t id,
                                                         const SvTime *value, SvHandle *info) {
  return kvsvSessionSetPropExTime(session, nullptr, id, value, info);
}
