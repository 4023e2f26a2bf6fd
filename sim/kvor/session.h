// One session of the driver: its definition, the properties set on it, and the events its
// blocked calls wait for. An error session has no definition and answers every use with the
// status it was made with.
#ifndef KVOR_SIM_SESSION_H
#define KVOR_SIM_SESSION_H

#include <utility>

#include "driver_status.h"
#include "property_store.h"
#include "session_definition.h"
#include "session_events.h"

namespace nKvorSim {

struct ErrorSessionTag {};

class Session {
 public:
  explicit Session(SessionDefinition definition) : definition_(std::move(definition)) {}
  Session(ErrorSessionTag, Status status) : errorStatus_(status) {}

  // Negative for an error session, 0 for any other.
  Status ErrorStatus() const { return errorStatus_; }
  const SessionDefinition &Definition() const { return definition_; }
  PropertyStore &Store() { return store_; }
  const PropertyStore &Store() const { return store_; }
  SessionEvents &Events() { return events_; }

 private:
  const SessionDefinition definition_;
  const Status errorStatus_ = 0;
  PropertyStore store_;
  SessionEvents events_;
};

}  // namespace nKvorSim

#endif
