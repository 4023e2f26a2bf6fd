// Signal sessions made with the Tesla database file, and the signals of it that tests move, with
// the resolution of each.
#ifndef KVSV_TESTS_SUPPORT_TESLA_SIGNALS_H
#define KVSV_TESTS_SUPPORT_TESLA_SIGNALS_H

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "kvsim.h"
#include "kvsvplatform.h"

namespace kvsvtest {

inline std::string TeslaPath() { return std::string(KVSV_DBC_DIR) + "/tesla_can.dbc"; }

// A session of the Tesla database on `interfaceName`; a failure fails the test and gives 0.
inline uint32_t TeslaSession(const char *interfaceName, uint32_t mode, const std::string &list) {
  uint32_t handle = 0;
  const int32_t status =
      kvCreateSession(TeslaPath().c_str(), "", list.c_str(), interfaceName, mode, &handle);
  EXPECT_EQ(status, 0) << list;
  return handle;
}

struct tSignalCase {
  const char *name;
  double value;
  double scale;  // a decoded value lies within half of it
};

// Both byte orders, signed and unsigned, offsets, and a multiplexed signal of each of two
// multiplexer values, whose bits overlap.
inline const std::vector<tSignalCase> &TeslaSignals() {
  static const std::vector<tSignalCase> signals = {
      {"DAS_steeringAngleRequest", -403.85, 0.1},          // big-endian, 15 bits, offset -1638.35
      {"DAS_steeringControlCounter", 11, 1},               // big-endian, 4 bits, same frame
      {"EPAS_sysStatus.EPAS_internalSAS", 123.4, 0.1},     // big-endian, 14 bits, offset -819.2
      {"DI_torqueMotor", -312.25, 0.25},                   // little-endian, signed 13 bits
      {"DI_motorRPM", -16000, 1},                          // little-endian, signed 16 bits
      {"UI_csaRoadCurvC2", -0.012345, 1e-6},               // little-endian, signed, tiny scale
      {"UI_donDisableAutoWiperDuration", 5, 1},            // multiplexed, multiplexer value 0
      {"UI_camBlockLaneCheckThreshold", 0.6348, 0.01587},  // multiplexed, value 1
  };
  return signals;
}

inline std::string ListOf(const std::vector<tSignalCase> &signals) {
  std::string list;
  for (const tSignalCase &signal : signals)
    list += (list.empty() ? "" : ",") + std::string(signal.name);
  return list;
}

inline void SetResampleRate(uint32_t session, double rate) {
  ASSERT_EQ(kvSetProperty(session, kvPropSession_ResampRate, sizeof rate, &rate), 0);
}

}  // namespace kvsvtest

#endif
