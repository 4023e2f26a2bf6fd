#include "session/session_slot.h"

#include <cstdlib>

#include "session/name_list.h"

namespace nKVSVAPI100 {

void DestroySlot(tSessionSlot *slot) {
  if (slot == nullptr) return;
  std::free(slot->frameBuffer);
  if (slot->waveformScratch != nullptr) {
    std::free(slot->waveformScratch->second);
    std::free(slot->waveformScratch->first);
    std::free(slot->waveformScratch);
  }
  std::free(slot->flexRayTimeCache);
  delete slot->sessionNameList;
  delete slot->nameList;
  delete slot;
}

}  // namespace nKVSVAPI100
