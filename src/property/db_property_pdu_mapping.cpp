// kvsvdbGetPropPDU_Mapping and kvsvdbSetPropPDU_Mapping: a frame's PDUs with their start and
// update bits, which the driver keeps as three parallel properties, as one host array of
// clusters.
#include <algorithm>
#include <boost/noncopyable.hpp>
#include <cstddef>
#include <cstdint>

#include "core/host_handles.h"
#include "core/internal_error.h"
#include "core/status.h"
#include "kvorproperties.h"
#include "kvsvapi.h"
#include "property/annotate_property_status.h"
#include "property/property_value_io.h"

using namespace nKVSVAPI100;

namespace {

constexpr uint32_t kLineGetNotMapping = 1909;
constexpr uint32_t kLineSetNotMapping = 2029;

// One element of the host's array; the array's count is at byte 0, its elements from byte 8.
struct tPduMapping {
  SvHandle pdu;  // reference text of the PDU
  uint32_t startBit;
  uint32_t updateBit;
};
static_assert(sizeof(tPduMapping) == 16, "the host lays out 16-byte elements");
static_assert(offsetof(tPduMapping, pdu) == 0, "PDU reference first");
static_assert(offsetof(tPduMapping, startBit) == 8, "start bit behind the reference");
static_assert(offsetof(tPduMapping, updateBit) == 12, "update bit last");
constexpr size_t kClusterArrayHeader = 8;

constexpr uint32_t kParts[] = {kvPropFrm_PDURefs, kvPropFrm_PDUStartBits, kvPropFrm_PDUUpdateBits};

tPduMapping *Elements(SvHandle array) {
  return reinterpret_cast<tPduMapping *>(static_cast<char *>(*array) + kClusterArrayHeader);
}

uint32_t *Numbers(SvHandle array) {
  return reinterpret_cast<uint32_t *>(static_cast<char *>(*array) + kHostCountBytes);
}

int32_t CountOf(SvHandle array) { return array != nullptr ? ArrayCount(array) : 0; }

// The three arrays of one call, the library's own; the strings of the reference array are ours
// only when we read them.
class cMappingParts : boost::noncopyable {
 public:
  explicit cMappingParts(bool ownStrings) : ownStrings_(ownStrings) {}
  ~cMappingParts() {
    if (ownStrings_)
      DisposeHandleArray(&refs);
    else
      DisposeHandle(&refs);
    DisposeHandle(&starts);
    DisposeHandle(&updates);
  }

  SvHandle refs = nullptr, starts = nullptr, updates = nullptr;

 private:
  const bool ownStrings_;
};

// Elements that the new length drops lose their block at the resize: their strings go first.
void DisposeDroppedStrings(SvHandle array, int32_t length) {
  if (array == nullptr || *array == nullptr) return;
  for (int32_t i = length; i < ArrayCount(array); ++i) DisposeHandle(&Elements(array)[i].pdu);
}

Status ReadMapping(uint32_t object, SvHandle *value) {
  cMappingParts parts(true);
  Status status = kvsvdbGetPropRef1D(object, kvPropFrm_PDURefs, &parts.refs, nullptr);
  if (status >= 0)
    status = kvsvdbGetPropU32_1D(object, kvPropFrm_PDUStartBits, &parts.starts, nullptr);
  if (status >= 0)
    status = kvsvdbGetPropU32_1D(object, kvPropFrm_PDUUpdateBits, &parts.updates, nullptr);
  if (status < 0) return status;
  if (value == nullptr) return kvErrNullArgument;
  // The driver may list more of one than of another: only complete elements are given.
  const int32_t length =
      std::max(0, std::min({CountOf(parts.refs), CountOf(parts.starts), CountOf(parts.updates)}));
  DisposeDroppedStrings(*value, length);
  if (ResizeOrCreateHandle(value, kClusterArrayHeader + uint64_t{sizeof(tPduMapping)} *
                                                            static_cast<uint64_t>(length)) < 0)
    return kvErrOutOfMemory;
  tPduMapping *elements = Elements(*value);
  for (int32_t i = 0; i < length; ++i) {
    // A copy of its own, which the host disposes with the array; the read's strings go below.
    const SvHandle pdu = ArrayData8<SvHandle>(parts.refs)[i];
    if (pdu == nullptr) {
      DisposeHandle(&elements[i].pdu);
    } else if (svCopyHandle(&elements[i].pdu, pdu) != 0) {
      status = kvErrOutOfMemory;
    }
    elements[i].startBit = Numbers(parts.starts)[i];
    elements[i].updateBit = Numbers(parts.updates)[i];
  }
  ArrayCount(*value) = length;
  return status;
}

Status ClearMapping(uint32_t object) {
  Status status = 0;
  for (uint32_t part : kParts) {
    status = tDbPropertyCalls::Set(object, part, 0, nullptr);
    if (status < 0) break;
  }
  return status;
}

Status WriteMapping(uint32_t object, const SvHandle *value) {
  if (value == nullptr || *value == nullptr || **value == nullptr || ArrayCount(*value) <= 0)
    return ClearMapping(object);
  const auto count = static_cast<uint32_t>(ArrayCount(*value));
  // The references borrow the host's string handles: nothing is copied, nothing of theirs freed.
  cMappingParts parts(false);
  parts.refs = svNewHandleClr(kClusterArrayHeader + uint64_t{count} * sizeof(SvHandle));
  parts.starts = svNewHandleClr(kHostCountBytes + uint64_t{count} * sizeof(uint32_t));
  parts.updates = svNewHandleClr(kHostCountBytes + uint64_t{count} * sizeof(uint32_t));
  if (parts.refs == nullptr || parts.starts == nullptr || parts.updates == nullptr)
    return kvErrOutOfMemory;
  const tPduMapping *elements = Elements(*value);
  for (uint32_t i = 0; i < count; ++i) {
    ArrayData8<SvHandle>(parts.refs)[i] = elements[i].pdu;
    Numbers(parts.starts)[i] = elements[i].startBit;
    Numbers(parts.updates)[i] = elements[i].updateBit;
  }
  for (SvHandle array : {parts.refs, parts.starts, parts.updates})
    ArrayCount(array) = static_cast<int32_t>(count);
  Status status = kvsvdbSetPropRef1D(object, kvPropFrm_PDURefs, &parts.refs, nullptr);
  if (status >= 0)
    status = kvsvdbSetPropU32_1D(object, kvPropFrm_PDUStartBits, &parts.starts, nullptr);
  if (status >= 0)
    status = kvsvdbSetPropU32_1D(object, kvPropFrm_PDUUpdateBits, &parts.updates, nullptr);
  return status;
}

Status ReportNotMapping(uint32_t line) {
  return ReportInternalError(kComponentKvsvapi, nFile::kDatabaseProperties, line, 0);
}

}  // namespace

// A wrong identifier is the caller's programming error, reported without naming a property.
extern "C" KVSV_EXPORT kvsvStatus kvsvdbGetPropPDU_Mapping(uint32_t object, uint32_t id,
                                                           SvHandle *value, SvHandle *info) {
  if (id != kvPropFrm_PDU_Mapping) return ReportNotMapping(kLineGetNotMapping);
  return AnnotatedStatus(ReadMapping(object, value), id, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvdbSetPropPDU_Mapping(uint32_t object, uint32_t id,
                                                           SvHandle *value, SvHandle *info) {
  if (id != kvPropFrm_PDU_Mapping) return ReportNotMapping(kLineSetNotMapping);
  return AnnotatedStatus(WriteMapping(object, value), id, info);
}
