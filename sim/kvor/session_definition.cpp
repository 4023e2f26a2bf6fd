#include "session_definition.h"

#include <cctype>
#include <optional>
#include <string_view>

#include "inventory.h"
#include "kvsim.h"

namespace nKvorSim {

namespace {

std::string_view Trim(std::string_view text) {
  while (!text.empty() && std::isspace(static_cast<unsigned char>(text.front()))) {
    text.remove_prefix(1);
  }
  while (!text.empty() && std::isspace(static_cast<unsigned char>(text.back()))) {
    text.remove_suffix(1);
  }
  return text;
}

std::optional<InterfacePlace> ResolveInterface(std::string_view name) {
  const size_t slash = name.find('/');
  if (slash != std::string_view::npos && slash + 1 == name.size()) return std::nullopt;
  return FindInterface(name.substr(0, slash));
}

Status SplitList(const std::string &list, std::vector<std::string> *items) {
  items->clear();
  if (Trim(list).empty()) return 0;
  std::string_view rest = list;
  while (true) {
    const size_t comma = rest.find(',');
    const std::string_view item = Trim(rest.substr(0, comma));
    if (item.empty()) return kvsimErrInvalidList;
    items->emplace_back(item);
    if (comma == std::string_view::npos) return 0;
    rest.remove_prefix(comma + 1);
  }
}

}  // namespace

Status MakeSessionDefinition(const char *database, const char *cluster, const char *list,
                             const char *interfaceName, uint32_t mode, NetworkSet &networks,
                             SessionDefinition *definition) {
  if (interfaceName == nullptr) return kvsimErrNullPointer;
  if (mode > kLastSessionMode) return kvsimErrInvalidMode;
  const std::optional<InterfacePlace> place = ResolveInterface(interfaceName);
  if (!place) return kvsimErrUnknownInterface;
  Status status = SplitList(list != nullptr ? list : "", &definition->items);
  if (status < 0) return status;
  definition->mode = mode;
  definition->protocol = place->record->protocol;
  definition->interfaceIndex = place->index;
  definition->interfaceName = interfaceName;
  definition->database = database != nullptr ? database : "";
  definition->cluster = cluster != nullptr ? cluster : "";
  definition->network = &networks[place->record->network];
  return 0;
}

}  // namespace nKvorSim
