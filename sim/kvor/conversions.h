// Conversion sessions: the session's signals, as values or as one image of their raw bytes, packed
// into the frames that carry them, and taken back out of frames, with no bus. The frames are
// those that a signal output session of the same list would send for the same values, encoded
// in the conversion session's record form (conversion_properties.h).
#ifndef KVOR_SIM_CONVERSIONS_H
#define KVOR_SIM_CONVERSIONS_H

#include <cstdint>

#include "driver_status.h"
#include "session.h"

namespace nKvorSim {

// Where the frames of a conversion go: `size` bytes at `buffer`, and the bytes written.
struct tRecordsOut {
  void *buffer;
  uint32_t size;
  uint32_t *bytesReturned;
};

// One value per signal (8 bytes each) into frames stamped `now`.
Status ConvertSignalsToFrames(const Session &session, uint64_t now, const double *values,
                              uint32_t valuesSize, const tRecordsOut &out);
// The byte image (SessionImageBytes at least) into frames stamped `now`.
Status ConvertImageToFrames(const Session &session, uint64_t now, const uint8_t *bytes,
                            uint32_t bytesSize, const tRecordsOut &out);

// One value per signal, and its frame's time if `timestamps` is not null, from `size` bytes of
// records. A signal that no frame carries reads 0.0 at time 0.
Status ConvertFramesToSignals(const Session &session, const void *records, uint32_t size,
                              double *values, uint32_t valuesSize, uint64_t *timestamps,
                              uint32_t timestampsSize);
// The byte image from `size` bytes of records; a signal that no frame carries is all zero bits.
Status ConvertFramesToImage(const Session &session, const void *records, uint32_t size,
                            uint8_t *bytes, uint32_t bytesSize);

}  // namespace nKvorSim

#endif
