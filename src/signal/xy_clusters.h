// The host array of XY clusters and the driver's flat regions that XY reads and writes move
// between. The host array holds one cluster per signal: the handle of its timestamp array, then
// the handle of its value array. The driver sees, in the slot's scratch area, all timestamps
// (64-bit raw times), then all values, one run per signal, then one 32-bit pair count per signal.
#ifndef KVSVAPI_SIGNAL_XY_CLUSTERS_H
#define KVSVAPI_SIGNAL_XY_CLUSTERS_H

#include <cstddef>
#include <cstdint>

#include "core/host_handles.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

struct tXYCluster {
  SvHandle timestamps;  // array of SvTime
  SvHandle values;      // array of 64-bit floats
};
static_assert(sizeof(tXYCluster) == 16, "host layout");
static_assert(offsetof(tXYCluster, values) == 8, "host layout");

// Bytes of an outer array of `count` clusters.
constexpr uint32_t ClusterArrayBytes(uint32_t count) { return count * 16u + 8u; }

inline tXYCluster *Clusters(SvHandle array) { return ArrayData8<tXYCluster>(array); }

// The scratch area of `count` signals with runs of `run` pairs, laid out as the driver wants it.
// Sizes are in 32-bit arithmetic, as the slot counts its buffer.
struct tXYRegions {
  tXYRegions(void *area, uint32_t count, uint32_t run)
      : total(count * 8u * run),
        timestamps(static_cast<uint64_t *>(area)),
        values(reinterpret_cast<double *>(static_cast<char *>(area) + total)),
        numPairs(reinterpret_cast<uint32_t *>(static_cast<char *>(area) + 2u * uint64_t{total})) {}

  // Bytes of an area for `count` signals with runs of `run` pairs.
  static uint32_t AreaBytes(uint32_t count, uint32_t run) { return (run * 16u + 4u) * count; }

  const uint32_t total;  // bytes of the timestamp region, and of the value region
  uint64_t *const timestamps;
  double *const values;
  uint32_t *const numPairs;
};

}  // namespace nKVSVAPI100

#endif
