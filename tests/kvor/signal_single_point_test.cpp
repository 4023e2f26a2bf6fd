// Single-point signals: an input session reads the latest value and timestamp of each signal on
// its network; an output session puts values on it; joined interfaces share a network.
#include <vector>

#include "kvor_test_support.h"

namespace {

using KvorSignalSinglePoint = KvorTest;

constexpr uint64_t kNoon = 133600000000000000ull;  // a raw time in 2024

TEST_F(KvorSignalSinglePoint, AReadGivesTheLatestValuesWithTheirTimestamps) {
  kvsimSetClock(kNoon);
  const uint32_t session = Create("CAN1", kvMode_SignalInSinglePoint, "Speed,Rpm,Gear");
  const uint32_t unset = Create("LIN2", kvMode_SignalInSinglePoint, "Door");
  const double first[] = {88.5, 2400.0};
  ASSERT_EQ(kvsimSetSignalValues(session, first, 2), 2);
  kvsimAdvanceClock(5000);
  const double later[] = {90.25};
  ASSERT_EQ(kvsimSetSignalValues(session, later, 1), 1) << "only the first signal changes";

  double values[3] = {-1, -1, -1};
  uint64_t stamps[3] = {9, 9, 9};
  ASSERT_EQ(kvReadSignalSinglePoint(session, values, sizeof values, stamps, sizeof stamps), 0);
  EXPECT_EQ(std::vector<double>(values, values + 3), (std::vector<double>{90.25, 2400.0, 0.0}));
  EXPECT_EQ(std::vector<uint64_t>(stamps, stamps + 3),
            (std::vector<uint64_t>{kNoon + 5000, kNoon, 0}))
      << "a signal never set reads 0.0 at time 0";
  ASSERT_EQ(kvReadSignalSinglePoint(unset, values, 8, stamps, 8), 0);
  EXPECT_EQ(values[0], 0.0);
  EXPECT_EQ(stamps[0], 0u);
  ASSERT_EQ(kvReadSignalSinglePoint(session, values, sizeof values, nullptr, 0), 0)
      << "timestamps are optional";
}

TEST_F(KvorSignalSinglePoint, BuffersMustHoldEverySignal) {
  const uint32_t session = Create("CAN1", kvMode_SignalInSinglePoint, "A,B");
  const double set[] = {1.0, 2.0};
  ASSERT_EQ(kvsimSetSignalValues(session, set, 2), 2);
  std::vector<double> values(3, -7.0);
  std::vector<uint64_t> stamps(3, 7);
  EXPECT_EQ(kvReadSignalSinglePoint(session, values.data(), 15, nullptr, 0),
            kvsimErrBufferTooSmall);
  EXPECT_EQ(kvReadSignalSinglePoint(session, values.data(), 16, stamps.data(), 8),
            kvsimErrBufferTooSmall);
  EXPECT_EQ(values, std::vector<double>(3, -7.0)) << "a refused read writes nothing";
  EXPECT_EQ(stamps, std::vector<uint64_t>(3, 7));
  EXPECT_EQ(kvReadSignalSinglePoint(session, nullptr, 16, nullptr, 0), kvsimErrNullPointer);
  ASSERT_EQ(kvReadSignalSinglePoint(session, values.data(), 24, stamps.data(), 24), 0);
  EXPECT_EQ(values, (std::vector<double>{1.0, 2.0, -7.0})) << "room beyond the signals is left";
  EXPECT_EQ(stamps[2], 7u);

  const uint32_t writer = Create("FlexRay1", kvMode_SignalOutSinglePoint, "A,B");
  EXPECT_EQ(kvWriteSignalSinglePoint(writer, set, 8), kvsimErrBufferTooSmall);
  EXPECT_EQ(kvWriteSignalSinglePoint(writer, nullptr, 16), kvsimErrNullPointer);
  double seen[2] = {-1, -1};
  ASSERT_EQ(kvsimGetSignalValues(writer, seen, 2), 2);
  EXPECT_EQ(seen[0], 0.0) << "a refused write puts nothing on the network";
}

TEST_F(KvorSignalSinglePoint, EveryModeUpToTwelveIsKeptAndSinglePointCallsNeedTheirOwn) {
  double value = 0;
  for (uint32_t mode = 0; mode <= 12; ++mode) {
    SCOPED_TRACE(mode);
    const uint32_t session = Create("CAN3", mode, "A");
    EXPECT_EQ(ReadU32(session, kvPropSession_Mode), mode);
    // What waveform and XY sessions (1, 2, 4, 5) do with these calls is theirs to tell.
    const int32_t read = kvReadSignalSinglePoint(session, &value, 8, nullptr, 0);
    const int32_t write = kvWriteSignalSinglePoint(session, &value, 8);
    if (mode != 1 && mode != 2) {
      EXPECT_EQ(read, mode == kvMode_SignalInSinglePoint ? 0 : kvsimErrWrongMode);
    }
    if (mode != 4 && mode != 5) {
      EXPECT_EQ(write, mode == kvMode_SignalOutSinglePoint ? 0 : kvsimErrWrongMode);
    }
  }
  for (uint32_t mode : {13u, 100u, 0xFFFFFFFFu}) {
    uint32_t handle = 0;
    EXPECT_EQ(kvCreateSession("DB", "Cluster", "A", "CAN2", mode, &handle), kvsimErrInvalidMode)
        << mode;
  }
  EXPECT_EQ(kvsimOpenSessionCount(), 13);
}

TEST_F(KvorSignalSinglePoint, AWrittenValueReachesReadersOnTheSameNetworkOnly) {
  const uint32_t writer = Create("CAN1", kvMode_SignalOutSinglePoint, "Torque,Rpm");
  const uint32_t joined = Create("CAN2", kvMode_SignalInSinglePoint, "Rpm,Torque");
  const uint32_t local = Create("CAN1", kvMode_SignalInSinglePoint, "Torque");
  const uint32_t apart = Create("CAN3", kvMode_SignalInSinglePoint, "Torque");
  const uint32_t otherBus = Create("LIN1", kvMode_SignalInSinglePoint, "Torque");
  kvsimSetClock(kNoon);
  const double written[] = {310.0, 1800.0};
  ASSERT_EQ(kvWriteSignalSinglePoint(writer, written, sizeof written), 0);

  double pair[2] = {};
  uint64_t stamps[2] = {};
  ASSERT_EQ(kvReadSignalSinglePoint(joined, pair, sizeof pair, stamps, sizeof stamps), 0);
  EXPECT_EQ(std::vector<double>(pair, pair + 2), (std::vector<double>{1800.0, 310.0}));
  EXPECT_EQ(stamps[1], kNoon);
  for (uint32_t reader : {local, apart, otherBus}) {
    ASSERT_EQ(kvReadSignalSinglePoint(reader, pair, 8, nullptr, 0), 0);
    EXPECT_EQ(pair[0], reader == local ? 310.0 : 0.0) << std::hex << reader;
  }
}

TEST_F(KvorSignalSinglePoint, TheControlsSetAndGetAtMostTheSignalsOfTheSession) {
  const uint32_t session = Create("ENET1", kvMode_SignalInSinglePoint, "A,B");
  const double many[] = {1.0, 2.0, 3.0, 4.0};
  EXPECT_EQ(kvsimSetSignalValues(session, many, 4), 2);
  double out[4] = {-1, -1, -1, -1};
  EXPECT_EQ(kvsimGetSignalValues(session, out, 1), 2) << "the count of signals, not of copies";
  EXPECT_EQ(out[0], 1.0);
  EXPECT_EQ(out[1], -1.0);
  EXPECT_EQ(kvsimGetSignalValues(session, out, 4), 2);
  EXPECT_EQ(out[1], 2.0);
  EXPECT_EQ(out[2], -1.0);
  EXPECT_EQ(kvsimSetSignalValues(session, nullptr, 1), -1);
  EXPECT_EQ(kvsimSetSignalValues(0x20FF1FFF, many, 1), -1);
  EXPECT_EQ(kvsimGetSignalValues(0x20FF1FFF, out, 1), -1);
}

}  // namespace
