#include "frame_bus.h"

#include "frame_items.h"
#include "frame_properties.h"
#include "kvsvplatform.h"
#include "signal_properties.h"

namespace nKvorSim {

namespace {

const InterfaceRecord &InterfaceAt(uint32_t index) {
  for (const DeviceRecord &device : Devices()) {
    if (index < device.interfaces.size()) return device.interfaces[index];
    index -= static_cast<uint32_t>(device.interfaces.size());
  }
  return Devices().front().interfaces.front();
}

bool AloneOnNetwork(uint32_t network) {
  uint32_t count = 0;
  for (const DeviceRecord &device : Devices()) {
    for (const InterfaceRecord &record : device.interfaces) count += record.network == network;
  }
  return count == 1;
}

uint8_t EchoFlag(uint32_t protocol) {
  return protocol == kProtocolEthernet ? static_cast<uint8_t>(kEthernetEchoFlag) : kEchoFlag;
}

// How the receiver on `receiverInterface` gets a frame of the writer, if it gets it at all.
enum class Arrival { kNone, kPlain, kEcho };

Arrival ArrivalAt(const SessionDefinition &writer, bool echo, uint32_t receiverInterface,
                  bool alone) {
  if (receiverInterface != writer.interfaceIndex) return Arrival::kPlain;
  if (echo) return Arrival::kEcho;
  return alone ? Arrival::kPlain : Arrival::kNone;
}

}  // namespace

bool ReceivesFrames(const Session &session) {
  const SessionDefinition &definition = session.Definition();
  if (session.ErrorStatus() != 0) return false;
  if (IsFrameInputMode(definition.mode)) return true;
  return definition.signals != nullptr && IsSignalInputMode(definition.mode);
}

void ReceiveFrame(Session &receiver, const Frame &frame) {
  const SessionDefinition &definition = receiver.Definition();
  if (IsSignalInputMode(definition.mode)) {
    if (definition.signals == nullptr) return;
    const uint32_t count = static_cast<uint32_t>(definition.items.size());
    const uint32_t capacity = SignalQueueCapacity(receiver);
    definition.signals->Decode(frame, [&](uint32_t index, double value) {
      receiver.SignalsIn().Receive(count, index, frame.timestamp, value, capacity);
    });
    return;
  }
  if (definition.mode != kvMode_FrameInSinglePoint) {
    receiver.Frames().Enqueue(frame, QueueCapacity(receiver));
    return;
  }
  for (uint32_t index = 0; index < definition.items.size(); ++index) {
    const std::optional<FrameItem> item = LookUpFrameItem(definition.items[index]);
    if (item && IsFrameOfItem(definition.protocol, *item, frame.identifier)) {
      receiver.Frames().KeepLatest(index, frame);
    }
  }
}

void FrameBus::Transmit(const Session &writer, std::vector<Frame> frames, uint64_t now,
                        const SessionRegistry &sessions) {
  for (Frame &frame : frames) {
    frame.timestamp = now;
    frame.sentAt = now;
  }
  TransmitStamped(writer, std::move(frames), sessions);
}

void FrameBus::TransmitStamped(const Session &writer, std::vector<Frame> frames,
                               const SessionRegistry &sessions) {
  const SessionDefinition &from = writer.Definition();
  const uint32_t network = InterfaceAt(from.interfaceIndex).network;
  const bool alone = AloneOnNetwork(network);
  const bool echo = EchoEnabled(writer);
  const uint8_t echoFlag = EchoFlag(from.protocol);
  for (Frame &frame : frames) {
    frame.sequence = ++sequences_[network];
    frame.flags = static_cast<uint8_t>(frame.flags & ~echoFlag);
  }
  for (const std::shared_ptr<Session> &receiver : sessions.All()) {
    const SessionDefinition &to = receiver->Definition();
    if (to.network != from.network || !ReceivesFrames(*receiver)) continue;
    const Arrival arrival = ArrivalAt(from, echo, to.interfaceIndex, alone);
    if (arrival == Arrival::kNone) continue;
    for (const Frame &frame : frames) {
      if (arrival == Arrival::kPlain) {
        ReceiveFrame(*receiver, frame);
      } else {
        Frame echoed = frame;
        echoed.flags |= echoFlag;
        ReceiveFrame(*receiver, echoed);
      }
    }
    receiver->Events().Notify();
  }
}

void FrameBus::Reset() {
  for (std::atomic<uint32_t> &sequence : sequences_) sequence.store(0);
}

}  // namespace nKvorSim
