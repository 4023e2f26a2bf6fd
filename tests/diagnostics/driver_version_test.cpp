// The version line of the log's header, from the driver's system properties.
#include <gtest/gtest.h>

#include "diagnostics/driver_version.h"
#include "kvorproperties.h"
#include "kvsim.h"

namespace {

using namespace nKVSVAPI100;

TEST(DriverVersionLine, FullVersionOrTheProductNameAlone) {
  const struct {
    const char *what;
    const char *failingFunction;
    uint32_t failingProperty;  // 0: the whole function fails
    const char *line;
  } cases[] = {
      {"all read", nullptr, 0, "KVOR driver 24.5.0f49"},
      {"system open fails", "kvSystemOpen", 0, "KVOR driver"},
      {"major fails", "kvGetProperty", kvPropSys_VerMajor, "KVOR driver"},
      {"phase fails", "kvGetProperty", kvPropSys_VerPhase, "KVOR driver"},
      {"build fails", "kvGetProperty", kvPropSys_VerBuild, "KVOR driver"},
  };
  for (const auto &c : cases) {
    kvsimReset();
    if (c.failingFunction != nullptr && c.failingProperty == 0) {
      kvsimFailCall(c.failingFunction, -1, 1);
    } else if (c.failingFunction != nullptr) {
      kvsimFailProperty(c.failingFunction, c.failingProperty, -1, 1);
    }
    kvsimLogClear();
    EXPECT_EQ(DriverVersionLine(), c.line) << c.what;
    EXPECT_EQ(kvsimCountCalls("kvSystemClose"), 1) << c.what << ": closed in any case";
  }
}

TEST(DriverVersionLine, ReadingStopsAtTheFirstFailure) {
  kvsimReset();
  kvsimFailProperty("kvGetProperty", kvPropSys_VerMinor, -1, 1);
  kvsimLogClear();
  DriverVersionLine();
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSys_VerMajor), 1);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSys_VerMinor), 1);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSys_VerUpdate), 0);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSys_VerBuild), 0);
}

}  // namespace
