// The reference manager: registration with copies of every text, unique cookies, removal by
// cookie and by name, forced results, and the protocol constants.
#include <gtest/gtest.h>

#include <set>
#include <string>

#include "host_fixture.h"

namespace {

using References = HostTest;

TEST_F(References, TheListKeepsTheOrderOfRegistrationAndCutsLongTexts) {
  const std::string longName(300, 'x');
  const char *names[] = {"Speed\nPowertrain.CAN_A", longName.c_str(), "Speed"};
  SvRefnum cookies[3] = {};
  for (int i = 0; i < 3; ++i) {
    ReferenceArgs args;
    args.name = names[i];
    args.handle = 0x83000005u + i;
    ASSERT_EQ(Register(args, &cookies[i]), 0);
  }
  SvsimRefInfo info{};
  for (int32_t i = 0; i < 3; ++i) {
    ASSERT_EQ(svsimGetRef(i, &info), 1);
    EXPECT_EQ(info.cookie, cookies[i]);
    EXPECT_EQ(info.handle, 0x83000005u + i);
    EXPECT_EQ(std::string(info.name), std::string(names[i]).substr(0, sizeof info.name - 1));
  }
  EXPECT_EQ(svsimGetRef(3, &info), 0);
  EXPECT_EQ(svsimGetRef(-1, &info), 0);
  ASSERT_EQ(svsimFindRef("Speed", &info), 1) << "found by the exact name only";
  EXPECT_EQ(info.cookie, cookies[2]);
}

TEST_F(References, CookiesAreUniqueWiderThan32BitsAndNeverHandedOutTwice) {
  std::set<SvRefnum> cookies;
  for (int i = 0; i < 5; ++i) {
    SvRefnum cookie = 0;
    ASSERT_EQ(Register(ReferenceArgs(), &cookie), 0);  // The same name five times is allowed.
    EXPECT_GT(cookie, 0xFFFFFFFFull);
    cookies.insert(cookie);
  }
  EXPECT_EQ(cookies.size(), 5u);
  svsimReset();
  SvRefnum afterReset = 0;
  ASSERT_EQ(Register(ReferenceArgs(), &afterReset), 0);
  EXPECT_EQ(cookies.count(afterReset), 0u);
}

TEST_F(References, UnregisterRemovesExactlyThatCookie) {
  SvRefnum first = 0, second = 0;
  ReferenceArgs args;
  args.name = "first";
  ASSERT_EQ(Register(args, &first), 0);
  args.name = "second";
  ASSERT_EQ(Register(args, &second), 0);
  EXPECT_EQ(svUnregisterRef(first), 0);
  SvsimRefInfo info{};
  EXPECT_EQ(svsimFindRef("first", &info), 0);
  EXPECT_EQ(svsimFindRef("second", &info), 1);
  for (SvRefnum wrong : {first, SvRefnum{0}, SvRefnum{second & 0xFFFFFFFFu}}) {
    EXPECT_EQ(svUnregisterRef(wrong), SVSIM_REF_NOT_FOUND) << std::hex << wrong;
  }
  EXPECT_EQ(svsimRefCount(), 1);
}

TEST_F(References, WrongProtocolValuesAreRefusedAndNothingIsRecorded) {
  void (*spoil[])(ReferenceArgs &) = {
      [](ReferenceArgs &a) { a.c21 = 20; }, [](ReferenceArgs &a) { a.c8 = 4; },
      [](ReferenceArgs &a) { a.c1 = 0; },   [](ReferenceArgs &a) { a.z0 = 1; },
      [](ReferenceArgs &a) { a.z1 = 1; },
  };
  for (size_t i = 0; i < std::size(spoil); ++i) {
    ReferenceArgs args;
    spoil[i](args);
    SvRefnum cookie = 0;
    EXPECT_EQ(Register(args, &cookie), SVSIM_REF_BAD_ARGUMENT) << "argument " << i;
    EXPECT_EQ(cookie, 0u) << "argument " << i;
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

TEST_F(References, TheByNameRemovalMatchesAllThreeTexts) {
  ReferenceArgs session, frame, otherKind, other;
  frame.className = "KVOR Frame";
  otherKind.kind = "kvor2";
  other.name = "other";
  SvRefnum cookie = 0;
  for (const ReferenceArgs *args : {&session, &session, &frame, &otherKind, &other}) {
    ASSERT_EQ(Register(*args, &cookie), 0);
  }
  SvHandle name = svsimMakeString(session.name);
  SvHandle kind = svsimMakeString("kvor");
  SvHandle className = svsimMakeString("KVOR Session");
  svsimSetRefStatus(-9);
  EXPECT_EQ(svsimUnregisterRefByName(name, kind, className, 21), -9);
  svsimSetRefStatus(0);
  EXPECT_EQ(svsimRefCount(), 5);
  EXPECT_EQ(svsimUnregisterRefByName(name, kind, className, 21), 0);
  EXPECT_EQ(svsimRefCount(), 3) << "both sessions of that name went, nothing else";
  SvsimRefInfo info{};
  ASSERT_EQ(svsimFindRef(session.name, &info), 1);
  EXPECT_STREQ(info.className, "KVOR Frame");
  EXPECT_EQ(svsimUnregisterRefByName(name, kind, className, 21), SVSIM_REF_NOT_FOUND);
  EXPECT_EQ(svsimUnregisterRefByName(name, kind, className, 20), SVSIM_REF_BAD_ARGUMENT);
  EXPECT_EQ(svsimUnregisterRefByName(nullptr, kind, className, 21), SVSIM_REF_BAD_ARGUMENT);
  for (SvHandle h : {name, kind, className}) svDisposeHandle(h);
}

}  // namespace
