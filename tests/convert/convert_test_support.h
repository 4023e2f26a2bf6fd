// Conversions as a host program makes them: conversion sessions of the field databases, the host
// arrays kept between calls, and the frames and signals of a database as its properties give them.
#ifndef KVSVAPI_TESTS_CONVERT_TEST_SUPPORT_H
#define KVSVAPI_TESTS_CONVERT_TEST_SUPPORT_H

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "frame/frame_read_support.h"
#include "kvor/database_test_support.h"
#include "kvorproperties.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "support/slot_fixture.h"
#include "svsim.h"

namespace kvsvtest {

inline std::string TeslaDbc() { return DbcPath("tesla_can.dbc"); }
inline std::string HyundaiFdDbc() { return DbcPath("hyundai_canfd.dbc"); }

// One signal of a database, as a list item and with what its value may be.
struct tDbSignal {
  std::string item;  // "frame.signal"
  uint32_t numBits = 0;
  uint32_t type = 0;  // 0 signed, 1 unsigned
  double scale = 1.0;
  double offset = 0.0;
  bool multiplexed = false;
  uint32_t muxValue = 0;
  uint32_t frameLength = 0;
};

// The signals of every frame of the database file at `path` that fit their frame, in file order.
inline std::vector<tDbSignal> DatabaseSignals(const std::string &path) {
  std::vector<tDbSignal> signals;
  const uint32_t database = OpenDatabase(path);
  for (uint32_t frame : DbHandles(DbCluster(database), kvPropClst_FrmRefs)) {
    const std::string frameName = DbText(frame, kvPropFrm_Name);
    for (uint32_t handle : DbHandles(frame, kvPropFrm_SigRefs)) {
      tDbSignal signal;
      signal.item = frameName + "." + DbText(handle, kvPropSig_Name);
      signal.numBits = DbRead<uint32_t>(handle, kvPropSig_NumBits);
      signal.type = DbRead<uint32_t>(handle, kvPropSig_DataType);
      signal.scale = DbRead<double>(handle, kvPropSig_ScaleFac);
      signal.offset = DbRead<double>(handle, kvPropSig_ScaleOff);
      signal.multiplexed = DbBool(handle, kvPropSig_MuxIsDynamic);
      signal.muxValue = DbRead<uint32_t>(handle, kvPropSig_MuxValue);
      signal.frameLength = DbRead<uint32_t>(frame, kvPropFrm_PayloadLen);
      // A signal that lies outside its frame is refused by every session: leave it out.
      uint32_t probe = 0;
      if (kvCreateSession(path.c_str(), "", signal.item.c_str(), "CAN1",
                          kvMode_SignalConversionSinglePoint, &probe) != 0) {
        continue;
      }
      kvClear(probe);
      signals.push_back(signal);
    }
  }
  kvdbCloseDatabase(database, 1);
  return signals;
}

inline std::string ListOf(const std::vector<tDbSignal> &signals) {
  std::string list;
  for (const tDbSignal &signal : signals) list += (list.empty() ? "" : ",") + signal.item;
  return list;
}

// Raw bits that differ from signal to signal and fit each; small enough that a 64-bit raw value
// survives the trip through a double. The field files have integer signals only.
inline uint64_t RawFor(const tDbSignal &signal, size_t index) {
  const uint64_t mask = (uint64_t{1} << std::min<uint32_t>(signal.numBits, 40)) - 1;
  return (0x9E3779B97F4A7C15ull * (index + 1)) >> 7 & mask;
}

// The value that `raw` stands for.
inline double ValueOf(const tDbSignal &signal, uint64_t raw) {
  int64_t steps = static_cast<int64_t>(raw);
  if (signal.type == 0 && signal.numBits < 64 && (raw >> (signal.numBits - 1)) != 0) {
    steps -= int64_t{1} << signal.numBits;
  }
  return static_cast<double>(steps) * signal.scale + signal.offset;
}

// Bytes of one signal in a byte image, and the image of `raws`, low byte first.
inline uint32_t ImageWidth(const tDbSignal &signal) { return (signal.numBits + 7) / 8; }
inline tBytes ImageOf(const std::vector<tDbSignal> &signals, const std::vector<uint64_t> &raws) {
  tBytes image;
  for (size_t i = 0; i < signals.size(); ++i) {
    for (uint32_t b = 0; b < ImageWidth(signals[i]); ++b) {
      image.push_back(static_cast<uint8_t>(raws[i] >> (8 * b)));
    }
  }
  return image;
}

// A host double array, and a host byte array (count at byte 0, bytes from byte 4).
inline SvHandle ValueArray(const std::vector<double> &values) {
  SvHandle h = svNewHandleClr(8 + values.size() * 8);
  const int32_t count = static_cast<int32_t>(values.size());
  std::memcpy(*h, &count, 4);
  if (!values.empty())
    std::memcpy(static_cast<uint8_t *>(*h) + 8, values.data(), values.size() * 8);
  return h;
}
inline std::vector<double> ValuesIn(SvHandle h) {
  std::vector<double> values(static_cast<size_t>(std::max(Count(h), 0)));
  if (!values.empty())
    std::memcpy(values.data(), static_cast<uint8_t *>(*h) + 8, values.size() * 8);
  return values;
}
inline SvHandle ByteArray(const tBytes &bytes) {
  SvHandle h = svNewHandleClr(bytes.size() + 7);
  const int32_t count = static_cast<int32_t>(bytes.size());
  std::memcpy(*h, &count, 4);
  if (!bytes.empty()) std::memcpy(static_cast<uint8_t *>(*h) + 4, bytes.data(), bytes.size());
  return h;
}

// A frame cluster's fields that a conversion sets, whatever the protocol.
struct tFrameFields {
  uint32_t identifier = 0;
  uint8_t type = 0;
  uint8_t extended = 0;
  tBytes payload;
  bool operator==(const tFrameFields &o) const {
    return identifier == o.identifier && type == o.type && extended == o.extended &&
           payload == o.payload;
  }
};

// The two host arrays of a conversion towards frames, or the input array of one away from them,
// of CAN clusters unless told otherwise; every handle left in them is disposed of at the end.
class cHostFrames {
 public:
  explicit cHostFrames(uint32_t stride = 32) : stride_(stride) {}
  ~cHostFrames() { Dispose(); }
  cHostFrames(const cHostFrames &) = delete;
  cHostFrames &operator=(const cHostFrames &) = delete;

  SvHandle frames = nullptr;
  SvHandle spares = nullptr;

  SvHandle Payload(int32_t i) const {
    SvHandle h;
    std::memcpy(&h, static_cast<const uint8_t *>(*frames) + 8 + i * stride_ + 16, 8);
    return h;
  }
  tFrameFields Fields(int32_t i) const {
    const uint8_t *c = static_cast<const uint8_t *>(*frames) + 8 + i * stride_;
    tFrameFields f;
    std::memcpy(&f.identifier, c + 24, 4);
    f.type = c[28];
    f.extended = c[29];
    f.payload = PayloadBytes(Payload(i));
    return f;
  }
  std::vector<tFrameFields> All() const {
    std::vector<tFrameFields> all;
    for (int32_t i = 0; i < Count(frames); ++i) all.push_back(Fields(i));
    return all;
  }
  std::vector<SvHandle> Payloads() const {
    std::vector<SvHandle> out;
    for (int32_t i = 0; i < Count(frames); ++i) out.push_back(Payload(i));
    return out;
  }
  std::vector<SvHandle> Spares() const {
    std::vector<SvHandle> out;
    for (int32_t i = 0; i < Count(spares); ++i) out.push_back(SpareAt(spares, i));
    return out;
  }

  // Clusters for a conversion away from frames: CAN fields, a payload handle each (none for a
  // null payload).
  void Set(const std::vector<tFrameFields> &all, const std::vector<bool> &nullPayload = {}) {
    Dispose();
    frames = svNewHandleClr(8 + all.size() * stride_);
    const int32_t count = static_cast<int32_t>(all.size());
    std::memcpy(*frames, &count, 4);
    for (size_t i = 0; i < all.size(); ++i) {
      uint8_t *c = static_cast<uint8_t *>(*frames) + 8 + i * stride_;
      std::memcpy(c + 24, &all[i].identifier, 4);
      c[28] = all[i].type;
      c[29] = all[i].extended;
      if (i < nullPayload.size() && nullPayload[i]) continue;
      SvHandle payload = ByteArray(all[i].payload);
      std::memcpy(c + 16, &payload, 8);
    }
  }

  void Dispose() {
    if (frames != nullptr) {
      const size_t capacity = (svGetHandleSize(frames) - 8) / stride_;
      for (size_t i = 0; i < capacity; ++i) svDisposeHandle(Payload(static_cast<int32_t>(i)));
      svDisposeHandle(frames);
    }
    if (spares != nullptr) {
      for (int32_t i = 0; i < Count(spares); ++i) svDisposeHandle(SpareAt(spares, i));
      svDisposeHandle(spares);
    }
    frames = spares = nullptr;
  }

 private:
  uint32_t stride_;
};

// Conversion sessions with a slot in the library.
class ConvertTest : public SlotFixture {
 protected:
  uint32_t Conversion(const std::string &database, const std::string &list,
                      const char *interfaceName = "CAN1") {
    uint32_t session = 0;
    EXPECT_EQ(kvCreateSession(database.c_str(), "", list.c_str(), interfaceName,
                              kvMode_SignalConversionSinglePoint, &session),
              0)
        << list;
    PlaceSlot(session);
    return session;
  }
};

}  // namespace kvsvtest

#endif
