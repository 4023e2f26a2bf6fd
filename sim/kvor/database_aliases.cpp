#include "database_aliases.h"

namespace nKvorSim {

std::optional<tAlias> DatabaseAliases::Find(const std::string &alias) const {
  const auto found = aliases_.find(alias);
  if (found == aliases_.end()) return std::nullopt;
  return found->second;
}

void DatabaseAliases::Lists(std::string *aliases, std::string *paths) const {
  aliases->clear();
  paths->clear();
  for (const auto &[alias, target] : aliases_) {
    if (!aliases->empty()) {
      *aliases += ',';
      *paths += ',';
    }
    *aliases += alias;
    *paths += target.path;
  }
}

}  // namespace nKvorSim
