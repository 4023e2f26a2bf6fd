// kvsvConvertSignalSinglePointToFrame{Raw,CAN,LIN,FlexRay} and the Ex forms: one value per signal
// packed by the driver into the frames that carry them.
#include "convert/conversion_protocols.h"
#include "convert/conversion_sides.h"
#include "convert/convert_to_frames.h"
#include "frame/ex_skip.h"
#include "kvsvapi.h"

using namespace nKVSVAPI100;

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertSignalSinglePointToFrameRaw(uint32_t session,
                                                                         SvHandle *values,
                                                                         SvHandle *rawFrames) {
  return ConvertRawToFrames<tSignalValues>(session, values, rawFrames);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertSignalSinglePointToFrameCAN(uint32_t session,
                                                                         SvHandle *values,
                                                                         SvHandle *frames,
                                                                         SvHandle *spareHandles) {
  return ConvertToFrames<tCanConversion, tSignalValues>(session, values, frames, spareHandles);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertSignalSinglePointToFrameLIN(uint32_t session,
                                                                         SvHandle *values,
                                                                         SvHandle *frames,
                                                                         SvHandle *spareHandles) {
  return ConvertToFrames<tLinConversion, tSignalValues>(session, values, frames, spareHandles);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertSignalSinglePointToFrameFlexRay(
    uint32_t session, SvHandle *values, SvHandle *frames, SvHandle *spareHandles) {
  return ConvertToFrames<tFlexRayConversion, tSignalValues>(session, values, frames, spareHandles);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertSignalSinglePointToFrameCANEx(uint32_t session,
                                                                           SvHandle *values,
                                                                           SvHandle *frames,
                                                                           SvHandle *spareHandles,
                                                                           const uint8_t *skip) {
  if (SkipRequested(skip)) return 0;
  return kvsvConvertSignalSinglePointToFrameCAN(session, values, frames, spareHandles);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertSignalSinglePointToFrameLINEx(uint32_t session,
                                                                           SvHandle *values,
                                                                           SvHandle *frames,
                                                                           SvHandle *spareHandles,
                                                                           const uint8_t *skip) {
  if (SkipRequested(skip)) return 0;
  return kvsvConvertSignalSinglePointToFrameLIN(session, values, frames, spareHandles);
}

extern "C" KVSV_EXPORT kvsvStatus
kvsvConvertSignalSinglePointToFrameFlexRayEx(uint32_t session, SvHandle *values, SvHandle *frames,
                                             SvHandle *spareHandles, const uint8_t *skip) {
  if (SkipRequested(skip)) return 0;
  return kvsvConvertSignalSinglePointToFrameFlexRay(session, values, frames, spareHandles);
}
