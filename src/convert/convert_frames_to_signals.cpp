// kvsvConvertFrame{Raw,CAN,LIN,FlexRay}ToSignalSinglePoint: frames packed into records and
// handed to the driver, which extracts one value per signal into the host's double array.
#include "convert/conversion_protocols.h"
#include "convert/conversion_sides.h"
#include "convert/convert_from_frames.h"
#include "kvsvapi.h"

using namespace nKVSVAPI100;

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertFrameRawToSignalSinglePoint(uint32_t session,
                                                                         SvHandle *rawFrames,
                                                                         SvHandle *values) {
  return ConvertRawFromFrames<tSignalValues>(session, rawFrames, values);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertFrameCANToSignalSinglePoint(uint32_t session,
                                                                         SvHandle *frames,
                                                                         SvHandle *values) {
  return ConvertFromFrames<tCanConversion, tSignalValues>(session, frames, values);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertFrameLINToSignalSinglePoint(uint32_t session,
                                                                         SvHandle *frames,
                                                                         SvHandle *values) {
  return ConvertFromFrames<tLinConversion, tSignalValues>(session, frames, values);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertFrameFlexRayToSignalSinglePoint(uint32_t session,
                                                                             SvHandle *frames,
                                                                             SvHandle *values) {
  return ConvertFromFrames<tFlexRayConversion, tSignalValues>(session, frames, values);
}
