// One drive end to end: project sessions from a session file, values played on one interface of a
// network on the virtual clock, and what the other interface reads of them as frames, single
// points, pairs and waveforms, and what a conversion makes of the frames.
#ifndef KVSVDEMO_DRIVE_SCENARIO_H
#define KVSVDEMO_DRIVE_SCENARIO_H

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "drive_signals.h"
#include "library_exports.h"

namespace kvsvdemo {

struct tDriveOptions {
  std::string dbcPath;
  std::string interfaceName = "CAN1";  // the drive plays here; its partner on the network reads
  std::string directory;               // the program's own directory: the session file goes here
  int32_t steps = 300;                 // the drive lasts this many kStepSeconds
  size_t maxSignals = 6;
  // Runs once the stand-ins are reset, before the first call of the drive: a test arms its
  // faults here.
  std::function<void()> afterReset;
};

// A frame goes every kStepSeconds where the database gives it no cycle time of its own.
constexpr double kStepSeconds = 0.01;

// The signals of one frame, written together by an output session of their own at the frame's
// cycle.
struct tFrameGroup {
  std::string session;
  uint32_t frameId = 0;
  int32_t cycleTicks = 1;  // the frame goes at every tick that is a multiple of this
  std::vector<size_t> signals;
  bool DueAt(size_t tick) const { return tick % static_cast<size_t>(cycleTicks) == 0; }
};

// One CAN frame as a host cluster holds it.
struct tFrame {
  uint64_t rawTime = 0;
  uint32_t identifier = 0;
  uint8_t type = 0;
  uint8_t extended = 0;
  std::vector<uint8_t> payload;
  bool SameContent(const tFrame &o) const {
    return identifier == o.identifier && type == o.type && extended == o.extended &&
           payload == o.payload;
  }
};

struct tWaveform {
  uint64_t startRawTime = 0;
  double interval = 0.0;
  std::vector<double> samples;
};

// A session of the project as the library reports its properties.
struct tSessionSummary {
  std::string name;
  std::string interfaceName;
  uint32_t mode = 0;
  uint32_t numInList = 0;
};

struct tDriveResult {
  // The first call that failed: its name and status, the driver's text for the status and, for a
  // property call, the property its error information names; status 0 if none failed.
  std::string failedCall;
  int32_t status = 0;
  std::string statusText;
  std::string failedProperty;

  std::vector<tSessionSummary> sessions;

  std::string readInterface;
  std::vector<tDriveSignal> signals;
  std::vector<tFrameGroup> groups;
  std::vector<size_t> groupOf;  // [signal]
  // The drive's clock ticks at the largest period that every cycle time is a whole multiple of.
  double tickSeconds = kStepSeconds;
  std::vector<uint64_t> writeTimes;                 // raw clock of each tick
  std::vector<std::vector<double>> written;         // [tick][signal], the value last written
  std::vector<std::vector<double>> singlePoint;     // read after each tick
  std::vector<std::vector<double>> fromFrames;      // the frames of each tick converted back
  std::vector<std::vector<tFrame>> framesRead;      // per tick
  std::vector<std::vector<tFrame>> framesExpected;  // per tick, from the conversion session
  std::vector<std::vector<uint64_t>> xyTimes;       // [signal][pair]
  std::vector<std::vector<double>> xyValues;
  std::vector<tWaveform> waveforms;  // one per signal

  uint64_t steadyAllocations = 0;  // host allocations and resizes after the first step
  int32_t steadyFrames = 0;

  // Whether the frame of `signal` went at `tick`.
  bool WrittenAt(size_t signal, size_t tick) const { return groups[groupOf[signal]].DueAt(tick); }
  double steadySeconds = 0.0;
  int32_t sessionsOpened = 0;
  int32_t closesAtEnd = 0;       // references the host closed when the program ended
  int32_t sessionsLeftOpen = 0;  // driver sessions open after that
};

// Runs the drive with the stand-ins reset first. Stops at the first call that fails.
tDriveResult RunDrive(const tLibraryExports &library, const tDriveOptions &options);

// The interface wired to `name` on its network ("CAN1" and "CAN2", "CAN3" and "CAN4"); empty for
// one that has no partner.
std::string PartnerInterface(const std::string &name);

}  // namespace kvsvdemo

#endif
