// One driver record, or one Ethernet descriptor, into the fields of a host cluster. The payload
// handle is the caller's business: these fill every other field the cluster shows.
#ifndef KVSVAPI_FRAME_FRAME_DECODE_H
#define KVSVAPI_FRAME_FRAME_DECODE_H

#include <cstdint>

#include "frame/frame_record.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

// Timestamp, Identifier (29 bits), Type, Extended (identifier bit 29), Echo (flag bit 7).
void DecodeCanRecord(const uint8_t *record, uint8_t *cluster);
// Timestamp, Identifier (the record's low identifier byte), Echo, Flag0, Type, Info.
void DecodeLinRecord(const uint8_t *record, uint8_t *cluster);
// Timestamp, Identifier (16 bits), Type, Info, Flag0, Flag1, Flag2, Flag4, Flag5, Echo.
void DecodeFlexRayRecord(const uint8_t *record, uint8_t *cluster);
// Both timestamps (1 ns times), Word, Reserved (always 0), Flag0 to Flag3.
void DecodeEthernetDescriptor(const tEthernetReadDescriptor &descriptor, uint8_t *cluster);

// Puts `length` bytes into a payload handle (count at byte 0, bytes from byte 4), which must hold
// them.
void StorePayload(SvHandle payload, const uint8_t *bytes, uint32_t length);

}  // namespace nKVSVAPI100

#endif
