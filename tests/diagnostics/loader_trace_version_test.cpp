// The dynamic loader helpers (the handle or address on success, the detail document on failure),
// the console trace destination seen through its replaceable output, and the log's version line
// read from the driver's system properties.
#include <dlfcn.h>
#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <tuple>

#include "diagnostics/console_trace_destination.h"
#include "diagnostics/driver_version.h"
#include "diagnostics/json_status.h"
#include "diagnostics/ovdynlib.h"
#include "diagnostics/trace.h"
#include "kvorproperties.h"
#include "kvsim.h"

namespace {

using namespace nKVSVAPI100;

constexpr char kNoLibrary[] = "libkvsv-no-such-library.so.9";

TEST(Ovdynlib, LoadsALibraryAndFindsASymbolOrDescribesTheFailure) {
  tJsonStatus status;
  void *library = ovdynlib_load("libm.so.6", RTLD_NOW, status);
  ASSERT_NE(library, nullptr);
  EXPECT_NE(ovdynlib_symbol(library, "cos", status), nullptr);
  EXPECT_EQ(status.code, 0);
  EXPECT_EQ(status.buffer, nullptr);
  for (const bool symbol : {false, true}) {
    const std::string name = symbol ? "kvsv_no_such_symbol" : kNoLibrary;
    tJsonStatus failed;
    EXPECT_EQ(symbol ? ovdynlib_symbol(library, name.c_str(), failed)
                     : ovdynlib_load(name.c_str(), RTLD_NOW, failed),
              nullptr);
    EXPECT_EQ(failed.code, -52005);
    const std::string document = failed.buffer;
    const std::string line = symbol ? "185" : "110", debug = symbol ? "ovdynlib_symbol" : "path";
    // clang-format off
    const std::string expected =
        "{\"error_constant\":\"ovapalerr_invalidParameter\","
        "\"file\":\"src/diagnostics/ovdynlib.cpp\",\"line\":" + line + ",\"component\":\"kvsvapi\","
        "\"ovdynlib_debug\":{\"debug\":\"failed to ovdynlib_load library\",\"" + debug + "\":\"" +
        name + "\"},\"internal_error\":{\"api\":\"dlerror\",\"string\":\"";
    // clang-format on
    EXPECT_EQ(document.substr(0, expected.size()), expected);
    // Then the loader's own text, which names what failed.
    EXPECT_NE(document.find(name, expected.size()), std::string::npos) << document;
    EXPECT_EQ(document.substr(document.size() - 3), "\"}}");
    ReleaseJsonStatus(failed);
  }
  // An earlier error stops both and stays; an earlier warning gives way.
  tJsonStatus failed;
  failed.code = -7;
  EXPECT_EQ(ovdynlib_load("libm.so.6", RTLD_NOW, failed), nullptr);
  EXPECT_EQ(ovdynlib_symbol(library, "cos", failed), nullptr);
  EXPECT_EQ(failed.code, -7);
  EXPECT_EQ(failed.buffer, nullptr);
  failed.code = 4;
  EXPECT_EQ(ovdynlib_symbol(library, "kvsv_no_such_symbol", failed), nullptr);
  EXPECT_EQ(failed.code, -52005);
  ReleaseJsonStatus(failed);
  ovdynlib_close(library);
}

std::string gPrinted;

TEST(ConsoleTrace, WritesTextCutByLengthAndAt512BytesAndDescribesItselfIntoAnyBuffer) {
  const tTraceOutput saved = gTraceOutput;
  gTraceOutput = [](const char *text, std::FILE *) { return gPrinted += text, 0; };
  ProcessTrace().Destination()->Write("100% sure");
  ProcessTrace().Destination()->Write("abcdef", 3);
  ProcessTrace().Destination()->Write(std::string(2000, 'z').c_str());
  gTraceOutput = saved;
  EXPECT_EQ(gPrinted, "100% sureabc" + std::string(511, 'z'));
  // The option text and its NUL need 20 bytes; a smaller buffer gets what fits.
  char buffer[8];
  size_t needed = 0;
  EXPECT_EQ(ConsoleTraceDestination().Describe(buffer, sizeof buffer, &needed), buffer + 7);
  EXPECT_STREQ(buffer, " --dest");
  EXPECT_EQ(needed, 20u);
}

TEST(DriverVersionLine, FullVersionOrTheProductNameAloneAndReadingStopsAtTheFirstFailure) {
  // The property whose read fails (0: the system open fails instead, 1: nothing fails), the line,
  // and how often the build number is read: not once an earlier read failed.
  const std::tuple<uint32_t, const char *, int32_t> cases[] = {
      {1, "KVOR driver 24.5.0f49", 1},        {0, "KVOR driver", 0},
      {kvPropSys_VerMajor, "KVOR driver", 0}, {kvPropSys_VerMinor, "KVOR driver", 0},
      {kvPropSys_VerPhase, "KVOR driver", 0}, {kvPropSys_VerBuild, "KVOR driver", 1}};
  for (const auto &[failing, line, buildReads] : cases) {
    SCOPED_TRACE(failing);
    kvsimReset();
    if (failing == 0) kvsimFailCall("kvSystemOpen", -1, 1);
    if (failing > 1) kvsimFailProperty("kvGetProperty", failing, -1, 1);
    EXPECT_EQ(DriverVersionLine(), line);
    EXPECT_EQ(kvsimCountCalls("kvSystemClose"), 1) << "closed in any case";
    EXPECT_EQ(kvsimCountPropertyReads(kvPropSys_VerBuild), buildReads);
  }
}

}  // namespace
