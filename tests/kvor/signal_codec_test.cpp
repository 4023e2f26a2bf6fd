// Signal values in payloads: every placement of both byte orders against an independent reading
// of the payload as one integer, golden payloads, and the physical conversion at its edges.
#include "signal_codec.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <vector>

namespace {

using namespace nKvorSim;
constexpr ByteOrder kIntel = ByteOrder::kLittleEndian, kMotorola = ByteOrder::kBigEndian;

tSignal Layout(ByteOrder order, uint32_t start, uint32_t bits,
               SignalType type = SignalType::kUnsigned, double scale = 1.0, double offset = 0.0) {
  tSignal signal;
  signal.byteOrder = order;
  signal.startBit = start;
  signal.numBits = bits;
  signal.type = type;
  signal.scale = scale;
  signal.offset = offset;
  return signal;
}

uint64_t Mask(uint32_t bits) { return bits == 64 ? ~0ull : (1ull << bits) - 1; }

// The first bit of a signal counted from the top of a big-endian word (Motorola), or from the
// bottom of a little-endian one (Intel), where the signal is a plain run of bits.
uint32_t OracleFirst(const tSignal &s) {
  return s.byteOrder == kIntel ? s.startBit : (s.startBit / 8) * 8 + (7 - s.startBit % 8);
}

uint64_t OracleExtract(const tSignal &s, const uint8_t *payload) {
  uint64_t little = 0, big = 0;
  for (int i = 0; i < 8; ++i) {
    little |= uint64_t{payload[i]} << (8 * i);
    big = (big << 8) | payload[i];
  }
  if (s.byteOrder == kIntel) return (little >> s.startBit) & Mask(s.numBits);
  return (big >> (64 - OracleFirst(s) - s.numBits)) & Mask(s.numBits);
}

TEST(SignalCodec, EveryPlacementInEightBytesMatchesTheOracle) {
  uint64_t state = 0x5EED;
  const auto random = [&state] {
    state = state * 6364136223846793005ull + 1442695040888963407ull;
    return state ^ (state >> 29);
  };
  for (ByteOrder order : {kIntel, kMotorola}) {
    for (uint32_t start = 0; start < 64; ++start) {
      for (uint32_t bits = 1; bits <= 64; ++bits) {
        SCOPED_TRACE(testing::Message()
                     << (order == kIntel ? "intel " : "motorola ") << start << "|" << bits);
        const tSignal s = Layout(order, start, bits);
        ASSERT_EQ(SignalFits(s, 8), OracleFirst(s) + bits <= 64);
        if (OracleFirst(s) + bits > 64) continue;
        uint8_t payload[8], written[8];
        const uint64_t background = random(), raw = random() & Mask(bits);
        std::memcpy(payload, &background, 8);
        ASSERT_EQ(ExtractRaw(s, payload), OracleExtract(s, payload));
        std::memcpy(written, payload, 8);
        InsertRaw(s, raw, written);
        ASSERT_EQ(OracleExtract(s, written), raw);
        // Nothing outside the signal changed: clearing its bits in both gives the same bytes.
        InsertRaw(s, 0, written);
        InsertRaw(s, 0, payload);
        ASSERT_EQ(std::memcmp(written, payload, 8), 0);
      }
    }
  }
}

TEST(SignalCodec, GoldenPayloadsAndTheEdgesOfTheLongestPayload) {
  const std::vector<uint8_t> eight = {0xEF, 0xCD, 0xAB, 0x89, 0x67, 0x45, 0x23, 0x01};
  const struct {
    tSignal signal;
    uint64_t raw;
    std::vector<uint8_t> payload;
  } cases[] = {
      {Layout(kIntel, 0, 12), 0xABC, {0xBC, 0x0A, 0, 0}},
      {Layout(kMotorola, 6, 15), 0x1234, {0x12, 0x34, 0, 0}},
      {Layout(kMotorola, 0, 2), 0x3, {0x01, 0x80, 0, 0}},
      {Layout(kIntel, 0, 64), 0x0123456789ABCDEFull, eight},
      {Layout(kMotorola, 7, 64), 0xEFCDAB8967452301ull, eight},
  };
  for (const auto &c : cases) {
    std::vector<uint8_t> payload(c.payload.size(), 0);
    InsertRaw(c.signal, c.raw, payload.data());
    EXPECT_EQ(payload, c.payload) << std::hex << c.raw;
    EXPECT_EQ(ExtractRaw(c.signal, c.payload.data()), c.raw);
  }
  uint8_t payload[64] = {};  // the last bits of a 64-byte CAN FD payload
  ASSERT_TRUE(SignalFits(Layout(kIntel, 511, 1), 64) && SignalFits(Layout(kMotorola, 511, 8), 64));
  InsertRaw(Layout(kIntel, 511, 1), 1, payload);
  EXPECT_EQ(payload[63], 0x80);
  EXPECT_EQ(ExtractRaw(Layout(kMotorola, 511, 8), payload), 0x80u);
  EXPECT_FALSE(SignalFits(Layout(kIntel, 505, 8), 64));
  EXPECT_FALSE(SignalFits(Layout(kIntel, 0, 0), 8));
  EXPECT_FALSE(SignalFits(Layout(kIntel, 0, 16, SignalType::kFloat), 8));
}

TEST(SignalCodec, PhysicalValuesConvertWithScaleOffsetAndLimits) {
  const auto kSigned = SignalType::kSigned, kFloat = SignalType::kFloat;
  const struct {
    const char *what;
    tSignal signal;
    double physical;
    uint64_t raw;
    double back;  // the physical value of `raw`
  } cases[] = {
      {"scaled", Layout(kIntel, 0, 15, SignalType::kUnsigned, 0.1, -1638.35), 0.05, 16384, 0.05},
      {"rounded to the step", Layout(kIntel, 0, 8, SignalType::kUnsigned, 0.5), 1.26, 3, 1.5},
      {"unsigned below zero", Layout(kIntel, 0, 8), -5, 0, 0},
      {"unsigned above", Layout(kIntel, 0, 8), 300, 255, 255},
      {"signed -1", Layout(kIntel, 0, 13, kSigned, 0.25), -0.25, 0x1FFF, -0.25},
      {"signed lowest", Layout(kIntel, 0, 13, kSigned), -5000, 0x1000, -4096},
      {"signed highest", Layout(kIntel, 0, 13, kSigned), 5000, 0x0FFF, 4095},
      {"signed 1 bit", Layout(kIntel, 0, 1, kSigned), -1, 1, -1},
      {"64-bit signed lowest", Layout(kIntel, 0, 64, kSigned), -INFINITY, 1ull << 63, -0x1p63},
      {"64-bit unsigned highest", Layout(kIntel, 0, 64), 1e30, ~0ull, 0x1p64},
      {"NaN", Layout(kIntel, 0, 8, kSigned), std::nan(""), 0, 0},
      {"float", Layout(kIntel, 0, 32, kFloat, 2.0, 1.0), 4.0, 0x3FC00000, 4.0},
      {"double", Layout(kIntel, 0, 64, kFloat), -2.5, 0xC004000000000000ull, -2.5},
  };
  for (const auto &c : cases) {
    EXPECT_EQ(PhysicalToRaw(c.signal, c.physical), c.raw) << c.what;
    EXPECT_NEAR(RawToPhysical(c.signal, c.raw), c.back, 1e-9) << c.what;
  }
}

}  // namespace
