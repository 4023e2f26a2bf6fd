#include "database_dbc_attributes.h"

#include <cstdlib>
#include <vector>

#include "dbc_attribute_values.h"
#include "kvsim.h"

namespace nKvorSim {

namespace {

std::string Joined(const std::vector<std::string> &items) {
  std::string text;
  for (const std::string &item : items) text += (text.empty() ? "" : ",") + item;
  return text;
}

// An enumeration's value is written as its index; callers get its text.
std::string Shown(const tAttributeDefinition &definition, const tAttributeValue &value) {
  if (definition.type != "ENUM" || value.quoted) return value.text;
  char *end = nullptr;
  const unsigned long index = std::strtoul(value.text.c_str(), &end, 10);
  if (end == value.text.c_str() || *end != '\0' || index >= definition.enumTexts.size()) {
    return value.text;
  }
  return definition.enumTexts[index];
}

}  // namespace

Status DbcAttributeText(const tObjectRef &object, uint32_t mode, const char *name,
                        std::string *text, bool *isDefault) {
  if (mode > 2) return kvsimErrInvalidArgument;
  if (mode != 2 && name == nullptr) return kvsimErrNullPointer;
  tCluster *cluster = object.cluster;
  if (object.objectClass == kClassDatabase) {
    if (object.database->clusters.empty()) return kvsimErrPropertyUnknown;
    cluster = &object.database->clusters.front();
  }
  std::string_view kind;
  tAttributeValues values;
  switch (object.objectClass) {
    case kClassDatabase:
    case kClassCluster:
      kind = kAttrOfDatabase;
      values = ClusterAttributes(*cluster);
      break;
    case kClassEcu:
      kind = kAttrOfEcu;
      values = EcuAttributes(*object.ecu);
      break;
    case kClassFrame:
      kind = kAttrOfFrame;
      values = FrameAttributes(*cluster, *object.frame);
      break;
    case kClassSignal:
      kind = kAttrOfSignal;
      values = SignalAttributes(*cluster, *object.signal);
      break;
    default:
      return kvsimErrInvalidClass;
  }
  const std::vector<tAttributeDefinition> definitions = AttributeDefinitions(*cluster);
  if (mode == 2) {
    std::vector<std::string> names;
    for (const tAttributeDefinition &definition : definitions) {
      if (definition.objectKind == kind) names.push_back(definition.name);
    }
    *text = Joined(names);
    return 0;
  }
  const tAttributeDefinition *definition = nullptr;
  for (const tAttributeDefinition &each : definitions) {
    if (each.objectKind == kind && each.name == name) definition = &each;
  }
  if (definition == nullptr) return kvsimErrPropertyUnknown;
  if (mode == 1) {
    if (definition->type != "ENUM") return kvsimErrInvalidArgument;
    *text = Joined(definition->enumTexts);
    return 0;
  }
  const auto set = values.find(name);
  if (set != values.end()) {
    *text = Shown(*definition, set->second);
    *isDefault = false;
  } else {
    *text = definition->defaultValue ? Shown(*definition, *definition->defaultValue) : "";
    *isDefault = true;
  }
  return 0;
}

}  // namespace nKvorSim
