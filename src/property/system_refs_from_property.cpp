#include "property/system_refs_from_property.h"

#include <memory>
#include <new>

#include "core/host_handles.h"
#include "core/internal_error.h"
#include "kvorproperties.h"
#include "property/property_value_io.h"
#include "session/device_reference_name.h"

namespace nKVSVAPI100 {

namespace {

constexpr uint32_t kLineOneStringOnly = 1105;
// A device name has a fixed length, 19 characters: room for it from the start.
constexpr uint64_t kDeviceNameBytes = 32;
// Bytes that a name's string handle holds beyond the driver's size of the name.
constexpr uint32_t kNameSlack = 12;

void SetCount(SvHandle string, int32_t count) { static_cast<SvStr *>(*string)->cnt = count; }

// A name property of `object` into a new string handle, its count leaving the NUL out. The
// string is empty when the name cannot be read.
Status ReadTextName(uint32_t object, uint32_t nameId, SvHandle &name) {
  const Status status = ReadSizedIntoHandle<tSessionPropertyCalls>(
      object, nameId, &name, kNameSlack, [&name](Status read, uint32_t size) {
        SetCount(name, read >= 0 && size != 0 ? static_cast<int32_t>(size - 1) : 0);
      });
  if (name == nullptr && ResizeOrCreateHandle(&name, kNameSlack) < 0) return kvErrOutOfMemory;
  return status;
}

// The device's name into a new string handle. A device behind one whose serial could not be read
// is named empty too: hosts have always seen the pair that way.
Status ReadDeviceName(uint32_t device, bool afterFailure, SvHandle &name) {
  name = svNewHandleClr(kDeviceNameBytes);
  if (name == nullptr) return kvErrOutOfMemory;
  const Status status = ReadDeviceReferenceName(device, name);
  if (status < 0 || afterFailure) SetCount(name, 0);
  return status;
}

}  // namespace

Status SystemRefsFromProperty(uint32_t handle, uint32_t listId, uint32_t nameId, SvHandle *out,
                              uint32_t mode) {
  std::unique_ptr<uint32_t[]> list;
  uint32_t count = 0;
  Status status =
      ReadHandleList<tSessionPropertyCalls>(handle, listId, kSystemRefsSelf, list, count);
  if (status < 0 || count == 0) return status;

  if (mode == kSystemRefsArray) {
    DisposeHandleArray(out);
    *out = svNewHandleClr(uint64_t{count} * 8 + 8);
    if (*out == nullptr) return kvErrOutOfMemory;
    ArrayCount(*out) = static_cast<int32_t>(count);
  } else {
    DisposeHandle(out);
  }
  bool deviceFailed = false;
  for (uint32_t i = 0; i < count; ++i) {
    SvHandle name = nullptr;
    if (nameId == kvPropDev_SerNum) {
      status = ReadDeviceName(list[i], deviceFailed, name);
      deviceFailed = status < 0;
    } else {
      status = ReadTextName(list[i], nameId, name);
    }
    if (mode == kSystemRefsArray) {
      ArrayData8<SvHandle>(*out)[i] = name;
    } else if (i == 0) {
      *out = name;
    } else {
      ReportInternalError(kComponentKvsvapi, nFile::kUtility, kLineOneStringOnly, i);
      DisposeHandle(&name);
    }
  }
  return status;
}

}  // namespace nKVSVAPI100
