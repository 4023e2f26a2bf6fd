#include "session/open_project_session.h"

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <memory>
#include <new>

#include "core/host_handles.h"
#include "kvsvplatform.h"
#include "session/create_project_session.h"
#include "session/session_file_entry.h"
#include "session/session_file_fields.h"
#include "session/session_file_siblings.h"

namespace nKVSVAPI100 {

namespace {

// Names of this form belong to manually created sessions, which no file defines.
constexpr char kManualSessionPrefix[] = "___kvorSesn#";
// This library records its interfaces under the empty tag.
const std::string kLocalTag;

// The name's bytes are compared up to the first difference or NUL, whatever the count says, but
// never beyond the host's block.
bool IsManualSessionName(SvHandle name) {
  const size_t blockSize = svGetHandleSize(name);
  const size_t available = blockSize > offsetof(SvStr, str) ? blockSize - offsetof(SvStr, str) : 0;
  const auto *text = reinterpret_cast<const char *>(static_cast<const SvStr *>(*name)->str);
  const size_t compared = std::min(available, sizeof kManualSessionPrefix - 1);
  return compared == sizeof kManualSessionPrefix - 1 &&
         std::strncmp(text, kManualSessionPrefix, compared) == 0;
}

Status SessionName(SvHandle *nameRef, std::string &name) {
  if (nameRef == nullptr || *nameRef == nullptr || **nameRef == nullptr ||
      static_cast<const SvStr *>(**nameRef)->cnt == 0)
    return kvErrSessionNameEmpty;
  if (IsManualSessionName(*nameRef)) return kvErrManualSessionName;
  return StringFromSvStr(name, static_cast<const SvStr *>(**nameRef));
}

// A later open takes what the first open on the interface made.
Status Claim(cSnLifeManager &manager, const std::string &key, cSnLifeInterface &record,
             const std::string &name, uint32_t &handle) {
  const auto found = record.sessions.find(name);
  if (record.tag != kLocalTag) return kvErrInterfaceTagMismatch;
  if (found == record.sessions.end()) return kvErrSessionNotInInterface;
  cSnLifeSession *session = found->second;
  if (session->status < 0) {
    // Its failure is told once; after that the name is unknown to the record.
    const Status failure = session->status;
    delete session;
    record.sessions.erase(found);
    if (record.sessions.empty()) manager.EraseInterface(key);
    return failure;
  }
  if (session->state != cSnLifeSession::kCreated) return kvErrSessionAlreadyOpen;
  handle = session->handle;
  session->state = cSnLifeSession::kClaimed;
  return session->status;
}

// A sibling that cannot be made is recorded with its failure, which waits for whoever opens it.
// The opened name, and a name that the file repeats, have their record already.
void AddSibling(cSnLifeInterface &record, const char *name, const std::string &path) {
  uint32_t handle = 0;
  try {
    if (record.sessions.count(name) != 0) return;
    tSessionEntry entry;
    Status status = ReadSessionEntry(name, path.c_str(), entry);
    if (status >= 0) status = CreateProjectSession(entry, false, handle);
    std::unique_ptr<cSnLifeSession> session(new cSnLifeSession);
    session->state = handle != 0 ? cSnLifeSession::kCreated : cSnLifeSession::kGone;
    session->handle = handle;
    session->status = status;
    record.sessions.emplace(name, session.get());
    session.release();
  } catch (const std::bad_alloc &) {
    // Skipped: no record may hold a driver session that nothing can reach.
    if (handle != 0) kvClear(handle);
  }
}

// The first open on an interface: its session, its record and all its siblings.
Status CreateInterface(cSnLifeManager &manager, const std::string &key, const std::string &name,
                       const tSessionEntry &entry, const std::string &path, bool retry,
                       uint32_t &handle) {
  const Status status = CreateProjectSession(entry, retry, handle);
  if (status < 0) return status;
  cSnLifeInterface *record = nullptr;
  try {
    std::unique_ptr<cSnLifeInterface> made(new cSnLifeInterface);
    made->tag = kLocalTag;
    made->database = entry.Database();
    made->cluster = entry.Cluster();
    std::unique_ptr<cSnLifeSession> session(new cSnLifeSession);
    session->state = cSnLifeSession::kClaimed;
    session->handle = handle;
    session->status = status;
    made->sessions.emplace(name, session.get());
    session.release();
    manager.InsertInterface(key, made.get());
    record = made.release();
  } catch (const std::bad_alloc &) {
    kvClear(handle);
    handle = 0;
    return kvErrOutOfMemory;
  }

  tMallocBlock siblings;
  const Status listed = ListSiblingSessions(key.c_str(), record->database.c_str(),
                                            record->cluster.c_str(), path.c_str(), siblings);
  // The session and its record stay as they are: the open fails, but nothing is undone.
  if (listed < 0) {
    handle = 0;
    return listed;
  }
  for (const char *sibling = siblings.get(); *sibling != '\0';
       sibling += std::strlen(sibling) + 1)
    AddSibling(*record, sibling, path);
  return status;
}

}  // namespace

Status OpenProjectSession(cSnLifeManager &manager, SvHandle *nameRef, uint32_t *sessionOut,
                          const std::string &path, bool retry) {
  *sessionOut = 0;
  std::string name;
  Status status = SessionName(nameRef, name);
  if (status < 0) return status;
  tSessionEntry entry;
  status = ReadSessionEntry(name.c_str(), path.c_str(), entry);
  if (status < 0) return status;
  std::string key;
  try {
    key.assign(entry.Interface(), InterfaceKeyLength(entry.Interface()));
  } catch (const std::bad_alloc &) {
    return kvErrOutOfMemory;
  }

  uint32_t handle = 0;
  const auto found = manager.interfaces.find(key);
  status = found != manager.interfaces.end()
               ? Claim(manager, key, *found->second, name, handle)
               : CreateInterface(manager, key, name, entry, path, retry, handle);
  if (status < 0) return status;
  *sessionOut = handle;
  return status;
}

}  // namespace nKVSVAPI100
