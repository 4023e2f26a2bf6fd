// Signals end to end: eight signals of two frames of a field database, four big-endian and four
// little-endian, written as single points on CAN1 and read on CAN2 as single points and as
// waveforms, and the same values through two conversion sessions to frames and back. Each figure
// stands beside the driver's own calls for the same work and, for the single-point read, beside a
// decode floor: the frames moved by the driver and their bits taken out by a plain loop.
#include <benchmark/benchmark.h>

#include <cmath>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "end_to_end_support.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "svsim.h"

namespace {

using namespace kvsvbench;

// How a signal lies in its frame's payload, as the database file describes it.
struct tSignal {
  const char *name;
  uint32_t identifier;
  uint32_t startBit;  // least significant bit for little-endian, most significant for big-endian
  uint32_t bits;
  bool bigEndian;
  bool isSigned;
  double scale, offset;
  double value;  // written, and expected back within half a step
};

constexpr uint32_t kSteering = 1160, kTorque = 264;
const tSignal kSignals[] = {
    {"DAS_steeringControl.DAS_steeringAngleRequest", kSteering, 6, 15, true, false, 0.1, -1638.35,
     -403.8},
    {"DAS_steeringControl.DAS_steeringControlCounter", kSteering, 19, 4, true, false, 1, 0, 11},
    {"DAS_steeringControl.DAS_steeringControlType", kSteering, 23, 2, true, false, 1, 0, 2},
    {"DAS_steeringControl.DAS_steeringControlChecksum", kSteering, 31, 8, true, false, 1, 0, 165},
    {"DI_torque1.DI_torqueDriver", kTorque, 0, 13, false, true, 0.25, 0, -120.5},
    {"DI_torque1.DI_torqueMotor", kTorque, 16, 13, false, true, 0.25, 0, -312.25},
    {"DI_torque1.DI_motorRPM", kTorque, 32, 16, false, true, 1, 0, -16000},
    {"DI_torque1.DI_pedalPos", kTorque, 48, 8, false, false, 0.4, 0, 40.4},
};
constexpr int32_t kCount = sizeof kSignals / sizeof kSignals[0];

std::string Tesla() { return std::string(KVSV_DBC_DIR) + "/tesla_can.dbc"; }

const std::string &List() {
  static const std::string list = [] {
    std::string text;
    for (const tSignal &s : kSignals) text += (text.empty() ? "" : ",") + std::string(s.name);
    return text;
  }();
  return list;
}

const std::vector<double> &Values() {
  static const std::vector<double> values = [] {
    std::vector<double> v;
    for (const tSignal &s : kSignals) v.push_back(s.value);
    return v;
  }();
  return values;
}

bool CloseToWritten(const double *values) {
  for (int32_t i = 0; i < kCount; ++i)
    if (!(std::fabs(values[i] - kSignals[i].value) <= kSignals[i].scale / 2)) return false;
  return true;
}

// The plain decode: the signal's bits taken from the payload seen as one 64-bit number, low byte
// first for little-endian signals and high byte first for big-endian ones.
double Decode(const tSignal &s, const uint8_t payload[8]) {
  uint64_t raw;
  if (s.bigEndian) {
    uint64_t word = 0;
    for (int b = 0; b < 8; ++b) word = (word << 8) | payload[b];
    const uint32_t fromTop = (s.startBit / 8) * 8 + (7 - s.startBit % 8);
    raw = word >> (64 - fromTop - s.bits);
  } else {
    uint64_t word;
    std::memcpy(&word, payload, 8);
    raw = word >> s.startBit;
  }
  raw &= (1ull << s.bits) - 1;
  const int64_t signedRaw = s.isSigned && (raw >> (s.bits - 1)) != 0
                                ? static_cast<int64_t>(raw) - (int64_t{1} << s.bits)
                                : static_cast<int64_t>(raw);
  return static_cast<double>(signedRaw) * s.scale + s.offset;
}

// Every signal decoded from the classic records it is carried in.
bool DecodeRecords(const uint8_t *records, uint32_t size, double *values) {
  int found = 0;
  for (uint32_t at = 0; at + 24 <= size; at += 24) {
    uint32_t id;
    std::memcpy(&id, records + at + 8, 4);
    for (int32_t i = 0; i < kCount; ++i) {
      if (kSignals[i].identifier != id) continue;
      values[i] = Decode(kSignals[i], records + at + 16);
      ++found;
    }
  }
  return found == kCount;
}

constexpr int32_t kFrames = 2;
constexpr uint32_t kRecordsSize = kFrames * 24;

// The frames a single-point write of the values puts on the bus, as the driver's records.
std::vector<uint8_t> EncodedRecords() {
  cDriverSession writer(Tesla().c_str(), List().c_str(), "CAN1", kvMode_SignalOutSinglePoint);
  cDriverSession reader(":memory:", "", "CAN2", kvMode_FrameInStream);
  std::vector<uint8_t> records(kRecordsSize);
  uint32_t got = 0;
  if (kvWriteSignalSinglePoint(writer.handle(), Values().data(), kCount * 8) != 0 ||
      kvReadFrame(reader.handle(), records.data(), kRecordsSize, 0.0, &got) != 0 ||
      got != kRecordsSize)
    return {};
  return records;
}

// The decode floor: the driver writes the encoded frames on CAN1 and reads them on CAN2, and a
// plain loop takes each signal's bits out.
double DecodeFloorNs(int64_t calls) {
  const std::vector<uint8_t> records = EncodedRecords();
  double values[kCount] = {};
  if (records.empty() || !DecodeRecords(records.data(), kRecordsSize, values) ||
      !CloseToWritten(values))
    return -1;
  cDriverSession writer(":memory:", "", "CAN1", kvMode_FrameOutStream);
  cDriverSession reader(":memory:", "", "CAN2", kvMode_FrameInStream);
  uint8_t buffer[kRecordsSize];
  return TimeRounds(calls, [&] {
    uint32_t got = 0;
    const bool moved = kvWriteFrame(writer.handle(), records.data(), kRecordsSize, 0.0) == 0 &&
                       kvReadFrame(reader.handle(), buffer, kRecordsSize, 0.0, &got) == 0 &&
                       DecodeRecords(buffer, got, values);
    benchmark::DoNotOptimize(values);
    return moved;
  });
}

// Our rounds on CAN1 and CAN2 through the library; the floor's, the driver's own calls for the same
// work, on CAN3 and CAN4, a network of its own, so that both pairs stay open and take turns.
void BM_BusSignalsSinglePoint(benchmark::State &state) {
  kvsimReset();
  kvsimSetCallLog(0);
  tTimes times;
  {
    const cLibrarySession writer(Tesla().c_str(), List().c_str(), "CAN1",
                                 kvMode_SignalOutSinglePoint);
    const cLibrarySession reader(Tesla().c_str(), List().c_str(), "CAN2",
                                 kvMode_SignalInSinglePoint);
    const cDriverSession floorWriter(Tesla().c_str(), List().c_str(), "CAN3",
                                     kvMode_SignalOutSinglePoint);
    const cDriverSession floorReader(Tesla().c_str(), List().c_str(), "CAN4",
                                     kvMode_SignalInSinglePoint);
    SvHandle written = DoubleArray(Values().data(), kCount), read = nullptr;
    double floorValues[kCount];
    times = TimeBesideFloor(
        state,
        [&] {
          return kvsvWriteSignalSinglePoint(writer.handle(), written) == 0 &&
                 kvsvReadSignalSinglePoint(reader.handle(), &read) == 0;
        },
        [&] {
          return ArrayCountOf(read) == kCount &&
                 CloseToWritten(reinterpret_cast<const double *>(static_cast<uint8_t *>(*read) + 8));
        },
        [&] {
          return kvWriteSignalSinglePoint(floorWriter.handle(), Values().data(), kCount * 8) == 0 &&
                 kvReadSignalSinglePoint(floorReader.handle(), floorValues, kCount * 8, nullptr,
                                         0) == 0;
        });
    svDisposeHandle(written);
    if (read != nullptr) svDisposeHandle(read);
  }
  if (times.failed) return;
  // Frame sessions would hear the signal sessions' frames: the decode floor runs after them.
  const double decodeNs = DecodeFloorNs(state.iterations());
  if (decodeNs < 0) state.SkipWithError("the decode floor did not deliver the values");
  ReportBesideFloor(state, kCount, times);
  state.counters["decode_floor_per_second"] =
      static_cast<double>(state.iterations() * kCount) / (decodeNs * 1e-9);
  state.counters["ratio_to_decode_floor"] = times.ourNs / decodeNs;
  kvsimSetCallLog(1);
}
BENCHMARK(BM_BusSignalsSinglePoint);

// At the default resample rate of 1000 per second, one instant of the grid in raw time.
constexpr uint64_t kRawPerSample = 10000;

// Single points written on CAN1, `batch` samples of each signal read as waveforms on CAN2 per
// call, the virtual clock moved on by as many instants of the grid. The floor's reader on CAN4
// takes the instants our rounds moved the clock by; its own call of the clock moves it by none.
void BM_BusSignalsWaveform(benchmark::State &state) {
  kvsimReset();
  kvsimSetCallLog(0);
  const auto samples = static_cast<int32_t>(state.range(0));
  tTimes times;
  {
    const cLibrarySession writer(Tesla().c_str(), List().c_str(), "CAN1",
                                 kvMode_SignalOutSinglePoint);
    const cLibrarySession reader(Tesla().c_str(), List().c_str(), "CAN2", kvMode_SignalInWaveform);
    const cDriverSession floorWriter(Tesla().c_str(), List().c_str(), "CAN3",
                                     kvMode_SignalOutSinglePoint);
    const cDriverSession floorReader(Tesla().c_str(), List().c_str(), "CAN4",
                                     kvMode_SignalInWaveform);
    SvHandle written = DoubleArray(Values().data(), kCount);
    SvWaveformArray *waveforms = svsimMakeWaveformArray(0, 0);
    std::vector<double> last(samples);
    std::vector<std::vector<double>> buffers(kCount, std::vector<double>(samples));
    std::vector<double *> pointers;
    for (std::vector<double> &b : buffers) pointers.push_back(b.data());
    times = TimeBesideFloor(
        state,
        [&] {
          if (kvsvWriteSignalSinglePoint(writer.handle(), written) != 0) return false;
          kvsimAdvanceClock(samples * kRawPerSample);
          return kvsvReadSignalWaveform(reader.handle(), samples, waveforms, 0.0) == 0;
        },
        [&] {
          // The last sample of each waveform holds the value written before it.
          double values[kCount];
          for (int32_t i = 0; i < kCount; ++i) {
            if (svsimWaveformRead(waveforms, i, last.data(), samples, nullptr, nullptr) != samples)
              return false;
            values[i] = last.back();
          }
          return svsimWaveformCount(waveforms) == kCount && CloseToWritten(values);
        },
        [&] {
          uint64_t start = 0;
          double interval = 0;
          uint32_t got = 0;
          if (kvWriteSignalSinglePoint(floorWriter.handle(), Values().data(), kCount * 8) != 0)
            return false;
          kvsimAdvanceClock(0);
          return kvhdnReadSignalWaveform(floorReader.handle(), 0.0, &start, &interval,
                                         pointers.data(), static_cast<uint32_t>(samples * 8),
                                         &got) == 0 &&
                 got == static_cast<uint32_t>(samples);
        });
    svsimDisposeWaveformArray(waveforms);
    svDisposeHandle(written);
  }
  if (!times.failed) ReportBesideFloor(state, int64_t{kCount} * samples, times);
  kvsimSetCallLog(1);
}
BENCHMARK(BM_BusSignalsWaveform)->Apply(Batches);

// The values to frames through one conversion session and back through another, beside the
// driver's own conversions on two sessions of its own.
void BM_ConvertSignalsRoundTrip(benchmark::State &state) {
  kvsimReset();
  kvsimSetCallLog(0);
  tTimes times;
  {
    const uint32_t mode = kvMode_SignalConversionSinglePoint;
    const std::string tesla = Tesla();
    const cLibrarySession toFrames(tesla.c_str(), List().c_str(), "CAN1", mode);
    const cLibrarySession fromFrames(tesla.c_str(), List().c_str(), "CAN1", mode);
    const cDriverSession floorTo(tesla.c_str(), List().c_str(), "CAN3", mode);
    const cDriverSession floorFrom(tesla.c_str(), List().c_str(), "CAN3", mode);
    SvHandle values = DoubleArray(Values().data(), kCount);
    SvHandle frames = nullptr, spares = nullptr, back = nullptr;
    uint8_t records[kRecordsSize];
    double floorValues[kCount];
    times = TimeBesideFloor(
        state,
        [&] {
          return kvsvConvertSignalSinglePointToFrameCAN(toFrames.handle(), &values, &frames,
                                                        &spares) == 0 &&
                 kvsvConvertFrameCANToSignalSinglePoint(fromFrames.handle(), &frames, &back) == 0;
        },
        [&] {
          return ArrayCountOf(frames) == kFrames && ArrayCountOf(back) == kCount &&
                 CloseToWritten(reinterpret_cast<const double *>(static_cast<uint8_t *>(*back) + 8));
        },
        [&] {
          uint32_t got = 0;
          return kvConvertSignalsToFramesSinglePoint(floorTo.handle(), Values().data(), kCount * 8,
                                                     records, kRecordsSize, &got) == 0 &&
                 kvConvertFramesToSignalsSinglePoint(floorFrom.handle(), records, got, floorValues,
                                                     kCount * 8, nullptr, 0) == 0;
        });
    DisposeFrameArrays(frames, spares);
    svDisposeHandle(values);
    if (back != nullptr) svDisposeHandle(back);
  }
  if (!times.failed) ReportBesideFloor(state, kCount, times);
  kvsimSetCallLog(1);
}
BENCHMARK(BM_ConvertSignalsRoundTrip);

}  // namespace
