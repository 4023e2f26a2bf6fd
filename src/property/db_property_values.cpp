// kvsvdbGetProp and kvsvdbSetProp of the values that travel as bytes: U32, U64, F64, Bool, the U8
// and U32 arrays, text and arrays of text. One template per shape over the driver's database calls,
// the same size protocol and empty-source rule as the session family.
#include <cstdint>

#include "core/status.h"
#include "kvsvapi.h"
#include "property/annotate_property_status.h"
#include "property/property_value_io.h"

using namespace nKVSVAPI100;

namespace {

constexpr uint32_t kNoStringArraySetterLine = 1439;

template <class tValue>
Status GetScalar(uint32_t object, uint32_t id, tValue *value, SvHandle *info) {
  return AnnotatedStatus(tDbPropertyCalls::Get(object, id, sizeof(tValue), value), id, info);
}

template <class tValue>
Status SetScalar(uint32_t object, uint32_t id, const tValue *value, SvHandle *info) {
  return AnnotatedStatus(tDbPropertyCalls::Set(object, id, sizeof(tValue), value), id, info);
}

template <class tElement>
Status GetArray(uint32_t object, uint32_t id, SvHandle *value, SvHandle *info) {
  return AnnotatedStatus(ReadArrayProperty<tDbPropertyCalls, tElement>(object, id, value), id,
                         info);
}

template <class tElement>
Status SetArray(uint32_t object, uint32_t id, const SvHandle *value, SvHandle *info) {
  const tPropertySource source = ArraySource<tElement>(value);
  return AnnotatedStatus(tDbPropertyCalls::Set(object, id, source.size, source.buffer), id, info);
}

// Database texts are counted by the driver's size less its NUL, whatever the read gave: the
// handle always holds that many bytes, so the count never reaches past its block.
Status ReadText(uint32_t object, uint32_t id, SvHandle *value) {
  return ReadSizedIntoHandle<tDbPropertyCalls>(
      object, id, value, kStringSlack, [value](Status, uint32_t size) {
        static_cast<SvStr *>(**value)->cnt = size == 0 ? 0 : static_cast<int32_t>(size - 1);
      });
}

Status WriteText(uint32_t object, uint32_t id, const SvHandle *value) {
  const cTextSource text(value);
  if (text.status() < 0) return text.status();
  return tDbPropertyCalls::Set(object, id, text.source().size, text.source().buffer);
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvdbGetPropU32(uint32_t object, uint32_t id, uint32_t *value,
                                                   SvHandle *info) {
  return GetScalar(object, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvdbSetPropU32(uint32_t object, uint32_t id,
                                                   const uint32_t *value, SvHandle *info) {
  return SetScalar(object, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbGetPropU64(uint32_t object, uint32_t id, uint64_t *value,
                                                   SvHandle *info) {
  return GetScalar(object, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvdbSetPropU64(uint32_t object, uint32_t id,
                                                   const uint64_t *value, SvHandle *info) {
  return SetScalar(object, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbGetPropF64(uint32_t object, uint32_t id, double *value,
                                                   SvHandle *info) {
  return GetScalar(object, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvdbSetPropF64(uint32_t object, uint32_t id,
                                                   const double *value, SvHandle *info) {
  return SetScalar(object, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbGetPropBool(uint32_t object, uint32_t id, uint8_t *value,
                                                    SvHandle *info) {
  return GetScalar(object, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvdbSetPropBool(uint32_t object, uint32_t id,
                                                    const uint8_t *value, SvHandle *info) {
  return SetScalar(object, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbGetPropU8_1D(uint32_t object, uint32_t id, SvHandle *value,
                                                     SvHandle *info) {
  return GetArray<uint8_t>(object, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvdbSetPropU8_1D(uint32_t object, uint32_t id, SvHandle *value,
                                                     SvHandle *info) {
  return SetArray<uint8_t>(object, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbGetPropU32_1D(uint32_t object, uint32_t id, SvHandle *value,
                                                      SvHandle *info) {
  return GetArray<uint32_t>(object, id, value, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvdbSetPropU32_1D(uint32_t object, uint32_t id, SvHandle *value,
                                                      SvHandle *info) {
  return SetArray<uint32_t>(object, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbGetPropString(uint32_t object, uint32_t id, SvHandle *value,
                                                      SvHandle *info) {
  return AnnotatedStatus(ReadText(object, id, value), id, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvdbSetPropString(uint32_t object, uint32_t id, SvHandle *value,
                                                      SvHandle *info) {
  return AnnotatedStatus(WriteText(object, id, value), id, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbGetPropString1D(uint32_t object, uint32_t id,
                                                        SvHandle *value, SvHandle *info) {
  return AnnotatedStatus(ReadCommaListProperty<tDbPropertyCalls>(object, id, value), id, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvdbSetPropString1D(uint32_t, uint32_t id, SvHandle *,
                                                        SvHandle *info) {
  return ReportMissingSetter(nFile::kDatabaseProperties, kNoStringArraySetterLine, id, info);
}
