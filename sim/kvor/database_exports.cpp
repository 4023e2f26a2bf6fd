// Databases: kvdbOpenDatabase, kvdbCloseDatabase, kvdbFindObject, kvdbCreateObject,
// kvdbDeleteObject, kvdbGetPropertySize, kvdbGetProperty, kvdbSetProperty, kvdbSaveDatabase,
// kvdbAddAlias, kvdbAddAlias64, kvdbRemoveAlias, kvdbGetDatabaseListSizes, kvdbGetDatabaseList,
// kvdbMerge, kvdbDeploy, kvdbUndeploy, kvdbGetDBCAttributeSize, kvdbGetDBCAttribute,
// kvhdndbCreateErrorObject, kvhdndbGetDatabaseRefFromObjRef, kvhdndbOpenDatabaseByRef.
#include <cstdio>

#include "driver.h"
#include "driver_call.h"
#include "driver_export.h"
#include "kvsvplatform.h"

using namespace nKvorSim;

namespace {

CallArgs DatabaseCall(const char *function, uint32_t object, uint32_t propertyId = 0,
                      uint32_t size1 = 0, const char *text = nullptr) {
  CallArgs args;
  args.function = function;
  args.object = object;
  args.propertyId = propertyId;
  args.size1 = size1;
  if (text != nullptr) std::snprintf(args.text, sizeof args.text, "%s", text);
  return args;
}

// A call on an object: an error session or error object given in its place answers with its
// failure, as every call on an object does.
template <class Body>
Status OnObject(uint32_t object, Body body) {
  Driver &driver = Driver::Instance();
  if (const Status failure = driver.ErrorSessionStatus(object)) return failure;
  if (const Status failure = driver.Databases().ErrorObjectStatus(object)) return failure;
  return body(driver.Databases());
}

}  // namespace

KVOR_DRIVER_API int32_t kvdbOpenDatabase(const char *name, uint32_t *database) {
  return RunDriverCall(DatabaseCall("kvdbOpenDatabase", 0, 0, 0, name), 0,
                       [&](CallArgs &args) -> Status {
                         const Status status = Driver::Instance().Databases().Open(name, database);
                         if (status == 0) args.object = *database;
                         return status;
                       });
}

KVOR_DRIVER_API int32_t kvdbCloseDatabase(uint32_t database, uint32_t closeAll) {
  return RunDriverCall(DatabaseCall("kvdbCloseDatabase", database, 0, closeAll), 0,
                       [&](CallArgs &) -> Status {
                         // The failure an error object stands for was reported at each use.
                         if (Driver::Instance().Databases().CloseErrorObject(database)) return 0;
                         return OnObject(database, [&](DatabaseRegistry &databases) {
                           return databases.Close(database, closeAll);
                         });
                       });
}

KVOR_DRIVER_API int32_t kvdbFindObject(uint32_t parent, uint32_t objectClass, const char *name,
                                       uint32_t *object) {
  return RunDriverCall(DatabaseCall("kvdbFindObject", parent, 0, objectClass, name), 0,
                       [&](CallArgs &) -> Status {
                         return OnObject(parent, [&](DatabaseRegistry &databases) {
                           return databases.FindObject(parent, objectClass, name, object);
                         });
                       });
}

KVOR_DRIVER_API int32_t kvdbCreateObject(uint32_t parent, uint32_t objectClass, const char *name,
                                         uint32_t *object) {
  return RunDriverCall(DatabaseCall("kvdbCreateObject", parent, 0, objectClass, name), 0,
                       [&](CallArgs &) -> Status {
                         return OnObject(parent, [&](DatabaseRegistry &databases) {
                           return databases.CreateObject(parent, objectClass, name, object);
                         });
                       });
}

KVOR_DRIVER_API int32_t kvdbDeleteObject(uint32_t object) {
  return RunDriverCall(DatabaseCall("kvdbDeleteObject", object), 0, [&](CallArgs &) -> Status {
    return OnObject(object,
                    [&](DatabaseRegistry &databases) { return databases.DeleteObject(object); });
  });
}

KVOR_DRIVER_API int32_t kvdbGetPropertySize(uint32_t object, uint32_t id, uint32_t *size) {
  return RunDriverCall(DatabaseCall("kvdbGetPropertySize", object, id), 0,
                       [&](CallArgs &) -> Status {
                         return OnObject(object, [&](DatabaseRegistry &databases) {
                           return databases.GetPropertySize(object, id, size);
                         });
                       });
}

KVOR_DRIVER_API int32_t kvdbGetProperty(uint32_t object, uint32_t id, uint32_t size,
                                        void *value) {
  return RunDriverCall(DatabaseCall("kvdbGetProperty", object, id, size), 0,
                       [&](CallArgs &) -> Status {
                         return OnObject(object, [&](DatabaseRegistry &databases) {
                           return databases.GetProperty(object, id, size, value);
                         });
                       });
}

KVOR_DRIVER_API int32_t kvdbSetProperty(uint32_t object, uint32_t id, uint32_t size,
                                        const void *value) {
  return RunDriverCall(DatabaseCall("kvdbSetProperty", object, id, size), 0,
                       [&](CallArgs &) -> Status {
                         return OnObject(object, [&](DatabaseRegistry &databases) {
                           return databases.SetProperty(object, id, size, value);
                         });
                       });
}

KVOR_DRIVER_API int32_t kvdbSaveDatabase(uint32_t database, const char *filePath) {
  return RunDriverCall(DatabaseCall("kvdbSaveDatabase", database, 0, 0, filePath), 0,
                       [&](CallArgs &) -> Status {
                         return OnObject(database, [&](DatabaseRegistry &databases) {
                           return databases.Save(database, filePath);
                         });
                       });
}

KVOR_DRIVER_API int32_t kvdbAddAlias64(const char *alias, const char *filePath,
                                       uint64_t defaultBaudRate) {
  return RunDriverCall(DatabaseCall("kvdbAddAlias64", 0, 0, 0, alias), 0,
                       [&](CallArgs &) -> Status {
                         return Driver::Instance().Databases().AddAlias(alias, filePath,
                                                                        defaultBaudRate);
                       });
}

KVOR_DRIVER_API int32_t kvdbAddAlias(const char *alias, const char *filePath,
                                     uint32_t defaultBaudRate) {
  return RunDriverCall(DatabaseCall("kvdbAddAlias", 0, 0, defaultBaudRate, alias), 0,
                       [&](CallArgs &) -> Status {
                         return Driver::Instance().Databases().AddAlias(alias, filePath,
                                                                        defaultBaudRate);
                       });
}

KVOR_DRIVER_API int32_t kvdbRemoveAlias(const char *alias) {
  return RunDriverCall(DatabaseCall("kvdbRemoveAlias", 0, 0, 0, alias), 0,
                       [&](CallArgs &) -> Status {
                         return Driver::Instance().Databases().RemoveAlias(alias);
                       });
}

KVOR_DRIVER_API int32_t kvdbGetDatabaseListSizes(uint64_t target, uint32_t *aliasesSize,
                                                 uint32_t *pathsSize) {
  return RunDriverCall(DatabaseCall("kvdbGetDatabaseListSizes", 0), 0, [&](CallArgs &) -> Status {
    return Driver::Instance().Databases().GetListSizes(target, aliasesSize, pathsSize);
  });
}

KVOR_DRIVER_API int32_t kvdbGetDatabaseList(uint64_t target, uint32_t aliasesSize, char *aliases,
                                            uint32_t pathsSize, char *paths, uint32_t *count) {
  CallArgs args = DatabaseCall("kvdbGetDatabaseList", 0, 0, aliasesSize);
  args.size2 = pathsSize;
  return RunDriverCall(args, 0, [&](CallArgs &) -> Status {
    return Driver::Instance().Databases().GetList(target, aliasesSize, aliases, pathsSize, paths,
                                                  count);
  });
}

KVOR_DRIVER_API int32_t kvhdndbCreateErrorObject(int32_t status, uint32_t *object) {
  CallArgs args = DatabaseCall("kvhdndbCreateErrorObject", 0, 0, static_cast<uint32_t>(status));
  return RunDriverCall(args, 0, [&](CallArgs &call) -> Status {
    const Status made = Driver::Instance().Databases().CreateErrorObject(status, object);
    if (made == 0) call.object = *object;
    return made;
  });
}

KVOR_DRIVER_API int32_t kvhdndbGetDatabaseRefFromObjRef(uint32_t object, uint32_t *database) {
  return RunDriverCall(DatabaseCall("kvhdndbGetDatabaseRefFromObjRef", object), 0,
                       [&](CallArgs &) -> Status {
                         return OnObject(object, [&](DatabaseRegistry &databases) {
                           return databases.DatabaseOf(object, database);
                         });
                       });
}

KVOR_DRIVER_API int32_t kvhdndbOpenDatabaseByRef(uint32_t handle) {
  return RunDriverCall(DatabaseCall("kvhdndbOpenDatabaseByRef", handle), 0,
                       [&](CallArgs &) -> Status {
                         return OnObject(handle, [&](DatabaseRegistry &databases) {
                           return databases.OpenByRef(handle);
                         });
                       });
}

KVOR_DRIVER_API int32_t kvdbMerge(uint32_t target, uint32_t source, uint32_t copyMode,
                                  const char *prefix, uint32_t, uint32_t *percentComplete) {
  CallArgs args = DatabaseCall("kvdbMerge", target, 0, copyMode, prefix);
  args.size2 = source;
  return RunDriverCall(args, 0, [&](CallArgs &) -> Status {
    if (const Status failure = Driver::Instance().Databases().ErrorObjectStatus(source)) {
      return failure;
    }
    return OnObject(target, [&](DatabaseRegistry &databases) {
      const Status status = databases.Merge(target, source, copyMode, prefix);
      if (status == 0 && percentComplete != nullptr) *percentComplete = 100;
      return status;
    });
  });
}

KVOR_DRIVER_API int32_t kvdbDeploy(const char *ipAddress, const char *alias, uint32_t,
                                   uint32_t *percentComplete) {
  return RunDriverCall(DatabaseCall("kvdbDeploy", 0, 0, 0, alias), 0, [&](CallArgs &) -> Status {
    const Status status = Driver::Instance().Databases().Deploy(ipAddress, alias);
    if (status == 0 && percentComplete != nullptr) *percentComplete = 100;
    return status;
  });
}

KVOR_DRIVER_API int32_t kvdbUndeploy(const char *ipAddress, const char *alias) {
  return RunDriverCall(DatabaseCall("kvdbUndeploy", 0, 0, 0, alias), 0, [&](CallArgs &) -> Status {
    return Driver::Instance().Databases().Undeploy(ipAddress, alias);
  });
}

KVOR_DRIVER_API int32_t kvdbGetDBCAttributeSize(uint32_t object, uint32_t mode, const char *name,
                                                uint32_t *size) {
  return RunDriverCall(DatabaseCall("kvdbGetDBCAttributeSize", object, 0, mode, name), 0,
                       [&](CallArgs &) -> Status {
                         return OnObject(object, [&](DatabaseRegistry &databases) {
                           return databases.GetDbcAttributeSize(object, mode, name, size);
                         });
                       });
}

KVOR_DRIVER_API int32_t kvdbGetDBCAttribute(uint32_t object, uint32_t mode, const char *name,
                                            uint32_t size, char *value, uint32_t *isDefault) {
  CallArgs args = DatabaseCall("kvdbGetDBCAttribute", object, 0, mode, name);
  args.size2 = size;
  return RunDriverCall(args, 0, [&](CallArgs &) -> Status {
    return OnObject(object, [&](DatabaseRegistry &databases) {
      return databases.GetDbcAttribute(object, mode, name, size, value, isDefault);
    });
  });
}
