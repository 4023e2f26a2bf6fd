#include "signal_codec.h"

#include <cmath>
#include <cstring>
#include <limits>

namespace nKvorSim {

namespace {

// Motorola signals count their bits from the most significant one of byte 0 onwards; in that
// counting a big-endian signal is one unbroken run, as an Intel signal is in the plain counting.
uint32_t BigEndianRunStart(uint32_t startBit) { return (startBit / 8) * 8 + (7 - startBit % 8); }

uint64_t LowMask(uint32_t bits) { return bits >= 64 ? ~uint64_t{0} : (uint64_t{1} << bits) - 1; }

bool GetBit(const uint8_t *payload, uint32_t byte, uint32_t bit) {
  return (payload[byte] >> bit) & 1u;
}

void PutBit(uint8_t *payload, uint32_t byte, uint32_t bit, bool value) {
  const uint8_t mask = static_cast<uint8_t>(1u << bit);
  payload[byte] = value ? static_cast<uint8_t>(payload[byte] | mask)
                        : static_cast<uint8_t>(payload[byte] & ~mask);
}

// Byte and bit of the signal's bit `k`, counted from its least significant bit.
void Locate(const tSignal &signal, uint32_t k, uint32_t *byte, uint32_t *bit) {
  if (signal.byteOrder == ByteOrder::kLittleEndian) {
    const uint32_t position = signal.startBit + k;
    *byte = position / 8;
    *bit = position % 8;
  } else {
    const uint32_t run = BigEndianRunStart(signal.startBit) + (signal.numBits - 1 - k);
    *byte = run / 8;
    *bit = 7 - run % 8;
  }
}

int64_t SignExtend(uint64_t raw, uint32_t bits) {
  if (bits >= 64) {
    int64_t value;
    std::memcpy(&value, &raw, sizeof value);
    return value;
  }
  const uint64_t sign = uint64_t{1} << (bits - 1);
  const uint64_t extended = (raw & LowMask(bits)) ^ sign;
  return static_cast<int64_t>(extended) - static_cast<int64_t>(sign);
}

uint64_t FloatBits(double value, uint32_t bits) {
  if (bits == 32) {
    // Beyond the range of a single the value is infinite; converting it as it is would not be
    // defined.
    const float limit = std::numeric_limits<float>::max();
    const float single = value > limit    ? std::numeric_limits<float>::infinity()
                         : value < -limit ? -std::numeric_limits<float>::infinity()
                                          : static_cast<float>(value);
    uint32_t word;
    std::memcpy(&word, &single, sizeof word);
    return word;
  }
  uint64_t word;
  std::memcpy(&word, &value, sizeof word);
  return word;
}

double FloatValue(uint64_t raw, uint32_t bits) {
  if (bits == 32) {
    const uint32_t word = static_cast<uint32_t>(raw);
    float single;
    std::memcpy(&single, &word, sizeof single);
    return single;
  }
  double value;
  std::memcpy(&value, &raw, sizeof value);
  return value;
}

}  // namespace

bool SignalFits(const tSignal &signal, uint32_t payloadLength) {
  if (signal.numBits < 1 || signal.numBits > 64) return false;
  if (signal.type == SignalType::kFloat && signal.numBits != 32 && signal.numBits != 64) {
    return false;
  }
  const uint64_t payloadBits = uint64_t{payloadLength} * 8;
  if (signal.startBit >= payloadBits) return false;
  const uint64_t first = signal.byteOrder == ByteOrder::kLittleEndian
                             ? signal.startBit
                             : BigEndianRunStart(signal.startBit);
  return first + signal.numBits <= payloadBits;
}

uint64_t ExtractRaw(const tSignal &signal, const uint8_t *payload) {
  uint64_t raw = 0;
  for (uint32_t k = 0; k < signal.numBits; ++k) {
    uint32_t byte, bit;
    Locate(signal, k, &byte, &bit);
    if (GetBit(payload, byte, bit)) raw |= uint64_t{1} << k;
  }
  return raw;
}

void InsertRaw(const tSignal &signal, uint64_t raw, uint8_t *payload) {
  for (uint32_t k = 0; k < signal.numBits; ++k) {
    uint32_t byte, bit;
    Locate(signal, k, &byte, &bit);
    PutBit(payload, byte, bit, (raw >> k) & 1u);
  }
}

double RawToPhysical(const tSignal &signal, uint64_t raw) {
  raw &= LowMask(signal.numBits);
  double value;
  switch (signal.type) {
    case SignalType::kFloat:
      value = FloatValue(raw, signal.numBits);
      break;
    case SignalType::kSigned:
      value = static_cast<double>(SignExtend(raw, signal.numBits));
      break;
    default:
      value = static_cast<double>(raw);
      break;
  }
  return value * signal.scale + signal.offset;
}

uint64_t PhysicalToRaw(const tSignal &signal, double physical) {
  const double scale = signal.scale != 0.0 ? signal.scale : 1.0;
  const double steps = (physical - signal.offset) / scale;
  if (signal.type == SignalType::kFloat) return FloatBits(steps, signal.numBits);
  if (std::isnan(steps)) return 0;
  const double rounded = std::round(steps);
  const uint32_t bits = signal.numBits;
  if (signal.type == SignalType::kUnsigned) {
    // 2^bits as a double is exact for every width up to 64.
    const double limit = std::ldexp(1.0, static_cast<int>(bits));
    if (rounded <= 0.0) return 0;
    if (rounded >= limit) return LowMask(bits);
    return static_cast<uint64_t>(rounded);
  }
  const double half = std::ldexp(1.0, static_cast<int>(bits) - 1);
  int64_t value;
  if (rounded >= half) {
    value = bits >= 64 ? std::numeric_limits<int64_t>::max()
                       : static_cast<int64_t>(LowMask(bits - 1));
  } else if (rounded < -half) {
    value = bits >= 64 ? std::numeric_limits<int64_t>::min()
                       : -static_cast<int64_t>(LowMask(bits - 1)) - 1;
  } else {
    value = static_cast<int64_t>(rounded);
  }
  return static_cast<uint64_t>(value) & LowMask(bits);
}

double DecodeSignal(const tSignal &signal, const uint8_t *payload) {
  return RawToPhysical(signal, ExtractRaw(signal, payload));
}

void EncodeSignal(const tSignal &signal, double physical, uint8_t *payload) {
  InsertRaw(signal, PhysicalToRaw(signal, physical), payload);
}

bool SignalPresent(const tFrame &frame, const tSignal &signal, const uint8_t *payload) {
  if (signal.mux != MuxRole::kMultiplexed) return true;
  const tSignal *multiplexer = FindMultiplexer(frame);
  if (multiplexer == nullptr || !SignalFits(*multiplexer, frame.payloadLength)) return false;
  return ExtractRaw(*multiplexer, payload) == signal.muxValue;
}

}  // namespace nKvorSim
