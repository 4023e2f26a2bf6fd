// The values that callers set on one session, plain and sub-indexed. Safe for many threads.
#ifndef KVOR_SIM_PROPERTY_STORE_H
#define KVOR_SIM_PROPERTY_STORE_H

#include <cstdint>
#include <map>
#include <mutex>
#include <optional>
#include <unordered_map>
#include <utility>

#include "property_value.h"

namespace nKvorSim {

class PropertyStore {
 public:
  void Set(uint32_t id, PropertyValue value);
  std::optional<PropertyValue> Get(uint32_t id) const;

  // Sub-indexed values belong to one item of the session's list.
  void SetSub(uint32_t index, uint32_t id, PropertyValue value);
  std::optional<PropertyValue> GetSub(uint32_t index, uint32_t id) const;

 private:
  mutable std::mutex mutex_;
  std::unordered_map<uint32_t, PropertyValue> values_;
  std::map<std::pair<uint32_t, uint32_t>, PropertyValue> subValues_;
};

}  // namespace nKvorSim

#endif
