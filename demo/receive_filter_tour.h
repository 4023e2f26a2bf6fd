// The Ethernet part of the demonstration: a receive filter set on an Ethernet input session and
// read back, through the library's exports alone.
#ifndef KVSVDEMO_RECEIVE_FILTER_TOUR_H
#define KVSVDEMO_RECEIVE_FILTER_TOUR_H

#include <cstdint>
#include <string>
#include <vector>

#include "library_exports.h"

namespace kvsvdemo {

// One entry of an endpoint's receive filter; each field is in force only when its flag is set.
struct tFilterEntry {
  bool useValue16 = false;
  uint16_t value16 = 0;
  bool useValue8 = false;
  uint8_t value8 = 0;
  bool useName = false;
  std::string name;

  bool operator==(const tFilterEntry &other) const;
};

struct tFilterTour {
  std::string failedCall;
  int32_t status = 0;
  std::vector<tFilterEntry> written;
  std::vector<tFilterEntry> read;
};

// Makes an Ethernet frame input session on `interfaceName`, writes `filter` as its receive filter,
// reads it back and ends the session.
tFilterTour RunReceiveFilterTour(const tLibraryExports &exports, const std::string &interfaceName,
                                 const std::vector<tFilterEntry> &filter);

}  // namespace kvsvdemo

#endif
