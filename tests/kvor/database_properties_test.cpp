// Properties of database objects against values read off the field files by eye, references
// between objects, finding, editing, creating and deleting.
#include "database_test_support.h"

namespace {

using namespace kvsvtest;

class KvorDatabaseProperties : public KvorTest {
 protected:
  void SetUp() override {
    KvorTest::SetUp();
    database_ = OpenDatabase(DbcPath("tesla_can.dbc"));
    cluster_ = DbCluster(database_);
  }
  uint32_t Signal(const std::string &frameDotSignal) {
    return DbFind(cluster_, 0x30000, frameDotSignal);
  }

  uint32_t database_ = 0;
  uint32_t cluster_ = 0;
};

TEST_F(KvorDatabaseProperties, SignalsReadAsTheFileWritesThem) {
  const struct {
    const char *name;  // frame.signal
    uint32_t start, bits, order, type;
    double scale, offset, min, max;
    const char *unit;
  } cases[] = {
      // BO_ 1160, big-endian: 6|15@0+ (0.1,-1638.35) [-1638.35|1638.35] "deg"
      {"DAS_steeringControl.DAS_steeringAngleRequest", 6, 15, 1, 1, 0.1, -1638.35, -1638.35,
       1638.35, "deg"},
      // BO_ 264, little-endian and signed: 0|13@1- (0.25,0) [-750|750] "Nm"
      {"DI_torque1.DI_torqueDriver", 0, 13, 0, 0, 0.25, 0, -750, 750, "Nm"},
      // BO_ 697: 18|9@1+ (0.03,-15.232) [-15.232|0.098] "m/s^3"
      {"DAS_control.DAS_jerkMin", 18, 9, 0, 1, 0.03, -15.232, -15.232, 0.098, "m/s^3"},
      // BO_ 569: 40|8@1+ (2.4E-07,-3E-05) [-3E-05|3E-05] "m-2"
      {"DAS_lanes.DAS_virtualLaneC3", 40, 8, 0, 1, 2.4E-07, -3E-05, -3E-05, 3E-05, "m-2"},
      // BO_ 880: 37|14@0+ (0.1,-819.200012) [0|0] "deg"
      {"EPAS_sysStatus.EPAS_internalSAS", 37, 14, 1, 1, 0.1, -819.200012, 0, 0, "deg"},
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.name);
    const uint32_t signal = Signal(c.name);
    EXPECT_EQ(signal >> 24, 0x83u) << "a signal handle";
    EXPECT_EQ(DbRead<uint32_t>(signal, kvPropSig_StartBit), c.start);
    EXPECT_EQ(DbRead<uint32_t>(signal, kvPropSig_NumBits), c.bits);
    EXPECT_EQ(DbRead<uint32_t>(signal, kvPropSig_ByteOrdr), c.order);
    EXPECT_EQ(DbRead<uint32_t>(signal, kvPropSig_DataType), c.type);
    EXPECT_EQ(DbRead<double>(signal, kvPropSig_ScaleFac), c.scale);
    EXPECT_EQ(DbRead<double>(signal, kvPropSig_ScaleOff), c.offset);
    EXPECT_EQ(DbRead<double>(signal, kvPropSig_Min), c.min);
    EXPECT_EQ(DbRead<double>(signal, kvPropSig_Max), c.max);
    EXPECT_EQ(DbText(signal, kvPropSig_Unit), c.unit);
    EXPECT_EQ(DbText(signal, kvPropSig_NameUniqueToCluster), c.name);
    EXPECT_EQ(DbRead<uint32_t>(signal, kvPropSig_ConfigStatus), 0u);
  }
}

TEST_F(KvorDatabaseProperties, FramesReadAsTheFileWritesThem) {
  const struct {
    const char *name;
    uint32_t id, length, signals;
    const char *transmitter;
  } cases[] = {
      {"DAS_steeringControl", 1160, 4, 5, "NEO"},   // BO_ 1160 DAS_steeringControl: 4 NEO
      {"STW_ANGL_STAT", 3, 8, 0, "STW"},            // BO_ 3 STW_ANGL_STAT: 8 STW
      {"GTW_epasControl", 257, 3, 7, "NEO"},        // BO_ 257 GTW_epasControl: 3 NEO
      {"UI_autopilotControl", 1006, 8, 24, "GTW"},  // BO_ 1006, multiplexed
  };
  for (const auto &c : cases) {
    SCOPED_TRACE(c.name);
    const uint32_t frame = DbFind(cluster_, 0x20000, c.name);
    EXPECT_EQ(frame >> 24, 0x82u);
    EXPECT_EQ(DbRead<uint32_t>(frame, kvPropFrm_ID), c.id);
    EXPECT_FALSE(DbBool(frame, kvPropFrm_CANExtID));
    EXPECT_EQ(DbRead<uint32_t>(frame, kvPropFrm_PayloadLen), c.length);
    EXPECT_EQ(DbRead<uint32_t>(frame, kvPropFrm_CANioMode), 0u);
    EXPECT_EQ(DbRead<uint32_t>(frame, kvPropFrm_ClusterRef), cluster_);
    if (c.signals != 0) {
      EXPECT_EQ(DbHandles(frame, kvPropFrm_SigRefs).size(), c.signals);
    }
    const std::vector<uint32_t> sent =
        DbHandles(DbFind(cluster_, 0x50000, c.transmitter), kvPropECU_TxFrmRefs);
    EXPECT_NE(std::find(sent.begin(), sent.end(), frame), sent.end()) << "sent by its node";
    // The PDU is the frame's payload.
    const uint32_t pdu = DbFind(cluster_, 0x80000, c.name);
    EXPECT_EQ(pdu >> 24, 0x88u);
    EXPECT_EQ(DbHandles(frame, kvPropFrm_PDURefs), std::vector<uint32_t>{pdu});
    EXPECT_EQ(DbHandles(pdu, kvPropPDU_FrmRefs), std::vector<uint32_t>{frame});
    EXPECT_EQ(DbText(pdu, kvPropPDU_Name), c.name);
    EXPECT_EQ(DbRead<uint32_t>(pdu, kvPropPDU_PayloadLen), c.length);
  }
  // DAS_steeringControl is received by EPAS, in every signal.
  const std::vector<uint32_t> received =
      DbHandles(DbFind(cluster_, 0x50000, "EPAS"), kvPropECU_RxFrmRefs);
  EXPECT_NE(
      std::find(received.begin(), received.end(), DbFind(cluster_, 0x20000, "DAS_steeringControl")),
      received.end());
  EXPECT_EQ(DbHandles(cluster_, kvPropClst_ECURefs).size(), 11u);  // BU_: NEO ... XXX
}

TEST_F(KvorDatabaseProperties, MultiplexingIsToldOnFrameAndSignals) {
  const uint32_t frame = DbFind(cluster_, 0x20000, "UI_autopilotControl");
  const uint32_t multiplexer = Signal("UI_autopilotControlIndex");  // unique in the cluster
  EXPECT_TRUE(DbBool(frame, kvPropFrm_MuxIsMuxed));
  EXPECT_EQ(DbRead<uint32_t>(frame, kvPropFrm_MuxDataMuxSigRef), multiplexer);
  EXPECT_EQ(DbHandles(frame, kvPropFrm_MuxStaticSigRefs), std::vector<uint32_t>{multiplexer});
  const struct {
    const char *name;
    bool isMux, isDynamic;
    uint32_t value;
  } cases[] = {
      {"UI_autopilotControlIndex", true, false, 0},       // M
      {"UI_hovEnabled", false, true, 0},                  // m0
      {"UI_camBlockLaneCheckThreshold", false, true, 1},  // m1
  };
  for (const auto &c : cases) {
    const uint32_t signal = Signal(std::string("UI_autopilotControl.") + c.name);
    EXPECT_EQ(DbBool(signal, kvPropSig_MuxIsDataMux), c.isMux) << c.name;
    EXPECT_EQ(DbBool(signal, kvPropSig_MuxIsDynamic), c.isDynamic) << c.name;
    EXPECT_EQ(DbRead<uint32_t>(signal, kvPropSig_MuxValue), c.value) << c.name;
    EXPECT_EQ(DbRead<uint32_t>(signal, kvPropSig_FrameRef), frame);
  }
  uint32_t size = 0;
  EXPECT_EQ(kvdbGetPropertySize(DbFind(cluster_, 0x20000, "DI_torque1"), kvPropFrm_MuxDataMuxSigRef,
                                &size),
            kvsimErrPropertyUnknown)
      << "a frame without a multiplexer";
}

TEST_F(KvorDatabaseProperties, OtherFilesGiveExtendedAndCanFdFrames) {
  // gm: BO_ 2152177664 OTA_Electric_Pwr_Readiness_LS: 1 XXX, bit 31 marks it extended.
  const uint32_t gm = DbCluster(OpenDatabase(DbcPath("gm_global_a_lowspeed_1818125.dbc")));
  const uint32_t extended = DbFind(gm, 0x20000, "OTA_Electric_Pwr_Readiness_LS");
  EXPECT_TRUE(DbBool(extended, kvPropFrm_CANExtID));
  EXPECT_EQ(DbRead<uint32_t>(extended, kvPropFrm_ID), 2152177664u - 0x80000000u);
  EXPECT_EQ(DbRead<uint32_t>(extended, kvPropFrm_PayloadLen), 1u);
  // hyundai_canfd: frames of 32 bytes are CAN FD.
  const uint32_t fd = DbCluster(OpenDatabase(DbcPath("hyundai_canfd.dbc")));
  size_t canFd = 0;
  for (uint32_t frame : DbHandles(fd, kvPropClst_FrmRefs)) {
    const uint32_t length = DbRead<uint32_t>(frame, kvPropFrm_PayloadLen);
    EXPECT_EQ(DbRead<uint32_t>(frame, kvPropFrm_CANioMode), length > 8 ? 1u : 0u);
    canFd += length > 8;
  }
  EXPECT_EQ(canFd, 12u + 8u + 55u);  // frames of 16, 24 and 32 bytes in the file
  EXPECT_EQ(DbRead<uint32_t>(fd, kvPropClst_CanIoMode), 1u);
}

TEST_F(KvorDatabaseProperties, ReadsAreRefusedAsADriverRefusesThem) {
  const uint32_t signal = Signal("DI_torque1.DI_torqueDriver");
  char small[4];
  EXPECT_EQ(kvdbGetProperty(signal, kvPropSig_Name, sizeof small, small), kvsimErrBufferTooSmall);
  uint32_t size = 0;
  EXPECT_EQ(kvdbGetPropertySize(signal, kvPropFrm_Name, &size), kvsimErrPropertyUnknown)
      << "a property of another class";
  EXPECT_EQ(kvdbGetPropertySize(signal, 0x00030077, &size), kvsimErrPropertyUnknown);
  EXPECT_EQ(kvdbGetPropertySize(0x83FFFFFF, kvPropSig_Name, &size), kvsimErrInvalidDatabase);
  EXPECT_EQ(kvdbGetPropertySize(signal, kvPropSig_Name, nullptr), kvsimErrNullPointer);
  uint32_t error = 0;
  ASSERT_EQ(kvhdnCreateErrorSession(kvsimErrTimeout, &error), 0);
  EXPECT_EQ(kvdbGetPropertySize(error, kvPropSig_Name, &size), kvsimErrTimeout)
      << "an error handle answers with its failure";
}

TEST_F(KvorDatabaseProperties, FindingTellsMissingAndAmbiguousNames) {
  uint32_t object = 0;
  const struct {
    uint32_t parentClass;  // 0 the database, 1 the cluster
    uint32_t objectClass;
    const char *name;
    int32_t status;
  } cases[] = {
      {0, 0x10000, "", 0},  // the database's one cluster
      {0, 0x10000, "Cluster", 0},
      {0, 0x10000, "Other", kvsimErrObjectNotFound},
      {0, 0x20000, "DI_torque1", 0},  // through the one cluster
      {1, 0x20000, "NoSuchFrame", kvsimErrObjectNotFound},
      {1, 0x30000, "DI_torque1.NoSuchSignal", kvsimErrObjectNotFound},
      // EPAS_internalSAS is in EPAS_sysStatus and EPAS3P_sysStatus.
      {1, 0x30000, "EPAS_internalSAS", kvsimErrObjectNotFound},
      {1, 0x30000, "EPAS3P_sysStatus.EPAS_internalSAS", 0},
      {1, 0x40000, "Sub", kvsimErrInvalidClass},
      {1, 0x10000, "Cluster", kvsimErrInvalidClass},
  };
  for (const auto &c : cases) {
    const uint32_t parent = c.parentClass == 0 ? database_ : cluster_;
    EXPECT_EQ(kvdbFindObject(parent, c.objectClass, c.name, &object), c.status) << c.name;
  }
  EXPECT_EQ(DbFind(database_, 0x10000, ""), cluster_) << "the same object keeps its handle";
  EXPECT_EQ(DbFind(DbFind(cluster_, 0x20000, "DI_torque1"), 0x30000, "DI_torqueDriver"),
            Signal("DI_torque1.DI_torqueDriver"));
}

TEST_F(KvorDatabaseProperties, SetValuesReadBackAndBadOnesAreRefused) {
  const uint32_t frame = DbFind(cluster_, 0x20000, "DI_torque1");
  const uint32_t signal = Signal("DI_torque1.DI_torqueDriver");
  EXPECT_EQ(DbSet<uint32_t>(frame, kvPropFrm_ID, 0x123), 0);
  EXPECT_EQ(DbRead<uint32_t>(frame, kvPropFrm_ID), 0x123u);
  EXPECT_EQ(DbSet<double>(frame, kvPropFrm_CANTxTime, 0.02), 0);
  EXPECT_EQ(DbRead<double>(frame, kvPropFrm_CANTxTime), 0.02);
  EXPECT_EQ(DbSet<uint32_t>(frame, kvPropFrm_PayloadLen, 16), 0);
  EXPECT_EQ(DbRead<uint32_t>(frame, kvPropFrm_CANioMode), 1u) << "over 8 bytes is CAN FD";
  EXPECT_EQ(DbSet<double>(signal, kvPropSig_Default, -10.0), 0);
  EXPECT_EQ(DbRead<double>(signal, kvPropSig_Default), -10.0);
  EXPECT_EQ(DbSetText(signal, kvPropSig_Name, "Driver"), 0);
  EXPECT_EQ(DbText(signal, kvPropSig_NameUniqueToCluster), "DI_torque1.Driver");

  const struct {
    uint32_t object, id;
    std::vector<uint8_t> value;
    int32_t status;
  } refused[] = {
      {frame, kvPropFrm_ID, {0x00, 0x08, 0, 0}, kvsimErrInvalidArgument},    // 0x800: not standard
      {frame, kvPropFrm_ID, {0x88, 0x04, 0, 0}, kvsimErrObjectExists},       // DAS_steeringControl
      {frame, kvPropFrm_PayloadLen, {9, 0, 0, 0}, kvsimErrInvalidArgument},  // no such length
      {frame, kvPropFrm_CANioMode, {0, 0, 0, 0}, kvsimErrInvalidArgument},   // 16 bytes need FD
      {frame, kvPropFrm_ID, {1, 0}, kvsimErrPropertySize},
      {frame, kvPropFrm_Name, {'9', 'x', 0}, kvsimErrInvalidName},
      {frame,
       kvPropFrm_Name,
       {'D', 'I', '_', 't', 'o', 'r', 'q', 'u', 'e', '2', 0},
       kvsimErrObjectExists},
      {frame, kvPropFrm_SigRefs, {}, kvsimErrPropertyReadOnly},
      {signal, kvPropSig_NumBits, {0, 0, 0, 0}, kvsimErrInvalidArgument},
      {signal, kvPropSig_NumBits, {65, 0, 0, 0}, kvsimErrInvalidArgument},
      {signal, kvPropSig_ByteOrdr, {2, 0, 0, 0}, kvsimErrInvalidArgument},
      {signal, kvPropSig_NameUniqueToCluster, {'a', 0}, kvsimErrPropertyReadOnly},
      {signal, kvPropSig_MuxIsDataMux, {1}, 0},
  };
  for (const auto &c : refused) {
    EXPECT_EQ(kvdbSetProperty(c.object, c.id, static_cast<uint32_t>(c.value.size()),
                              c.value.empty() ? nullptr : c.value.data()),
              c.status)
        << std::hex << c.id;
  }
  EXPECT_EQ(DbRead<uint32_t>(frame, kvPropFrm_ID), 0x123u) << "refused sets change nothing";
  EXPECT_EQ(DbSet<uint8_t>(Signal("DI_torque1.DI_pedalPos"), kvPropSig_MuxIsDataMux, 1),
            kvsimErrObjectExists)
      << "one multiplexer per frame";
}

TEST_F(KvorDatabaseProperties, ConfigStatusTellsASignalOutsideItsFrame) {
  const uint32_t frame = DbFind(cluster_, 0x20000, "GTW_epasControl");        // 3 bytes
  const uint32_t signal = Signal("GTW_epasControl.GTW_epasControlChecksum");  // 23|8 big-endian
  EXPECT_EQ(DbRead<uint32_t>(frame, kvPropFrm_ConfigStatus), 0u);
  ASSERT_EQ(DbSet<uint32_t>(signal, kvPropSig_NumBits, 9), 0);  // runs into byte 3
  EXPECT_EQ(static_cast<int32_t>(DbRead<uint32_t>(signal, kvPropSig_ConfigStatus)),
            kvsimErrSignalLayout);
  EXPECT_EQ(static_cast<int32_t>(DbRead<uint32_t>(frame, kvPropFrm_ConfigStatus)),
            kvsimErrSignalLayout);
  cTempDir directory;
  EXPECT_EQ(kvdbSaveDatabase(database_, directory.Sub("x.dbc").c_str()), kvsimErrDatabaseWrite);
  EXPECT_NE(DatabaseErrorText().find("GTW_epasControlChecksum"), std::string::npos);
}

TEST_F(KvorDatabaseProperties, DefaultPayloadHoldsTheStartValues) {
  const uint32_t frame = DbFind(cluster_, 0x20000, "UI_autopilotControl");
  const uint32_t index = Signal("UI_autopilotControl.UI_autopilotControlIndex");    // 0|3 M
  const uint32_t m1 = Signal("UI_autopilotControl.UI_camBlockLaneCheckThreshold");  // 4|6 m1
  const uint32_t m0 = Signal("UI_autopilotControl.UI_hovEnabled");                  // 3|1 m0
  ASSERT_EQ(DbSet<double>(m1, kvPropSig_Default, 0.01587 * 0x2A), 0);
  ASSERT_EQ(DbSet<double>(m0, kvPropSig_Default, 1.0), 0);
  EXPECT_EQ(DbBytes(frame, kvPropFrm_DefaultPayload),
            (std::vector<uint8_t>{0x08, 0, 0, 0, 0, 0, 0, 0}))
      << "multiplexer 0 selects the m0 signals";
  ASSERT_EQ(DbSet<double>(index, kvPropSig_Default, 1.0), 0);
  EXPECT_EQ(DbBytes(frame, kvPropFrm_DefaultPayload),
            (std::vector<uint8_t>{0xA1, 0x02, 0, 0, 0, 0, 0, 0}))
      << "multiplexer 1 selects the m1 signals: 0x2A at bit 4";
}

TEST_F(KvorDatabaseProperties, CreatedAndDeletedObjectsComeAndGoWithTheirHandles) {
  uint32_t frame = 0, signal = 0, ecu = 0;
  ASSERT_EQ(kvdbCreateObject(cluster_, 0x20000, "NewFrame", &frame), 0);
  EXPECT_EQ(DbRead<uint32_t>(frame, kvPropFrm_ID), 0u) << "the lowest free identifier";
  ASSERT_EQ(kvdbCreateObject(frame, 0x30000, "NewSignal", &signal), 0);
  ASSERT_EQ(kvdbCreateObject(cluster_, 0x50000, "NewEcu", &ecu), 0);
  EXPECT_EQ(kvdbCreateObject(cluster_, 0x20000, "NewFrame", &frame), kvsimErrObjectExists);
  EXPECT_EQ(kvdbCreateObject(cluster_, 0x20000, "bad name", &frame), kvsimErrInvalidName);
  EXPECT_EQ(kvdbCreateObject(database_, 0x10000, "Second", &frame), kvsimErrObjectExists);
  EXPECT_EQ(kvdbCreateObject(signal, 0x30000, "Child", &frame), kvsimErrInvalidClass);
  EXPECT_EQ(DbFind(cluster_, 0x30000, "NewFrame.NewSignal"), signal);

  // An ECU goes from the frames that named it.
  const uint32_t neo = DbFind(cluster_, 0x50000, "NEO");
  const size_t sent = DbHandles(neo, kvPropECU_TxFrmRefs).size();
  ASSERT_GT(sent, 0u);
  const uint32_t driven = DbHandles(neo, kvPropECU_TxFrmRefs)[0];
  ASSERT_EQ(DbSetText(neo, kvPropECU_Name, "Brain"), 0);
  EXPECT_EQ(DbHandles(neo, kvPropECU_TxFrmRefs).size(), sent) << "frames follow a rename";
  ASSERT_EQ(kvdbDeleteObject(neo), 0);
  EXPECT_EQ(kvdbDeleteObject(neo), kvsimErrInvalidDatabase);
  EXPECT_FALSE(DbText(driven, kvPropFrm_Name).empty()) << "the frame stays";
  for (uint32_t other : DbHandles(cluster_, kvPropClst_ECURefs)) {
    const std::vector<uint32_t> frames = DbHandles(other, kvPropECU_TxFrmRefs);
    EXPECT_EQ(std::find(frames.begin(), frames.end(), driven), frames.end()) << "no sender now";
  }

  const size_t frames = DbHandles(cluster_, kvPropClst_FrmRefs).size();
  const uint32_t pdu = DbHandles(frame, kvPropFrm_PDURefs).at(0);
  ASSERT_EQ(kvdbDeleteObject(frame), 0);
  EXPECT_EQ(DbHandles(cluster_, kvPropClst_FrmRefs).size(), frames - 1);
  uint32_t size = 0;
  for (uint32_t gone : {frame, signal, pdu}) {
    EXPECT_EQ(kvdbGetPropertySize(gone, kvPropSig_Name, &size), kvsimErrInvalidDatabase)
        << std::hex << gone;
  }
  EXPECT_EQ(kvdbDeleteObject(database_), kvsimErrInvalidClass);
  EXPECT_EQ(kvdbDeleteObject(DbFind(cluster_, 0x80000, "DI_torque1")), kvsimErrInvalidClass);
}

TEST_F(KvorDatabaseProperties, CallsAreLoggedAndCanBeMadeToFail) {
  constexpr int32_t kFault = static_cast<int32_t>(0xBFF62777);
  ASSERT_EQ(kvsimFailCall("kvdbFindObject", kFault, 1), 0);
  ASSERT_EQ(kvsimFailProperty("kvdbGetProperty", kvPropFrm_ID, kFault, 1), 0);
  kvsimLogClear();
  uint32_t object = 0;
  EXPECT_EQ(kvdbFindObject(cluster_, 0x20000, "DI_torque1", &object), kFault);
  ASSERT_EQ(kvdbFindObject(cluster_, 0x20000, "DI_torque1", &object), 0) << "once only";
  kvsimCallRecord record;
  ASSERT_EQ(kvsimLogEntry(1, &record), 1);
  EXPECT_STREQ(record.function, "kvdbFindObject");
  EXPECT_EQ(record.object, cluster_);
  EXPECT_EQ(record.size1, 0x20000u);
  EXPECT_STREQ(record.text, "DI_torque1");
  uint32_t id = 0;
  EXPECT_EQ(kvdbGetProperty(object, kvPropFrm_ID, sizeof id, &id), kFault);
  EXPECT_EQ(kvdbGetProperty(object, kvPropFrm_ID, sizeof id, &id), 0);
  EXPECT_EQ(id, 264u);
  EXPECT_EQ(kvsimCountCalls("kvdbGetProperty"), 2);
}

}  // namespace
