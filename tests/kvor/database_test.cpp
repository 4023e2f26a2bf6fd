// Database files: every frame and signal of each field file reads as a reading of its text apart
// from the driver's gives it, before and after a save and a load, and every object, property and
// attribute of each comes back from a save; a faulty text is refused with its line named, and
// the quirks of other tools' files are read; what the reader has no use for is skipped and what
// it knows is read and written back; a file is one database by any name until closed as often as
// opened; objects of every class; aliases in their file; merges, deployments and attributes.
#include <array>
#include <filesystem>
#include <regex>
#include <sstream>

#include "kvor_test_support.h"
#include "paths/paths_test_support.h"

namespace {

using namespace kvsvtest;

class KvorDatabase : public KvorTest {
 protected:
  cTempDir directory_;
  // Aliases go to a file of the test's own.
  cScopedEnv configDir_{"KVSIM_CONFIG_DIR", directory_.Sub("config")};

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

  int files_ = 0;
};

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

// The name by which each class of object is known in its cluster.
const uint32_t kNameIds[] = {kvPropDatabase_Name, kvPropClst_Name, kvPropFrm_Name,
                             kvPropSig_NameUniqueToCluster, kvPropSubfrm_NameUniqueToCluster,
                             kvPropECU_Name, kvPropLINSched_Name,
                             kvPropLINSchedEntry_NameUniqueToCluster, kvPropPDU_Name};

std::string NameOf(uint32_t object) { return DbText(object, kNameIds[(object >> 24) & 0xF]); }

std::string DbcAttribute(uint32_t object, uint32_t mode, const char *name, uint32_t *isDefault) {
  uint32_t size = 0;
  if (kvdbGetDBCAttributeSize(object, mode, name, &size) != 0) return "<none>";
  std::string text(size, '?');
  EXPECT_EQ(kvdbGetDBCAttribute(object, mode, name, size, text.data(), isDefault), 0) << name;
  return text.substr(0, size - 1);
}

// Every property of the object that the driver answers, references by the names of what they
// point at, then each of its attributes with its value, and whether that is the default.
std::string Dump(uint32_t object, std::initializer_list<uint32_t> ids, bool attributes = true) {
  std::ostringstream out;
  out << NameOf(object) << ":";
  for (const uint32_t id : ids) {
    uint32_t size = 0;
    out << " " << std::hex << id << std::dec << "=";
    if (kvdbGetPropertySize(object, id, &size) != 0) {
      out << "-";
      continue;
    }
    switch (id >> 24) {
      case 3:
        out << DbText(object, id);
        break;
      case 5:
        out << NameOf(DbRead<uint32_t>(object, id));
        break;
      case 6:
        for (const uint32_t handle : DbHandles(object, id)) out << NameOf(handle) << ",";
        break;
      case 9:
        out << DbRead<uint64_t>(object, id);
        break;
      default:
        for (const double number : Numbers(object, {id})) out << number;
    }
  }
  const std::string names = attributes ? DbcAttribute(object, 2, nullptr, nullptr) : "";
  std::istringstream list(names);
  for (std::string name; std::getline(list, name, ',');) {
    uint32_t isDefault = 7;
    out << " " << name << "=" << DbcAttribute(object, 0, name.c_str(), &isDefault) << "/"
        << isDefault;
  }
  return out.str();
}

std::string DumpDatabase(uint32_t database) {
  const uint32_t cluster = DbCluster(database);
  std::string all = Dump(cluster, {kvPropClst_Comment, kvPropClst_BaudRate64,
                                   kvPropClst_CanFdBaudRate64, kvPropClst_CanIoMode,
                                   kvPropClst_FrmRefs, kvPropClst_SigRefs, kvPropClst_ECURefs,
                                   kvPropClst_PDURefs, kvPropClst_LINSchedules}) + "\n";
  for (const uint32_t frame : DbHandles(cluster, kvPropClst_FrmRefs)) {
    all += Dump(frame, {kvPropFrm_Comment, kvPropFrm_ID, kvPropFrm_CANExtID, kvPropFrm_PayloadLen,
                        kvPropFrm_CANTxTime, kvPropFrm_CANioMode, kvPropFrm_SigRefs,
                        kvPropFrm_MuxDataMuxSigRef, kvPropFrm_MuxSubframeRefs,
                        kvPropFrm_ClusterRef}) + "\n";
    for (const uint8_t byte : DbBytes(frame, kvPropFrm_DefaultPayload)) all += std::to_string(byte) + " ";
    for (const uint32_t signal : DbHandles(frame, kvPropFrm_SigRefs)) {
      all += Dump(signal, {kvPropSig_Comment, kvPropSig_ByteOrdr, kvPropSig_DataType,
                           kvPropSig_Default, kvPropSig_Min, kvPropSig_Max, kvPropSig_NumBits,
                           kvPropSig_ScaleFac, kvPropSig_ScaleOff, kvPropSig_StartBit,
                           kvPropSig_Unit, kvPropSig_MuxIsDataMux, kvPropSig_MuxIsDynamic,
                           kvPropSig_MuxValue,
                           kvPropSig_MuxSubfrmRef, 0x05030034}) + "\n";
    }
    for (const uint32_t subframe : DbHandles(frame, kvPropFrm_MuxSubframeRefs)) {
      all += Dump(subframe, {kvPropSubfrm_MuxValue, kvPropSubfrm_DynSigRefs, kvPropSubfrm_FrmRef,
                             0x05040006}, false) + "\n";
    }
  }
  for (const uint32_t ecu : DbHandles(cluster, kvPropClst_ECURefs)) {
    all += Dump(ecu, {kvPropECU_Comment, kvPropECU_TxFrmRefs, kvPropECU_RxFrmRefs}) + "\n";
  }
  for (const uint32_t pdu : DbHandles(cluster, kvPropClst_PDURefs)) {
    all += Dump(pdu, {kvPropPDU_SigRefs, kvPropPDU_FrmRefs, kvPropPDU_ClusterRef}, false) + "\n";
  }
  return all;
}

TEST_F(KvorDatabase, FieldFilesReadAsTheirTextSaysAndComeBackWholeFromASaveAndALoad) {
  // BO_ id name: length, and SG_ name [M|mN] : start|bits@order sign (scale,offset) [min|max]
  // "unit", read here with patterns of their own.
  const std::regex frameLine(R"(^BO_ (\d+) (\w+) *: *(\d+))");
  const std::regex signalLine(R"re(^\s+SG_ (\w+) *(M|m(\d+))? *: *(\d+)\|(\d+)@([01])([+-]) *)re"
                              R"re(\(([^,]+),([^)]+)\) *\[([^|]+)\|([^\]]+)\] *"([^"]*)")re");
  for (const char *file :
       {"tesla_can.dbc", "toyota_2017_ref_pt.dbc", "hyundai_2015_ccan.dbc", "hyundai_canfd.dbc",
        "gm_global_a_lowspeed_1818125.dbc", "ford_fusion_2018_adas.dbc", "mazda_radar.dbc"}) {
    SCOPED_TRACE(file);
    const uint32_t original = OpenDatabase(DbcPath(file));
    const uint32_t cluster = DbCluster(original);
    std::istringstream lines(ReadFile(DbcPath(file)));
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
    // Every object, property and attribute comes back from a save; written again, the text is
    // the same.
    const uint32_t reloaded = SavedAndReloaded(original, file);
    EXPECT_EQ(DumpDatabase(reloaded), DumpDatabase(original));
    SavedAndReloaded(reloaded, std::string(file) + "2");
    EXPECT_EQ(ReadFile(directory_.Sub(file + std::string("2"))), ReadFile(directory_.Sub(file)));
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
      {kFrame + " SG_ M M : 0|2@1+ (1,0) [0|3] \"\" B\n SG_ S m4 : 8|8@1+ (1,0) [0|1] \"\" B\n", 7,
       "selected by 4, which multiplexer 'M' of 2 bits cannot take"},
      {kFrame + "BO_ 100 G: 8 A\n", 6, "used twice"},
      {kFrame + kSignal + "CM_ BO_ 100 \"x\" BA_ \"A\" 1;\n", 7, "';' after the comment"},
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
  directory_.WriteFile("small.dbc", ReadFile(DbcPath("mazda_radar.dbc")));
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

TEST_F(KvorDatabase, QuirksOfOtherToolsAreReadWithAWarningThatNamesTheLine) {
  const struct {
    std::string text;
    const char *warning;  // "" for none
  } cases[] = {
      {"\xEF\xBB\xBF" + kHead + kFrame + kSignal, ""},
      {kHead + "BO_ 100 2F: 8 A\n SG_ 1st : 0|8@1+ (1,0) [0|255] \"\" B\n", "line 5: warning: name '2F'"},
      {kHead + kFrame + kSignal + "CM_ BO_ 100 \"c\"\nBA_DEF_ BO_ \"X\" INT 0 9\nBA_ \"X\" BO_ 100 3",
       "line 7: warning: no ';' after the comment"},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.text);
    uint32_t database = 0;
    ASSERT_EQ(OpenText(c.text, &database), 0) << DatabaseErrorText();
    EXPECT_NE(DatabaseErrorText().find(c.warning), std::string::npos) << DatabaseErrorText();
    const uint32_t copy = SavedAndReloaded(database, "quirk" + std::to_string(files_) + ".dbc");
    EXPECT_EQ(DumpDatabase(copy), DumpDatabase(database));
  }
}

TEST_F(KvorDatabase, ObjectsOfEveryClassAreMadeFoundByTheirNamesAndDeletedWithWhatTheyHold) {
  const uint32_t database = OpenDatabase(":memory:");
  uint32_t cluster = 0, frame = 0, signal = 0, schedule = 0, made = 0;
  ASSERT_EQ(kvdbCreateObject(database, 0x10000, "Body", &cluster), 0);
  ASSERT_EQ(kvdbCreateObject(cluster, 0x20000, "Door", &frame), 0);
  ASSERT_EQ(kvdbCreateObject(frame, 0x30000, "Sel", &signal), 0);
  const uint8_t on = 1;
  ASSERT_EQ(kvdbSetProperty(signal, kvPropSig_MuxIsDataMux, 1, &on), 0);
  ASSERT_EQ(kvdbCreateObject(cluster, 0x60000, "Sched", &schedule), 0);
  const struct {
    uint32_t parent, objectClass;
    const char *name, *inCluster;  // the name in the cluster, as its name property gives it
    uint32_t clusterRef;
  } cases[] = {
      {cluster, 0x20000, "Window", "Window", kvPropFrm_ClusterRef},
      {cluster, 0x80000, "Lamp", "Lamp", kvPropPDU_ClusterRef},
      {frame, 0x30000, "Lock", "Door.Lock", 0x05030034},
      {frame, 0x40000, "Open", "Door.Open", 0x05040006},
      {cluster, 0x50000, "Bcm", "Bcm", kvPropECU_ClstRef},
      {cluster, 0x60000, "Fast", "Fast", kvPropLINSched_ClstRef},
      {schedule, 0x70000, "Slot", "Sched.Slot", 0x05070009},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.inCluster);
    ASSERT_EQ(kvdbCreateObject(c.parent, c.objectClass, c.name, &made), 0);
    EXPECT_EQ(made >> 24, 0x80 | c.objectClass >> 16);
    EXPECT_EQ(kvdbCreateObject(c.parent, c.objectClass, c.name, &made), kvsimErrObjectExists);
    EXPECT_EQ(DbFind(c.parent, c.objectClass, c.name), made);
    EXPECT_EQ(DbFind(cluster, c.objectClass, c.inCluster), made);
    EXPECT_EQ(NameOf(made), c.inCluster);
    EXPECT_EQ(DbRead<uint32_t>(made, c.clusterRef), cluster);
    uint32_t owner = 0;
    EXPECT_EQ(kvhdndbGetDatabaseRefFromObjRef(made, &owner), 0);
    EXPECT_EQ(owner, database);
    ASSERT_EQ(kvdbDeleteObject(made), 0);
    EXPECT_EQ(kvdbFindObject(c.parent, c.objectClass, c.name, &owner), kvsimErrObjectNotFound);
    EXPECT_EQ(kvdbGetPropertySize(made, kNameIds[c.objectClass >> 16], &owner), kvsimErrInvalidDatabase);
  }
  // A subframe holds the signals of its value; a schedule its entries. A LIN schedule has no
  // place in a database file.
  uint32_t subframe = 0, dynamic = 0, entry = 0, ignored = 0;
  ASSERT_EQ(kvdbCreateObject(frame, 0x40000, "Sub", &subframe), 0);
  ASSERT_EQ(kvdbCreateObject(subframe, 0x30000, "Dyn", &dynamic), 0);
  EXPECT_EQ(DbRead<uint32_t>(dynamic, kvPropSig_MuxSubfrmRef), subframe);
  ASSERT_EQ(kvdbCreateObject(schedule, 0x70000, "E", &entry), 0);
  EXPECT_EQ(kvdbSaveDatabase(database, directory_.Sub("lin.dbc").c_str()), kvsimErrDatabaseWrite);
  EXPECT_FALSE(std::filesystem::exists(directory_.Sub("lin.dbc")));
  ASSERT_EQ(kvdbDeleteObject(subframe) + kvdbDeleteObject(schedule), 0);
  EXPECT_EQ(kvdbGetPropertySize(dynamic, kvPropSig_Name, &ignored), kvsimErrInvalidDatabase);
  EXPECT_EQ(kvdbGetPropertySize(entry, kvPropLINSchedEntry_Name, &ignored), kvsimErrInvalidDatabase);
  // A reference's open is given back by one close of its handle.
  ASSERT_EQ(kvhdndbOpenDatabaseByRef(frame), 0);
  EXPECT_EQ(kvhdndbOpenDatabaseByRef(0x0FFFFFFF), kvsimErrInvalidDatabase);
  EXPECT_EQ(kvdbCloseDatabase(frame, 0) + kvdbCloseDatabase(database, 0), 0);
  EXPECT_EQ(kvsimLoadedDatabaseCount(), 0);
}

TEST_F(KvorDatabase, AliasesOutliveAResetInTheirFileAndDeploymentsAreListedPerTarget) {
  directory_.WriteFile("radar.dbc", ReadFile(DbcPath("mazda_radar.dbc")));
  ASSERT_EQ(kvdbAddAlias64("Radar", directory_.Sub("radar.dbc").c_str(), 125000), 0);
  kvsimReset();
  EXPECT_EQ(DbRead<uint32_t>(DbCluster(OpenDatabase("Radar")), kvPropClst_BaudRate), 125000u);
  const auto list = [](const char *target) {
    uint32_t aliasesSize = 0, pathsSize = 0, count = 0;
    const uint64_t at = reinterpret_cast<uintptr_t>(target);
    EXPECT_EQ(kvdbGetDatabaseListSizes(at, &aliasesSize, &pathsSize), 0);
    std::string aliases(aliasesSize, '?'), paths(pathsSize, '?');
    const int32_t status =
        kvdbGetDatabaseList(at, aliasesSize, aliases.data(), pathsSize, paths.data(), &count);
    return std::to_string(status) + ":" + std::to_string(count) + ":" + aliases.c_str();
  };
  EXPECT_EQ(kvdbDeploy("10.0.0.2", "Radar", 0, nullptr), 0);
  EXPECT_EQ(kvdbDeploy("10.0.0.2", "NoSuchAlias", 0, nullptr), kvsimErrDatabaseNotFound);
  EXPECT_EQ(list("10.0.0.2"), "0:1:Radar");
  EXPECT_EQ(list("10.0.0.3"), "0:0:");
  kvsimChangeDatabaseList(2);
  // A list that changed under its reader copies nothing.
  for (int round = 0; round < 2; ++round) {
    EXPECT_EQ(list(nullptr), std::to_string(kvErrDatabaseListChanged) + ":0:??????");
  }
  EXPECT_EQ(list(nullptr), "0:1:Radar");
  EXPECT_EQ(kvdbUndeploy("10.0.0.2", "Radar"), 0);
  EXPECT_EQ(list("10.0.0.2"), "0:0:");
  ASSERT_EQ(kvdbRemoveAlias("Radar"), 0);
  kvsimReset();
  uint32_t database = 0;
  EXPECT_EQ(kvdbOpenDatabase("Radar", &database), kvsimErrDatabaseNotFound);
}

TEST_F(KvorDatabase, AMergeCopiesTheClusterByItsModeAndPrefixOrNothing) {
  const std::string source = kHead + kFrame + kSignal + "BO_ 200 G: 8 B\n";
  const struct {
    uint32_t mode;
    const char *prefix;
    std::string target;
    int32_t status;
    const char *frames;  // of the target afterwards, by name and identifier
  } cases[] = {
      {0, "", kHead + "BO_ 100 F: 2 A\n", 0, "F100/8,G200/8,"},
      {1, "", kHead + "BO_ 100 F: 2 A\n", 0, "F100/2,G200/8,"},
      {2, "", kHead + "BO_ 100 F: 2 A\n", kvsimErrObjectExists, "F100/2,"},
      {0, "", kHead + "BO_ 200 H: 2 A\n", kvsimErrObjectExists, "H200/2,"},
      {2, "Src_", kHead + "BO_ 300 F: 2 A\n", 0, "F300/2,Src_F100/8,Src_G200/8,"},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.mode);
    uint32_t from = 0, into = 0, percent = 0;
    ASSERT_EQ(OpenText(source, &from) + OpenText(c.target, &into), 0);
    EXPECT_EQ(kvdbMerge(DbCluster(into), DbCluster(from), c.mode, c.prefix, 1, &percent), c.status);
    std::string frames;
    for (const uint32_t frame : DbHandles(DbCluster(into), kvPropClst_FrmRefs)) {
      frames += NameOf(frame) + std::to_string(DbRead<uint32_t>(frame, kvPropFrm_ID)) + "/" +
                std::to_string(DbRead<uint32_t>(frame, kvPropFrm_PayloadLen)) + ",";
    }
    EXPECT_EQ(frames, c.frames);
    if (c.status == 0) {
      EXPECT_EQ(percent, 100u);
    }
  }
}

TEST_F(KvorDatabase, AttributesAreGivenByValueDefaultEnumerationAndName) {
  uint32_t database = 0;
  ASSERT_EQ(OpenText(kHead + kFrame + kSignal +
                         "BA_DEF_ BU_ \"Role\" ENUM \"Gateway\",\"Sensor\";\n"
                         "BA_DEF_ SG_ \"Res\" FLOAT 0 1;\nBA_DEF_ \"Owner\" STRING;\n"
                         "BA_DEF_DEF_ \"Role\" 1;\nBA_DEF_DEF_ \"Res\" 0.5;\n"
                         "BA_ \"Role\" BU_ A 0;\nBA_ \"Owner\" \"me\";\n",
                     &database),
            0);
  const uint32_t cluster = DbCluster(database);
  const uint32_t a = DbFind(cluster, 0x50000, "A"), b = DbFind(cluster, 0x50000, "B");
  const uint32_t s = DbFind(cluster, 0x30000, "S");
  const struct {
    uint32_t object, mode;
    const char *name, *text;
    uint32_t isDefault;
  } cases[] = {
      {a, 0, "Role", "Gateway", 0},       {b, 0, "Role", "Sensor", 1},
      {s, 0, "Res", "0.5", 1},            {database, 0, "Owner", "me", 0},
      {a, 1, "Role", "Gateway,Sensor", 7}, {a, 2, nullptr, "Role,NmStationAddress", 7},
      {s, 1, "Res", "<none>", 7},         {s, 0, "Role", "<none>", 7},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.text);
    uint32_t isDefault = 7;
    EXPECT_EQ(DbcAttribute(c.object, c.mode, c.name, &isDefault), c.text);
    EXPECT_EQ(isDefault, c.isDefault);
  }
}

}  // namespace

// A small file whose every value is known, read by class and identifier as the text says; then
// edited, saved and read back, with the LIN schedules that only live in memory set on the copy.
const char kPropertyText[] =
    "VERSION \"\"\n"
    "BU_: Engine Dash\n"
    "BO_ 291 Speed: 8 Engine\n"
    " SG_ Mode M : 0|4@1+ (1,0) [0|15] \"\" Dash\n"
    " SG_ Kmh m1 : 8|16@1+ (0.5,-10) [-10|1000] \"km/h\" Dash\n"
    " SG_ Rpm : 39|16@0- (2,0) [0|8000] \"rpm\" Dash\n"
    "BO_ 2147484000 Lamp: 4 Dash\n"
    " SG_ On : 0|1@1+ (1,0) [0|1] \"\" Engine\n"
    "CM_ SG_ 291 Kmh \"vehicle speed\";\n"
    "BA_DEF_ BO_ \"GenMsgCycleTime\" INT 0 65535;\n"
    "BA_ \"GenMsgCycleTime\" BO_ 291 100;\n";

// One property as text: numbers, texts, the names of what references point at, lists with ','.
std::string Shown(uint32_t object, uint32_t id) {
  uint32_t size = 0;
  if (const int32_t status = kvdbGetPropertySize(object, id, &size)) return std::to_string(status);
  std::string numbers;
  for (const uint32_t number : DbHandles(object, id)) numbers += std::to_string(number) + ",";
  if (id >> 24 == 8) return numbers;
  const std::string dump = Dump(object, {id}, false);
  return dump.substr(dump.find('=') + 1);
}

TEST_F(KvorDatabase, EveryClassAnswersItsPropertiesAndEditsSurviveASaveAndALoad) {
  const struct {
    uint32_t objectClass;
    const char *name;
    uint32_t id;
    const char *read, *edited;  // null: no such object then
  } rows[] = {
      {0x10000, "", kvPropClst_FrmRefs, "Speed,Lamp,", "Speed,Lamp,"},
      {0x10000, "", kvPropClst_ApplicationProtocol, "0", "0"},
      {0x20000, "Speed", kvPropFrm_ID, "291", "300"},
      {0x20000, "Speed", kvPropFrm_CANTxTime, "0.1", "0.1"},
      {0x20000, "Speed", kvPropFrm_CANTimingType, "0", "0"},
      {0x20000, "Speed", kvPropFrm_SigRefs, "Speed.Mode,Speed.Kmh,Speed.Rpm,",
       "Speed.Mode,Speed.Kmh,Speed.Rpm,"},
      {0x20000, "Speed", kvPropFrm_PDURefs, "Speed,", "Lamp,Speed,"},
      {0x20000, "Speed", kvPropFrm_PDUStartBits, "0,", "0,32,"},
      {0x20000, "Speed", kvPropFrm_PDUUpdateBits, "4294967295,", "63,4294967295,"},
      {0x20000, "Lamp", kvPropFrm_ID, "352", "352"},
      {0x20000, "Lamp", kvPropFrm_CANExtID, "1", "1"},
      {0x20000, "Lamp", kvPropFrm_CANTimingType, "1", "1"},
      {0x80000, "Lamp", kvPropPDU_FrmRefs, "Lamp,", "Speed,Lamp,"},
      {0x80000, "Lamp", kvPropPDU_PayloadLen, "4", "4"},
      {0x30000, "Speed.Kmh", kvPropSig_StartBit, "8", "8"},
      {0x30000, "Speed.Kmh", kvPropSig_ScaleFac, "0.5", "0.25"},
      {0x30000, "Speed.Kmh", kvPropSig_ScaleOff, "-10", "-10"},
      {0x30000, "Speed.Kmh", kvPropSig_Max, "1000", "1000"},
      {0x30000, "Speed.Kmh", kvPropSig_Unit, "km/h", "km/h"},
      {0x30000, "Speed.Kmh", kvPropSig_Comment, "vehicle speed", "vehicle speed"},
      {0x30000, "Speed.Kmh", kvPropSig_MuxSubfrmRef, "Speed.m1", "Speed.m1"},
      {0x30000, "Speed.Rpm", kvPropSig_ByteOrdr, "1", "1"},
      {0x30000, "Speed.Rpm", kvPropSig_DataType, "0", "0"},
      {0x30000, "Speed.Mode", kvPropSig_MuxIsDataMux, "1", "1"},
      {0x40000, "Speed.m1", kvPropSubfrm_DynSigRefs, "Speed.Kmh,", "Speed.Kmh,"},
      {0x50000, "Engine", kvPropECU_TxFrmRefs, "Speed,", "Speed,Lamp,"},
      {0x50000, "Engine", kvPropECU_RxFrmRefs, "Lamp,", ""},
      {0x50000, "Dash", kvPropECU_TxFrmRefs, "Lamp,", ""},
      {0x50000, "Dash", kvPropECU_J1939PreferredAddress, "254", "17"},
      {0x60000, "Main", kvPropLINSched_Priority, nullptr, "3"},
      {0x60000, "Main", kvPropLINSched_Entries, nullptr, "Main.Slot,"},
      {0x70000, "Main.Slot", kvPropLINSchedEntry_Frames, nullptr, "Speed,Lamp,"},
      {0x70000, "Main.Slot", kvPropLINSchedEntry_CollisionResSched, nullptr, "Spare"},
      {0x70000, "Main.Slot", kvPropLINSchedEntry_Delay, nullptr, "0.01"},
      {0x70000, "Main.Slot", kvPropLINSchedEntry_Type, nullptr, "2"},
  };
  uint32_t database = 0;
  ASSERT_EQ(OpenText(kPropertyText, &database), 0) << DatabaseErrorText();
  uint32_t cluster = DbCluster(database);
  const auto find = [&](uint32_t objectClass, const char *name) {
    return objectClass == 0x10000 ? cluster : DbFind(cluster, objectClass, name);
  };
  for (const auto &row : rows) {
    if (row.read != nullptr) {
      EXPECT_EQ(Shown(find(row.objectClass, row.name), row.id), row.read)
          << row.name << " " << std::hex << row.id;
    }
  }
  const auto set = [&](uint32_t object, uint32_t id, auto value) {
    EXPECT_EQ(kvdbSetProperty(object, id, sizeof value, &value), 0) << std::hex << id;
  };
  const uint32_t speed = find(0x20000, "Speed"), lamp = find(0x20000, "Lamp");
  set(speed, kvPropFrm_ID, uint32_t{300});
  set(find(0x30000, "Speed.Kmh"), kvPropSig_ScaleFac, 0.25);
  set(find(0x50000, "Engine"), kvPropECU_TxFrmRefs, std::array<uint32_t, 2>{speed, lamp});
  EXPECT_EQ(kvdbSetProperty(find(0x50000, "Engine"), kvPropECU_RxFrmRefs, 0, nullptr), 0);
  set(find(0x50000, "Dash"), kvPropECU_J1939PreferredAddress, uint32_t{17});
  set(speed, kvPropFrm_PDURefs,
      std::array<uint32_t, 2>{find(0x80000, "Lamp"), find(0x80000, "Speed")});
  set(speed, kvPropFrm_PDUStartBits, std::array<uint32_t, 2>{0, 32});
  set(speed, kvPropFrm_PDUUpdateBits, std::array<uint32_t, 2>{63, 0xFFFFFFFF});

  database = SavedAndReloaded(database, "edited.dbc");
  cluster = DbCluster(database);
  uint32_t main = 0, spare = 0, slot = 0;
  ASSERT_EQ(kvdbCreateObject(cluster, 0x60000, "Main", &main) +
                kvdbCreateObject(cluster, 0x60000, "Spare", &spare) +
                kvdbCreateObject(main, 0x70000, "Slot", &slot),
            0);
  set(main, kvPropLINSched_Priority, uint32_t{3});
  set(slot, kvPropLINSchedEntry_Frames,
      std::array<uint32_t, 2>{find(0x20000, "Speed"), find(0x20000, "Lamp")});
  set(slot, kvPropLINSchedEntry_CollisionResSched, spare);
  set(slot, kvPropLINSchedEntry_Delay, 0.01);
  set(slot, kvPropLINSchedEntry_Type, uint32_t{2});
  for (const auto &row : rows) {
    EXPECT_EQ(Shown(find(row.objectClass, row.name), row.id), row.edited)
        << row.name << " " << std::hex << row.id;
  }
}

TEST_F(KvorDatabase, PropertiesAreRefusedWithTheStatusOfWhatIsWrong) {
  uint32_t database = 0;
  ASSERT_EQ(OpenText(kPropertyText, &database), 0) << DatabaseErrorText();
  const uint32_t cluster = DbCluster(database);
  const uint32_t speed = DbFind(cluster, 0x20000, "Speed"),
                 kmh = DbFind(cluster, 0x30000, "Speed.Kmh");
  const uint32_t engine = DbFind(cluster, 0x50000, "Engine");
  uint32_t schedule = 0, entry = 0;
  ASSERT_EQ(kvdbCreateObject(cluster, 0x60000, "Main", &schedule) +
                kvdbCreateObject(schedule, 0x70000, "Slot", &entry),
            0);
  const struct {
    const char *what;
    uint32_t object, id;
    bool set;
    uint32_t size;
    uint64_t value;
    int32_t status;
  } rows[] = {
      {"a number read into 8 bytes", speed, kvPropFrm_ID, false, 8, 0, kvsimErrPropertySize},
      {"a list read into too few bytes", speed, kvPropFrm_SigRefs, false, 4, 0,
       kvsimErrBufferTooSmall},
      {"a double set from 4 bytes", kmh, kvPropSig_ScaleFac, true, 4, 0, kvsimErrPropertySize},
      {"a signal's property of a frame", speed, kvPropSig_StartBit, false, 4, 0,
       kvsimErrPropertyUnknown},
      {"a LIN property of a CAN frame", speed, kvPropFrm_LINChecksum, false, 4, 0,
       kvsimErrWrongProtocol},
      {"a collision schedule never set", entry, kvPropLINSchedEntry_CollisionResSched, false, 4, 0,
       kvsimErrPropertyUnknown},
      {"a set of what follows from others", speed, kvPropFrm_SigRefs, true, 0, 0,
       kvsimErrPropertyReadOnly},
      {"a standard identifier above 0x7FF", speed, kvPropFrm_ID, true, 4, 0x800,
       kvsimErrInvalidArgument},
      {"a PDU start beyond the payload", speed, kvPropFrm_PDUStartBits, true, 4, 64,
       kvsimErrInvalidArgument},
      {"an entry type above 3", entry, kvPropLINSchedEntry_Type, true, 4, 4,
       kvsimErrInvalidArgument},
      {"a schedule priority of 255", schedule, kvPropLINSched_Priority, true, 4, 255,
       kvsimErrInvalidArgument},
      {"a signal among sent frames", engine, kvPropECU_TxFrmRefs, true, 4, kmh,
       kvsimErrWrongObject},
      {"a frame as a collision schedule", entry, kvPropLINSchedEntry_CollisionResSched, true, 4,
       speed, kvsimErrWrongObject},
  };
  for (const auto &row : rows) {
    uint64_t value = row.value;
    EXPECT_EQ(row.set ? kvdbSetProperty(row.object, row.id, row.size, &value)
                      : kvdbGetProperty(row.object, row.id, row.size, &value),
              row.status)
        << row.what;
  }
  // A refused set changes nothing.
  EXPECT_EQ(DbRead<uint32_t>(speed, kvPropFrm_ID), 291u);
  EXPECT_EQ(DbHandles(engine, kvPropECU_TxFrmRefs), std::vector<uint32_t>{speed});
}
