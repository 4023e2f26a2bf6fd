// The per-session cache record, reached without a lock through the low 16 bits of the handle.
#ifndef KVSVAPI_SESSION_SESSION_SLOT_H
#define KVSVAPI_SESSION_SESSION_SLOT_H

#include <atomic>
#include <cstdint>

#include "kvsvapi.h"

namespace nKVSVAPI100 {

class cNameList;

// "Not known": negative as a signed number, it fails every size test, so no further flag is needed.
constexpr int32_t kUnknown = static_cast<int32_t>(0x87654321u);

// What a waveform call hands to the host and the driver, one entry per signal; each array a
// malloc block.
struct tWaveformScratch {
  double **sampleBuffers;             // where each waveform's samples lie, for the driver
  SvWaveformDescriptor *descriptors;  // filled by the host's Lock
};

// Convert exports trust the cache only under their own tag: protocol digit, then direction.
enum eConvertTag : uint32_t {
  kTagRawToFrames = 0x8100,
  kTagCanToFrames = 0x1100,
  kTagLinToFrames = 0x4100,
  kTagFlexRayToFrames = 0x2100,
  kTagRawFromFrames = 0x8200,
  kTagCanFromFrames = 0x1200,
  kTagLinFromFrames = 0x4200,
  kTagFlexRayFromFrames = 0x2200
};

// Bit 0 of cacheFlags for read functions: frameLimit and sessionMode are known.
constexpr uint32_t kLimitsKnown = 1;

struct tSessionSlot {
  void *frameBuffer = nullptr;  // raw frame records, or scratch of XY reads
  tWaveformScratch *waveformScratch = nullptr;
  void *flexRayTimeCache = nullptr;
  cNameList *sessionNameList = nullptr;
  cNameList *nameList = nullptr;
  int32_t cachedCount = kUnknown;    // signals or frames the output is sized for
  int32_t cachedSamples = kUnknown;  // samples last sized for; frame functions: maximum payload
  uint32_t requiredHandleSize = 0;   // bytes the host handle needs for the cache to hold
  uint32_t frameBufferSize = 0;
  uint32_t sessionMode = 0xFFFFFFFFu;
  uint32_t cacheFlags = 0;
  uint32_t frameLimit = 0;  // frames in the list, or queue size; valid under kLimitsKnown
  uint32_t frameKind = 0;   // 1 classic CAN, 2 CAN FD, 3 J1939
  std::atomic<uint32_t> slotValid{0};
  std::atomic<uint32_t> guard{0};      // held for a whole read, write or convert call
  std::atomic<uint32_t> listGuard{0};  // held while a name list is looked up or built
};

// Frees what the slot owns and puts the record back to its initial values, invalid and with free
// guards.
void ClearSlot(tSessionSlot &slot);

// Frees what the slot owns, then the record: back to the session manager, which keeps records for
// reuse, or deleted when there is no manager (its end at process exit).
void DestroySlot(tSessionSlot *slot);

}  // namespace nKVSVAPI100

#endif
