// The database half of the demonstration: a host program that opens a database file by alias,
// finds objects by their reference texts, edits the database, saves it and opens the saved file
// again, through the library's exports alone.
#ifndef KVSVDEMO_DATABASE_TOUR_H
#define KVSVDEMO_DATABASE_TOUR_H

#include <cstdint>
#include <string>
#include <vector>

#include "library_exports.h"

namespace kvsvdemo {

struct tDatabaseTour {
  // The first call that failed, and its status; status 0 if none failed.
  std::string failedCall;
  int32_t status = 0;

  std::string frameReference;              // of the frame found by its reference text
  std::string signalReference;             // of the signal found by its reference text
  std::vector<std::string> clusterFrames;  // the cluster's frames, by reference
  std::string scheduleReference;           // of the LIN schedule created and deleted
  std::string savedPath;
  bool addedFrameReloaded = false;   // the frame added is in the saved file, opened anew
  std::vector<std::string> aliases;  // the database list, with the file of each
  std::vector<std::string> aliasFiles;
  uint32_t openDatabasesAtEnd = 0;
};

// Opens `dbcPath` as alias "tesla", finds `frame` and its `signal`, edits the database and saves it
// as "tesla_edited.dbc" in `directory`, reloads it as "tesla_edited", lists the databases, closes
// everything and removes both aliases.
tDatabaseTour RunDatabaseTour(const tLibraryExports &exports, const std::string &dbcPath,
                              const std::string &directory, const std::string &frame,
                              const std::string &signal);

}  // namespace kvsvdemo

#endif
