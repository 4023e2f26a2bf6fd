#include "session/db_reference_strings.h"

#include <cstring>
#include <new>

#include "core/host_handles.h"
#include "core/internal_error.h"
#include "kvorproperties.h"
#include "property/property_value_io.h"
#include "session/object_class.h"
#include "session/reference_array_work.h"

namespace nKVSVAPI100 {

namespace {

constexpr uint32_t kLineLocationClass = 1177;
constexpr uint32_t kLineOneStringOnly = 1569;
constexpr uint32_t kLineOutputMode = 1575;

// The cluster the driver writes for a database without clusters of its own: never written out.
constexpr char kDefaultCluster[] = "Cluster";

// Bytes that a name's string handle holds beyond the name (with its NUL) and its location.
constexpr uint64_t kNameSlack = 12;

Status Report(uint32_t line, uint32_t info) {
  return ReportInternalError(kComponentKvsvapi, nFile::kUtility, line, info);
}

uint32_t ClusterRefProperty(uint32_t objectClass) {
  switch (objectClass) {
    case kClassFrame: return kvPropFrm_ClusterRef;
    case kClassSignal: return kSignalClusterRef;
    case kClassSubframe: return kSubframeClusterRef;
    case kClassEcu: return kvPropECU_ClstRef;
    case kClassLinSchedule: return kvPropLINSched_ClstRef;
    case kClassLinScheduleEntry: return kLinScheduleEntryClusterRef;
    case kClassPdu: return kvPropPDU_ClusterRef;
    default: return 0;
  }
}

uint32_t ClassOfProperty(uint32_t id) { return id & 0xFF0000u; }

SvStr *Text(SvHandle string) { return static_cast<SvStr *>(*string); }

// Makes the output ready for `count` texts.
Status PrepareOutput(tReferenceOutput output, uint32_t mode, uint32_t count) {
  switch (mode) {
    case kReferenceArray:
      DisposeHandleArray(output.handle);
      *output.handle = svNewHandleClr(uint64_t{count} * 8 + 8);
      return *output.handle != nullptr ? 0 : kvErrOutOfMemory;
    case kReferenceString:
      DisposeHandle(output.handle);
      return 0;
    case kReferenceVariants:
      return GrowHandleArray(output.handle, count, nullptr) != nullptr ? 0 : kvErrOutOfMemory;
    case kReferenceText:
      output.text->clear();
      return 0;
    default:
      return 0;
  }
}

// The name of `object` into `*string` behind its count, with `location` appended; the count
// leaves the name's NUL out. A failure leaves an empty string where one could be made.
Status ReadName(uint32_t object, uint32_t nameProperty, const std::string &location,
                SvHandle *string) {
  const Status status = ReadSizedIntoHandle<tDbPropertyCalls>(
      object, nameProperty, string, location.size() + kNameSlack,
      [&](Status read, uint32_t size) {
        SvStr *text = Text(*string);
        text->cnt = 0;
        if (read < 0 || size == 0) return;
        std::memcpy(text->str + size - 1, location.data(), location.size());
        text->cnt = static_cast<int32_t>(size - 1 + location.size());
      });
  if (*string == nullptr && ResizeOrCreateHandle(string, 8) < 0) return kvErrOutOfMemory;
  if (status < 0) Text(*string)->cnt = 0;
  return status;
}

// A cluster is named with its database in front: "database.cluster".
Status PrefixDatabaseName(uint32_t cluster, SvHandle *string) {
  uint32_t database = 0;
  Status status = kvdbGetProperty(cluster, kvPropClst_DatabaseRef, sizeof database, &database);
  if (status < 0) return status;
  tMallocBlock name;
  status = ReadTextBlock<tDbPropertyCalls>(database, kvPropDatabase_Name, name);
  if (status < 0) return status;
  const size_t prefix = std::strlen(name.get()) + 1;
  const size_t length = static_cast<size_t>(Text(*string)->cnt);
  if (ResizeOrCreateHandle(string, kHostCountBytes + prefix + length) < 0) return kvErrOutOfMemory;
  SvStr *text = Text(*string);
  std::memmove(text->str + prefix, text->str, length);
  std::memcpy(text->str, name.get(), prefix - 1);
  text->str[prefix - 1] = '.';
  text->cnt = static_cast<int32_t>(prefix + length);
  return status;
}

// Hands the text made for element `index` to the output; it takes the handle in modes 0 and 1.
void StoreText(tReferenceOutput output, uint32_t mode, uint32_t index, SvHandle *string) {
  switch (mode) {
    case kReferenceArray:
      ArrayData8<SvHandle>(*output.handle)[index] = *string;
      ArrayCount(*output.handle) = static_cast<int32_t>(index + 1);
      *string = nullptr;
      return;
    case kReferenceString:
      if (index != 0) {
        Report(kLineOneStringOnly, index);
        return;
      }
      *output.handle = *string;
      *string = nullptr;
      return;
    case kReferenceVariants: {
      int32_t &count = ArrayCount(*output.handle);
      svVariantSetStringAttr(ArrayData8<uint64_t>(*output.handle) + count, kVariantNameAttribute,
                             *string);
      ++count;
      return;
    }
    case kReferenceText: {
      const SvStr *text = Text(*string);
      if (index != 0) output.text->push_back(',');
      output.text->append(reinterpret_cast<const char *>(text->str),
                          static_cast<size_t>(text->cnt));
      return;
    }
    default:
      Report(kLineOutputMode, mode);
      return;
  }
}

}  // namespace

Status BuildReferenceStrings(uint32_t object, uint32_t listProperty, uint32_t nameProperty,
                             tReferenceOutput output, uint32_t mode, uint32_t qualify) {
  cReferenceArrayWork work;
  const Status listed = ReadHandleList<tDbPropertyCalls>(object, listProperty, kReferenceListSelf,
                                                        work.objects, work.count);
  Status status = PrepareOutput(output, mode, work.count);
  if (status < 0) return status;

  const uint32_t nameClass = ClassOfProperty(nameProperty);
  try {
    std::string location;
    if (qualify != 0 && nameClass != kClassDatabase && nameClass != kClassCluster &&
        work.count != 0)
      location = BuildLocationText(nameClass, work.objects[0]);
    for (uint32_t i = 0; i < work.count; ++i) {
      status = ReadName(work.objects[i], nameProperty, location, &work.scratch);
      if (work.scratch == nullptr) continue;
      if (status >= 0 && nameClass == kClassCluster)
        status = PrefixDatabaseName(work.objects[i], &work.scratch);
      if (status < 0) Text(work.scratch)->cnt = 0;
      StoreText(output, mode, i, &work.scratch);
    }
  } catch (const std::bad_alloc &) {
    return kvErrOutOfMemory;
  }
  return status != 0 ? status : listed;
}

std::string BuildLocationText(uint32_t objectClass, uint32_t object) {
  const uint32_t clusterRef = ClusterRefProperty(objectClass);
  if (clusterRef == 0) {
    Report(kLineLocationClass, objectClass);
    return std::string();
  }
  uint32_t cluster = 0, database = 0;
  tMallocBlock clusterName, databaseName;
  if (kvdbGetProperty(object, clusterRef, sizeof cluster, &cluster) < 0 ||
      kvdbGetProperty(cluster, kvPropClst_DatabaseRef, sizeof database, &database) < 0 ||
      ReadTextBlock<tDbPropertyCalls>(database, kvPropDatabase_Name, databaseName) < 0 ||
      ReadTextBlock<tDbPropertyCalls>(cluster, kvPropClst_Name, clusterName) < 0)
    return std::string();
  try {
    std::string location = '\n' + std::string(databaseName.get());
    if (clusterName.get()[0] != '\0' && std::strcmp(clusterName.get(), kDefaultCluster) != 0)
      location += '.' + std::string(clusterName.get());
    return location;
  } catch (const std::bad_alloc &) {
    return std::string();
  }
}

}  // namespace nKVSVAPI100
