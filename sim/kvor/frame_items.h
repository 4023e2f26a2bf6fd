// The frames that a frame session's list names. Without a database an item names a frame by its
// identifier: "0x123" (standard), "0x18FEF100x" (extended: a trailing x), each with an optional
// ":LEN" payload length in decimal. Every lookup of a list item goes through here.
#ifndef KVOR_SIM_FRAME_ITEMS_H
#define KVOR_SIM_FRAME_ITEMS_H

#include <cstdint>
#include <optional>
#include <string_view>

namespace nKvorSim {

struct FrameItem {
  uint32_t identifier = 0;        // as in a record: bit 29 marks an extended CAN identifier
  std::optional<uint32_t> length; // absent: the session's payload maximum
};

// The frame that `item` names, or nothing if the item is not an identifier.
std::optional<FrameItem> LookUpFrameItem(std::string_view item);

// Whether a frame with the record identifier `identifier` is the frame of `item` on a network of
// `protocol`: CAN compares the identifier with its extended mark, LIN the low byte, FlexRay the
// low 16 bits.
bool IsFrameOfItem(uint32_t protocol, const FrameItem &item, uint32_t identifier);

}  // namespace nKvorSim

#endif
