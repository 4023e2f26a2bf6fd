// The session pairs of the soak: a writer on CAN1 and a reader on CAN2, each a manual session
// with its host reference, and the changers that end sessions by close, clear or abort and make
// new ones while the traffic runs on them.
#ifndef KVSVAPI_STRESS_SOAK_PAIRS_H
#define KVSVAPI_STRESS_SOAK_PAIRS_H

#include <atomic>
#include <cstdint>
#include <mutex>
#include <vector>

#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "soak_frame_stamp.h"
#include "soak_progress.h"

namespace nKvsvSoak {

// Phases of the run. Sessions change while `changing`; traffic runs while `running`, and what it
// moves once `changing` is over counts as settled.
struct tRunFlags {
  std::atomic<bool> changing{true};
  std::atomic<bool> running{true};
};

struct tSessionEnd {
  tSessionEnd(const char *interfaceText, uint32_t sessionMode)
      : interfaceName(interfaceText), mode(sessionMode) {}
  const char *interfaceName;
  uint32_t mode;
  // What the traffic uses now; it may be a session that was just ended.
  std::atomic<uint32_t> handle{0};
  // Touched only by the holder of the pair's `change` lock.
  kvsvRefnum reference = 0;
};

struct tPair {
  uint32_t number = 0;
  tWriterKind kind{};
  tSessionEnd writer{"CAN1", kvMode_FrameOutQueued};
  tSessionEnd reader{"CAN2", kvMode_FrameInQueued};
  // Sequence numbers handed out to the writer's frames.
  std::atomic<uint32_t> issued{0};
  std::mutex change;
};

enum class eEnding { kClose, kClear, kAbort };

// Makes the session of `end` with its host reference and publishes its handle. False, with a
// violation, if the library refused it.
bool OpenSession(tPair &pair, tSessionEnd &end, cSoakThread &thread);
// Ends the session of `end` as the host, the program or the program's clean-up would, then
// checks that calls on it fail. The ended handle stays published until the next open.
void EndSession(tPair &pair, tSessionEnd &end, eEnding ending, cSoakThread &thread);

// Ends and re-creates sessions of random pairs until `flags.changing` goes false.
void RunSessionChanger(std::vector<tPair> &pairs, const tRunFlags &flags, uint32_t seed,
                       cSoakThread &thread);

// The session handle behind a host reference, 0 if the host has none.
uint32_t HandleOfReference(kvsvRefnum reference);

}  // namespace nKvsvSoak

#endif
