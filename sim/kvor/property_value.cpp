#include "property_value.h"

#include <cstring>

#include "kvsim.h"

namespace nKvorSim {

namespace {

enum ValueType : uint32_t {
  kU32 = 0x00,
  kF64 = 0x01,
  kBool = 0x02,
  kText = 0x03,
  kCommaText = 0x04,
  kHandle = 0x05,
  kU64 = 0x09
};

// Byte size of the fixed-size types; 0 for the types whose size the value decides.
uint32_t FixedSize(uint32_t type) {
  switch (type) {
    case kU32:
    case kHandle:
      return 4;
    case kF64:
    case kU64:
      return 8;
    case kBool:
      return 1;
    default:
      return 0;
  }
}

}  // namespace

uint32_t FixedValueSize(uint32_t id) { return FixedSize(id >> 24); }

PropertyValue U32Value(uint32_t value) {
  PropertyValue bytes(sizeof value);
  std::memcpy(bytes.data(), &value, sizeof value);
  return bytes;
}

PropertyValue TextValue(std::string_view text) {
  PropertyValue bytes(text.begin(), text.end());
  bytes.push_back(0);
  return bytes;
}

PropertyValue HandleArrayValue(const std::vector<uint32_t> &handles) {
  PropertyValue bytes(handles.size() * sizeof(uint32_t));
  if (!handles.empty()) std::memcpy(bytes.data(), handles.data(), bytes.size());
  return bytes;
}

Status CopyValueOut(const PropertyValue &value, uint32_t size, void *out) {
  if (size < value.size()) return kvsimErrBufferTooSmall;
  if (value.empty()) return 0;
  if (out == nullptr) return kvsimErrNullPointer;
  std::memcpy(out, value.data(), value.size());
  return 0;
}

Status ValueFromCaller(uint32_t id, uint32_t size, const void *in, PropertyValue *value) {
  if (size != 0 && in == nullptr) return kvsimErrNullPointer;
  const uint32_t type = id >> 24;
  const uint32_t fixed = FixedSize(type);
  if (fixed != 0 && size != fixed) return kvsimErrPropertySize;
  const auto *bytes = static_cast<const uint8_t *>(in);
  value->assign(bytes, bytes + size);
  if ((type == kText || type == kCommaText) && (value->empty() || value->back() != 0)) {
    value->push_back(0);
  }
  return 0;
}

}  // namespace nKvorSim
