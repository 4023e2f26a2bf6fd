#include "signal_outputs.h"

#include <algorithm>

#include "signal_codec.h"

namespace nKvorSim {

std::vector<Frame> SignalOutputs::Encode(const SignalLayout &layout,
                                         std::vector<tSignalEvent> events) {
  const std::vector<tSignalItem> &items = layout.Items();
  const std::vector<tFrameGroup> &groups = layout.Groups();
  std::stable_sort(events.begin(), events.end(), [&](const tSignalEvent &a, const tSignalEvent &b) {
    if (a.time != b.time) return a.time < b.time;
    return items[a.index].group < items[b.index].group;
  });
  std::lock_guard<std::mutex> lock(mutex_);
  if (payloads_.empty()) {
    for (const tFrameGroup &group : groups) payloads_.push_back(group.startPayload);
  }
  std::vector<Frame> frames;
  std::vector<bool> carried(items.size());
  for (size_t run = 0; run < events.size();) {
    const uint64_t time = events[run].time;
    const uint32_t group = items[events[run].index].group;
    std::vector<uint8_t> &payload = payloads_[group];
    std::fill(carried.begin(), carried.end(), false);
    // A frame carries one value of each signal: a second value due at the same time takes the
    // next frame.
    size_t end = run;
    for (; end < events.size() && events[end].time == time &&
           items[events[end].index].group == group && !carried[events[end].index];
         ++end) {
      carried[events[end].index] = true;
      EncodeSignal(*items[events[end].index].signal, events[end].value, payload.data());
    }
    Frame frame;
    frame.timestamp = time;
    frame.sentAt = time;
    frame.identifier = groups[group].identifier;
    frame.payload = payload;
    frames.push_back(std::move(frame));
    run = end;
  }
  return frames;
}

uint64_t SignalOutputs::WaveformStart(uint64_t now) {
  std::lock_guard<std::mutex> lock(mutex_);
  return std::max(now, waveformEnd_);
}

void SignalOutputs::WaveformReached(uint64_t end) {
  std::lock_guard<std::mutex> lock(mutex_);
  waveformEnd_ = std::max(waveformEnd_, end);
}

}  // namespace nKvorSim
