// Trigger terminals and the routes that a session connects between them. A route joins a source
// terminal to a destination terminal; a session keeps the routes it made until it disconnects
// them or is cleared.
#ifndef KVOR_SIM_TERMINALS_H
#define KVOR_SIM_TERMINALS_H

#include <cstddef>
#include <mutex>
#include <set>
#include <string>
#include <string_view>
#include <utility>

#include "driver_status.h"

namespace nKvorSim {

// Whether `name` is one of the terminals of kvsim.h, spelt exactly.
bool IsTerminalName(std::string_view name);

// Checks a route as kvConnectTerminals and kvDisconnectTerminals take it: both names given, both
// terminals, and not the same terminal twice.
Status CheckRoute(const char *source, const char *destination);

class TerminalConnections {
 public:
  // Connecting a route that is connected already changes nothing.
  void Connect(std::string_view source, std::string_view destination);
  // False if the route is not connected.
  bool Disconnect(std::string_view source, std::string_view destination);
  bool IsConnected(std::string_view source, std::string_view destination) const;
  size_t Count() const;

 private:
  using Route = std::pair<std::string, std::string>;

  mutable std::mutex mutex_;
  std::set<Route> routes_;
};

}  // namespace nKvorSim

#endif
