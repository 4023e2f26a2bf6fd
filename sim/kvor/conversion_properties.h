// The properties of a conversion session (mode 12), and what its conversions take from them. A
// value set with kvSetProperty or kvSetSubProperty wins over the default.
//
//   kvPropSession_NumFrames          the frames that a conversion of all the session's signals
//                                    gives, one per frame group (see signal_layout.h); a test may
//                                    set fewer, to make the session count fewer than it gives
//   kvPropSession_PayldLenMax        LIN 8, FlexRay 254; CAN 1785 for J1939
//                                    (kvPropSession_ApplicationProtocol 1), otherwise the longest
//                                    frame of the session's groups, 8 at least
//   kvPropSession_ApplicationProtocol  0
//   kvPropHidden_ByteArrayBits       at any index: the bits of the session's byte image
#ifndef KVOR_SIM_CONVERSION_PROPERTIES_H
#define KVOR_SIM_CONVERSION_PROPERTIES_H

#include <cstdint>
#include <optional>

#include "database_model.h"
#include "frame_record.h"
#include "property_value.h"
#include "session.h"

namespace nKvorSim {

bool IsConversionSession(const Session &session);

std::optional<PropertyValue> ConversionDefaultProperty(const Session &session, uint32_t id);
// A value of the whole session that is served as a sub-property, whatever the index.
std::optional<PropertyValue> ConversionSessionSubProperty(const Session &session, uint32_t id);

// Bytes that one signal takes in a byte image: its raw bits, low byte first, in whole bytes.
uint32_t ImageBytes(const tSignal &signal);
// Bytes of the session's whole image: its signals one behind the other, in list order.
uint32_t SessionImageBytes(const Session &session);

uint32_t ConversionPayloadLimit(const Session &session);
// The record form of a conversion session's frames: variable for FlexRay and for CAN with a
// payload limit above 8, fixed otherwise.
RecordForm ConversionRecordForm(const Session &session);

}  // namespace nKvorSim

#endif
