// Properties of sessions and of system objects: kvGetPropertySize, kvGetProperty, kvSetProperty,
// kvGetSubProperty, kvSetSubProperty. The handle's top byte tells which kind of object it is.
#include <memory>
#include <optional>

#include "driver.h"
#include "driver_call.h"
#include "driver_export.h"
#include "kvsvplatform.h"
#include "session_properties.h"
#include "system_handles.h"
#include "system_properties.h"

using namespace nKvorSim;

namespace {

template <class OnSession, class OnSystemObject>
Status OnObject(uint32_t object, OnSession onSession, OnSystemObject onSystemObject) {
  Driver &driver = Driver::Instance();
  if (IsSystemClassHandle(object)) {
    const std::optional<SystemObject> resolved = driver.Systems().Resolve(object);
    if (!resolved) return kvsimErrInvalidObject;
    return onSystemObject(*resolved);
  }
  std::shared_ptr<Session> session;
  const Status status = driver.UseSession(object, &session);
  if (status != 0) return status;
  return onSession(*session);
}

CallArgs PropertyCall(const char *function, uint32_t object, uint32_t id, uint32_t size,
                      uint32_t index) {
  CallArgs args;
  args.function = function;
  args.object = object;
  args.propertyId = id;
  args.size1 = size;
  args.size2 = index;
  return args;
}

}  // namespace

KVOR_DRIVER_API int32_t kvGetPropertySize(uint32_t object, uint32_t id, uint32_t *size) {
  return RunDriverCall(
      PropertyCall("kvGetPropertySize", object, id, 0, 0), object, [&](CallArgs &) -> Status {
        return OnObject(
            object,
            [&](const Session &session) -> Status {
              return GetSessionPropertySize(session, id, size);
            },
            [&](const SystemObject &system) -> Status {
              if (size == nullptr) return kvsimErrNullPointer;
              const std::optional<PropertyValue> value = SystemObjectProperty(system, id);
              if (!value) return kvsimErrPropertyUnknown;
              *size = static_cast<uint32_t>(value->size());
              return 0;
            });
      });
}

KVOR_DRIVER_API int32_t kvGetProperty(uint32_t object, uint32_t id, uint32_t size, void *value) {
  return RunDriverCall(
      PropertyCall("kvGetProperty", object, id, size, 0), object, [&](CallArgs &) -> Status {
        return OnObject(
            object,
            [&](const Session &session) -> Status {
              return GetSessionProperty(session, id, size, value);
            },
            [&](const SystemObject &system) -> Status {
              const std::optional<PropertyValue> known = SystemObjectProperty(system, id);
              if (!known) return kvsimErrPropertyUnknown;
              return CopyValueOut(*known, size, value);
            });
      });
}

KVOR_DRIVER_API int32_t kvSetProperty(uint32_t object, uint32_t id, uint32_t size,
                                      const void *value) {
  return RunDriverCall(PropertyCall("kvSetProperty", object, id, size, 0), object,
                       [&](CallArgs &) -> Status {
                         return OnObject(
                             object,
                             [&](Session &session) -> Status {
                               return SetSessionProperty(session, id, size, value);
                             },
                             [&](const SystemObject &system) -> Status {
                               return SetSystemObjectProperty(system, id);
                             });
                       });
}

KVOR_DRIVER_API int32_t kvGetSubProperty(uint32_t object, uint32_t index, uint32_t id,
                                         uint32_t size, void *value) {
  return RunDriverCall(
      PropertyCall("kvGetSubProperty", object, id, size, index), object, [&](CallArgs &) -> Status {
        return OnObject(
            object,
            [&](const Session &session) -> Status {
              return GetSessionSubProperty(session, index, id, size, value);
            },
            [&](const SystemObject &) -> Status { return kvsimErrPropertyUnknown; });
      });
}

KVOR_DRIVER_API int32_t kvSetSubProperty(uint32_t object, uint32_t index, uint32_t id,
                                         uint32_t size, const void *value) {
  return RunDriverCall(
      PropertyCall("kvSetSubProperty", object, id, size, index), object, [&](CallArgs &) -> Status {
        return OnObject(
            object,
            [&](Session &session) -> Status {
              return SetSessionSubProperty(session, index, id, size, value);
            },
            [&](const SystemObject &) -> Status { return kvsimErrPropertyUnknown; });
      });
}
