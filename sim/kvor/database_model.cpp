#include "database_model.h"

#include <algorithm>
#include <cstddef>

namespace nKvorSim {

bool IsIdentifier(std::string_view name) {
  if (name.empty()) return false;
  for (size_t i = 0; i < name.size(); ++i) {
    const char c = name[i];
    const bool letter = (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z') || c == '_';
    const bool digit = c >= '0' && c <= '9';
    if (!letter && !(digit && i > 0)) return false;
  }
  return true;
}

bool IsFileName(std::string_view name) {
  bool letter = false;
  for (const char c : name) {
    const bool digit = c >= '0' && c <= '9';
    if (!digit && !IsIdentifier(std::string_view(&c, 1))) return false;
    letter = letter || !digit;
  }
  return letter;
}

bool IsValidPayloadLength(uint32_t length) {
  if (length <= 8) return true;
  switch (length) {
    case 12:
    case 16:
    case 20:
    case 24:
    case 32:
    case 48:
    case 64:
      return true;
    default:
      return false;
  }
}

uint32_t MaxFrameId(bool extended) { return extended ? 0x1FFFFFFFu : 0x7FFu; }

const tSignal *FindSignal(const tFrame &frame, std::string_view name) {
  for (const tSignal &signal : frame.signals) {
    if (signal.name == name) return &signal;
  }
  return nullptr;
}

const tSignal *FindMultiplexer(const tFrame &frame) {
  for (const tSignal &signal : frame.signals) {
    if (signal.mux == MuxRole::kMultiplexer) return &signal;
  }
  return nullptr;
}

tPduMapping PduMappingOf(const tFrame &frame) {
  if (frame.pdus) return *frame.pdus;
  return tPduMapping{{frame.name}, {0}, {kNoUpdateBit}};
}

namespace {

void Replace(std::vector<std::string> *names, const std::string &from, const std::string &to) {
  for (std::string &name : *names) {
    if (name == from) name = to;
  }
}

}  // namespace

void RenameFrameReferences(tCluster *cluster, const std::string &from, const std::string &to) {
  for (tFrame &frame : cluster->frames) {
    if (frame.pdus) Replace(&frame.pdus->pdus, from, to);
  }
  for (tLinSchedule &schedule : cluster->linSchedules) {
    for (tLinScheduleEntry &entry : schedule.entries) Replace(&entry.frames, from, to);
  }
}

void ForgetFrame(tCluster *cluster, const std::string &name) {
  for (tFrame &frame : cluster->frames) {
    if (!frame.pdus) continue;
    // A PDU's start and update bits go with it.
    tPduMapping &mapping = *frame.pdus;
    for (size_t i = mapping.pdus.size(); i-- > 0;) {
      if (mapping.pdus[i] != name) continue;
      mapping.pdus.erase(mapping.pdus.begin() + static_cast<std::ptrdiff_t>(i));
      if (i < mapping.startBits.size())
        mapping.startBits.erase(mapping.startBits.begin() + static_cast<std::ptrdiff_t>(i));
      if (i < mapping.updateBits.size())
        mapping.updateBits.erase(mapping.updateBits.begin() + static_cast<std::ptrdiff_t>(i));
    }
  }
  for (tLinSchedule &schedule : cluster->linSchedules) {
    for (tLinScheduleEntry &entry : schedule.entries) {
      entry.frames.erase(std::remove(entry.frames.begin(), entry.frames.end(), name),
                         entry.frames.end());
    }
  }
}

void RenameScheduleReferences(tCluster *cluster, const std::string &from, const std::string &to) {
  for (tLinSchedule &schedule : cluster->linSchedules) {
    for (tLinScheduleEntry &entry : schedule.entries) {
      if (entry.collisionSchedule == from) entry.collisionSchedule = to;
    }
  }
}

std::string SubframeName(uint32_t muxValue) { return "m" + std::to_string(muxValue); }

void AddMissingSubframes(tFrame *frame) {
  for (const tSignal &signal : frame->signals) {
    if (signal.mux != MuxRole::kMultiplexed) continue;
    bool known = false;
    for (const tSubframe &subframe : frame->subframes)
      known = known || subframe.muxValue == signal.muxValue;
    if (!known)
      frame->subframes.push_back(tSubframe{SubframeName(signal.muxValue), signal.muxValue});
  }
}

}  // namespace nKvorSim
