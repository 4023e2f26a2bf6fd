// Run-mode flags: what the control API sets is what the host operations answer.
#include <gtest/gtest.h>

#include "host_fixture.h"

namespace {

using RunMode = HostTest;

TEST_F(RunMode, FlagsAnswerWhatWasSet) {
  struct Mode {
    int32_t bound, runTime, fullFeature;
  };
  for (const Mode &m :
       {Mode{1, 0, 0}, Mode{0, 1, 0}, Mode{0, 0, 1}, Mode{1, 1, 1}, Mode{0, 0, 0}}) {
    svsimSetRunMode(m.bound, m.runTime, m.fullFeature);
    EXPECT_EQ(svIsBoundApp(0), m.bound);
    EXPECT_EQ(svIsRunTime(0), m.runTime);
    EXPECT_EQ(svIsFullFeatureRunTime(0), m.fullFeature);
  }
}

TEST_F(RunMode, ADevelopmentEnvironmentByDefault) {
  svsimSetRunMode(1, 1, 1);
  svsimReset();
  EXPECT_EQ(svIsBoundApp(0), 0);
  EXPECT_EQ(svIsRunTime(0), 0);
  EXPECT_EQ(svIsFullFeatureRunTime(0), 0);
}

}  // namespace
