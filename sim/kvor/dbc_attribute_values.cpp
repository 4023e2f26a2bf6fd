#include "dbc_attribute_values.h"

#include <charconv>
#include <cstdlib>

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

}  // namespace

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

tAttributeValues EcuAttributes(const tEcu &ecu) { return ecu.attributes; }

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
  return values;
}

tAttributeValues SignalAttributes(const tCluster &cluster, const tSignal &signal) {
  tAttributeValues values = signal.attributes;
  Carry(&values, kAttrStartValue, signal.defaultRaw != DefaultNumber(cluster, kAttrStartValue),
        {NumberText(signal.defaultRaw), false});
  return values;
}

}  // namespace nKvorSim
