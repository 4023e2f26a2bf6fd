// The reference manager: registration with copies of every text, unique cookies, removal by
// cookie, forced results, and the protocol constants.
#include <gtest/gtest.h>

#include <set>
#include <string>

#include "host_fixture.h"
#include "reference_args.h"

namespace {

using References = HostTest;

TEST_F(References, RegistrationRecordsCopiesOfEveryText) {
  ReferenceArgs args;
  args.name = "Speed\nPowertrain.CAN_A";
  args.handle = 0x83000005;
  args.className = "KVOR Signal";
  args.openName = "kvsvdbSignalOpen";
  args.closeName = "kvsvdbSignalClose";
  SvRefnum cookie = 0;
  ASSERT_EQ(Register(args, &cookie), 0);  // Disposes of its handles after the call.
  SvsimRefInfo info{};
  ASSERT_EQ(svsimFindRef("Speed\nPowertrain.CAN_A", &info), 1);
  EXPECT_EQ(info.cookie, cookie);
  EXPECT_EQ(info.handle, 0x83000005u);
  EXPECT_EQ(info.keep, 1);
  EXPECT_STREQ(info.kind, "kvor");
  EXPECT_STREQ(info.className, "KVOR Signal");
  EXPECT_STREQ(info.libraryPattern, "kvsvapi.*");
  EXPECT_STREQ(info.openName, "kvsvdbSignalOpen");
  EXPECT_STREQ(info.closeName, "kvsvdbSignalClose");
  EXPECT_EQ(svsimFindRef("Speed", &info), 0);
}

TEST_F(References, CookiesAreUniqueNonZeroAndWiderThan32Bits) {
  std::set<SvRefnum> cookies;
  for (int i = 0; i < 5; ++i) {
    SvRefnum cookie = 0;
    ASSERT_EQ(Register(ReferenceArgs(), &cookie), 0);  // The same name five times is allowed.
    EXPECT_NE(cookie, 0u);
    EXPECT_GT(cookie, 0xFFFFFFFFull);
    cookies.insert(cookie);
  }
  EXPECT_EQ(cookies.size(), 5u);
  svsimReset();
  SvRefnum afterReset = 0;
  ASSERT_EQ(Register(ReferenceArgs(), &afterReset), 0);
  EXPECT_EQ(cookies.count(afterReset), 0u) << "a cookie is never handed out twice";
}

TEST_F(References, TheListKeepsTheOrderOfRegistration) {
  const char *names[] = {"A", "B", "C"};
  for (const char *name : names) {
    ReferenceArgs args;
    args.name = name;
    SvRefnum cookie = 0;
    ASSERT_EQ(Register(args, &cookie), 0);
  }
  ASSERT_EQ(svsimRefCount(), 3);
  SvsimRefInfo info{};
  for (int32_t i = 0; i < 3; ++i) {
    ASSERT_EQ(svsimGetRef(i, &info), 1);
    EXPECT_STREQ(info.name, names[i]);
  }
  EXPECT_EQ(svsimGetRef(3, &info), 0);
  EXPECT_EQ(svsimGetRef(-1, &info), 0);
}

TEST_F(References, UnregisterRemovesExactlyThatCookie) {
  SvRefnum first = 0, second = 0;
  ReferenceArgs args;
  args.name = "first";
  ASSERT_EQ(Register(args, &first), 0);
  args.name = "second";
  ASSERT_EQ(Register(args, &second), 0);
  EXPECT_EQ(svUnregisterRef(first), 0);
  EXPECT_EQ(svsimRefCount(), 1);
  SvsimRefInfo info{};
  EXPECT_EQ(svsimFindRef("first", &info), 0);
  EXPECT_EQ(svsimFindRef("second", &info), 1);
  EXPECT_EQ(svUnregisterRef(first), SVSIM_REF_NOT_FOUND);
  EXPECT_EQ(svUnregisterRef(0), SVSIM_REF_NOT_FOUND);
  EXPECT_EQ(svUnregisterRef(second & 0xFFFFFFFFull), SVSIM_REF_NOT_FOUND)
      << "a cookie cut to 32 bits is not the cookie";
  EXPECT_EQ(svsimRefCount(), 1);
}

TEST_F(References, WrongProtocolValuesAreRefusedAndNothingIsRecorded) {
  struct Case {
    const char *name;
    void (*spoil)(ReferenceArgs &);
  };
  const Case cases[] = {
      {"c21", [](ReferenceArgs &a) { a.c21 = 20; }}, {"c8", [](ReferenceArgs &a) { a.c8 = 4; }},
      {"c1", [](ReferenceArgs &a) { a.c1 = 0; }},    {"z0", [](ReferenceArgs &a) { a.z0 = 1; }},
      {"z1", [](ReferenceArgs &a) { a.z1 = 1; }},
  };
  for (const Case &c : cases) {
    ReferenceArgs args;
    c.spoil(args);
    SvRefnum cookie = 0;
    EXPECT_EQ(Register(args, &cookie), SVSIM_REF_BAD_ARGUMENT) << c.name;
    EXPECT_EQ(cookie, 0u) << c.name;
  }
  EXPECT_EQ(Register(ReferenceArgs(), nullptr), SVSIM_REF_BAD_ARGUMENT);
  EXPECT_EQ(svsimRefCount(), 0);
}

TEST_F(References, AForcedStatusFailsOrWarns) {
  SvRefnum cookie = 0;
  svsimSetRefStatus(-5);
  EXPECT_EQ(Register(ReferenceArgs(), &cookie), -5);
  EXPECT_EQ(svsimRefCount(), 0);

  svsimSetRefStatus(7);
  EXPECT_EQ(Register(ReferenceArgs(), &cookie), 7);
  EXPECT_EQ(svsimRefCount(), 1) << "a warning still registers";

  svsimSetRefStatus(-5);
  EXPECT_EQ(svUnregisterRef(cookie), -5);
  EXPECT_EQ(svsimRefCount(), 1);
  svsimSetRefStatus(7);
  EXPECT_EQ(svUnregisterRef(cookie), 7);
  EXPECT_EQ(svsimRefCount(), 0);
  svsimSetRefStatus(0);
  EXPECT_EQ(svUnregisterRef(cookie), SVSIM_REF_NOT_FOUND);
}

TEST_F(References, LongTextsAreCutToTheirField) {
  const std::string longName(300, 'x');
  ReferenceArgs args;
  args.name = longName.c_str();
  SvRefnum cookie = 0;
  ASSERT_EQ(Register(args, &cookie), 0);
  SvsimRefInfo info{};
  ASSERT_EQ(svsimGetRef(0, &info), 1);
  EXPECT_EQ(std::string(info.name), longName.substr(0, sizeof info.name - 1));
}

TEST_F(References, TheByNameRemovalOfTheControlApiMatchesAllThreeTexts) {
  ReferenceArgs session;
  ReferenceArgs frame;
  frame.className = "KVOR Frame";
  ReferenceArgs other;
  other.name = "other";
  SvRefnum cookie = 0;
  ASSERT_EQ(Register(session, &cookie), 0);
  ASSERT_EQ(Register(session, &cookie), 0);
  ASSERT_EQ(Register(frame, &cookie), 0);
  ASSERT_EQ(Register(other, &cookie), 0);
  SvHandle name = svsimMakeString(session.name);
  SvHandle kind = svsimMakeString("kvor");
  SvHandle className = svsimMakeString("KVOR Session");
  EXPECT_EQ(svsimUnregisterRefByName(name, kind, className, 21), 0);
  EXPECT_EQ(svsimRefCount(), 2) << "both sessions of that name went, the frame and other stayed";
  SvsimRefInfo info{};
  ASSERT_EQ(svsimFindRef(session.name, &info), 1);
  EXPECT_STREQ(info.className, "KVOR Frame");
  EXPECT_EQ(svsimUnregisterRefByName(name, kind, className, 21), SVSIM_REF_NOT_FOUND);
  EXPECT_EQ(svsimUnregisterRefByName(name, kind, className, 20), SVSIM_REF_BAD_ARGUMENT);
  EXPECT_EQ(svsimUnregisterRefByName(nullptr, kind, className, 21), SVSIM_REF_BAD_ARGUMENT);
  for (SvHandle h : {name, kind, className}) svDisposeHandle(h);
}

}  // namespace
