// Session creation: which interfaces and modes the system accepts, and what a session tells of
// its own definition.
#include <string>

#include "kvor_test_support.h"

namespace {

using KvorSessionCreate = KvorTest;

TEST_F(KvorSessionCreate, InterfacesAreCheckedAgainstTheSystem) {
  const struct {
    const char *name;
    int32_t status;
    uint32_t protocol;
  } cases[] = {
      {"CAN1", 0, kvProtocol_CAN},
      {"CAN4", 0, kvProtocol_CAN},
      {"LIN1", 0, kvProtocol_LIN},
      {"LIN2", 0, kvProtocol_LIN},
      {"FlexRay1", 0, kvProtocol_FlexRay},
      {"FlexRay2", 0, kvProtocol_FlexRay},
      {"ENET1", 0, kvProtocol_Ethernet},
      {"ENET1/monitor", 0, kvProtocol_Ethernet},
      {"CAN1/monitor", 0, kvProtocol_CAN},
      {"can2", 0, kvProtocol_CAN},
      {"flexray1", 0, kvProtocol_FlexRay},
      {"CAN5", kvsimErrUnknownInterface, 0},
      {"CAN0", kvsimErrUnknownInterface, 0},
      {"CAN", kvsimErrUnknownInterface, 0},
      {"ENET2", kvsimErrUnknownInterface, 0},
      {"LIN3", kvsimErrUnknownInterface, 0},
      {"", kvsimErrUnknownInterface, 0},
      {"CAN1/", kvsimErrUnknownInterface, 0},
      {"/monitor", kvsimErrUnknownInterface, 0},
      {" CAN1", kvsimErrUnknownInterface, 0},
  };
  for (const auto &c : cases) {
    uint32_t handle = 0xABCD0123;
    const int32_t status =
        kvCreateSession("DB", "Cluster", "", c.name, kvMode_FrameInStream, &handle);
    EXPECT_EQ(status, c.status) << '"' << c.name << '"';
    if (c.status == 0) {
      EXPECT_EQ(ReadU32(handle, kvPropSession_Protocol), c.protocol) << c.name;
      EXPECT_EQ(ReadText(handle, kvPropSession_IntfName), c.name) << "the name as it was given";
      EXPECT_EQ(kvClear(handle), 0);
    } else {
      EXPECT_EQ(handle, 0xABCD0123u) << "a failed creation leaves the output alone: " << c.name;
    }
  }
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
}

TEST_F(KvorSessionCreate, ModesUpToTwelveAreAcceptedAndKept) {
  for (uint32_t mode = 0; mode <= 12; ++mode) {
    const uint32_t handle = Create("CAN2", mode, "A,B");
    EXPECT_EQ(ReadU32(handle, kvPropSession_Mode), mode);
  }
  for (uint32_t mode : {13u, 100u, 0xFFFFFFFFu}) {
    uint32_t handle = 0;
    EXPECT_EQ(kvCreateSession("DB", "Cluster", "A", "CAN2", mode, &handle), kvsimErrInvalidMode)
        << mode;
  }
  EXPECT_EQ(kvsimOpenSessionCount(), 13);
}

TEST_F(KvorSessionCreate, MissingPointersAreRefused) {
  uint32_t handle = 0;
  EXPECT_EQ(kvCreateSession("DB", "Cluster", "A", nullptr, 0, &handle), kvsimErrNullPointer);
  EXPECT_EQ(kvCreateSession("DB", "Cluster", "A", "CAN1", 0, nullptr), kvsimErrNullPointer);
  EXPECT_EQ(kvsimOpenSessionCount(), 0);
  ASSERT_EQ(kvCreateSession(nullptr, nullptr, nullptr, "CAN1", 0, &handle), 0)
      << "absent texts other than the interface count as empty";
  EXPECT_EQ(ReadText(handle, kvPropSession_DatabaseName), "");
  EXPECT_EQ(ReadU32(handle, kvPropSession_NumInList), 0u);
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
    uint32_t handle = 0;
    const int32_t status =
        kvCreateSession("DB", "Cluster", c.list, "CAN1", kvMode_SignalInSinglePoint, &handle);
    ASSERT_EQ(status, c.status) << '"' << c.list << '"';
    if (status != 0) continue;
    EXPECT_EQ(ReadU32(handle, kvPropSession_NumInList), c.count) << '"' << c.list << '"';
    EXPECT_EQ(ReadText(handle, kvPropSession_List), c.normalised) << '"' << c.list << '"';
  }
}

TEST_F(KvorSessionCreate, ASessionTellsItsDefinition) {
  uint32_t handle = 0;
  ASSERT_EQ(kvCreateSession("Powertrain.dbc", "HS-CAN", "RPM,Torque", "ENET1/monitor",
                            kvMode_SignalOutSinglePoint, &handle),
            0);
  EXPECT_EQ(ReadU32(handle, kvPropSession_Mode),
            static_cast<uint32_t>(kvMode_SignalOutSinglePoint));
  EXPECT_EQ(ReadU32(handle, kvPropSession_NumInList), 2u);
  EXPECT_EQ(ReadU32(handle, kvPropSession_Protocol), static_cast<uint32_t>(kvProtocol_Ethernet));
  EXPECT_EQ(ReadText(handle, kvPropSession_List), "RPM,Torque");
  EXPECT_EQ(ReadText(handle, kvPropSession_IntfName), "ENET1/monitor");
  EXPECT_EQ(ReadText(handle, kvPropSession_DatabaseName), "Powertrain.dbc");
  EXPECT_EQ(ReadText(handle, kvPropSession_ClusterName), "HS-CAN");
}

}  // namespace
