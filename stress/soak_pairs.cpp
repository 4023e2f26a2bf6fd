#include "soak_pairs.h"

#include <chrono>
#include <random>
#include <string>
#include <thread>

#include "kvorproperties.h"
#include "kvsvplatform.h"
#include "soak_bad_arguments.h"
#include "soak_host_arrays.h"
#include "soak_violations.h"
#include "svsim.h"

namespace nKvsvSoak {

namespace {

void Expect(cSoakThread &thread, int32_t status, int32_t expected, const std::string &what) {
  if (status != expected)
    Violation(thread.Name(), what + " gave " + StatusText(status) + ", not " + StatusText(expected));
}

// Calls on an ended session must fail, whatever slot its number now leads to.
void ProbeEnded(tPair &pair, const tSessionEnd &end, uint32_t handle, cSoakThread &thread) {
  int32_t status;
  if (end.mode == kvMode_FrameOutQueued) {
    cWriteArray frames(1);
    frames.Stamp(0, pair.number, pair.issued.fetch_add(1), pair.kind);
    status = thread.Call("kvsvWriteFrameCAN (ended)",
                         [&] { return kvsvWriteFrameCAN(handle, frames.handle(), 0.0); });
  } else {
    cReadArrays arrays;
    status = thread.Call("kvsvReadFrameCAN (ended)", [&] {
      return kvsvReadFrameCAN(handle, 4, &arrays.frames, &arrays.spares, 0.0);
    });
  }
  uint32_t mode = 0;
  const int32_t property = thread.Call("kvsvSessionGetPropU32 (ended)", [&] {
    return kvsvSessionGetPropU32(handle, kvPropSession_Mode, &mode, nullptr);
  });
  thread.tally.closedProbes += 2;
  for (const int32_t s : {status, property})
    if (s >= 0)
      Violation(thread.Name(), "a call on ended session " + StatusText(int32_t(handle)) +
                                   " gave " + StatusText(s));
}

}  // namespace

uint32_t HandleOfReference(kvsvRefnum reference) {
  // Other threads register and remove references meanwhile and shift the positions: look again
  // until the reference, which stays until this thread removes it, is seen.
  for (int pass = 0; pass < 1000 && reference != 0; ++pass) {
    for (int32_t i = 0; i < svsimRefCount(); ++i) {
      SvsimRefInfo info{};
      if (svsimGetRef(i, &info) == 1 && info.cookie == reference) return info.handle;
    }
  }
  return 0;
}

// A new session of `end` with its host reference; 0, with a violation, if there is none.
uint32_t MakeSession(const tSessionEnd &end, kvsvRefnum &reference, cSoakThread &thread) {
  reference = 0;
  const int32_t made = thread.Call("kvsvSessionManualCreate", [&] {
    return kvsvSessionManualCreate(":memory:", "", "", end.interfaceName, end.mode, &reference);
  });
  thread.Doing("finding the session's reference");
  const uint32_t handle = HandleOfReference(reference);
  thread.Beat();
  if (made != 0 || handle == 0) {
    Violation(thread.Name(), std::string("no session on ") + end.interfaceName + ": " +
                                 StatusText(made));
    if (reference != 0) kvsvSessionClear(handle, reference);
    return 0;
  }
  return handle;
}

bool OpenSession(tPair &pair, tSessionEnd &end, cSoakThread &thread) {
  kvsvRefnum reference = 0;
  uint32_t handle = MakeSession(end, reference, thread);
  // The driver hands out the next number each time, so the next session lands elsewhere.
  while (handle != 0 && ReachedByStrangers(handle)) {
    Expect(thread, thread.Call("kvsvSessionClear", [&] {
      return kvsvSessionClear(handle, reference);
    }), 0, "clearing a session whose slot handles of other classes reach");
    handle = MakeSession(end, reference, thread);
  }
  if (handle == 0) return false;
  if (pair.kind.flexibleDataRate) {
    const uint32_t on = 1;
    Expect(thread, thread.Call("kvsvSessionSetPropU32", [&] {
      return kvsvSessionSetPropU32(handle, kvPropSession_IntfCanIoMode, &on, nullptr);
    }), 0, "switching a new session to CAN FD");
  }
  end.reference = reference;
  end.handle.store(handle);
  return true;
}

void EndSession(tPair &pair, tSessionEnd &end, eEnding ending, cSoakThread &thread) {
  const uint32_t handle = end.handle.load();
  const kvsvRefnum reference = end.reference;
  end.reference = 0;
  switch (ending) {
    case eEnding::kClose:
      // The host ends its reference and calls the close export that was registered with it.
      Expect(thread, thread.Call("svUnregisterRef", [&] { return svUnregisterRef(reference); }),
             0, "the host's removal of a session reference");
      Expect(thread, thread.Call("kvsvSessionClose", [&] { return kvsvSessionClose(handle); }), 0,
             "kvsvSessionClose");
      break;
    case eEnding::kClear:
      Expect(thread, thread.Call("kvsvSessionClear", [&] {
        return kvsvSessionClear(handle, reference);
      }), 0, "kvsvSessionClear");
      break;
    case eEnding::kAbort:
      Expect(thread, thread.Call("kvsvSessionAbort", [&] { return kvsvSessionAbort(handle); }), 0,
             "kvsvSessionAbort");
      // The abort leaves the reference, which the program then clears alone.
      Expect(thread, thread.Call("kvsvSessionClear (reference only)", [&] {
        return kvsvSessionClear(0, reference);
      }), 0, "kvsvSessionClear of the reference of an aborted session");
      break;
  }
  ++thread.tally.sessionsEnded;
  ProbeEnded(pair, end, handle, thread);
}

void RunSessionChanger(std::vector<tPair> &pairs, const tRunFlags &flags, uint32_t seed,
                       cSoakThread &thread) {
  std::minstd_rand random(seed);
  while (flags.changing.load()) {
    tPair &pair = pairs[random() % pairs.size()];
    std::unique_lock<std::mutex> lock(pair.change, std::try_to_lock);
    if (lock.owns_lock()) {
      const uint32_t which = random() % 3;  // writer, reader or both
      const eEnding ending = static_cast<eEnding>(random() % 3);
      std::vector<tSessionEnd *> ends;
      if (which != 1) ends.push_back(&pair.writer);
      if (which != 0) ends.push_back(&pair.reader);
      for (tSessionEnd *end : ends) EndSession(pair, *end, ending, thread);
      // The traffic meets the ended sessions for a moment before the new ones come.
      thread.Doing("pausing with ended sessions");
      std::this_thread::sleep_for(std::chrono::microseconds(random() % 3000));
      for (tSessionEnd *end : ends) OpenSession(pair, *end, thread);
    }
    thread.Doing("pausing between changes");
    thread.Beat();
    std::this_thread::sleep_for(std::chrono::milliseconds(2 + random() % 30));
  }
}

}  // namespace nKvsvSoak
