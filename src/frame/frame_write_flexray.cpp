// kvsvWriteFrameFlexRay: a host array of FlexRay clusters sent as records of their own size.
#include "frame/frame_record.h"
#include "frame/frame_write_records.h"
#include "kvsvapi.h"

using namespace nKVSVAPI100;

extern "C" KVSV_EXPORT kvsvStatus kvsvWriteFrameFlexRay(uint32_t session, SvHandle frames,
                                                        double timeout) {
  return WriteRecordFrames(session, frames, timeout, tFrameClusterFlexRay::kSize, kEncodeFlexRay);
}
