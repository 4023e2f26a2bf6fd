#include "dbc_writer.h"

#include <charconv>

#include "dbc_attribute_values.h"
#include "dbc_attributes.h"
#include "signal_codec.h"

namespace nKvorSim {

namespace {

std::string Number(double value) { return NumberText(value); }

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
    if (!IsFileName(ecu.name)) {
      *error = "ECU name '" + ecu.name + "' is not an identifier";
      return false;
    }
  }
  for (const tFrame &frame : cluster.frames) {
    if (!IsFileName(frame.name) || !IsValidPayloadLength(frame.payloadLength) ||
        frame.id > MaxFrameId(frame.extended)) {
      *error = "frame '" + frame.name + "' cannot be written";
      return false;
    }
    for (const tSignal &signal : frame.signals) {
      if (!IsFileName(signal.name) || !SignalFits(signal, frame.payloadLength)) {
        *error = "signal '" + signal.name + "' of frame '" + frame.name + "' cannot be written";
        return false;
      }
    }
  }
  return true;
}

std::string AttributeValue(const tAttributeValue &value) {
  return value.quoted ? Quoted(value.text) : value.text;
}

void WriteAttributeValues(const std::string &object, const tAttributeValues &values,
                          std::string &out) {
  for (const auto &[name, value] : values) {
    out += "BA_ " + Quoted(name) + object + " " + AttributeValue(value) + ";\n";
  }
}

void WriteAttributes(const tCluster &cluster, std::string &out) {
  const std::vector<tAttributeDefinition> definitions = AttributeDefinitions(cluster);
  for (const tAttributeDefinition &definition : definitions) {
    out += "BA_DEF_ " + (definition.objectKind.empty() ? "" : definition.objectKind + " ") +
           Quoted(definition.name) + " " + definition.type;
    if (definition.type == "ENUM") {
      for (size_t i = 0; i < definition.enumTexts.size(); ++i) {
        out += (i == 0 ? " " : ",") + Quoted(definition.enumTexts[i]);
      }
    } else if (definition.type != "STRING") {
      out += " " + definition.minimum + " " + definition.maximum;
    }
    out += ";\n";
  }
  for (const tAttributeDefinition &definition : definitions) {
    if (definition.defaultValue) {
      out += "BA_DEF_DEF_ " + Quoted(definition.name) + " " +
             AttributeValue(*definition.defaultValue) + ";\n";
    }
  }
  WriteAttributeValues("", ClusterAttributes(cluster), out);
  for (const tEcu &ecu : cluster.ecus) WriteAttributeValues(" BU_ " + ecu.name, EcuAttributes(ecu), out);
  for (const tFrame &frame : cluster.frames) {
    const std::string id = WrittenId(frame);
    WriteAttributeValues(" BO_ " + id, FrameAttributes(cluster, frame), out);
    for (const tSignal &signal : frame.signals) {
      WriteAttributeValues(" SG_ " + id + " " + signal.name, SignalAttributes(cluster, signal), out);
    }
  }
}

}  // namespace

bool WriteDbc(const tDatabase &database, std::string *text, std::string *error) {
  if (database.clusters.size() != 1) {
    *error = "a database file holds exactly one cluster";
    return false;
  }
  const tCluster &cluster = database.clusters.front();
  if (!cluster.linSchedules.empty()) {
    *error = "a database file holds no LIN schedule";
    return false;
  }
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

  WriteAttributes(cluster, out);
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
