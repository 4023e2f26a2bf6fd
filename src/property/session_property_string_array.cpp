// kvsvSessionGetPropString1D and its Ex form: a comma list of the driver as a host array of
// strings. The session's list comes in reference-string form, so that each entry names its
// object in the session's database and cluster. There is no setter.
#include <boost/noncopyable.hpp>
#include <cstdint>

#include "kvorproperties.h"
#include "kvsvapi.h"
#include "property/session_property_call.h"

using namespace nKVSVAPI100;

namespace {

constexpr uint32_t kNoStringArraySetterLine = 2113;
constexpr uint32_t kLastListMode = 5;
constexpr char kLineFeed = '\n';

// A host handle of our own, disposed on every way out.
class cScratchString : boost::noncopyable {
 public:
  ~cScratchString() { DisposeHandle(&handle); }
  SvHandle handle = nullptr;
};

bool IsObjectList(uint32_t id) {
  return id == kvPropSession_IntfLINSchedNames || id == kvPropSession_List ||
         id == kvPropHidden_FrameList;
}

// Frame sessions that keep one entry per frame of their list: queued and single-point input,
// queued and single-point output.
bool HasFrameList(uint32_t mode) { return mode == 7 || mode == 8 || mode == 10 || mode == 11; }

// Each entry becomes "entry\ndatabase.cluster".
Status AppendReference(SvHandle array, SvHandle reference) {
  for (int32_t i = 0; i < ArrayCount(array); ++i) {
    SvHandle element = ArrayData8<SvHandle>(array)[i];
    if (element == nullptr) continue;
    if (svStrPrintf(element, "%H%c%H", element, kLineFeed, reference) < 0) return kvErrOutOfMemory;
  }
  return 0;
}

// Reads `id` into `*value`. Lists of objects are answered only in the modes that have them, and
// `id` becomes kvPropSession_List where the frame list is read through it.
Status ReadStringArray(uint32_t handle, uint32_t &id, SvHandle *value, SvHandle *info) {
  if (value == nullptr) return kvErrNullArgument;
  cScratchString reference;
  Status status = 0;
  if (IsObjectList(id)) {
    uint32_t mode = 0;
    status = tSessionPropertyCalls::Get(handle, kvPropSession_Mode, sizeof mode, &mode);
    if (status < 0) return status;
    if (id == kvPropSession_List && mode > kLastListMode) return status;
    if (id == kvPropHidden_FrameList) {
      if (!HasFrameList(mode)) return status;
      id = kvPropSession_List;
    }
    status = kvsvSessionGetPropString(handle, kvPropSession_ClusterName, &reference.handle, info);
    if (status < 0) return status;
  }
  status = ReadCommaListProperty<tSessionPropertyCalls>(handle, id, value);
  if (status < 0) return status;
  if (reference.handle != nullptr) {
    const Status appended = AppendReference(*value, reference.handle);
    if (appended < 0) return appended;
  }
  return status;
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropExString1D(uint32_t session, SvHandle *,
                                                               uint32_t id, SvHandle *value,
                                                               SvHandle *info) {
  return RunSessionPropertyCall(
      session, id, info, [&](uint32_t handle) { return ReadStringArray(handle, id, value, info); });
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionGetPropString1D(uint32_t session, uint32_t id,
                                                             SvHandle *value, SvHandle *info) {
  return kvsvSessionGetPropExString1D(session, nullptr, id, value, info);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropExString1D(uint32_t, SvHandle *, uint32_t id,
                                                               SvHandle *, SvHandle *info) {
  return ReportMissingSetter(nFile::kSessionOpenClose, kNoStringArraySetterLine, id, info);
}
extern "C" KVSV_EXPORT kvsvStatus kvsvSessionSetPropString1D(uint32_t session, uint32_t id,
                                                             SvHandle *value, SvHandle *info) {
  return kvsvSessionSetPropExString1D(session, nullptr, id, value, info);
}
