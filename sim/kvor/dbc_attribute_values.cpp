#include "dbc_attribute_values.h"

#include <charconv>
#include <cstdlib>
#include <type_traits>

#include "dbc_attributes.h"

namespace nKvorSim {

namespace {

tAttributeDefinition Numeric(std::string_view kind, std::string_view name, const char *type,
                             const char *minimum, const char *maximum,
                             const char *defaultValue = nullptr) {
  tAttributeDefinition definition;
  definition.objectKind = kind;
  definition.name = name;
  definition.type = type;
  definition.minimum = minimum;
  definition.maximum = maximum;
  if (defaultValue != nullptr) definition.defaultValue = tAttributeValue{defaultValue, false};
  return definition;
}

std::vector<tAttributeDefinition> OwnDefinitions() {
  std::vector<tAttributeDefinition> own;
  own.push_back(Numeric(kAttrOfDatabase, kAttrBaudRate, "INT", "0", "1000000000"));
  own.push_back(Numeric(kAttrOfDatabase, kAttrFdBaudRate, "INT", "0", "1000000000"));
  tAttributeDefinition clusterName;
  clusterName.name = kAttrClusterName;
  clusterName.type = "STRING";
  own.push_back(clusterName);
  own.push_back(Numeric(kAttrOfFrame, kAttrCycleTime, "FLOAT", "0", "3600000", "0"));
  tAttributeDefinition format;
  format.objectKind = kAttrOfFrame;
  format.name = kAttrFrameFormat;
  format.type = "ENUM";
  format.enumTexts = {"StandardCAN", "ExtendedCAN"};
  for (uint32_t i = kFormatExtendedCan + 1; i < kFormatStandardCanFd; ++i) {
    format.enumTexts.push_back("reserved");
  }
  format.enumTexts.push_back("StandardCAN_FD");
  format.enumTexts.push_back("ExtendedCAN_FD");
  own.push_back(format);
  own.push_back(Numeric(kAttrOfSignal, kAttrStartValue, "FLOAT", "-1e308", "1e308", "0"));
  own.push_back(Numeric(kAttrOfEcu, kAttrStationAddress, "INT", "0", "255",
                        std::to_string(kJ1939NullAddress).c_str()));
  tAttributeDefinition pdus;
  pdus.objectKind = kAttrOfFrame;
  pdus.name = kAttrPduMapping;
  pdus.type = "STRING";
  own.push_back(pdus);
  return own;
}

const tAttributeDefinition *Definition(const tCluster &cluster, std::string_view name) {
  for (const tAttributeDefinition &definition : cluster.attributeDefinitions) {
    if (definition.name == name) return &definition;
  }
  return nullptr;
}

double DefaultNumber(const tCluster &cluster, std::string_view name) {
  const tAttributeDefinition *definition = Definition(cluster, name);
  if (definition == nullptr || !definition->defaultValue) return 0.0;
  return std::strtod(definition->defaultValue->text.c_str(), nullptr);
}

// A property's value in place of the file's: kept where the file set it or where it is not the
// attribute's default.
void Carry(tAttributeValues *values, std::string_view name, bool differs, tAttributeValue value) {
  const std::string key(name);
  if (differs || values->count(key) != 0) (*values)[key] = std::move(value);
}

template <class Item>
std::string Listed(const std::vector<Item> &items) {
  std::string text;
  for (const Item &item : items) {
    if (!text.empty()) text += ',';
    if constexpr (std::is_same_v<Item, std::string>) {
      text += item;
    } else {
      text += std::to_string(item);
    }
  }
  return text;
}

std::vector<std::string> Cut(const std::string &text, char separator) {
  std::vector<std::string> parts;
  size_t from = 0;
  for (size_t at; (at = text.find(separator, from)) != std::string::npos; from = at + 1) {
    parts.push_back(text.substr(from, at - from));
  }
  parts.push_back(text.substr(from));
  return parts;
}

bool ParseBits(const std::string &text, std::vector<uint32_t> *bits) {
  if (text.empty()) return true;
  for (const std::string &part : Cut(text, ',')) {
    uint32_t bit = 0;
    const auto result = std::from_chars(part.data(), part.data() + part.size(), bit);
    if (result.ec != std::errc() || result.ptr != part.data() + part.size()) return false;
    bits->push_back(bit);
  }
  return true;
}

}  // namespace

std::string PduMappingText(const tPduMapping &mapping) {
  return Listed(mapping.pdus) + "|" + Listed(mapping.startBits) + "|" + Listed(mapping.updateBits);
}

bool ParsePduMapping(const std::string &text, tPduMapping *mapping) {
  const std::vector<std::string> lists = Cut(text, '|');
  if (lists.size() != 3) return false;
  *mapping = tPduMapping{};
  if (!lists[0].empty()) mapping->pdus = Cut(lists[0], ',');
  return ParseBits(lists[1], &mapping->startBits) && ParseBits(lists[2], &mapping->updateBits);
}

std::string NumberText(double value) {
  char buffer[32];
  const auto result = std::to_chars(buffer, buffer + sizeof buffer, value);
  return std::string(buffer, result.ptr);
}

std::vector<tAttributeDefinition> AttributeDefinitions(const tCluster &cluster) {
  std::vector<tAttributeDefinition> all = cluster.attributeDefinitions;
  for (tAttributeDefinition &own : OwnDefinitions()) {
    if (Definition(cluster, own.name) == nullptr) all.push_back(std::move(own));
  }
  return all;
}

tAttributeValues ClusterAttributes(const tCluster &cluster) {
  tAttributeValues values = cluster.attributes;
  // The baud rates and the name are always written: a file without them reads otherwise.
  values[std::string(kAttrBaudRate)] = {std::to_string(cluster.baudRate), false};
  values[std::string(kAttrFdBaudRate)] = {std::to_string(cluster.fdBaudRate), false};
  values[std::string(kAttrClusterName)] = {cluster.name, true};
  return values;
}

tAttributeValues EcuAttributes(const tEcu &ecu) {
  tAttributeValues values = ecu.attributes;
  Carry(&values, kAttrStationAddress, ecu.j1939Address != kJ1939NullAddress,
        {std::to_string(ecu.j1939Address), false});
  return values;
}

tAttributeValues FrameAttributes(const tCluster &cluster, const tFrame &frame) {
  tAttributeValues values = frame.attributes;
  Carry(&values, kAttrCycleTime, frame.cycleTimeMs != DefaultNumber(cluster, kAttrCycleTime),
        {NumberText(frame.cycleTimeMs), false});
  // A short payload alone does not say CAN FD; a format that no longer holds follows the frame.
  const bool fd = frame.format == FrameFormat::kCanFd;
  uint32_t format = frame.extended ? kFormatExtendedCan : kFormatStandardCan;
  if (fd) format = frame.extended ? kFormatExtendedCanFd : kFormatStandardCanFd;
  const auto stored = values.find(std::string(kAttrFrameFormat));
  const bool storedFd = stored != values.end() &&
                        (stored->second.text == std::to_string(kFormatStandardCanFd) ||
                         stored->second.text == std::to_string(kFormatExtendedCanFd));
  if (fd || storedFd) values[std::string(kAttrFrameFormat)] = {std::to_string(format), false};
  if (frame.pdus) values[std::string(kAttrPduMapping)] = {PduMappingText(*frame.pdus), true};
  return values;
}

tAttributeValues SignalAttributes(const tCluster &cluster, const tSignal &signal) {
  tAttributeValues values = signal.attributes;
  Carry(&values, kAttrStartValue, signal.defaultRaw != DefaultNumber(cluster, kAttrStartValue),
        {NumberText(signal.defaultRaw), false});
  return values;
}

}  // namespace nKvorSim
