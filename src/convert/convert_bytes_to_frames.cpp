// kvsvConvertByteArraySinglePointToFrame{Raw,CAN,LIN,FlexRay} and the Ex forms: an image of the
// signals' bytes spread by the driver over the frames that carry them.
#include "convert/conversion_protocols.h"
#include "convert/conversion_sides.h"
#include "convert/convert_to_frames.h"
#include "frame/ex_skip.h"
#include "kvsvapi.h"

using namespace nKVSVAPI100;

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertByteArraySinglePointToFrameRaw(uint32_t session,
                                                                            SvHandle *bytes,
                                                                            SvHandle *rawFrames) {
  return ConvertRawToFrames<tByteImage>(session, bytes, rawFrames);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertByteArraySinglePointToFrameCAN(
    uint32_t session, SvHandle *bytes, SvHandle *frames, SvHandle *spareHandles) {
  return ConvertToFrames<tCanConversion, tByteImage>(session, bytes, frames, spareHandles);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertByteArraySinglePointToFrameLIN(
    uint32_t session, SvHandle *bytes, SvHandle *frames, SvHandle *spareHandles) {
  return ConvertToFrames<tLinConversion, tByteImage>(session, bytes, frames, spareHandles);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertByteArraySinglePointToFrameFlexRay(
    uint32_t session, SvHandle *bytes, SvHandle *frames, SvHandle *spareHandles) {
  return ConvertToFrames<tFlexRayConversion, tByteImage>(session, bytes, frames, spareHandles);
}

extern "C" KVSV_EXPORT kvsvStatus
kvsvConvertByteArraySinglePointToFrameCANEx(uint32_t session, SvHandle *bytes, SvHandle *frames,
                                            SvHandle *spareHandles, const uint8_t *skip) {
  if (SkipRequested(skip)) return 0;
  return kvsvConvertByteArraySinglePointToFrameCAN(session, bytes, frames, spareHandles);
}

extern "C" KVSV_EXPORT kvsvStatus
kvsvConvertByteArraySinglePointToFrameLINEx(uint32_t session, SvHandle *bytes, SvHandle *frames,
                                            SvHandle *spareHandles, const uint8_t *skip) {
  if (SkipRequested(skip)) return 0;
  return kvsvConvertByteArraySinglePointToFrameLIN(session, bytes, frames, spareHandles);
}

extern "C" KVSV_EXPORT kvsvStatus
kvsvConvertByteArraySinglePointToFrameFlexRayEx(uint32_t session, SvHandle *bytes, SvHandle *frames,
                                                SvHandle *spareHandles, const uint8_t *skip) {
  if (SkipRequested(skip)) return 0;
  return kvsvConvertByteArraySinglePointToFrameFlexRay(session, bytes, frames, spareHandles);
}
