// Where the signals of a session made with a database live: the session's own copy of the
// cluster, and for each item of its list the frame and signal that it names. Signals travel in
// frame groups: the plain signals of a frame, or the multiplexed signals of one multiplexer value
// of a frame. A write sends one frame per group that it touches, and a group's frame carries the
// latest value of each signal of the group.
#ifndef KVOR_SIM_SIGNAL_LAYOUT_H
#define KVOR_SIM_SIGNAL_LAYOUT_H

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "database_model.h"
#include "driver_status.h"
#include "frame.h"

namespace nKvorSim {

class DatabaseRegistry;

struct tSignalItem {
  const tFrame *frame = nullptr;
  const tSignal *signal = nullptr;
  const tSignal *multiplexer = nullptr;  // the frame's, for a multiplexed signal
  uint32_t identifier = 0;               // the frame's, as records carry it
  uint32_t group = 0;                    // index into the layout's groups
};

struct tFrameGroup {
  const tFrame *frame = nullptr;
  uint32_t identifier = 0;
  std::optional<uint32_t> muxValue;   // the multiplexer value of its signals; none for plain ones
  std::vector<uint8_t> startPayload;  // every signal of the group at its start value
};

class SignalLayout {
 public:
  // The items in the cluster: "frame.signal", or the name of a signal that no other frame of the
  // cluster uses. kvsimErrObjectNotFound names no signal, or one shared by several frames;
  // kvsimErrSignalLayout a signal that does not fit its frame.
  static Status Make(tCluster cluster, const std::vector<std::string> &items,
                     std::shared_ptr<const SignalLayout> *layout);

  const std::vector<tSignalItem> &Items() const { return items_; }
  const std::vector<tFrameGroup> &Groups() const { return groups_; }

  // Calls `take(index, value)` for each item that the frame carries: its identifier is the item's
  // frame's, the payload holds all of the signal's bits, and a multiplexed signal's multiplexer
  // holds its value.
  template <class Take>
  void Decode(const Frame &frame, Take take) const;

 private:
  SignalLayout() = default;
  Status Resolve(const std::string &item, tSignalItem *resolved);
  uint32_t GroupOf(const tFrame &frame, const tSignal &signal);

  tCluster cluster_;
  std::vector<tSignalItem> items_;
  std::vector<tFrameGroup> groups_;
};

// Whether the session of this definition takes its signals from a database: a signal mode and a
// database that is neither empty nor the in-memory one, whose sessions carry values by name.
bool UsesSignalDatabase(const std::string &database, uint32_t mode);

// The layout of a session made with a database: its cluster copied from the registry, its items
// resolved there. Null, and 0, for a session that carries values by name: one made with no
// database, the in-memory one, or one that is neither an alias nor a file.
Status MakeSessionLayout(DatabaseRegistry &databases, const std::string &database,
                         const std::string &cluster, uint32_t mode,
                         const std::vector<std::string> &items,
                         std::shared_ptr<const SignalLayout> *layout);

// The payload bits of `item` turned into its value, if the frame carries them.
std::optional<double> DecodeItem(const tSignalItem &item, const Frame &frame);

template <class Take>
void SignalLayout::Decode(const Frame &frame, Take take) const {
  for (uint32_t index = 0; index < items_.size(); ++index) {
    if (std::optional<double> value = DecodeItem(items_[index], frame)) take(index, *value);
  }
}

}  // namespace nKvorSim

#endif
