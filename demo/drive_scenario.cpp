#include "drive_scenario.h"

#include <algorithm>
#include <chrono>
#include <cstring>
#include <fstream>
#include <list>
#include <tuple>

#include "kvsim.h"
#include "kvsvplatform.h"
#include "svsim.h"

namespace kvsvdemo {

namespace {

constexpr uint64_t kStartRawTime = 133500000000000000ull;  // a moment in 2024
constexpr uint64_t kRawPerSecond = 10000000;
constexpr uint32_t kClusterSize = 32;
constexpr uint32_t kPayloadOffset = 16;
constexpr uint32_t kIdentifierOffset = 24;
constexpr int32_t kWaveformRate = 100;  // per second: one sample per step

// The sessions of the project, as the session file names them.
enum eSession { kDriveOut, kConvert, kFramesIn, kSignalsIn, kPairsIn, kWaveformIn, kSessionCount };

struct tProjectSession {
  const char *name;
  int32_t mode;
  bool reads;  // on the partner interface
  bool signals;
  int32_t rate;
};

const tProjectSession kSessions[kSessionCount] = {
    {"DriveOut", kvMode_SignalOutSinglePoint, false, true, 0},
    {"DriveConvert", kvMode_SignalConversionSinglePoint, false, true, 0},
    {"BusFrames", kvMode_FrameInQueued, true, false, 0},
    {"BusSignals", kvMode_SignalInSinglePoint, true, true, 0},
    {"BusPairs", kvMode_SignalInXY, true, true, 0},
    {"BusWaveforms", kvMode_SignalInWaveform, true, true, kWaveformRate},
};

// A host handle disposed of with everything it holds when the drive ends.
class cHostArrays {
 public:
  ~cHostArrays() {
    for (auto &[handle, stride, inner, extent] : arrays_) {
      if (handle == nullptr) continue;
      int32_t count = 0;
      std::memcpy(&count, *handle, 4);
      const size_t held = stride == 0          ? 0
                          : extent == kCounted ? static_cast<size_t>(std::max(count, 0))
                                               : (svGetHandleSize(handle) - 8) / stride;
      for (size_t i = 0; i < held; ++i) {
        for (uint32_t offset : inner) {
          SvHandle element;
          std::memcpy(&element, static_cast<uint8_t *>(*handle) + 8 + i * stride + offset, 8);
          if (element != nullptr) svDisposeHandle(element);
        }
      }
      svDisposeHandle(handle);
    }
    for (SvWaveformArray *w : waveforms_) svsimDisposeWaveformArray(w);
  }
  // Which elements own the handles they hold: every one the block has room for (the library
  // keeps handles past the count for later reads), or only those of the count.
  enum eExtent { kWholeBlock, kCounted };
  // `stride` and `inner`: the size of an element and where in it handles lie.
  SvHandle &Track(uint32_t stride = 0, std::vector<uint32_t> inner = {},
                  eExtent extent = kWholeBlock) {
    arrays_.push_back({nullptr, stride, std::move(inner), extent});
    return std::get<0>(arrays_.back());
  }
  SvWaveformArray *TrackWaveforms(SvWaveformArray *w) {
    waveforms_.push_back(w);
    return w;
  }

 private:
  std::list<std::tuple<SvHandle, uint32_t, std::vector<uint32_t>, eExtent>> arrays_;
  std::vector<SvWaveformArray *> waveforms_;
};

class cDrive {
 public:
  cDrive(const tLibraryExports &library, const tDriveOptions &options, tDriveResult &result)
      : lib_(library), options_(options), r_(result) {}

  void Run() {
    if (!Prepare() || !OpenSessions()) return;
    Play();
    if (r_.status >= 0) ReadPairs();
    if (r_.status >= 0) ReadWaveforms();
    End();
  }

 private:
  bool Fail(const std::string &call, int32_t status) {
    r_.failedCall = call;
    r_.status = status;
    char text[256] = {0};
    if (lib_.statusToString != nullptr) lib_.statusToString(status, sizeof text, text);
    r_.statusText = text;
    return false;
  }
  bool Check(const char *call, int32_t status) { return status >= 0 || Fail(call, status); }

  bool Prepare() {
    r_.readInterface = PartnerInterface(options_.interfaceName);
    if (r_.readInterface.empty())
      return Fail("no partner on the network of " + options_.interfaceName, kvErrInternal);
    kvsimReset();
    svsimReset();
    std::string what;
    int32_t status = 0;
    r_.signals = PickDriveSignals(options_.dbcPath, options_.maxSignals, what, status);
    if (r_.signals.empty()) return Fail(what, status);
    // A built application keeps its session file beside itself.
    svsimSetRunMode(1, 1, 1);
    svsimSetAppPath(options_.directory.c_str());
    kvsimSetClock(kStartRawTime);
    return WriteSessionFile();
  }

  bool WriteSessionFile() {
    std::string list;
    for (const tDriveSignal &s : r_.signals) list += (list.empty() ? "" : ",") + s.item;
    std::ofstream file(options_.directory + "/kvorSession.txt", std::ios::binary);
    for (const tProjectSession &s : kSessions) {
      file << s.name << "\n"
           << s.mode << " " << s.rate << " 0 0 "
           << (s.reads ? r_.readInterface : options_.interfaceName) << " "
           << (s.signals ? list : "-") << " - " << options_.dbcPath << "\n\n";
    }
    file.close();
    return !file.fail() || Fail("write of the session file", kvErrSessionFile);
  }

  bool OpenSessions() {
    for (int i = 0; i < kSessionCount; ++i) {
      SvHandle name = svsimMakeString(kSessions[i].name);
      lib_.sessionOpen(&name, &handles_[i], 0);
      Register(name, handles_[i]);
      svDisposeHandle(name);
      // The open always succeeds for the host; a failure shows at the session's first use.
      uint32_t size = 0;
      const int32_t status = kvGetPropertySize(handles_[i], kvPropSession_IntfName, &size);
      if (!Check((std::string("kvsvSessionOpen ") + kSessions[i].name).c_str(), status))
        return false;
      ++r_.sessionsOpened;
    }
    return true;
  }

  // The host keeps a reference for each session it opened, to close it when the program ends.
  static void Register(SvHandle name, uint32_t handle) {
    SvHandle texts[5];
    const char *const values[5] = {"kvor", "kvorSession", "kvsvapi.*", "kvsvSessionOpen",
                                   "kvsvSessionClose"};
    for (int i = 0; i < 5; ++i) texts[i] = svsimMakeString(values[i]);
    SvRefnum reference = 0;
    svRegisterRefKind3(name, handle, texts[0], texts[1], 21, &reference, 8, texts[2], 1, texts[3],
                       texts[4], 0, 0, 0);
    for (SvHandle text : texts) svDisposeHandle(text);
  }

  void Play() {
    const size_t n = r_.signals.size();
    std::vector<double> zeros(n, 0.0);
    SvHandle &values = arrays_.Track();
    values = svsimMakeDoubleArray(zeros.data(), static_cast<int32_t>(n));
    SvHandle &frames = arrays_.Track(kClusterSize, {kPayloadOffset});
    SvHandle &spares = arrays_.Track(8, {0}, cHostArrays::kCounted);
    SvHandle &expected = arrays_.Track(kClusterSize, {kPayloadOffset});
    SvHandle &expectedSpares = arrays_.Track(8, {0}, cHostArrays::kCounted);
    SvHandle &read = arrays_.Track();
    SvHandle &converted = arrays_.Track();
    const double duration = options_.steps * kStepSeconds;
    std::chrono::steady_clock::time_point start;
    for (int32_t step = 0; step < options_.steps; ++step) {
      // The first step sizes every host array; from the second on nothing should be allocated.
      if (step == 1) {
        svsimResetCounters();
        start = std::chrono::steady_clock::now();
      }
      kvsimAdvanceClock(static_cast<uint64_t>(kStepSeconds * kRawPerSecond));
      r_.writeTimes.push_back(kvsimClock());
      double *out = reinterpret_cast<double *>(static_cast<uint8_t *>(*values) + 8);
      for (size_t i = 0; i < n; ++i)
        out[i] = DriveValue(r_.signals[i], i, (step + 1) * kStepSeconds, duration);
      r_.written.emplace_back(out, out + n);
      if (!Check("kvsvWriteSignalSinglePoint",
                 lib_.writeSignalSinglePoint(handles_[kDriveOut], values)) ||
          !Check("kvsvReadFrameCAN",
                 lib_.readFrameCAN(handles_[kFramesIn], -1, &frames, &spares, 0.0)) ||
          !Check("kvsvReadSignalSinglePoint",
                 lib_.readSignalSinglePoint(handles_[kSignalsIn], &read)) ||
          !Check("kvsvConvertSignalSinglePointToFrameCAN",
                 lib_.convertSignalsToFrameCAN(handles_[kConvert], &values, &expected,
                                               &expectedSpares)) ||
          !Check("kvsvConvertFrameCANToSignalSinglePoint",
                 lib_.convertFrameCANToSignals(handles_[kConvert], &frames, &converted)))
        return;
      r_.framesRead.push_back(Frames(frames));
      r_.framesExpected.push_back(Frames(expected));
      r_.singlePoint.push_back(Doubles(read));
      r_.fromFrames.push_back(Doubles(converted));
      if (step >= 1) r_.steadyFrames += static_cast<int32_t>(r_.framesRead.back().size());
    }
    if (options_.steps > 1) {
      r_.steadySeconds =
          std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
      r_.steadyAllocations = svsimAllocCount() + svsimResizeCount();
    }
  }

  void ReadPairs() {
    SvHandle &clusters = arrays_.Track(16, {0, 8});
    if (!Check("kvsvReadSignalXY", lib_.readSignalXY(handles_[kPairsIn], -1, nullptr, &clusters)))
      return;
    const int32_t count = Count(clusters);
    for (int32_t i = 0; i < count; ++i) {
      const uint8_t *cluster = static_cast<uint8_t *>(*clusters) + 8 + i * 16;
      SvHandle times, values;
      std::memcpy(&times, cluster, 8);
      std::memcpy(&values, cluster + 8, 8);
      std::vector<uint64_t> raw;
      const SvTime *t = reinterpret_cast<const SvTime *>(static_cast<uint8_t *>(*times) + 8);
      for (int32_t k = 0; k < Count(times); ++k) {
        uint64_t value = 0;
        lib_.svTimeToRawTime(&value, &t[k]);
        raw.push_back(value);
      }
      r_.xyTimes.push_back(raw);
      r_.xyValues.push_back(Doubles(values));
    }
  }

  void ReadWaveforms() {
    SvWaveformArray *array = arrays_.TrackWaveforms(svsimMakeWaveformArray(0, 0));
    // The grid starts at the open: one instant there and one after each step.
    const int32_t samples = options_.steps + 1;
    if (!Check("kvsvReadSignalWaveform",
               lib_.readSignalWaveform(handles_[kWaveformIn], samples, array, 0.0)))
      return;
    for (int32_t i = 0; i < svsimWaveformCount(array); ++i) {
      tWaveform w;
      w.samples.resize(static_cast<size_t>(samples));
      SvTime t0{};
      const int32_t got = svsimWaveformRead(array, i, w.samples.data(), samples, &t0, &w.interval);
      w.samples.resize(static_cast<size_t>(std::max(got, 0)));
      lib_.svTimeToRawTime(&w.startRawTime, &t0);
      r_.waveforms.push_back(std::move(w));
    }
  }

  // The program stops as a host stops it: the host closes every reference it holds.
  void End() {
    SvsimEndReport report{};
    svsimEndProgram(&report);
    r_.closesAtEnd = report.closesCalled;
    r_.sessionsLeftOpen = kvsimOpenSessionCount();
  }

  static int32_t Count(SvHandle array) {
    int32_t count = 0;
    if (array != nullptr) std::memcpy(&count, *array, 4);
    return count;
  }
  static std::vector<double> Doubles(SvHandle array) {
    const double *first = reinterpret_cast<const double *>(static_cast<uint8_t *>(*array) + 8);
    return std::vector<double>(first, first + Count(array));
  }
  std::vector<tFrame> Frames(SvHandle array) const {
    std::vector<tFrame> frames;
    for (int32_t i = 0; i < Count(array); ++i) {
      const uint8_t *c = static_cast<uint8_t *>(*array) + 8 + i * kClusterSize;
      tFrame f;
      SvTime time;
      std::memcpy(&time, c, sizeof time);
      lib_.svTimeToRawTime(&f.rawTime, &time);
      std::memcpy(&f.identifier, c + kIdentifierOffset, 4);
      f.type = c[kIdentifierOffset + 4];
      f.extended = c[kIdentifierOffset + 5];
      SvHandle payload;
      std::memcpy(&payload, c + kPayloadOffset, 8);
      if (payload != nullptr) {
        const uint8_t *block = static_cast<uint8_t *>(*payload);
        f.payload.assign(block + 4, block + 4 + Count(payload));
      }
      frames.push_back(std::move(f));
    }
    return frames;
  }

  const tLibraryExports &lib_;
  const tDriveOptions &options_;
  tDriveResult &r_;
  uint32_t handles_[kSessionCount] = {};
  cHostArrays arrays_;
};

}  // namespace

std::string PartnerInterface(const std::string &name) {
  if (name.size() != 4 || name.compare(0, 3, "CAN") != 0 || name[3] < '1' || name[3] > '4')
    return {};
  const int port = name[3] - '0';
  return "CAN" + std::to_string(port % 2 == 1 ? port + 1 : port - 1);
}

tDriveResult RunDrive(const tLibraryExports &library, const tDriveOptions &options) {
  tDriveResult result;
  {
    cDrive drive(library, options, result);
    drive.Run();
  }
  return result;
}

}  // namespace kvsvdemo
