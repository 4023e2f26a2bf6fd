// The Ethernet receive filter of a session as the driver holds it (28-byte records) and as the
// host holds it (an array of 16-byte clusters).
#ifndef KVSVAPI_PROPERTY_ENET_RX_FILTER_RECORD_H
#define KVSVAPI_PROPERTY_ENET_RX_FILTER_RECORD_H

#include <cstddef>
#include <cstdint>

#include "kvsvplatform.h"

namespace nKVSVAPI100 {

// Which fields of a record are in force.
enum eEnetRxFilterFlag : uint32_t {
  kEnetRxFilterValue16 = 1u << 0,
  kEnetRxFilterValue8 = 1u << 1,
  kEnetRxFilterName = 1u << 2
};

constexpr size_t kEnetRxFilterNameBytes = 21;
// The longest name a host may write: the driver's field keeps room beyond it.
constexpr uint32_t kEnetRxFilterNameMax = 18;

#pragma pack(push, 1)
struct tEnetRxFilterRecord {
  uint32_t flags;
  uint16_t value16;
  uint8_t value8;
  char filterName[kEnetRxFilterNameBytes];  // NUL-terminated
};
#pragma pack(pop)

static_assert(sizeof(tEnetRxFilterRecord) == 28, "the driver's record is 28 bytes");
static_assert(offsetof(tEnetRxFilterRecord, value16) == 4, "value16 at 4");
static_assert(offsetof(tEnetRxFilterRecord, value8) == 6, "value8 at 6");
static_assert(offsetof(tEnetRxFilterRecord, filterName) == 7, "filterName at 7");

// One element of the host's array, from byte 8 of its block; the count is at byte 0.
struct tEnetRxFilterCluster {
  uint8_t useValue16;
  uint8_t reserved1;
  uint16_t value16;
  uint8_t useValue8;
  uint8_t value8;
  uint8_t useName;
  uint8_t reserved7;
  SvHandle filterName;  // counted, without NUL
};

static_assert(sizeof(tEnetRxFilterCluster) == 16, "the host's element is 16 bytes");
static_assert(offsetof(tEnetRxFilterCluster, value16) == 2, "value16 at 2");
static_assert(offsetof(tEnetRxFilterCluster, useValue8) == 4, "flag bit 1 at 4");
static_assert(offsetof(tEnetRxFilterCluster, value8) == 5, "value8 at 5");
static_assert(offsetof(tEnetRxFilterCluster, useName) == 6, "flag bit 2 at 6");
static_assert(offsetof(tEnetRxFilterCluster, filterName) == 8, "filterName at 8");

constexpr uint64_t kEnetRxFilterArrayHeader = 8;

}  // namespace nKVSVAPI100

#endif
