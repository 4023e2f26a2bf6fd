#include "drive_scenario.h"

#include <algorithm>
#include <chrono>
#include <cmath>
#include <cstring>
#include <fstream>
#include <list>
#include <numeric>
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

// The sessions of the project beside the drive's own output sessions, as the session file names
// them.
enum eSession { kConvert, kFramesIn, kSignalsIn, kPairsIn, kWaveformIn, kSessionCount };

struct tProjectSession {
  const char *name;
  int32_t mode;
  bool reads;  // on the partner interface
  bool signals;
  int32_t rate;
};

const tProjectSession kSessions[kSessionCount] = {
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

  // A drive that fails still ends its program, so that the host closes what was opened.
  void Run() {
    if (!Prepare()) return;
    if (OpenSessions()) {
      Play();
      if (r_.status >= 0) ReadPairs();
      if (r_.status >= 0) ReadWaveforms();
    }
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
  // A property call leaves a text in its error information ("\nProperty: Name") for any status
  // but 0; the host owns that handle.
  bool CheckProperty(const std::string &call, int32_t status, SvHandle &info) {
    const std::string text = Text(info);
    if (info != nullptr) svDisposeHandle(info);
    info = nullptr;
    if (status >= 0) return true;
    const std::string prefix = "\nProperty: ";
    r_.failedProperty = text.rfind(prefix, 0) == 0 ? text.substr(prefix.size()) : text;
    return Fail(call, status);
  }

  bool Prepare() {
    r_.readInterface = PartnerInterface(options_.interfaceName);
    if (r_.readInterface.empty())
      return Fail("no partner on the network of " + options_.interfaceName, kvErrInternal);
    kvsimReset();
    svsimReset();
    if (options_.afterReset) options_.afterReset();
    std::string what;
    int32_t status = 0;
    r_.signals = PickDriveSignals(options_.dbcPath, options_.maxSignals, what, status);
    if (r_.signals.empty()) return Fail(what, status);
    GroupByFrame();
    // A built application keeps its session file beside itself.
    svsimSetRunMode(1, 1, 1);
    svsimSetAppPath(options_.directory.c_str());
    kvsimSetClock(kStartRawTime);
    return WriteSessionFile();
  }

  // One output session per frame, so that each frame goes at its own cycle. The clock ticks at
  // the largest period that divides every cycle, in whole milliseconds.
  void GroupByFrame() {
    constexpr int64_t kStepMs = 10;
    int64_t tickMs = kStepMs;
    std::vector<int64_t> cycleMs;
    for (size_t i = 0; i < r_.signals.size(); ++i) {
      const tDriveSignal &signal = r_.signals[i];
      size_t g = 0;
      while (g < r_.groups.size() && r_.groups[g].frameId != signal.frameId) ++g;
      if (g == r_.groups.size()) {
        tFrameGroup group;
        group.session = "Drive_" + signal.item.substr(0, signal.item.find('.'));
        group.frameId = signal.frameId;
        r_.groups.push_back(group);
        const int64_t ms = std::llround(signal.cycleSeconds * 1000);
        cycleMs.push_back(ms > 0 ? ms : kStepMs);
        tickMs = std::gcd(tickMs, cycleMs.back());
      }
      r_.groups[g].signals.push_back(i);
      r_.groupOf.push_back(g);
    }
    for (size_t g = 0; g < r_.groups.size(); ++g)
      r_.groups[g].cycleTicks = static_cast<int32_t>(cycleMs[g] / tickMs);
    r_.tickSeconds = static_cast<double>(tickMs) / 1000;
    ticks_ =
        static_cast<size_t>(std::max(options_.steps, 0)) * static_cast<size_t>(kStepMs / tickMs);
  }

  bool WriteSessionFile() {
    std::string all;
    for (const tDriveSignal &s : r_.signals) all += (all.empty() ? "" : ",") + s.item;
    std::ofstream file(options_.directory + "/kvorSession.txt", std::ios::binary);
    const auto entry = [&](const std::string &name, int32_t mode, int32_t rate, bool reads,
                           const std::string &list) {
      file << name << "\n"
           << mode << " " << rate << " 0 0 " << (reads ? r_.readInterface : options_.interfaceName)
           << " " << list << " - " << options_.dbcPath << "\n\n";
    };
    for (const tFrameGroup &g : r_.groups) {
      std::string list;
      for (size_t i : g.signals) list += (list.empty() ? "" : ",") + r_.signals[i].item;
      entry(g.session, kvMode_SignalOutSinglePoint, 0, false, list);
    }
    for (const tProjectSession &s : kSessions)
      entry(s.name, s.mode, s.rate, s.reads, s.signals ? all : "-");
    file.close();
    return !file.fail() || Fail("write of the session file", kvErrSessionFile);
  }

  bool OpenSessions() {
    std::vector<std::string> names;
    for (const tFrameGroup &g : r_.groups) names.push_back(g.session);
    for (const tProjectSession &s : kSessions) names.emplace_back(s.name);
    handles_.assign(names.size(), 0);
    for (size_t i = 0; i < names.size(); ++i) {
      SvHandle name = svsimMakeString(names[i].c_str());
      lib_.sessionOpen(&name, &handles_[i], 0);
      Register(name, handles_[i]);
      svDisposeHandle(name);
      // The open always succeeds for the host; a failure shows at the session's first use,
      // here the first property read.
      if (!Summarize(names[i], handles_[i])) return false;
      ++r_.sessionsOpened;
    }
    return true;
  }

  bool Summarize(const std::string &name, uint32_t session) {
    tSessionSummary summary;
    summary.name = name;
    SvHandle info = nullptr;
    SvHandle text = nullptr;
    const int32_t status = lib_.sessionGetPropString(session, kvPropSession_IntfName, &text, &info);
    summary.interfaceName = Text(text);
    if (text != nullptr) svDisposeHandle(text);
    const std::string call = " of " + name;
    if (!CheckProperty("kvsvSessionGetPropString" + call, status, info) ||
        !CheckProperty("kvsvSessionGetPropU32" + call,
                       lib_.sessionGetPropU32(session, kvPropSession_Mode, &summary.mode, &info),
                       info) ||
        !CheckProperty(
            "kvsvSessionGetPropU32" + call,
            lib_.sessionGetPropU32(session, kvPropSession_NumInList, &summary.numInList, &info),
            info))
      return false;
    r_.sessions.push_back(summary);
    return true;
  }

  uint32_t Session(eSession s) const { return handles_[r_.groups.size() + s]; }

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
    // Every signal's value in force, for the conversion; and each frame's own.
    SvHandle &values = arrays_.Track();
    values = svsimMakeDoubleArray(zeros.data(), static_cast<int32_t>(n));
    std::vector<SvHandle *> groupValues;
    for (const tFrameGroup &g : r_.groups) {
      SvHandle &array = arrays_.Track();
      array = svsimMakeDoubleArray(zeros.data(), static_cast<int32_t>(g.signals.size()));
      groupValues.push_back(&array);
    }
    SvHandle &frames = arrays_.Track(kClusterSize, {kPayloadOffset});
    SvHandle &spares = arrays_.Track(8, {0}, cHostArrays::kCounted);
    SvHandle &expected = arrays_.Track(kClusterSize, {kPayloadOffset});
    SvHandle &expectedSpares = arrays_.Track(8, {0}, cHostArrays::kCounted);
    SvHandle &read = arrays_.Track();
    SvHandle &converted = arrays_.Track();
    const double duration = options_.steps * kStepSeconds;
    std::chrono::steady_clock::time_point start;
    std::vector<uint32_t> due;
    for (size_t tick = 0; tick < ticks_; ++tick) {
      // Every frame goes at the first tick, which sizes every host array; from the second tick
      // on nothing should be allocated.
      if (tick == 1) {
        svsimResetCounters();
        start = std::chrono::steady_clock::now();
      }
      kvsimAdvanceClock(static_cast<uint64_t>(std::llround(r_.tickSeconds * kRawPerSecond)));
      r_.writeTimes.push_back(kvsimClock());
      const double seconds = static_cast<double>(tick + 1) * r_.tickSeconds;
      double *all = DoubleData(values);
      due.clear();
      for (size_t g = 0; g < r_.groups.size(); ++g) {
        const tFrameGroup &group = r_.groups[g];
        if (!group.DueAt(tick)) continue;
        double *out = DoubleData(*groupValues[g]);
        for (size_t k = 0; k < group.signals.size(); ++k) {
          const size_t i = group.signals[k];
          out[k] = all[i] = DriveValue(r_.signals[i], i, seconds, duration);
        }
        if (!Check("kvsvWriteSignalSinglePoint",
                   lib_.writeSignalSinglePoint(handles_[g], *groupValues[g])))
          return;
        due.push_back(group.frameId);
      }
      r_.written.emplace_back(all, all + n);
      if (!Check("kvsvReadFrameCAN",
                 lib_.readFrameCAN(Session(kFramesIn), -1, &frames, &spares, 0.0)) ||
          !Check("kvsvReadSignalSinglePoint",
                 lib_.readSignalSinglePoint(Session(kSignalsIn), &read)) ||
          !Check("kvsvConvertSignalSinglePointToFrameCAN",
                 lib_.convertSignalsToFrameCAN(Session(kConvert), &values, &expected,
                                               &expectedSpares)) ||
          !Check("kvsvConvertFrameCANToSignalSinglePoint",
                 lib_.convertFrameCANToSignals(Session(kConvert), &frames, &converted)))
        return;
      r_.framesRead.push_back(Frames(frames));
      // The conversion makes every frame; only those that went this tick are on the bus.
      r_.framesExpected.push_back(Frames(expected, &due));
      r_.singlePoint.push_back(Doubles(read));
      r_.fromFrames.push_back(Doubles(converted));
      if (tick >= 1) r_.steadyFrames += static_cast<int32_t>(r_.framesRead.back().size());
    }
    if (ticks_ > 1) {
      r_.steadySeconds =
          std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
      r_.steadyAllocations = svsimAllocCount() + svsimResizeCount();
    }
  }

  void ReadPairs() {
    SvHandle &clusters = arrays_.Track(16, {0, 8});
    if (!Check("kvsvReadSignalXY", lib_.readSignalXY(Session(kPairsIn), -1, nullptr, &clusters)))
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
               lib_.readSignalWaveform(Session(kWaveformIn), samples, array, 0.0)))
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
  // The text of a counted host string; empty for none.
  static std::string Text(SvHandle string) {
    if (string == nullptr) return {};
    return std::string(static_cast<const char *>(*string) + 4,
                       static_cast<size_t>(std::max(Count(string), 0)));
  }
  static double *DoubleData(SvHandle array) {
    return reinterpret_cast<double *>(static_cast<uint8_t *>(*array) + 8);
  }
  static std::vector<double> Doubles(SvHandle array) {
    const double *first = DoubleData(array);
    return std::vector<double>(first, first + Count(array));
  }
  // The frames of a cluster array; with `only`, those of the identifiers it names.
  std::vector<tFrame> Frames(SvHandle array, const std::vector<uint32_t> *only = nullptr) const {
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
      if (only != nullptr && std::find(only->begin(), only->end(), f.identifier) == only->end())
        continue;
      frames.push_back(std::move(f));
    }
    return frames;
  }

  const tLibraryExports &lib_;
  const tDriveOptions &options_;
  tDriveResult &r_;
  std::vector<uint32_t> handles_;  // the frames' output sessions, then those of eSession
  size_t ticks_ = 0;
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
