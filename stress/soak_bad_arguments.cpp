#include "soak_bad_arguments.h"

#include <chrono>
#include <functional>
#include <random>
#include <string>
#include <thread>

#include "kvorproperties.h"
#include "kvsvplatform.h"
#include "soak_host_arrays.h"
#include "soak_traffic.h"
#include "soak_violations.h"
#include "svsim.h"

namespace nKvsvSoak {

namespace {

// A session number past the end of the library's table, and handles of database objects.
constexpr uint32_t kBeyondTable = 0x2000FFFFu;
constexpr uint32_t kDatabaseHandle = 0x80000123u;
constexpr uint32_t kFrameObjectHandle = 0x82000123u;
constexpr char kDeviceName[] = "___kvorDev#fff0b8ed";  // the CAN/LIN box, serial 1001234

enum class eExpect { kAny, kNegative, kExact };

struct tCase {
  const char *name;
  eExpect expect;
  int32_t exact;
  // Whether it reads frames into the thread's arrays, which are then checked.
  bool reads;
  std::function<int32_t()> call;
};

// System objects held as the host holds them: opened by name, then registered under that name,
// so that their close removes the reference again.
class cSystemObjects {
 public:
  explicit cSystemObjects(cSoakThread &thread) : thread_(thread) {
    names_ = {svsimMakeString(""), svsimMakeString(kDeviceName), svsimMakeString("CAN1")};
    Check(kvsvSystemOpen(&names_[0], &system), "kvsvSystemOpen");
    Check(kvsvDeviceOpen(&names_[1], &device), "kvsvDeviceOpen");
    Register(kDeviceName, device, "KVOR Device", "kvsvDeviceOpen", "kvsvDeviceClose");
    Check(kvsvInterfaceOpen(&names_[2], &interfaceRef), "kvsvInterfaceOpen");
    Register("CAN1", interfaceRef, "KVOR Interface", "kvsvInterfaceOpen", "kvsvInterfaceClose");
  }
  ~cSystemObjects() {
    Check(kvsvInterfaceClose(interfaceRef), "kvsvInterfaceClose");
    Check(kvsvDeviceClose(device), "kvsvDeviceClose");
    Check(kvsvSystemClose(system), "kvsvSystemClose");
    for (SvHandle name : names_) svDisposeHandle(name);
  }
  cSystemObjects(const cSystemObjects &) = delete;
  cSystemObjects &operator=(const cSystemObjects &) = delete;

  uint32_t system = 0;
  uint32_t device = 0;
  uint32_t interfaceRef = 0;
  SvHandle emptyName() { return names_[0]; }

 private:
  void Check(int32_t status, const char *what) {
    if (status != 0) Violation(thread_.Name(), std::string(what) + " gave " + StatusText(status));
  }
  void Register(const char *name, uint32_t handle, const char *className, const char *open,
                const char *close) {
    SvHandle texts[] = {svsimMakeString(name), svsimMakeString("kvor"), svsimMakeString(className),
                        svsimMakeString("kvsvapi.*"), svsimMakeString(open),
                        svsimMakeString(close)};
    SvRefnum cookie = 0;
    Check(svRegisterRefKind3(texts[0], handle, texts[1], texts[2], 21, &cookie, 8, texts[3], 1,
                             texts[4], texts[5], 0, 0, 0),
          "the host's registration of a system object");
    for (SvHandle text : texts) svDisposeHandle(text);
  }

  cSoakThread &thread_;
  std::vector<SvHandle> names_;
};

// A session of this thread's own, ended at once. One is made each round: the driver hands a
// slot number out again after going round all of them, and an ended number that lands on a live
// session reaches that session's slot.
uint32_t EndedSession(cSoakThread &thread) {
  kvsvRefnum reference = 0;
  kvsvSessionManualCreate(":memory:", "", "", "CAN2", kvMode_FrameInQueued, &reference);
  const uint32_t handle = HandleOfReference(reference);
  if (kvsvSessionClear(handle, reference) != 0 || handle == 0)
    Violation(thread.Name(), "could not make and clear a session of its own");
  return handle;
}

}  // namespace

void RunBadArguments(std::vector<tPair> &pairs, const tRunFlags &flags, uint32_t seed,
                     cSoakThread &thread) {
  std::minstd_rand random(seed);
  cSystemObjects objects(thread);
  uint32_t ended = 0;
  cReadArrays arrays;
  cWriteArray empty(1), oversized(1), frame(1);
  empty.SetCount(0);
  oversized.Stamp(0, 0, 0, pairs[0].kind);
  oversized.Oversize(0, kFlexiblePayloadMax + 1);
  SvHandle info = nullptr;
  uint32_t value = 0;
  const uint8_t skip = 1;

  // The pair that the next case aims at; its sessions may be ended under it at any time.
  tPair *pair = &pairs[0];
  auto reader = [&] { return pair->reader.handle.load(); };
  auto writer = [&] { return pair->writer.handle.load(); };
  auto read = [&](uint32_t session, int32_t n, double limit) {
    return kvsvReadFrameCAN(session, n, &arrays.frames, &arrays.spares, limit);
  };
  auto write = [&](uint32_t session, SvHandle frames) {
    return kvsvWriteFrameCAN(session, frames, 0.0);
  };
  auto stamped = [&] {
    frame.Stamp(0, pair->number, pair->issued.fetch_add(1), pair->kind);
    return frame.handle();
  };
  const std::vector<uint32_t> strangers = {objects.system, objects.device, objects.interfaceRef,
                                           kDatabaseHandle, kFrameObjectHandle};
  const eExpect kNeg = eExpect::kNegative, kExact = eExpect::kExact, kAny = eExpect::kAny;
  const std::vector<tCase> cases = {
      {"read into null arrays", kNeg, 0, false, [&] { return kvsvReadFrameCAN(reader(), 1, nullptr, nullptr, 0.0); }},
      {"read of session 0", kExact, kvErrInvalidSession, true, [&] { return read(0, 4, 0.0); }},
      {"read beyond the table", kExact, kvErrInvalidSession, true, [&] { return read(kBeyondTable, 4, 0.0); }},
      {"read of an ended session", kNeg, 0, true, [&] { return read(ended, 4, 0.02); }},
      {"read of everything with a time limit", kNeg, 0, true, [&] { return read(reader(), -1, 0.01); }},
      {"read skipped with null arrays", kExact, 0, false,
       [&] { return kvsvReadFrameCANEx(reader(), 1, nullptr, nullptr, &skip, 0.0); }},
      {"read of 3000 frames", kAny, 0, true, [&] { return read(reader(), 3000, 0.0); }},
      {"read on a writer", kNeg, 0, true, [&] { return read(writer(), 2, 0.0); }},
      {"write of a null array", kAny, 0, false, [&] { return write(writer(), nullptr); }},
      {"write of an empty array on an ended session", kNeg, 0, false, [&] { return write(ended, empty.handle()); }},
      {"write of a payload over 64 bytes", kNeg, 0, false, [&] { return write(writer(), oversized.handle()); }},
      {"write on a reader", kNeg, 0, false, [&] { return write(reader(), stamped()); }},
      {"write on an ended session", kNeg, 0, false, [&] { return write(ended, stamped()); }},
      {"property into a null value", kNeg, 0, false,
       [&] { return kvsvSessionGetPropU32(reader(), kvPropSession_Mode, nullptr, nullptr); }},
      {"property of an ended session", kNeg, 0, false,
       [&] { return kvsvSessionGetPropU32(ended, kvPropSession_Mode, &value, &info); }},
      {"read-only property set", kNeg, 0, false,
       [&] { return kvsvSessionSetPropU32(writer(), kvPropSession_Mode, &value, &info); }},
      {"signal read of a frame session into null", kNeg, 0, false, [&] { return kvsvReadSignalSinglePoint(reader(), nullptr); }},
      {"wait on an ended session", kNeg, 0, false,
       [&] { return kvsvSessionWait(ended, 0x8001, 0, &value, 0.001); }},
      {"close of session 0", kExact, 0, false, [&] { return kvsvSessionClose(0); }},
      {"close beyond the table", kExact, 0, false, [&] { return kvsvSessionClose(kBeyondTable); }},
      {"clear of nothing", kExact, 0, false, [&] { return kvsvSessionClear(0, 0); }},
      {"abort of session 0", kExact, 0, false, [&] { return kvsvSessionAbort(0); }},
      {"abort beyond the table", kExact, 0, false, [&] { return kvsvSessionAbort(kBeyondTable); }},
      {"system open into null", kExact, kvErrInternal, false, [&] { return kvsvSystemOpen(nullptr, nullptr); }},
      {"device open of a null name", kExact, kvErrDeviceNameEmpty, false,
       [&] { return kvsvDeviceOpen(nullptr, &value); }},
      {"interface open of an empty name", kExact, kvErrSystemObjectNotFound, false, [&] {
         SvHandle name = objects.emptyName();
         return kvsvInterfaceOpen(&name, &value);
       }},
      {"session on an interface that does not exist", kNeg, 0, false, [&] {
         kvsvRefnum reference = 0;
         const int32_t status =
             kvsvSessionManualCreate(":memory:", "", "", "CAN9", kvMode_FrameInQueued, &reference);
         // The refused session is registered all the same, for its first use to fail.
         const int32_t cleared = kvsvSessionClear(0, reference);
         if (cleared != 0)
           Violation(thread.Name(), "clearing the reference of a refused session gave " +
                                        StatusText(cleared));
         return status;
       }},
  };

  while (flags.running.load()) {
    ended = EndedSession(thread);
    for (const tCase &c : cases) {
      pair = &pairs[random() % pairs.size()];
      const int32_t status = thread.Call(c.name, c.call);
      if (info != nullptr) {  // a failed property call names the property in a handle of ours
        svDisposeHandle(info);
        info = nullptr;
      }
      const bool fine = c.expect == kAny || (c.expect == kNeg && status < 0) ||
                        (c.expect == kExact && status == c.exact);
      if (!fine) Violation(thread.Name(), std::string(c.name) + " gave " + StatusText(status));
      // What the reads took off a live session must be frames that were written.
      if (c.reads && status != kvErrInvalidSession && status != kvErrSessionBusy)
        thread.tally.framesRead +=
            CheckFrames(c.name, arrays, pair->kind.flexibleDataRate, pairs, nullptr, thread);
      if (!flags.running.load()) break;
    }
    for (const uint32_t stranger : strangers) {
      pair = &pairs[random() % pairs.size()];
      for (const int32_t status :
           {thread.Call("read of another class", [&] { return read(stranger, 2, 0.0); }),
            thread.Call("write of another class", [&] { return write(stranger, stamped()); }),
            thread.Call("property of another class", [&] {
              return kvsvSessionGetPropU32(stranger, kvPropSession_Mode, &value, nullptr);
            })})
        if (status >= 0)
          Violation(thread.Name(), "a session call on handle " + StatusText(int32_t(stranger)) +
                                       " gave " + StatusText(status));
    }
    thread.Doing("pausing between rounds");
    std::this_thread::sleep_for(std::chrono::milliseconds(1));
  }
}

bool ReachedByStrangers(uint32_t session) {
  const uint32_t slot = session & 0xFFFFu;
  // Devices 0x01SSDD00 and their interfaces 0x01SSDD0P, DD 1 or 2, reach slots DD00 to DD0F.
  const uint32_t device = slot >> 8;
  const bool systemObject = (device == 1 || device == 2) && (slot & 0xF0u) == 0;
  return systemObject || slot == (kDatabaseHandle & 0xFFFFu) ||
         slot == (kFrameObjectHandle & 0xFFFFu);
}

}  // namespace nKvsvSoak
