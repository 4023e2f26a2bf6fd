#include "property_store.h"

namespace nKvorSim {

void PropertyStore::Set(uint32_t id, PropertyValue value) {
  std::lock_guard<std::mutex> lock(mutex_);
  values_[id] = std::move(value);
}

std::optional<PropertyValue> PropertyStore::Get(uint32_t id) const {
  std::lock_guard<std::mutex> lock(mutex_);
  auto found = values_.find(id);
  if (found == values_.end()) return std::nullopt;
  return found->second;
}

void PropertyStore::SetSub(uint32_t index, uint32_t id, PropertyValue value) {
  std::lock_guard<std::mutex> lock(mutex_);
  subValues_[{index, id}] = std::move(value);
}

std::optional<PropertyValue> PropertyStore::GetSub(uint32_t index, uint32_t id) const {
  std::lock_guard<std::mutex> lock(mutex_);
  auto found = subValues_.find({index, id});
  if (found == subValues_.end()) return std::nullopt;
  return found->second;
}

}  // namespace nKvorSim
