// A host that offers the by-name removal: the program links libsvhostbyname.so and the operation
// is found by a run-time lookup, as the library finds it.
#include <dlfcn.h>
#include <gtest/gtest.h>

#include "host_fixture.h"
#include "reference_args.h"

namespace {

using ByNamePresent = HostTest;

TEST_F(ByNamePresent, TheOperationIsFoundAndRemovesByName) {
  auto byName =
      reinterpret_cast<SvUnregisterRefByNameProc>(dlsym(RTLD_DEFAULT, "svUnregisterRefByName"));
  ASSERT_NE(byName, nullptr);

  ReferenceArgs database;
  database.name = "Powertrain";
  database.className = "KVOR Database";
  ReferenceArgs ecu;
  ecu.name = "Powertrain";
  ecu.className = "KVOR ECU";
  SvRefnum cookie = 0;
  ASSERT_EQ(Register(database, &cookie), 0);
  ASSERT_EQ(Register(ecu, &cookie), 0);

  SvHandle name = svsimMakeString("Powertrain");
  SvHandle kind = svsimMakeString("kvor");
  SvHandle className = svsimMakeString("KVOR Database");
  EXPECT_EQ(byName(name, kind, className, 21), 0);
  EXPECT_EQ(svsimRefCount(), 1);
  SvsimRefInfo info{};
  ASSERT_EQ(svsimGetRef(0, &info), 1);
  EXPECT_STREQ(info.className, "KVOR ECU");
  EXPECT_EQ(byName(name, kind, className, 21), SVSIM_REF_NOT_FOUND);
  svsimSetRefStatus(-9);
  EXPECT_EQ(byName(name, kind, className, 21), -9);
  for (SvHandle h : {name, kind, className}) svDisposeHandle(h);
}

}  // namespace
