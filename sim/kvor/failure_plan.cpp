#include "failure_plan.h"

#include <algorithm>

namespace nKvorSim {

void FailurePlan::Add(std::string_view function, std::optional<uint32_t> propertyId, Status status,
                      int32_t count) {
  std::lock_guard<std::mutex> lock(mutex_);
  rules_.push_back(Rule{std::string(function), propertyId, status, count});
}

std::optional<Status> FailurePlan::Take(std::string_view function, uint32_t propertyId) {
  std::lock_guard<std::mutex> lock(mutex_);
  auto matches = [&](bool forProperty) {
    return std::find_if(rules_.begin(), rules_.end(), [&](const Rule &rule) {
      return rule.function == function && rule.propertyId.has_value() == forProperty &&
             (!forProperty || *rule.propertyId == propertyId);
    });
  };
  auto rule = matches(true);
  if (rule == rules_.end()) rule = matches(false);
  if (rule == rules_.end()) return std::nullopt;
  const Status status = rule->status;
  if (rule->remaining > 0 && --rule->remaining == 0) rules_.erase(rule);
  return status;
}

void FailurePlan::Clear() {
  std::lock_guard<std::mutex> lock(mutex_);
  rules_.clear();
}

}  // namespace nKvorSim
