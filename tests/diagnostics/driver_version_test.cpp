// The version line of the log's header, from the driver's system properties.
#include <gtest/gtest.h>

#include "diagnostics/driver_version.h"
#include "kvorproperties.h"
#include "kvsim.h"

namespace {

using namespace nKVSVAPI100;

TEST(DriverVersionLine, FullVersionOrTheProductNameAloneAndReadingStopsAtTheFirstFailure) {
  const struct {
    const char *what;
    const char *failingFunction;
    uint32_t failingProperty;  // 0: the whole function fails
    const char *line;
    int32_t buildReads;        // the last of the five: 0 once an earlier one failed
  } cases[] = {
      {"all read", nullptr, 0, "KVOR driver 24.5.0f49", 1},
      {"system open fails", "kvSystemOpen", 0, "KVOR driver", 0},
      {"major fails", "kvGetProperty", kvPropSys_VerMajor, "KVOR driver", 0},
      {"minor fails", "kvGetProperty", kvPropSys_VerMinor, "KVOR driver", 0},
      {"phase fails", "kvGetProperty", kvPropSys_VerPhase, "KVOR driver", 0},
      {"build fails", "kvGetProperty", kvPropSys_VerBuild, "KVOR driver", 1},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.what);
    kvsimReset();
    if (c.failingFunction != nullptr && c.failingProperty == 0) {
      kvsimFailCall(c.failingFunction, -1, 1);
    } else if (c.failingFunction != nullptr) {
      kvsimFailProperty(c.failingFunction, c.failingProperty, -1, 1);
    }
    kvsimLogClear();
    EXPECT_EQ(DriverVersionLine(), c.line);
    EXPECT_EQ(kvsimCountCalls("kvSystemClose"), 1) << "closed in any case";
    EXPECT_EQ(kvsimCountPropertyReads(kvPropSys_VerBuild), c.buildReads);
  }
}

}  // namespace
