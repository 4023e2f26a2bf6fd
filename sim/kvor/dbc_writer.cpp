#include "dbc_writer.h"

#include <charconv>

#include "dbc_attributes.h"
#include "signal_codec.h"

namespace nKvorSim {

namespace {

// The shortest text that reads back to the same double.
std::string Number(double value) {
  char buffer[32];
  const auto result = std::to_chars(buffer, buffer + sizeof buffer, value);
  return std::string(buffer, result.ptr);
}

std::string Quoted(const std::string &text) {
  std::string quoted = "\"";
  for (const char c : text) {
    if (c == '"' || c == '\\') quoted += '\\';
    quoted += c;
  }
  return quoted + '"';
}

std::string WrittenId(const tFrame &frame) {
  return std::to_string((frame.extended ? frame.id | 0x80000000u : frame.id) | frame.idMarks);
}

std::string ValuePairs(const std::vector<tValueName> &values) {
  std::string text;
  for (const tValueName &pair : values) text += " " + Number(pair.value) + " " + Quoted(pair.name);
  return text;
}

const char *MuxMark(const tSignal &signal, std::string *scratch) {
  switch (signal.mux) {
    case MuxRole::kMultiplexer:
      return " M";
    case MuxRole::kMultiplexed:
      *scratch = " m" + std::to_string(signal.muxValue);
      return scratch->c_str();
    default:
      return "";
  }
}

bool Check(const tCluster &cluster, std::string *error) {
  for (const tEcu &ecu : cluster.ecus) {
    if (!IsIdentifier(ecu.name)) {
      *error = "ECU name '" + ecu.name + "' is not an identifier";
      return false;
    }
  }
  for (const tFrame &frame : cluster.frames) {
    if (!IsIdentifier(frame.name) || !IsValidPayloadLength(frame.payloadLength) ||
        frame.id > MaxFrameId(frame.extended)) {
      *error = "frame '" + frame.name + "' cannot be written";
      return false;
    }
    for (const tSignal &signal : frame.signals) {
      if (!IsIdentifier(signal.name) || !SignalFits(signal, frame.payloadLength)) {
        *error = "signal '" + signal.name + "' of frame '" + frame.name + "' cannot be written";
        return false;
      }
    }
  }
  return true;
}

void WriteAttributeDefinitions(const tCluster &cluster, std::string &out) {
  out += "BA_DEF_ " + Quoted(std::string(kAttrBaudRate)) + " INT 0 1000000000;\n";
  out += "BA_DEF_ " + Quoted(std::string(kAttrFdBaudRate)) + " INT 0 1000000000;\n";
  out += "BA_DEF_ " + Quoted(std::string(kAttrClusterName)) + " STRING ;\n";
  out += "BA_DEF_ BO_ " + Quoted(std::string(kAttrCycleTime)) + " FLOAT 0 3600000;\n";
  out += "BA_DEF_ BO_ " + Quoted(std::string(kAttrFrameFormat)) +
         " ENUM \"StandardCAN\",\"ExtendedCAN\"";
  for (uint32_t i = kFormatExtendedCan + 1; i < kFormatStandardCanFd; ++i) out += ",\"reserved\"";
  out += ",\"StandardCAN_FD\",\"ExtendedCAN_FD\";\n";
  out += "BA_DEF_ SG_ " + Quoted(std::string(kAttrStartValue)) + " FLOAT -1e308 1e308;\n";
  out += "BA_DEF_DEF_ " + Quoted(std::string(kAttrCycleTime)) + " 0;\n";
  out += "BA_DEF_DEF_ " + Quoted(std::string(kAttrStartValue)) + " 0;\n";
  out += "BA_ " + Quoted(std::string(kAttrBaudRate)) + " " + std::to_string(cluster.baudRate) + ";\n";
  out += "BA_ " + Quoted(std::string(kAttrFdBaudRate)) + " " + std::to_string(cluster.fdBaudRate) +
         ";\n";
  out += "BA_ " + Quoted(std::string(kAttrClusterName)) + " " + Quoted(cluster.name) + ";\n";
}

}  // namespace

bool WriteDbc(const tDatabase &database, std::string *text, std::string *error) {
  if (database.clusters.size() != 1) {
    *error = "a database file holds exactly one cluster";
    return false;
  }
  const tCluster &cluster = database.clusters.front();
  if (!Check(cluster, error)) return false;

  std::string out = "VERSION " + Quoted(database.version) + "\n\n";
  out += "NS_ :\n\tCM_\n\tBA_DEF_\n\tBA_\n\tVAL_\n\tBA_DEF_DEF_\n\tVAL_TABLE_\n\tSIG_VALTYPE_\n\n";
  out += "BS_:\n\nBU_:";
  for (const tEcu &ecu : cluster.ecus) out += " " + ecu.name;
  out += "\n\n";
  for (const tValueTable &table : cluster.valueTables) {
    out += "VAL_TABLE_ " + table.name + ValuePairs(table.values) + " ;\n";
  }
  std::string scratch;
  for (const tFrame &frame : cluster.frames) {
    out += "\nBO_ " + WrittenId(frame) + " " + frame.name + ": " +
           std::to_string(frame.payloadLength) + " " +
           (frame.transmitter.empty() ? std::string(kNoNode) : frame.transmitter) + "\n";
    for (const tSignal &signal : frame.signals) {
      out += " SG_ " + signal.name + MuxMark(signal, &scratch) + " : " +
             std::to_string(signal.startBit) + "|" + std::to_string(signal.numBits) + "@" +
             (signal.byteOrder == ByteOrder::kLittleEndian ? "1" : "0") +
             (signal.type == SignalType::kSigned ? "-" : "+") + " (" + Number(signal.scale) + "," +
             Number(signal.offset) + ") [" + Number(signal.minimum) + "|" +
             Number(signal.maximum) + "] " + Quoted(signal.unit) + " ";
      if (signal.receivers.empty()) out += kNoNode;
      for (size_t i = 0; i < signal.receivers.size(); ++i) {
        out += (i == 0 ? "" : ",") + signal.receivers[i];
      }
      out += "\n";
    }
  }
  out += "\n";

  if (!cluster.comment.empty()) out += "CM_ " + Quoted(cluster.comment) + ";\n";
  for (const tEcu &ecu : cluster.ecus) {
    if (!ecu.comment.empty()) out += "CM_ BU_ " + ecu.name + " " + Quoted(ecu.comment) + ";\n";
  }
  for (const tFrame &frame : cluster.frames) {
    if (!frame.comment.empty()) {
      out += "CM_ BO_ " + WrittenId(frame) + " " + Quoted(frame.comment) + ";\n";
    }
    for (const tSignal &signal : frame.signals) {
      if (!signal.comment.empty()) {
        out += "CM_ SG_ " + WrittenId(frame) + " " + signal.name + " " + Quoted(signal.comment) +
               ";\n";
      }
    }
  }

  WriteAttributeDefinitions(cluster, out);
  for (const tFrame &frame : cluster.frames) {
    const std::string id = WrittenId(frame);
    if (frame.cycleTimeMs != 0.0) {
      out += "BA_ \"" + std::string(kAttrCycleTime) + "\" BO_ " + id + " " +
             Number(frame.cycleTimeMs) + ";\n";
    }
    // A short payload alone does not say CAN FD.
    if (frame.format == FrameFormat::kCanFd) {
      const uint32_t format = frame.extended ? kFormatExtendedCanFd : kFormatStandardCanFd;
      out += "BA_ \"" + std::string(kAttrFrameFormat) + "\" BO_ " + id + " " +
             std::to_string(format) + ";\n";
    }
    for (const tSignal &signal : frame.signals) {
      if (signal.defaultRaw != 0.0) {
        out += "BA_ \"" + std::string(kAttrStartValue) + "\" SG_ " + id + " " + signal.name + " " +
               Number(signal.defaultRaw) + ";\n";
      }
    }
  }
  for (const tFrame &frame : cluster.frames) {
    for (const tSignal &signal : frame.signals) {
      if (!signal.valueNames.empty()) {
        out += "VAL_ " + WrittenId(frame) + " " + signal.name + ValuePairs(signal.valueNames) +
               " ;\n";
      }
    }
  }
  for (const tFrame &frame : cluster.frames) {
    for (const tSignal &signal : frame.signals) {
      if (signal.type == SignalType::kFloat) {
        out += "SIG_VALTYPE_ " + WrittenId(frame) + " " + signal.name + " : " +
               (signal.numBits == 32 ? "1" : "2") + ";\n";
      }
    }
  }
  *text = std::move(out);
  return true;
}

}  // namespace nKvorSim
