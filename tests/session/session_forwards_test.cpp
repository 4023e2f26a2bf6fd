// The control exports that forward to the driver: each reaches the driver with its arguments as
// given, returns the driver's status as it is, and needs no slot of the library.
#include <gtest/gtest.h>

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "svsim.h"

namespace {

constexpr int32_t kDriverWarning = 0x3FF62077;
constexpr int32_t kDriverFault = static_cast<int32_t>(0xBFF62DEA);

class SessionForwards : public testing::Test {
 protected:
  void SetUp() override {
    kvsimReset();
    svsimReset();
    // Made in the driver alone: the library holds no slot for it.
    ASSERT_EQ(kvCreateSession("DB", "Cluster", "Speed", "FlexRay2", kvMode_SignalInSinglePoint,
                              &session_),
              0);
    uint32_t system = 0;
    ASSERT_EQ(kvSystemOpen(&system), 0);
    uint32_t interfaces[2] = {};
    ASSERT_EQ(kvGetProperty(system, kvPropSys_IntfRefsFlexRay, sizeof interfaces, interfaces), 0);
    interface_ = interfaces[1];
    kvsimLogClear();
  }

  void TearDown() override {
    kvsimReset();
    svsimReset();
  }

  // One export, the driver function it forwards to, and what the driver's call log must show.
  struct Forward {
    const char *function;
    std::function<int32_t()> call;
    uint32_t object;
    uint32_t size1;
    std::string text;
  };

  std::vector<Forward> Forwards() {
    const uint32_t s = session_;
    uint64_t *token = &token_;
    return {
        {"kvStart", [=] { return kvsvSessionStart(s, kvsimScopeInterfaceOnly); }, s,
         kvsimScopeInterfaceOnly, ""},
        {"kvStop", [=] { return kvsvSessionStop(s, kvsimScopeSessionOnly); }, s,
         kvsimScopeSessionOnly, ""},
        {"kvFlush", [=] { return kvsvSessionFlush(s); }, s, 0, ""},
        {"kvConnectTerminals",
         [=] { return kvsvSessionConnectTerminals(s, "PXI_Trig4", "FrontPanel1"); }, s, 0,
         "PXI_Trig4 -> FrontPanel1"},
        {"kvDisconnectTerminals",
         [=] { return kvsvSessionDisconnectTerminals(s, "FrontPanel0", "Interface/StartTrigger"); },
         s, 0, "FrontPanel0 -> Interface/StartTrigger"},
        {"kvhdnCreateSvTiming_FlexRayMacrotick",
         [=] { return kvsvSessionCreateSvTiming_FlexRayMacrotick(s, token); }, s, 0, ""},
        {"kvBlink", [this] { return kvsvInterfaceBlink(interface_, kvsimBlinkOn); }, interface_,
         kvsimBlinkOn, ""},
    };
  }

  uint32_t session_ = 0;
  uint32_t interface_ = 0;
  uint64_t token_ = 0;
};

TEST_F(SessionForwards, EachReachesTheDriverOnceWithItsArgumentsAsGiven) {
  for (const Forward &forward : Forwards()) {
    SCOPED_TRACE(forward.function);
    kvsimLogClear();
    forward.call();
    ASSERT_EQ(kvsimLogCount(), 1) << "one driver call and nothing else";
    kvsimCallRecord record;
    ASSERT_EQ(kvsimLogEntry(0, &record), 1);
    EXPECT_STREQ(record.function, forward.function);
    EXPECT_EQ(record.object, forward.object);
    EXPECT_EQ(record.size1, forward.size1);
    EXPECT_EQ(record.text, forward.text);
  }
  EXPECT_EQ(token_, KVSIM_MACROTICK_SOURCE(session_)) << "the timing source reaches the caller";
}

TEST_F(SessionForwards, TheDriversStatusComesBackAsItIs) {
  for (const Forward &forward : Forwards()) {
    SCOPED_TRACE(forward.function);
    for (int32_t injected : {kDriverWarning, kDriverFault}) {
      // The disconnect of a route never connected fails in the driver; a warning rides only on a
      // call that succeeds, so that call is made to succeed first.
      ASSERT_EQ(kvConnectTerminals(session_, "FrontPanel0", "Interface/StartTrigger"), 0);
      ASSERT_EQ(kvsimFailCall(forward.function, injected, 1), 0);
      EXPECT_EQ(forward.call(), injected) << std::hex << injected;
    }
  }
}

TEST_F(SessionForwards, AHandleTheLibraryDoesNotKnowGoesToTheDriverUnjudged) {
  // Index 0xFFFF is beyond the session table: a guarded export would refuse it itself.
  const uint32_t unknown = 0x2000FFFFu;
  uint64_t token = 3;
  const struct {
    const char *what;
    int32_t status;
    int32_t expected;
  } cases[] = {
      {"start", kvsvSessionStart(unknown, 0), kvsimErrInvalidSession},
      {"stop", kvsvSessionStop(unknown, 0), kvsimErrInvalidSession},
      {"flush", kvsvSessionFlush(unknown), kvsimErrInvalidSession},
      {"connect", kvsvSessionConnectTerminals(unknown, "PXI_Trig0", "StartTrigger"),
       kvsimErrInvalidSession},
      {"disconnect", kvsvSessionDisconnectTerminals(unknown, "PXI_Trig0", "StartTrigger"),
       kvsimErrInvalidSession},
      {"timing", kvsvSessionCreateSvTiming_FlexRayMacrotick(unknown, &token),
       kvsimErrInvalidSession},
      {"blink", kvsvInterfaceBlink(unknown, 1), kvsimErrInvalidObject},
      {"null terminal", kvsvSessionConnectTerminals(session_, nullptr, "StartTrigger"),
       kvsimErrNullPointer},
      {"null output", kvsvSessionCreateSvTiming_FlexRayMacrotick(session_, nullptr),
       kvsimErrNullPointer},
      {"bad scope", kvsvSessionStart(session_, 9), kvsimErrInvalidScope},
  };
  for (const auto &c : cases) EXPECT_EQ(c.status, c.expected) << c.what;
  EXPECT_EQ(token, 3u);
  EXPECT_EQ(kvsimLogCount(), static_cast<int32_t>(std::size(cases)))
      << "every call went to the driver";
}

}  // namespace
