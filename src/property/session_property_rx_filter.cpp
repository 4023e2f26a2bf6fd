// kvsvSessionGetPropExCluster1D and kvsvSessionSetPropExCluster1D: the Ethernet receive filter of
// a session, the driver's 28-byte records against the host's array of 16-byte clusters.
#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <memory>

#include "core/host_handles.h"
#include "core/internal_error.h"
#include "kvorproperties.h"
#include "kvsvapi.h"
#include "property/enet_rx_filter_record.h"
#include "property/session_property_call.h"

using namespace nKVSVAPI100;

namespace {

constexpr uint32_t kLineGetUnknown = 2708;
constexpr uint32_t kLineSetUnknown = 2818;

// Records of the driver in a zeroed block of our own.
using tRecordBlock = std::unique_ptr<tEnetRxFilterRecord, void (*)(void *)>;

tRecordBlock NewRecords(size_t bytes) {
  return tRecordBlock(static_cast<tEnetRxFilterRecord *>(std::calloc(bytes, 1)), std::free);
}

tEnetRxFilterCluster *Elements(SvHandle array) {
  return reinterpret_cast<tEnetRxFilterCluster *>(static_cast<char *>(*array) +
                                                  kEnetRxFilterArrayHeader);
}

// The host's array and every name it holds. A count beyond the block counts as far as the block.
void DisposeFilterArray(SvHandle *array) {
  if (*array == nullptr) return;
  if (**array != nullptr) {
    const uint64_t size = svGetHandleSize(*array);
    const uint64_t room = size > kEnetRxFilterArrayHeader
                              ? (size - kEnetRxFilterArrayHeader) / sizeof(tEnetRxFilterCluster)
                              : 0;
    const int32_t count = ArrayCount(*array);
    const uint64_t held = count > 0 ? std::min<uint64_t>(static_cast<uint64_t>(count), room) : 0;
    for (uint64_t i = 0; i < held; ++i) DisposeHandle(&Elements(*array)[i].filterName);
  }
  DisposeHandle(array);
}

// Fills the host's element from one record; 0xBFF63010 if its name has no room.
Status ToCluster(const tEnetRxFilterRecord &record, tEnetRxFilterCluster &element) {
  element.useValue16 = (record.flags & kEnetRxFilterValue16) != 0;
  element.value16 = record.value16;
  element.useValue8 = (record.flags & kEnetRxFilterValue8) != 0;
  element.value8 = record.value8;
  element.useName = (record.flags & kEnetRxFilterName) != 0;
  element.filterName =
      NewStringHandle(record.filterName, strnlen(record.filterName, kEnetRxFilterNameBytes));
  return element.filterName != nullptr ? 0 : kvErrOutOfMemory;
}

Status ReadFilter(uint32_t handle, uint32_t id, SvHandle *value) {
  uint32_t size = 0;
  Status status = tSessionPropertyCalls::GetSize(handle, id, &size);
  if (status < 0) return status;
  if (id != kvPropSession_IntfEnetEptReceiveFilter)
    return ReportInternalError(kComponentKvsvapi, nFile::kSessionOpenClose, kLineGetUnknown, id);
  if (value == nullptr) return kvErrNullArgument;
  const uint32_t count = size / sizeof(tEnetRxFilterRecord);
  // The block holds all the driver's bytes, a part record behind the whole ones included.
  tRecordBlock records = NewRecords(count != 0 ? size : 0);
  if (count != 0) {
    if (!records) return kvErrOutOfMemory;
    status = tSessionPropertyCalls::Get(handle, id, size, records.get());
    if (status < 0) return status;
  }
  DisposeFilterArray(value);
  *value =
      svNewHandleClr(uint64_t{count} * sizeof(tEnetRxFilterCluster) + kEnetRxFilterArrayHeader);
  if (*value == nullptr) return kvErrOutOfMemory;
  ArrayCount(*value) = 0;
  for (uint32_t i = 0; i < count; ++i) {
    const Status made = ToCluster(records.get()[i], Elements(*value)[i]);
    if (made < 0) return made;
    ++ArrayCount(*value);
  }
  return status;
}

// Fills one record from the host's element. A name too long for the driver is left empty and
// refused: 0xBFF630C0.
Status ToRecord(const tEnetRxFilterCluster &element, tEnetRxFilterRecord &record) {
  record.flags = (element.useValue16 != 0 ? kEnetRxFilterValue16 : 0u) |
                 (element.useValue8 != 0 ? kEnetRxFilterValue8 : 0u) |
                 (element.useName != 0 ? kEnetRxFilterName : 0u);
  record.value16 = element.value16;
  record.value8 = element.value8;
  const SvHandle name = element.filterName;
  if (name == nullptr || *name == nullptr) return 0;
  const auto *text = static_cast<const SvStr *>(*name);
  // A negative count is as long as any.
  const uint32_t length = static_cast<uint32_t>(text->cnt);
  if (length > kEnetRxFilterNameMax) return kvErrNameTooLong;
  std::memcpy(record.filterName, text->str, length);
  return 0;
}

Status WriteFilter(uint32_t handle, uint32_t id, const SvHandle *value) {
  if (value == nullptr || *value == nullptr || **value == nullptr || ArrayCount(*value) == 0)
    return 0;
  const int32_t count = ArrayCount(*value);
  if (count < 0) return kvErrOutOfMemory;
  const uint64_t bytes = uint64_t{static_cast<uint32_t>(count)} * sizeof(tEnetRxFilterRecord);
  if (bytes > UINT32_MAX) return kvErrOutOfMemory;
  tRecordBlock records = NewRecords(bytes);
  if (!records) return kvErrOutOfMemory;
  // Every element is made, so that a refused name does not hide the elements behind it.
  Status pending = 0;
  for (int32_t i = 0; i < count; ++i) {
    const Status made = ToRecord(Elements(*value)[i], records.get()[i]);
    if (made < 0) pending = made;
  }
  if (pending < 0) return pending;
  return tSessionPropertyCalls::Set(handle, id, static_cast<uint32_t>(bytes), records.get());
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropExCluster1D(uint32_t session, SvHandle *,
                                                                uint32_t id, SvHandle *value,
                                                                SvHandle *info) {
  return RunSessionPropertyCall(session, id, info,
                                [&](uint32_t handle) { return ReadFilter(handle, id, value); });
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropExCluster1D(uint32_t session, SvHandle *,
                                                                uint32_t id, SvHandle *value,
                                                                SvHandle *info) {
  return RunSessionPropertyCall(session, id, info, [&](uint32_t handle) -> Status {
    if (id != kvPropSession_IntfEnetEptReceiveFilter)
      return ReportInternalError(kComponentKvsvapi, nFile::kSessionOpenClose, kLineSetUnknown, id);
    return WriteFilter(handle, id, value);
  });
}
