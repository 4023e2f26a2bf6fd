// Database files from the field: each loads with the frames and signals its text holds, and a
// save followed by a load gives the same objects. Opening by path, alias and directory, the
// in-memory database, and the counting of opens and closes.
#include <regex>

#include "database_test_support.h"

namespace {

using namespace kvsvtest;
using KvorDatabaseFiles = KvorTest;

// Counted from the text itself: frames start a line with "BO_ ", signals are indented "SG_ ".
struct tTextCounts {
  size_t frames = 0;
  size_t signals = 0;
};

tTextCounts CountInText(const std::string &text) {
  tTextCounts counts;
  std::istringstream lines(text);
  const std::regex frame("^BO_ "), signal("^[ \t]+SG_ ");
  for (std::string line; std::getline(lines, line);) {
    if (std::regex_search(line, frame)) ++counts.frames;
    if (std::regex_search(line, signal)) ++counts.signals;
  }
  return counts;
}

TEST_F(KvorDatabaseFiles, EveryFieldFileLoadsWithTheCountsOfItsText) {
  // The message counts that the files' own README gives.
  const size_t readmeFrames[] = {44, 143, 113, 88, 367, 64, 9};
  for (size_t i = 0; i < std::size(kFieldFiles); ++i) {
    const std::string path = DbcPath(kFieldFiles[i]);
    const tTextCounts expected = CountInText(ReadWholeFile(path));
    ASSERT_EQ(expected.frames, readmeFrames[i]) << path;
    const uint32_t database = OpenDatabase(path);
    ASSERT_NE(database, 0u) << path;
    const uint32_t cluster = DbCluster(database);
    EXPECT_EQ(DbHandles(cluster, kvPropClst_FrmRefs).size(), expected.frames) << path;
    EXPECT_EQ(DbHandles(cluster, kvPropClst_PDURefs).size(), expected.frames) << path;
    EXPECT_EQ(DbHandles(cluster, kvPropClst_SigRefs).size(), expected.signals) << path;
    EXPECT_EQ(DbText(database, kvPropDatabase_Name), path);
    EXPECT_EQ(kvdbCloseDatabase(database, 0), 0);
  }
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 0);
}

TEST_F(KvorDatabaseFiles, SaveThenLoadGivesTheSameObjects) {
  cTempDir directory;
  for (const char *file : kFieldFiles) {
    const uint32_t original = OpenDatabase(DbcPath(file));
    const std::string before = DescribeDatabase(original);
    const std::string copy = directory.Sub(file);
    ASSERT_EQ(kvdbSaveDatabase(original, copy.c_str()), 0) << DatabaseErrorText();
    const uint32_t reloaded = OpenDatabase(copy);
    ASSERT_NE(reloaded, original) << "a copy in another file is another database";
    EXPECT_EQ(DescribeDatabase(reloaded), before) << file;
    // Writing what was read back gives the very same text.
    const std::string again = copy + ".again";
    ASSERT_EQ(kvdbSaveDatabase(reloaded, again.c_str()), 0);
    EXPECT_EQ(ReadWholeFile(again), ReadWholeFile(copy)) << file;
  }
}

TEST_F(KvorDatabaseFiles, OneFileByAnyNameIsOneDatabaseUntilClosedAsOftenAsOpened) {
  cTempDir directory;
  directory.WriteFile("small.dbc", ReadWholeFile(DbcPath("mazda_radar.dbc")));
  cScopedEnv databaseDir("KVSIM_DATABASE_DIR", directory.Path());
  ASSERT_EQ(kvdbAddAlias("Radar", "small.dbc", 250000), 0) << DatabaseErrorText();

  const uint32_t byPath = OpenDatabase("Radar");
  EXPECT_EQ(OpenDatabase("small.dbc"), byPath);
  EXPECT_EQ(OpenDatabase(directory.Sub("small.dbc")), byPath);
  EXPECT_EQ(DbText(byPath, kvPropDatabase_Name), "Radar") << "the first name";
  EXPECT_EQ(DbRead<uint32_t>(DbCluster(byPath), kvPropClst_BaudRate), 250000u)
      << "the file gives no baud rate, so the alias's holds";
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 1);

  // Three opens: an object handle's close counts as one of them.
  const uint32_t frame = DbHandles(DbCluster(byPath), kvPropClst_FrmRefs).at(0);
  EXPECT_EQ(kvdbCloseDatabase(byPath, 0), 0);
  EXPECT_EQ(kvdbCloseDatabase(frame, 0), 0);
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 1);
  EXPECT_EQ(kvdbCloseDatabase(byPath, 0), 0);
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 0);
  uint32_t size = 0;
  EXPECT_EQ(kvdbGetPropertySize(frame, kvPropFrm_Name, &size), kvsimErrInvalidDatabase);
  EXPECT_EQ(kvdbCloseDatabase(byPath, 0), kvsimErrInvalidDatabase);

  // closeAll unloads whatever the count.
  const uint32_t again = OpenDatabase("Radar");
  OpenDatabase("Radar");
  EXPECT_EQ(kvdbCloseDatabase(again, 1), 0);
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 0);
}

TEST_F(KvorDatabaseFiles, NamesThatStandForNoFileAreNotFound) {
  cTempDir directory;
  cScopedEnv databaseDir("KVSIM_DATABASE_DIR", directory.Path());
  uint32_t handle = 0x5A5A5A5A;
  for (const char *name : {"", "missing.dbc", "/no/such/dir/x.dbc", "NoAlias"}) {
    EXPECT_EQ(kvdbOpenDatabase(name, &handle), kvsimErrDatabaseNotFound) << name;
    EXPECT_EQ(handle, 0x5A5A5A5Au) << "the output stays untouched";
  }
  EXPECT_NE(DatabaseErrorText().find("NoAlias"), std::string::npos) << DatabaseErrorText();
  EXPECT_EQ(kvdbOpenDatabase(nullptr, &handle), kvsimErrNullPointer);
  EXPECT_EQ(kvdbAddAlias("A", "missing.dbc", 0), kvsimErrDatabaseNotFound);
  EXPECT_EQ(kvdbAddAlias("A,B", DbcPath("mazda_radar.dbc").c_str(), 0), kvsimErrInvalidName);
  EXPECT_EQ(kvdbRemoveAlias("A"), kvsimErrDatabaseNotFound);
}

TEST_F(KvorDatabaseFiles, AliasesAreListedWithTheirFiles) {
  ASSERT_EQ(kvdbAddAlias("Tesla", DbcPath("tesla_can.dbc").c_str(), 500000), 0);
  ASSERT_EQ(kvdbAddAlias64("Mazda", DbcPath("mazda_radar.dbc").c_str(), 1000000), 0);
  uint32_t aliasesSize = 0, pathsSize = 0, count = 0;
  ASSERT_EQ(kvdbGetDatabaseListSizes(0, &aliasesSize, &pathsSize), 0);
  std::vector<char> aliases(aliasesSize), paths(pathsSize);
  ASSERT_EQ(kvdbGetDatabaseList(0, aliasesSize, aliases.data(), pathsSize, paths.data(), &count), 0);
  EXPECT_EQ(count, 2u);
  EXPECT_STREQ(aliases.data(), "Mazda,Tesla");
  EXPECT_NE(std::string(paths.data()).find("mazda_radar.dbc,"), std::string::npos) << paths.data();
  // The list grew after its sizes were read.
  ASSERT_EQ(kvdbAddAlias("Zed", DbcPath("mazda_radar.dbc").c_str(), 0), 0);
  EXPECT_EQ(kvdbGetDatabaseList(0, aliasesSize, aliases.data(), pathsSize, paths.data(), &count),
            kvErrDatabaseListChanged);
  EXPECT_EQ(kvdbGetDatabaseListSizes(7, &aliasesSize, &pathsSize), kvsimErrInvalidArgument);
  ASSERT_EQ(kvdbRemoveAlias("Zed"), 0);
  uint32_t handle = 0;
  EXPECT_EQ(kvdbOpenDatabase("Zed", &handle), kvsimErrDatabaseNotFound);
}

TEST_F(KvorDatabaseFiles, TheInMemoryDatabaseIsBuiltAndSaved) {
  cTempDir directory;
  const uint32_t memory = OpenDatabase(":memory:");
  EXPECT_TRUE(DbHandles(memory, kvPropDatabase_ClstRefs).empty());
  EXPECT_EQ(kvdbSaveDatabase(memory, nullptr), kvsimErrDatabaseWrite) << "no file to go back to";
  EXPECT_EQ(kvdbSaveDatabase(memory, directory.Sub("none.dbc").c_str()), kvsimErrDatabaseWrite)
      << "a database file holds one cluster";

  uint32_t cluster = 0, frame = 0, signal = 0, ecu = 0;
  ASSERT_EQ(kvdbCreateObject(memory, 0x10000, "Body", &cluster), 0);
  ASSERT_EQ(kvdbCreateObject(cluster, 0x50000, "Gateway", &ecu), 0);
  ASSERT_EQ(kvdbCreateObject(cluster, 0x20000, "Doors", &frame), 0);
  ASSERT_EQ(kvdbCreateObject(frame, 0x30000, "DoorOpen", &signal), 0);
  const double scale = 0.5;
  const uint32_t id = 0x18FF0011, start = 9;
  const uint8_t extended = 1;
  ASSERT_EQ(kvdbSetProperty(frame, kvPropFrm_CANExtID, 1, &extended), 0);
  ASSERT_EQ(kvdbSetProperty(frame, kvPropFrm_ID, 4, &id), 0);
  ASSERT_EQ(kvdbSetProperty(signal, kvPropSig_StartBit, 4, &start), 0);
  ASSERT_EQ(kvdbSetProperty(signal, kvPropSig_ScaleFac, 8, &scale), 0);
  ASSERT_EQ(DbSetText(signal, kvPropSig_Comment, "say \"hi\"\\"), 0);
  const std::string before = DescribeDatabase(memory);

  const std::string file = directory.Sub("built.dbc");
  ASSERT_EQ(kvdbSaveDatabase(memory, file.c_str()), 0) << DatabaseErrorText();
  EXPECT_EQ(DescribeDatabase(OpenDatabase(file)), before);
  EXPECT_EQ(OpenDatabase(":memory:"), memory) << "the one in-memory database, opened again";
  EXPECT_EQ(kvdbCloseDatabase(memory, 1), 0);
  const uint32_t fresh = OpenDatabase(":memory:");
  EXPECT_TRUE(DbHandles(fresh, kvPropDatabase_ClstRefs).empty()) << "closed is gone";
}

TEST_F(KvorDatabaseFiles, SavingWithoutAPathWritesTheOwnFile) {
  cTempDir directory;
  const std::string file = directory.Sub("own.dbc");
  directory.WriteFile("own.dbc", ReadWholeFile(DbcPath("mazda_radar.dbc")));
  const uint32_t database = OpenDatabase(file);
  const uint32_t frame = DbHandles(DbCluster(database), kvPropClst_FrmRefs).at(0);
  ASSERT_EQ(DbSetText(frame, kvPropFrm_Comment, "renamed"), 0);
  ASSERT_EQ(kvdbSaveDatabase(database, ""), 0);
  ASSERT_EQ(kvdbCloseDatabase(database, 1), 0);
  const uint32_t reopened = OpenDatabase(file);
  EXPECT_EQ(DbText(DbHandles(DbCluster(reopened), kvPropClst_FrmRefs).at(0), kvPropFrm_Comment),
            "renamed");
  EXPECT_EQ(kvdbSaveDatabase(reopened, "/no/such/dir/x.dbc"), kvsimErrDatabaseWrite);
}

}  // namespace
