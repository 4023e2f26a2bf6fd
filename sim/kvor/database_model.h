// What a CAN database describes: one cluster of frames with their signals, the ECUs that send and
// receive them, and each frame's PDU, which maps one to one onto the frame. Plain values, so that
// a session can keep its own copy; lists keep every object at one address while the database
// lives, so that handles can point at them.
#ifndef KVOR_SIM_DATABASE_MODEL_H
#define KVOR_SIM_DATABASE_MODEL_H

#include <cstdint>
#include <list>
#include <string>
#include <string_view>
#include <vector>

namespace nKvorSim {

// Values of kvPropSig_ByteOrdr.
enum class ByteOrder : uint32_t { kLittleEndian = 0, kBigEndian = 1 };

// Values of kvPropSig_DataType. Floats are IEEE singles (32 bits) or doubles (64 bits).
enum class SignalType : uint32_t { kSigned = 0, kUnsigned = 1, kFloat = 2 };

// Values of kvPropFrm_CANioMode.
enum class FrameFormat : uint32_t { kCan = 0, kCanFd = 1 };

// The part a signal plays in a multiplexed frame: the multiplexer selects which of the
// multiplexed signals the payload carries; plain signals are always there.
enum class MuxRole { kPlain, kMultiplexer, kMultiplexed };

struct tValueName {
  double value = 0;
  std::string name;
};

struct tSignal {
  std::string name;
  // Intel signals start at their least significant bit, Motorola signals at their most
  // significant one; bit b is bit b % 8 of byte b / 8.
  uint32_t startBit = 0;
  uint32_t numBits = 1;
  ByteOrder byteOrder = ByteOrder::kLittleEndian;
  SignalType type = SignalType::kUnsigned;
  double scale = 1.0;
  double offset = 0.0;
  double minimum = 0.0;
  double maximum = 0.0;
  double defaultRaw = 0.0;  // the value a frame starts with, before scale and offset
  std::string unit;
  std::string comment;
  MuxRole mux = MuxRole::kPlain;
  uint32_t muxValue = 0;  // the multiplexer's raw value that selects a multiplexed signal
  std::vector<std::string> receivers;
  std::vector<tValueName> valueNames;
};

struct tFrame {
  std::string name;
  uint32_t id = 0;
  bool extended = false;
  // Bits 29 and 30 of the identifier as a file wrote them: marks of other tools, no part of the
  // CAN identifier, kept so that the file is written back as it was read.
  uint32_t idMarks = 0;
  uint32_t payloadLength = 8;
  FrameFormat format = FrameFormat::kCan;
  double cycleTimeMs = 0.0;  // 0 for a frame sent on events
  std::string transmitter;
  std::string comment;
  std::list<tSignal> signals;
};

struct tEcu {
  std::string name;
  std::string comment;
};

struct tValueTable {
  std::string name;
  std::vector<tValueName> values;
};

struct tCluster {
  std::string name = "Cluster";
  uint64_t baudRate = 0;  // 0 while a file has not given it

  uint64_t fdBaudRate = 2000000;
  std::string comment;
  std::list<tEcu> ecus;
  std::list<tFrame> frames;
  std::vector<tValueTable> valueTables;
};

struct tDatabase {
  std::string name;  // as it was opened; no part of its file
  std::string version;
  bool showInvalidFromOpen = false;
  std::list<tCluster> clusters;  // a database read from a file has exactly one
};

// Identifiers of the file format, of frames and signals: a letter or underscore, then letters,
// digits and underscores.
bool IsIdentifier(std::string_view name);

// Bytes that a payload may have; CAN frames have up to 8, CAN FD frames one of the longer steps.
bool IsValidPayloadLength(uint32_t length);

// The highest identifier of a frame in the standard or extended form.
uint32_t MaxFrameId(bool extended);

// The signal of that name in the frame, or null.
const tSignal *FindSignal(const tFrame &frame, std::string_view name);
// The frame's multiplexer, or null for a frame without one.
const tSignal *FindMultiplexer(const tFrame &frame);

}  // namespace nKvorSim

#endif
