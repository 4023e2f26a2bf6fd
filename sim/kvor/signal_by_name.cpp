#include "signal_by_name.h"

#include <string>

namespace nKvorSim {

void PublishLast(const SessionDefinition &definition,
                 const std::vector<std::optional<double>> &last, uint64_t time) {
  std::vector<std::string> names;
  std::vector<double> values;
  for (size_t i = 0; i < last.size() && i < definition.items.size(); ++i) {
    if (!last[i]) continue;
    names.push_back(definition.items[i]);
    values.push_back(*last[i]);
  }
  if (!names.empty()) definition.network->Publish(names, values.data(), names.size(), time);
}

}  // namespace nKvorSim
