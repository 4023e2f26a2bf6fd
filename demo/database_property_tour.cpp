#include "database_property_tour.h"

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <string>

#include "database_calls.h"
#include "kvorproperties.h"
#include "svsim.h"

namespace kvsvdemo {

namespace {

constexpr uint32_t kBaudRate = 500000;
constexpr size_t kMappingElement = 16;  // string handle, start bit, update bit
constexpr size_t kArrayHeader = 8;

// The elements of a mapping array, each a string handle and two bit numbers.
std::vector<tPduPlace> MappingOf(SvHandle array) {
  std::vector<tPduPlace> places;
  if (array == nullptr) return places;
  const char *block = static_cast<const char *>(*array);
  const int32_t count = *reinterpret_cast<const int32_t *>(block);
  for (int32_t i = 0; i < count; ++i) {
    const char *element = block + kArrayHeader + i * kMappingElement;
    tPduPlace place;
    SvHandle pdu = nullptr;
    std::memcpy(&pdu, element, sizeof pdu);
    place.pdu = HostText(pdu);
    std::memcpy(&place.startBit, element + 8, 4);
    std::memcpy(&place.updateBit, element + 12, 4);
    places.push_back(place);
  }
  return places;
}

// Gives up a mapping array with the strings its elements own.
void DisposeMapping(SvHandle &array) {
  if (array == nullptr) return;
  char *block = static_cast<char *>(*array);
  for (int32_t i = 0; i < *reinterpret_cast<int32_t *>(block); ++i) {
    SvHandle pdu = nullptr;
    std::memcpy(&pdu, block + kArrayHeader + i * kMappingElement, sizeof pdu);
    if (pdu != nullptr) svDisposeHandle(pdu);
  }
  svDisposeHandle(array);
  array = nullptr;
}

// Shortest decimal text that reads back as `value`, as database files write numbers.
std::string Number(double value) {
  char text[32];
  for (int digits = 1; digits <= 17; ++digits) {
    std::snprintf(text, sizeof text, "%.*g", digits, value);
    if (std::strtod(text, nullptr) == value) break;
  }
  return text;
}

class cSignalReader {
 public:
  cSignalReader(const tLibraryExports &e, cDatabaseCalls &calls) : e_(e), calls_(calls) {}

  bool Read(uint32_t signal, tSignalRow &row) {
    SvHandle unit = nullptr;
    const bool ok = U32(signal, kvPropSig_StartBit, row.startBit) &&
                    U32(signal, kvPropSig_NumBits, row.numBits) &&
                    U32(signal, kvPropSig_ByteOrdr, row.byteOrder) &&
                    U32(signal, kvPropSig_DataType, row.dataType) &&
                    F64(signal, kvPropSig_ScaleFac, row.factor) &&
                    F64(signal, kvPropSig_ScaleOff, row.offset) &&
                    F64(signal, kvPropSig_Min, row.minimum) &&
                    F64(signal, kvPropSig_Max, row.maximum) &&
                    calls_.Ok("kvsvdbGetPropString",
                              e_.dbGetPropString(signal, kvPropSig_Unit, &unit, nullptr));
    if (unit != nullptr) {
      row.unit = HostText(unit);
      svDisposeHandle(unit);
    }
    return ok;
  }

  bool F64(uint32_t object, uint32_t id, double &value) {
    return calls_.Ok("kvsvdbGetPropF64", e_.dbGetPropF64(object, id, &value, nullptr));
  }

 private:
  bool U32(uint32_t object, uint32_t id, uint32_t &value) {
    return calls_.Ok("kvsvdbGetPropU32", e_.dbGetPropU32(object, id, &value, nullptr));
  }

  const tLibraryExports &e_;
  cDatabaseCalls &calls_;
};

}  // namespace

std::string tSignalRow::AsFileText() const {
  return std::to_string(startBit) + "|" + std::to_string(numBits) + "@" +
         (byteOrder == 0 ? "1" : "0") + (dataType == 0 ? "-" : "+") + " (" + Number(factor) + "," +
         Number(offset) + ") [" + Number(minimum) + "|" + Number(maximum) + "] \"" + unit + "\"";
}

tPropertyTour RunPropertyTour(const tLibraryExports &e, const std::string &dbcPath,
                              const std::string &directory, const std::string &frame) {
  tPropertyTour r;
  cDatabaseCalls calls(e, r.failedCall, r.status);
  cSignalReader reader(e, calls);
  tHeld database, frameHeld, first, saved, reloaded;
  const std::string savedPath = directory + "/props_saved.dbc";

  SvHandle signalTexts = nullptr;
  if (calls.Ok("kvsvdbAddAlias", e.dbAddAlias("props", dbcPath.c_str(), kBaudRate)) &&
      calls.Open(kDatabaseClass, "props", database) &&
      calls.Open(kFrameClass, frame + "\nprops", frameHeld) &&
      calls.Ok("kvsvdbGetPropRef1D",
               e.dbGetPropRef1D(frameHeld.handle, kvPropFrm_SigRefs, &signalTexts, nullptr))) {
    for (const std::string &text : TakeStrings(signalTexts)) {
      tHeld signal;
      tSignalRow row;
      // "frame.signal", a line feed, the database.
      const std::string qualified = text.substr(0, text.find('\n'));
      row.name = qualified.substr(qualified.find('.') + 1);
      if (!calls.Open(kSignalClass, text, signal) || !reader.Read(signal.handle, row)) break;
      r.signals.push_back(row);
      if (r.signals.size() == 1) first = signal;
    }
  }

  // A changed factor is in the saved file.
  if (calls.Going() && !r.signals.empty()) {
    r.factorBefore = r.signals.front().factor;
    r.factorSet = r.factorBefore * 2;
    if (calls.Ok("kvsvdbSetPropF64",
                 e.dbSetPropF64(first.handle, kvPropSig_ScaleFac, &r.factorSet, nullptr)) &&
        calls.Ok("kvsvdbSave", e.dbSave(database.handle, savedPath.c_str())) &&
        calls.Ok("kvsvdbAddAlias", e.dbAddAlias("props_saved", savedPath.c_str(), kBaudRate)) &&
        calls.Open(kDatabaseClass, "props_saved", saved) &&
        calls.Open(kSignalClass, frame + "." + r.signals.front().name + "\nprops_saved",
                   reloaded)) {
      reader.F64(reloaded.handle, kvPropSig_ScaleFac, r.factorReloaded);
    }
  }

  // The PDU mapping, written back with each update bit on the payload's last bit.
  SvHandle mapping = nullptr;
  uint32_t payloadLength = 0;
  if (calls.Going() &&
      calls.Ok("kvsvdbGetPropU32",
               e.dbGetPropU32(frameHeld.handle, kvPropFrm_PayloadLen, &payloadLength, nullptr)) &&
      calls.Ok(
          "kvsvdbGetPropPDU_Mapping",
          e.dbGetPropPDU_Mapping(frameHeld.handle, kvPropFrm_PDU_Mapping, &mapping, nullptr))) {
    r.mappingBefore = MappingOf(mapping);
    char *block = static_cast<char *>(*mapping);
    for (size_t i = 0; i < r.mappingBefore.size(); ++i) {
      const uint32_t updateBit = payloadLength * 8 - 1;
      std::memcpy(block + kArrayHeader + i * kMappingElement + 12, &updateBit, 4);
    }
    if (calls.Ok(
            "kvsvdbSetPropPDU_Mapping",
            e.dbSetPropPDU_Mapping(frameHeld.handle, kvPropFrm_PDU_Mapping, &mapping, nullptr))) {
      DisposeMapping(mapping);
      if (calls.Ok(
              "kvsvdbGetPropPDU_Mapping",
              e.dbGetPropPDU_Mapping(frameHeld.handle, kvPropFrm_PDU_Mapping, &mapping, nullptr))) {
        r.mappingAfter = MappingOf(mapping);
      }
    }
  }
  DisposeMapping(mapping);

  for (const tHeld *held : {&database, &saved}) {
    if (held->reference != 0) calls.CloseAll(*held);
  }
  for (const char *alias : {"props", "props_saved"}) e.dbRemoveAlias(alias);
  return r;
}

}  // namespace kvsvdemo
