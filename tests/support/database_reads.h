// Where the field database files lie, and typed reads of database objects through the driver's
// database calls, each a failure of the test when the driver refuses it.
#ifndef KVSV_TESTS_SUPPORT_DATABASE_READS_H
#define KVSV_TESTS_SUPPORT_DATABASE_READS_H

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "kvsim.h"
#include "kvsvplatform.h"

namespace kvsvtest {

inline std::string DbcPath(const std::string &file) {
  return std::string(KVSV_DBC_DIR) + "/" + file;
}

inline std::string DatabaseErrorText() {
  char text[512];
  kvsimDatabaseErrorText(text, sizeof text);
  return text;
}

inline uint32_t OpenDatabase(const std::string &name) {
  uint32_t handle = 0;
  const int32_t status = kvdbOpenDatabase(name.c_str(), &handle);
  EXPECT_EQ(status, 0) << name << ": " << DatabaseErrorText();
  return handle;
}

template <class T>
T DbRead(uint32_t object, uint32_t id) {
  T value{};
  EXPECT_EQ(kvdbGetProperty(object, id, sizeof value, &value), 0) << std::hex << id;
  return value;
}

inline bool DbBool(uint32_t object, uint32_t id) { return DbRead<uint8_t>(object, id) != 0; }

inline std::vector<uint8_t> DbBytes(uint32_t object, uint32_t id) {
  uint32_t size = 0;
  EXPECT_EQ(kvdbGetPropertySize(object, id, &size), 0) << std::hex << id;
  std::vector<uint8_t> bytes(size);
  if (size != 0) {
    EXPECT_EQ(kvdbGetProperty(object, id, size, bytes.data()), 0) << std::hex << id;
  }
  return bytes;
}

inline std::string DbText(uint32_t object, uint32_t id) {
  const std::vector<uint8_t> bytes = DbBytes(object, id);
  if (bytes.empty() || bytes.back() != 0) return "<not text>";
  return std::string(reinterpret_cast<const char *>(bytes.data()));
}

inline std::vector<uint32_t> DbHandles(uint32_t object, uint32_t id) {
  const std::vector<uint8_t> bytes = DbBytes(object, id);
  std::vector<uint32_t> handles(bytes.size() / 4);
  if (!handles.empty()) std::memcpy(handles.data(), bytes.data(), handles.size() * 4);
  return handles;
}

inline uint32_t DbFind(uint32_t parent, uint32_t objectClass, const std::string &name) {
  uint32_t object = 0;
  EXPECT_EQ(kvdbFindObject(parent, objectClass, name.c_str(), &object), 0) << name;
  return object;
}

// The one cluster of a database read from a file.
inline uint32_t DbCluster(uint32_t database) {
  const std::vector<uint32_t> clusters = DbHandles(database, kvPropDatabase_ClstRefs);
  EXPECT_EQ(clusters.size(), 1u);
  return clusters.empty() ? 0 : clusters[0];
}

}  // namespace kvsvtest

#endif
