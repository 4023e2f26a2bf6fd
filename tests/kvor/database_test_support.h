// Shared pieces of the database tests: where the field files lie, typed reads of database
// properties, and a description of a whole database built from its properties, to compare two
// databases object by object.
#ifndef KVOR_DATABASE_TEST_SUPPORT_H
#define KVOR_DATABASE_TEST_SUPPORT_H

#include <cstring>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include "kvor_test_support.h"
#include "paths/paths_test_support.h"

namespace kvsvtest {

inline std::string DbcPath(const std::string &file) { return std::string(KVSV_DBC_DIR) + "/" + file; }

inline const char *const kFieldFiles[] = {
    "tesla_can.dbc",          "toyota_2017_ref_pt.dbc",           "hyundai_2015_ccan.dbc",
    "hyundai_canfd.dbc",      "gm_global_a_lowspeed_1818125.dbc", "ford_fusion_2018_adas.dbc",
    "mazda_radar.dbc",
};

inline std::string ReadWholeFile(const std::string &path) {
  std::ifstream file(path, std::ios::binary);
  std::stringstream text;
  text << file.rdbuf();
  return text.str();
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

inline int32_t DbSetText(uint32_t object, uint32_t id, const std::string &text) {
  return kvdbSetProperty(object, id, static_cast<uint32_t>(text.size() + 1), text.c_str());
}

template <class T>
int32_t DbSet(uint32_t object, uint32_t id, T value) {
  return kvdbSetProperty(object, id, sizeof value, &value);
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

// Every property that the database file carries, of every object, as text: two databases with
// the same description hold the same objects.
inline std::string DescribeDatabase(uint32_t database) {
  std::ostringstream out;
  out.precision(17);
  const uint32_t cluster = DbCluster(database);
  out << "cluster " << DbText(cluster, kvPropClst_Name) << " "
      << DbRead<uint64_t>(cluster, kvPropClst_BaudRate64) << " "
      << DbText(cluster, kvPropClst_Comment) << "\n";
  for (uint32_t ecu : DbHandles(cluster, kvPropClst_ECURefs)) {
    out << "ecu " << DbText(ecu, kvPropECU_Name) << " '" << DbText(ecu, kvPropECU_Comment)
        << "' tx";
    for (uint32_t frame : DbHandles(ecu, kvPropECU_TxFrmRefs)) out << " " << DbText(frame, kvPropFrm_Name);
    out << " rx";
    for (uint32_t frame : DbHandles(ecu, kvPropECU_RxFrmRefs)) out << " " << DbText(frame, kvPropFrm_Name);
    out << "\n";
  }
  for (uint32_t frame : DbHandles(cluster, kvPropClst_FrmRefs)) {
    out << "frame " << DbText(frame, kvPropFrm_Name) << " " << DbRead<uint32_t>(frame, kvPropFrm_ID)
        << " ext " << DbBool(frame, kvPropFrm_CANExtID) << " len "
        << DbRead<uint32_t>(frame, kvPropFrm_PayloadLen) << " mode "
        << DbRead<uint32_t>(frame, kvPropFrm_CANioMode) << " tx "
        << DbRead<double>(frame, kvPropFrm_CANTxTime) << " '" << DbText(frame, kvPropFrm_Comment)
        << "' default";
    for (uint8_t byte : DbBytes(frame, kvPropFrm_DefaultPayload)) out << " " << int{byte};
    out << "\n";
    for (uint32_t signal : DbHandles(frame, kvPropFrm_SigRefs)) {
      out << "  signal " << DbText(signal, kvPropSig_Name) << " "
          << DbRead<uint32_t>(signal, kvPropSig_StartBit) << "|"
          << DbRead<uint32_t>(signal, kvPropSig_NumBits) << " order "
          << DbRead<uint32_t>(signal, kvPropSig_ByteOrdr) << " type "
          << DbRead<uint32_t>(signal, kvPropSig_DataType) << " ("
          << DbRead<double>(signal, kvPropSig_ScaleFac) << ","
          << DbRead<double>(signal, kvPropSig_ScaleOff) << ") ["
          << DbRead<double>(signal, kvPropSig_Min) << "|" << DbRead<double>(signal, kvPropSig_Max)
          << "] default " << DbRead<double>(signal, kvPropSig_Default) << " '"
          << DbText(signal, kvPropSig_Unit) << "' mux " << DbBool(signal, kvPropSig_MuxIsDataMux)
          << DbBool(signal, kvPropSig_MuxIsDynamic) << " "
          << DbRead<uint32_t>(signal, kvPropSig_MuxValue) << " '"
          << DbText(signal, kvPropSig_Comment) << "'\n";
    }
  }
  return out.str();
}

}  // namespace kvsvtest

#endif
