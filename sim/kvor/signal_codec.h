// Signal values in frame payloads: where a signal's bits lie for either byte order, and the
// conversion between those bits and the physical value through the signal's type, scale and
// offset. Pure functions: they keep no state and touch no session.
#ifndef KVOR_SIM_SIGNAL_CODEC_H
#define KVOR_SIM_SIGNAL_CODEC_H

#include <cstdint>

#include "database_model.h"

namespace nKvorSim {

// Whether the signal has a usable shape (1 to 64 bits, a float of 32 or 64) and all of its bits
// lie inside a payload of `payloadLength` bytes. The functions below require it.
bool SignalFits(const tSignal &signal, uint32_t payloadLength);

// The signal's bits as they stand in the payload, the least significant in bit 0.
uint64_t ExtractRaw(const tSignal &signal, const uint8_t *payload);
// Writes the low `numBits` bits of `raw` into the signal's place; other bits stay as they are.
void InsertRaw(const tSignal &signal, uint64_t raw, uint8_t *payload);

// Raw bits to the physical value: sign-extended for signed signals, read as IEEE for floats.
double RawToPhysical(const tSignal &signal, uint64_t raw);
// The physical value to raw bits: rounded to the nearest step of the scale and held to what the
// signal's bits can carry; NaN gives 0 for integers.
uint64_t PhysicalToRaw(const tSignal &signal, double physical);

double DecodeSignal(const tSignal &signal, const uint8_t *payload);
void EncodeSignal(const tSignal &signal, double physical, uint8_t *payload);

// Whether the payload carries the signal: a multiplexed signal is there only when the frame's
// multiplexer holds its value. The frame's payload length bounds every read.
bool SignalPresent(const tFrame &frame, const tSignal &signal, const uint8_t *payload);

}  // namespace nKvorSim

#endif
