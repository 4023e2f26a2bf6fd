// What a CAN database describes: one cluster of frames with their signals, the ECUs that send and
// receive them, and each frame's PDU, which maps one to one onto the frame. Plain values, so that
// a session can keep its own copy; lists keep every object at one address while the database
// lives, so that handles can point at them.
#ifndef KVOR_SIM_DATABASE_MODEL_H
#define KVOR_SIM_DATABASE_MODEL_H

#include <cstdint>
#include <list>
#include <map>
#include <optional>
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

// A value of an attribute of a database file, as the file writes it: a number's text, or a
// string's text without its quotes.
struct tAttributeValue {
  std::string text;
  bool quoted = false;
};
using tAttributeValues = std::map<std::string, tAttributeValue>;

// Kinds of object that a database file defines attributes for, as the file names them ("" is the
// database itself).
constexpr std::string_view kAttrOfDatabase = "";
constexpr std::string_view kAttrOfEcu = "BU_";
constexpr std::string_view kAttrOfFrame = "BO_";
constexpr std::string_view kAttrOfSignal = "SG_";

// An attribute definition with its default. `type` is INT, HEX, FLOAT, STRING or ENUM; the
// range is kept as written, the enumeration's texts in their order.
struct tAttributeDefinition {
  std::string objectKind;
  std::string name;
  std::string type;
  std::string minimum;
  std::string maximum;
  std::vector<std::string> enumTexts;
  std::optional<tAttributeValue> defaultValue;
};

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
  tAttributeValues attributes;
};

// The payload of a multiplexed frame for one value of its multiplexer: the multiplexed signals of
// that value, beside the frame's plain ones. A file writes the value alone, so a subframe read
// from one is named "m" and the value, as its signals are marked.
struct tSubframe {
  std::string name;
  uint32_t muxValue = 0;
};

// The PDUs that a frame carries, by name in its cluster, each with the bit of the frame where it
// starts and the bit that tells whether it was updated (kNoUpdateBit: none). The three lists are
// set one at a time, so they may differ in length for a while.
constexpr uint32_t kNoUpdateBit = 0xFFFFFFFFu;
struct tPduMapping {
  std::vector<std::string> pdus;
  std::vector<uint32_t> startBits;
  std::vector<uint32_t> updateBits;
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
  std::list<tSubframe> subframes;
  // None while the frame carries its own PDU alone, at bit 0 with no update bit.
  std::optional<tPduMapping> pdus;
  tAttributeValues attributes;
};

// The PDUs of the frame, its own if none were set.
tPduMapping PduMappingOf(const tFrame &frame);

// Values of kvPropECU_J1939PreferredAddress: the address that claims none.
constexpr uint32_t kJ1939NullAddress = 254;

struct tEcu {
  std::string name;
  std::string comment;
  uint32_t j1939Address = kJ1939NullAddress;
  uint64_t j1939Name = 0;
  tAttributeValues attributes;
};

// Values of kvPropLINSchedEntry_Type.
enum class EntryType : uint32_t {
  kUnconditional = 0,
  kSporadic = 1,
  kEventTriggered = 2,
  kDiagnostic = 3
};
// Values of kvPropLINSched_RunMode.
enum class RunMode : uint32_t { kContinuous = 0, kOnce = 1, kNull = 2 };

// LIN schedules, which a CAN database file cannot hold: made by callers only. Frames and the
// schedule that resolves collisions are named in the cluster.
struct tLinScheduleEntry {
  std::string name;
  double delay = 0.0;  // seconds from this entry to the next
  uint32_t eventId = 0;
  EntryType type = EntryType::kUnconditional;
  std::vector<std::string> frames;
  std::string collisionSchedule;         // empty: none
  std::vector<uint8_t> diagnosticBytes;  // a diagnostic entry's node configuration data
};

struct tLinSchedule {
  std::string name;
  std::string comment;
  uint32_t priority = 0;  // 0 is the lowest; 1..254 may interrupt
  RunMode runMode = RunMode::kContinuous;
  std::list<tLinScheduleEntry> entries;
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
  std::list<tLinSchedule> linSchedules;
  std::vector<tAttributeDefinition> attributeDefinitions;
  tAttributeValues attributes;  // the file's own, which the database has
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

// Names that a database file can carry: identifiers, and what files of other tools write
// besides, a name that starts with a digit but is no number.
bool IsFileName(std::string_view name);

// Bytes that a payload may have; CAN frames have up to 8, CAN FD frames one of the longer steps.
bool IsValidPayloadLength(uint32_t length);

// The highest identifier of a frame in the standard or extended form.
uint32_t MaxFrameId(bool extended);

// The signal of that name in the frame, or null.
const tSignal *FindSignal(const tFrame &frame, std::string_view name);
// The frame's multiplexer, or null for a frame without one.
const tSignal *FindMultiplexer(const tFrame &frame);

// What refers to a frame by its name follows when it is renamed, and forgets it when it goes: the
// frames that carry it as a PDU and the LIN schedule entries that send it.
void RenameFrameReferences(tCluster *cluster, const std::string &from, const std::string &to);
void ForgetFrame(tCluster *cluster, const std::string &name);
// The entries that resolve their collisions with a schedule follow it in the same way.
void RenameScheduleReferences(tCluster *cluster, const std::string &from, const std::string &to);

// The name that a subframe read from a file has: "m" and the multiplexer's value.
std::string SubframeName(uint32_t muxValue);
// Gives a multiplexed frame a subframe for each value that its multiplexed signals are selected
// by and that has none yet.
void AddMissingSubframes(tFrame *frame);

}  // namespace nKvorSim

#endif
