// The reference texts of database objects as the host holds them: the object's name, and behind
// it a line feed and "database.cluster" (the database alone for the cluster named "Cluster"), so
// that the object can be found again without its database being open.
#ifndef KVSVAPI_SESSION_DB_REFERENCE_STRINGS_H
#define KVSVAPI_SESSION_DB_REFERENCE_STRINGS_H

#include <cstdint>
#include <string>

#include "core/status.h"
#include "kvsvplatform.h"

namespace nKVSVAPI100 {

// Where the texts go.
enum eReferenceOutput : uint32_t {
  kReferenceArray = 0,     // a new array of strings at *handle, the old one disposed of
  kReferenceString = 1,    // one string at *handle, the old one disposed of
  kReferenceVariants = 2,  // appended to the array of references at *handle as their names
  kReferenceText = 3       // into *text, separated by ','
};

// Cluster references that the driver serves without a name of their own.
constexpr uint32_t kSignalClusterRef = 0x05030034u;
constexpr uint32_t kSubframeClusterRef = 0x05040006u;
constexpr uint32_t kLinScheduleEntryClusterRef = 0x05070009u;

// The list property that stands for the object alone.
constexpr uint32_t kReferenceListSelf = 0xFFFFFFFFu;

struct tReferenceOutput {
  SvHandle *handle = nullptr;
  std::string *text = nullptr;
};

// The texts of the objects that `listProperty` of `object` lists (or of `object` alone), each
// its `nameProperty`, a cluster's prefixed with its database's name. `qualify` non-zero adds the
// location of the first object to every name, for objects inside a cluster. A failure at one
// object leaves its text empty and the others go on; the result is the last status, or the list
// read's if that is 0.
Status BuildReferenceStrings(uint32_t object, uint32_t listProperty, uint32_t nameProperty,
                             tReferenceOutput output, uint32_t mode, uint32_t qualify);

// The text that follows the name of `object` of `objectClass` in its reference: a line feed, the
// database's name and, unless the cluster is named "Cluster", '.' and the cluster's name. Empty
// on any failure.
std::string BuildLocationText(uint32_t objectClass, uint32_t object);

}  // namespace nKVSVAPI100

#endif
