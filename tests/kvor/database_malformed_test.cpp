// Database files that break the format are refused with a message that names the line; what
// the reader has no use for is skipped, and what it knows is read whatever its layout.
#include "database_test_support.h"

namespace {

using namespace kvsvtest;

class KvorDatabaseMalformed : public KvorTest {
 protected:
  // Opens `text` as a database file; the status, and the message when it failed.
  int32_t OpenText(const std::string &text, uint32_t *handle) {
    directory_.WriteFile("test.dbc", text);
    return kvdbOpenDatabase(directory_.Sub("test.dbc").c_str(), handle);
  }

  cTempDir directory_;
};

const std::string kHead = "VERSION \"\"\n\nBU_: A B\n\n";  // lines 1 to 4
const std::string kFrame = "BO_ 100 F: 8 A\n";             // line 5
const std::string kSignal = " SG_ S : 0|8@1+ (1,0) [0|255] \"\" B\n";

TEST_F(KvorDatabaseMalformed, AFaultyTextNamesItsLine) {
  const struct {
    const char *what;
    std::string text;
    uint32_t line;
    const char *says;
  } cases[] = {
      {"truncated signal", kHead + kFrame + " SG_ S : 0|8@1+ (1,0)\n", 6, "ends before '['"},
      {"truncated signal, more after", kHead + kFrame + " SG_ S : 0|8@1+ (1,0)\n" + kFrame, 6,
       "line ends before '['"},
      {"truncated frame", kHead + "BO_ 100 F:\n" + kSignal, 5, "line ends before the payload"},
      {"bad scale", kHead + kFrame + " SG_ S : 0|8@1+ (1x,0) [0|255] \"\" B\n", 6, "after the scale"},
      {"bad start bit", kHead + kFrame + " SG_ S : 0.5|8@1+ (1,0) [0|255] \"\" B\n", 6,
       "bad start bit '0.5'"},
      {"bad byte order", kHead + kFrame + " SG_ S : 0|8@2+ (1,0) [0|255] \"\" B\n", 6,
       "bad byte order"},
      {"huge identifier", kHead + "BO_ 99999999999 F: 8 A\n", 5, "bad frame identifier"},
      {"standard identifier too big", kHead + "BO_ 2048 F: 8 A\n", 5, "out of range"},
      {"payload length", kHead + "BO_ 100 F: 9 A\n", 5, "payload length 9"},
      {"unit without quotes", kHead + kFrame + " SG_ S : 0|8@1+ (1,0) [0|255] B\n", 6,
       "expected the unit"},
      {"comment without closing quote", kHead + kFrame + kSignal + "\nCM_ BO_ 100 \"open;\n", 8,
       "no closing quote"},
      {"signal outside its frame", kHead + kFrame + " SG_ S : 60|8@1+ (1,0) [0|255] \"\" B\n", 6,
       "does not fit"},
      {"signal before any frame", kHead + kSignal, 5, "follows no frame"},
      {"comment on a frame without quotes", kHead + kFrame + kSignal + "CM_ BO_ 100 x;\n", 7,
       "expected the comment text"},
      {"value list without end", kHead + kFrame + kSignal + "VAL_ 100 S 1 \"one\"\n", 7,
       "not closed with ';'"},
      {"stray number", kHead + "123 F\n", 5, "expected a statement"},
      {"float of 8 bits", kHead + kFrame + kSignal + "SIG_VALTYPE_ 100 S : 1;\n", 7,
       "wrong size for its float"},
      {"multiplexed, no multiplexer", kHead + kFrame + " SG_ S m1 : 0|8@1+ (1,0) [0|255] \"\" B\n",
       5, "no multiplexer"},
      {"signal twice", kHead + kFrame + kSignal + kSignal, 7, "defined twice"},
      {"second multiplexer", kHead + kFrame + " SG_ M1 M : 0|2@1+ (1,0) [0|3] \"\" B\n" +
                                 " SG_ M2 M : 2|2@1+ (1,0) [0|3] \"\" B\n", 7, "second multiplexer"},
  };
  for (const auto &c : cases) {
    uint32_t handle = 0;
    EXPECT_EQ(OpenText(c.text, &handle), kvsimErrDatabaseSyntax) << c.what;
    const std::string message = DatabaseErrorText();
    EXPECT_NE(message.find(", line " + std::to_string(c.line) + ": "), std::string::npos)
        << c.what << ": " << message;
    EXPECT_NE(message.find(c.says), std::string::npos) << c.what << ": " << message;
    EXPECT_EQ(kvsimLoadedDatabaseCount(), 0) << c.what;
  }
}

TEST_F(KvorDatabaseMalformed, WhatIsNotUsedIsSkippedAndWhatIsKnownIsRead) {
  const std::string text =
      "VERSION \"1.0\"\n"
      "NS_ :\n\tCM_\n\tBA_DEF_\n"
      "BS_:\n"
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
      "BA_DEF_ BO_ \"GenMsgCycleTime\" INT 0 10000;\n"
      "BA_DEF_DEF_ \"GenMsgCycleTime\" 100;\n"
      "BA_ \"GenMsgCycleTime\" BO_ 200 20;\n"
      "BA_ \"VFrameFormat\" BO_ 200 14;\n"
      "BA_ \"GenSigStartValue\" SG_ 2147484672 A 8;\n"
      "SIG_VALTYPE_ 2147484672 F : 1;\n"
      "SG_MUL_VAL_ 2147484672 A Mux 0-0;\n"
      // Statements about objects that the file does not define describe nothing.
      "CM_ BO_ 7 \"no such frame\";\n"
      "VAL_ 200 NoSuchSignal 1 \"one\";\n"
      "BA_ \"GenMsgCycleTime\" BO_ 7 10;\n";
  uint32_t database = 0;
  ASSERT_EQ(OpenText(text, &database), 0) << DatabaseErrorText();
  const uint32_t cluster = DbCluster(database);
  EXPECT_EQ(DbText(cluster, kvPropClst_Comment), "multi\nline\ncluster");
  EXPECT_EQ(DbHandles(cluster, kvPropClst_ECURefs).size(), 2u);

  const uint32_t ext = DbFind(cluster, 0x20000, "Ext");
  EXPECT_TRUE(DbBool(ext, kvPropFrm_CANExtID));
  EXPECT_EQ(DbRead<uint32_t>(ext, kvPropFrm_ID), 0x400u);
  EXPECT_EQ(DbRead<double>(ext, kvPropFrm_CANTxTime), 0.1) << "the attribute's default";
  const uint32_t fd = DbFind(cluster, 0x20000, "Fd");
  EXPECT_EQ(DbRead<double>(fd, kvPropFrm_CANTxTime), 0.02);
  EXPECT_EQ(DbRead<uint32_t>(fd, kvPropFrm_CANioMode), 1u) << "frame format 14";
  EXPECT_EQ(DbRead<uint32_t>(fd, kvPropFrm_PayloadLen), 8u);

  const uint32_t a = DbFind(cluster, 0x30000, "Ext.A");
  EXPECT_EQ(DbText(a, kvPropSig_Comment), "said \"so\"");
  EXPECT_EQ(DbRead<double>(a, kvPropSig_Default), 8 * 0.5 - 3) << "start value is raw";
  EXPECT_EQ(DbRead<uint32_t>(a, kvPropSig_DataType), 0u);
  EXPECT_EQ(DbRead<uint32_t>(DbFind(cluster, 0x30000, "Ext.F"), kvPropSig_DataType), 2u);
  EXPECT_TRUE(DbHandles(DbFind(cluster, 0x50000, "NodeA"), kvPropECU_RxFrmRefs).empty())
      << "Flag has no receiver, and Ext is received by NodeB only";
  EXPECT_EQ(DbHandles(DbFind(cluster, 0x50000, "NodeB"), kvPropECU_RxFrmRefs),
            std::vector<uint32_t>{ext});
}

TEST_F(KvorDatabaseMalformed, AnEmptyTextIsAnEmptyCluster) {
  uint32_t database = 0;
  ASSERT_EQ(OpenText("", &database), 0);
  EXPECT_TRUE(DbHandles(DbCluster(database), kvPropClst_FrmRefs).empty());
}

}  // namespace
