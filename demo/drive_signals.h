// The signals a drive plays: picked from a database file, with the values each takes over time.
#ifndef KVSVDEMO_DRIVE_SIGNALS_H
#define KVSVDEMO_DRIVE_SIGNALS_H

#include <cstdint>
#include <string>
#include <vector>

namespace kvsvdemo {

// What a signal stands for in the drive; it shapes the course of its values.
enum class eRole { kSpeed, kSteering, kGear, kOther };

struct tDriveSignal {
  std::string item;  // "frame.signal", as session lists name it
  std::string unit;
  uint32_t frameId = 0;       // of the frame that carries it
  double cycleSeconds = 0.0;  // the frame's cycle time in the database; 0 where it gives none
  eRole role = eRole::kOther;
  double scale = 1.0;
  double offset = 0.0;
  int64_t rawLow = 0;  // raw values the drive keeps to: inside the bits and the database's range
  int64_t rawHigh = 0;

  // The value at `fraction` (0..1) of the signal's range, on a whole raw step.
  double ValueAt(double fraction) const;
  // Where `value` lies in the signal's range, 0..1 (clamped).
  double FractionOf(double value) const;
  // Half a raw step: how far a value read back may lie from the one written.
  double Tolerance() const;
};

// At most `count` plain signals of classic CAN frames of the database file at `path`: speed,
// steering angle and gear first where the names tell them, then the rest in file order. Empty
// when the file gives none, with `what` naming the failure and `status` its status.
std::vector<tDriveSignal> PickDriveSignals(const std::string &path, size_t count, std::string &what,
                                           int32_t &status);

// The value of `signal` at `seconds` into a drive of `duration` seconds.
double DriveValue(const tDriveSignal &signal, size_t index, double seconds, double duration);

}  // namespace kvsvdemo

#endif
