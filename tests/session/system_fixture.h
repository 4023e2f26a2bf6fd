// Reset stand-ins, name handles that the host would pass, and host references registered the way
// the host registers a device or interface that a program opened by name.
#ifndef KVSVAPI_TESTS_SESSION_SYSTEM_FIXTURE_H
#define KVSVAPI_TESTS_SESSION_SYSTEM_FIXTURE_H

#include <gtest/gtest.h>

#include <cstdint>
#include <deque>
#include <string>

#include "kvorproperties.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "kvsvplatform.h"
#include "svsim.h"

// Device names as the host knows them: "___kvorDev#" and the complemented serial.
constexpr char kBusBoxCanLin[] = "___kvorDev#fff0b8ed";       // serial 1001234
constexpr char kBusBoxFlexRayEnet[] = "___kvorDev#fff0b8ec";  // serial 1001235

class SystemFixture : public testing::Test {
 protected:
  void SetUp() override {
    kvsimReset();
    svsimReset();
  }

  void TearDown() override {
    // Whatever a test left open goes, so that the next test starts from a closed system.
    uint64_t a = 0, b = 0;
    kvsvSystemManualClose(&a, &b);
    for (SvHandle h : names_) svDisposeHandle(h);
    kvsimReset();
    svsimReset();
  }

  // Logged calls of `function` on `object`. The error log may open and close a system of its own
  // when it is built at the first report, so system closes are counted per handle.
  static int CallsOn(const char *function, uint32_t object) {
    int calls = 0;
    for (int32_t i = 0; i < kvsimLogCount(); ++i) {
      kvsimCallRecord record{};
      if (kvsimLogEntry(i, &record) == 1 && std::string(record.function) == function &&
          record.object == object)
        ++calls;
    }
    return calls;
  }

  // A string handle that lives until the end of the test, at an address that stays put.
  SvHandle *Name(const char *text) {
    names_.push_back(svsimMakeString(text));
    return &names_.back();
  }

  int32_t OpenDevice(const char *name, uint32_t *handle) {
    return kvsvDeviceOpen(Name(name), handle);
  }

  int32_t OpenInterface(const char *name, uint32_t *handle) {
    return kvsvInterfaceOpen(Name(name), handle);
  }

  // What the host does after an open by name: it registers the reference under that name.
  static SvRefnum RegisterHostRef(const char *name, uint32_t handle, const char *className) {
    const std::string close =
        std::string(className) == "KVOR Device" ? "kvsvDeviceClose" : "kvsvInterfaceClose";
    const std::string open =
        std::string(className) == "KVOR Device" ? "kvsvDeviceOpen" : "kvsvInterfaceOpen";
    SvHandle texts[] = {svsimMakeString(name),         svsimMakeString("kvor"),
                        svsimMakeString(className),    svsimMakeString("kvsvapi.*"),
                        svsimMakeString(open.c_str()), svsimMakeString(close.c_str())};
    SvRefnum cookie = 0;
    EXPECT_EQ(svRegisterRefKind3(texts[0], handle, texts[1], texts[2], 21, &cookie, 8, texts[3], 1,
                                 texts[4], texts[5], 0, 0, 0),
              0);
    for (SvHandle h : texts) svDisposeHandle(h);
    return cookie;
  }

  static bool HostHasRef(SvRefnum cookie) {
    SvsimRefInfo info;
    for (int32_t i = 0; svsimGetRef(i, &info) != 0; ++i)
      if (info.cookie == cookie) return true;
    return false;
  }

  // The name the driver gives an interface handle, or the status of the read.
  static std::string InterfaceName(uint32_t handle, int32_t *status = nullptr) {
    char text[64] = {};
    const int32_t s = kvGetProperty(handle, kvPropIntf_Name, sizeof text, text);
    if (status != nullptr) *status = s;
    return text;
  }

  static int32_t SerialNumber(uint32_t device) {
    uint32_t serial = 0;
    const int32_t s = kvGetProperty(device, kvPropDev_SerNum, sizeof serial, &serial);
    return s < 0 ? s : static_cast<int32_t>(serial);
  }

  // The first use of an error handle: every driver call answers with the failure it carries.
  static int32_t FirstUse(uint32_t handle) {
    uint32_t size = 0;
    return kvGetPropertySize(handle, kvPropIntf_Name, &size);
  }

 private:
  std::deque<SvHandle> names_;
};

#endif
