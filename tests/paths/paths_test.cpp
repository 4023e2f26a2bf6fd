// The path subsystem with the directory table's defaults (no relocation library in this program):
// UTF-8 decoding, the locale's conversions, the standard directories, directory making, the
// driver's directories by kind, joined and converted, and the path text exports.
#include <gtest/gtest.h>
#include <pwd.h>
#include <unistd.h>

#include <array>
#include <clocale>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <string>
#include <tuple>
#include <vector>

#include "core/exception_base.h"
#include "diagnostics/jsonz.h"
#include "diagnostics/overr_exception.h"
#include "kvsvapi.h"
#include "paths/directory_kind.h"
#include "paths/make_directory.h"
#include "paths/multibyte.h"
#include "paths/path.h"
#include "paths/path_maker.h"
#include "paths/share_dir.h"
#include "paths/utf8_decode.h"
#include "support/scoped_env.h"
#include "support/temp_dir.h"
#include "svsim.h"

namespace {

using namespace kvpath;
using kvsvtest::cScopedEnv;
using tAt = std::array<uint32_t, 5>;  // component, file, line, kind, info of a cExceptionBase

constexpr char kErrorLogDir[] = "/var/lib/kvor/log";

// Where `action` threw cExceptionBase from; zeroes if it threw none.
template <typename F>
tAt ThrownAt(F action) {
  try {
    action();
  } catch (const nKVSVAPI100::cExceptionBase &e) {
    const auto *s = e.Status();
    return {s->Component(), s->File(), s->Line(), s->Kind(), s->info};
  }
  return {};
}

// The text of `key` in the object `object` (null: the top) of the detail document `doc`.
std::string Detail(const char *doc, const char *object, const char *key) {
  if (doc != nullptr && object != nullptr) doc = jsonz::JsonFindKey(doc, object);
  const char *value = doc != nullptr ? jsonz::JsonFindKey(doc, key) : nullptr;
  size_t length = 0;
  const char *text = value != nullptr ? jsonz::JsonReadString(value, "", &length, nullptr) : "";
  return std::string(text, length);
}

// Every test works in a directory of its own, which holds the user's configuration directory.
class Paths : public testing::Test {
 protected:
  ~Paths() override { std::setlocale(LC_ALL, "C"); }
  std::string Sub(const std::string &relative) const { return dir_.Path() + "/" + relative; }
  void Write(const std::string &relative, const std::string &content) const {
    std::ofstream(Sub(relative), std::ios::binary) << content;
  }

  kvsvtest::cTempDir dir_;
  cScopedEnv xdg_{"XDG_CONFIG_HOME", Sub("cfg/")};
  cSysqWrapper sysq_;
};

TEST_F(Paths, Utf8Decoding) {
  // The edges of each length, then each way to fail (code point 0). The unchecked decoder reads
  // what the conversions below decode.
  // clang-format off
  const struct { std::string bytes; int result; uint32_t codePoint; } cases[] = {
      {"A", 0, 0x41}, {std::string(1, '\0'), 0, 0}, {"\xC2\x80", 0, 0x80}, {"\xDF\xBF", 0, 0x7FF},
      {"\xE0\xA0\x80", 0, 0x800}, {"\xED\x9F\xBF", 0, 0xD7FF}, {"\xEE\x80\x80", 0, 0xE000},
      {"\xEF\xBF\xBF", 0, 0xFFFF}, {"\xF0\x90\x80\x80", 0, 0x10000}, {"\xF4\x8F\xBF\xBF", 0, 0x10FFFF},
      {"", kUtf8Truncated, 0}, {"\xC3", kUtf8Truncated, 0}, {"\xF0\x9F\x98", kUtf8Truncated, 0},
      {"\x80", kUtf8BadLead, 0}, {"\xF8\x88\x80\x80\x80", kUtf8BadLead, 0}, {"\xFF", kUtf8BadLead, 0},
      {"\xC3\x41", kUtf8BadContinuation, 0}, {"\xF0\x9F\x98\xC0", kUtf8BadContinuation, 0},
      {"\xC0\xAF", kUtf8Overlong, 0}, {"\xE0\x9F\xBF", kUtf8Overlong, 0}, {"\xF0\x8F\xBF\xBF", kUtf8Overlong, 0},
      {"\xF4\x90\x80\x80", kUtf8AboveMaximum, 0}, {"\xF7\xBF\xBF\xBF", kUtf8AboveMaximum, 0},
      {"\xED\xA0\x80", kUtf8Surrogate, 0}, {"\xED\xBF\xBF", kUtf8Surrogate, 0}};
  // clang-format on
  for (const auto &c : cases) {
    SCOPED_TRACE(testing::PrintToString(c.bytes));
    const auto *begin = reinterpret_cast<const unsigned char *>(c.bytes.data()), *p = begin;
    const unsigned char *end = begin + c.bytes.size();
    uint32_t codePoint = 0;
    EXPECT_EQ(DecodeUtf8(p, end, codePoint), c.result);
    EXPECT_EQ(c.result == kUtf8Ok ? codePoint : 0u, c.codePoint);  // else unspecified
    EXPECT_EQ(p, c.result == kUtf8Ok ? end : begin) << "a failure stays at the sequence's start";
  }
  const unsigned char cut[] = {0xF0, 0x9F}, *p = cut;
  DecodeUtf8Unchecked(p, cut + 2);  // a sequence cut short: the sanitiser sees a read behind it
  EXPECT_EQ(p, cut + 2);
}

TEST_F(Paths, ConversionsBetweenUtf8AndTheLocale) {
  // Null and empty texts leave the output alone and 7-bit text is copied, in any locale and
  // strict or not; a strict call refuses any other text, but broken UTF-8 fails before that.
  const auto in = &MultibyteToUtf8, out = &Utf8ToMultibyte;
  const int32_t strict = kConversionStrict, failed = kConversionFailed;
  const char *const plain = "/var/lib/kvor log\t~",
                    *const all = "/var/lib/A\xC3\xA9\xE2\x82\xAC\xF0\x9F\x98\x80/kvor";
  // clang-format off
  const struct { const char *locale; int32_t (*convert)(const char *, bool, std::string &);
                 const char *text; bool strict; int32_t result; const char *output; } cases[] = {
      {"C", in, nullptr, false, 0, "kept"}, {"C", out, nullptr, false, 0, "kept"},
      {"C", in, "", true, 0, "kept"}, {"C", out, "", true, 0, "kept"},
      {"C", in, plain, true, 0, plain}, {"C", out, plain, true, 0, plain},
      {"C.UTF-8", in, "caf\xC3\xA9", true, strict, "kept"}, {"C.UTF-8", out, "caf\xC3\xA9", true, strict, "kept"},
      {"C.UTF-8", out, "a\xC0\xAF", false, failed, "kept"}, {"C.UTF-8", out, "\xED\xA0\x80", true, failed, "kept"},
      {"C.UTF-8", out, "x\xC3", true, failed, "kept"}, {"C.UTF-8", out, "\xF4\x90\x80\x80", false, failed, "kept"},
      {"C", in, "caf\xC3\xA9", false, failed, "kept"}, {"C", out, "caf\xC3\xA9", false, failed, "kept"},
      {"C.UTF-8", in, all, false, 0, all}, {"C.UTF-8", out, all, false, 0, all}};
  // clang-format on
  for (const auto &c : cases) {
    SCOPED_TRACE(&c - cases);
    ASSERT_NE(std::setlocale(LC_ALL, c.locale), nullptr);
    std::string output = "kept";
    EXPECT_EQ(c.convert(c.text, c.strict, output), c.result);
    EXPECT_EQ(output, c.output);
  }
}

TEST_F(Paths, ShareDirectoryFile) {
  // Its content normalised; missing, or a directory that opens but does not read: the default.
  // clang-format off
  const std::pair<std::string, std::string> cases[] = {
      {" /opt/orvane/share/\n", "/opt/orvane/share"}, {std::string("/opt/x\0", 7), "/opt/x"},
      {"/\n", ""}, {"", ""}};
  // clang-format on
  for (const auto &[content, dir] : cases) {
    Write("share.dir", content);
    EXPECT_EQ(ovsysq::ReadShareDir(Sub("share.dir").c_str()), dir);
  }
  EXPECT_EQ(ovsysq::ReadShareDir(Sub("absent").c_str()), "/usr/local/orvane/share");
  EXPECT_EQ(ovsysq::ReadShareDir(dir_.Path().c_str()), "/usr/local/orvane/share");
}

TEST_F(Paths, UserConfigurationDirectory) {
  cScopedEnv xdg("XDG_CONFIG_HOME", std::nullopt), home("HOME", std::nullopt);
  const passwd *entry = getpwuid(getuid());
  ASSERT_NE(entry, nullptr);
  EXPECT_EQ(sysq_.GetUserConfigDir(false), std::string(entry->pw_dir) + "/.config")
      << "without HOME the password entry decides";
  // Made only when asked: XDG_CONFIG_HOME with its parents, below HOME only the last directory.
  for (const auto &[variable, value, dir] :
       {std::array<std::string, 3>{"XDG_CONFIG_HOME", Sub("a/b//\n"), Sub("a/b")},
        {"HOME", dir_.Path() + "// ", Sub(".config")}}) {
    cScopedEnv set(variable.c_str(), value);
    EXPECT_EQ(sysq_.GetUserConfigDir(false), dir);
    EXPECT_FALSE(std::filesystem::is_directory(dir));
    EXPECT_EQ(sysq_.GetUserConfigDir(true), dir);
    EXPECT_EQ(sysq_.GetUserConfigDir(true), dir) << "again";
    EXPECT_TRUE(std::filesystem::is_directory(dir)) << variable;
  }
  cScopedEnv missing("HOME", Sub("missing/home"));
  try {
    sysq_.GetUserConfigDir(true);
    ADD_FAILURE() << "a home that does not exist";
  } catch (const overr::Exception &e) {
    EXPECT_EQ(e.Code(), -52006);
    EXPECT_EQ(Detail(e.Detail(), nullptr, "error_constant"), "ovapalerr_resourceNotFound");
    EXPECT_EQ(Detail(e.Detail(), "ovsysq_debug", "desc"), "parent not found");
    EXPECT_EQ(Detail(e.Detail(), "ovsysq_debug", "path"), Sub("missing/home/.config"));
    EXPECT_EQ(Detail(e.Detail(), "internal_error", "api"), "errno");
  }
}

TEST_F(Paths, EachKindByNumberAndByName) {
  // Kinds 2 and 14, alone, make their directory with its parents. Names as the exports take them.
  cScopedEnv xdg("XDG_CONFIG_HOME", Sub("deep/er/"));
  const std::string share = ovsysq::ReadShareDir(ovsysq::kShareDirFile),
                    config = Sub("deep/er/kvor");
  // clang-format off
  const struct { uint32_t kind; std::string path; const char *name; } cases[] = {
      {0, "/var/lib/kvor", "eAliasFileDir"}, {1, "/var/lib/kvor/dbCache", "eDatabaseCacheDir"},
      {2, config, "eDatabaseEditorSettingsIniDir"}, {3, kErrorLogDir, "eErrorLogDir"},
      {4, "/usr/share/kvor/firmware", nullptr}, {5, "/usr/share/kvor", nullptr}, {6, "/var/lib/kvor", nullptr},
      {7, share + "/errors/English", nullptr}, {8, share + "/errors/German", nullptr},
      {9, share + "/errors/French", nullptr}, {10, share + "/errors/Japanese", nullptr},
      {11, kErrorLogDir, nullptr}, {12, kErrorLogDir, nullptr}, {13, "/var/lib/kvor", "eTemporarySessionTextFileDir"},
      {14, config, "eDatabaseConfigDir"}, {15, "/usr/share/kvor", nullptr}, {16, "/home/svuser", nullptr}};
  // clang-format on
  for (const auto &c : cases) {
    SCOPED_TRACE(c.kind);
    EXPECT_EQ(cSvCgSupportLibraryPathMaker::MakePath(c.kind)->GetUtf8(), c.path);
    EXPECT_EQ(std::filesystem::is_directory(c.path), c.kind == 2 || c.kind == 14);
    std::filesystem::remove_all(Sub("deep"));
    if (c.name == nullptr) continue;
    EXPECT_EQ(KindFromName(c.name), c.kind);
  }
}

TEST_F(Paths, KindsAndDirectoriesThatFail) {
  EXPECT_EQ(ThrownAt([&] { cPath path(17, sysq_); }), (tAt{22, 1, 154, 2, 1}));
  for (std::string name : {"", "eerrorlogdir", "eErrorLogDir ", " eErrorLogDir", "eErrorLogDi"})
    EXPECT_EQ(ThrownAt([&] { KindFromName(name); }), (tAt{13, 24, 51, 2, 1})) << name;
  Write("file", "x");
  // Made with its parents: a file in the way, and a missing parent with no '/' to walk up from.
  // clang-format off
  for (const auto &[path, code, desc] : {std::tuple<std::string, int32_t, const char *>{
           Sub("file"), -52013, "path exist but not a dir"}, {"", -52006, "parent not found"}}) {
    // clang-format on
    nKVSVAPI100::tJsonStatus status;
    ovsysq::MakeDirectoryWithParents(path, nullptr, status);
    EXPECT_EQ(status.code, code);
    EXPECT_EQ(Detail(status.buffer, "ovsysq_debug", "desc"), desc);
    EXPECT_EQ(Detail(status.buffer, "ovsysq_debug", "path"), path);
    nKVSVAPI100::ReleaseJsonStatus(status);
  }
  // A file where the configuration directory goes: the system failure's code, and an internal
  // error at the exports; nothing is kept, so a usable directory works at the next call.
  cScopedEnv xdg("XDG_CONFIG_HOME", Sub("file/below"));
  for (const std::string name : {"eDatabaseEditorSettingsIniDir", "eDatabaseConfigDir"}) {
    EXPECT_EQ(ThrownAt([&] { cPath path(KindFromName(name), sysq_); }),
              (tAt{22, 1, 59, 3, static_cast<uint32_t>(-52008)}));
    uint64_t size = 0;
    EXPECT_EQ(kvsvPathGetMultibyteStringSizeInBytes(name.data(), name.size(), &size),
              kvErrInternal);
  }
  cScopedEnv good("XDG_CONFIG_HOME", Sub("good"));
  EXPECT_EQ(cSvCgSupportLibraryPathMaker::MakePath(14)->GetUtf8(), Sub("good/kvor"));
}

TEST_F(Paths, AppendConvertAndCopy) {
  // Both sides lose white space, '/' and NUL at the end, white space at the start, and join with
  // one '/'; the path keeps a trailing one of its own only until the next append.
  // clang-format off
  const std::pair<std::vector<std::string>, std::string> cases[] = {
      {{"a"}, "/a"}, {{"a/ \t\r\n/"}, "/a"}, {{std::string("x/\0\0", 4)}, "/x"}, {{" \v\fa b \n"}, "/a b"},
      {{"/abs//"}, "//abs"}, {{"caf\xC3\xA9"}, "/caf\xC3\xA9"}, {{" \n/\t"}, "/"}, {{"d/", "", "x/"}, "/d/x"}};
  // clang-format on
  for (const auto &[components, joined] : cases) {
    cPath path(16, sysq_);
    for (const std::string &component : components) path.AppendUtf8(component);
    EXPECT_EQ(path.GetUtf8(), "/home/svuser" + joined) << testing::PrintToString(components);
  }
  // Invalid UTF-8 anywhere in a component throws and changes nothing.
  cPath path(16, sysq_);
  for (const std::string bad : {"ok\xC3(", "\200abc", "abc\xC0\xAF", "a\xED\xA0\x80", "\xFF"})
    EXPECT_EQ(ThrownAt([&] { path.AppendUtf8(bad); }), (tAt{22, 1, 413, 2, 1})) << bad;
  EXPECT_EQ(path.GetUtf8(), "/home/svuser");
  // In the locale's encoding; a conversion that fails throws the in-house exception, either way.
  ASSERT_NE(std::setlocale(LC_ALL, "C.UTF-8"), nullptr);
  EXPECT_EQ(path.AppendMultibyte("m\xC3\xBCnchen/").GetMultibyte(), "/home/svuser/m\xC3\xBCnchen");
  std::setlocale(LC_ALL, "C");
  try {
    path.AppendMultibyte("caf\xC3\xA9");
    ADD_FAILURE() << "no exception";
  } catch (const overr::Exception &e) {
    EXPECT_EQ(e.Code(), -52027);
    EXPECT_EQ(Detail(e.Detail(), nullptr, "file"), "mbsToUtf8") << "the converter's name";
  }
  EXPECT_THROW(path.GetMultibyte(), overr::Exception);
  char buffer[32] = "x";
  EXPECT_THROW(path.CopyMultibyte(buffer, sizeof buffer), overr::Exception);
  EXPECT_STREQ(buffer, "x");
  // A copy needs room for the NUL.
  path.CopyUtf8(buffer, sizeof buffer);
  EXPECT_STREQ(buffer, "/home/svuser/m\xC3\xBCnchen");
  EXPECT_EQ(ThrownAt([&] { path.CopyUtf8(buffer, std::strlen(buffer)); }),
            (tAt{22, 1, 76, 1, static_cast<uint32_t>(kvErrBufferTooSmall)}));
}

TEST_F(Paths, ExportsReadOnlyTheNameAndTouchNothingWhenTheyRefuse) {
  // Only nameLength bytes of the name count; the text and its NUL fill the buffer exactly, the
  // rest of a larger one is NUL, and a smaller one is refused untouched.
  const char name[] = "eErrorLogDirAndMore";
  const size_t length = std::strlen(kErrorLogDir);
  uint64_t size = 0;
  ASSERT_EQ(kvsvPathGetMultibyteStringSizeInBytes(name, 12, &size), 0);
  EXPECT_EQ(size, length + 1);
  std::vector<char> buffer(64, 'x');
  EXPECT_EQ(kvsvPathGetMultibyteString(name, 12, length, buffer.data()), kvErrInternal);
  EXPECT_EQ(std::string(buffer.data(), 64), std::string(64, 'x'));
  ASSERT_EQ(kvsvPathGetMultibyteString(name, 12, length + 1, buffer.data()), 0);
  EXPECT_EQ(std::string(buffer.data(), length + 2), kErrorLogDir + std::string(1, '\0') + 'x');
  ASSERT_EQ(kvsvPathGetMultibyteString(name, 12, 64, buffer.data()), 0);
  EXPECT_EQ(std::string(buffer.data(), 64), kErrorLogDir + std::string(64 - length, '\0'));
  const std::pair<const char *, size_t> refused[] = {{name, 19}, {nullptr, 0}, {nullptr, 3}};
  for (const auto &[text, count] : refused) {
    const kvsvStatus status = text == nullptr && count != 0 ? kvErrNullArgument : kvErrInternal;
    size = 99;
    char untouched[64] = "untouched";
    EXPECT_EQ(kvsvPathGetMultibyteStringSizeInBytes(text, count, &size), status) << count;
    EXPECT_EQ(kvsvPathGetMultibyteString(text, count, 64, untouched), status) << count;
    EXPECT_EQ(size, 99u);
    EXPECT_STREQ(untouched, "untouched");
  }
  EXPECT_EQ(kvsvPathGetMultibyteStringSizeInBytes(name, 12, nullptr), kvErrNullArgument);
  EXPECT_EQ(kvsvPathGetMultibyteString(name, 12, 64, nullptr), kvErrNullArgument);
  // To a host string: no name, or a text that the host cannot store, leave it as it was.
  SvHandle text = svsimMakeString("old"), kind = svsimMakeString("eDatabaseCacheDir");
  char value[64];
  EXPECT_EQ(kvsvGetPathMultibyteStringAsSvStr(nullptr, text), kvErrInternal);
  svsimFailAll(1);
  EXPECT_EQ(kvsvGetPathMultibyteStringAsSvStr(kind, text), kvErrInternal);
  svsimFailAll(0);
  svsimReadString(text, value, sizeof value);
  EXPECT_STREQ(value, "old");
  EXPECT_EQ(kvsvGetPathMultibyteStringAsSvStr(kind, text), 0);
  svsimReadString(text, value, sizeof value);
  EXPECT_STREQ(value, "/var/lib/kvor/dbCache");
  svDisposeHandle(kind);
  svDisposeHandle(text);
}

}  // namespace
