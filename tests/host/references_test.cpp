// The reference manager: registration with copies of every text, unique cookies, removal by
// cookie and by name, forced results, and the protocol constants.
#include <gtest/gtest.h>

#include <set>
#include <string>

#include "host_fixture.h"

namespace {

using References = HostTest;

TEST_F(References, TheListKeepsTheOrderOfRegistrationCutsLongTextsAndCookiesAreNeverReused) {
  const std::string longName(300, 'x');
  const char *names[] = {"Speed\nPowertrain.CAN_A", longName.c_str(), "Speed", "Speed"};
  SvRefnum cookies[4] = {};
  for (int i = 0; i < 4; ++i) {
    ReferenceArgs args;
    args.name = names[i];
    args.handle = 0x83000005u + i;
    ASSERT_EQ(Register(args, &cookies[i]), 0);
    EXPECT_GT(cookies[i], 0xFFFFFFFFull) << "cookies are wider than 32 bits";
  }
  SvsimRefInfo info{};
  for (int32_t i = 0; i < 4; ++i) {
    ASSERT_EQ(svsimGetRef(i, &info), 1);
    EXPECT_EQ(info.cookie, cookies[i]);
    EXPECT_EQ(info.handle, 0x83000005u + i);
    EXPECT_EQ(std::string(info.name), std::string(names[i]).substr(0, sizeof info.name - 1));
  }
  EXPECT_EQ(svsimGetRef(4, &info), 0);
  EXPECT_EQ(svsimGetRef(-1, &info), 0);
  ASSERT_EQ(svsimFindRef("Speed", &info), 1) << "found by the exact name only";
  EXPECT_EQ(info.cookie, cookies[2]);

  std::set<SvRefnum> unique(std::begin(cookies), std::end(cookies));
  EXPECT_EQ(unique.size(), 4u);
  svsimReset();
  SvRefnum afterReset = 0;
  ASSERT_EQ(Register(ReferenceArgs(), &afterReset), 0);
  EXPECT_EQ(unique.count(afterReset), 0u);
}

TEST_F(References, UnregisterRemovesExactlyThatCookieUnlessAStatusIsForced) {
  SvRefnum first = 0, second = 0;
  svsimSetRefStatus(-5);
  EXPECT_EQ(Register(ReferenceArgs(), &first), -5);
  EXPECT_EQ(svsimRefCount(), 0);
  svsimSetRefStatus(7);
  EXPECT_EQ(Register(ReferenceArgs(), &first), 7) << "a warning still registers";
  svsimSetRefStatus(0);
  ReferenceArgs args;
  args.name = "second";
  ASSERT_EQ(Register(args, &second), 0);
  svsimSetRefStatus(-5);
  EXPECT_EQ(svUnregisterRef(first), -5);
  EXPECT_EQ(svsimRefCount(), 2);
  svsimSetRefStatus(7);
  EXPECT_EQ(svUnregisterRef(first), 7);
  svsimSetRefStatus(0);
  SvsimRefInfo info{};
  EXPECT_EQ(svsimFindRef(ReferenceArgs().name, &info), 0);
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
