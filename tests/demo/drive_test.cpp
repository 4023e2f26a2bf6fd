// The drive of kvsv-demo on every database file of the field: every frame written arrives as the
// conversion session makes it, every value read back, single point, from the frames, as pairs and
// as waveform samples, is the one written within its resolution, the steady loop allocates
// nothing, and the end of the program closes every session.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <filesystem>
#include <fstream>
#include <functional>
#include <string>
#include <vector>

#include "drive_scenario.h"
#include "kvsim.h"
#include "kvsvplatform.h"
#include "paths/paths_test_support.h"

namespace {

using namespace kvsvdemo;

constexpr int32_t kSteps = 120;

std::vector<std::string> FieldFiles() {
  std::vector<std::string> files;
  for (const auto &entry : std::filesystem::directory_iterator(KVSV_DBC_DIR)) {
    if (entry.path().extension() == ".dbc") files.push_back(entry.path().filename().string());
  }
  std::sort(files.begin(), files.end());
  return files;
}

tDriveResult Drive(const std::string &dbc, const std::string &interfaceName,
                   const kvsvtest::cTempDir &directory,
                   std::function<void()> afterReset = nullptr) {
  tDriveOptions options;
  options.afterReset = std::move(afterReset);
  options.dbcPath = dbc.find('/') == std::string::npos ? std::string(KVSV_DBC_DIR) + "/" + dbc : dbc;
  options.interfaceName = interfaceName;
  options.directory = directory.Path();
  options.steps = kSteps;
  return RunDrive(LinkedExports(), options);
}

// The value written last at or before `rawTime`; 0.0 before the first write.
double WrittenAt(const tDriveResult &r, size_t signal, uint64_t rawTime) {
  double value = 0.0;
  for (size_t k = 0; k < r.writeTimes.size() && r.writeTimes[k] <= rawTime; ++k)
    value = r.written[k][signal];
  return value;
}

// Every frame that went arrives as the conversion makes it, and every value read back, single
// point, from the frames, as pairs and as waveform samples, is the one in force.
void ExpectEverythingReadBack(const tDriveResult &r) {
  ASSERT_FALSE(r.signals.empty());
  const size_t ticks = static_cast<size_t>(std::llround(kSteps * kStepSeconds / r.tickSeconds));
  ASSERT_EQ(r.written.size(), ticks);
  const size_t n = r.signals.size();

  // The drive moves: a check against values that never change would prove little.
  size_t moving = 0;
  for (size_t i = 0; i < n; ++i) moving += r.written.front()[i] != r.written[ticks / 2][i];
  EXPECT_GT(moving, 0u);

  for (size_t k = 0; k < r.written.size(); ++k) {
    SCOPED_TRACE("tick " + std::to_string(k));
    // At a tick with no frame due the bus carries nothing.
    bool due = false;
    for (const tFrameGroup &g : r.groups) due = due || g.DueAt(k);
    ASSERT_EQ(r.framesExpected[k].empty(), !due);
    ASSERT_EQ(r.framesRead[k].size(), r.framesExpected[k].size());
    for (size_t f = 0; f < r.framesRead[k].size(); ++f) {
      EXPECT_TRUE(r.framesRead[k][f].SameContent(r.framesExpected[k][f])) << "frame " << f;
      EXPECT_EQ(r.framesRead[k][f].rawTime, r.writeTimes[k]);
    }
    ASSERT_EQ(r.singlePoint[k].size(), n);
    ASSERT_EQ(r.fromFrames[k].size(), n);
    for (size_t i = 0; i < n; ++i) {
      EXPECT_NEAR(r.singlePoint[k][i], r.written[k][i], r.signals[i].Tolerance())
          << r.signals[i].item;
      // A frame that did not go this tick is not among those converted back.
      if (r.WrittenAt(i, k)) {
        EXPECT_NEAR(r.fromFrames[k][i], r.written[k][i], r.signals[i].Tolerance())
            << r.signals[i].item;
      }
    }
  }

  ASSERT_EQ(r.xyValues.size(), n);
  for (size_t i = 0; i < n; ++i) {
    SCOPED_TRACE(r.signals[i].item);
    std::vector<uint64_t> times;
    std::vector<double> values;
    for (size_t k = 0; k < ticks; ++k) {
      if (!r.WrittenAt(i, k)) continue;
      times.push_back(r.writeTimes[k]);
      values.push_back(r.written[k][i]);
    }
    EXPECT_EQ(r.xyTimes[i], times);
    ASSERT_EQ(r.xyValues[i].size(), values.size());
    for (size_t k = 0; k < values.size(); ++k)
      EXPECT_NEAR(r.xyValues[i][k], values[k], r.signals[i].Tolerance()) << "pair " << k;
  }

  ASSERT_EQ(r.waveforms.size(), n);
  for (size_t i = 0; i < n; ++i) {
    SCOPED_TRACE(r.signals[i].item);
    const tWaveform &w = r.waveforms[i];
    EXPECT_DOUBLE_EQ(w.interval, kStepSeconds);
    ASSERT_EQ(w.samples.size(), static_cast<size_t>(kSteps + 1));
    for (size_t j = 0; j < w.samples.size(); ++j) {
      const uint64_t at =
          w.startRawTime + static_cast<uint64_t>(std::llround(j * w.interval * 1e7));
      EXPECT_NEAR(w.samples[j], WrittenAt(r, i, at), r.signals[i].Tolerance()) << "sample " << j;
    }
  }

  EXPECT_EQ(r.steadyAllocations, 0u);
  EXPECT_GT(r.steadyFrames, 0);
  // One output session per frame, then the five that read and convert, each as its properties
  // tell it through the library.
  EXPECT_EQ(r.sessionsOpened, static_cast<int32_t>(r.groups.size()) + 5);
  ASSERT_EQ(r.sessions.size(), static_cast<size_t>(r.sessionsOpened));
  for (size_t g = 0; g < r.groups.size(); ++g) {
    EXPECT_EQ(r.sessions[g].name, r.groups[g].session);
    EXPECT_EQ(r.sessions[g].interfaceName, "CAN1");
    EXPECT_EQ(r.sessions[g].mode, static_cast<uint32_t>(kvMode_SignalOutSinglePoint));
    EXPECT_EQ(r.sessions[g].numInList, r.groups[g].signals.size());
  }
  EXPECT_EQ(r.sessions.back().interfaceName, r.readInterface);
  EXPECT_EQ(r.sessions.back().mode, static_cast<uint32_t>(kvMode_SignalInWaveform));
  EXPECT_EQ(r.sessions.back().numInList, n);
  EXPECT_EQ(r.closesAtEnd, r.sessionsOpened);
  EXPECT_EQ(r.sessionsLeftOpen, 0);
}

class DriveOnFieldFile : public testing::TestWithParam<std::string> {};

// The field's files give no cycle times: every frame goes every step.
TEST_P(DriveOnFieldFile, EverythingWrittenIsReadBack) {
  kvsvtest::cTempDir directory;
  const tDriveResult r = Drive(GetParam(), "CAN1", directory);
  ASSERT_EQ(r.status, 0) << r.failedCall << ": " << r.statusText;
  EXPECT_DOUBLE_EQ(r.tickSeconds, kStepSeconds);
  for (const tFrameGroup &g : r.groups) EXPECT_EQ(g.cycleTicks, 1) << g.session;
  ExpectEverythingReadBack(r);
}

INSTANTIATE_TEST_SUITE_P(FieldFiles, DriveOnFieldFile, testing::ValuesIn(FieldFiles()),
                         [](const testing::TestParamInfo<std::string> &info) {
                           std::string name = info.param.substr(0, info.param.find('.'));
                           for (char &c : name)
                             c = std::isalnum(static_cast<unsigned char>(c)) ? c : '_';
                           return name;
                         });

// A frame goes at the cycle time its database gives it; the clock ticks at the period that
// divides them all.
TEST(Drive, FramesGoAtTheirCycleTimes) {
  kvsvtest::cTempDir directory;
  const std::string dbc = directory.Path() + "/tesla_cycles.dbc";
  {
    std::ifstream in(std::string(KVSV_DBC_DIR) + "/tesla_can.dbc", std::ios::binary);
    std::ofstream out(dbc, std::ios::binary);
    out << in.rdbuf()
        << "\nBA_DEF_ BO_ \"GenMsgCycleTime\" INT 0 65535;\n"
           "BA_DEF_DEF_ \"GenMsgCycleTime\" 0;\n"
           "BA_ \"GenMsgCycleTime\" BO_ 280 20;\n"    // DI_torque2, 0x118
           "BA_ \"GenMsgCycleTime\" BO_ 1160 15;\n";  // DAS_steeringControl, 0x488
  }
  const tDriveResult r = Drive(dbc, "CAN1", directory);
  ASSERT_EQ(r.status, 0) << r.failedCall << ": " << r.statusText;
  EXPECT_DOUBLE_EQ(r.tickSeconds, 0.005);
  ASSERT_EQ(r.groups.size(), 2u);
  EXPECT_EQ(r.groups[0].frameId, 0x118u);
  EXPECT_EQ(r.groups[0].cycleTicks, 4);
  EXPECT_EQ(r.groups[1].frameId, 0x488u);
  EXPECT_EQ(r.groups[1].cycleTicks, 3);
  // Each frame on the bus as often as its cycle says: first at tick 0, then every cycle.
  const size_t ticks = r.written.size();
  for (size_t g = 0; g < 2; ++g) {
    size_t seen = 0;
    for (const std::vector<tFrame> &tick : r.framesRead)
      for (const tFrame &f : tick) seen += f.identifier == r.groups[g].frameId;
    const size_t cycle = static_cast<size_t>(r.groups[g].cycleTicks);
    EXPECT_EQ(seen, (ticks + cycle - 1) / cycle) << r.groups[g].session;
  }
  ExpectEverythingReadBack(r);
}

TEST(Drive, TheOtherNetworkCarriesItToo) {
  kvsvtest::cTempDir directory;
  const tDriveResult r = Drive("tesla_can.dbc", "CAN4", directory);
  ASSERT_EQ(r.status, 0) << r.failedCall << ": " << r.statusText;
  EXPECT_EQ(r.readInterface, "CAN3");
  ASSERT_FALSE(r.singlePoint.empty());
  for (size_t i = 0; i < r.signals.size(); ++i)
    EXPECT_NEAR(r.singlePoint.back()[i], r.written.back()[i], r.signals[i].Tolerance());
}

TEST(Drive, PicksSpeedSteeringAndGearByName) {
  kvsvtest::cTempDir directory;
  const tDriveResult r = Drive("tesla_can.dbc", "CAN1", directory);
  ASSERT_GE(r.signals.size(), 3u);
  EXPECT_EQ(r.signals[0].role, eRole::kSpeed);
  EXPECT_EQ(r.signals[0].item, "DI_torque2.DI_vehicleSpeed");
  EXPECT_EQ(r.signals[0].unit, "MPH");
  // The drive starts from standstill and comes back to it.
  EXPECT_GE(r.written.front()[0], 0.0);
  EXPECT_LT(r.written.front()[0], 1.0);
  double top = 0.0;
  for (const std::vector<double> &step : r.written) top = std::max(top, step[0]);
  EXPECT_GT(top, 100.0);
  EXPECT_EQ(r.signals[1].role, eRole::kSteering);
  EXPECT_EQ(r.signals[2].role, eRole::kGear);
}

TEST(Drive, AFailureNamesTheCallAndItsStatus) {
  kvsvtest::cTempDir directory;
  const auto failModeRead = [] {
    kvsimFailProperty("kvGetProperty", kvPropSession_Mode, kvsimErrPropertyUnknown, 1);
  };
  const auto failNameRead = [] {
    kvsimFailProperty("kvGetPropertySize", kvPropSession_IntfName, kvsimErrPropertyUnknown, 1);
  };
  const struct {
    const char *dbc;
    const char *interfaceName;
    std::function<void()> afterReset;
    int32_t status;
    const char *call;
    const char *property;  // named by the error information of a property call
  } cases[] = {
      {"no_such_file.dbc", "CAN1", nullptr, kvsimErrDatabaseNotFound, "kvdbOpenDatabase ", ""},
      {"tesla_can.dbc", "LIN1", nullptr, kvErrInternal, "no partner on the network of LIN1", ""},
      {"tesla_can.dbc", "CAN1", failModeRead, kvsimErrPropertyUnknown,
       "kvsvSessionGetPropU32 of Drive_DI_torque2", "Mode"},
      {"tesla_can.dbc", "CAN1", failNameRead, kvsimErrPropertyUnknown,
       "kvsvSessionGetPropString of Drive_DI_torque2", "IntfName"},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.dbc + std::string(" on ") + c.interfaceName + ", " + c.call);
    const tDriveResult r = Drive(c.dbc, c.interfaceName, directory, c.afterReset);
    EXPECT_EQ(r.status, c.status);
    EXPECT_EQ(r.failedCall.rfind(c.call, 0), 0u) << r.failedCall;
    EXPECT_FALSE(r.statusText.empty());
    EXPECT_EQ(r.failedProperty, c.property);
    EXPECT_TRUE(r.written.empty());
    // Once sessions were opened, the program still ends: the host closes them all, the one
    // whose property failed included.
    if (*c.property != '\0') {
      EXPECT_EQ(r.closesAtEnd, r.sessionsOpened + 1);
      EXPECT_EQ(r.sessionsLeftOpen, 0);
    }
  }
}

TEST(Drive, PartnerInterfaces) {
  const std::pair<const char *, const char *> cases[] = {
      {"CAN1", "CAN2"}, {"CAN2", "CAN1"}, {"CAN3", "CAN4"}, {"CAN4", "CAN3"},
      {"CAN5", ""},     {"LIN1", ""},     {"CAN", ""},      {"CAN10", ""}};
  for (const auto &[name, partner] : cases) EXPECT_EQ(PartnerInterface(name), partner) << name;
}

TEST(DriveSignal, ValuesLieOnWholeRawStepsWithinTheRange) {
  tDriveSignal s;
  s.scale = 0.05;
  s.offset = -25.0;
  s.rawLow = 0;
  s.rawHigh = 4095;
  EXPECT_DOUBLE_EQ(s.ValueAt(0.0), -25.0);
  EXPECT_DOUBLE_EQ(s.ValueAt(1.0), 4095 * 0.05 - 25.0);
  EXPECT_DOUBLE_EQ(s.ValueAt(2.0), s.ValueAt(1.0));
  EXPECT_DOUBLE_EQ(s.ValueAt(-1.0), s.ValueAt(0.0));
  const double mid = s.ValueAt(0.5);
  EXPECT_NEAR(std::remainder((mid - s.offset) / s.scale, 1.0), 0.0, 1e-9);
  EXPECT_DOUBLE_EQ(s.Tolerance(), 0.025);
  EXPECT_DOUBLE_EQ(s.ValueAt(s.FractionOf(0.0)), 0.0);
  EXPECT_DOUBLE_EQ(s.FractionOf(-100.0), 0.0);
  EXPECT_DOUBLE_EQ(s.FractionOf(1000.0), 1.0);
}

}  // namespace
