// The properties that a frame session has before anyone sets them, and what the frame calls take
// from them. A value set with kvSetProperty wins over the default.
//
//   kvPropSession_PayldLenMax     Ethernet 1500, FlexRay 254, LIN 8; CAN 1785 for J1939
//                                 (kvPropSession_ApplicationProtocol 1), 64 for CAN FD
//                                 (kvPropSession_IntfCanIoMode non-zero), 8 otherwise
//   kvPropSession_QueueSize       room for kDefaultQueueFrames records of the payload maximum
//   kvPropSession_IntfCanIoMode, kvPropSession_ApplicationProtocol, kvPropSession_IntfEchoTx  0
//   kvPropSession_NumPend         read-only: frames waiting in an input session's queue
//   kvPropHidden_FramePayloadLen  per list item: the item's length (see frame_items.h)
#ifndef KVOR_SIM_FRAME_PROPERTIES_H
#define KVOR_SIM_FRAME_PROPERTIES_H

#include <cstdint>
#include <optional>

#include "frame_record.h"
#include "property_value.h"
#include "session.h"

namespace nKvorSim {

constexpr uint32_t kDefaultQueueFrames = 4096;

// The value set on the session, or `fallback`. Sizes are checked when a value is set, so a stored
// value of a 4-byte identifier has its 4 bytes.
uint32_t SetU32(const Session &session, uint32_t id, uint32_t fallback);

bool IsFrameInputMode(uint32_t mode);
bool IsFrameOutputMode(uint32_t mode);

// A live value that cannot be set; nothing for any other identifier or session.
std::optional<PropertyValue> FrameReadOnlyProperty(const Session &session, uint32_t id);
// The default of a settable frame property; nothing for any other identifier or session.
std::optional<PropertyValue> FrameDefaultProperty(const Session &session, uint32_t id);
std::optional<PropertyValue> FrameDefaultSubProperty(const Session &session, uint32_t index,
                                                     uint32_t id);

// The session's values as the frame calls use them.
uint32_t PayloadLimit(const Session &session);
uint32_t QueueCapacity(const Session &session);
bool EchoEnabled(const Session &session);
// The record form of kvReadFrame and kvWriteFrame: fixed for LIN and classic CAN, variable for
// CAN FD, J1939 and FlexRay.
RecordForm SessionRecordForm(const Session &session);
// Payload length of list item `index`.
uint32_t ItemPayloadLength(const Session &session, uint32_t index);

}  // namespace nKvorSim

#endif
