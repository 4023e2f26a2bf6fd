#include "receive_filter_tour.h"

#include <cstring>

#include "database_calls.h"
#include "kvorproperties.h"
#include "svsim.h"

namespace kvsvdemo {

namespace {

constexpr uint32_t kFrameInputQueued = 7;
constexpr size_t kArrayHeader = 8;
constexpr size_t kElementSize = 16;  // flag, value16, flag, value8, flag, name handle at 8

SvHandle MakeFilter(const std::vector<tFilterEntry> &filter) {
  SvHandle array = svNewHandleClr(kArrayHeader + filter.size() * kElementSize);
  if (array == nullptr) return nullptr;
  char *block = static_cast<char *>(*array);
  *reinterpret_cast<int32_t *>(block) = static_cast<int32_t>(filter.size());
  for (size_t i = 0; i < filter.size(); ++i) {
    char *element = block + kArrayHeader + i * kElementSize;
    const tFilterEntry &entry = filter[i];
    element[0] = entry.useValue16 ? 1 : 0;
    std::memcpy(element + 2, &entry.value16, 2);
    element[4] = entry.useValue8 ? 1 : 0;
    element[5] = static_cast<char>(entry.value8);
    element[6] = entry.useName ? 1 : 0;
    SvHandle name = svsimMakeString(entry.name.c_str());
    std::memcpy(element + 8, &name, sizeof name);
  }
  return array;
}

// The entries of a filter array, which then gives up its names with itself.
std::vector<tFilterEntry> TakeFilter(SvHandle &array) {
  std::vector<tFilterEntry> filter;
  if (array == nullptr) return filter;
  char *block = static_cast<char *>(*array);
  const int32_t count = *reinterpret_cast<int32_t *>(block);
  for (int32_t i = 0; i < count; ++i) {
    const char *element = block + kArrayHeader + i * kElementSize;
    tFilterEntry entry;
    entry.useValue16 = element[0] != 0;
    std::memcpy(&entry.value16, element + 2, 2);
    entry.useValue8 = element[4] != 0;
    entry.value8 = static_cast<uint8_t>(element[5]);
    entry.useName = element[6] != 0;
    SvHandle name = nullptr;
    std::memcpy(&name, element + 8, sizeof name);
    if (name != nullptr) {
      entry.name = HostText(name);
      svDisposeHandle(name);
    }
    filter.push_back(entry);
  }
  svDisposeHandle(array);
  array = nullptr;
  return filter;
}

}  // namespace

bool tFilterEntry::operator==(const tFilterEntry &other) const {
  return useValue16 == other.useValue16 && value16 == other.value16 &&
         useValue8 == other.useValue8 && value8 == other.value8 && useName == other.useName &&
         name == other.name;
}

tFilterTour RunReceiveFilterTour(const tLibraryExports &e, const std::string &interfaceName,
                                 const std::vector<tFilterEntry> &filter) {
  tFilterTour r;
  r.written = filter;
  cDatabaseCalls calls(e, r.failedCall, r.status);
  kvsvRefnum reference = 0;
  if (!calls.Ok("kvsvSessionManualCreate", e.sessionManualCreate("", "", "", interfaceName.c_str(),
                                                                 kFrameInputQueued, &reference))) {
    e.sessionClear(0, reference);
    return r;
  }
  SvsimRefInfo info{};
  uint32_t session = 0;
  for (int32_t i = 0; svsimGetRef(i, &info) == 1; ++i) {
    if (info.cookie == reference) session = info.handle;
  }
  SvHandle array = MakeFilter(filter);
  if (calls.Ok("kvsvSessionSetPropExCluster1D",
               e.sessionSetPropExCluster1D(session, nullptr, kvPropSession_IntfEnetEptReceiveFilter,
                                           &array, nullptr))) {
    TakeFilter(array);
    calls.Ok("kvsvSessionGetPropExCluster1D",
             e.sessionGetPropExCluster1D(session, nullptr, kvPropSession_IntfEnetEptReceiveFilter,
                                         &array, nullptr));
  }
  r.read = TakeFilter(array);
  calls.Ok("kvsvSessionClear", e.sessionClear(session, reference));
  return r;
}

}  // namespace kvsvdemo
