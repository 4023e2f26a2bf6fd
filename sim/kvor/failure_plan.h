// Statuses that tests inject into driver calls: for the next N calls of a function, or until
// cleared, optionally only for one property identifier.
#ifndef KVOR_SIM_FAILURE_PLAN_H
#define KVOR_SIM_FAILURE_PLAN_H

#include <cstdint>
#include <mutex>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "driver_status.h"

namespace nKvorSim {

class FailurePlan {
 public:
  // `count` > 0: the next `count` matching calls; < 0: every matching call until Clear.
  void Add(std::string_view function, std::optional<uint32_t> propertyId, Status status,
           int32_t count);
  // The status injected into this call, if a rule matches; a rule for the property is preferred
  // to one for the whole function. A counted rule is used up by the calls it matches.
  std::optional<Status> Take(std::string_view function, uint32_t propertyId);
  void Clear();

 private:
  struct Rule {
    std::string function;
    std::optional<uint32_t> propertyId;
    Status status;
    int32_t remaining;  // negative: no limit
  };

  std::mutex mutex_;
  std::vector<Rule> rules_;
};

}  // namespace nKvorSim

#endif
