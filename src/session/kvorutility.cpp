#include "session/kvorutility.h"

#include <dlfcn.h>

#include <mutex>

#include "core/host_handles.h"
#include "core/internal_error.h"
#include "kvsvapi.h"

namespace nKVSVAPI100 {

cRegistrationLock gRegistrationLock;
std::atomic<uint32_t> gReportImplicitClose{0};

cRegistrationLock::cRegistrationLock() : mutex(status) {}

namespace {

// What the host is told of each class: its name and the exports that open and close it.
struct tClassEntry {
  uint32_t objectClass;
  int32_t keep;
  const char *className;
  const char *openExport;
  const char *closeExport;
};

constexpr tClassEntry kClasses[] = {
    {kClassDatabase, 0, "KVOR Database", "kvsvdbDatabaseOpen", "kvsvdbDatabaseClose"},
    {kClassCluster, 1, "KVOR Cluster", "kvsvdbClusterOpen", "kvsvdbClusterClose"},
    {kClassFrame, 1, "KVOR Frame", "kvsvdbFrameOpen", "kvsvdbFrameClose"},
    {kClassSignal, 1, "KVOR Signal", "kvsvdbSignalOpen", "kvsvdbSignalClose"},
    {kClassSubframe, 1, "KVOR Subframe", "kvsvdbSubframeOpen", "kvsvdbSubframeClose"},
    {kClassEcu, 1, "KVOR ECU", "kvsvdbEcuOpen", "kvsvdbEcuClose"},
    {kClassLinSchedule, 1, "KVOR LIN Schedule", "kvsvdbLINSchedOpen", "kvsvdbLINSchedClose"},
    {kClassLinScheduleEntry, 1, "KVOR LIN Schedule Entry", "kvsvdbLINSchedEntryOpen",
     "kvsvdbLINSchedEntryClose"},
    {kClassPdu, 1, "KVOR PDU", "kvsvdbPDUOpen", "kvsvdbPDUClose"},
    {kClassSession, 1, "KVOR Session", "kvsvSessionOpen", "kvsvSessionClose"},
    {kClassSystem, 0, "KVOR System", "kvsvSystemOpen", "kvsvSystemClose"},
    {kClassDevice, 0, "KVOR Device", "kvsvDeviceOpen", "kvsvDeviceClose"},
    {kClassInterface, 0, "KVOR Interface", "kvsvInterfaceOpen", "kvsvInterfaceClose"},
};

constexpr char kKind[] = "kvor";
constexpr char kLibraryPattern[] = "kvsvapi.*";

// Protocol constants of the host's registration.
constexpr int32_t kRefKindVersion = 21;
constexpr int32_t kRefCookieSize = 8;
constexpr int32_t kRefLibraryCount = 1;

const tClassEntry *FindClass(uint32_t objectClass) {
  for (const tClassEntry &entry : kClasses)
    if (entry.objectClass == objectClass) return &entry;
  return nullptr;
}

Status Report(uint32_t line, uint32_t info) {
  return ReportInternalError(kComponentKvsvapi, nFile::kUtility, line, info);
}

// String handles made for one host call and disposed of on every way out.
template <std::size_t N>
class cTextHandles {
 public:
  cTextHandles() {
    for (SvHandle &h : handles_) h = nullptr;
  }
  ~cTextHandles() {
    for (SvHandle &h : handles_) DisposeHandle(&h);
  }
  // False if any handle or its block could not be made.
  bool Make() {
    for (SvHandle &h : handles_) {
      h = svNewHandleClr(8);
      if (h == nullptr || *h == nullptr) return false;
    }
    return true;
  }
  SvHandle operator[](std::size_t i) const { return handles_[i]; }

 private:
  SvHandle handles_[N];
};

bool Print(SvHandle handle, const char *text) { return svStrPrintf(handle, "%s", text) >= 0; }

// The host's by-name removal is not a link-time import: not every host has it. A found address
// is kept; a missing one is looked for again at the next call.
SvUnregisterRefByNameProc FindUnregisterByName() {
  static std::atomic<SvUnregisterRefByNameProc> found{nullptr};
  SvUnregisterRefByNameProc proc = found.load();
  if (proc == nullptr) {
    proc = reinterpret_cast<SvUnregisterRefByNameProc>(dlsym(RTLD_DEFAULT, "svUnregisterRefByName"));
    if (proc != nullptr) found.store(proc);
  }
  return proc;
}

}  // namespace

Status RegisterReference(uint32_t objectClass, SvHandle name, uint32_t handle,
                         SvRefnum *referenceOut) {
  enum { kKindText, kClassName, kOpenName, kCloseName, kPattern };
  cTextHandles<5> texts;
  if (!texts.Make() || !Print(texts[kKindText], kKind) || !Print(texts[kPattern], kLibraryPattern))
    return kvErrOutOfMemory;
  const tClassEntry *entry = FindClass(objectClass);
  if (entry == nullptr) return Report(2451, 0);
  if (!Print(texts[kClassName], entry->className) || !Print(texts[kOpenName], entry->openExport) ||
      !Print(texts[kCloseName], entry->closeExport))
    return kvErrOutOfMemory;
  if (gRegistrationLock.status.code < 0)
    return Report(2462, static_cast<uint32_t>(gRegistrationLock.status.code));

  std::lock_guard<cRecursiveMutex> lock(gRegistrationLock.mutex);
  Status status = svRegisterRefKind3(name, handle, texts[kKindText], texts[kClassName],
                                     kRefKindVersion, referenceOut, kRefCookieSize,
                                     texts[kPattern], kRefLibraryCount, texts[kOpenName],
                                     texts[kCloseName], 0, 0, entry->keep);
  if (status < 0) status = Report(2536, static_cast<uint32_t>(status));
  return status;
}

Status UnregisterReference(SvRefnum reference) {
  if (reference == 0) return 0;
  if (gRegistrationLock.status.code < 0)
    return Report(2579, static_cast<uint32_t>(gRegistrationLock.status.code));
  Status status;
  {
    std::lock_guard<cRecursiveMutex> lock(gRegistrationLock.mutex);
    status = svUnregisterRef(reference);
  }
  // A warning of the host is of no use to the program that removed the reference.
  return status < 0 ? Report(2596, static_cast<uint32_t>(status)) : 0;
}

Status UnregisterReferenceByName(uint32_t objectClass, const std::string *name) {
  enum { kName, kKindText, kClassName };
  cTextHandles<3> texts;
  if (!texts.Make()) return kvErrOutOfMemory;
  if (!Print(texts[kName], name != nullptr ? name->c_str() : "") || !Print(texts[kKindText], kKind))
    return kvErrOutOfMemory;
  const tClassEntry *entry = FindClass(objectClass);
  if (entry == nullptr) return Report(2719, 0);
  if (!Print(texts[kClassName], entry->className)) return kvErrOutOfMemory;
  if (gRegistrationLock.status.code < 0) {
    // This way out releases the lock it never took; a mutex that failed is never touched.
    gRegistrationLock.mutex.unlock();
    return Report(2730, static_cast<uint32_t>(gRegistrationLock.status.code));
  }

  std::lock_guard<cRecursiveMutex> lock(gRegistrationLock.mutex);
  const SvUnregisterRefByNameProc unregisterByName = FindUnregisterByName();
  if (unregisterByName == nullptr) return Report(2618, 0);
  Status status = unregisterByName(texts[kName], texts[kKindText], texts[kClassName],
                                   kRefKindVersion);
  if (status < 0) status = Report(2743, static_cast<uint32_t>(status));
  return status;
}

void CloseDispatch(uint32_t handle, uint32_t objectClass) {
  const bool report = gReportImplicitClose.load(std::memory_order_relaxed) != 0;
  switch (objectClass) {
    case kClassSession:
      kvsvSessionClose(handle);
      break;
    case kClassSystem:
      if (report) Report(2242, objectClass);
      kvsvSystemClose(handle);
      break;
    case kClassDevice:
      if (report) Report(2248, objectClass);
      kvsvDeviceClose(handle);
      break;
    case kClassInterface:
      if (report) Report(2254, objectClass);
      kvsvInterfaceClose(handle);
      break;
    case kClassDatabase:
    case kClassCluster:
    case kClassFrame:
    case kClassSignal:
    case kClassSubframe:
    case kClassEcu:
    case kClassLinSchedule:
    case kClassLinScheduleEntry:
    case kClassPdu:
      if (report) Report(2232, objectClass);
      kvsvdbAutoCloseDbObject(handle);
      break;
    case kClassBareDatabase:
      kvdbCloseDatabase(handle, 0);
      break;
    default:
      break;
  }
}

}  // namespace nKVSVAPI100
