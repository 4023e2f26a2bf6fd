// Naming an entry of a session's list: decimal indexes, names and their prefixes, the list read
// once per slot, and the slot's own failures.
#include "property/session_name_to_index.h"

#include <gtest/gtest.h>

#include <cstring>

#include "kvorproperties.h"
#include "kvsim.h"
#include "support/slot_fixture.h"
#include "svsim.h"

using namespace nKVSVAPI100;

namespace {

SvStr *Counted(SvHandle string) { return static_cast<SvStr *>(*string); }

TEST(ParseDecimalStringTest, DigitsWrapInThirtyTwoBitsAndAnythingElseIsMinusOne) {
  const struct {
    const char *text;
    int32_t expected;
  } cases[] = {
      {"", 0},
      {"0", 0},
      {"42", 42},
      {"007", 7},
      {"3x", -1},
      {"-1", -1},
      {" 3", -1},
      {"2147483647", 2147483647},
      {"2147483648", INT32_MIN},
      {"4294967299", 3},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.text);
    SvHandle string = svsimMakeString(c.text);
    EXPECT_EQ(ParseDecimalString(*Counted(string)), c.expected);
    svDisposeHandle(string);
  }
}

class SessionNameToIndexTest : public SlotFixture {
 protected:
  // Runs the lookup for `text` (null: no handle at all).
  Status Look(uint32_t session, const char *text, int32_t *index) {
    if (text == nullptr) return SessionNameToIndex(session, nullptr, index);
    SvHandle sub = Keep(svsimMakeString(text));
    return SessionNameToIndex(session, &sub, index);
  }
};

TEST_F(SessionNameToIndexTest, EntriesByIndexAndByName) {
  const uint32_t session = MakeSession("3,Frm.Sig,Frm.Two,Gear,Gear.Sig,Body.A,Body.B", 0);
  const struct {
    const char *text;
    Status status;
    int32_t index;
  } cases[] = {
      {nullptr, 0, 0},
      {"", 0, 0},
      {"3", 0, 3},  // a number, even though entry 0 bears that name
      {"12", 0, 12},
      {"3x", kvErrSubIdNumberInvalid, -1},
      {"2147483648", kvErrSubIdNumberInvalid, INT32_MIN},
      {"Frm", 0, 1},  // the first entry of that prefix
      {"Frm.Two", 0, 2},
      {"Gear", 0, 3},  // an exact entry before a prefix
      {"Body", 0, 5},
      {"Gear ", 0, 3},
      {"Frm.Two\nPowertrain.Body", 0, 2},
      {"  Body.B trailing", 0, 6},
      {"Nope", kvErrSubIdNameUnknown, -1},
      {"Fr", kvErrSubIdNameUnknown, -1},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.text == nullptr ? "null" : c.text);
    int32_t index = 99;
    EXPECT_EQ(Look(session, c.text, &index), c.status);
    EXPECT_EQ(index, c.index);
  }
}

TEST_F(SessionNameToIndexTest, EmptyHandlesMeanEntryZeroWithoutTheDriver) {
  const uint32_t session = MakeSession("A,B", 0);
  void *noBlock = nullptr;
  SvHandle blockless = &noBlock;
  SvHandle none = nullptr;
  SvHandle negative = Keep(svsimMakeString("B"));
  Counted(negative)->cnt = -1;
  kvsimLogClear();
  for (SvHandle *sub : {&none, &blockless, &negative}) {
    int32_t index = 99;
    EXPECT_EQ(SessionNameToIndex(session, sub, &index), 0);
    EXPECT_EQ(index, 0);
  }
  EXPECT_EQ(kvsimLogCount(), 0);
}

TEST_F(SessionNameToIndexTest, TheListIsReadOncePerSlot) {
  const uint32_t session = MakeSession("A,B,C", 0);
  int32_t index = -1;
  kvsimLogClear();
  ASSERT_EQ(Look(session, "C", &index), 0);
  EXPECT_EQ(index, 2);
  EXPECT_EQ(kvsimCountPropertyReads(kvPropSession_List), 2);  // its size, then its text
  kvsimLogClear();
  ASSERT_EQ(Look(session, "B", &index), 0);
  EXPECT_EQ(index, 1);
  EXPECT_EQ(kvsimLogCount(), 0);
  // Numbers never need the list.
  const uint32_t other = MakeSession("A", 0);
  kvsimLogClear();
  ASSERT_EQ(Look(other, "0", &index), 0);
  EXPECT_EQ(Slot(other)->sessionNameList, nullptr);
  EXPECT_EQ(kvsimLogCount(), 0);
}

TEST_F(SessionNameToIndexTest, SlotAndDriverFailures) {
  const uint32_t session = MakeSession("A,B", 0);
  int32_t index = 0;
  EXPECT_EQ(Look(session + 1, "A", &index), kvErrInvalidSession);
  EXPECT_EQ(Look(0x20002001u, "A", &index), kvErrInvalidSession);

  Slot(session)->listGuard = 1;
  EXPECT_EQ(Look(session, "A", &index), kvErrSessionBusy);
  Slot(session)->listGuard = 0;

  const struct { const char *function; } reads[] = {{"kvGetPropertySize"}, {"kvGetProperty"}};
  for (const auto &r : reads) {
    SCOPED_TRACE(r.function);
    kvsimFailProperty(r.function, kvPropSession_List, kvsimErrInternal, 1);
    EXPECT_EQ(Look(session, "B", &index), kvsimErrInternal);
    EXPECT_EQ(Slot(session)->sessionNameList, nullptr);
  }
  // The guard was given back on every way out.
  EXPECT_EQ(Slot(session)->listGuard.load(), 0u);
  ASSERT_EQ(Look(session, "B", &index), 0);
  EXPECT_EQ(index, 1);
  EXPECT_EQ(Slot(session)->listGuard.load(), 0u);
}

}  // namespace
