#include "property/property_name_list.h"

#include "property/property_value_io.h"
#include "session/name_list.h"

namespace nKVSVAPI100 {

Status EnsurePropertyNameList(uint32_t session, uint32_t id, cNameList *&list) {
  if (list != nullptr) return 0;
  tMallocBlock text;
  const Status status = ReadTextBlock<tSessionPropertyCalls>(session, id, text);
  if (status < 0) return status;
  list = new cNameList(text.get());
  return 0;
}

}  // namespace nKVSVAPI100
