// Database files: every frame and signal of each field file reads as a reading of its text apart
// from the driver's gives it, before and after a save and a load; a faulty text is refused with
// its line named; what the reader has no use for is skipped and what it knows is read and written
// back; a file is one database by any name until closed as often as opened.
#include <fstream>
#include <regex>
#include <sstream>

#include "kvor_test_support.h"
#include "paths/paths_test_support.h"

namespace {

using namespace kvsvtest;

class KvorDatabase : public KvorTest {
 protected:
  // Opens `text` as a database file of its own.
  int32_t OpenText(const std::string &text, uint32_t *handle) {
    const std::string name = "text" + std::to_string(files_++) + ".dbc";
    directory_.WriteFile(name, text);
    return kvdbOpenDatabase(directory_.Sub(name).c_str(), handle);
  }

  // The database saved to a file of its own and opened from there.
  uint32_t SavedAndReloaded(uint32_t database, const std::string &name) {
    EXPECT_EQ(kvdbSaveDatabase(database, directory_.Sub(name).c_str()), 0) << DatabaseErrorText();
    return OpenDatabase(directory_.Sub(name));
  }

  cTempDir directory_;
  int files_ = 0;
};

std::string ReadWholeFile(const std::string &path) {
  std::ifstream file(path, std::ios::binary);
  std::stringstream text;
  text << file.rdbuf();
  return text.str();
}

// Numeric properties as their type codes tell: 0 an integer, 1 a double, 2 a flag.
std::vector<double> Numbers(uint32_t object, std::initializer_list<uint32_t> ids) {
  std::vector<double> numbers;
  for (uint32_t id : ids) {
    numbers.push_back(id >> 24 == 1   ? DbRead<double>(object, id)
                      : id >> 24 == 2 ? DbRead<uint8_t>(object, id)
                                      : DbRead<uint32_t>(object, id));
  }
  return numbers;
}

TEST_F(KvorDatabase, FieldFilesReadAsTheirTextSaysBeforeAndAfterASaveAndALoad) {
  // BO_ id name: length, and SG_ name [M|mN] : start|bits@order sign (scale,offset) [min|max]
  // "unit", read here with patterns of their own.
  const std::regex frameLine(R"(^BO_ (\d+) (\w+) *: *(\d+))");
  const std::regex signalLine(R"re(^\s+SG_ (\w+) *(M|m(\d+))? *: *(\d+)\|(\d+)@([01])([+-]) *)re"
                              R"re(\(([^,]+),([^)]+)\) *\[([^|]+)\|([^\]]+)\] *"([^"]*)")re");
  for (const char *file :
       {"tesla_can.dbc", "toyota_2017_ref_pt.dbc", "hyundai_2015_ccan.dbc", "hyundai_canfd.dbc",
        "gm_global_a_lowspeed_1818125.dbc", "ford_fusion_2018_adas.dbc", "mazda_radar.dbc"}) {
    const std::string text = ReadWholeFile(DbcPath(file));
    const uint32_t original = OpenDatabase(DbcPath(file));
    const uint32_t reloaded = SavedAndReloaded(original, file);
    for (uint32_t database : {original, reloaded}) {
      SCOPED_TRACE(testing::Message() << file << (database == original ? "" : ", saved"));
      const uint32_t cluster = DbCluster(database);
      std::istringstream lines(text);
      size_t frames = 0, signals = 0;
      uint32_t frame = 0;
      std::smatch m;
      for (std::string line; std::getline(lines, line);) {
        if (std::regex_search(line, m, frameLine)) {
          ++frames;
          frame = DbFind(cluster, 0x20000, m[2]);
          // Bit 31 marks an extended identifier, and so do bits 29 and 30 of one over 11 bits.
          const uint64_t written = std::stoull(m[1]), id = written & 0x1FFFFFFF;
          const bool extended = written >> 31 || ((written & 0x60000000) != 0 && id > 0x7FF);
          const uint32_t length = std::stoul(m[3]);
          EXPECT_EQ(
              Numbers(frame, {kvPropFrm_ID, kvPropFrm_CANExtID, kvPropFrm_PayloadLen,
                              kvPropFrm_CANioMode}),
              std::vector<double>({1.0 * id, 1.0 * extended, 1.0 * length, length > 8 ? 1.0 : 0.0}))
              << line;
        } else if (std::regex_search(line, m, signalLine)) {
          ++signals;
          const uint32_t signal = DbFind(frame, 0x30000, m[1]);
          EXPECT_EQ(Numbers(signal, {kvPropSig_StartBit, kvPropSig_NumBits, kvPropSig_ByteOrdr,
                                     kvPropSig_DataType, kvPropSig_ScaleFac, kvPropSig_ScaleOff,
                                     kvPropSig_Min, kvPropSig_Max, kvPropSig_MuxIsDataMux,
                                     kvPropSig_MuxIsDynamic, kvPropSig_MuxValue}),
                    std::vector<double>({std::stod(m[4]), std::stod(m[5]), m[6] == "0" ? 1.0 : 0,
                                         m[7] == "+" ? 1.0 : 0, std::stod(m[8]), std::stod(m[9]),
                                         std::stod(m[10]), std::stod(m[11]), 1.0 * (m[2] == "M"),
                                         1.0 * m[3].matched, m[3].matched ? std::stod(m[3]) : 0}))
              << line;
          EXPECT_EQ(DbText(signal, kvPropSig_Unit), m[12].str()) << line;
        }
      }
      EXPECT_EQ(DbHandles(cluster, kvPropClst_FrmRefs).size(), frames);
      EXPECT_EQ(DbHandles(cluster, kvPropClst_PDURefs).size(), frames);
      EXPECT_EQ(DbHandles(cluster, kvPropClst_SigRefs).size(), signals);
    }
    // Written again after being read back, the text is the same.
    SavedAndReloaded(reloaded, std::string(file) + "2");
    EXPECT_EQ(ReadWholeFile(directory_.Sub(file + std::string("2"))),
              ReadWholeFile(directory_.Sub(file)));
    ASSERT_EQ(kvdbCloseDatabase(original, 1) + kvdbCloseDatabase(reloaded, 1), 0);
  }
}

const std::string kHead = "VERSION \"\"\n\nBU_: A B\n\n";  // lines 1 to 4
const std::string kFrame = "BO_ 100 F: 8 A\n";             // line 5
const std::string kSignal = " SG_ S : 0|8@1+ (1,0) [0|255] \"\" B\n";

TEST_F(KvorDatabase, AFaultyTextIsRefusedWithItsLineNamed) {
  const struct {
    std::string text;  // after kHead
    uint32_t line;
    const char *says;
  } cases[] = {
      {kFrame + " SG_ S : 0|8@1+ (1,0)\n", 6, "ends before '['"},
      {kFrame + " SG_ S : 0|8@1+ (1,0)\n" + kFrame, 6, "line ends before '['"},
      {"BO_ 100 F:\n" + kSignal, 5, "line ends before the payload"},
      {kFrame + " SG_ S : 0|8@1+ (1x,0) [0|255] \"\" B\n", 6, "expected the scale"},
      {kFrame + " SG_ S : 0.5|8@1+ (1,0) [0|255] \"\" B\n", 6, "bad start bit '0.5'"},
      {kFrame + " SG_ S : 0|8@2+ (1,0) [0|255] \"\" B\n", 6, "bad byte order"},
      {"BO_ 99999999999 F: 8 A\n", 5, "bad frame identifier"},
      {"BO_ 2048 F: 8 A\n", 5, "out of range"},
      {"BO_ 100 F: 9 A\n", 5, "payload length 9"},
      {kFrame + " SG_ S : 0|8@1+ (1,0) [0|255] B\n", 6, "expected the unit"},
      {kFrame + kSignal + "\nCM_ BO_ 100 \"open;\n", 8, "no closing quote"},
      {kFrame + " SG_ S : 60|8@1+ (1,0) [0|255] \"\" B\n", 6, "does not fit"},
      {kSignal, 5, "follows no frame"},
      {kFrame + kSignal + "CM_ BO_ 100 x;\n", 7, "expected the comment text"},
      {kFrame + kSignal + "VAL_ 100 S 1 \"one\"\n", 7, "not closed with ';'"},
      {"123 F\n", 5, "expected a statement"},
      {"|\n", 5, "'|'"},
      {"\x01\n", 5, "byte 0x01"},
      {kFrame + kSignal + "SIG_VALTYPE_ 100 S : 1;\n", 7, "wrong size for its float"},
      {kFrame + " SG_ S m1 : 0|8@1+ (1,0) [0|255] \"\" B\n", 5, "no multiplexer"},
      {kFrame + kSignal + kSignal, 7, "defined twice"},
      {kFrame + " SG_ M1 M : 0|2@1+ (1,0) [0|3] \"\" B\n SG_ M2 M : 2|2@1+ (1,0) [0|3] \"\" B\n", 7,
       "second multiplexer"},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.says);
    uint32_t handle = 0x5A5A;
    EXPECT_EQ(OpenText(kHead + c.text, &handle), kvsimErrDatabaseSyntax);
    EXPECT_EQ(handle, 0x5A5Au);
    const std::string message = DatabaseErrorText();
    EXPECT_NE(message.find(", line " + std::to_string(c.line) + ": "), std::string::npos)
        << message;
    EXPECT_NE(message.find(c.says), std::string::npos) << message;
  }
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 0);
}

TEST_F(KvorDatabase, WhatIsNotUsedIsSkippedAndWhatIsKnownIsReadAndWrittenBack) {
  const std::string text =
      "VERSION \"1.0\"\n"
      "BU_:\n\tNodeA\n\tNodeB\n"
      "BO_TX_BU_ 100 : NodeA,NodeB;\n"
      "EV_ Env: 0 [0|10] \"\" 0 1 DUMMY_NODE_VECTOR0 Vector__XXX;\n"
      "BO_ 2147484672 Ext: 8 NodeA\n"
      " SG_ Mux M : 0|4@1+ (1,0) [0|15] \"\" NodeB\n"
      " SG_ A m0 : 8|16@1- (0.5,-3) [0|0] \"x\" NodeB\n"
      " SG_ F m1 : 32|32@1+ (1,0) [0|0] \"\" NodeB\n"
      "BO_ 200 Fd: 8 NodeB\n"
      " SG_ Flag : 7|1@0+ (1,0) [0|1] \"\" Vector__XXX\n"
      "CM_ \"multi\nline\ncluster\";\n"
      "CM_ SG_ 2147484672 A \"said \\\"so\\\"\";\n"
      "CM_ BO_ 200 \"a frame\";\n"
      "CM_ BU_ NodeA \"a node\";\n"
      "BA_DEF_ BO_ \"GenMsgCycleTime\" INT 0 10000;\n"
      "BA_DEF_DEF_ \"GenMsgCycleTime\" 100;\n"
      "BA_DEF_DEF_ \"GenSigStartValue\" 1;\n"
      "BA_ \"GenMsgCycleTime\" BO_ 200 20;\n"
      "BA_ \"VFrameFormat\" BO_ 200 14;\n"
      "BA_ \"GenSigStartValue\" SG_ 2147484672 A 8;\n"
      "SIG_VALTYPE_ 2147484672 F : 1;\n"
      "SG_MUL_VAL_ 2147484672 A Mux 0-0;\n"
      // Statements about objects that the file does not define describe nothing.
      "CM_ BO_ 7 \"no such frame\";\n"
      "VAL_ 200 NoSuchSignal 1 \"one\";\n"
      "BA_ \"GenMsgCycleTime\" BO_ 7 10;\n";
  uint32_t read = 0;
  ASSERT_EQ(OpenText(text, &read), 0) << DatabaseErrorText();
  for (uint32_t database : {read, SavedAndReloaded(read, "copy.dbc")}) {
    SCOPED_TRACE(database == read ? "read" : "written and read back");
    const uint32_t cluster = DbCluster(database);
    const uint32_t ext = DbFind(cluster, 0x20000, "Ext"), fd = DbFind(cluster, 0x20000, "Fd");
    const uint32_t a = DbFind(cluster, 0x30000, "Ext.A"), nodeA = DbFind(cluster, 0x50000, "NodeA");
    EXPECT_EQ(DbText(cluster, kvPropClst_Comment), "multi\nline\ncluster");
    EXPECT_EQ(DbText(a, kvPropSig_Comment), "said \"so\"");
    EXPECT_EQ(DbText(fd, kvPropFrm_Comment) + ", " + DbText(nodeA, kvPropECU_Comment),
              "a frame, a node");
    // Ext's cycle time is the attribute's default; Fd is CAN FD by its frame format 14. Start
    // values are raw: 8 * 0.5 - 3 for A, the default 1 for Flag. F is a float.
    const uint32_t flag = DbFind(cluster, 0x30000, "Flag"), f = DbFind(cluster, 0x30000, "Ext.F");
    using Values = std::vector<double>;
    EXPECT_EQ(Numbers(ext, {kvPropFrm_CANTxTime}), Values{0.1});
    EXPECT_EQ(Numbers(fd, {kvPropFrm_CANTxTime, kvPropFrm_CANioMode}), Values({0.02, 1}));
    EXPECT_EQ(Numbers(a, {kvPropSig_Default, kvPropSig_DataType}), Values({1, 0}));
    EXPECT_EQ(Numbers(flag, {kvPropSig_Default}), Values{1});
    EXPECT_EQ(Numbers(f, {kvPropSig_DataType}), Values{2});
    EXPECT_EQ(DbHandles(nodeA, kvPropECU_TxFrmRefs), std::vector<uint32_t>{ext});
    EXPECT_TRUE(DbHandles(nodeA, kvPropECU_RxFrmRefs).empty())
        << "Flag has no receiver, and Ext is received by NodeB only";
    EXPECT_EQ(DbHandles(DbFind(cluster, 0x50000, "NodeB"), kvPropECU_RxFrmRefs),
              std::vector<uint32_t>{ext});
  }
}

TEST_F(KvorDatabase, OneFileByAnyNameIsOneDatabaseUntilClosedAsOftenAsOpened) {
  directory_.WriteFile("small.dbc", ReadWholeFile(DbcPath("mazda_radar.dbc")));
  cScopedEnv databaseDir("KVSIM_DATABASE_DIR", directory_.Path());
  ASSERT_EQ(kvdbAddAlias("Radar", "small.dbc", 250000), 0) << DatabaseErrorText();
  const uint32_t database = OpenDatabase("Radar");
  EXPECT_EQ(OpenDatabase("small.dbc"), database);
  EXPECT_EQ(OpenDatabase(directory_.Sub("small.dbc")), database);
  EXPECT_EQ(DbRead<uint32_t>(DbCluster(database), kvPropClst_BaudRate), 250000u) << "the alias's";
  // Three opens: an object handle's close counts as one of them.
  const uint32_t frame = DbHandles(DbCluster(database), kvPropClst_FrmRefs).at(0);
  EXPECT_EQ(kvdbCloseDatabase(database, 0) + kvdbCloseDatabase(frame, 0), 0);
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 1);
  EXPECT_EQ(kvdbCloseDatabase(database, 0), 0);
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 0);
  EXPECT_EQ(kvdbCloseDatabase(database, 0), kvsimErrInvalidDatabase);
  OpenDatabase("Radar");
  EXPECT_EQ(kvdbCloseDatabase(OpenDatabase("Radar"), 1), 0) << "closeAll, whatever the count";
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 0);
}

}  // namespace
