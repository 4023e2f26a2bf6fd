#include "frame_items.h"

#include <cctype>

#include "inventory.h"

namespace nKvorSim {

namespace {

constexpr uint32_t kExtendedMark = 0x20000000u;
constexpr uint32_t kLongestExtended = 0x1FFFFFFFu;
constexpr uint32_t kLongestStandard = 0x7FFu;

// Digits of `base` in `text`, all of it, into *value; false if `text` is empty, holds anything
// else, or overflows 32 bits.
bool ParseNumber(std::string_view text, uint32_t base, uint32_t *value) {
  if (text.empty()) return false;
  uint64_t number = 0;
  for (char c : text) {
    const int digit = std::isdigit(static_cast<unsigned char>(c))
                          ? c - '0'
                          : std::isxdigit(static_cast<unsigned char>(c))
                                ? std::tolower(static_cast<unsigned char>(c)) - 'a' + 10
                                : 99;
    if (digit >= static_cast<int>(base)) return false;
    number = number * base + static_cast<uint32_t>(digit);
    if (number > 0xFFFFFFFFu) return false;
  }
  *value = static_cast<uint32_t>(number);
  return true;
}

uint32_t IdentifierMask(uint32_t protocol) {
  switch (protocol) {
    case kProtocolLin:
      return 0xFFu;
    case kProtocolFlexRay:
      return 0xFFFFu;
    default:
      return kExtendedMark | kLongestExtended;
  }
}

}  // namespace

std::optional<FrameItem> LookUpFrameItem(std::string_view item) {
  FrameItem found;
  const size_t colon = item.find(':');
  if (colon != std::string_view::npos) {
    uint32_t length = 0;
    if (!ParseNumber(item.substr(colon + 1), 10, &length)) return std::nullopt;
    found.length = length;
    item = item.substr(0, colon);
  }
  if (item.size() < 3 || item[0] != '0' || (item[1] != 'x' && item[1] != 'X')) {
    return std::nullopt;
  }
  item.remove_prefix(2);
  const bool extended = item.back() == 'x' || item.back() == 'X';
  if (extended) item.remove_suffix(1);
  uint32_t identifier = 0;
  if (!ParseNumber(item, 16, &identifier)) return std::nullopt;
  if (identifier > (extended ? kLongestExtended : kLongestStandard)) return std::nullopt;
  found.identifier = extended ? identifier | kExtendedMark : identifier;
  return found;
}

bool IsFrameOfItem(uint32_t protocol, const FrameItem &item, uint32_t identifier) {
  const uint32_t mask = IdentifierMask(protocol);
  return (item.identifier & mask) == (identifier & mask);
}

}  // namespace nKvorSim
