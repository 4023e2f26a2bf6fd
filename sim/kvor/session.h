// One session of the driver: its definition, the properties set on it, the events its blocked
// calls wait for, the terminal routes it connected, the point up to which it was flushed, its
// frame and signal traffic, and the states that tests set for it. An error session has no
// definition and answers every use with the status it was made with.
#ifndef KVOR_SIM_SESSION_H
#define KVOR_SIM_SESSION_H

#include <atomic>
#include <cstdint>
#include <optional>
#include <utility>

#include "driver_status.h"
#include "frame_inbox.h"
#include "frame_last_writes.h"
#include "frame_read_stream.h"
#include "future_trigger.h"
#include "property_store.h"
#include "session_definition.h"
#include "session_events.h"
#include "session_states.h"
#include "signal_inputs.h"
#include "signal_outputs.h"
#include "terminals.h"
#include "written_states.h"

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
  const SessionEvents &Events() const { return events_; }
  TerminalConnections &Terminals() { return terminals_; }
  const TerminalConnections &Terminals() const { return terminals_; }
  FrameInbox &Frames() { return frames_; }
  const FrameInbox &Frames() const { return frames_; }
  FrameReadStream &ReadStream() { return readStream_; }
  FrameLastWrites &LastWrites() { return lastWrites_; }
  SignalInputs &SignalsIn() { return signalsIn_; }
  SignalOutputs &SignalsOut() { return signalsOut_; }
  SessionStates &States() { return states_; }

  // Signal values published on the network up to this publication number arrived before the
  // latest flush, and the session no longer holds them.
  uint64_t FlushedThrough() const { return flushedThrough_.load(); }
  void MarkFlushed(uint64_t publication) { flushedThrough_.store(publication); }

  // The LIN schedule that kvWriteState selected last; none until one is selected.
  std::optional<uint32_t> LinSchedule() const {
    const int64_t index = linSchedule_.load();
    if (index < 0) return std::nullopt;
    return static_cast<uint32_t>(index);
  }
  void SelectLinSchedule(uint32_t index) { linSchedule_.store(index); }

  WrittenStates &StatesWritten() { return statesWritten_; }
  FutureTrigger &Trigger() { return trigger_; }

 private:
  const SessionDefinition definition_;
  const Status errorStatus_ = 0;
  PropertyStore store_;
  SessionEvents events_;
  TerminalConnections terminals_;
  FrameInbox frames_;
  FrameReadStream readStream_;
  FrameLastWrites lastWrites_;
  SignalInputs signalsIn_;
  SignalOutputs signalsOut_;
  SessionStates states_;
  std::atomic<uint64_t> flushedThrough_{0};
  std::atomic<int64_t> linSchedule_{-1};  // -1: no schedule selected
  WrittenStates statesWritten_;
  FutureTrigger trigger_;
};

}  // namespace nKvorSim

#endif
