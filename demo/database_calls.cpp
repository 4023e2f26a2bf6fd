#include "database_calls.h"

#include "svsim.h"

namespace kvsvdemo {

namespace {

tHeld Held(kvsvRefnum reference) {
  SvsimRefInfo info{};
  for (int32_t i = 0; svsimGetRef(i, &info) == 1; ++i) {
    if (info.cookie == reference) return {reference, info.handle, info.name};
  }
  return {reference, 0, {}};
}

}  // namespace

std::string HostText(SvHandle string) {
  char text[512] = {};
  const int32_t length = svsimReadString(string, text, sizeof text);
  return length < 0 ? std::string() : std::string(text);
}

std::vector<std::string> TakeStrings(SvHandle &array) {
  std::vector<std::string> strings;
  if (array == nullptr) return strings;
  const int32_t count = *static_cast<int32_t *>(*array);
  for (int32_t i = 0; i < count; ++i) {
    SvHandle &string = reinterpret_cast<SvHandle *>(static_cast<char *>(*array) + 8)[i];
    strings.push_back(HostText(string));
    if (string != nullptr) svDisposeHandle(string);
  }
  svDisposeHandle(array);
  array = nullptr;
  return strings;
}

bool cDatabaseCalls::Ok(const char *call, int32_t status) {
  if (status < 0 && status_ == 0) {
    failedCall_ = call;
    status_ = status;
  }
  return Going();
}

bool cDatabaseCalls::Open(uint32_t objectClass, const std::string &text, tHeld &held) {
  SvHandle name = svsimMakeString(text.c_str());
  kvsvRefnum reference = 0;
  const int32_t status = e_.dbManualOpen(objectClass, name, &reference);
  svDisposeHandle(name);
  held = Held(reference);
  return Ok("kvsvdbManualOpen", status);
}

bool cDatabaseCalls::Create(uint32_t parent, uint32_t objectClass, const char *name, tHeld &held) {
  kvsvRefnum reference = 0;
  const int32_t status = e_.dbCreateObject(parent, objectClass, name, &reference);
  held = Held(reference);
  return Ok("kvsvdbCreateObject", status);
}

bool cDatabaseCalls::CloseAll(const tHeld &held) {
  SvHandle name = svsimMakeString(held.name.c_str());
  const int32_t status = e_.dbManualClose(held.handle, name, held.reference, 1, nullptr, nullptr);
  svDisposeHandle(name);
  return Ok("kvsvdbManualClose", status);
}

}  // namespace kvsvdemo
