// Property identifier names: the lookup against the identifiers as the driver defines them, and
// the annotation that a property export writes into its caller's error information.
#include "property/property_id_names.h"

#include <gtest/gtest.h>

#include <cstring>
#include <set>
#include <string>

#include "property/annotate_property_status.h"
#include "svsim.h"

namespace {

using namespace nKVSVAPI100;

struct tNamedCase {
  uint32_t id;
  const char *name;
};

// Pairs that share a number under two types, 64-bit twins, and names whose neighbours have none.
const tNamedCase kNamed[] = {
    {0x03010008, "kvPropClst_Comment"},
    {0x06010008, "kvPropClst_PDURefs"},
    {0x00120008, "kvPropDev_ProductNum"},
    {0x06120008, "kvPropDev_IntfRefsAll"},
    {0x06080005, "kvPropPDU_SigRefs"},
    {0x0A080005, "kvPropPDU_DefaultPayload"},
    {0x01100081, "kvPropSessionSub_CANStartTimeOff"},
    {0x02100081, "kvPropSession_IntfLINChecksumToInStrm"},
    {0x00010001, "kvPropClst_BaudRate"},
    {0x09010001, "kvPropClst_BaudRate64"},
    {0x00010011, "kvPropClst_CanFdBaudRate"},
    {0x09010011, "kvPropClst_CanFdBaudRate64"},
    {0x00100016, "kvPropSession_IntfBaudRate"},
    {0x09100016, "kvPropSession_IntfBaudRate64"},
    {0x0011000A, "kvPropSys_VerPhase"},
    {0x0802FFFC, "kvPropFrm_PDU_Mapping"},
    {0x03000001, "kvPropDatabase_Name"},
    {0x0013000F, "kvPropIntf_DongleCompatibleFirmwareVersion"},
    {0x081000F2, "kvPropSessionSub_CustCodeData"},
    {0x0C1000BC, "kvPropSession_IntfEnetEptReceiveFilter"},
};

TEST(PropertyIdToName, NamesEachIdentifierOfASharedNumberOnItsOwn) {
  for (const tNamedCase &c : kNamed) {
    const char *name = PropertyIdToName(c.id);
    ASSERT_NE(name, nullptr) << std::hex << c.id;
    EXPECT_STREQ(name, c.name) << std::hex << c.id;
  }
}

TEST(PropertyIdToName, GivesNullForIdentifiersWithoutAName) {
  const tNamedCase unnamed[] = {
      {0x00000000, "class 0, number 0"},
      {0x00090000, "class without a row"},
      {0x000F0000, "class without a row"},
      {0x00140001, "class beyond the last row"},
      {0xFF100003, "type without names"},
      {0x00120009, "known class, unknown number"},
      {0x0111000A, "named number under another type"},
      {0x06010009, "named number under another type"},
      {0x09010002, "named number under another type"},
      {0x0002FEFD, "hidden frame sub-setting"},
      {0x0011FFF1, "hidden implicit-close report"},
      {0x0410FFFF, "hidden frame list"},
      {0x0010FFF1, "hidden identifier of the session class"},
      {0x0010FFF2, "hidden identifier of the session class"},
      {0x05030034, "cluster reference of a signal"},
      {0x05040006, "cluster reference of a subframe"},
      {0x05070009, "cluster reference of a LIN schedule entry"},
      {0x00100000, "below the first number of a row"},
      {0x0013FFFF, "above the last number of a row"},
  };
  for (const tNamedCase &c : unnamed)
    EXPECT_EQ(PropertyIdToName(c.id), nullptr) << std::hex << c.id << ": " << c.name;
}

// Every type that has names, every class that has a row, and the numbers in use: exactly the 382
// names, no two alike, each under the prefix of its own class.
TEST(PropertyIdToName, NamesExactly382DistinctIdentifiersUnderTheirClassPrefix) {
  struct tClassPrefix {
    uint32_t classField;
    const char *prefixes[2];
  };
  const tClassPrefix classes[] = {
      {0x00, {"kvPropDatabase_"}}, {0x01, {"kvPropClst_"}},
      {0x02, {"kvPropFrm_"}},      {0x03, {"kvPropSig_"}},
      {0x04, {"kvPropSubfrm_"}},   {0x05, {"kvPropECU_"}},
      {0x06, {"kvPropLINSched_"}}, {0x07, {"kvPropLINSchedEntry_"}},
      {0x08, {"kvPropPDU_"}},      {0x10, {"kvPropSession_", "kvPropSessionSub_"}},
      {0x11, {"kvPropSys_"}},      {0x12, {"kvPropDev_"}},
      {0x13, {"kvPropIntf_"}},
  };
  std::set<std::string> names;
  int found = 0;
  for (uint32_t type = 0; type <= 0x0C; ++type) {
    for (const tClassPrefix &c : classes) {
      for (uint32_t number = 0; number <= 0xFFFF; number = number == 0x100 ? 0xFFFC : number + 1) {
        const uint32_t id = type << 24 | c.classField << 16 | number;
        const char *name = PropertyIdToName(id);
        if (name == nullptr) continue;
        ++found;
        names.insert(name);
        bool prefixed = false;
        for (const char *prefix : c.prefixes)
          prefixed |= prefix != nullptr && std::strncmp(name, prefix, std::strlen(prefix)) == 0;
        EXPECT_TRUE(prefixed) << name << " under class " << std::hex << c.classField;
      }
    }
  }
  EXPECT_EQ(found, 382);
  EXPECT_EQ(names.size(), 382u);
}

class AnnotatePropertyStatusTest : public testing::Test {
 protected:
  void SetUp() override { liveBefore_ = svsimReset(); }
  void TearDown() override {
    svsimReset();
    EXPECT_EQ(svsimLiveHandles(), liveBefore_) << "handles left alive";
  }

  static std::string Text(SvHandle string) {
    char text[128] = {};
    const int32_t length = svsimReadString(string, text, sizeof text);
    return std::string(text, static_cast<size_t>(length));
  }

  uint64_t liveBefore_ = 0;
};

TEST_F(AnnotatePropertyStatusTest, WritesTheNameBehindItsFirstUnderscoreIntoANewHandle) {
  struct tCase {
    Status status;
    uint32_t id;
    const char *text;
  };
  const tCase cases[] = {
      {static_cast<Status>(0xBFF630B0), 0x04100003, "\nProperty: List"},
      {0x3FF60001, 0x04100003, "\nProperty: List"},
      {-1, 0x0802FFFC, "\nProperty: PDU_Mapping"},
      {-1, 0x03100086, "\nProperty: J1939_AddrFilter"},
      {-1, 0x0A070009, "\nProperty: NC_FF_DataBytes"},
      {-1, 0x0002FEFD, "\nProperty: (unknown ID hex 0002fefd)"},
      {7, 0x0C0FABCD, "\nProperty: (unknown ID hex 0c0fabcd)"},
      {-1, 0x00000000, "\nProperty: (unknown ID hex 00000000)"},
  };
  for (const tCase &c : cases) {
    SvHandle earlier = svsimMakeString("earlier");
    SvHandle info = earlier;
    const uint64_t live = svsimLiveHandles();
    svsimResetCounters();
    AnnotatePropertyStatus(c.status, c.id, &info);
    ASSERT_NE(info, nullptr) << std::hex << c.id;
    EXPECT_NE(info, earlier);
    EXPECT_EQ(Text(info), c.text) << std::hex << c.id;
    // Every annotation fits the fixed width: the handle is never grown.
    EXPECT_EQ(svGetHandleSize(info), 108u);
    EXPECT_EQ(svsimAllocCount(), 1u);
    EXPECT_EQ(svsimResizeCount(), 0u);
    // The host still owns what it passed in: it stays alive and unchanged.
    EXPECT_EQ(svsimFreeCount(), 0u);
    EXPECT_EQ(svsimLiveHandles(), live + 1);
    EXPECT_EQ(Text(earlier), "earlier");
    svDisposeHandle(info);
    svDisposeHandle(earlier);
  }
}

TEST_F(AnnotatePropertyStatusTest, LeavesInfoAloneForSuccessOrNoInfo) {
  SvHandle earlier = svsimMakeString("earlier");
  SvHandle info = earlier;
  svsimResetCounters();
  AnnotatePropertyStatus(0, 0x04100003, &info);
  AnnotatePropertyStatus(-1, 0x04100003, nullptr);
  EXPECT_EQ(info, earlier);
  EXPECT_EQ(Text(info), "earlier");
  EXPECT_EQ(svsimAllocCount(), 0u);
  svDisposeHandle(earlier);
}

TEST_F(AnnotatePropertyStatusTest, AFailedAllocationLeavesNullAndTheEarlierHandleAlive) {
  SvHandle earlier = svsimMakeString("earlier");
  SvHandle info = earlier;
  const uint64_t live = svsimLiveHandles();
  svsimFailAllocAt(1);
  AnnotatePropertyStatus(-1, 0x04100003, &info);
  EXPECT_EQ(svsimInjectedFaults(), 1u);
  EXPECT_EQ(info, nullptr);
  EXPECT_EQ(svsimLiveHandles(), live);
  EXPECT_EQ(Text(earlier), "earlier");
  svDisposeHandle(earlier);
}

}  // namespace
