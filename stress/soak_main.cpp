// kvsv_soak SECONDS [SEED]: the soak of `make stress`. Pairs of sessions carry stamped CAN and
// CAN FD frames from CAN1 to CAN2 while other threads end and re-create those sessions by close,
// clear and abort, and one more calls exports with bad arguments. Every frame read must be one
// that was written, every call on an ended session must fail, nothing may hang (a watchdog
// ends the process, saying where each thread stands), and at the end no driver session, host
// reference, system or slot may be left. Prints what it counted; exits 1 on any violation.
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include "diagnostics/error_log.h"
#include "kvsim.h"
#include "kvsvapi.h"
#include "soak_bad_arguments.h"
#include "soak_pairs.h"
#include "soak_progress.h"
#include "soak_traffic.h"
#include "soak_violations.h"
#include "svsim.h"

using namespace nKvsvSoak;

namespace {

constexpr tWriterKind kKinds[] = {{false, false}, {true, false}, {true, true}, {false, true}};
constexpr uint32_t kChangers = 2;
// Long enough for a close that waits on a read with the longest time limit many times over.
constexpr double kHangSeconds = 30.0;

// The log of internal reports and the driver's configuration live in a directory of the soak's
// own, never in the system's log directory or the user's configuration.
class cScratchDirectory {
 public:
  cScratchDirectory() {
    path_ = (std::filesystem::temp_directory_path() / "kvsv-soak.XXXXXX").string();
    if (mkdtemp(path_.data()) == nullptr) path_ = "/nonexistent/kvsv-soak";
    nKVSVAPI100::SetErrorLogDirectoryForTests(path_);
    setenv("KVSIM_CONFIG_DIR", (path_ + "/driver-config").c_str(), 1);
  }
  ~cScratchDirectory() {
    std::error_code ignored;
    std::filesystem::remove_all(path_, ignored);
  }
  // The rows of every log that the library wrote there: its internal reports.
  std::vector<std::string> LogRows() const {
    std::vector<std::string> rows;
    std::error_code ignored;
    for (const auto &entry : std::filesystem::directory_iterator(path_, ignored)) {
      std::ifstream in(entry.path());
      bool body = false;
      for (std::string line; std::getline(in, line);) {
        if (body && line.find_first_not_of(" \r") != std::string::npos) rows.push_back(line);
        body = body || line.rfind("------", 0) == 0;
      }
    }
    return rows;
  }

 private:
  std::string path_;
};

void CheckNothingLeft(cSoakThread &main, const char *when) {
  const std::string at = std::string(" ") + when;
  if (const int32_t n = kvsimOpenSessionCount(); n != 0)
    Violation(main.Name(), std::to_string(n) + " driver sessions left" + at);
  if (const int32_t n = kvsimOpenSystemCount(); n != 0)
    Violation(main.Name(), std::to_string(n) + " driver systems left" + at);
  if (const uint32_t n = kvsvGetSystemRefCount(); n != 0)
    Violation(main.Name(), std::to_string(n) + " counts left on the system" + at);
  for (int32_t i = 0; svsimRefCount() != 0 && i < svsimRefCount(); ++i) {
    SvsimRefInfo info{};
    if (svsimGetRef(i, &info) == 1)
      Violation(main.Name(), std::string("host reference \"") + info.name + "\" left" + at);
  }
  // A read on a number without a slot fails before anything else; any other status is a slot.
  for (uint32_t index = 1; index <= 8192; ++index) {
    SvHandle values = nullptr;
    const int32_t status = kvsvReadSignalSinglePoint(index, &values);
    if (values != nullptr) svDisposeHandle(values);
    if (status != kvErrInvalidSession)
      Violation(main.Name(), "slot " + std::to_string(index) + " left" + at);
  }
  main.Beat();
}

void PrintReport(double seconds, uint32_t seed, const std::vector<cSoakThread *> &threads,
                 const tTally &all, const std::vector<std::string> &logRows, int32_t cleanupsRun) {
  std::printf("soak: %.1f s, seed %u, %zu pairs, %u session changers\n", seconds, seed,
              std::size(kKinds), kChangers);
  std::printf("  calls %llu\n", static_cast<unsigned long long>(all.calls));
  std::printf("  frames written %llu, read %llu\n",
              static_cast<unsigned long long>(all.framesWritten),
              static_cast<unsigned long long>(all.framesRead));
  for (const cSoakThread *t : threads)
    std::printf("    %-14s calls %10llu  frames written %9llu  read %9llu\n", t->Name().c_str(),
                static_cast<unsigned long long>(t->tally.calls),
                static_cast<unsigned long long>(t->tally.framesWritten),
                static_cast<unsigned long long>(t->tally.framesRead));
  std::printf("  sessions ended and made again %llu, calls on ended sessions %llu\n",
              static_cast<unsigned long long>(all.sessionsEnded),
              static_cast<unsigned long long>(all.closedProbes));
  std::printf("  clean-ups run at the program's end %d, internal reports %zu\n", cleanupsRun,
              logRows.size());
  std::printf("  statuses seen:\n");
  for (const auto &entry : all.statuses)
    std::printf("    %12llu  %s\n", static_cast<unsigned long long>(entry.second),
                StatusText(entry.first).c_str());
  for (const std::string &row : logRows) std::printf("  report: %s\n", row.c_str());
  std::printf("soak: %llu violations\n", static_cast<unsigned long long>(ViolationCount()));
}

}  // namespace

int main(int argc, char **argv) {
  const double seconds = argc > 1 ? std::atof(argv[1]) : 60.0;
  const uint32_t seed = argc > 2 ? uint32_t(std::strtoul(argv[2], nullptr, 0))
                                 : uint32_t(std::chrono::system_clock::now().time_since_epoch().count());
  if (!(seconds > 0.0)) {
    std::fprintf(stderr, "usage: %s SECONDS [SEED]\n", argv[0]);
    return 2;
  }
  cScratchDirectory scratch;
  const uint64_t liveHandles = svsimLiveHandles();

  std::vector<tPair> pairs(std::size(kKinds));
  cSoakThread main("main");
  std::vector<std::unique_ptr<cSoakThread>> threads;
  std::vector<cSoakThread *> watched{&main};
  auto thread = [&](const std::string &name) -> cSoakThread & {
    threads.push_back(std::make_unique<cSoakThread>(name));
    watched.push_back(threads.back().get());
    return *threads.back();
  };
  for (uint32_t i = 0; i < pairs.size(); ++i) {
    pairs[i].number = i;
    pairs[i].kind = kKinds[i];
    OpenSession(pairs[i], pairs[i].writer, main);
    OpenSession(pairs[i], pairs[i].reader, main);
  }
  std::vector<cSoakThread *> traffic, changers;
  for (uint32_t i = 0; i < pairs.size(); ++i) {
    traffic.push_back(&thread("writer " + std::to_string(i)));
    traffic.push_back(&thread("reader " + std::to_string(i)));
  }
  for (uint32_t i = 0; i < kChangers; ++i) changers.push_back(&thread("changer " + std::to_string(i)));
  cSoakThread &badArguments = thread("bad arguments");

  tRunFlags flags;
  {
    cWatchdog watchdog(watched, kHangSeconds);
    std::vector<std::thread> running;
    for (uint32_t i = 0; i < pairs.size(); ++i) {
      running.emplace_back([&, i] {
        RunWriter(pairs[i], flags, seed + 2 * i, *traffic[2 * i]);
        traffic[2 * i]->Finish();
      });
      running.emplace_back([&, i] {
        RunReader(pairs[i], pairs, flags, seed + 2 * i + 1, *traffic[2 * i + 1]);
        traffic[2 * i + 1]->Finish();
      });
    }
    running.emplace_back([&] {
      RunBadArguments(pairs, flags, seed + 100, badArguments);
      badArguments.Finish();
    });
    std::vector<std::thread> changing;
    for (uint32_t i = 0; i < kChangers; ++i)
      changing.emplace_back([&, i] {
        RunSessionChanger(pairs, flags, seed + 200 + i, *changers[i]);
        changers[i]->Finish();
      });

    // The last part of the run has no changes, so that each pair must show it carried on.
    using tClock = std::chrono::steady_clock;
    const double settle = std::min(3.0, seconds / 5);
    const tClock::time_point start = tClock::now();
    auto elapsed = [&] { return std::chrono::duration<double>(tClock::now() - start).count(); };
    main.Doing("waiting for the end of the changes");
    while (elapsed() < seconds - settle) {
      std::this_thread::sleep_for(std::chrono::milliseconds(100));
      main.Beat();
    }
    flags.changing.store(false);
    main.Doing("joining the changers");
    for (std::thread &t : changing) t.join();
    main.Doing("waiting for the end of the run");
    while (elapsed() < seconds) {
      std::this_thread::sleep_for(std::chrono::milliseconds(100));
      main.Beat();
    }
    flags.running.store(false);
    main.Doing("joining the traffic");
    for (std::thread &t : running) t.join();

    for (cSoakThread *t : traffic)
      if (t->tally.settledTransfers == 0)
        Violation(t->Name(), "moved no frames on its last sessions after the changes stopped");
    for (tPair &pair : pairs)
      for (tSessionEnd *end : {&pair.writer, &pair.reader})
        if (const int32_t status = main.Call("kvsvSessionClear", [&] {
              return kvsvSessionClear(end->handle.load(), end->reference);
            });
            status != 0)
          Violation(main.Name(), "the last clear gave " + StatusText(status));
    main.Doing("checking that nothing is left");
    CheckNothingLeft(main, "after the last clear");
    if (const uint64_t n = svsimLiveHandles(); n != liveHandles)
      Violation(main.Name(), std::to_string(n) + " host handles alive where " +
                                 std::to_string(liveHandles) + " were at the start");
    // The clean-ups that blocking calls registered are for sessions long ended: running them
    // must leave everything as it is.
    main.Doing("ending the program");
    SvsimEndReport report{};
    if (svsimEndProgram(&report) != 0 || report.closesCalled != 0)
      Violation(main.Name(), "the program's end found references to close");
    CheckNothingLeft(main, "after the program's end");
    main.Finish();

    tTally all = main.tally;
    for (const auto &t : threads) all.Merge(t->tally);
    const std::vector<std::string> rows = scratch.LogRows();
    for (const std::string &row : rows) Violation("library", "internal report: " + row);
    PrintReport(seconds, seed, watched, all, rows, report.cleanupsRun);
  }
  return ViolationCount() == 0 ? 0 : 1;
}
