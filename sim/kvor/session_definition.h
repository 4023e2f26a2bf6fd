// What a session is made of: mode, interface, database, cluster and list, checked against the
// system when the session is created.
#ifndef KVOR_SIM_SESSION_DEFINITION_H
#define KVOR_SIM_SESSION_DEFINITION_H

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "driver_status.h"
#include "network.h"
#include "signal_layout.h"

namespace nKvorSim {

constexpr uint32_t kLastSessionMode = 12;

struct SessionDefinition {
  uint32_t mode = 0;
  uint32_t protocol = 0;
  uint32_t interfaceIndex = 0;  // InterfacePlace::index of the interface
  std::string interfaceName;  // as the creator gave it, "/suffix" included
  std::string database;
  std::string cluster;
  std::vector<std::string> items;  // signals or frames, trimmed, in list order
  Network *network = nullptr;      // the network of the interface
  // Where the signals lie in frames, for a signal session made with a database; null for one
  // whose values travel by name.
  std::shared_ptr<const SignalLayout> signals;
  uint64_t createdAt = 0;  // the clock when the session was made
};

// Checks the arguments of kvCreateSession and makes the definition. The interface is one of the
// system's, compared without regard to case, optionally followed by "/" and a non-empty suffix
// ("ENET1/monitor"). The list is comma-separated; each item is trimmed of white space, a list of
// nothing but white space has no items, and an empty item among others makes it invalid. Null
// texts other than the interface count as empty.
Status MakeSessionDefinition(const char *database, const char *cluster, const char *list,
                             const char *interfaceName, uint32_t mode, NetworkSet &networks,
                             SessionDefinition *definition);

}  // namespace nKvorSim

#endif
