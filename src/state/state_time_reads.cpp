// kvsvReadStateTime, kvsvReadStateTime2 and kvsvReadStateTimeTrigger: driver times as SvTime.
// Ethernet sessions keep 1 ns times in 24-byte records; all others keep raw times, and only the
// first time of a record.
#include <optional>

#include "core/internal_error.h"
#include "core/status.h"
#include "core/timestamps.h"
#include "kvorproperties.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/abort_cleanup.h"

using namespace nKVSVAPI100;

namespace {

// The driver's 24-byte time record.
struct tTimeRecord {
  uint64_t first;
  uint64_t second;
  uint32_t flags;  // bit 0: the flag
  uint32_t unused;
};
static_assert(sizeof(tTimeRecord) == 24, "the driver's record is 24 bytes");

// Outside Ethernet a record identifier stands for its 8-byte state.
uint32_t ShortTimeState(uint32_t stateId) {
  switch (stateId) {
    case kvState_TimeCurrentLong:
      return kvState_TimeCurrent;
    case kvState_TimeStartLong:
      return kvState_TimeStart;
    case kvState_TimeCommLong:
      return kvState_TimeComm;
    default:
      return stateId;
  }
}

struct tTimeOutputs {
  SvTime *first;
  SvTime *second;
  uint8_t *flag;

  void Clear() const {
    *first = SvTime{};
    *second = SvTime{};
    *flag = 0;
  }

  void Store(const tTimeRecord &record, bool ethernet) const {
    *flag = static_cast<uint8_t>(record.flags & 1);
    if (ethernet) {
      NsTimeToSvTime(first, &record.first);
      NsTimeToSvTime(second, &record.second);
    } else {
      RawTimeToSvTime(first, &record.first);
      RawTimeToSvTime(second, &record.second);
    }
  }
};

// The steps of both two-time reads. With a trigger timeout the time comes from the blocking
// trigger read, which always takes a whole record, and a failed protocol read leaves the outputs.
Status ReadTwoTimes(uint32_t session, uint32_t stateId, const tTimeOutputs &out,
                    std::optional<double> triggerTimeout, uint32_t line) {
  if (out.first == nullptr || out.second == nullptr || out.flag == nullptr) {
    return ReportInternalError(kComponentKvsvapi, nFile::kSessionIo, line, 0);
  }
  uint32_t protocol = 0;
  Status status = kvGetProperty(session, kvPropSession_Protocol, sizeof protocol, &protocol);
  if (status < 0) {
    if (!triggerTimeout) out.Clear();
    return status;
  }
  const bool ethernet = protocol == kvProtocol_Ethernet;
  tTimeRecord record{};
  if (triggerTimeout) {
    RegisterAbortIfBlocking(session, *triggerTimeout);
    status = kvReadStateTimeTrigger(session, sizeof record, &record, *triggerTimeout);
  } else if (ethernet) {
    status = kvReadState(session, stateId, sizeof record, &record, nullptr);
  } else {
    status =
        kvReadState(session, ShortTimeState(stateId), sizeof record.first, &record.first, nullptr);
  }
  if (status < 0) {
    out.Clear();
    return status;
  }
  out.Store(record, ethernet);
  return status;
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvReadStateTime(uint32_t session, uint32_t stateId,
                                                    SvTime *time) {
  if (time == nullptr)
    return ReportInternalError(kComponentKvsvapi, nFile::kSessionIo, __LINE__, 0);
  uint64_t rawTime = 0;
  const Status status = kvReadState(session, stateId, sizeof rawTime, &rawTime, nullptr);
  RawTimeToSvTime(time, &rawTime);
  return status;
}

extern "C" KVSV_EXPORT kvsvStatus kvsvReadStateTime2(uint32_t session, uint32_t stateId,
                                                     SvTime *first, SvTime *second, uint8_t *flag) {
  return ReadTwoTimes(session, stateId, {first, second, flag}, std::nullopt, __LINE__);
}

extern "C" KVSV_EXPORT kvsvStatus kvsvReadStateTimeTrigger(uint32_t session, SvTime *first,
                                                           SvTime *second, uint8_t *flag,
                                                           double timeout) {
  return ReadTwoTimes(session, 0, {first, second, flag}, timeout, __LINE__);
}
