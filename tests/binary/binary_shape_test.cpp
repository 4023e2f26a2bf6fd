// The built library's shape: what it exports, what it needs, what it leaves to the host process.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <array>
#include <cstdio>
#include <fstream>
#include <memory>
#include <regex>
#include <set>
#include <sstream>
#include <string>

namespace {

std::string Shell(const std::string &command) {
  std::unique_ptr<FILE, int (*)(FILE *)> pipe(popen(command.c_str(), "r"), pclose);
  EXPECT_NE(pipe, nullptr) << command;
  std::string out;
  std::array<char, 4096> buffer{};
  while (pipe && fgets(buffer.data(), buffer.size(), pipe.get()) != nullptr) out += buffer.data();
  return out;
}

std::string ReadFile(const char *path) {
  std::ifstream in(path);
  std::stringstream text;
  text << in.rdbuf();
  return text.str();
}

// Names that a regular expression captures, one per match.
std::set<std::string> Captures(const std::string &text, const std::regex &pattern) {
  std::set<std::string> names;
  for (std::sregex_iterator it(text.begin(), text.end(), pattern), end; it != end; ++it)
    names.insert((*it)[1].str());
  return names;
}

// Symbols of the dynamic table, by nm's letter: defined ones, or undefined ones.
std::set<std::string> DynamicSymbols(bool defined) {
  const std::string nm = std::string("nm -D ") + (defined ? "--defined-only " : "--undefined-only ") +
                         KVSV_LIBRARY_FILE;
  std::set<std::string> names;
  std::istringstream lines(Shell(nm));
  std::string line;
  while (std::getline(lines, line)) {
    std::istringstream fields(line);
    std::string a, b, c;
    fields >> a >> b >> c;
    std::string name = c.empty() ? b : c;
    name = name.substr(0, name.find('@'));
    if (!name.empty()) names.insert(name);
  }
  return names;
}

TEST(BinaryShape, ExportsExactlyTheFunctionsOfThePublicHeader) {
  const std::set<std::string> declared =
      Captures(ReadFile(KVSV_PUBLIC_HEADER), std::regex(R"(\nKVSV_EXPORT[^;(]*\b(\w+)\s*\()"));
  ASSERT_FALSE(declared.empty());
  for (const std::string &name : declared) EXPECT_EQ(name.rfind("kvsv", 0), 0u) << name;

  std::set<std::string> exported;
  for (const std::string &name : DynamicSymbols(true)) {
    // Linker-made markers of every shared object are not exports of ours.
    static const std::set<std::string> markers = {"_init", "_fini", "__bss_start", "_edata", "_end"};
    if (markers.count(name) == 0) exported.insert(name);
  }
  EXPECT_EQ(exported, declared);
}

TEST(BinaryShape, NeedsTheDriverBySonameAndNoStandIn) {
  const std::string dynamic = Shell(std::string("readelf -d ") + KVSV_LIBRARY_FILE);
  const std::set<std::string> needed =
      Captures(dynamic, std::regex(R"(\(NEEDED\)\s+Shared library: \[([^\]]+)\])"));
  EXPECT_THAT(needed, testing::Contains("libkvor.so.1"));
  for (const std::string &name : needed) EXPECT_EQ(name.find("svhost"), std::string::npos) << name;
  EXPECT_THAT(dynamic, testing::HasSubstr("Library soname: [libkvsvapi.so.1]"));
}

TEST(BinaryShape, LeavesEveryHostOperationToTheProcess) {
  const std::set<std::string> undefined = DynamicSymbols(false);
  const std::set<std::string> defined = DynamicSymbols(true);
  // Every host operation the platform header declares and the library calls stays undefined.
  const std::set<std::string> hostOps =
      Captures(ReadFile(KVSV_PLATFORM_HEADER), std::regex(R"(\b(sv[A-Z]\w*)\s*\()"));
  std::set<std::string> used;
  for (const std::string &name : undefined)
    if (hostOps.count(name)) used.insert(name);
  EXPECT_THAT(used, testing::IsSupersetOf({"svNewHandleClr", "svSetHandleSizeClr", "svGetHandleSize",
                                           "svDisposeHandle"}));
  for (const std::string &name : defined) EXPECT_NE(name.rfind("sv", 0), 0u) << name;
}

}  // namespace
