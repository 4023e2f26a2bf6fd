// Conversions as a host program makes them: conversion sessions of the field databases, and the
// host arrays of values, byte images and frames kept between calls.
#ifndef KVSVAPI_TESTS_CONVERT_TEST_SUPPORT_H
#define KVSVAPI_TESTS_CONVERT_TEST_SUPPORT_H

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "kvsvapi.h"
#include "support/host_frame_arrays.h"
#include "support/slot_fixture.h"
#include "support/tesla_signals.h"

namespace kvsvtest {

inline std::string HyundaiFdPath() { return std::string(KVSV_DBC_DIR) + "/hyundai_canfd.dbc"; }

// A host array of doubles.
inline SvHandle ValueArray(const std::vector<double> &values) {
  SvHandle h = svNewHandleClr(8 + values.size() * 8);
  const auto count = static_cast<int32_t>(values.size());
  std::memcpy(*h, &count, 4);
  std::copy(values.begin(), values.end(),
            reinterpret_cast<double *>(static_cast<uint8_t *>(*h) + 8));
  return h;
}
inline std::vector<double> ValuesIn(SvHandle h) {
  const auto *values = reinterpret_cast<const double *>(static_cast<uint8_t *>(*h) + 8);
  return std::vector<double>(values, values + std::max(Count(h), 0));
}

// The fields of a CAN cluster that a conversion sets.
struct tFrameFields {
  uint32_t identifier;
  uint8_t type, extended;
  tBytes payload;
  bool operator==(const tFrameFields &o) const {
    return identifier == o.identifier && type == o.type && extended == o.extended &&
           payload == o.payload;
  }
};

// The two host arrays of a conversion towards frames, or the input array of one away from them.
class cHostFrames : public cHostArrays {
 public:
  using cHostArrays::cHostArrays;

  tFrameFields Fields(int32_t i) const {
    return {At<uint32_t>(i, 24), At<uint8_t>(i, 28), At<uint8_t>(i, 29), PayloadOf(i)};
  }
  std::vector<tFrameFields> All() const {
    std::vector<tFrameFields> all;
    for (int32_t i = 0; i < Count(frames); ++i) all.push_back(Fields(i));
    return all;
  }
  // CAN clusters for a conversion away from frames, with a payload handle each but where `null`.
  void Set(const std::vector<tFrameFields> &all, const std::vector<bool> &null = {}) {
    Dispose();
    frames = svNewHandleClr(8 + all.size() * 32);
    const auto count = static_cast<int32_t>(all.size());
    std::memcpy(*frames, &count, 4);
    for (size_t i = 0; i < all.size(); ++i) {
      uint8_t *c = static_cast<uint8_t *>(*frames) + 8 + i * 32;
      std::memcpy(c + 24, &all[i].identifier, 4);
      c[28] = all[i].type;
      c[29] = all[i].extended;
      const SvHandle payload = i < null.size() && null[i] ? nullptr : ByteArray(all[i].payload);
      std::memcpy(c + 16, &payload, 8);
    }
  }
};

// Three frames of 4, 8 and 8 bytes.
const char kTeslaList[] = "DAS_steeringAngleRequest,EPAS_sysStatus.EPAS_internalSAS,DI_torqueMotor";
const std::vector<double> kTeslaValues = {-403.8, 123.4, -312.25};

// Conversion sessions with a slot in the library.
class ConvertTest : public SlotFixture {
 protected:
  // A Tesla session whose arrays have been through one conversion of values towards frames.
  uint32_t SteadyTesla(cHostFrames &out) {
    const uint32_t session = Conversion(TeslaPath(), kTeslaList);
    SvHandle in = Keep(ValueArray(kTeslaValues));
    EXPECT_EQ(kvsvConvertSignalSinglePointToFrameCAN(session, &in, &out.frames, &out.spares), 0);
    EXPECT_EQ(Count(out.frames), 3);
    return session;
  }
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
