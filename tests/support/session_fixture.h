// The session area's fixture: reset stand-ins, and whatever a test left open (host references,
// the system, slots, interface records) ended before the next test. System objects are opened by
// name handles as the host passes them, and registered as the host registers what it opened.
#ifndef KVSVAPI_TESTS_SESSION_FIXTURE_H
#define KVSVAPI_TESTS_SESSION_FIXTURE_H

#include <gtest/gtest.h>

#include <deque>
#include <functional>
#include <mutex>
#include <string>
#include <vector>

#include "kvorproperties.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "session/session_manager.h"
#include "support/fake_error_log.h"
#include "support/session_helpers.h"
#include "support/slot_fixture.h"
#include "svsim.h"

// Device names as the host knows them: "___kvorDev#" and the complemented serial.
constexpr char kBusBoxCanLin[] = "___kvorDev#fff0b8ed";       // serial 1001234
constexpr char kBusBoxFlexRayEnet[] = "___kvorDev#fff0b8ec";  // serial 1001235
constexpr int32_t kNotFound = static_cast<int32_t>(0xBFF6308A);
constexpr int32_t kRefused = static_cast<int32_t>(0xBFF62099);

// The lines of the reports that `log` holds, in their order.
inline std::vector<uint32_t> ReportLines(const kvsvtest::cFakeErrorLog &log) {
  std::vector<uint32_t> lines;
  for (const auto &record : log.Records()) lines.push_back(record.value.Line());
  return lines;
}

class SessionFixture : public SlotFixture {
 protected:
  void TearDown() override {
    using namespace nKVSVAPI100;
    svsimSetRefStatus(0);
    svsimEndProgram(nullptr);
    kvsvSystemManualClose(nullptr, nullptr);
    {
      std::lock_guard<cRecursiveMutex> lock(*gSessionManager.mutex);
      while (!gSessionManager.interfaces.empty())
        gSessionManager.EraseInterface(gSessionManager.interfaces.begin()->first);
      for (auto &slot : gSessionManager.slots) DestroySlot(slot.exchange(nullptr));
    }
    for (SvHandle h : names_) svDisposeHandle(h);
    SlotFixture::TearDown();
  }

  // A string handle that lives until the end of the test, at an address that stays put.
  SvHandle *Name(const char *text) {
    names_.push_back(svsimMakeString(text));
    return &names_.back();
  }
  int32_t OpenDevice(const char *name, uint32_t *h) { return kvsvDeviceOpen(Name(name), h); }
  int32_t OpenInterface(const char *name, uint32_t *h) { return kvsvInterfaceOpen(Name(name), h); }

  // What the host does after an open by name: it registers the reference under that name.
  static SvRefnum HostRef(const char *name, uint32_t handle, bool device) {
    const std::string kind = device ? "Device" : "Interface";
    const std::string texts[] = {
        name, "kvor", "KVOR " + kind, "kvsvapi.*", "kvsv" + kind + "Open", "kvsv" + kind + "Close"};
    SvHandle h[6];
    for (int i = 0; i < 6; ++i) h[i] = svsimMakeString(texts[i].c_str());
    SvRefnum cookie = 0;
    EXPECT_EQ(
        svRegisterRefKind3(h[0], handle, h[1], h[2], 21, &cookie, 8, h[3], 1, h[4], h[5], 0, 0, 0),
        0);
    for (SvHandle x : h) svDisposeHandle(x);
    return cookie;
  }

  // The driver's calls since its log was last cleared: function, object, first size and text.
  static std::vector<std::string> DriverCalls() {
    std::vector<std::string> calls;
    kvsimCallRecord r;
    for (int32_t i = 0; kvsimLogEntry(i, &r) == 1; ++i)
      calls.push_back(std::string(r.function) + " " + std::to_string(r.object) + " " +
                      std::to_string(r.size1) + " " + r.text);
    return calls;
  }

  static bool HostHasRef(SvRefnum cookie) {
    SvsimRefInfo info;
    for (int32_t i = 0; svsimGetRef(i, &info) != 0; ++i)
      if (info.cookie == cookie) return true;
    return false;
  }

  static bool IsErrorHandle(uint32_t handle) { return (handle >> 24) == 0x20u; }

  // The name the driver gives an interface handle.
  static std::string InterfaceName(uint32_t handle) {
    char text[64] = {};
    kvGetProperty(handle, kvPropIntf_Name, sizeof text, text);
    return text;
  }

  static int32_t SerialNumber(uint32_t device) {
    uint32_t serial = 0;
    const int32_t s = kvGetProperty(device, kvPropDev_SerNum, sizeof serial, &serial);
    return s < 0 ? s : static_cast<int32_t>(serial);
  }

  // What a first use of a session gives: an error session answers with the failure it carries.
  static int32_t UseStatus(uint32_t handle) {
    uint32_t size = 0;
    return kvGetPropertySize(handle, kvPropSession_IntfName, &size);
  }

 private:
  std::deque<SvHandle> names_;
};

#endif
