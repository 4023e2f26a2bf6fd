// A new object in a database, registered with the host under its reference text. The host always
// gets a reference: one that stands for no object carries a failed create to its first use.
#include <cstdint>

#include "core/host_handles.h"
#include "core/internal_error.h"
#include "core/status.h"
#include "database/db_life_manager.h"
#include "kvorproperties.h"
#include "kvsvapi.h"
#include "session/db_reference_strings.h"
#include "session/kvorutility.h"
#include "session/object_class.h"

using namespace nKVSVAPI100;

namespace {

constexpr uint32_t kLineUnknownClass = 546;

// The handle of an object that could not be created, and the name prefix of its reference.
constexpr uint32_t kInvalidObject = 0x0FFFFFFFu;
constexpr char kInvalidPrefix[] = "___kvorInvalid__";

// The property that names an object of each class in its reference: unique within the cluster
// for the classes whose names are unique only within their frame or schedule.
Status NameProperty(uint32_t objectClass, uint32_t *nameId) {
  switch (objectClass) {
    case kClassDatabase: *nameId = kvPropDatabase_Name; return 0;
    case kClassCluster: *nameId = kvPropClst_Name; return 0;
    case kClassFrame: *nameId = kvPropFrm_Name; return 0;
    case kClassSignal: *nameId = kvPropSig_NameUniqueToCluster; return 0;
    case kClassSubframe: *nameId = kvPropSubfrm_NameUniqueToCluster; return 0;
    case kClassEcu: *nameId = kvPropECU_Name; return 0;
    case kClassLinSchedule: *nameId = kvPropLINSched_Name; return 0;
    case kClassLinScheduleEntry: *nameId = kvPropLINSchedEntry_NameUniqueToCluster; return 0;
    case kClassPdu: *nameId = kvPropPDU_Name; return 0;
    default:
      *nameId = 0;
      return ReportInternalError(kComponentKvsvapi, nFile::kDatabaseExports, kLineUnknownClass,
                                 objectClass);
  }
}

// Creates the object, names it and enters it in the account. The object goes to `*object` once
// created.
Status CreateAndAccount(uint32_t parent, uint32_t objectClass, const char *name, uint32_t nameId,
                        SvHandle *text, uint32_t *object) {
  uint32_t database = 0;
  Status status = kvhdndbGetDatabaseRefFromObjRef(parent, &database);
  if (status < 0) return status;
  status = kvdbCreateObject(parent, objectClass, name, object);
  if (status < 0) return status;
  tReferenceOutput output;
  output.handle = text;
  status = BuildReferenceStrings(*object, kReferenceListSelf, nameId, output, kReferenceString, 1);
  if (status < 0) return status;
  cDbLifeManager &manager = GetDbLifeManager();
  manager.FindByName(*text, nullptr);
  tDbObject account{*object, database, objectClass, 0};
  return manager.AddObject(*text, account, status, kDbOpenUndecided);
}

// Registers `handle` under `text`; a refused registration undoes the object's account and the
// object itself.
Status RegisterCreated(uint32_t objectClass, SvHandle text, uint32_t handle,
                       kvsvRefnum *reference) {
  const Status registered = RegisterReference(objectClass, text, handle, reference);
  if (registered >= 0) return kvhdndbOpenDatabaseByRef(handle);
  GetDbLifeManager().ReleaseByName(text, handle, nullptr);
  kvdbDeleteObject(handle);
  return registered;
}

}  // namespace

extern "C" KVSV_EXPORT kvsvStatus kvsvdbCreateObject(uint32_t parent, uint32_t objectClass,
                                                     const char *name, kvsvRefnum *reference) {
  struct tOwnedText {
    ~tOwnedText() { DisposeHandle(&handle); }
    SvHandle handle = nullptr;
  } text;
  uint32_t nameId = 0;
  uint32_t object = 0;
  Status status = NameProperty(objectClass, &nameId);
  if (status >= 0) {
    status = CreateAndAccount(parent, objectClass, name, nameId, &text.handle, &object);
    if (status >= 0) return RegisterCreated(objectClass, text.handle, object, reference);
  }

  // The reference stands for no object; its name still says which one was wanted.
  if (text.handle == nullptr && ResizeOrCreateHandle(&text.handle, 8) < 0) return kvErrOutOfMemory;
  if (svStrPrintf(text.handle, "%s%s", kInvalidPrefix, name != nullptr ? name : "") < 0)
    return kvErrOutOfMemory;
  const Status registered = RegisterReference(objectClass, text.handle, kInvalidObject, reference);
  if (status < 0) return status;
  // A failure that is no error, such as a report that let the create go on.
  if (registered >= 0) return kvhdndbOpenDatabaseByRef(kInvalidObject);
  GetDbLifeManager().ReleaseByName(text.handle, kInvalidObject, nullptr);
  kvdbDeleteObject(kInvalidObject);
  return registered;
}
