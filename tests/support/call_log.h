// The driver stand-in's call log as the tests read it.
#ifndef KVSVAPI_TESTS_SUPPORT_CALL_LOG_H
#define KVSVAPI_TESTS_SUPPORT_CALL_LOG_H

#include <gtest/gtest.h>

#include <string>

#include "kvsim.h"

namespace kvsvtest {

// The latest logged call of `function`, or of any function for null; a failure if there is none.
inline kvsimCallRecord LastCall(const char *function = nullptr) {
  kvsimCallRecord record{};
  for (int32_t i = kvsimLogCount() - 1; i >= 0; --i) {
    if (kvsimLogEntry(i, &record) == 1 &&
        (function == nullptr || record.function == std::string(function))) {
      return record;
    }
  }
  ADD_FAILURE() << "no call of " << (function != nullptr ? function : "the driver");
  return kvsimCallRecord{};
}

}  // namespace kvsvtest

#endif
