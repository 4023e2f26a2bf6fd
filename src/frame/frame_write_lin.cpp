// kvsvWriteFrameLIN: a host array of LIN clusters sent as fixed 24-byte records.
#include "frame/frame_record.h"
#include "frame/frame_write_records.h"
#include "kvsvapi.h"

using namespace nKVSVAPI100;

extern "C" KVSV_EXPORT kvsvStatus kvsvWriteFrameLIN(uint32_t session, SvHandle frames,
                                                    double timeout) {
  return WriteRecordFrames(session, frames, timeout, tFrameClusterLIN::kSize, kEncodeLin);
}
