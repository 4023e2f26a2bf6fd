// Frame reads and writes as a host program makes them: driver records built by hand, sessions on
// a virtual bus of one protocol, the reader's two host arrays, and clusters built for writes.
#ifndef KVSVAPI_TESTS_FRAME_SUPPORT_H
#define KVSVAPI_TESTS_FRAME_SUPPORT_H

#include <algorithm>
#include <memory>

#include "kvsvapi.h"
#include "support/call_log.h"
#include "support/host_frame_arrays.h"
#include "support/slot_fixture.h"

namespace kvsvtest {

// 5.5 s past the first absolute rawTime, and the SvTime that stands for it.
constexpr uint64_t kGoldenRawTime = 118653336000000000ull + 55000000ull;
constexpr uint64_t kGoldenFraction = 9223372036855000000ull;
constexpr int64_t kGoldenSeconds = 2303704805;

// One record of `size` bytes at the golden time: the header as given, then as many of `payload`
// as fit.
inline tBytes Record(uint32_t id, uint8_t type, uint8_t flags, uint8_t info, uint8_t lengthField,
                     const tBytes &payload, uint32_t size) {
  tBytes record(size, 0);
  std::memcpy(record.data(), &kGoldenRawTime, 8);
  std::memcpy(record.data() + 8, &id, 4);
  record[12] = type;
  record[13] = flags;
  record[14] = info;
  record[15] = lengthField;
  std::copy_n(payload.begin(), std::min<size_t>(payload.size(), size - 16), record.begin() + 16);
  return record;
}

inline tBytes Join(std::initializer_list<tBytes> parts) {
  tBytes out;
  for (const tBytes &part : parts) out.insert(out.end(), part.begin(), part.end());
  return out;
}

// A protocol's exports, buses and cluster: the identifier's width at 24, then `fields` one-byte
// fields from `fieldsAt`.
struct tProtocol {
  const char *name;
  kvsvStatus (*read)(uint32_t, int32_t, SvHandle *, SvHandle *, double);
  kvsvStatus (*write)(uint32_t, SvHandle, double);
  const char *out, *in;
  uint32_t stride, payloadOffset, idBytes, fieldsAt, fields;
};
const tProtocol kCan{"CAN", kvsvReadFrameCAN, kvsvWriteFrameCAN, "CAN1", "CAN2", 32, 16, 4, 28, 3};
const tProtocol kLin{"LIN", kvsvReadFrameLIN, kvsvWriteFrameLIN, "LIN1", "LIN2", 32, 16, 4, 28, 4};
const tProtocol kFlexRay{
    "FlexRay", kvsvReadFrameFlexRay, kvsvWriteFrameFlexRay, "FlexRay1", "FlexRay2", 40, 16, 2, 26,
    8};
const tProtocol kEthernet{
    "Ethernet", kvsvReadFrameEthernet, kvsvWriteFrameEthernet, "ENET1", "ENET1", 56, 32, 4, 46, 4};

// A host array of clusters for a write; the payload handles it made go with it.
class cClusterArray {
 public:
  cClusterArray(int32_t count, const tProtocol &p)
      : p_(p), handle_(svNewHandleClr(8 + static_cast<size_t>(count) * p.stride)) {
    std::memcpy(*handle_, &count, 4);
  }
  ~cClusterArray() {
    for (SvHandle payload : payloads_) svDisposeHandle(payload);
    svDisposeHandle(handle_);
  }

  template <typename T>
  cClusterArray &Set(int32_t i, uint32_t offset, T value) {
    std::memcpy(static_cast<uint8_t *>(*handle_) + 8 + size_t(i) * p_.stride + offset, &value,
                sizeof value);
    return *this;
  }
  // The golden time, the identifier and the one-byte fields.
  cClusterArray &Frame(int32_t i, uint32_t id, const tBytes &fields = {}) {
    Set(i, 0, kGoldenFraction).Set(i, 8, kGoldenSeconds).Set(i, 24, id);
    for (size_t k = 0; k < fields.size(); ++k) Set(i, uint32_t(p_.fieldsAt + k), fields[k]);
    return *this;
  }
  cClusterArray &Payload(int32_t i, const tBytes &bytes) {
    payloads_.push_back(ByteArray(bytes));
    return Set(i, p_.payloadOffset, payloads_.back());
  }
  SvHandle handle() const { return handle_; }

 private:
  const tProtocol &p_;
  SvHandle handle_;
  std::vector<SvHandle> payloads_;
};

// Sessions on the virtual bus of one protocol: a library reader with its program's two arrays and
// a driver writer, or a library writer. Every host resize moves its block, so that a block
// pointer kept across one reads freed memory.
class FrameTest : public SlotFixture {
 protected:
  void TearDown() override {
    arrays_.reset();
    SlotFixture::TearDown();
  }

  // The reader, with `property` set to 1 on both ends if given; arrays of a former Open go.
  void Open(const tProtocol &p, uint32_t property = 0, uint32_t mode = kvMode_FrameInQueued,
            const char *list = "") {
    p_ = &p;
    arrays_ = std::make_unique<cHostArrays>(p.stride, p.payloadOffset);
    svsimSetMoveOnResize(1);
    EXPECT_EQ(kvCreateSession(":memory:", "", "", p.out, kvMode_FrameOutQueued, &writer_), 0);
    reader_ = MakeSession(list, mode, p.in);
    for (const uint32_t session : {writer_, reader_})
      if (property != 0) SetU32(session, property, 1);
  }
  // A library writer with `property` set to `value` first, if given, and a driver reader.
  void Writer(const tProtocol &p, uint32_t property = 0, uint32_t value = 1) {
    p_ = &p;
    writer_ = MakeSession("", kvMode_FrameOutQueued, p.out);
    EXPECT_EQ(kvCreateSession(":memory:", "", "", p.in, kvMode_FrameInQueued, &reader_), 0);
    if (property != 0) SetU32(writer_, property, value);
  }
  kvsvStatus Read(int32_t n, double timeout = 0.0) {
    return p_->read(reader_, n, &arrays_->frames, &arrays_->spares, timeout);
  }
  void Serve(const tBytes &bytes) {
    ASSERT_EQ(kvsimSetReadStream(reader_, bytes.data(), static_cast<uint32_t>(bytes.size()), 0), 0);
  }
  // `count` frames with identifiers 0x100 + i and payloads of `length` bytes seeded by `seed` + i:
  // sent on the bus for Ethernet, served as classic records to the next read otherwise.
  void Send(int count, uint8_t seed, size_t length = 8) {
    std::vector<tBytes> payloads;
    tBytes records;
    for (int i = 0; i < count; ++i) {
      payloads.push_back(Pattern(length, uint8_t(seed + i)));
      records = Join({records, Record(0x100 + i, 0, 0, 0, uint8_t(length), payloads.back(), 24)});
    }
    if (p_ != &kEthernet) return Serve(records);
    std::vector<uint64_t> descriptors;  // data address, then length and padding
    for (const tBytes &b : payloads)
      descriptors.insert(descriptors.end(), {reinterpret_cast<uintptr_t>(b.data()), b.size()});
    ASSERT_EQ(kvhdnWriteFrameEthernet(writer_, descriptors.data(), uint32_t(count), 0.0), 0);
  }
  int32_t Frames() const { return Count(arrays_->frames); }
  uint32_t Id(int32_t i) const {
    return p_->idBytes == 2 ? arrays_->At<uint16_t>(i, 24) : arrays_->At<uint32_t>(i, 24);
  }
  tBytes Fields(int32_t i) const { return arrays_->Bytes(i, p_->fieldsAt, p_->fields); }
  // The bytes of the last successful kvWriteFrame of the writer.
  tBytes LastWrite() const {
    tBytes bytes(static_cast<size_t>(std::max(kvsimLastWrite(writer_, nullptr, 0), 0)));
    kvsimLastWrite(writer_, bytes.data(), static_cast<uint32_t>(bytes.size()));
    return bytes;
  }

  const tProtocol *p_ = nullptr;
  std::unique_ptr<cHostArrays> arrays_;
  uint32_t writer_ = 0;
  uint32_t reader_ = 0;
};

}  // namespace kvsvtest

#endif
