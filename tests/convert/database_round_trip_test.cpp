// Every frame of two field databases through conversion sessions: values to frames to values and
// byte images to frames to byte images, and the frames against what a signal output session puts
// on the bus for the same values.
#include <map>
#include <utility>

#include "convert/convert_test_support.h"

namespace {

using namespace kvsvtest;

struct tDatabase {
  const char *name;
  std::string (*path)();
  bool flexibleData;  // frames longer than 8 bytes
};
const tDatabase kDatabases[] = {{"tesla", TeslaDbc, false}, {"hyundai", HyundaiFdDbc, true}};

// A decoded value lies within half a step of the scale.
double Tolerance(const tDbSignal &signal, double value) {
  return std::fabs(signal.scale) / 2 + std::fabs(value) * 1e-12;
}

class DatabaseRoundTrip : public ConvertTest {
 protected:
  // The plain signals of every frame in one list, then the multiplexed signals of each frame and
  // multiplexer value in a list of their own: each list's frames then carry each signal once.
  static std::vector<std::vector<tDbSignal>> Lists(const std::string &path) {
    std::vector<std::vector<tDbSignal>> lists(1);
    std::map<std::pair<std::string, uint32_t>, std::vector<tDbSignal>> multiplexed;
    for (const tDbSignal &signal : DatabaseSignals(path)) {
      if (!signal.multiplexed) {
        lists[0].push_back(signal);
      } else {
        multiplexed[{signal.item.substr(0, signal.item.find('.')), signal.muxValue}].push_back(
            signal);
      }
    }
    for (auto &entry : multiplexed) lists.push_back(entry.second);
    return lists;
  }

  // Values to frames and back, then the image of the same raw values to frames and back.
  std::vector<tFrameFields> RoundTrip(const std::string &path,
                                      const std::vector<tDbSignal> &signals) {
    const uint32_t session = Conversion(path, ListOf(signals));
    std::vector<uint64_t> raws;
    std::vector<double> values;
    for (size_t i = 0; i < signals.size(); ++i) {
      raws.push_back(RawFor(signals[i], i));
      values.push_back(ValueOf(signals[i], raws.back()));
    }
    SvHandle in = Keep(ValueArray(values));
    cHostFrames out;
    EXPECT_EQ(kvsvConvertSignalSinglePointToFrameCAN(session, &in, &out.frames, &out.spares), 0);
    uint32_t numFrames = 0;
    EXPECT_EQ(kvGetProperty(session, kvPropSession_NumFrames, 4, &numFrames), 0);
    EXPECT_EQ(Count(out.frames), static_cast<int32_t>(numFrames));
    SvHandle back = nullptr;
    EXPECT_EQ(kvsvConvertFrameCANToSignalSinglePoint(session, &out.frames, &back), 0);
    Keep(back);
    const std::vector<double> got = ValuesIn(back);
    EXPECT_EQ(got.size(), signals.size());
    for (size_t i = 0; i < got.size() && i < values.size(); ++i) {
      EXPECT_NEAR(got[i], values[i], Tolerance(signals[i], values[i])) << signals[i].item;
    }

    const tBytes image = ImageOf(signals, raws);
    SvHandle imageIn = Keep(ByteArray(image));
    cHostFrames imageFrames;
    EXPECT_EQ(kvsvConvertByteArraySinglePointToFrameCAN(session, &imageIn, &imageFrames.frames,
                                                        &imageFrames.spares),
              0);
    EXPECT_EQ(imageFrames.All(), out.All()) << "the image and the values give other frames";
    SvHandle imageBack = nullptr;
    EXPECT_EQ(kvsvConvertFrameCANToByteArraySinglePoint(session, &imageFrames.frames, &imageBack),
              0);
    Keep(imageBack);
    EXPECT_EQ(PayloadBytes(imageBack), image);
    return out.All();
  }
};

TEST_F(DatabaseRoundTrip, EverySignalOfEveryFrameComesBackWithinItsResolution) {
  for (const tDatabase &database : kDatabases) {
    SCOPED_TRACE(database.name);
    size_t covered = 0;
    std::map<uint32_t, bool> identifiers;
    for (const std::vector<tDbSignal> &list : Lists(database.path())) {
      for (const tFrameFields &frame : RoundTrip(database.path(), list)) {
        identifiers[frame.identifier] = true;
        if (!database.flexibleData) {
          EXPECT_LE(frame.payload.size(), 8u);
        }
      }
      covered += list.size();
    }
    // Both files have hundreds of signals in dozens of frames; a list that lost them would pass
    // every comparison above.
    EXPECT_GT(covered, 500u);
    EXPECT_GT(identifiers.size(), 40u);
  }
}

TEST_F(DatabaseRoundTrip, FramesAreThoseThatAnOutputSessionSendsForTheSameValues) {
  for (const tDatabase &database : kDatabases) {
    SCOPED_TRACE(database.name);
    const std::vector<tDbSignal> plain = Lists(database.path())[0];
    std::vector<double> values;
    for (size_t i = 0; i < plain.size(); ++i)
      values.push_back(ValueOf(plain[i], RawFor(plain[i], i)));

    const uint32_t reader = MakeSession("", kvMode_FrameInQueued, "CAN2");
    if (database.flexibleData) {
      SetU32(reader, kvPropSession_IntfCanIoMode, 1);
      SetU32(reader, kvPropSession_PayldLenMax, 64);
    }
    uint32_t writer = 0;
    ASSERT_EQ(kvCreateSession(database.path().c_str(), "", ListOf(plain).c_str(), "CAN1",
                              kvMode_SignalOutSinglePoint, &writer),
              0);
    ASSERT_EQ(
        kvWriteSignalSinglePoint(writer, values.data(), static_cast<uint32_t>(values.size() * 8)),
        0);
    cHostFrames sent;
    const std::vector<tFrameFields> converted = RoundTrip(database.path(), plain);
    ASSERT_EQ(kvsvReadFrameCAN(reader, static_cast<int32_t>(converted.size()) + 1, &sent.frames,
                               &sent.spares, 0.0),
              0);
    EXPECT_EQ(sent.All(), converted);
    kvClear(writer);
  }
}

}  // namespace
