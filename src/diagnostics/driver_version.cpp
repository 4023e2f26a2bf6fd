#include "diagnostics/driver_version.h"

#include <cstdint>
#include <cstdio>

#include "kvorproperties.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

namespace {

constexpr char kProductName[] = "KVOR driver";
constexpr size_t kVersionTextSize = 50;

char PhaseLetter(uint32_t phase) {
  static const char kLetters[] = {'d', 'a', 'b', 'f'};
  return phase < sizeof kLetters ? kLetters[phase] : '-';
}

}  // namespace

std::string DriverVersionLine() {
  std::string line = kProductName;
  uint32_t system = 0;
  // Major, minor, update, phase, build: read in this order, up to the first failure.
  const uint32_t ids[] = {kvPropSys_VerMajor, kvPropSys_VerMinor, kvPropSys_VerUpdate,
                          kvPropSys_VerPhase, kvPropSys_VerBuild};
  uint32_t values[5] = {0, 0, 0, 0, 0};
  bool complete = kvSystemOpen(&system) >= 0;
  for (size_t i = 0; complete && i < 5; ++i) {
    complete = kvGetProperty(system, ids[i], sizeof values[i], &values[i]) >= 0;
  }
  kvSystemClose(system);
  if (complete) {
    char text[kVersionTextSize];
    std::snprintf(text, sizeof text, "%u.%u.%u%c%u", values[0], values[1], values[2],
                  PhaseLetter(values[3]), values[4]);
    line += ' ';
    line += text;
  }
  return line;
}

}  // namespace nKVSVAPI100
