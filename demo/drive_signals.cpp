#include "drive_signals.h"

#include <algorithm>
#include <cctype>
#include <cmath>
#include <cstring>

#include "kvorproperties.h"
#include "kvsvplatform.h"

namespace kvsvdemo {

namespace {

constexpr double kPi = 3.14159265358979323846;
// Raw values stay within 40 bits so that every one is exact as a double.
constexpr uint32_t kWidestRaw = 40;
constexpr size_t kClassicPayload = 8;

template <typename T>
T Read(uint32_t object, uint32_t id) {
  T value{};
  kvdbGetProperty(object, id, sizeof value, &value);
  return value;
}

std::vector<uint8_t> Bytes(uint32_t object, uint32_t id) {
  uint32_t size = 0;
  if (kvdbGetPropertySize(object, id, &size) != 0) return {};
  std::vector<uint8_t> bytes(size);
  if (size != 0 && kvdbGetProperty(object, id, size, bytes.data()) != 0) return {};
  return bytes;
}

std::string Text(uint32_t object, uint32_t id) {
  const std::vector<uint8_t> bytes = Bytes(object, id);
  return std::string(bytes.begin(), std::find(bytes.begin(), bytes.end(), 0));
}

std::vector<uint32_t> Handles(uint32_t object, uint32_t id) {
  const std::vector<uint8_t> bytes = Bytes(object, id);
  std::vector<uint32_t> handles(bytes.size() / 4);
  if (!handles.empty()) std::memcpy(handles.data(), bytes.data(), handles.size() * 4);
  return handles;
}

std::string Lower(std::string text) {
  for (char &c : text) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
  return text;
}

eRole RoleOf(const std::string &name) {
  const std::string lower = Lower(name);
  if (lower.find("speed") != std::string::npos) return eRole::kSpeed;
  if (lower.find("angl") != std::string::npos && lower.find("st") != std::string::npos)
    return eRole::kSteering;
  if (lower.find("gear") != std::string::npos) return eRole::kGear;
  return eRole::kOther;
}

// Whether a session can be made of the item: the driver refuses signals that leave their frame.
bool Usable(const std::string &path, const std::string &item) {
  uint32_t probe = 0;
  if (kvCreateSession(path.c_str(), "", item.c_str(), "CAN1", kvMode_SignalConversionSinglePoint,
                      &probe) != 0)
    return false;
  kvClear(probe);
  return true;
}

// The signal's raw range within its bits, narrowed to the database's range where it gives one.
bool SetRawRange(tDriveSignal &signal, uint32_t numBits, bool isSigned, double low, double high) {
  const uint32_t bits = std::min(numBits, kWidestRaw);
  signal.rawLow = isSigned ? -(int64_t{1} << (bits - 1)) : 0;
  signal.rawHigh = isSigned ? (int64_t{1} << (bits - 1)) - 1 : (int64_t{1} << bits) - 1;
  if (low < high) {
    double a = std::ceil((low - signal.offset) / signal.scale - 1e-9);
    double b = std::floor((high - signal.offset) / signal.scale + 1e-9);
    if (a > b) std::swap(a, b);
    const int64_t narrowLow = std::max(signal.rawLow, static_cast<int64_t>(std::max(a, -1e15)));
    const int64_t narrowHigh = std::min(signal.rawHigh, static_cast<int64_t>(std::min(b, 1e15)));
    if (narrowLow < narrowHigh) {
      signal.rawLow = narrowLow;
      signal.rawHigh = narrowHigh;
    }
  }
  return signal.rawLow < signal.rawHigh;
}

}  // namespace

double tDriveSignal::ValueAt(double fraction) const {
  const double span = static_cast<double>(rawHigh - rawLow);
  const int64_t raw =
      rawLow + static_cast<int64_t>(std::llround(std::clamp(fraction, 0.0, 1.0) * span));
  return static_cast<double>(raw) * scale + offset;
}

double tDriveSignal::FractionOf(double value) const {
  const double low = static_cast<double>(rawLow) * scale + offset;
  const double high = static_cast<double>(rawHigh) * scale + offset;
  return std::clamp((value - low) / (high - low), 0.0, 1.0);
}

double tDriveSignal::Tolerance() const { return std::fabs(scale) / 2; }

std::vector<tDriveSignal> PickDriveSignals(const std::string &path, size_t count, std::string &what,
                                           int32_t &status) {
  uint32_t database = 0;
  status = kvdbOpenDatabase(path.c_str(), &database);
  if (status != 0) {
    what = "kvdbOpenDatabase " + path;
    return {};
  }
  std::vector<tDriveSignal> found;
  const std::vector<uint32_t> clusters = Handles(database, kvPropDatabase_ClstRefs);
  for (uint32_t frame :
       clusters.empty() ? std::vector<uint32_t>{} : Handles(clusters[0], kvPropClst_FrmRefs)) {
    if (Read<uint32_t>(frame, kvPropFrm_PayloadLen) > kClassicPayload) continue;
    const std::string frameName = Text(frame, kvPropFrm_Name);
    const uint32_t frameId = Read<uint32_t>(frame, kvPropFrm_ID);
    const double cycleSeconds = Read<double>(frame, kvPropFrm_CANTxTime);
    for (uint32_t handle : Handles(frame, kvPropFrm_SigRefs)) {
      const uint32_t type = Read<uint32_t>(handle, kvPropSig_DataType);
      if (type > 1 || Read<uint8_t>(handle, kvPropSig_MuxIsDynamic) != 0 ||
          Read<uint8_t>(handle, kvPropSig_MuxIsDataMux) != 0)
        continue;
      tDriveSignal signal;
      const std::string name = Text(handle, kvPropSig_Name);
      signal.item = frameName + "." + name;
      signal.unit = Text(handle, kvPropSig_Unit);
      signal.frameId = frameId;
      signal.cycleSeconds = cycleSeconds;
      signal.role = RoleOf(name);
      signal.scale = Read<double>(handle, kvPropSig_ScaleFac);
      signal.offset = Read<double>(handle, kvPropSig_ScaleOff);
      const uint32_t numBits = Read<uint32_t>(handle, kvPropSig_NumBits);
      if (signal.scale == 0.0 || numBits < 2) continue;
      if (!SetRawRange(signal, numBits, type == 0, Read<double>(handle, kvPropSig_Min),
                       Read<double>(handle, kvPropSig_Max)))
        continue;
      found.push_back(signal);
    }
  }
  kvdbCloseDatabase(database, 0);

  // One of each role by name, then the others in file order. Only what would be taken is tried
  // as a session: a database may hold thousands of signals.
  const auto usable = [&path](const tDriveSignal &s) { return Usable(path, s.item); };
  std::vector<tDriveSignal> picked;
  for (eRole role : {eRole::kSpeed, eRole::kSteering, eRole::kGear}) {
    // The vehicle's own speed rather than a set point, where the names tell them apart.
    auto it = std::find_if(found.begin(), found.end(), [&](const tDriveSignal &s) {
      return s.role == role && role == eRole::kSpeed &&
             Lower(s.item).find("vehiclespeed") != std::string::npos && usable(s);
    });
    if (it == found.end())
      it = std::find_if(found.begin(), found.end(),
                        [&](const tDriveSignal &s) { return s.role == role && usable(s); });
    if (it != found.end() && picked.size() < count) {
      picked.push_back(*it);
      found.erase(it);
    }
  }
  for (tDriveSignal &signal : found) {
    if (picked.size() >= count) break;
    if (!usable(signal)) continue;
    // A second speed or gear signal takes a course of its own.
    signal.role = eRole::kOther;
    picked.push_back(signal);
  }
  if (picked.empty()) {
    what = "no plain signal of a classic CAN frame in " + path;
    status = kvErrDbObjectNotFound;
  }
  return picked;
}

double DriveValue(const tDriveSignal &signal, size_t index, double seconds, double duration) {
  const double phase = seconds / duration;
  switch (signal.role) {
    case eRole::kSpeed: {  // away from standstill, up to speed and back down
      const double stand = signal.FractionOf(0.0);
      return signal.ValueAt(stand + (1 - stand) * (0.5 - 0.5 * std::cos(2 * kPi * phase)));
    }
    case eRole::kSteering:  // weaving about straight ahead
      return signal.ValueAt(0.5 + 0.3 * std::sin(2 * kPi * 1.5 * phase));
    case eRole::kGear:  // a step up every quarter of the drive
      return signal.ValueAt(std::floor(phase * 4) / 4);
    case eRole::kOther:
      break;
  }
  // A sawtooth of its own pace for each of the other signals.
  const double pace = 1.0 + static_cast<double>(index % 5);
  return signal.ValueAt(std::fmod(phase * pace, 1.0));
}

}  // namespace kvsvdemo
