// kvsvConvertFrame{Raw,CAN,LIN,FlexRay}ToByteArraySinglePoint: frames packed into records and
// handed to the driver, which extracts the signals' bytes into the host's byte image.
#include "convert/conversion_protocols.h"
#include "convert/conversion_sides.h"
#include "convert/convert_from_frames.h"
#include "kvsvapi.h"

using namespace nKVSVAPI100;

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertFrameRawToByteArraySinglePoint(uint32_t session,
                                                                            SvHandle *rawFrames,
                                                                            SvHandle *bytes) {
  return ConvertRawFromFrames<tByteImage>(session, rawFrames, bytes);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertFrameCANToByteArraySinglePoint(uint32_t session,
                                                                            SvHandle *frames,
                                                                            SvHandle *bytes) {
  return ConvertFromFrames<tCanConversion, tByteImage>(session, frames, bytes);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertFrameLINToByteArraySinglePoint(uint32_t session,
                                                                            SvHandle *frames,
                                                                            SvHandle *bytes) {
  return ConvertFromFrames<tLinConversion, tByteImage>(session, frames, bytes);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvConvertFrameFlexRayToByteArraySinglePoint(uint32_t session,
                                                                                SvHandle *frames,
                                                                                SvHandle *bytes) {
  return ConvertFromFrames<tFlexRayConversion, tByteImage>(session, frames, bytes);
}
