// Frame writes of output sessions. A write is checked whole before anything is sent: a buffer
// that the driver would not take is refused and sends nothing. What is taken is transmitted at
// once, stamped with the clock; a time limit is accepted and never needed.
#ifndef KVOR_SIM_FRAME_WRITES_H
#define KVOR_SIM_FRAME_WRITES_H

#include <cstdint>

#include "driver.h"
#include "driver_status.h"
#include "frame_record.h"
#include "session.h"

namespace nKvorSim {

// Records of the session's form: `size` bytes at `buffer`, which may be null for size 0.
Status WriteRecords(Driver &driver, Session &session, const void *buffer, uint32_t size,
                    double timeLimit);

// `count` Ethernet frames, one per descriptor.
Status WriteEthernetFrames(Driver &driver, Session &session,
                           const tEthernetWriteDescriptor *descriptors, uint32_t count,
                           double timeLimit);

}  // namespace nKvorSim

#endif
