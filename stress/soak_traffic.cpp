#include "soak_traffic.h"

#include <chrono>
#include <random>
#include <string>
#include <thread>

#include "soak_host_arrays.h"
#include "soak_violations.h"

namespace nKvsvSoak {

namespace {

constexpr int32_t kLargestWriteBatch = 24;
constexpr int32_t kLargestReadBatch = 40;
// Short enough that an ended session is seen at once, long enough that reads do wait.
constexpr double kReadLimits[] = {0.0, 0.002, 0.02};

}  // namespace

uint64_t CheckFrames(const char *call, const cReadArrays &arrays, bool flexibleReader, std::vector<tPair> &pairs,
                     std::vector<int64_t> *last, cSoakThread &thread) {
  std::vector<tWriterKind> kinds;
  for (const tPair &pair : pairs) kinds.push_back(pair.kind);
  const tWriterTable writers{kinds.data(), static_cast<uint32_t>(kinds.size()),
                             [&pairs](uint32_t writer) { return pairs[writer].issued.load(); }};
  const int32_t count = arrays.Frames();
  for (int32_t i = 0; i < count; ++i) {
    uint32_t writer = 0, sequence = 0;
    const std::string fault =
        CheckStamp(arrays.Frame(i), flexibleReader, writers, &writer, &sequence);
    if (!fault.empty()) {
      Violation(thread.Name(), "frame " + std::to_string(i) + " of " + call + ": " + fault);
      continue;
    }
    if (last == nullptr) continue;
    // One session gets each writer's frames in the order they were written, each once.
    if (int64_t(sequence) <= (*last)[writer])
      Violation(thread.Name(), "writer " + std::to_string(writer) + "'s frame " +
                                   std::to_string(sequence) + " came after its frame " +
                                   std::to_string((*last)[writer]));
    (*last)[writer] = sequence;
  }
  return uint64_t(count);
}

void RunWriter(tPair &pair, const tRunFlags &flags, uint32_t seed, cSoakThread &thread) {
  std::minstd_rand random(seed);
  cWriteArray frames(kLargestWriteBatch);
  while (flags.running.load()) {
    const bool settled = !flags.changing.load();
    const uint32_t session = pair.writer.handle.load();
    const int32_t batch = 1 + int32_t(random() % kLargestWriteBatch);
    const uint32_t first = pair.issued.fetch_add(uint32_t(batch));
    for (int32_t i = 0; i < batch; ++i) frames.Stamp(i, pair.number, first + uint32_t(i), pair.kind);
    frames.SetCount(batch);
    const double limit = random() % 4 == 0 ? 0.01 : 0.0;
    const int32_t status = thread.Call("kvsvWriteFrameCAN", [&] {
      return kvsvWriteFrameCAN(session, frames.handle(), limit);
    });
    if (status >= 0) {
      thread.tally.framesWritten += uint64_t(batch);
      if (settled) ++thread.tally.settledTransfers;
    }
    // A pace the readers can follow, so that their reads also wait for frames.
    thread.Doing("pausing between writes");
    std::this_thread::sleep_for(std::chrono::microseconds(200 + random() % 2500));
  }
}

void RunReader(tPair &pair, std::vector<tPair> &pairs, const tRunFlags &flags, uint32_t seed,
               cSoakThread &thread) {
  std::minstd_rand random(seed);
  cReadArrays arrays;
  uint32_t lastSession = 0;
  std::vector<int64_t> last(pairs.size(), -1);
  while (flags.running.load()) {
    const bool settled = !flags.changing.load();
    const uint32_t session = pair.reader.handle.load();
    if (session != lastSession) {
      lastSession = session;
      last.assign(pairs.size(), -1);
    }
    int32_t wanted = 1 + int32_t(random() % kLargestReadBatch);
    double limit = kReadLimits[random() % 3];
    if (random() % 16 == 0) {
      wanted = -1;  // all the session holds, which needs no time limit
      limit = 0.0;
    }
    const int32_t status = thread.Call("kvsvReadFrameCAN", [&] {
      return kvsvReadFrameCAN(session, wanted, &arrays.frames, &arrays.spares, limit);
    });
    // These two leave the arrays untouched: what they hold was checked already. A session that
    // is gone stays gone until a changer makes the next one: no need to spin on it.
    if (status == kvErrInvalidSession) std::this_thread::sleep_for(std::chrono::microseconds(100));
    if (status == kvErrInvalidSession || status == kvErrSessionBusy) continue;
    thread.Doing("checking frames read");
    if (wanted > 0 && arrays.Frames() > wanted)
      Violation(thread.Name(), "a read for " + std::to_string(wanted) + " frames gave " +
                                   std::to_string(arrays.Frames()));
    const uint64_t frames =
        CheckFrames("a read", arrays, pair.kind.flexibleDataRate, pairs, &last, thread);
    thread.tally.framesRead += frames;
    if (status >= 0 && frames != 0 && settled) ++thread.tally.settledTransfers;
    thread.Beat();
  }
}

}  // namespace nKvsvSoak
