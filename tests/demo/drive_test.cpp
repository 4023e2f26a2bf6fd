// The drive of kvsv-demo on every database file of the field: every frame written arrives as the
// conversion session makes it, every value read back, single point, from the frames, as pairs and
// as waveform samples, is the one written within its resolution, the steady loop allocates
// nothing, and the end of the program closes every session. Then the picture of its waveforms.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <filesystem>
#include <fstream>
#include <functional>
#include <regex>
#include <sstream>
#include <string>
#include <tuple>
#include <vector>

#include "database_property_tour.h"
#include "database_tour.h"
#include "drive_scenario.h"
#include "receive_filter_tour.h"
#include "kvsim.h"
#include "kvsvplatform.h"
#include "signals_svg.h"
#include "support/scoped_env.h"
#include "support/temp_dir.h"
#include "svsim.h"

namespace {

using namespace kvsvdemo;

constexpr int32_t kSteps = 120;

tDriveResult Drive(const std::string &dbc, const std::string &interfaceName,
                   std::function<void()> afterReset = nullptr) {
  const kvsvtest::cTempDir directory;
  const std::string path = dbc.find('/') == std::string::npos ? KVSV_DBC_DIR "/" + dbc : dbc;
  return RunDrive(LinkedExports(), {path, interfaceName, directory.Path(), kSteps,
                                    tDriveOptions().maxSignals, std::move(afterReset)});
}

// The value written last at or before `rawTime`; 0.0 before the first write.
double WrittenAt(const tDriveResult &r, size_t signal, uint64_t rawTime) {
  double value = 0.0;
  for (size_t k = 0; k < r.writeTimes.size() && r.writeTimes[k] <= rawTime; ++k)
    value = r.written[k][signal];
  return value;
}

auto Summary(const tSessionSummary &s) {
  return std::make_tuple(s.name, s.interfaceName, s.mode, s.numInList);
}

// Every frame that went on `interfaceName` arrives as the conversion makes it, and every value
// read back, single point, from the frames, as pairs and as waveform samples, is the one in force.
void ExpectEverythingReadBack(const tDriveResult &r, const std::string &interfaceName) {
  ASSERT_EQ(r.status, 0) << r.failedCall << ": " << r.statusText;
  ASSERT_FALSE(r.signals.empty());
  const size_t ticks = static_cast<size_t>(std::llround(kSteps * kStepSeconds / r.tickSeconds));
  const size_t n = r.signals.size();
  ASSERT_EQ(r.written.size(), ticks);
  // The drive moves: a check against values that never change would prove little.
  EXPECT_NE(r.written.front(), r.written[ticks / 2]);
  ASSERT_EQ(std::make_pair(r.xyValues.size(), r.waveforms.size()), std::make_pair(n, n));
  std::vector<std::vector<uint64_t>> xyTimes(n);
  for (size_t k = 0; k < ticks; ++k) {
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
    ASSERT_EQ(std::make_pair(r.singlePoint[k].size(), r.fromFrames[k].size()),
              std::make_pair(n, n));
    for (size_t i = 0; i < n; ++i) {
      const double tolerance = r.signals[i].Tolerance();
      EXPECT_NEAR(r.singlePoint[k][i], r.written[k][i], tolerance) << r.signals[i].item;
      // A frame that did not go this tick is not among those converted back, nor among the pairs.
      if (!r.WrittenAt(i, k)) continue;
      EXPECT_NEAR(r.fromFrames[k][i], r.written[k][i], tolerance) << r.signals[i].item;
      const size_t pair = xyTimes[i].size();
      xyTimes[i].push_back(r.writeTimes[k]);
      ASSERT_LT(pair, r.xyValues[i].size()) << r.signals[i].item;
      EXPECT_NEAR(r.xyValues[i][pair], r.written[k][i], tolerance) << r.signals[i].item;
    }
  }
  for (size_t i = 0; i < n; ++i) {
    SCOPED_TRACE(r.signals[i].item);
    EXPECT_EQ(r.xyTimes[i], xyTimes[i]);
    EXPECT_EQ(r.xyValues[i].size(), xyTimes[i].size());
    const tWaveform &w = r.waveforms[i];
    EXPECT_DOUBLE_EQ(w.interval, kStepSeconds);
    ASSERT_EQ(w.samples.size(), static_cast<size_t>(kSteps + 1));
    for (size_t j = 0; j < w.samples.size(); ++j) {
      const uint64_t at = w.startRawTime + std::llround(j * w.interval * 1e7);  // 100 ns units
      EXPECT_NEAR(w.samples[j], WrittenAt(r, i, at), r.signals[i].Tolerance()) << "sample " << j;
    }
  }
  EXPECT_EQ(r.steadyAllocations, 0u);
  EXPECT_GT(r.steadyFrames, 0);
  // One output session per frame, then the five that read and convert, each as its properties
  // tell it through the library; the host closes every one at the end.
  ASSERT_EQ(r.sessions.size(), r.groups.size() + 5);
  for (size_t g = 0; g < r.groups.size(); ++g) {
    EXPECT_EQ(Summary(r.sessions[g]),
              Summary({r.groups[g].session, interfaceName, kvMode_SignalOutSinglePoint,
                       static_cast<uint32_t>(r.groups[g].signals.size())}));
  }
  const tSessionSummary &last = r.sessions.back();
  EXPECT_EQ(Summary(last), Summary({last.name, PartnerInterface(interfaceName),
                                    kvMode_SignalInWaveform, static_cast<uint32_t>(n)}));
  EXPECT_EQ(std::make_tuple(r.sessionsOpened, r.closesAtEnd, r.sessionsLeftOpen),
            std::make_tuple(static_cast<int32_t>(r.sessions.size()), r.sessionsOpened, 0));
}

class DriveOnFieldFile : public testing::TestWithParam<std::string> {};

// The field's files give no cycle times: every frame goes every step.
TEST_P(DriveOnFieldFile, EverythingWrittenIsReadBack) {
  const tDriveResult r = Drive(GetParam(), "CAN1");
  EXPECT_DOUBLE_EQ(r.tickSeconds, kStepSeconds);
  for (const tFrameGroup &g : r.groups) EXPECT_EQ(g.cycleTicks, 1) << g.session;
  ExpectEverythingReadBack(r, "CAN1");
}

std::vector<std::string> FieldFiles() {
  std::vector<std::string> files;
  for (const auto &entry : std::filesystem::directory_iterator(KVSV_DBC_DIR))
    if (entry.path().extension() == ".dbc") files.push_back(entry.path().filename().string());
  std::sort(files.begin(), files.end());
  return files;
}

INSTANTIATE_TEST_SUITE_P(FieldFiles, DriveOnFieldFile, testing::ValuesIn(FieldFiles()));

// A frame goes at the cycle time its database gives it; the clock ticks at the period that
// divides them all.
TEST(Drive, FramesGoAtTheirCycleTimes) {
  const kvsvtest::cTempDir directory;
  const std::string dbc = directory.Path() + "/tesla_cycles.dbc";
  std::ofstream(dbc, std::ios::binary)
      << std::ifstream(KVSV_DBC_DIR "/tesla_can.dbc", std::ios::binary).rdbuf()
      << "\nBA_DEF_ BO_ \"GenMsgCycleTime\" INT 0 65535;\n"
         "BA_DEF_DEF_ \"GenMsgCycleTime\" 0;\n"
         "BA_ \"GenMsgCycleTime\" BO_ 280 20;\n"    // DI_torque2, 0x118
         "BA_ \"GenMsgCycleTime\" BO_ 1160 15;\n";  // DAS_steeringControl, 0x488
  const tDriveResult r = Drive(dbc, "CAN1");
  EXPECT_DOUBLE_EQ(r.tickSeconds, 0.005);
  ASSERT_EQ(r.groups.size(), 2u);
  // Each frame on the bus as often as its cycle says: first at tick 0, then every cycle.
  for (const auto &[g, frameId, cycle] : {std::make_tuple(0, 0x118u, 4), {1, 0x488u, 3}}) {
    EXPECT_EQ(std::tie(r.groups[g].frameId, r.groups[g].cycleTicks), std::tie(frameId, cycle));
    size_t seen = 0;
    for (const std::vector<tFrame> &tick : r.framesRead)
      for (const tFrame &f : tick) seen += f.identifier == frameId;
    EXPECT_EQ(seen, (r.written.size() + cycle - 1) / cycle) << r.groups[g].session;
  }
  ExpectEverythingReadBack(r, "CAN1");
}

// The other network, read on its partner; speed, steering and gear picked by name.
TEST(Drive, TheOtherNetworkAndTheSignalsPickedByName) {
  const tDriveResult r = Drive("tesla_can.dbc", "CAN4");
  EXPECT_EQ(r.readInterface, "CAN3");
  ExpectEverythingReadBack(r, "CAN4");
  ASSERT_GE(r.signals.size(), 3u);
  EXPECT_EQ(std::tie(r.signals[0].item, r.signals[0].unit, r.signals[0].role, r.signals[1].role,
                     r.signals[2].role),
            std::make_tuple("DI_torque2.DI_vehicleSpeed", "MPH", eRole::kSpeed, eRole::kSteering,
                            eRole::kGear));
  // The drive starts from standstill and goes above 100.
  EXPECT_TRUE(r.written.front()[0] >= 0.0 && r.written.front()[0] < 1.0) << r.written.front()[0];
  double top = 0.0;
  for (const std::vector<double> &step : r.written) top = std::max(top, step[0]);
  EXPECT_GT(top, 100.0);
}

TEST(Drive, AFailureNamesTheCallAndItsStatus) {
  // The driver call made to fail with kvsimErrPropertyUnknown for a property, if any; the call
  // and the property that the failure names.
  // clang-format off
  const struct { const char *dbc, *interfaceName, *fail; uint32_t propertyId; int32_t status;
                 const char *call, *property; } cases[] = {
      {"no_such_file.dbc", "CAN1", nullptr, 0, kvsimErrDatabaseNotFound, "kvdbOpenDatabase ", ""},
      {"tesla_can.dbc", "LIN1", nullptr, 0, kvErrInternal, "no partner on the network of LIN1", ""},
      {"tesla_can.dbc", "CAN1", "kvGetProperty", kvPropSession_Mode, kvsimErrPropertyUnknown,
       "kvsvSessionGetPropU32 of Drive_DI_torque2", "Mode"},
      {"tesla_can.dbc", "CAN1", "kvGetPropertySize", kvPropSession_IntfName, kvsimErrPropertyUnknown,
       "kvsvSessionGetPropString of Drive_DI_torque2", "IntfName"}};
  // clang-format on
  for (const auto &c : cases) {
    SCOPED_TRACE(c.dbc + std::string(" on ") + c.interfaceName + ", " + c.call);
    const tDriveResult r = Drive(c.dbc, c.interfaceName, [&c] {
      if (c.fail != nullptr) kvsimFailProperty(c.fail, c.propertyId, kvsimErrPropertyUnknown, 1);
    });
    EXPECT_EQ(r.status, c.status);
    EXPECT_EQ(r.failedCall.rfind(c.call, 0), 0u) << r.failedCall;
    EXPECT_FALSE(r.statusText.empty());
    EXPECT_EQ(r.failedProperty, c.property);
    EXPECT_TRUE(r.written.empty());
    // Once sessions were opened, the program still ends: the host closes them all, the one
    // whose property failed included.
    if (*c.property == '\0') continue;
    EXPECT_EQ(std::make_pair(r.closesAtEnd, r.sessionsLeftOpen),
              std::make_pair(r.sessionsOpened + 1, 0));
  }
}

TEST(Drive, PartnerInterfacesAndValuesOnWholeRawSteps) {
  // clang-format off
  const std::pair<const char *, const char *> partners[] = {{"CAN1", "CAN2"}, {"CAN2", "CAN1"},
      {"CAN3", "CAN4"}, {"CAN4", "CAN3"}, {"CAN5", ""}, {"LIN1", ""}, {"CAN", ""}, {"CAN10", ""}};
  // clang-format on
  for (const auto &[name, partner] : partners) EXPECT_EQ(PartnerInterface(name), partner) << name;
  const tDriveSignal s{"", "", 0, 0.0, eRole::kOther, 0.05, -25.0, 0, 4095};
  EXPECT_DOUBLE_EQ(s.ValueAt(0.0), -25.0);
  EXPECT_DOUBLE_EQ(s.ValueAt(1.0), 4095 * 0.05 - 25.0);
  EXPECT_DOUBLE_EQ(s.ValueAt(2.0), s.ValueAt(1.0));
  EXPECT_DOUBLE_EQ(s.ValueAt(-1.0), s.ValueAt(0.0));
  EXPECT_NEAR(std::remainder((s.ValueAt(0.5) - s.offset) / s.scale, 1.0), 0.0, 1e-9);
  EXPECT_DOUBLE_EQ(s.Tolerance(), 0.025);
  EXPECT_DOUBLE_EQ(s.ValueAt(s.FractionOf(0.0)), 0.0);
  EXPECT_EQ(std::make_pair(s.FractionOf(-100.0), s.FractionOf(1000.0)), std::make_pair(0.0, 1.0));
}

// Both database tours on the tesla file, with the driver's aliases kept in a directory of the
// test's own.
class DatabaseTour : public testing::Test {
 protected:
  void SetUp() override { kvsimReset(); }

  const kvsvtest::cTempDir directory_;
  const kvsvtest::cScopedEnv config_{"KVSIM_CONFIG_DIR", directory_.Sub("config")};
  const std::string dbc_ = KVSV_DBC_DIR "/tesla_can.dbc";
  const std::string text_ = kvsvtest::ReadFile(dbc_);
};

// The database tour of the demonstration on a real file: the cluster's frames by reference, the
// texts the library builds for what it creates, the edit saved and reloaded, and nothing left
// open or registered when the program's references end.
TEST_F(DatabaseTour, EditsSavesAndReloadsThroughTheExportsAndLeavesNothingOpen) {
  const tDatabaseTour t =
      RunDatabaseTour(LinkedExports(), dbc_, directory_.Path(), "DAS_control", "DAS_setSpeed");
  ASSERT_EQ(t.status, 0) << t.failedCall;
  const std::regex frameLine(R"(\nBO_ \d+ (\w+) *:)");
  std::vector<std::string> frames;
  for (std::sregex_iterator it(text_.begin(), text_.end(), frameLine), end; it != end; ++it)
    frames.push_back((*it)[1].str() + "\ntesla");
  EXPECT_EQ(t.clusterFrames, frames);
  EXPECT_EQ(t.scheduleReference, "DemoSchedule\ntesla");
  EXPECT_TRUE(t.addedFrameReloaded);
  EXPECT_NE(kvsvtest::ReadFile(t.savedPath).find(" DemoFrame"), std::string::npos);
  EXPECT_EQ(t.aliases, (std::vector<std::string>{"tesla", "tesla_edited"}));
  EXPECT_EQ(t.aliasFiles.size(), 2u);
  EXPECT_EQ(std::make_tuple(t.openDatabasesAtEnd, kvsimLoadedDatabaseCount(), svsimRefCount()),
            std::make_tuple(0u, 0, 0));
}

// The property tour on a real file: every signal of the frame reads as the file's own line, a
// changed factor is in the saved file, and a PDU mapping written is read back.
TEST_F(DatabaseTour, ReadsSignalsAsTheFileWritesThemAndKeepsWhatItChanges) {
  const tPropertyTour t = RunPropertyTour(LinkedExports(), dbc_, directory_.Path(), "DAS_control");
  ASSERT_EQ(t.status, 0) << t.failedCall;
  const size_t frame = text_.find("BO_ 697 DAS_control:");
  const std::regex signalLine(R"re(^ SG_ (\w+) : (.*) \w+$)re");
  std::vector<std::string> expected, read;
  std::istringstream lines(text_.substr(text_.find('\n', frame) + 1));
  std::smatch m;
  for (std::string line; std::getline(lines, line) && std::regex_match(line, m, signalLine);)
    expected.push_back(m[1].str() + " " + m[2].str());
  for (const tSignalRow &row : t.signals) read.push_back(row.name + " " + row.AsFileText());
  EXPECT_EQ(read, expected);
  EXPECT_EQ(t.factorReloaded, t.factorSet);
  EXPECT_NE(t.factorSet, t.factorBefore);
  ASSERT_EQ(t.mappingBefore.size(), 1u);
  ASSERT_EQ(t.mappingAfter.size(), 1u);
  EXPECT_EQ(t.mappingAfter[0].pdu, t.mappingBefore[0].pdu);
  EXPECT_EQ(std::make_pair(t.mappingAfter[0].startBit, t.mappingAfter[0].updateBit),
            std::make_pair(t.mappingBefore[0].startBit, 63u));
  EXPECT_EQ(std::make_tuple(kvsimLoadedDatabaseCount(), svsimRefCount()), std::make_tuple(0, 0));
}

// The receive filter tour: what is written is read back field by field, and the session ends.
TEST(ReceiveFilterTour, ReadsBackEachEntryAndEndsItsSession) {
  kvsimReset();
  const std::vector<tFilterEntry> filter = {{true, 0x88F7, false, 0, true, "ptp"},
                                            {false, 0, true, 17, false, ""},
                                            {false, 0, false, 0, true, "eighteen_chars_abc"}};
  const tFilterTour t = RunReceiveFilterTour(LinkedExports(), "ENET1", filter);
  ASSERT_EQ(t.status, 0) << t.failedCall;
  EXPECT_EQ(t.read, filter);
  EXPECT_EQ(std::make_tuple(kvsimOpenSessionCount(), svsimRefCount()), std::make_tuple(0, 0));
}

// The points of each polyline of `svg`.
std::vector<std::string> Polylines(const std::string &svg) {
  const std::regex polyline("<polyline[^>]*points=\"([^\"]*)\"");
  std::vector<std::string> points;
  for (std::sregex_iterator it(svg.begin(), svg.end(), polyline), end; it != end; ++it)
    points.push_back((*it)[1]);
  return points;
}

// One polyline per curve with a point per sample, over the shared time axis (x 80 to 720), each
// curve filling its own range (y 360 to 50) and a flat one in the middle; labels escaped.
TEST(SignalsSvg, EachCurveIsAPolylineScaledToItsOwnRange) {
  const std::string svg = PlotSvg("two curves", {{"speed (kph)", 0.01, {0, 10, 40, 90, 40, 10}},
                                                 {"steering <deg> & more", 0.025, {-5, 5, -5}}});
  EXPECT_EQ(svg.rfind("<svg xmlns=\"http://www.w3.org/2000/svg\"", 0), 0u);
  EXPECT_EQ(svg.substr(svg.size() - 7), "</svg>\n");
  EXPECT_NE(svg.find(">steering &lt;deg&gt; &amp; more</text>"), std::string::npos);
  EXPECT_EQ(Polylines(svg),
            (std::vector<std::string>{"80,360 208,325.6 336,222.2 464,50 592,222.2 720,325.6",
                                      "80,360 400,50 720,360"}));
  EXPECT_EQ(Polylines(PlotSvg("flat", {{"gear", 0.01, {3, 3, 3}}})),
            std::vector<std::string>{"80,205 400,205 720,205"});
}

}  // namespace
