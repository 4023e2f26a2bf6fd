// Signal values in payloads: every placement of both byte orders against an independent reading
// of the payload as one integer, golden payloads, the physical conversion at its edges, and
// multiplexing.
#include "signal_codec.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>
#include <vector>

namespace {

using namespace nKvorSim;

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

// The oracle: the 8 bytes as one little-endian word for Intel signals, one big-endian word for
// Motorola signals, where a signal is a plain run of bits.
uint64_t OracleExtract(const tSignal &s, const uint8_t *payload) {
  uint64_t little = 0, big = 0;
  for (int i = 7; i >= 0; --i) little = (little << 8) | payload[i];
  for (int i = 0; i < 8; ++i) big = (big << 8) | payload[i];
  if (s.byteOrder == ByteOrder::kLittleEndian) return (little >> s.startBit) & Mask(s.numBits);
  const uint32_t msbFromTop = (s.startBit / 8) * 8 + (7 - s.startBit % 8);
  return (big >> (64 - msbFromTop - s.numBits)) & Mask(s.numBits);
}

uint64_t NextRandom(uint64_t *state) {
  *state = *state * 6364136223846793005ull + 1442695040888963407ull;
  return *state ^ (*state >> 29);
}

TEST(SignalCodec, EveryPlacementInEightBytesMatchesTheOracle) {
  uint64_t seed = 0x5EED;
  int checked = 0;
  for (ByteOrder order : {ByteOrder::kLittleEndian, ByteOrder::kBigEndian}) {
    for (uint32_t start = 0; start < 64; ++start) {
      for (uint32_t bits = 1; bits <= 64; ++bits) {
        const tSignal s = Layout(order, start, bits);
        uint8_t payload[8];
        const uint64_t background = NextRandom(&seed);
        std::memcpy(payload, &background, 8);
        // Whether it fits, told by the oracle's own arithmetic.
        const uint32_t first =
            order == ByteOrder::kLittleEndian ? start : (start / 8) * 8 + (7 - start % 8);
        ASSERT_EQ(SignalFits(s, 8), first + bits <= 64) << start << "|" << bits;
        if (first + bits > 64) continue;
        ASSERT_EQ(ExtractRaw(s, payload), OracleExtract(s, payload)) << start << "|" << bits;

        const uint64_t raw = NextRandom(&seed) & Mask(bits);
        uint8_t written[8];
        std::memcpy(written, payload, 8);
        InsertRaw(s, raw, written);
        ASSERT_EQ(OracleExtract(s, written), raw) << start << "|" << bits;
        // Nothing outside the signal changed: clearing its bits in both gives the same bytes.
        InsertRaw(s, 0, written);
        InsertRaw(s, 0, payload);
        ASSERT_EQ(std::memcmp(written, payload, 8), 0) << start << "|" << bits;
        ++checked;
      }
    }
  }
  EXPECT_EQ(checked, 2 * 2080);  // 64 + 63 + ... + 1 placements per byte order
}

TEST(SignalCodec, GoldenPayloads) {
  const struct {
    const char *what;
    tSignal signal;
    uint64_t raw;
    std::vector<uint8_t> payload;
  } cases[] = {
      {"intel 12 bits at 0", Layout(ByteOrder::kLittleEndian, 0, 12), 0xABC, {0xBC, 0x0A, 0, 0}},
      {"intel 1 bit at 31", Layout(ByteOrder::kLittleEndian, 31, 1), 1, {0, 0, 0, 0x80}},
      {"motorola 15 bits at 6", Layout(ByteOrder::kBigEndian, 6, 15), 0x1234, {0x12, 0x34, 0, 0}},
      {"motorola 15 bits at 6, top", Layout(ByteOrder::kBigEndian, 6, 15), 0x4000, {0x40, 0, 0, 0}},
      {"motorola 2 bits at 0", Layout(ByteOrder::kBigEndian, 0, 2), 0x3, {0x01, 0x80, 0, 0}},
      {"motorola 12 bits at 19", Layout(ByteOrder::kBigEndian, 19, 12), 0xABC, {0, 0, 0x0A, 0xBC}},
      {"motorola 1 bit at 31", Layout(ByteOrder::kBigEndian, 31, 1), 1, {0, 0, 0, 0x80}},
  };
  for (const auto &c : cases) {
    std::vector<uint8_t> payload(c.payload.size(), 0);
    InsertRaw(c.signal, c.raw, payload.data());
    EXPECT_EQ(payload, c.payload) << c.what;
    EXPECT_EQ(ExtractRaw(c.signal, c.payload.data()), c.raw) << c.what;
  }
}

TEST(SignalCodec, SixtyFourBitsAndTheLongestPayload) {
  uint8_t payload[64] = {};
  const tSignal intel = Layout(ByteOrder::kLittleEndian, 0, 64);
  InsertRaw(intel, 0x0123456789ABCDEFull, payload);
  EXPECT_EQ(std::vector<uint8_t>(payload, payload + 8),
            (std::vector<uint8_t>{0xEF, 0xCD, 0xAB, 0x89, 0x67, 0x45, 0x23, 0x01}));
  const tSignal motorola = Layout(ByteOrder::kBigEndian, 7, 64);
  EXPECT_EQ(ExtractRaw(motorola, payload), 0xEFCDAB8967452301ull);
  // The last bits of a 64-byte CAN FD payload.
  const tSignal last = Layout(ByteOrder::kLittleEndian, 511, 1);
  const tSignal lastByte = Layout(ByteOrder::kBigEndian, 511, 8);
  ASSERT_TRUE(SignalFits(last, 64));
  ASSERT_TRUE(SignalFits(lastByte, 64));
  InsertRaw(last, 1, payload);
  EXPECT_EQ(payload[63], 0x80);
  EXPECT_EQ(ExtractRaw(lastByte, payload), 0x80u);
  EXPECT_FALSE(SignalFits(Layout(ByteOrder::kLittleEndian, 505, 8), 64));
  EXPECT_FALSE(SignalFits(Layout(ByteOrder::kBigEndian, 7, 65), 64));
  EXPECT_FALSE(SignalFits(Layout(ByteOrder::kLittleEndian, 0, 0), 8));
  EXPECT_FALSE(SignalFits(Layout(ByteOrder::kLittleEndian, 0, 16, SignalType::kFloat), 8));
  EXPECT_FALSE(SignalFits(Layout(ByteOrder::kLittleEndian, 0, 8), 0));
}

TEST(SignalCodec, PhysicalValuesConvertWithScaleOffsetAndLimits) {
  const double inf = std::numeric_limits<double>::infinity();
  const double nan = std::numeric_limits<double>::quiet_NaN();
  const auto le = ByteOrder::kLittleEndian;
  const struct {
    const char *what;
    tSignal signal;
    double physical;
    uint64_t raw;
    double back;  // the physical value of `raw`
  } cases[] = {
      {"scaled", Layout(le, 0, 15, SignalType::kUnsigned, 0.1, -1638.35), 0.05, 16384, 0.05},
      {"rounded to the step", Layout(le, 0, 8, SignalType::kUnsigned, 0.5, 0), 1.26, 3, 1.5},
      {"unsigned below zero", Layout(le, 0, 8), -5, 0, 0},
      {"unsigned above", Layout(le, 0, 8), 300, 255, 255},
      {"signed -1", Layout(le, 0, 13, SignalType::kSigned, 0.25, 0), -0.25, 0x1FFF, -0.25},
      {"signed lowest", Layout(le, 0, 13, SignalType::kSigned), -5000, 0x1000, -4096},
      {"signed highest", Layout(le, 0, 13, SignalType::kSigned), 5000, 0x0FFF, 4095},
      {"signed 1 bit", Layout(le, 0, 1, SignalType::kSigned), -1, 1, -1},
      {"64-bit signed lowest", Layout(le, 0, 64, SignalType::kSigned), -inf, 0x8000000000000000ull,
       -9223372036854775808.0},
      {"64-bit unsigned highest", Layout(le, 0, 64), 1e30, ~0ull, 18446744073709551616.0},
      {"NaN", Layout(le, 0, 8, SignalType::kSigned), nan, 0, 0},
      {"float", Layout(le, 0, 32, SignalType::kFloat, 2.0, 1.0), 4.0, 0x3FC00000, 4.0},
      {"double", Layout(le, 0, 64, SignalType::kFloat), -2.5, 0xC004000000000000ull, -2.5},
  };
  for (const auto &c : cases) {
    EXPECT_EQ(PhysicalToRaw(c.signal, c.physical), c.raw) << c.what;
    EXPECT_NEAR(RawToPhysical(c.signal, c.raw), c.back, 1e-9) << c.what;
  }
}

TEST(SignalCodec, OnlyTheSelectedMultiplexedSignalsArePresent) {
  tFrame frame;
  frame.payloadLength = 8;
  tSignal mux = Layout(ByteOrder::kLittleEndian, 0, 3);
  mux.mux = MuxRole::kMultiplexer;
  tSignal plain = Layout(ByteOrder::kLittleEndian, 56, 8);
  tSignal m2 = Layout(ByteOrder::kLittleEndian, 8, 8);
  m2.mux = MuxRole::kMultiplexed;
  m2.muxValue = 2;
  frame.signals = {mux, plain, m2};
  uint8_t payload[8] = {};
  for (uint64_t selector : {0u, 2u, 5u}) {
    InsertRaw(mux, selector, payload);
    EXPECT_TRUE(SignalPresent(frame, frame.signals.front(), payload));
    EXPECT_TRUE(SignalPresent(frame, plain, payload));
    EXPECT_EQ(SignalPresent(frame, m2, payload), selector == 2) << selector;
  }
  frame.signals.pop_front();  // no multiplexer: no multiplexed signal is there
  EXPECT_FALSE(SignalPresent(frame, m2, payload));
}

}  // namespace
