#include "database_merge.h"

#include <list>

#include "kvsim.h"

namespace nKvorSim {

namespace {

template <class List>
typename List::iterator Named(List &list, const std::string &name) {
  for (auto it = list.begin(); it != list.end(); ++it) {
    if (it->name == name) return it;
  }
  return list.end();
}

std::string Prefixed(const std::string &prefix, const std::string &node) {
  return node.empty() ? node : prefix + node;
}

// The source's frames and ECUs as they will be in the target.
void Rename(tCluster *copy, const std::string &prefix) {
  for (tEcu &ecu : copy->ecus) ecu.name = prefix + ecu.name;
  for (tFrame &frame : copy->frames) {
    frame.name = prefix + frame.name;
    frame.transmitter = Prefixed(prefix, frame.transmitter);
    if (frame.pdus) {
      for (std::string &pdu : frame.pdus->pdus) pdu = prefix + pdu;
    }
    for (tSignal &signal : frame.signals) {
      for (std::string &receiver : signal.receivers) receiver = Prefixed(prefix, receiver);
    }
  }
}

}  // namespace

Status MergeCluster(tCluster *target, const tCluster &source, MergeMode mode,
                    const std::string &prefix, const std::function<void(const void *)> &removing,
                    std::string *error) {
  if (mode != MergeMode::kReplace && mode != MergeMode::kKeepTarget && mode != MergeMode::kRefuse) {
    return kvsimErrInvalidArgument;
  }
  tCluster copy = source;
  Rename(&copy, prefix);
  // Every check before the first change, so that a refused merge changes nothing.
  const auto refuse = [&](Status status, std::string why) {
    *error = std::move(why);
    return status;
  };
  for (const tEcu &ecu : copy.ecus) {
    if (!IsIdentifier(ecu.name)) return refuse(kvsimErrInvalidName, "ECU name '" + ecu.name + "'");
    if (mode == MergeMode::kRefuse && Named(target->ecus, ecu.name) != target->ecus.end()) {
      return refuse(kvsimErrObjectExists, "ECU '" + ecu.name + "' is in both clusters");
    }
  }
  for (const tFrame &frame : copy.frames) {
    if (!IsIdentifier(frame.name)) return refuse(kvsimErrInvalidName, "frame name '" + frame.name + "'");
    const bool named = Named(target->frames, frame.name) != target->frames.end();
    if (mode == MergeMode::kRefuse && named) {
      return refuse(kvsimErrObjectExists, "frame '" + frame.name + "' is in both clusters");
    }
    if (mode == MergeMode::kKeepTarget && named) continue;
    for (const tFrame &other : target->frames) {
      if (other.name != frame.name && other.id == frame.id && other.extended == frame.extended) {
        return refuse(kvsimErrObjectExists, "frame '" + frame.name + "' has the identifier of '" +
                                                other.name + "'");
      }
    }
  }

  for (tEcu &ecu : copy.ecus) {
    const auto there = Named(target->ecus, ecu.name);
    if (there != target->ecus.end()) {
      if (mode == MergeMode::kKeepTarget) continue;
      removing(&*there);
      target->ecus.erase(there);
    }
    target->ecus.push_back(std::move(ecu));
  }
  for (tFrame &frame : copy.frames) {
    const auto there = Named(target->frames, frame.name);
    if (there != target->frames.end()) {
      if (mode == MergeMode::kKeepTarget) continue;
      removing(&*there);
      target->frames.erase(there);
    }
    target->frames.push_back(std::move(frame));
  }
  for (tValueTable &table : copy.valueTables) {
    if (Named(target->valueTables, table.name) == target->valueTables.end()) {
      target->valueTables.push_back(std::move(table));
    }
  }
  for (tAttributeDefinition &definition : copy.attributeDefinitions) {
    if (Named(target->attributeDefinitions, definition.name) == target->attributeDefinitions.end()) {
      target->attributeDefinitions.push_back(std::move(definition));
    }
  }
  return 0;
}

}  // namespace nKvorSim
