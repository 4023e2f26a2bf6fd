// Signal sessions of the driver stand-in made with a database file: values encoded into frames
// on one interface and decoded on the joined one, single point, as pairs and as waveforms.
#include <array>
#include <cmath>
#include <iterator>
#include <vector>

#include "frame_test_support.h"
#include "signal_test_support.h"

namespace {

using namespace kvsvtest;

constexpr uint64_t kSecond = 10000000;  // raw time units

class KvorSignalDatabase : public KvorTest {
 protected:
  // Pairs of each signal of an XY reader, at most `run` each.
  struct tPairs {
    std::vector<std::vector<double>> values;
    std::vector<std::vector<uint64_t>> times;
  };
  static tPairs ReadPairs(uint32_t reader, uint32_t count, uint32_t run,
                          const uint64_t *limit = nullptr) {
    std::vector<double> values(count * run);
    std::vector<uint64_t> times(count * run);
    std::vector<uint32_t> pairs(count);
    EXPECT_EQ(kvReadSignalXY(reader, limit, values.data(), Bytes(values.size()), times.data(),
                             Bytes(times.size()), pairs.data(), count * 4),
              0);
    tPairs out;
    for (uint32_t i = 0; i < count; ++i) {
      out.values.emplace_back(values.begin() + i * run, values.begin() + i * run + pairs[i]);
      out.times.emplace_back(times.begin() + i * run, times.begin() + i * run + pairs[i]);
    }
    return out;
  }

  static uint32_t Bytes(size_t elements) { return static_cast<uint32_t>(elements * 8); }
};

TEST_F(KvorSignalDatabase, ListItemsNameSignalsOfTheDatabase) {
  struct Case {
    const char *list;
    const char *cluster;
    int32_t status;
  } cases[] = {
      {"DAS_steeringAngleRequest", "", 0},
      {"DAS_steeringControl.DAS_steeringAngleRequest, DI_motorRPM", "", 0},
      {"NoSuchSignal", "", kvsimErrObjectNotFound},
      {"NoSuchFrame.DAS_steeringAngleRequest", "", kvsimErrObjectNotFound},
      {"DAS_control.DAS_steeringAngleRequest", "", kvsimErrObjectNotFound},  // another frame's
      {"EPAS_eacStatus", "", kvsimErrObjectNotFound},                        // two frames have it
      {"EPAS_sysStatus.EPAS_eacStatus", "", 0},
      {"DI_motorRPM", "NoSuchCluster", kvsimErrObjectNotFound},
  };
  for (const Case &c : cases) {
    uint32_t handle = 0xAAAA;
    EXPECT_EQ(
        kvCreateSession(TeslaPath().c_str(), c.cluster, c.list, "CAN1", kvMode_SignalInXY, &handle),
        c.status)
        << c.list;
    if (c.status != 0) {
      EXPECT_EQ(handle, 0xAAAAu) << c.list;
    }
  }
  // Frame sessions name frames by identifier, whatever the database.
  uint32_t frames = 0;
  EXPECT_EQ(
      kvCreateSession(TeslaPath().c_str(), "", "0x123", "CAN1", kvMode_FrameInStream, &frames), 0);
}

TEST_F(KvorSignalDatabase, WritesPutBitExactFramesOnTheBus) {
  struct Case {
    const char *list;
    std::vector<double> values;
    uint32_t identifier;
    std::vector<uint8_t> payload;
  } cases[] = {
      // Big-endian: the request's 15 bits run from bit 6 of byte 0 into byte 1, 12345 = 0x3039.
      {"DAS_steeringAngleRequest,DAS_steeringControlCounter",
       {-403.85, 5},
       1160,
       {0x30, 0x39, 0x05, 0x00}},
      // Multiplexed: the multiplexer (bits 0-2) carries 1, the threshold 40 sits in bits 4-9.
      {"UI_camBlockLaneCheckThreshold", {0.6348}, 1006, {0x81, 0x02, 0, 0, 0, 0, 0, 0}},
      // Little-endian signed: -12345 = 0xCFC7 in bytes 0-1; the range 510 m is 255 steps of 2.
      {"UI_csaRoadCurvC2,UI_csaRoadCurvRange",
       {-0.012345, 510},
       744,
       {0xC7, 0xCF, 0, 0, 0xFF, 0, 0, 0}},
  };
  for (const Case &c : cases) {
    kvsimReset();
    const uint32_t writer = TeslaSession("CAN1", kvMode_SignalOutSinglePoint, c.list);
    const uint32_t frames = Create("CAN2", kvMode_FrameInStream);
    kvsimSetClock(42 * kSecond);
    ASSERT_EQ(kvWriteSignalSinglePoint(writer, c.values.data(), Bytes(c.values.size())), 0);
    std::array<uint8_t, 48> records{};
    uint32_t bytes = 0;
    ASSERT_EQ(kvReadFrame(frames, records.data(), 48, 0.0, &bytes), 0);
    Rec expected;
    expected.identifier = c.identifier;
    expected.payload = c.payload;
    expected.timestamp = 42 * kSecond;
    EXPECT_EQ(Unpack(records.data(), bytes, true), std::vector<Rec>{expected}) << c.list;
  }
}

TEST_F(KvorSignalDatabase, MultiplexedSignalsArriveOnlyWhenTheirValueIsSelected) {
  // The two signals share bits 4-6; each write sends one frame per multiplexer value.
  const std::string list = "UI_donDisableAutoWiperDuration,UI_camBlockLaneCheckThreshold";
  const uint32_t onlyZero =
      TeslaSession("CAN1", kvMode_SignalOutSinglePoint, "UI_donDisableAutoWiperDuration");
  const uint32_t both = TeslaSession("CAN1", kvMode_SignalOutSinglePoint, list);
  const uint32_t reader = TeslaSession("CAN2", kvMode_SignalInXY, list);
  const double seven = 7;
  ASSERT_EQ(kvWriteSignalSinglePoint(onlyZero, &seven, 8), 0);
  tPairs pairs = ReadPairs(reader, 2, 4);
  EXPECT_EQ(pairs.values[0], std::vector<double>{7});
  EXPECT_TRUE(pairs.values[1].empty());  // the frame of value 0 does not carry it
  const double values[] = {3, 0.3174};   // 20 steps
  ASSERT_EQ(kvWriteSignalSinglePoint(both, values, 16), 0);
  pairs = ReadPairs(reader, 2, 4);
  ASSERT_EQ(pairs.values[0].size(), 1u);
  ASSERT_EQ(pairs.values[1].size(), 1u);
  EXPECT_EQ(pairs.values[0][0], 3);
  EXPECT_NEAR(pairs.values[1][0], 0.3174, 0.01587 / 2);
}

TEST_F(KvorSignalDatabase, PairsTravelAtTheirTimesAndAreTakenUpToTheLimit) {
  // Two signals of one frame and one of another; pairs due together in one frame share it.
  const std::string list = "DI_torqueMotor,DI_motorRPM,EPAS_sysStatus.EPAS_internalSAS";
  const uint32_t writer = TeslaSession("CAN1", kvMode_SignalOutXY, list);
  const uint32_t reader = TeslaSession("CAN2", kvMode_SignalInXY, list);
  const uint32_t run = 3;
  const double values[] = {1.25, 2.5, 3.75, 100, 200, 300, -5.5, 0, 0};
  const uint64_t times[] = {10, 20, 30, 10, 20, 30, 15, 0, 0};
  const uint32_t counts[] = {3, 3, 1};
  ASSERT_EQ(kvWriteSignalXY(writer, 0.0, values, Bytes(9), times, Bytes(9), counts, 12), 0);
  // The clock has reached the limit: the read does not wait for runs to fill.
  const uint64_t limit = 20;
  kvsimSetClock(limit);
  tPairs pairs = ReadPairs(reader, 3, run, &limit);
  EXPECT_EQ(pairs.values[0], (std::vector<double>{1.25, 2.5}));
  EXPECT_EQ(pairs.times[0], (std::vector<uint64_t>{10, 20}));
  EXPECT_EQ(pairs.values[1], (std::vector<double>{100, 200}));
  EXPECT_EQ(pairs.times[2], std::vector<uint64_t>{15});
  EXPECT_NEAR(pairs.values[2][0], -5.5, 0.05);
  ReadPairs(reader, 3, run);  // no limit: what is left
  // Without timestamps every value goes at the clock, in order.
  kvsimSetClock(7 * kSecond);
  const uint32_t untimed[] = {2, 0, 0};
  ASSERT_EQ(kvWriteSignalXY(writer, 0.0, values, Bytes(9), nullptr, 0, untimed, 12), 0);
  pairs = ReadPairs(reader, 3, run);
  EXPECT_EQ(pairs.values[0], (std::vector<double>{1.25, 2.5}));
  EXPECT_EQ(pairs.times[0], (std::vector<uint64_t>{7 * kSecond, 7 * kSecond}));
  // Frames of the first signal carry the second one's latest value too.
  EXPECT_EQ(pairs.values[1], (std::vector<double>{300, 300}));
}

TEST_F(KvorSignalDatabase, WaveformsAreSentAndResampledOnTheirGrids) {
  const std::string list = "DI_torqueMotor,DAS_steeringAngleRequest";
  const uint32_t writer = TeslaSession("CAN1", kvMode_SignalOutWaveform, list);
  const uint32_t reader = TeslaSession("CAN2", kvMode_SignalInWaveform, list);
  SetResampleRate(writer, 100.0);  // 0.01 s apart
  SetResampleRate(reader, 200.0);  // twice as often: each value is held for two samples
  const double torque[] = {1.0, -2.0, 3.5};
  const double angle[] = {10.15, 20.25, 30.35};
  const double *written[] = {torque, angle};
  ASSERT_EQ(kvhdnWriteSignalWaveform(writer, 0.0, written, Bytes(3)), 0);
  std::array<double, 8> first{}, second{};
  double *buffers[] = {first.data(), second.data()};
  uint64_t start = 1;
  double interval = 0;
  uint32_t samples = 99;
  // The clock has not moved: only the instant at 0 is due.
  ASSERT_EQ(kvhdnReadSignalWaveform(reader, 0.0, &start, &interval, buffers, Bytes(8), &samples),
            0);
  EXPECT_EQ(samples, 1u);
  EXPECT_EQ(start, 0u);
  EXPECT_EQ(first[0], 1.0);
  kvsimSetClock(kSecond / 100 * 2 + kSecond / 200);  // 0.025 s: five more instants
  ASSERT_EQ(kvhdnReadSignalWaveform(reader, 0.0, &start, &interval, buffers, Bytes(8), &samples),
            0);
  ASSERT_EQ(samples, 5u);
  EXPECT_EQ(start, kSecond / 200);
  EXPECT_DOUBLE_EQ(interval, 1.0 / 200);
  EXPECT_EQ(std::vector<double>(first.begin(), first.begin() + 5),
            (std::vector<double>{1.0, -2.0, -2.0, 3.5, 3.5}));
  for (size_t k = 0; k < 5; ++k) EXPECT_NEAR(second[k], angle[(k + 1) / 2], 0.05) << k;
}

TEST_F(KvorSignalDatabase, EveryInputModeReadsTheLatestValueSinglePoint) {
  const uint32_t writer = TeslaSession("CAN1", kvMode_SignalOutSinglePoint, "DI_motorRPM");
  const uint32_t readers[] = {TeslaSession("CAN2", kvMode_SignalInSinglePoint, "DI_motorRPM"),
                              TeslaSession("CAN2", kvMode_SignalInWaveform, "DI_motorRPM"),
                              TeslaSession("CAN2", kvMode_SignalInXY, "DI_motorRPM")};
  kvsimSetClock(3 * kSecond);
  const double rpm = 1234;
  ASSERT_EQ(kvWriteSignalSinglePoint(writer, &rpm, 8), 0);
  for (uint32_t reader : readers) {
    double value = 0;
    uint64_t time = 0;
    ASSERT_EQ(kvReadSignalSinglePoint(reader, &value, 8, &time, 8), 0);
    EXPECT_EQ(value, 1234);
    EXPECT_EQ(time, 3 * kSecond);
  }
  ASSERT_EQ(kvFlush(readers[2]), 0);
  double value = -1;
  ASSERT_EQ(kvReadSignalSinglePoint(readers[2], &value, 8, nullptr, 0), 0);
  EXPECT_EQ(value, 0.0);  // forgotten
  EXPECT_TRUE(ReadPairs(readers[2], 1, 4).values[0].empty());
}

TEST_F(KvorSignalDatabase, QueueSizeBoundsThePairsOfEachSignal) {
  const uint32_t writer = TeslaSession("CAN1", kvMode_SignalOutXY, "DI_motorRPM");
  const uint32_t reader = TeslaSession("CAN2", kvMode_SignalInXY, "DI_motorRPM");
  EXPECT_EQ(ReadU32(reader, kvPropSession_QueueSize), 4096u);
  const uint32_t two = 2;
  ASSERT_EQ(kvSetProperty(reader, kvPropSession_QueueSize, 4, &two), 0);
  const double values[] = {1, 2, 3};
  const uint64_t times[] = {1, 2, 3};
  const uint32_t count = 3;
  ASSERT_EQ(kvWriteSignalXY(writer, 0.0, values, 24, times, 24, &count, 4), 0);
  EXPECT_EQ(ReadPairs(reader, 1, 8).values[0], (std::vector<double>{1, 2}));  // the third dropped
}

TEST_F(KvorSignalDatabase, CallsCheckModesRegionsAndArguments) {
  const uint32_t xyIn = Create("CAN1", kvMode_SignalInXY, "A,B");
  const uint32_t xyOut = Create("CAN1", kvMode_SignalOutXY, "A,B");
  const uint32_t waveIn = Create("CAN1", kvMode_SignalInWaveform, "A,B");
  const uint32_t waveOut = Create("CAN1", kvMode_SignalOutWaveform, "A,B");
  double values[8] = {};
  uint64_t times[8] = {}, start = 0;
  uint32_t counts[2] = {5, 0}, samples = 0;  // 5: more pairs than a run of 4
  double *buffers[] = {values, values + 4}, *missing[] = {values, nullptr};
  const double noRate = 0.0;
  ASSERT_EQ(kvSetProperty(waveOut, kvPropSession_ResampRate, 8, &noRate), 0);
  const int32_t cases[][2] = {
      {kvReadSignalXY(xyOut, nullptr, values, 64, times, 64, counts, 8), kvsimErrWrongMode},
      {kvReadSignalXY(xyIn, nullptr, values, 64, times, 64, counts, 4), kvsimErrBufferTooSmall},
      {kvReadSignalXY(xyIn, nullptr, values, 64, times, 32, counts, 8), kvsimErrBufferTooSmall},
      {kvReadSignalXY(xyIn, nullptr, values, 64, nullptr, 0, counts, 8), kvsimErrNullPointer},
      {kvWriteSignalXY(xyOut, std::nan(""), values, 64, nullptr, 0, counts, 8),
       kvsimErrInvalidArgument},
      {kvWriteSignalXY(xyOut, 0.0, values, 64, nullptr, 0, counts, 8), kvsimErrInvalidArgument},
      {kvhdnReadSignalWaveform(waveIn, 0.0, &start, values, missing, 32, &samples),
       kvsimErrNullPointer},
      {kvhdnReadSignalWaveform(waveIn, std::nan(""), &start, values, buffers, 32, &samples),
       kvsimErrInvalidArgument},
      {kvhdnReadSignalWaveform(xyIn, 0.0, &start, values, buffers, 32, &samples),
       kvsimErrWrongMode},
      {kvhdnWriteSignalWaveform(waveOut, 0.0, buffers, 32), kvsimErrInvalidArgument},
      {kvhdnWriteSignalWaveform(waveIn, 0.0, buffers, 32), kvsimErrWrongMode},
      {kvReadSignalSinglePoint(xyIn, values, 16, nullptr, 0), kvsimErrWrongMode},  // by name
  };
  for (size_t i = 0; i < std::size(cases); ++i) EXPECT_EQ(cases[i][0], cases[i][1]) << i;
  // The made-up values of a fill go to input sessions only, and end when it is taken back.
  EXPECT_EQ(kvsimSetSignalReadFill(xyOut, 1), -1);
  ASSERT_EQ(kvsimSetSignalReadFill(xyIn, 2), 0);
  ASSERT_EQ(kvsimSetSignalReadFill(xyIn, -1), 0);
  EXPECT_TRUE(ReadPairs(xyIn, 2, 3).values[0].empty());
}

}  // namespace
