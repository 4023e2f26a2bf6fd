#include "session/session_slot.h"

#include <cstdlib>

#include "session/name_list.h"
#include "session/session_manager.h"

namespace nKVSVAPI100 {

void ClearSlot(tSessionSlot &slot) {
  std::free(slot.frameBuffer);
  if (slot.waveformScratch != nullptr) {
    std::free(slot.waveformScratch->descriptors);
    std::free(slot.waveformScratch->sampleBuffers);
    std::free(slot.waveformScratch);
  }
  std::free(slot.flexRayTimeCache);
  delete slot.sessionNameList;
  delete slot.nameList;
  slot.frameBuffer = nullptr;
  slot.waveformScratch = nullptr;
  slot.flexRayTimeCache = nullptr;
  slot.sessionNameList = nullptr;
  slot.nameList = nullptr;
  slot.cachedCount = kUnknown;
  slot.cachedSamples = kUnknown;
  slot.requiredHandleSize = 0;
  slot.frameBufferSize = 0;
  slot.sessionMode = 0xFFFFFFFFu;
  slot.cacheFlags = 0;
  slot.frameLimit = 0;
  slot.frameKind = 0;
  slot.slotValid.store(0);
  slot.guard.store(0);
  slot.listGuard.store(0);
}

void DestroySlot(tSessionSlot *slot) {
  if (slot == nullptr) return;
  ClearSlot(*slot);
  gSessionManager.RetireSlot(slot);
}

}  // namespace nKVSVAPI100
