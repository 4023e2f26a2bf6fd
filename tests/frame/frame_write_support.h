// Frame writes as a host program makes them: arrays of clusters built field by field with their
// payload handles, and the bytes that the driver was handed, read back.
#ifndef KVSVAPI_TESTS_FRAME_WRITE_SUPPORT_H
#define KVSVAPI_TESTS_FRAME_WRITE_SUPPORT_H

#include <algorithm>
#include <cstring>
#include <utility>
#include <vector>

#include "frame/frame_read_support.h"

namespace kvsvtest {

// A host array of clusters; every handle it made is disposed of with it.
class cClusterArray {
 public:
  cClusterArray(int32_t count, uint32_t stride, uint32_t payloadOffset)
      : stride_(stride),
        payloadOffset_(payloadOffset),
        handle_(svNewHandleClr(8 + static_cast<size_t>(count) * stride)) {
    std::memcpy(*handle_, &count, 4);
  }
  ~cClusterArray() {
    for (auto &hidden : hidden_) *hidden.first = hidden.second;
    for (SvHandle payload : payloads_) svDisposeHandle(payload);
    svDisposeHandle(handle_);
  }
  cClusterArray(const cClusterArray &) = delete;
  cClusterArray &operator=(const cClusterArray &) = delete;

  template <typename T>
  cClusterArray &Set(int32_t i, uint32_t offset, T value) {
    std::memcpy(Element(i) + offset, &value, sizeof value);
    return *this;
  }
  // The SvTime of kGoldenRawTime at `offset`.
  cClusterArray &GoldenTime(int32_t i, uint32_t offset = 0) {
    return Set(i, offset, kGoldenFraction).Set(i, offset + 8, kGoldenSeconds);
  }
  // A payload handle holding `bytes`; `block` false leaves the handle's block null.
  cClusterArray &Payload(int32_t i, const tBytes &bytes, bool block = true) {
    SvHandle payload = svNewHandleClr(4 + bytes.size());
    const auto count = static_cast<int32_t>(bytes.size());
    std::memcpy(*payload, &count, 4);
    if (!bytes.empty())
      std::memcpy(static_cast<uint8_t *>(*payload) + 4, bytes.data(), bytes.size());
    payloads_.push_back(payload);
    if (!block) {
      // The host disposes of a handle only with its own block: put back before the end.
      hidden_.emplace_back(payload, *payload);
      *payload = nullptr;
    }
    return Set(i, payloadOffset_, payload);
  }
  SvHandle handle() const { return handle_; }

 private:
  uint8_t *Element(int32_t i) {
    return static_cast<uint8_t *>(*handle_) + 8 + static_cast<size_t>(i) * stride_;
  }

  uint32_t stride_;
  uint32_t payloadOffset_;
  SvHandle handle_;
  std::vector<SvHandle> payloads_;
  std::vector<std::pair<SvHandle, void *>> hidden_;
};

// A frame session with no slot in the library: the far end of a bus, or one the table never saw.
inline uint32_t DriverSession(uint32_t mode, const char *interfaceName) {
  uint32_t session = 0;
  EXPECT_EQ(kvCreateSession(":memory:", "", "", interfaceName, mode, &session), 0);
  return session;
}

// The bytes of the last successful kvWriteFrame on `session`.
inline tBytes LastWrite(uint32_t session) {
  const int32_t size = kvsimLastWrite(session, nullptr, 0);
  tBytes bytes(static_cast<size_t>(size > 0 ? size : 0));
  kvsimLastWrite(session, bytes.data(), static_cast<uint32_t>(bytes.size()));
  return bytes;
}

// One record of the golden time, zeros behind its payload.
inline tBytes Record(uint32_t id, uint8_t type, uint8_t flags, uint8_t info, uint8_t lengthField,
                     tBytes payload, uint32_t size) {
  payload.resize(std::max<size_t>(payload.size(), size - 16), 0);
  tBytes out;
  AppendRecord(out, id, type, flags, info, lengthField, payload, size, kGoldenRawTime);
  return out;
}

inline tBytes Join(std::initializer_list<tBytes> parts) {
  tBytes out;
  for (const tBytes &part : parts) out.insert(out.end(), part.begin(), part.end());
  return out;
}

}  // namespace kvsvtest

#endif
