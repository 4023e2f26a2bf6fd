#include "signal_layout.h"

#include "database_registry.h"
#include "kvsim.h"
#include "kvsvplatform.h"
#include "signal_codec.h"

namespace nKvorSim {

namespace {

// Bit 29 of a record's identifier marks an extended CAN identifier; bits 30 and 31 are no part
// of it.
constexpr uint32_t kExtendedMark = 0x20000000u;
constexpr uint32_t kIdentifierMask = 0x3FFFFFFFu;

uint32_t RecordIdentifier(const tFrame &frame) {
  return frame.extended ? frame.id | kExtendedMark : frame.id;
}

// The raw bits that a signal starts with: its start value is given before scale and offset.
uint64_t StartBits(const tSignal &signal) {
  tSignal rawDomain = signal;
  rawDomain.scale = 1.0;
  rawDomain.offset = 0.0;
  return PhysicalToRaw(rawDomain, signal.defaultRaw);
}

// The frame of a group before any value is written into it: every signal that the group's
// multiplexer value selects (the multiplexer's own start value for plain signals) at its start
// value, and the multiplexer holding that value.
std::vector<uint8_t> StartPayload(const tFrame &frame, std::optional<uint32_t> muxValue) {
  std::vector<uint8_t> payload(frame.payloadLength, 0);
  const tSignal *multiplexer = FindMultiplexer(frame);
  const bool muxUsable = multiplexer != nullptr && SignalFits(*multiplexer, frame.payloadLength);
  const uint64_t selected = muxValue ? *muxValue : muxUsable ? StartBits(*multiplexer) : 0;
  for (const tSignal &signal : frame.signals) {
    if (!SignalFits(signal, frame.payloadLength)) continue;
    if (signal.mux == MuxRole::kMultiplexed && (!muxUsable || signal.muxValue != selected)) {
      continue;
    }
    InsertRaw(signal, StartBits(signal), payload.data());
  }
  if (muxUsable) InsertRaw(*multiplexer, selected, payload.data());
  return payload;
}

const tFrame *FindFrame(const tCluster &cluster, const std::string &name) {
  for (const tFrame &frame : cluster.frames) {
    if (frame.name == name) return &frame;
  }
  return nullptr;
}

// Conversion sessions pack and unpack the same signals as the signal modes, with no bus.
bool IsSignalMode(uint32_t mode) {
  return mode <= kvMode_SignalOutXY || mode == kvMode_SignalConversionSinglePoint;
}

}  // namespace

Status SignalLayout::Make(tCluster cluster, const std::vector<std::string> &items,
                          std::shared_ptr<const SignalLayout> *layout) {
  std::shared_ptr<SignalLayout> made(new SignalLayout);
  made->cluster_ = std::move(cluster);
  made->items_.reserve(items.size());
  for (const std::string &item : items) {
    tSignalItem resolved;
    const Status status = made->Resolve(item, &resolved);
    if (status != 0) return status;
    made->items_.push_back(resolved);
  }
  *layout = std::move(made);
  return 0;
}

Status SignalLayout::Resolve(const std::string &item, tSignalItem *resolved) {
  const tFrame *frame = nullptr;
  const tSignal *signal = nullptr;
  const size_t dot = item.find('.');
  if (dot != std::string::npos) {
    frame = FindFrame(cluster_, item.substr(0, dot));
    if (frame != nullptr) signal = FindSignal(*frame, item.substr(dot + 1));
  } else {
    for (const tFrame &each : cluster_.frames) {
      const tSignal *found = FindSignal(each, item);
      if (found == nullptr) continue;
      // A name that several frames use names none of them.
      if (signal != nullptr) return kvsimErrObjectNotFound;
      frame = &each;
      signal = found;
    }
  }
  if (signal == nullptr) return kvsimErrObjectNotFound;
  if (!SignalFits(*signal, frame->payloadLength)) return kvsimErrSignalLayout;
  resolved->frame = frame;
  resolved->signal = signal;
  resolved->identifier = RecordIdentifier(*frame);
  if (signal->mux == MuxRole::kMultiplexed) {
    resolved->multiplexer = FindMultiplexer(*frame);
    if (resolved->multiplexer == nullptr ||
        !SignalFits(*resolved->multiplexer, frame->payloadLength)) {
      return kvsimErrSignalLayout;
    }
  }
  resolved->group = GroupOf(*frame, *signal);
  return 0;
}

uint32_t SignalLayout::GroupOf(const tFrame &frame, const tSignal &signal) {
  std::optional<uint32_t> muxValue;
  if (signal.mux == MuxRole::kMultiplexed) muxValue = signal.muxValue;
  for (uint32_t group = 0; group < groups_.size(); ++group) {
    if (groups_[group].frame == &frame && groups_[group].muxValue == muxValue) return group;
  }
  groups_.push_back(
      tFrameGroup{&frame, RecordIdentifier(frame), muxValue, StartPayload(frame, muxValue)});
  return static_cast<uint32_t>(groups_.size() - 1);
}

bool UsesSignalDatabase(const std::string &database, uint32_t mode) {
  return IsSignalMode(mode) && !database.empty() && database != DatabaseRegistry::kMemoryName;
}

Status MakeSessionLayout(DatabaseRegistry &databases, const std::string &database,
                         const std::string &cluster, uint32_t mode,
                         const std::vector<std::string> &items,
                         std::shared_ptr<const SignalLayout> *layout) {
  layout->reset();
  if (!UsesSignalDatabase(database, mode)) return 0;
  tCluster copy;
  const Status status = databases.CopyCluster(database.c_str(), cluster.c_str(), &copy);
  // A database that is nowhere to be found names signals that travel by name.
  if (status == kvsimErrDatabaseNotFound) return 0;
  if (status != 0) return status;
  return SignalLayout::Make(std::move(copy), items, layout);
}

std::optional<double> DecodeItem(const tSignalItem &item, const Frame &frame) {
  if ((frame.identifier & kIdentifierMask) != item.identifier) return std::nullopt;
  // A frame shorter than its database says carries only the signals that lie in what came.
  const uint32_t length = static_cast<uint32_t>(frame.payload.size());
  if (!SignalFits(*item.signal, length)) return std::nullopt;
  if (item.multiplexer != nullptr) {
    if (!SignalFits(*item.multiplexer, length) ||
        ExtractRaw(*item.multiplexer, frame.payload.data()) != item.signal->muxValue) {
      return std::nullopt;
    }
  }
  return DecodeSignal(*item.signal, frame.payload.data());
}

}  // namespace nKvorSim
