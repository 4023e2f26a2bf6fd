// Conversion sessions through the library against the driver stand-in's database engine: values,
// byte images, clusters and raw records of one session agree with each other and with what a
// signal output session sends; the payload limits at their edges; the cache of the session's
// form and sizes; the payload handles recycled through the spares, and what happens when they run
// out, find no room or the host changes its arrays between calls.
#include <functional>

#include "convert/convert_test_support.h"
#include "support/call_log.h"
#include "support/fake_error_log.h"

namespace {

using namespace kvsvtest;
using nKVSVAPI100::kUnknown;

using tToFrames = kvsvStatus (*)(uint32_t, SvHandle *, SvHandle *, SvHandle *);
using tFromFrames = kvsvStatus (*)(uint32_t, SvHandle *, SvHandle *);

TEST_F(ConvertTest, ValuesImagesRawRecordsAndAnOutputSessionAgreeOnTheFrames) {
  const struct {
    const char *name;
    std::string path;
    std::vector<tSignalCase> signals;
  } cases[] = {{"Tesla", TeslaPath(), {TeslaSignals().begin(), TeslaSignals().begin() + 6}},
               {"Hyundai, frames of 16 and 8 bytes",
                HyundaiFdPath(),
                {{"LKAS.StrTqReqVal", 100, 1}, {"CAM_0x185.COUNTER", 7, 1}}}};
  for (const auto &c : cases) {
    SCOPED_TRACE(c.name);
    std::vector<double> values;
    for (const tSignalCase &s : c.signals) values.push_back(s.value);
    const uint32_t session = Conversion(c.path, ListOf(c.signals));
    SvHandle in = Keep(ValueArray(values)), back = nullptr, image = nullptr, raw = nullptr,
             fromRaw = nullptr;
    cHostFrames out, again, sent;
    ASSERT_EQ(kvsvConvertSignalSinglePointToFrameCAN(session, &in, &out.frames, &out.spares), 0);
    // Back to values within half a step, through the byte image to the same frames, and through
    // the raw form to the same values.
    ASSERT_EQ(kvsvConvertFrameCANToSignalSinglePoint(session, &out.frames, &back), 0);
    ASSERT_EQ(kvsvConvertFrameCANToByteArraySinglePoint(session, &out.frames, &image), 0);
    EXPECT_EQ(svGetHandleSize(image), static_cast<uint32_t>(Count(image)) + 7);  // as every payload
    ASSERT_EQ(
        kvsvConvertByteArraySinglePointToFrameCAN(session, &image, &again.frames, &again.spares),
        0);
    EXPECT_EQ(again.All(), out.All());
    ASSERT_EQ(kvsvConvertSignalSinglePointToFrameRaw(session, &in, &raw), 0);
    ASSERT_EQ(kvsvConvertFrameRawToSignalSinglePoint(session, &raw, &fromRaw), 0);
    for (SvHandle h : {back, image, raw, fromRaw}) Keep(h);
    for (const std::vector<double> &got : {ValuesIn(back), ValuesIn(fromRaw)}) {
      ASSERT_EQ(got.size(), values.size());
      for (size_t i = 0; i < got.size(); ++i)
        EXPECT_NEAR(got[i], values[i], c.signals[i].scale / 2) << c.signals[i].name;
    }

    // What a signal output session puts on the bus for the same values, read as CAN FD.
    const uint32_t reader = MakeSession("", kvMode_FrameInQueued, "CAN2");
    SetU32(reader, kvPropSession_IntfCanIoMode, 1);
    SetU32(reader, kvPropSession_PayldLenMax, 64);
    uint32_t writer = 0;
    ASSERT_EQ(kvCreateSession(c.path.c_str(), "", ListOf(c.signals).c_str(), "CAN1",
                              kvMode_SignalOutSinglePoint, &writer),
              0);
    ASSERT_EQ(kvWriteSignalSinglePoint(writer, values.data(), uint32_t(values.size() * 8)), 0);
    ASSERT_EQ(kvsvReadFrameCAN(reader, Count(out.frames) + 1, &sent.frames, &sent.spares, 0.0), 0);
    EXPECT_EQ(sent.All(), out.All());
    kvClear(writer);
    // An image size given in bits that are not whole bytes: the driver is asked for whole bytes.
    const uint32_t twelveBits = 12;
    ASSERT_EQ(kvSetSubProperty(session, 0, kvPropHidden_ByteArrayBits, 4, &twelveBits), 0);
    kvsvConvertFrameCANToByteArraySinglePoint(session, &out.frames, &image);
    EXPECT_EQ(LastCall("kvConvertFramesToByteArraySinglePoint").size2, 1u);
  }
}

TEST_F(ConvertTest, PayloadLimitsHoldAtTheirExactEdges) {
  const struct {
    const char *interfaceName;
    uint32_t protocol, limit;
    kvsvStatus status;
    uint32_t kind;  // CAN only
  } cases[] = {
      {"CAN1", 0, 64, 0, 2},
      {"CAN1", 0, 65, kvErrPayloadMaxTooLarge, 0},
      {"CAN1", 1, 1785, 0, 3},
      {"CAN1", 1, 1786, kvErrPayloadMaxTooLarge, 0},
      {"CAN1", 0, 8, 0, 1},
      {"CAN1", 1, 8, 0, 1},
      {"CAN1", 0, 9, 0, 2},
      {"LIN1", 0, 8, 0, 0},
      {"LIN1", 0, 9, kvErrPayloadMaxTooLarge, 0},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::Message()
                 << c.interfaceName << " limit " << c.limit << " protocol " << c.protocol);
    const bool lin = std::string(c.interfaceName) == "LIN1";
    const uint32_t toFrames = MakeSession("", kvMode_SignalConversionSinglePoint, c.interfaceName);
    const uint32_t fromFrames =
        MakeSession("", kvMode_SignalConversionSinglePoint, c.interfaceName);
    for (const uint32_t session : {toFrames, fromFrames}) {
      SetU32(session, kvPropSession_ApplicationProtocol, c.protocol);
      SetU32(session, kvPropSession_PayldLenMax, c.limit);
    }
    // Towards frames: an empty list, so the limit alone decides.
    SvHandle values = Keep(ValueArray({}));
    cHostFrames out;
    const tToFrames convert =
        lin ? kvsvConvertSignalSinglePointToFrameLIN : kvsvConvertSignalSinglePointToFrameCAN;
    EXPECT_EQ(convert(toFrames, &values, &out.frames, &out.spares), c.status);
    const nKVSVAPI100::tSessionSlot &slot = *Slot(toFrames);
    if (c.status == 0) {
      EXPECT_EQ(slot.cachedSamples, static_cast<int32_t>(c.limit));
      if (!lin) {
        EXPECT_EQ(slot.frameKind, c.kind);
      }
    } else {
      EXPECT_EQ(slot.cachedCount, kUnknown);
      // A LIN limit that is too long stays: it is the session's.
      EXPECT_EQ(slot.cachedSamples, lin ? static_cast<int32_t>(c.limit) : kUnknown);
    }
    // Away from frames, with one frame to pack.
    cHostFrames in;
    in.Set({{0x10, 0, 0, {1, 2, 3}}});
    SvHandle back = Keep(ValueArray({7.0}));
    const tFromFrames extract =
        lin ? kvsvConvertFrameLINToSignalSinglePoint : kvsvConvertFrameCANToSignalSinglePoint;
    EXPECT_EQ(extract(fromFrames, &in.frames, &back), c.status);
    EXPECT_EQ(Count(back), 0);
    if (c.status != 0) {
      EXPECT_EQ(Slot(fromFrames)->cachedSamples, kUnknown);
      EXPECT_EQ(Slot(fromFrames)->frameBuffer, nullptr);
    }
  }
}

TEST_F(ConvertTest, NoFramesOrTheSkipByteIsSuccessThatTouchesNothing) {
  const tFromFrames exports[] = {
      kvsvConvertFrameRawToSignalSinglePoint,    kvsvConvertFrameCANToSignalSinglePoint,
      kvsvConvertFrameLINToSignalSinglePoint,    kvsvConvertFrameFlexRayToSignalSinglePoint,
      kvsvConvertFrameRawToByteArraySinglePoint, kvsvConvertFrameCANToByteArraySinglePoint,
      kvsvConvertFrameLINToByteArraySinglePoint, kvsvConvertFrameFlexRayToByteArraySinglePoint};
  SvHandle empty = Keep(ValueArray({}));
  SvHandle output = Keep(ValueArray({1.0, 2.0}));
  for (const tFromFrames convert : exports) {
    for (SvHandle frames : {static_cast<SvHandle>(nullptr), empty}) {
      SvHandle kept = output;
      EXPECT_EQ(convert(0xFFFF, &frames, &kept), 0);
      EXPECT_EQ(kept, output);
    }
  }
  EXPECT_EQ(ValuesIn(output), (std::vector<double>{1.0, 2.0}));
  using tEx = kvsvStatus (*)(uint32_t, SvHandle *, SvHandle *, SvHandle *, const uint8_t *);
  const tEx exForms[] = {kvsvConvertSignalSinglePointToFrameCANEx,
                         kvsvConvertSignalSinglePointToFrameLINEx,
                         kvsvConvertSignalSinglePointToFrameFlexRayEx,
                         kvsvConvertByteArraySinglePointToFrameCANEx,
                         kvsvConvertByteArraySinglePointToFrameLINEx,
                         kvsvConvertByteArraySinglePointToFrameFlexRayEx};
  SvHandle in = Keep(ValueArray(kTeslaValues));
  const uint8_t skip = 1, run = 0;
  for (const tEx convert : exForms) {
    cHostFrames out;
    EXPECT_EQ(convert(0xFFFF, &in, &out.frames, &out.spares, &skip), 0);
    EXPECT_EQ(out.frames, nullptr);
    EXPECT_EQ(convert(0xFFFF, &in, &out.frames, &out.spares, &run), kvErrInvalidSession);
  }
}

TEST_F(ConvertTest, TheFormTagAndTheSizesSeenDecideWhetherTheCacheHolds) {
  const uint32_t session = Conversion(TeslaPath(), kTeslaList);
  SvHandle values = Keep(ValueArray(kTeslaValues));
  SvHandle image = Keep(ByteArray(tBytes(6, 0x33)));
  SvHandle raw = Keep(svNewHandleClr(8)), back = Keep(ValueArray({}));
  cHostFrames out, more;
  const auto signalsToCan = [&] {
    return kvsvConvertSignalSinglePointToFrameCAN(session, &values, &out.frames, &out.spares);
  };
  const auto imageToCan = [&] {
    return kvsvConvertByteArraySinglePointToFrameCAN(session, &image, &out.frames, &out.spares);
  };
  const auto signalsToRaw = [&] {
    return kvsvConvertSignalSinglePointToFrameRaw(session, &values, &raw);
  };
  const auto canToSignals = [&] {
    return kvsvConvertFrameCANToSignalSinglePoint(session, &out.frames, &back);
  };
  const auto moreCanToSignals = [&] {
    return kvsvConvertFrameCANToSignalSinglePoint(session, &more.frames, &back);
  };
  more.Set({{1, 0, 0, {1}}, {2, 0, 0, {2}}, {3, 0, 0, {3}}, {4, 0, 0, {4}}});
  struct {
    const char *step;
    std::function<kvsvStatus()> call;
    bool rebuilds;
  } steps[] = {
      {"first call", signalsToCan, true},
      {"same form", signalsToCan, false},
      {"byte image, same tag", imageToCan, false},
      {"raw form", signalsToRaw, true},
      {"raw again", signalsToRaw, false},
      {"back to clusters", signalsToCan, true},
      {"raw form once more", signalsToRaw, true},
      {"other direction", canToSignals, true},
      {"same frames", canToSignals, false},
      {"more frames than the buffer was made for", moreCanToSignals, true},
      {"as many again", moreCanToSignals, false},
      {"fewer frames", canToSignals, false},
  };
  for (const auto &step : steps) {
    SCOPED_TRACE(step.step);
    kvsimLogClear();
    svsimResetCounters();
    EXPECT_EQ(step.call(), 0);
    const int32_t reads = kvsimCountCalls("kvGetProperty") + kvsimCountCalls("kvGetSubProperty");
    EXPECT_EQ(reads != 0, step.rebuilds);
    // A cache that holds neither allocates nor resizes a handle, nor does a rebuild whose raw
    // array is already large enough.
    if (!step.rebuilds || std::string(step.step) == "raw form once more") {
      EXPECT_EQ(svsimAllocCount() + svsimResizeCount() + svsimFreeCount(), 0u);
    }
  }
}

TEST_F(ConvertTest, AHostThatShrinksOrDropsItsArraysGetsThemBuiltAgain) {
  cHostFrames out;
  const uint32_t session = SteadyTesla(out);
  const std::vector<tFrameFields> expected = out.All();
  SvHandle in = Keep(ValueArray(kTeslaValues));
  const struct {
    const char *what;
    // Payload handles from `first` on are cut to `size` bytes, if not 0, and their counts to
    // what is left, as a host cuts an array.
    size_t first, size;
    int reads;  // of the frame count, 1 when the arrays are built again
  } cases[] = {{"the last payload handle too small for its 8 bytes, the first as large as ever",
                2, 5, 0},
               {"payload handles too small for the limit", 0, 9, 1},
               {"no arrays", 0, 0, 1}};
  for (const auto &c : cases) {
    SCOPED_TRACE(c.what);
    const std::vector<SvHandle> payloads = out.Payloads();
    for (size_t i = c.first; i < payloads.size() && c.size != 0; ++i) {
      ASSERT_EQ(svSetHandleSizeClr(payloads[i], c.size), 0);
      *static_cast<int32_t *>(*payloads[i]) = static_cast<int32_t>(c.size) - 4;
    }
    if (c.size == 0) out.Dispose();
    kvsimLogClear();
    ASSERT_EQ(kvsvConvertSignalSinglePointToFrameCAN(session, &in, &out.frames, &out.spares), 0);
    EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumFrames), c.reads);
    EXPECT_EQ(out.All(), expected);
    for (SvHandle payload : out.Payloads()) EXPECT_EQ(svGetHandleSize(payload), 15u);
  }
}

TEST_F(ConvertTest, SparesThatRunOutAreReportedAndTheFramesSoFarStay) {
  // The session first counts its three frames, then only one: the buffer keeps its size, and the
  // driver's three frames find one payload handle.
  struct {
    const char *interfaceName;
    uint32_t protocol;  // 0, or 1 for J1939
    uint32_t limit;     // 0 for the session's own
    uint32_t stride;
    tToFrames convert;
    uint32_t line;
    int32_t count;  // fixed records count every record the driver gave
  } cases[] = {
      {"CAN1", 0, 0, 32, kvsvConvertSignalSinglePointToFrameCAN, 1115, 3},
      {"CAN1", 0, 64, 32, kvsvConvertSignalSinglePointToFrameCAN, 1275, 1},
      {"CAN1", 1, 0, 32, kvsvConvertSignalSinglePointToFrameCAN, 1440, 1},
      {"LIN1", 0, 0, 32, kvsvConvertSignalSinglePointToFrameLIN, 2142, 3},
      {"FlexRay1", 0, 0, 40, kvsvConvertSignalSinglePointToFrameFlexRay, 2512, 1},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.line);
    cFakeErrorLog log;
    const uint32_t session = Conversion(TeslaPath(), kTeslaList, c.interfaceName);
    SetU32(session, kvPropSession_ApplicationProtocol, c.protocol);
    if (c.limit != 0) SetU32(session, kvPropSession_PayldLenMax, c.limit);
    SvHandle in = Keep(ValueArray(kTeslaValues));
    SvHandle none = nullptr;
    cHostFrames out(c.stride);
    ASSERT_EQ(c.convert(session, &in, &out.frames, &out.spares), 0);
    // No input empties the frames into a spares handle with room for one: the rest go.
    const std::vector<SvHandle> handles = out.Payloads();
    ASSERT_EQ(svSetHandleSizeClr(out.spares, 16), 0);
    svsimResetCounters();
    EXPECT_EQ(c.convert(session, &none, &out.frames, &out.spares), kvErrElementCountMismatch);
    EXPECT_EQ(Count(out.frames), 0);
    EXPECT_EQ(out.Spares(), std::vector<SvHandle>{handles[0]});
    EXPECT_EQ(svsimFreeCount(), 2u);
    EXPECT_EQ(Slot(session)->cachedCount, kUnknown);
    SetU32(session, kvPropSession_NumFrames, 1);
    EXPECT_EQ(c.convert(session, &in, &out.frames, &out.spares), kvErrInternal);
    ASSERT_EQ(log.Records().size(), 1u);
    EXPECT_EQ(log.Records()[0].value.Line(), c.line);
    EXPECT_EQ(Count(out.frames), c.count);
    EXPECT_EQ(out.PayloadOf(0).size(), 4u);
  }
}

TEST_F(ConvertTest, AFrameOverTheLimitKeepsEveryFrameFromTheDriver) {
  const uint32_t classic = MakeSession("", kvMode_SignalConversionSinglePoint, "CAN1");
  cHostFrames frames;
  frames.Set({{1, 0, 0, tBytes(8, 1)}, {2, 0, 0, tBytes(9, 2)}, {3, 0, 0, {3}}});
  SvHandle values = Keep(ValueArray({5.0}));
  EXPECT_EQ(kvsvConvertFrameCANToSignalSinglePoint(classic, &frames.frames, &values),
            kvErrPayloadTruncated);
  EXPECT_EQ(kvsimCountCalls("kvConvertFramesToSignalsSinglePoint"), 0);
  EXPECT_EQ(Count(values), 0);
  EXPECT_EQ(Slot(classic)->cachedCount, kUnknown);
}

}  // namespace
