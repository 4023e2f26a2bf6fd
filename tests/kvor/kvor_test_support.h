// Shared pieces of the driver stand-in's tests: a fixture that starts and ends each test from a
// freshly reset driver, readers for property values, frame records as tests write and read them,
// and the driver's control calls and handle-taking calls as tables.
#ifndef KVOR_TEST_SUPPORT_H
#define KVOR_TEST_SUPPORT_H

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <functional>
#include <string>
#include <vector>

#include "kvorproperties.h"
#include "kvsim.h"
#include "kvsvplatform.h"

class KvorTest : public ::testing::Test {
 protected:
  // The interfaces of the stand-in's system, in the order the system lists them.
  static constexpr const char *kInterfaceNames[] = {"CAN1", "CAN2",     "CAN3",     "CAN4", "LIN1",
                                                    "LIN2", "FlexRay1", "FlexRay2", "ENET1"};

  void SetUp() override { kvsimReset(); }
  void TearDown() override { kvsimReset(); }

  // A session that must be made; a failure fails the test and gives 0.
  static uint32_t Create(const char *interfaceName, uint32_t mode, const char *list = "") {
    uint32_t handle = 0;
    const int32_t status = kvCreateSession("DB", "Cluster", list, interfaceName, mode, &handle);
    EXPECT_EQ(status, 0) << "creating a session on " << interfaceName;
    return handle;
  }

  static uint32_t OpenSystem() {
    uint32_t system = 0;
    EXPECT_EQ(kvSystemOpen(&system), 0);
    return system;
  }

  static uint32_t ReadU32(uint32_t object, uint32_t id) {
    uint32_t value = 0xDEADBEEF;
    EXPECT_EQ(kvGetProperty(object, id, sizeof value, &value), 0) << std::hex << id;
    return value;
  }

  // Text through the size the driver gives, which counts the NUL.
  static std::string ReadText(uint32_t object, uint32_t id) {
    uint32_t size = 0;
    EXPECT_EQ(kvGetPropertySize(object, id, &size), 0) << std::hex << id;
    if (size == 0) return "<no size>";
    std::vector<char> text(size, 'X');
    EXPECT_EQ(kvGetProperty(object, id, size, text.data()), 0) << std::hex << id;
    EXPECT_EQ(text.back(), '\0') << "text property " << std::hex << id << " lacks its NUL";
    return std::string(text.data());
  }

  static std::vector<uint32_t> ReadHandles(uint32_t object, uint32_t id) {
    uint32_t size = 0;
    EXPECT_EQ(kvGetPropertySize(object, id, &size), 0) << std::hex << id;
    std::vector<uint32_t> handles(size / 4);
    if (!handles.empty()) {
      EXPECT_EQ(kvGetProperty(object, id, size, handles.data()), 0) << std::hex << id;
    }
    return handles;
  }
};

struct Rec {
  uint32_t identifier = 0;
  std::vector<uint8_t> payload;
  uint8_t type = 0;
  uint8_t flags = 0;
  uint8_t info = 0;
  uint64_t timestamp = 0;

  bool operator==(const Rec &o) const {
    return identifier == o.identifier && payload == o.payload && type == o.type &&
           flags == o.flags && info == o.info && timestamp == o.timestamp;
  }
};

inline std::ostream &operator<<(std::ostream &out, const Rec &r) {
  return out << "{id " << std::hex << r.identifier << " type " << +r.type << " flags " << +r.flags
             << " info " << +r.info << std::dec << " len " << r.payload.size() << " t "
             << r.timestamp << "}";
}

// Bytes of a record: 24 in the fixed form, otherwise room for the payload rounded up to 8 bytes,
// and never less than 8 of it.
inline uint32_t RecBytes(const Rec &r, bool fixed) {
  const uint32_t length = static_cast<uint32_t>(r.payload.size());
  return fixed || length <= 8 ? 24 : 16 + ((length + 7) / 8) * 8;
}

// A long record (type 0xC0) keeps the high bits of its length in the low 3 bits of Info.
inline std::vector<uint8_t> Pack(const std::vector<Rec> &recs, bool fixed = false) {
  std::vector<uint8_t> out;
  for (const Rec &r : recs) {
    std::vector<uint8_t> bytes(RecBytes(r, fixed), 0);
    std::memcpy(bytes.data(), &r.timestamp, 8);
    std::memcpy(bytes.data() + 8, &r.identifier, 4);
    bytes[12] = r.type;
    bytes[13] = r.flags;
    bytes[14] = r.info;
    bytes[15] = static_cast<uint8_t>(r.payload.size());
    if (r.type == 0xC0) bytes[14] = static_cast<uint8_t>((r.info & ~7) | (r.payload.size() >> 8));
    std::copy(r.payload.begin(), r.payload.end(), bytes.begin() + 16);
    out.insert(out.end(), bytes.begin(), bytes.end());
  }
  return out;
}

// Walks `size` bytes of records; a fixed-form record's payload is its length up to 8.
inline std::vector<Rec> Unpack(const uint8_t *bytes, uint32_t size, bool fixed = false) {
  std::vector<Rec> recs;
  for (uint32_t at = 0; at < size;) {
    Rec r;
    std::memcpy(&r.timestamp, bytes + at, 8);
    std::memcpy(&r.identifier, bytes + at + 8, 4);
    r.type = bytes[at + 12];
    r.flags = bytes[at + 13];
    r.info = bytes[at + 14];
    uint32_t length = bytes[at + 15];
    if (r.type == 0xC0) length |= (r.info & 7u) << 8;
    r.payload.assign(bytes + at + 16, bytes + at + 16 + (fixed ? std::min(length, 8u) : length));
    at += RecBytes(r, fixed);
    recs.push_back(r);
  }
  return recs;
}

// The driver's Ethernet descriptors: 40 bytes to read into, 16 bytes to write from.
struct EthernetSlot {
  uint64_t data = 0;
  uint32_t length = 0;
  uint32_t flags = 0;
  uint32_t wireLength = 0;
  uint32_t word = 0;
  uint64_t firstTime = 0;
  uint64_t secondTime = 0;
};
static_assert(sizeof(EthernetSlot) == 40, "driver layout");

inline EthernetSlot Room(uint8_t *at, uint32_t size) {
  EthernetSlot slot;
  slot.data = reinterpret_cast<uintptr_t>(at);
  slot.length = size;
  return slot;
}

struct EthernetOut {
  uint64_t data;
  uint32_t length;
  uint32_t padding;
};
static_assert(sizeof(EthernetOut) == 16, "driver layout");

inline EthernetOut Out(const uint8_t *at, uint32_t length) {
  return EthernetOut{reinterpret_cast<uintptr_t>(at), length, 0};
}

inline std::vector<uint8_t> Pattern(uint32_t length, uint8_t seed) {
  std::vector<uint8_t> bytes(length);
  for (uint32_t i = 0; i < length; ++i) bytes[i] = static_cast<uint8_t>(seed + i * 7);
  return bytes;
}

inline void SetU32(uint32_t session, uint32_t id, uint32_t value) {
  ASSERT_EQ(kvSetProperty(session, id, 4, &value), 0) << std::hex << id;
}

inline void SetEcho(uint32_t session) {
  const uint8_t on = 1;
  ASSERT_EQ(kvSetProperty(session, kvPropSession_IntfEchoTx, 1, &on), 0);
}

// Everything waiting in a session, as variable-form records.
inline std::vector<Rec> Drain(uint32_t session) {
  std::vector<uint8_t> buffer(1 << 16);
  uint32_t got = 0;
  EXPECT_EQ(
      kvhdnReadFrame(session, buffer.data(), static_cast<uint32_t>(buffer.size()), 4096, 0.0, &got),
      0);
  return Unpack(buffer.data(), got);
}

// The driver's control calls, each in a scene where it works and leaves an effect that the
// controls can see, for tests that make the calls fail or park them.
struct ControlScene {
  uint32_t session = 0;       // on FlexRay1, input single point, list "Speed"
  uint32_t interfaceRef = 0;  // FlexRay1 in an open system
  uint64_t token = 0;
};

struct ControlCall {
  const char *function;
  bool onSession;                               // the call works on the scene's session
  int32_t status;                               // what the call answers when left alone
  std::function<void(ControlScene &)> prepare;  // the state in which the call shows an effect
  std::function<int32_t(ControlScene &)> run;
  std::function<bool(ControlScene &)> effect;  // whether the effect shows; null: there is none
};

inline ControlScene MakeControlScene() {
  ControlScene scene;
  EXPECT_EQ(kvCreateSession("DB", "Cluster", "Speed", "FlexRay1", kvMode_SignalInSinglePoint,
                            &scene.session),
            0);
  uint32_t system = 0;
  EXPECT_EQ(kvSystemOpen(&system), 0);
  uint32_t refs[2] = {};
  EXPECT_EQ(kvGetProperty(system, kvPropSys_IntfRefsFlexRay, sizeof refs, refs), 0);
  scene.interfaceRef = refs[0];
  return scene;
}

inline std::vector<ControlCall> ControlCalls() {
  auto nothing = [](ControlScene &) {};
  auto connected = [](ControlScene &s) {
    return kvsimTerminalsConnected(s.session, "FrontPanel1", "StartTrigger") == 1;
  };
  return {
      {"kvStart", true, 0, nothing,
       [](ControlScene &s) { return kvStart(s.session, kvsimScopeNormal); },
       [](ControlScene &s) { return kvsimSessionStarted(s.session) == 1; }},
      {"kvStop", true, 0,
       [](ControlScene &s) { ASSERT_EQ(kvStart(s.session, kvsimScopeNormal), 0); },
       [](ControlScene &s) { return kvStop(s.session, kvsimScopeNormal); },
       [](ControlScene &s) { return kvsimSessionStarted(s.session) == 0; }},
      {"kvFlush", true, 0,
       [](ControlScene &s) {
         const double speed = 5.0;
         ASSERT_EQ(kvsimSetSignalValues(s.session, &speed, 1), 1);
       },
       [](ControlScene &s) { return kvFlush(s.session); },
       [](ControlScene &s) {
         double speed = -1.0;
         return kvReadSignalSinglePoint(s.session, &speed, 8, nullptr, 0) == 0 && speed == 0.0;
       }},
      {"kvConnectTerminals", true, 0, nothing,
       [](ControlScene &s) { return kvConnectTerminals(s.session, "FrontPanel1", "StartTrigger"); },
       connected},
      {"kvDisconnectTerminals", true, 0,
       [](ControlScene &s) {
         ASSERT_EQ(kvConnectTerminals(s.session, "FrontPanel1", "StartTrigger"), 0);
       },
       [](ControlScene &s) {
         return kvDisconnectTerminals(s.session, "FrontPanel1", "StartTrigger");
       },
       [connected](ControlScene &s) { return !connected(s); }},
      {"kvhdnCreateSvTiming_FlexRayMacrotick", true, 0, nothing,
       [](ControlScene &s) { return kvhdnCreateSvTiming_FlexRayMacrotick(s.session, &s.token); },
       [](ControlScene &s) { return s.token == KVSIM_MACROTICK_SOURCE(s.session); }},
      {"kvBlink", false, 0, nothing,
       [](ControlScene &s) { return kvBlink(s.interfaceRef, kvsimBlinkOn); },
       [](ControlScene &) { return kvsimBlinkMode("FlexRay1") == kvsimBlinkOn; }},
      {"kvdbCloseDatabase", false, kvsimErrInvalidDatabase, nothing,
       [](ControlScene &) { return kvdbCloseDatabase(0x03000001u, 0); }, nullptr},
  };
}

// Outputs of the calls below, marked so that any write shows.
struct UseOutputs {
  std::vector<uint8_t> buffer = std::vector<uint8_t>(64, 0xEE);
  double value = 42.0;
  uint64_t stamp = 7;
  uint32_t word = 0x5A5A5A5A;

  bool Untouched() const {
    return buffer == std::vector<uint8_t>(64, 0xEE) && value == 42.0 && stamp == 7 &&
           word == 0x5A5A5A5A;
  }
};

struct HandleUse {
  const char *call;
  int32_t notOpenStatus;  // the answer for a handle that is no open session
  std::function<int32_t(uint32_t handle)> run;
};

// Every driver call that takes a session handle, with its outputs in `o`.
inline std::vector<HandleUse> HandleUses(UseOutputs &o) {
  constexpr int32_t kNoSession = kvsimErrInvalidSession;
  constexpr uint32_t kMode = kvPropSession_Mode, kTx = kvPropSessionSub_CANTxTime;
  return {
      {"kvGetPropertySize", kNoSession,
       [&o](uint32_t h) { return kvGetPropertySize(h, kMode, &o.word); }},
      {"kvGetProperty", kNoSession,
       [&o](uint32_t h) { return kvGetProperty(h, kMode, 64, o.buffer.data()); }},
      {"kvSetProperty", kNoSession,
       [&o](uint32_t h) { return kvSetProperty(h, kvPropSession_IntfBaudRate, 4, &o.word); }},
      {"kvGetSubProperty", kNoSession,
       [&o](uint32_t h) { return kvGetSubProperty(h, 0, kTx, 64, o.buffer.data()); }},
      {"kvSetSubProperty", kNoSession,
       [&o](uint32_t h) { return kvSetSubProperty(h, 0, kTx, 8, &o.value); }},
      {"kvReadSignalSinglePoint", kNoSession,
       [&o](uint32_t h) { return kvReadSignalSinglePoint(h, &o.value, 8, &o.stamp, 8); }},
      {"kvWriteSignalSinglePoint", kNoSession,
       [&o](uint32_t h) { return kvWriteSignalSinglePoint(h, &o.value, 8); }},
      // A limit, so that a wrong answer shows as a failure rather than a hang.
      {"kvWait", kNoSession,
       [&o](uint32_t h) { return kvWait(h, kvsimConditionIntfCommunicating, 0, &o.word, 5.0); }},
      {"kvStart", kNoSession, [](uint32_t h) { return kvStart(h, kvsimScopeNormal); }},
      {"kvStop", kNoSession, [](uint32_t h) { return kvStop(h, kvsimScopeNormal); }},
      {"kvFlush", kNoSession, [](uint32_t h) { return kvFlush(h); }},
      {"kvConnectTerminals", kNoSession,
       [](uint32_t h) { return kvConnectTerminals(h, "PXI_Trig0", "StartTrigger"); }},
      {"kvDisconnectTerminals", kNoSession,
       [](uint32_t h) { return kvDisconnectTerminals(h, "PXI_Trig0", "StartTrigger"); }},
      {"kvhdnCreateSvTiming_FlexRayMacrotick", kNoSession,
       [&o](uint32_t h) { return kvhdnCreateSvTiming_FlexRayMacrotick(h, &o.stamp); }},
      {"kvBlink", kvsimErrInvalidObject, [](uint32_t h) { return kvBlink(h, kvsimBlinkOn); }},
      {"kvdbCloseDatabase", kvsimErrInvalidDatabase,
       [](uint32_t h) { return kvdbCloseDatabase(h, 1); }},
  };
}

#endif
