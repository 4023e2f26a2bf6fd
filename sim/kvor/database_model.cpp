#include "database_model.h"

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

std::string SubframeName(uint32_t muxValue) { return "m" + std::to_string(muxValue); }

void AddMissingSubframes(tFrame *frame) {
  for (const tSignal &signal : frame->signals) {
    if (signal.mux != MuxRole::kMultiplexed) continue;
    bool known = false;
    for (const tSubframe &subframe : frame->subframes) known = known || subframe.muxValue == signal.muxValue;
    if (!known) frame->subframes.push_back(tSubframe{SubframeName(signal.muxValue), signal.muxValue});
  }
}

}  // namespace nKvorSim
