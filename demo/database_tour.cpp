#include "database_tour.h"

#include <cstdint>
#include <string>

#include "database_calls.h"

namespace kvsvdemo {

namespace {

constexpr uint32_t kClusterFrames = 0x06010004;  // the cluster's frames, as references
constexpr uint32_t kBaudRate = 500000;

}  // namespace

tDatabaseTour RunDatabaseTour(const tLibraryExports &e, const std::string &dbcPath,
                              const std::string &directory, const std::string &frame,
                              const std::string &signal) {
  tDatabaseTour r;
  cDatabaseCalls tour(e, r.failedCall, r.status);
  tHeld database, found, cluster, schedule, entry, added, edited, reloaded;
  r.savedPath = directory + "/tesla_edited.dbc";

  if (tour.Ok("kvsvdbAddAlias", e.dbAddAlias("tesla", dbcPath.c_str(), kBaudRate)) &&
      tour.Open(kDatabaseClass, "tesla", database) &&
      tour.Open(kFrameClass, frame + "\ntesla", found)) {
    r.frameReference = found.name;
  }
  if (tour.Going() && tour.Open(kSignalClass, frame + "." + signal + "\ntesla", found)) {
    r.signalReference = found.name;
  }
  // The cluster by its own text: "tesla" alone names the database, which is open already.
  if (tour.Going() && tour.Open(kClusterClass, "tesla.Cluster", cluster)) {
    SvHandle frames = nullptr;
    if (tour.Ok("kvsvdbGetPropRef1D",
                e.dbGetPropRef1D(cluster.handle, kClusterFrames, &frames, nullptr))) {
      r.clusterFrames = TakeStrings(frames);
    }
  }
  if (tour.Going() && tour.Create(cluster.handle, kLinScheduleClass, "DemoSchedule", schedule) &&
      tour.Create(schedule.handle, kLinScheduleEntryClass, "DemoSlot", entry)) {
    r.scheduleReference = schedule.name;
    tour.Ok("kvsvdbDeleteObject", e.dbDeleteObject(schedule.handle, schedule.reference));
  }
  if (tour.Going() && tour.Create(cluster.handle, kFrameClass, "DemoFrame", added) &&
      tour.Ok("kvsvdbSave", e.dbSave(database.handle, r.savedPath.c_str())) &&
      tour.Ok("kvsvdbAddAlias", e.dbAddAlias("tesla_edited", r.savedPath.c_str(), kBaudRate)) &&
      tour.Open(kDatabaseClass, "tesla_edited", edited) &&
      tour.Open(kFrameClass, "DemoFrame\ntesla_edited", reloaded)) {
    r.addedFrameReloaded = reloaded.handle != 0;
  }
  SvHandle aliases = nullptr, files = nullptr;
  if (tour.Going() && tour.Ok("kvsvdbGetDatabaseList", e.dbGetDatabaseList(0, &aliases, &files))) {
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
