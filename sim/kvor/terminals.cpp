#include "terminals.h"

#include "kvsim.h"

namespace nKvorSim {

namespace {

constexpr std::string_view kTerminals[] = {
    "StartTrigger", "Interface/StartTrigger",
    "FrontPanel0",  "FrontPanel1",
    "PXI_Trig0",    "PXI_Trig1",
    "PXI_Trig2",    "PXI_Trig3",
    "PXI_Trig4",    "PXI_Trig5",
    "PXI_Trig6",    "PXI_Trig7",
};

}  // namespace

bool IsTerminalName(std::string_view name) {
  for (std::string_view terminal : kTerminals) {
    if (name == terminal) return true;
  }
  return false;
}

Status CheckRoute(const char *source, const char *destination) {
  if (source == nullptr || destination == nullptr) return kvsimErrNullPointer;
  const std::string_view from = source;
  const std::string_view to = destination;
  if (!IsTerminalName(from) || !IsTerminalName(to) || from == to) return kvsimErrInvalidTerminal;
  return 0;
}

void TerminalConnections::Connect(std::string_view source, std::string_view destination) {
  std::lock_guard<std::mutex> lock(mutex_);
  routes_.emplace(std::string(source), std::string(destination));
}

bool TerminalConnections::Disconnect(std::string_view source, std::string_view destination) {
  std::lock_guard<std::mutex> lock(mutex_);
  return routes_.erase(Route(source, destination)) != 0;
}

bool TerminalConnections::IsConnected(std::string_view source, std::string_view destination) const {
  std::lock_guard<std::mutex> lock(mutex_);
  return routes_.count(Route(source, destination)) != 0;
}

size_t TerminalConnections::Count() const {
  std::lock_guard<std::mutex> lock(mutex_);
  return routes_.size();
}

}  // namespace nKvorSim
