// The driver's control calls, each in a scene where it works and leaves an effect that the
// controls can see, for tests that make the calls fail or park them; and every call that takes a
// session handle, for tests of handles that name no session or a failed one.
#ifndef KVOR_CONTROL_CALLS_H
#define KVOR_CONTROL_CALLS_H

#include <gtest/gtest.h>

#include <cstdint>
#include <functional>
#include <vector>

#include "kvsim.h"
#include "kvsvplatform.h"

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
       [](ControlScene &s) {
         return kvsimTerminalsConnected(s.session, "FrontPanel1", "StartTrigger") == 1;
       }},
      {"kvDisconnectTerminals", true, 0,
       [](ControlScene &s) {
         ASSERT_EQ(kvConnectTerminals(s.session, "FrontPanel1", "StartTrigger"), 0);
       },
       [](ControlScene &s) {
         return kvDisconnectTerminals(s.session, "FrontPanel1", "StartTrigger");
       },
       [](ControlScene &s) {
         return kvsimTerminalsConnected(s.session, "FrontPanel1", "StartTrigger") == 0;
       }},
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
  constexpr uint32_t kMode = kvPropSession_Mode, kBaud = kvPropSession_IntfBaudRate;
  constexpr uint32_t kTx = kvPropSessionSub_CANTxTime;
  return {
      {"kvGetPropertySize", kNoSession,
       [&o](uint32_t h) { return kvGetPropertySize(h, kMode, &o.word); }},
      {"kvGetProperty", kNoSession,
       [&o](uint32_t h) { return kvGetProperty(h, kMode, 64, o.buffer.data()); }},
      {"kvSetProperty", kNoSession,
       [&o](uint32_t h) { return kvSetProperty(h, kBaud, 4, &o.word); }},
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
