// Project session files as a user's project writes them, and opens as the host makes them.
#ifndef KVSVAPI_TESTS_SESSION_PROJECT_SESSION_SUPPORT_H
#define KVSVAPI_TESTS_SESSION_PROJECT_SESSION_SUPPORT_H

#include <filesystem>
#include <fstream>
#include <string>

#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "svsim.h"

namespace kvsvtest {

// One entry: the name line, the fields line and an empty third line, each ended by `end`.
inline std::string Entry(const std::string &name, const std::string &fields,
                         const std::string &end = "\n") {
  return name + end + fields + end + end;
}

inline void WriteText(const std::string &path, const std::string &text) {
  std::filesystem::create_directories(std::filesystem::path(path).parent_path());
  std::ofstream(path, std::ios::binary) << text;
}

// kvsvSessionOpen as the host calls it; the host always gets 0, so only the handle is kept.
inline uint32_t Open(const char *name) {
  uint32_t handle = 0;
  SvHandle text = svsimMakeString(name);
  if (kvsvSessionOpen(&text, &handle, 0) != 0) handle = 0;
  svDisposeHandle(text);
  return handle;
}

// What a use of the session gives: an error session answers with the failure it stands for.
inline int32_t UseStatus(uint32_t handle) {
  uint32_t size = 0;
  return kvGetPropertySize(handle, kvPropSession_IntfName, &size);
}

}  // namespace kvsvtest

#endif
