#include "database_tour.h"

#include <cstdint>
#include <string>

#include "svsim.h"

namespace kvsvdemo {

namespace {

constexpr uint32_t kDatabase = 0x00000;
constexpr uint32_t kCluster = 0x10000;
constexpr uint32_t kFrame = 0x20000;
constexpr uint32_t kSignal = 0x30000;
constexpr uint32_t kLinSchedule = 0x60000;
constexpr uint32_t kLinScheduleEntry = 0x70000;
constexpr uint32_t kClusterFrames = 0x06010004;  // the cluster's frames, as references
constexpr uint32_t kBaudRate = 500000;

std::string Text(SvHandle string) {
  char text[512] = {};
  const int32_t length = svsimReadString(string, text, sizeof text);
  return length < 0 ? std::string() : std::string(text);
}

// The strings of a host array (its count at byte 0, string handles from byte 8), which the array
// then gives up with itself.
std::vector<std::string> TakeStrings(SvHandle &array) {
  std::vector<std::string> strings;
  if (array == nullptr) return strings;
  const int32_t count = *static_cast<int32_t *>(*array);
  for (int32_t i = 0; i < count; ++i) {
    SvHandle &string = reinterpret_cast<SvHandle *>(static_cast<char *>(*array) + 8)[i];
    strings.push_back(Text(string));
    if (string != nullptr) svDisposeHandle(string);
  }
  svDisposeHandle(array);
  array = nullptr;
  return strings;
}

// What the host knows of one of its references: the handle and the reference's name.
struct tHeld {
  kvsvRefnum reference = 0;
  uint32_t handle = 0;
  std::string name;
};

tHeld Held(kvsvRefnum reference) {
  SvsimRefInfo info{};
  for (int32_t i = 0; svsimGetRef(i, &info) == 1; ++i) {
    if (info.cookie == reference) return {reference, info.handle, info.name};
  }
  return {reference, 0, {}};
}

class cTour {
 public:
  cTour(const tLibraryExports &e, tDatabaseTour &result) : e_(e), r_(result) {}

  // Records the first failure; true while none has occurred.
  bool Ok(const char *call, int32_t status) {
    if (status < 0 && r_.status == 0) {
      r_.failedCall = call;
      r_.status = status;
    }
    return Going();
  }
  bool Going() const { return r_.status == 0; }

  bool Open(uint32_t objectClass, const std::string &text, tHeld &held) {
    SvHandle name = svsimMakeString(text.c_str());
    kvsvRefnum reference = 0;
    const int32_t status = e_.dbManualOpen(objectClass, name, &reference);
    svDisposeHandle(name);
    held = Held(reference);
    return Ok("kvsvdbManualOpen", status);
  }

  bool Create(uint32_t parent, uint32_t objectClass, const char *name, tHeld &held) {
    kvsvRefnum reference = 0;
    const int32_t status = e_.dbCreateObject(parent, objectClass, name, &reference);
    held = Held(reference);
    return Ok("kvsvdbCreateObject", status);
  }

  // Closes the whole database of `held`, every reference of it with it.
  bool CloseAll(const tHeld &held) {
    SvHandle name = svsimMakeString(held.name.c_str());
    const int32_t status = e_.dbManualClose(held.handle, name, held.reference, 1, nullptr, nullptr);
    svDisposeHandle(name);
    return Ok("kvsvdbManualClose", status);
  }

 private:
  const tLibraryExports &e_;
  tDatabaseTour &r_;
};

}  // namespace

tDatabaseTour RunDatabaseTour(const tLibraryExports &e, const std::string &dbcPath,
                              const std::string &directory, const std::string &frame,
                              const std::string &signal) {
  tDatabaseTour r;
  cTour tour(e, r);
  tHeld database, found, cluster, schedule, entry, added, edited, reloaded;
  r.savedPath = directory + "/tesla_edited.dbc";

  if (tour.Ok("kvsvdbAddAlias", e.dbAddAlias("tesla", dbcPath.c_str(), kBaudRate)) &&
      tour.Open(kDatabase, "tesla", database) && tour.Open(kFrame, frame + "\ntesla", found)) {
    r.frameReference = found.name;
  }
  if (tour.Going() && tour.Open(kSignal, frame + "." + signal + "\ntesla", found)) {
    r.signalReference = found.name;
  }
  // The cluster by its own text: "tesla" alone names the database, which is open already.
  if (tour.Going() && tour.Open(kCluster, "tesla.Cluster", cluster)) {
    SvHandle frames = nullptr;
    if (tour.Ok("kvsvdbGetPropRef1D",
                e.dbGetPropRef1D(cluster.handle, kClusterFrames, &frames, nullptr))) {
      r.clusterFrames = TakeStrings(frames);
    }
  }
  if (tour.Going() && tour.Create(cluster.handle, kLinSchedule, "DemoSchedule", schedule) &&
      tour.Create(schedule.handle, kLinScheduleEntry, "DemoSlot", entry)) {
    r.scheduleReference = schedule.name;
    tour.Ok("kvsvdbDeleteObject", e.dbDeleteObject(schedule.handle, schedule.reference));
  }
  if (tour.Going() && tour.Create(cluster.handle, kFrame, "DemoFrame", added) &&
      tour.Ok("kvsvdbSave", e.dbSave(database.handle, r.savedPath.c_str())) &&
      tour.Ok("kvsvdbAddAlias", e.dbAddAlias("tesla_edited", r.savedPath.c_str(), kBaudRate)) &&
      tour.Open(kDatabase, "tesla_edited", edited) &&
      tour.Open(kFrame, "DemoFrame\ntesla_edited", reloaded)) {
    r.addedFrameReloaded = reloaded.handle != 0;
  }
  SvHandle aliases = nullptr, files = nullptr;
  if (tour.Going() &&
      tour.Ok("kvsvdbGetDatabaseList", e.dbGetDatabaseList(0, &aliases, &files))) {
    r.aliases = TakeStrings(aliases);
    r.aliasFiles = TakeStrings(files);
  }

  // The program's references end with it, whatever went wrong before.
  for (const tHeld *held : {&database, &edited}) {
    if (held->reference != 0) tour.CloseAll(*held);
  }
  for (const char *alias : {"tesla", "tesla_edited"}) e.dbRemoveAlias(alias);
  r.openDatabasesAtEnd = e.dbNumOpen();
  return r;
}

}  // namespace kvsvdemo
