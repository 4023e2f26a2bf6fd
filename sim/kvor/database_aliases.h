// Short names that stand for database files, each with the baud rate that the file's cluster
// gets when the file gives none. Not safe for many threads: its owner locks.
#ifndef KVOR_SIM_DATABASE_ALIASES_H
#define KVOR_SIM_DATABASE_ALIASES_H

#include <cstdint>
#include <map>
#include <optional>
#include <string>

namespace nKvorSim {

struct tAlias {
  std::string path;
  uint64_t baudRate = 0;
};

class DatabaseAliases {
 public:
  // Adds the alias, or points it elsewhere.
  void Add(const std::string &alias, tAlias target) { aliases_[alias] = std::move(target); }
  // Whether there was such an alias.
  bool Remove(const std::string &alias) { return aliases_.erase(alias) != 0; }
  std::optional<tAlias> Find(const std::string &alias) const;
  // The aliases and their paths as two comma-separated lists in the same order.
  void Lists(std::string *aliases, std::string *paths) const;
  size_t Count() const { return aliases_.size(); }
  template <class Visit>
  void ForEach(Visit visit) const {
    for (const auto &[alias, target] : aliases_) visit(alias, target);
  }
  void Clear() { aliases_.clear(); }

 private:
  std::map<std::string, tAlias> aliases_;
};

}  // namespace nKvorSim

#endif
