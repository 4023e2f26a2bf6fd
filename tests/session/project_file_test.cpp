// The two readers of the project session file: one entry by name, and the siblings of an
// interface, on files as a project writes them and on damaged ones.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "paths/paths_test_support.h"
#include "session/project_session_support.h"
#include "session/session_file_entry.h"
#include "session/session_file_siblings.h"
#include "support/fake_error_log.h"

namespace {

using namespace nKVSVAPI100;
using kvsvtest::Entry;

class ProjectFile : public testing::Test {
 protected:
  std::string Write(const std::string &text, const std::string &name = "kvorSession.txt") {
    dir_.WriteFile(name, text);
    return dir_.Sub(name);
  }

  // The names of a sibling list, checking that it ends with one more NUL.
  static std::vector<std::string> Names(const tMallocBlock &names) {
    std::vector<std::string> list;
    const char *name = names.get();
    for (; *name != '\0'; name += list.back().size() + 1) list.emplace_back(name);
    return list;
  }

  kvsvtest::cTempDir dir_;
};

TEST_F(ProjectFile, EntryFieldsAsWritten) {
  struct Case {
    const char *what;
    std::string file;
    const char *name;
    int32_t mode;
    double rate;
    int32_t extra;
    const char *fields[4];  // interface, list, cluster, database
  } cases[] = {
      {"empty list, database with blanks",
       Entry("Speed In", "1 1000 500000 0 CAN1 - Body Vehicle Database.dbc"), "Speed In", 1,
       1000.5, 0, {"CAN1", "", "Body", "Vehicle Database.dbc"}},
      {"CR-LF line ends", Entry("A", "4 2 250000 -1 LIN1/x F1,F2 C D.ldf", "\r\n"), "A", 4, 2.25,
       -1, {"LIN1/x", "F1,F2", "C", "D.ldf"}},
      {"every token a dash", Entry("A", "2 0 0 7 - -list -c -db"), "A", 2, 0.0, 7,
       {"", "", "", ""}},
      {"no line feed at the end: the database loses its last character",
       "A\n3 0 0 0 CAN1 L C Vehicle.dbc", "A", 3, 0.0, 0, {"CAN1", "L", "C", "Vehicle.db"}},
      {"a name is a prefix of the first line that begins with it",
       Entry("CAN2", "6 0 0 0 CAN2 - - two") + Entry("CAN", "6 0 0 0 CAN1 - - one"), "CAN", 6,
       0.0, 0, {"CAN2", "", "", "two"}},
      {"an empty name takes the first entry",
       Entry("X", "5 0 0 0 CAN3 - - x") + Entry("Y", "5 0 0 0 CAN4 - - y"), "", 5, 0.0, 0,
       {"CAN3", "", "", "x"}},
      {"a later entry, past a third line longer than a line buffer",
       "X\n5 0 0 0 CAN3 - - x\n" + std::string(400, 'z') + "\n" +
           Entry("Y", "5 0 0 9 CAN4 - - y"),
       "Y", 5, 0.0, 9, {"CAN4", "", "", "y"}},
  };
  kvsvtest::cFakeErrorLog log;
  for (const Case &c : cases) {
    SCOPED_TRACE(c.what);
    tSessionEntry entry;
    ASSERT_EQ(ReadSessionEntry(c.name, Write(c.file).c_str(), entry), 0);
    EXPECT_EQ(entry.mode, c.mode);
    EXPECT_DOUBLE_EQ(entry.resampleRate, c.rate);
    EXPECT_EQ(entry.extra, c.extra);
    EXPECT_STREQ(entry.Interface(), c.fields[0]);
    EXPECT_STREQ(entry.List(), c.fields[1]);
    EXPECT_STREQ(entry.Cluster(), c.fields[2]);
    EXPECT_STREQ(entry.Database(), c.fields[3]);
  }
  EXPECT_TRUE(log.Records().empty());
}

TEST_F(ProjectFile, EntryFailures) {
  const std::string goodB = Entry("B", "1 0 0 0 CAN1 - C D");
  struct Case {
    const char *what;
    std::string file;
    std::string name;
    Status status;
    uint32_t reportLine;  // 0: no report
  } cases[] = {
      {"empty file", "", "A", kvErrSessionFile, 0},
      {"name absent", goodB, "A", kvErrSessionFile, 0},
      {"a name line of 300 characters throws the groups of three off",
       Entry(std::string(300, 'x'), "1 0 0 0 CAN1 - C D") + goodB, "B", kvErrSessionFile, 0},
      {"the first 255 characters of a long name line are its name",
       Entry(std::string(300, 'x'), "1 0 0 0 CAN1 - C D"), std::string(255, 'x'), kvErrInternal,
       421},
      {"mode not numeric", Entry("A", "one 0 0 0 CAN1 - C D"), "A", kvErrInternal, 421},
      {"truncated after the name", "A\n", "A", kvErrInternal, 421},
      {"numbers only, at the end", "A\n1 0 0 0\n", "A", kvErrInternal, 421},
      {"list missing at the end", "A\n1 0 0 0 CAN1\n", "A", kvErrInternal, 442},
      {"cluster missing at the end", "A\n1 0 0 0 CAN1 -\n", "A", kvErrInternal, 451},
      {"database missing at the end", "A\n1 0 0 0 CAN1 - C", "A", kvErrInternal, 469},
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(c.what);
    kvsvtest::cFakeErrorLog log;
    tSessionEntry entry;
    EXPECT_EQ(ReadSessionEntry(c.name.c_str(), Write(c.file).c_str(), entry), c.status);
    EXPECT_EQ(entry.text, nullptr);
    const auto records = log.Records();
    ASSERT_EQ(records.size(), c.reportLine != 0 ? 1u : 0u);
    if (c.reportLine != 0) {
      EXPECT_EQ(records[0].value.File(), 11u);
      EXPECT_EQ(records[0].value.Line(), c.reportLine);
    }
  }
  tSessionEntry entry;
  EXPECT_EQ(ReadSessionEntry("A", dir_.Sub("absent.txt").c_str(), entry), kvErrSessionFile);
}

TEST_F(ProjectFile, SiblingsShareInterfaceDatabaseAndCluster) {
  const std::string file = Entry("A", "6 0 0 0 CAN1 - Body Vehicle DB") +
                           Entry("Monitor", "6 0 0 0 CAN1/monitor F1 Body Vehicle DB", "\r\n") +
                           Entry("OtherDb", "6 0 0 0 CAN1 - Body Other") +
                           Entry("OtherCluster", "6 0 0 0 CAN1 - Chassis Vehicle DB") +
                           Entry("OtherInterface", "6 0 0 0 CAN2 - Body Vehicle DB") +
                           Entry("Case", "6 0 0 0 can1 - Body Vehicle DB") +
                           Entry("", "0 0 0 0 CAN1/x/z - Body Vehicle DB") +
                           Entry("B", "0 0 0 0 CAN1/x/y Speed Body Vehicle DB");
  const std::string path = Write(file);
  kvsvtest::cFakeErrorLog log;
  struct Case {
    const char *interfaceKey;
    const char *database;
    const char *cluster;
    std::vector<std::string> names;
  } cases[] = {
      {"CAN1", "Vehicle DB", "Body", {"A", "Monitor"}},
      {"CAN1/x", "Vehicle DB", "Body", {"B"}},
      {"CAN1", "Other", "Body", {"OtherDb"}},
      {"CAN3", "Vehicle DB", "Body", {}},
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(c.interfaceKey);
    tMallocBlock names;
    ASSERT_EQ(ListSiblingSessions(c.interfaceKey, c.database, c.cluster, path.c_str(), names), 0);
    EXPECT_EQ(Names(names), c.names);
  }
  // A dash stands for an empty cluster or database.
  tMallocBlock names;
  ASSERT_EQ(ListSiblingSessions("LIN1", "", "", Write(Entry("L", "0 0 0 0 LIN1 - - -")).c_str(),
                                names),
            0);
  EXPECT_EQ(Names(names), std::vector<std::string>{"L"});
  EXPECT_TRUE(log.Records().empty());
}

TEST_F(ProjectFile, SiblingFailuresDropTheList) {
  const std::string good = Entry("A", "6 0 0 0 CAN1 - C D");
  struct Case {
    const char *what;
    std::string path;
    Status status;
    uint32_t reportLine;
  } cases[] = {
      {"no file", dir_.Sub("absent.txt"), kvErrSessionFile, 0},
      {"a later entry not numeric", Write(good + Entry("B", "x 0 0 0 CAN1 - C D"), "late.txt"),
       kvErrInternal, 590},
      {"a name line of 300 characters",
       Write(good + Entry(std::string(300, 'n'), "6 0 0 0 CAN1 - C D"), "long.txt"),
       kvErrInternal, 590},
  };
  for (const Case &c : cases) {
    SCOPED_TRACE(c.what);
    kvsvtest::cFakeErrorLog log;
    tMallocBlock names;
    EXPECT_EQ(ListSiblingSessions("CAN1", "D", "C", c.path.c_str(), names), c.status);
    EXPECT_EQ(names, nullptr);
    const auto records = log.Records();
    ASSERT_EQ(records.size(), c.reportLine != 0 ? 1u : 0u);
    if (c.reportLine != 0) {
      EXPECT_EQ(records[0].value.Line(), c.reportLine);
    }
  }
}

}  // namespace
