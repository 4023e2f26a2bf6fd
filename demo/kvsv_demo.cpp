// kvsv-demo: a host program driving a vehicle network end to end through the library, which it
// loads as a host does. The host stand-in linked into this program supplies the host's operations;
// the driver stand-in, which the library loads by its own dependency, plays the hardware.
#include <dlfcn.h>

#include <cinttypes>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <string>

#include "database_property_tour.h"
#include "database_tour.h"
#include "drive_scenario.h"
#include "library_exports.h"
#include "receive_filter_tour.h"
#include "signals_svg.h"

namespace {

using namespace kvsvdemo;

constexpr size_t kFrameRows = 8;

void Usage() {
  std::fprintf(stderr,
               "usage: kvsv-demo [--dbc FILE] [--interface CAN1|CAN2|CAN3|CAN4] [--out DIR]\n");
}

std::string Hex(const std::vector<uint8_t> &bytes) {
  std::string text;
  char byte[4];
  for (uint8_t b : bytes) {
    std::snprintf(byte, sizeof byte, "%02X ", b);
    text += byte;
  }
  return text;
}

void PrintSessions(const tDriveResult &r) {
  std::printf("\nSessions opened by name:\n  %-28s %-10s %5s %s\n", "name", "interface", "mode",
              "items");
  for (const tSessionSummary &s : r.sessions) {
    std::printf("  %-28s %-10s %5" PRIu32 " %" PRIu32 "\n", s.name.c_str(), s.interfaceName.c_str(),
                s.mode, s.numInList);
  }
}

void PrintFrames(const tDriveResult &r) {
  std::printf("\nFrames read on %s (last step):\n  %-12s %-10s %-4s %s\n", r.readInterface.c_str(),
              "time (s)", "id", "len", "payload");
  const std::vector<tFrame> &frames = r.framesRead.back();
  for (size_t i = 0; i < frames.size() && i < kFrameRows; ++i) {
    const tFrame &f = frames[i];
    const double seconds = static_cast<double>(f.rawTime - r.writeTimes.front()) / 1e7;
    std::printf("  %-12.3f 0x%-8" PRIX32 "%s %-4zu %s\n", seconds, f.identifier,
                f.extended ? "x" : " ", f.payload.size(), Hex(f.payload).c_str());
  }
}

void PrintSignals(const tDriveResult &r) {
  std::printf("\nSignals read on %s (last step):\n  %-48s %12s %12s %12s  %s\n",
              r.readInterface.c_str(), "signal", "written", "single point", "from frames", "unit");
  for (size_t i = 0; i < r.signals.size(); ++i) {
    const double converted = i < r.fromFrames.back().size() ? r.fromFrames.back()[i] : NAN;
    const double single = i < r.singlePoint.back().size() ? r.singlePoint.back()[i] : NAN;
    std::printf("  %-48s %12.4f %12.4f %12.4f  %s\n", r.signals[i].item.c_str(),
                r.written.back()[i], single, converted, r.signals[i].unit.c_str());
  }
}

void PrintCounts(const tDriveResult &r) {
  size_t written = 0, read = 0, pairs = 0, samples = 0;
  for (const auto &step : r.framesExpected) written += step.size();
  for (const auto &step : r.framesRead) read += step.size();
  for (const auto &signal : r.xyValues) pairs += signal.size();
  for (const auto &w : r.waveforms) samples += w.samples.size();
  std::printf("\nDrive: %zu ticks of %.0f ms, %zu signals in %zu frames\n", r.written.size(),
              r.tickSeconds * 1000, r.signals.size(), r.groups.size());
  for (const tFrameGroup &g : r.groups) {
    std::printf("  0x%-8" PRIX32 " every %4.0f ms  %s\n", g.frameId,
                g.cycleTicks * r.tickSeconds * 1000, g.session.c_str());
  }
  std::printf("Frames: %zu written, %zu read\n", written, read);
  std::printf("Pairs read: %zu, waveform samples read: %zu\n", pairs, samples);
  std::printf("Steady loop: %" PRIu64 " host allocations, %.2f us per frame\n", r.steadyAllocations,
              r.steadyFrames > 0 ? r.steadySeconds * 1e6 / r.steadyFrames : 0.0);
  std::printf("Program end: %d sessions opened, %d closed by the host, %d left open\n",
              r.sessionsOpened, r.closesAtEnd, r.sessionsLeftOpen);
}

// A reference text shown on one line, its line feed as \n.
std::string OneLine(const std::string &text) {
  std::string shown = "\"";
  for (char c : text) shown += c == '\n' ? std::string("\\n") : std::string(1, c);
  return shown + "\"";
}

bool PrintDatabaseTour(const tDatabaseTour &t) {
  std::printf("\nDatabase edited through the library:\n");
  if (t.status < 0) {
    std::fprintf(stderr, "%s failed: status 0x%08" PRIX32 "\n", t.failedCall.c_str(),
                 static_cast<uint32_t>(t.status));
    return false;
  }
  std::printf("  opened by alias \"tesla\"; found frame %s and signal %s\n",
              OneLine(t.frameReference).c_str(), OneLine(t.signalReference).c_str());
  std::printf("  the cluster's frames by reference: %zu, from %s to %s\n", t.clusterFrames.size(),
              t.clusterFrames.empty() ? "-" : OneLine(t.clusterFrames.front()).c_str(),
              t.clusterFrames.empty() ? "-" : OneLine(t.clusterFrames.back()).c_str());
  std::printf("  created LIN schedule %s with one entry, then deleted it\n",
              OneLine(t.scheduleReference).c_str());
  std::printf("  added frame \"DemoFrame\", saved to %s, reloaded as \"tesla_edited\": %s\n",
              t.savedPath.c_str(), t.addedFrameReloaded ? "frame found" : "frame MISSING");
  std::printf("  databases known:");
  for (size_t i = 0; i < t.aliases.size(); ++i) {
    std::printf(" %s=%s", t.aliases[i].c_str(),
                i < t.aliasFiles.size() ? t.aliasFiles[i].c_str() : "?");
  }
  std::printf("\n  databases open at the end: %" PRIu32 "\n", t.openDatabasesAtEnd);
  return t.addedFrameReloaded && t.openDatabasesAtEnd == 0;
}

bool PrintPropertyTour(const tPropertyTour &t, const std::string &frame) {
  std::printf("\nSignals of %s read as database properties (as the file writes them):\n",
              frame.c_str());
  if (t.status < 0) {
    std::fprintf(stderr, "%s failed: status 0x%08" PRIX32 "\n", t.failedCall.c_str(),
                 static_cast<uint32_t>(t.status));
    return false;
  }
  for (const tSignalRow &row : t.signals) {
    std::printf("  SG_ %-24s : %s\n", row.name.c_str(), row.AsFileText().c_str());
  }
  std::printf("  factor of %s set from %g to %g, saved, reloaded: %g\n",
              t.signals.empty() ? "-" : t.signals.front().name.c_str(), t.factorBefore, t.factorSet,
              t.factorReloaded);
  const auto bit = [](uint32_t b) {
    return b == UINT32_MAX ? std::string("none") : std::to_string(b);
  };
  for (size_t i = 0; i < t.mappingBefore.size() && i < t.mappingAfter.size(); ++i) {
    std::printf("  PDU mapping of the frame: %s at start bit %" PRIu32
                ", update bit %s, written and read back as %s\n",
                OneLine(t.mappingBefore[i].pdu).c_str(), t.mappingBefore[i].startBit,
                bit(t.mappingBefore[i].updateBit).c_str(),
                bit(t.mappingAfter[i].updateBit).c_str());
  }
  return !t.signals.empty() && t.factorReloaded == t.factorSet && !t.mappingAfter.empty();
}

std::string FilterText(const tFilterEntry &f) {
  std::string text;
  char value16[16];
  std::snprintf(value16, sizeof value16, "0x%04X", f.value16);
  if (f.useValue16) text += std::string(" value16=") + value16;
  if (f.useValue8) text += " value8=" + std::to_string(f.value8);
  if (f.useName) text += " name=\"" + f.name + "\"";
  return text.empty() ? " (matches all)" : text;
}

bool PrintFilterTour(const tFilterTour &t) {
  std::printf("\nEthernet receive filter on ENET1, written and read back:\n");
  if (t.status < 0) {
    std::fprintf(stderr, "%s failed: status 0x%08" PRIX32 "\n", t.failedCall.c_str(),
                 static_cast<uint32_t>(t.status));
    return false;
  }
  for (size_t i = 0; i < t.written.size(); ++i) {
    std::printf("  entry %zu:%s -> %s\n", i, FilterText(t.written[i]).c_str(),
                i < t.read.size() && t.read[i] == t.written[i] ? "same" : "DIFFERENT");
  }
  return t.read == t.written;
}

bool WritePicture(const tDriveResult &r, const std::string &directory) {
  std::vector<tPlotCurve> curves;
  for (size_t i = 0; i < r.waveforms.size() && i < 2; ++i) {
    const tDriveSignal &s = r.signals[i];
    curves.push_back({s.item + (s.unit.empty() ? "" : " (" + s.unit + ")"), r.waveforms[i].interval,
                      r.waveforms[i].samples});
  }
  std::filesystem::create_directories(directory);
  const std::string path = directory + "/signals.svg";
  std::ofstream(path) << PlotSvg("Waveforms read on " + r.readInterface, curves);
  std::printf("Picture: %s\n", path.c_str());
  return std::filesystem::exists(path);
}

}  // namespace

int main(int argc, char **argv) {
  tDriveOptions options;
  options.dbcPath = KVSV_DEMO_DBC;
  std::string outDirectory = "demo-out";
  for (int i = 1; i < argc; ++i) {
    const std::string arg = argv[i];
    if (i + 1 < argc && arg == "--dbc") {
      options.dbcPath = std::filesystem::absolute(argv[++i]).string();
    } else if (i + 1 < argc && arg == "--interface") {
      options.interfaceName = argv[++i];
    } else if (i + 1 < argc && arg == "--out") {
      outDirectory = argv[++i];
    } else {
      Usage();
      return 2;
    }
  }
  options.directory = std::filesystem::absolute(outDirectory + "/app").string();
  // The stand-in driver keeps its alias file beside the demonstration's output rather than in the
  // user's configuration, unless told otherwise.
  setenv("KVSIM_CONFIG_DIR",
         std::filesystem::absolute(outDirectory + "/driver-config").string().c_str(), 0);
  std::filesystem::create_directories(options.directory);

  // The host loads the library with its symbols open to the process: the host finds the close of
  // each reference there when the program ends. The path is the build's own copy, so that the
  // loader's search (which a sanitizer's runtime changes) does not matter.
  void *library = dlopen(KVSV_DEMO_LIBRARY, RTLD_NOW | RTLD_GLOBAL);
  if (library == nullptr) {
    std::fprintf(stderr, "cannot load %s: %s\n", KVSV_DEMO_LIBRARY, dlerror());
    return 1;
  }
  std::string error;
  const tLibraryExports exports = ExportsOf(library, error);
  if (!error.empty()) {
    std::fprintf(stderr, "%s: %s\n", KVSV_DEMO_LIBRARY, error.c_str());
    return 1;
  }

  std::printf("Drive on %s with %s\n", options.interfaceName.c_str(), options.dbcPath.c_str());
  const tDriveResult result = RunDrive(exports, options);
  if (result.status < 0) {
    std::fprintf(stderr, "%s failed: status 0x%08" PRIX32 " (%s)%s%s\n", result.failedCall.c_str(),
                 static_cast<uint32_t>(result.status), result.statusText.c_str(),
                 result.failedProperty.empty() ? "" : ", property ", result.failedProperty.c_str());
    return 1;
  }
  PrintSessions(result);
  PrintFrames(result);
  PrintSignals(result);
  PrintCounts(result);
  const bool pictured = WritePicture(result, outDirectory);
  const tDatabaseTour tour =
      RunDatabaseTour(exports, KVSV_DEMO_DBC, std::filesystem::absolute(outDirectory).string(),
                      "DAS_control", "DAS_setSpeed");
  const bool toured = PrintDatabaseTour(tour);
  const std::string frame = "DAS_control";
  const tPropertyTour properties = RunPropertyTour(
      exports, KVSV_DEMO_DBC, std::filesystem::absolute(outDirectory).string(), frame);
  const bool read = PrintPropertyTour(properties, frame);
  const tFilterTour filter = RunReceiveFilterTour(
      exports, "ENET1", {{true, 0x88F7, false, 0, true, "ptp"}, {false, 0, true, 17, false, ""}});
  const bool filtered = PrintFilterTour(filter);
  return toured && read && filtered && pictured ? 0 : 1;
}
