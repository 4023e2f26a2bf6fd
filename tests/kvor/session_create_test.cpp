// Session creation: which interfaces and lists the system accepts, and what a session tells of its
// own definition.
#include <string>

#include "kvor_test_support.h"

namespace {

using KvorSessionCreate = KvorTest;

TEST_F(KvorSessionCreate, InterfacesAreCheckedAgainstTheSystemAndTheDefinitionIsKept) {
  const struct {
    const char *name;
    uint32_t protocol;
    const char *database, *cluster;  // null: none given, which reads as empty
  } known[] = {{"LIN2", kvProtocol_LIN, "DB", "Cluster"},
               {"can2", kvProtocol_CAN, nullptr, nullptr},
               {"flexray2", kvProtocol_FlexRay, "Powertrain.dbc", "HS-CAN"},
               {"ENET1/monitor", kvProtocol_Ethernet, "DB", "Cluster"},
               {"CAN1/monitor", kvProtocol_CAN, "DB", "Cluster"}};
  for (const auto &c : known) {
    SCOPED_TRACE(c.name);
    uint32_t handle = 0;
    ASSERT_EQ(kvCreateSession(c.database, c.cluster, nullptr, c.name, kvMode_SignalOutXY, &handle),
              0);
    EXPECT_EQ(ReadU32(handle, kvPropSession_Protocol), c.protocol);
    EXPECT_EQ(ReadText(handle, kvPropSession_IntfName), c.name) << "the name as it was given";
    EXPECT_EQ(ReadText(handle, kvPropSession_DatabaseName), c.database ? c.database : "");
    EXPECT_EQ(ReadText(handle, kvPropSession_ClusterName), c.cluster ? c.cluster : "");
    EXPECT_EQ(ReadU32(handle, kvPropSession_Mode), uint32_t{kvMode_SignalOutXY});
    EXPECT_EQ(ReadU32(handle, kvPropSession_NumInList), 0u);
    EXPECT_EQ(kvClear(handle), 0);
  }
  for (const char *name : {"CAN5", "CAN", "", "CAN1/", "/monitor", " CAN1"}) {
    uint32_t handle = 0xABCD0123;
    EXPECT_EQ(kvCreateSession("DB", "Cluster", "", name, kvMode_FrameInStream, &handle),
              kvsimErrUnknownInterface)
        << '"' << name << '"';
    EXPECT_EQ(handle, 0xABCD0123u) << "a failed creation leaves the output alone";
  }
  uint32_t handle = 0;
  EXPECT_EQ(kvCreateSession("DB", "Cluster", "A", nullptr, 0, &handle), kvsimErrNullPointer);
  EXPECT_EQ(kvCreateSession("DB", "Cluster", "A", "CAN1", 0, nullptr), kvsimErrNullPointer);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
}

TEST_F(KvorSessionCreate, TheListIsCutAtCommasAndTrimmed) {
  const struct {
    const char *list;
    int32_t status;
    uint32_t count;
    const char *normalised;
  } cases[] = {
      {"EngineSpeed", 0, 1, "EngineSpeed"},
      {" EngineSpeed , VehicleSpeed,Gear ", 0, 3, "EngineSpeed,VehicleSpeed,Gear"},
      {"Frame1.Signal1,Frame2.Signal1", 0, 2, "Frame1.Signal1,Frame2.Signal1"},
      {"", 0, 0, ""},
      {"   ", 0, 0, ""},
      {"A,,B", kvsimErrInvalidList, 0, nullptr},
      {"A,", kvsimErrInvalidList, 0, nullptr},
      {",A", kvsimErrInvalidList, 0, nullptr},
      {"A, ,B", kvsimErrInvalidList, 0, nullptr},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(std::string("\"") + c.list + "\"");
    uint32_t handle = 0;
    ASSERT_EQ(kvCreateSession("DB", "Cluster", c.list, "CAN1", kvMode_SignalInSinglePoint, &handle),
              c.status);
    if (c.status != 0) continue;
    EXPECT_EQ(ReadU32(handle, kvPropSession_NumInList), c.count);
    EXPECT_EQ(ReadText(handle, kvPropSession_List), c.normalised);
  }
}

}  // namespace
