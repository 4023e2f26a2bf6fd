// The host's side of a conversion, the one that is not frames: a double array of one value per
// signal, or a byte array that holds the signals packed as one image. Each says how its data goes
// to the driver, how many elements the session gives it and how large its handle must be.
#ifndef KVSVAPI_CONVERT_CONVERSION_SIDES_H
#define KVSVAPI_CONVERT_CONVERSION_SIDES_H

#include <cstdint>

#include "core/status.h"
#include "kvsvplatform.h"
#include "session/session_slot.h"

namespace nKVSVAPI100 {

// One 64-bit float per signal, behind the array's 8-byte header.
struct tSignalValues {
  // Packs the values into `size` bytes of records at `records`; the bytes written go to *bytes.
  static Status ToFrames(uint32_t session, SvHandle values, void *records, uint32_t size,
                         uint32_t *bytes);
  // The session's number of signals, into cachedCount.
  static Status ReadCount(tSessionSlot &slot, uint32_t session);
  // Handle bytes for `count` signals.
  static uint32_t HandleBytes(int32_t count);
  // Extracts one value per signal from `used` bytes of records into the array.
  static Status FromFrames(uint32_t session, const void *records, uint32_t used, SvHandle values,
                           int32_t count);
};

// The signals as one image of bytes, behind the array's 4-byte count.
struct tByteImage {
  static Status ToFrames(uint32_t session, SvHandle image, void *records, uint32_t size,
                         uint32_t *bytes);
  // The image's size in bytes, into cachedCount: the session gives it in bits, and the bits past
  // the last whole byte are dropped. The field is shifted whatever the read gave.
  static Status ReadCount(tSessionSlot &slot, uint32_t session);
  static uint32_t HandleBytes(int32_t count);
  static Status FromFrames(uint32_t session, const void *records, uint32_t used, SvHandle image,
                           int32_t count);
};

}  // namespace nKVSVAPI100

#endif
