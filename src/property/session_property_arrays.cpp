// kvsvSessionGetProp and kvsvSessionSetProp of number arrays: U8_1D, U16_1D and U32_1D. Reads
// follow the size protocol; writes send the host array in place.
#include <cstdint>
#include <iterator>

#include "kvorproperties.h"
#include "kvsvapi.h"
#include "property/session_property_call.h"

using namespace nKVSVAPI100;

namespace {

constexpr uint32_t kArraySubIds[] = {kvPropSessionSub_CustCodeData};

template <class tElement>
Status GetArray(uint32_t session, uint32_t id, SvHandle *value, SvHandle *info) {
  return RunSessionPropertyCall(session, id, info, [&](uint32_t handle) {
    return ReadArrayProperty<tSessionPropertyCalls, tElement>(handle, id, value);
  });
}

template <class tElement>
Status SetArray(uint32_t session, const SvHandle *subId, uint32_t id, const SvHandle *value,
                SvHandle *info) {
  return RunSessionPropertyCall(session, id, info, [&](uint32_t handle) {
    return SetSessionPropertyValue(handle, subId, id, ArraySource<tElement>(value),
                                   {kArraySubIds, std::size(kArraySubIds)});
  });
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropExU8_1D(uint32_t session, SvHandle *,
                                                            uint32_t id, SvHandle *value,
                                                            SvHandle *info) {
  return GetArray<uint8_t>(session, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropExU8_1D(uint32_t session, SvHandle *subId,
                                                            uint32_t id, SvHandle *value,
                                                            SvHandle *info) {
  return SetArray<uint8_t>(session, subId, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropExU16_1D(uint32_t session, SvHandle *,
                                                             uint32_t id, SvHandle *value,
                                                             SvHandle *info) {
  return GetArray<uint16_t>(session, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropExU16_1D(uint32_t session, SvHandle *subId,
                                                             uint32_t id, SvHandle *value,
                                                             SvHandle *info) {
  return SetArray<uint16_t>(session, subId, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropExU32_1D(uint32_t session, SvHandle *,
                                                             uint32_t id, SvHandle *value,
                                                             SvHandle *info) {
  return GetArray<uint32_t>(session, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropU32_1D(uint32_t session, uint32_t id,
                                                           SvHandle *value, SvHandle *info) {
  return kvsvSessionGetPropExU32_1D(session, nullptr, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropExU32_1D(uint32_t session, SvHandle *subId,
                                                             uint32_t id, SvHandle *value,
                                                             SvHandle *info) {
  return SetArray<uint32_t>(session, subId, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropU32_1D(uint32_t session, uint32_t id,
                                                           SvHandle *value, SvHandle *info) {
  return kvsvSessionSetPropExU32_1D(session, nullptr, id, value, info);
}
