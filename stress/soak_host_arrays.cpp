#include "soak_host_arrays.h"

#include <cstring>

#include "kvsvplatform.h"

namespace nKvsvSoak {

namespace {

// Room for the largest payload this soak writes, beyond what any session allows.
constexpr uint32_t kPayloadRoom = 96;

template <typename T>
T Load(const uint8_t *at) {
  T value;
  std::memcpy(&value, at, sizeof value);
  return value;
}

}  // namespace

int32_t ArrayCount(SvHandle array) {
  if (array == nullptr || *array == nullptr) return 0;
  return Load<int32_t>(static_cast<const uint8_t *>(*array));
}

cReadArrays::~cReadArrays() {
  if (frames != nullptr) {
    const size_t capacity = (svGetHandleSize(frames) - kArrayHeader) / kClusterSize;
    const uint8_t *block = static_cast<const uint8_t *>(*frames);
    for (size_t i = 0; i < capacity; ++i) {
      SvHandle payload = Load<SvHandle>(block + kArrayHeader + i * kClusterSize + kClusterPayload);
      if (payload != nullptr) svDisposeHandle(payload);
    }
    svDisposeHandle(frames);
  }
  if (spares != nullptr) {
    const int32_t count = ArrayCount(spares);
    for (int32_t i = 0; i < count; ++i)
      svDisposeHandle(Load<SvHandle>(static_cast<const uint8_t *>(*spares) + kArrayHeader + i * 8));
    svDisposeHandle(spares);
  }
}

tDelivered cReadArrays::Frame(int32_t i) const {
  const uint8_t *cluster = static_cast<const uint8_t *>(*frames) + kArrayHeader + i * kClusterSize;
  tDelivered frame{Load<uint32_t>(cluster + kClusterIdentifier), cluster[kClusterType],
                   cluster[kClusterExtended], cluster[kClusterEcho], nullptr, -1};
  const SvHandle payload = Load<SvHandle>(cluster + kClusterPayload);
  if (payload != nullptr && *payload != nullptr) {
    frame.length = Load<int32_t>(static_cast<const uint8_t *>(*payload));
    frame.payload = static_cast<const uint8_t *>(*payload) + 4;
  }
  return frame;
}

cWriteArray::cWriteArray(int32_t capacity)
    : capacity_(capacity), handle_(svNewHandleClr(kArrayHeader + size_t(capacity) * kClusterSize)) {
  for (int32_t i = 0; i < capacity_; ++i) {
    SvHandle payload = svNewHandleClr(4 + kPayloadRoom);
    std::memcpy(Cluster(i) + kClusterPayload, &payload, sizeof payload);
  }
}

cWriteArray::~cWriteArray() {
  for (int32_t i = 0; i < capacity_; ++i) svDisposeHandle(Load<SvHandle>(Cluster(i) + kClusterPayload));
  svDisposeHandle(handle_);
}

uint8_t *cWriteArray::Cluster(int32_t i) const {
  return static_cast<uint8_t *>(*handle_) + kArrayHeader + size_t(i) * kClusterSize;
}

void cWriteArray::SetCount(int32_t count) { std::memcpy(*handle_, &count, 4); }

void cWriteArray::Stamp(int32_t i, uint32_t writer, uint32_t sequence, const tWriterKind &kind) {
  uint8_t *cluster = Cluster(i);
  const uint32_t identifier = StampIdentifier(writer, kind);
  std::memcpy(cluster + kClusterIdentifier, &identifier, 4);
  cluster[kClusterType] = 0;
  cluster[kClusterExtended] = kind.extended ? 1 : 0;
  const uint32_t length = StampLength(sequence, kind);
  uint8_t *payload = static_cast<uint8_t *>(*Load<SvHandle>(cluster + kClusterPayload));
  std::memcpy(payload, &length, 4);
  FillStamp(payload + 4, length, writer, sequence);
  if (ArrayCount(handle_) <= i) SetCount(i + 1);
}

void cWriteArray::Oversize(int32_t i, uint32_t length) {
  uint8_t *payload = static_cast<uint8_t *>(*Load<SvHandle>(Cluster(i) + kClusterPayload));
  if (length > kPayloadRoom) length = kPayloadRoom;
  std::memcpy(payload, &length, 4);
  std::memset(payload + 4, 0xA5, length);
  if (ArrayCount(handle_) <= i) SetCount(i + 1);
}

}  // namespace nKvsvSoak
