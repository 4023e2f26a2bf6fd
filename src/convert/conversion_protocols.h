// What CAN, LIN and FlexRay conversion sessions do differently, in both directions; the steps
// they share are in convert_to_frames.h and convert_from_frames.h. Towards frames a protocol
// supplies:
//
//   kShape, kToFramesTag     its cluster's shape and its cache's form tag
//   kTestsPayloadHandles     whether the cache also holds the payload limit and the size of the
//                            payload handles
//   Prepare(slot, session, status)
//                            what is learnt before the cache is looked at; false ends the call at
//                            once with `status`
//   SizeToFrames(slot, arrays, session, sample)
//                            the frame count, both arrays, the payload handles and the buffer,
//                            built anew; `sample` is the size of one payload handle, or 0
//   Decodes(slot), Walk(slot, arrays, bytes, status)
//                            the unpacking of the driver's records (see record_unpack.h)
//
// and away from frames:
//
//   kFromFramesTag           its cache's form tag
//   LearnFromFrames(slot, session)
//                            what is learnt on every call while the payload limit is not known
//   ReadLimitInRebuild(slot, session)
//                            the payload limit, read when the cache is built anew
//   Encoding(slot)           how a cluster becomes a record
#ifndef KVSVAPI_CONVERT_CONVERSION_PROTOCOLS_H
#define KVSVAPI_CONVERT_CONVERSION_PROTOCOLS_H

#include <cstdint>

#include "core/status.h"
#include "frame/frame_encode.h"
#include "frame/frame_read_arrays.h"
#include "frame/frame_record.h"
#include "frame/record_unpack.h"
#include "session/session_slot.h"

namespace nKVSVAPI100 {

// Lines that reports of payload handles run out have always named for conversions.
constexpr tCanReportLines kCanConversionLines{1115, 1275, 1440};
constexpr uint32_t kLinConversionLine = 2142;
constexpr uint32_t kFlexRayConversionLine = 2512;

struct tCanConversion {
  static constexpr tClusterShape kShape = kShapeOf<tFrameClusterCAN>;
  static constexpr uint32_t kToFramesTag = kTagCanToFrames;
  static constexpr uint32_t kFromFramesTag = kTagCanFromFrames;
  static constexpr bool kTestsPayloadHandles = true;

  static bool Prepare(tSessionSlot &, uint32_t, Status &) { return true; }
  static Status SizeToFrames(tSessionSlot &slot, cFrameArrays &arrays, uint32_t session,
                             uint64_t sample);
  static bool Decodes(const tSessionSlot &slot) { return UnpacksCanKind(slot); }
  static int32_t Walk(const tSessionSlot &slot, const cFrameArrays &arrays, uint32_t bytes,
                      Status &status) {
    return UnpackCanRecords(slot, arrays, bytes, status, kCanConversionLines);
  }

  static Status LearnFromFrames(tSessionSlot &slot, uint32_t session);
  static Status ReadLimitInRebuild(tSessionSlot &, uint32_t) { return 0; }
  static eRecordEncoding Encoding(const tSessionSlot &slot) {
    return static_cast<eRecordEncoding>(slot.frameKind);
  }
};

struct tLinConversion {
  static constexpr tClusterShape kShape = kShapeOf<tFrameClusterLIN>;
  static constexpr uint32_t kToFramesTag = kTagLinToFrames;
  static constexpr uint32_t kFromFramesTag = kTagLinFromFrames;
  // LIN payload handles are made for the session's limit and never resized.
  static constexpr bool kTestsPayloadHandles = false;

  static bool Prepare(tSessionSlot &, uint32_t, Status &) { return true; }
  static Status SizeToFrames(tSessionSlot &slot, cFrameArrays &arrays, uint32_t session,
                             uint64_t sample);
  static bool Decodes(const tSessionSlot &) { return true; }
  static int32_t Walk(const tSessionSlot &slot, const cFrameArrays &arrays, uint32_t bytes,
                      Status &status) {
    return UnpackLinRecords(slot, arrays, bytes, status, kLinConversionLine);
  }

  static Status LearnFromFrames(tSessionSlot &, uint32_t) { return 0; }
  static Status ReadLimitInRebuild(tSessionSlot &slot, uint32_t session);
  static eRecordEncoding Encoding(const tSessionSlot &) { return kEncodeLin; }
};

struct tFlexRayConversion {
  static constexpr tClusterShape kShape = kShapeOf<tFrameClusterFlexRay>;
  static constexpr uint32_t kToFramesTag = kTagFlexRayToFrames;
  static constexpr uint32_t kFromFramesTag = kTagFlexRayFromFrames;
  static constexpr bool kTestsPayloadHandles = true;

  // The payload limit is learnt before anything else; a session whose limit cannot be read
  // converts nothing, and its frame count stays as it was.
  static bool Prepare(tSessionSlot &slot, uint32_t session, Status &status);
  static Status SizeToFrames(tSessionSlot &slot, cFrameArrays &arrays, uint32_t session,
                             uint64_t sample);
  static bool Decodes(const tSessionSlot &) { return true; }
  static int32_t Walk(const tSessionSlot &slot, const cFrameArrays &arrays, uint32_t bytes,
                      Status &status) {
    return UnpackFlexRayRecords(slot, arrays, bytes, status, kFlexRayConversionLine);
  }

  static Status LearnFromFrames(tSessionSlot &, uint32_t) { return 0; }
  static Status ReadLimitInRebuild(tSessionSlot &slot, uint32_t session);
  static eRecordEncoding Encoding(const tSessionSlot &) { return kEncodeFlexRay; }
};

}  // namespace nKVSVAPI100

#endif
