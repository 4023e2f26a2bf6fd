// Frame reads of input sessions. A stream or queued session hands out what waits in its queue,
// oldest first; a single-point session one record per list item. A read with a time limit of 0
// takes what is there; any other limit (seconds, negative for none) waits until all that was asked
// for is there, and then takes it, or takes what is there when the limit runs out, with status 0.
// A clear of the session ends the wait with kvsimErrSessionCleared. On an error the outputs are
// left untouched.
#ifndef KVOR_SIM_FRAME_READS_H
#define KVOR_SIM_FRAME_READS_H

#include <cstdint>
#include <optional>
#include <string_view>

#include "call_counter.h"
#include "driver_status.h"
#include "frame_record.h"
#include "session.h"

namespace nKvorSim {

// Where a wait of a read counts, so that tests see it blocked.
struct ReadWait {
  double timeLimit;
  CallCounter &blocked;
  std::string_view function;
};

// Whole records of the session's form, as many as fit into `size` bytes; with `maxFrames`,
// records of the variable form, no more than that many.
Status ReadRecords(Session &session, void *buffer, uint32_t size,
                   std::optional<uint32_t> maxFrames, const ReadWait &wait,
                   uint32_t *bytesReturned);

// Up to `numFrames` Ethernet frames of a stream or queued session, each into its descriptor.
Status ReadEthernetFrames(Session &session, tEthernetReadDescriptor *descriptors,
                          uint32_t numFrames, const ReadWait &wait, int32_t *numReturned);

}  // namespace nKvorSim

#endif
