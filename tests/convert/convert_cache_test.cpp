// The conversion exports' cache and their host arrays: payload limits at their edges, the empty
// input, the recycling of payload handles through the spares and what happens when they run out
// or find no room, a host that changes its arrays between calls, and steady loops that neither
// allocate nor read a property.
#include <functional>

#include "convert/convert_test_support.h"
#include "session/session_slot.h"
#include "support/fake_error_log.h"

namespace {

using namespace kvsvtest;
using nKVSVAPI100::kUnknown;

// Three frames of 4, 8 and 8 bytes.
const char kTeslaList[] = "DAS_steeringAngleRequest,EPAS_sysStatus.EPAS_internalSAS,DI_torqueMotor";
const std::vector<double> kTeslaValues = {-403.8, 123.4, -312.25};

using tToFrames = kvsvStatus (*)(uint32_t, SvHandle *, SvHandle *, SvHandle *);
using tFromFrames = kvsvStatus (*)(uint32_t, SvHandle *, SvHandle *);

class ConvertCache : public ConvertTest {
 protected:
  // A Tesla session whose arrays have been through one conversion towards frames.
  uint32_t SteadyTesla(cHostFrames &out) {
    const uint32_t session = Conversion(TeslaDbc(), kTeslaList);
    SvHandle in = Keep(ValueArray(kTeslaValues));
    EXPECT_EQ(kvsvConvertSignalSinglePointToFrameCAN(session, &in, &out.frames, &out.spares), 0);
    EXPECT_EQ(Count(out.frames), 3);
    return session;
  }
  static void SetLimits(uint32_t session, uint32_t protocol, uint32_t limit) {
    SetU32(session, kvPropSession_ApplicationProtocol, protocol);
    SetU32(session, kvPropSession_PayldLenMax, limit);
  }
};

TEST_F(ConvertCache, PayloadLimitsHoldAtTheirExactEdges) {
  struct {
    const char *interfaceName;
    uint32_t protocol;
    uint32_t limit;
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
    SCOPED_TRACE(std::string(c.interfaceName) + " limit " + std::to_string(c.limit) + " protocol " +
                 std::to_string(c.protocol));
    const bool lin = std::string(c.interfaceName) == "LIN1";
    // Towards frames: an empty list, so the limit alone decides.
    const uint32_t toFrames = MakeSession("", kvMode_SignalConversionSinglePoint, c.interfaceName);
    SetLimits(toFrames, c.protocol, c.limit);
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
    const uint32_t fromFrames =
        MakeSession("", kvMode_SignalConversionSinglePoint, c.interfaceName);
    SetLimits(fromFrames, c.protocol, c.limit);
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

TEST_F(ConvertCache, NoFramesIsSuccessOnAnySessionAndTouchesNothing) {
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
      EXPECT_EQ(ValuesIn(output), (std::vector<double>{1.0, 2.0}));
    }
  }
  // Against a real session, with the same arrays: the driver is not called either.
  const uint32_t session = Conversion(TeslaDbc(), kTeslaList);
  SvHandle frames = empty;
  EXPECT_EQ(kvsvConvertFrameCANToSignalSinglePoint(session, &frames, &output), 0);
  EXPECT_EQ(kvsimCountCalls("kvConvertFramesToSignalsSinglePoint"), 0);
}

TEST_F(ConvertCache, ConversionsOfOneSessionAgreeAcrossFamiliesAndForms) {
  const uint32_t session = Conversion(TeslaDbc(), kTeslaList);
  SvHandle values = Keep(ValueArray(kTeslaValues));
  cHostFrames clusters;
  ASSERT_EQ(
      kvsvConvertSignalSinglePointToFrameCAN(session, &values, &clusters.frames, &clusters.spares),
      0);
  // The raw form gives the records themselves: three classic records.
  SvHandle raw = nullptr;
  ASSERT_EQ(kvsvConvertSignalSinglePointToFrameRaw(session, &values, &raw), 0);
  Keep(raw);
  const tBytes records = PayloadBytes(raw);
  ASSERT_EQ(records.size(), 3u * 24);
  for (int32_t i = 0; i < 3; ++i) {
    const tFrameFields fields = clusters.Fields(i);
    uint32_t identifier;
    std::memcpy(&identifier, records.data() + i * 24 + 8, 4);
    EXPECT_EQ(identifier, fields.identifier);
    EXPECT_EQ(
        tBytes(records.begin() + i * 24 + 16, records.begin() + i * 24 + 16 + records[i * 24 + 15]),
        fields.payload);
  }
  SvHandle fromRaw = nullptr;
  ASSERT_EQ(kvsvConvertFrameRawToSignalSinglePoint(session, &raw, &fromRaw), 0);
  Keep(fromRaw);
  const std::vector<double> got = ValuesIn(fromRaw);
  ASSERT_EQ(got.size(), 3u);
  for (size_t i = 0; i < 3; ++i) EXPECT_NEAR(got[i], kTeslaValues[i], 0.13);

  // An image size the session gives in bits that are not whole bytes: the rest is dropped, and
  // the driver is asked for the whole bytes only.
  const uint32_t twelveBits = 12;
  ASSERT_EQ(kvSetSubProperty(session, 0, kvPropHidden_ByteArrayBits, 4, &twelveBits), 0);
  SvHandle image = nullptr;
  kvsimLogClear();
  kvsvConvertFrameCANToByteArraySinglePoint(session, &clusters.frames, &image);
  Keep(image);
  EXPECT_EQ(Slot(session)->requiredHandleSize, 8u);
  EXPECT_EQ(LastCallOf("kvConvertFramesToByteArraySinglePoint").size2, 1u);
}

TEST_F(ConvertCache, TheFormTagAndTheSizesSeenDecideWhetherTheCacheHolds) {
  const uint32_t session = Conversion(TeslaDbc(), kTeslaList);
  SvHandle values = Keep(ValueArray(kTeslaValues));
  SvHandle image = Keep(ByteArray(tBytes(6, 0x33)));
  SvHandle raw = nullptr;
  SvHandle back = nullptr;
  cHostFrames out;
  cHostFrames more;
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
    more.Set({{1, 0, 0, {1}}, {2, 0, 0, {2}}, {3, 0, 0, {3}}, {4, 0, 0, {4}}});
    return kvsvConvertFrameCANToSignalSinglePoint(session, &more.frames, &back);
  };
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
      {"other direction", canToSignals, true},
      {"same frames", canToSignals, false},
      {"more frames than the buffer was made for", moreCanToSignals, true},
      {"as many again", moreCanToSignals, false},
      {"fewer frames", canToSignals, false},
  };
  for (const auto &step : steps) {
    kvsimLogClear();
    EXPECT_EQ(step.call(), 0) << step.step;
    const int32_t reads = kvsimCountCalls("kvGetProperty") + kvsimCountCalls("kvGetSubProperty");
    EXPECT_EQ(reads != 0, step.rebuilds) << step.step;
  }
  Keep(raw);
  Keep(back);
}

TEST_F(ConvertCache, NullInputEmptiesTheFramesIntoTheSparesAndTheyComeBackLastInFirstOut) {
  for (const tToFrames convert :
       {kvsvConvertSignalSinglePointToFrameCAN, kvsvConvertByteArraySinglePointToFrameCAN}) {
    const uint32_t session = Conversion(TeslaDbc(), kTeslaList);
    SvHandle in =
        Keep(convert == kvsvConvertSignalSinglePointToFrameCAN ? ValueArray(kTeslaValues)
                                                               : ByteArray(tBytes(6, 0x5A)));
    cHostFrames out;
    ASSERT_EQ(convert(session, &in, &out.frames, &out.spares), 0);
    const std::vector<SvHandle> handles = out.Payloads();
    SvHandle none = nullptr;
    EXPECT_EQ(convert(session, &none, &out.frames, &out.spares), kvErrElementCountMismatch);
    EXPECT_EQ(Count(out.frames), 0);
    EXPECT_EQ(out.Spares(), handles);
    EXPECT_EQ(Slot(session)->cachedCount, kUnknown);
    svsimResetCounters();
    ASSERT_EQ(convert(session, &in, &out.frames, &out.spares), 0);
    EXPECT_EQ(out.Payloads(), std::vector<SvHandle>(handles.rbegin(), handles.rend()));
    EXPECT_EQ(Count(out.spares), 0);
    EXPECT_EQ(svsimAllocCount() + svsimResizeCount() + svsimFreeCount(), 0u);
  }
}

TEST_F(ConvertCache, SteadyLoopsAllocateNothingAndReadNoProperty) {
  // One session for each direction: the cache holds the form of one direction at a time.
  cHostFrames out;
  const uint32_t toFrames = SteadyTesla(out);
  const uint32_t fromFrames = Conversion(TeslaDbc(), kTeslaList);
  SvHandle in = Keep(ValueArray(kTeslaValues));
  SvHandle values = nullptr;
  ASSERT_EQ(kvsvConvertFrameCANToSignalSinglePoint(fromFrames, &out.frames, &values), 0);
  Keep(values);
  svsimResetCounters();
  kvsimLogClear();
  for (int i = 0; i < 50; ++i) {
    ASSERT_EQ(kvsvConvertSignalSinglePointToFrameCAN(toFrames, &in, &out.frames, &out.spares), 0);
    ASSERT_EQ(kvsvConvertFrameCANToSignalSinglePoint(fromFrames, &out.frames, &values), 0);
  }
  EXPECT_EQ(svsimAllocCount() + svsimResizeCount() + svsimFreeCount(), 0u);
  EXPECT_EQ(kvsimCountCalls("kvGetProperty") + kvsimCountCalls("kvGetSubProperty"), 0);
  EXPECT_EQ(kvsimCountCalls("kvConvertSignalsToFramesSinglePoint"), 50);
  EXPECT_EQ(kvsimCountCalls("kvConvertFramesToSignalsSinglePoint"), 50);
  EXPECT_EQ(Count(values), 3);
}

TEST_F(ConvertCache, AHostThatShrinksOrEmptiesItsArraysGetsThemBuiltAgain) {
  enum eChange { kSmallerPayloads, kFewerFrames, kSmallerHandle, kNoArrays };
  for (const eChange change : {kSmallerPayloads, kFewerFrames, kSmallerHandle, kNoArrays}) {
    SCOPED_TRACE(change);
    cHostFrames out;
    const uint32_t session = SteadyTesla(out);
    SvHandle in = Keep(ValueArray(kTeslaValues));
    if (change == kSmallerPayloads) {
      // Payload handles too small for the limit are made large enough again, in place.
      for (SvHandle payload : out.Payloads()) ASSERT_EQ(svSetHandleSizeClr(payload, 9), 0);
      kvsimLogClear();
      ASSERT_EQ(kvsvConvertSignalSinglePointToFrameCAN(session, &in, &out.frames, &out.spares), 0);
      EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumFrames), 1);
      for (SvHandle payload : out.Payloads()) EXPECT_GE(svGetHandleSize(payload), 15u);
      continue;
    }
    // The host keeps one frame and its handle, and no spares.
    const std::vector<SvHandle> handles = out.Payloads();
    svDisposeHandle(handles[1]);
    svDisposeHandle(handles[2]);
    std::memset(static_cast<uint8_t *>(*out.frames) + 8 + 32, 0, 64);
    const int32_t one = 1;
    std::memcpy(*out.frames, &one, 4);
    if (change == kSmallerHandle) {
      ASSERT_EQ(svSetHandleSizeClr(out.frames, 8 + 32), 0);
    }
    if (change == kNoArrays) {
      out.Dispose();
    } else {
      svDisposeHandle(out.spares);
      out.spares = nullptr;
    }
    kvsimLogClear();
    ASSERT_EQ(kvsvConvertSignalSinglePointToFrameCAN(session, &in, &out.frames, &out.spares), 0);
    EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumFrames), 1);
    ASSERT_EQ(Count(out.frames), 3);
    for (SvHandle payload : out.Payloads()) EXPECT_NE(payload, nullptr);
    EXPECT_GE(svGetHandleSize(out.frames), 8u + 3 * 32);
    if (change != kNoArrays) {
      EXPECT_EQ(out.Payload(0), handles[0]);
    }
  }
}

TEST_F(ConvertCache, ASparesHandleWithNoRoomDisposesTheSurplus) {
  cHostFrames out;
  const uint32_t session = SteadyTesla(out);
  const std::vector<SvHandle> handles = out.Payloads();
  // Room for one handle only.
  ASSERT_EQ(svSetHandleSizeClr(out.spares, 16), 0);
  svsimResetCounters();
  SvHandle none = nullptr;
  EXPECT_EQ(kvsvConvertSignalSinglePointToFrameCAN(session, &none, &out.frames, &out.spares),
            kvErrElementCountMismatch);
  EXPECT_EQ(out.Spares(), std::vector<SvHandle>{handles[0]});
  EXPECT_EQ(svsimFreeCount(), 2u);
  EXPECT_EQ(Count(out.frames), 0);
}

TEST_F(ConvertCache, SparesThatRunOutAreReportedAndTheFramesSoFarStay) {
  // The session first counts its three frames, then only one: the buffer keeps its size, the host
  // lets the spares go, and the driver's three frames find one payload handle.
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
    const uint32_t session = Conversion(TeslaDbc(), kTeslaList, c.interfaceName);
    SetU32(session, kvPropSession_ApplicationProtocol, c.protocol);
    if (c.limit != 0) SetU32(session, kvPropSession_PayldLenMax, c.limit);
    SvHandle in = Keep(ValueArray(kTeslaValues));
    SvHandle none = nullptr;
    cHostFrames out(c.stride);
    ASSERT_EQ(c.convert(session, &in, &out.frames, &out.spares), 0);
    EXPECT_EQ(c.convert(session, &none, &out.frames, &out.spares), kvErrElementCountMismatch);
    for (SvHandle spare : out.Spares()) svDisposeHandle(spare);
    std::memset(*out.spares, 0, 4);
    SetU32(session, kvPropSession_NumFrames, 1);
    EXPECT_EQ(c.convert(session, &in, &out.frames, &out.spares), kvErrInternal);
    ASSERT_EQ(log.Records().size(), 1u);
    EXPECT_EQ(log.Records()[0].value.Line(), c.line);
    EXPECT_EQ(Count(out.frames), c.count);
    EXPECT_EQ(out.Fields(0).payload.size(), 4u);
  }
}

TEST_F(ConvertCache, AFrameLongerThanTheLimitIsCutTowardsFramesAndRefusedAwayFromThem) {
  // Towards frames: a 16-byte frame on a session whose limit is 12 comes out cut to 12 bytes.
  const std::vector<tDbSignal> signals = DatabaseSignals(HyundaiFdDbc());
  const tDbSignal *eight = nullptr;
  const tDbSignal *sixteen = nullptr;
  for (const tDbSignal &signal : signals) {
    if (signal.multiplexed) continue;
    if (signal.frameLength == 8 && eight == nullptr) eight = &signal;
    if (signal.frameLength == 16 && sixteen == nullptr) sixteen = &signal;
  }
  ASSERT_TRUE(eight != nullptr && sixteen != nullptr);
  const uint32_t session = Conversion(HyundaiFdDbc(), eight->item + "," + sixteen->item);
  SetU32(session, kvPropSession_PayldLenMax, 12);
  SvHandle in = Keep(ValueArray({0.0, 0.0}));
  cHostFrames out;
  EXPECT_EQ(kvsvConvertSignalSinglePointToFrameCAN(session, &in, &out.frames, &out.spares),
            kvErrPayloadTruncated);
  ASSERT_EQ(Count(out.frames), 2);
  EXPECT_EQ(out.Fields(0).payload.size() + out.Fields(1).payload.size(), 8u + 12u);
  EXPECT_EQ(Slot(session)->cachedCount, kUnknown);

  // Away from frames: one frame over the limit keeps every frame from the driver.
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

TEST_F(ConvertCache, ALongJ1939MessageIsPackedInTheLongFormAndStepsByItsFullLength) {
  const uint32_t session = MakeSession("", kvMode_SignalConversionSinglePoint, "CAN1");
  SetU32(session, kvPropSession_ApplicationProtocol, 1);
  cHostFrames frames;
  frames.Set({{0x18FEF100, 0x00, 1, Pattern(256, 9)}, {0x100, 0x00, 0, {}}}, {false, true});
  SvHandle values = nullptr;
  kvsimLogClear();
  ASSERT_EQ(kvsvConvertFrameCANToSignalSinglePoint(session, &frames.frames, &values), 0);
  Keep(values);
  EXPECT_EQ(LastCallOf("kvConvertFramesToSignalsSinglePoint").size1, 272u + 24u);
  const uint8_t *records = static_cast<const uint8_t *>(Slot(session)->frameBuffer);
  EXPECT_EQ(tBytes(records + 12, records + 16), (tBytes{0xC0, 0, 1, 0}));
  uint32_t identifier;
  std::memcpy(&identifier, records + 8, 4);
  EXPECT_EQ(identifier, 0x18FEF100u | 0x20000000u);
  EXPECT_EQ(tBytes(records + 16, records + 16 + 256), Pattern(256, 9));
  std::memcpy(&identifier, records + 272 + 8, 4);
  EXPECT_EQ(identifier, 0x100u);
  EXPECT_EQ(records[272 + 15], 0);
}

TEST_F(ConvertCache, ExFormsWithTheSkipByteSetTouchNothing) {
  using tEx = kvsvStatus (*)(uint32_t, SvHandle *, SvHandle *, SvHandle *, const uint8_t *);
  const tEx exports[] = {kvsvConvertSignalSinglePointToFrameCANEx,
                         kvsvConvertSignalSinglePointToFrameLINEx,
                         kvsvConvertSignalSinglePointToFrameFlexRayEx,
                         kvsvConvertByteArraySinglePointToFrameCANEx,
                         kvsvConvertByteArraySinglePointToFrameLINEx,
                         kvsvConvertByteArraySinglePointToFrameFlexRayEx};
  const uint32_t session = Conversion(TeslaDbc(), kTeslaList);
  SvHandle in = Keep(ValueArray(kTeslaValues));
  const uint8_t skip = 1, run = 0;
  for (const tEx convert : exports) {
    cHostFrames out;
    EXPECT_EQ(convert(session, &in, &out.frames, &out.spares, &skip), 0);
    EXPECT_EQ(out.frames, nullptr);
    EXPECT_EQ(convert(0xFFFF, &in, &out.frames, &out.spares, &run), kvErrInvalidSession);
  }
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_NumFrames), 0);
}

TEST_F(ConvertCache, TheDriverRefusesWhatItCannotConvert) {
  const uint32_t tesla = Conversion(TeslaDbc(), kTeslaList);
  uint32_t output = 0, unresolved = 0;
  ASSERT_EQ(kvCreateSession(TeslaDbc().c_str(), "", kTeslaList, "CAN1", kvMode_SignalOutSinglePoint,
                            &output),
            0);
  ASSERT_EQ(kvCreateSession(":memory:", "", "DI_torqueMotor", "CAN1",
                            kvMode_SignalConversionSinglePoint, &unresolved),
            0);
  double values[3] = {};
  uint8_t records[128] = {};
  uint8_t image[6] = {};
  uint32_t bytes = 0;
  struct {
    const char *what;
    std::function<int32_t()> call;
    int32_t status;
  } cases[] = {
      {"not a conversion session",
       [&] {
         return kvConvertSignalsToFramesSinglePoint(output, values, 24, records, 128, &bytes);
       },
       kvsimErrWrongMode},
      {"signals with no database",
       [&] {
         return kvConvertFramesToSignalsSinglePoint(unresolved, records, 0, values, 24, nullptr, 0);
       },
       kvsimErrObjectNotFound},
      {"a value short",
       [&] { return kvConvertSignalsToFramesSinglePoint(tesla, values, 16, records, 128, &bytes); },
       kvsimErrBufferTooSmall},
      {"room for two frames of three",
       [&] { return kvConvertSignalsToFramesSinglePoint(tesla, values, 24, records, 48, &bytes); },
       kvsimErrBufferTooSmall},
      {"an image a byte short",
       [&] { return kvConvertByteArrayToFramesSinglePoint(tesla, image, 5, records, 128, &bytes); },
       kvsimErrBufferTooSmall},
      {"no room for the image",
       [&] { return kvConvertFramesToByteArraySinglePoint(tesla, records, 24, image, 5); },
       kvsimErrBufferTooSmall},
      {"a part of a record",
       [&] {
         return kvConvertFramesToSignalsSinglePoint(tesla, records, 25, values, 24, nullptr, 0);
       },
       kvsimErrInvalidFrame},
  };
  for (const auto &c : cases) EXPECT_EQ(c.call(), c.status) << c.what;
  // What fits is converted: three classic records, and from them the image.
  ASSERT_EQ(kvConvertSignalsToFramesSinglePoint(tesla, values, 24, records, 72, &bytes), 0);
  EXPECT_EQ(bytes, 72u);
  EXPECT_EQ(kvConvertFramesToByteArraySinglePoint(tesla, records, bytes, image, 6), 0);
  kvClear(output);
  kvClear(unresolved);
}

}  // namespace
