// The property half of the database demonstration: a frame's signals read with their layout and
// scaling, a factor changed and seen again after a save and a reload, and a frame's PDU mapping
// read and written, through the library's exports alone.
#ifndef KVSVDEMO_DATABASE_PROPERTY_TOUR_H
#define KVSVDEMO_DATABASE_PROPERTY_TOUR_H

#include <cstdint>
#include <string>
#include <vector>

#include "library_exports.h"

namespace kvsvdemo {

struct tSignalRow {
  std::string name;
  uint32_t startBit = 0;
  uint32_t numBits = 0;
  uint32_t byteOrder = 0;  // 0 little endian (Intel), 1 big endian (Motorola)
  uint32_t dataType = 0;   // 0 signed, 1 unsigned, 2 float
  double factor = 0;
  double offset = 0;
  double minimum = 0;
  double maximum = 0;
  std::string unit;

  // The signal as a line of its database file: `start|bits@order sign (factor,offset)
  // [min|max] "unit"`.
  std::string AsFileText() const;
};

struct tPduPlace {
  std::string pdu;  // reference text
  uint32_t startBit = 0;
  uint32_t updateBit = 0;
};

struct tPropertyTour {
  std::string failedCall;
  int32_t status = 0;

  std::vector<tSignalRow> signals;  // of the frame, in the frame's order
  double factorBefore = 0;          // of the first signal
  double factorSet = 0;
  double factorReloaded = 0;  // read from the saved file, opened anew
  std::vector<tPduPlace> mappingBefore;
  std::vector<tPduPlace> mappingAfter;  // read back after a write
};

// Opens `dbcPath` as alias "props", reads every signal of `frame`, sets the first signal's factor
// to twice what it was, saves as "props_saved.dbc" in `directory` and reads the factor from there;
// reads the frame's PDU mapping, writes it back with its update bits moved to the last bit of the
// payload, and reads it again. Everything is closed and the aliases removed at the end.
tPropertyTour RunPropertyTour(const tLibraryExports &exports, const std::string &dbcPath,
                              const std::string &directory, const std::string &frame);

}  // namespace kvsvdemo

#endif
