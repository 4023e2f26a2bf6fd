// The host's waveform array: its table of operations at the fixed positions, samples in handles
// that count and fail as every handle does, locks that fail on request, and a Lock without its
// Unlock stopping the process. What Lock describes and what Unlock keeps is checked by the
// library's waveform tests, which write and read every sample, start time and interval.
#include <gtest/gtest.h>

#include "host_fixture.h"

namespace {

using WaveformArray = HostTest;
using WaveformArrayDeathTest = HostTest;

TEST_F(WaveformArray, ResizeMakesResizesAndFreesSampleHandles) {
  SvWaveformArray *array = svsimMakeWaveformArray(0, 0);
  const void *const *table = reinterpret_cast<const void *const *>(array->ops);
  for (int position = 0; position < 13; ++position) {
    const bool used = position == 3 || position == 6 || position == 11 || position == 12;
    EXPECT_EQ(table[position] != nullptr, used) << position;
  }
  struct Case {
    int32_t kind, count, samples, status;
    uint64_t made, resized, freed;
  } cases[] = {
      {6, 3, 4, 0, 3, 0, 0},  // three new waveforms
      {6, 3, 4, 0, 0, 0, 0},  // nothing changes, nothing is done
      {6, 2, 8, 0, 0, 2, 1},  // one goes, the other two grow
      {5, 1, 1, SVSIM_ERR_ARGUMENT, 0, 0, 0},
      {6, -1, 1, SVSIM_ERR_ARGUMENT, 0, 0, 0},
  };
  for (const Case &c : cases) {
    svsimResetCounters();
    EXPECT_EQ(array->ops->Resize(array, c.kind, c.count, c.samples), c.status);
    EXPECT_EQ(svsimAllocCount(), c.made);
    EXPECT_EQ(svsimResizeCount(), c.resized);
    EXPECT_EQ(svsimFreeCount(), c.freed);
  }
  int32_t count = 0;
  ASSERT_EQ(array->ops->GetCount(array, &count), 0);
  EXPECT_EQ(count, 2);
  svsimFailResizeAt(1);
  EXPECT_EQ(array->ops->Resize(array, 6, 2, 9), SVSIM_ERR_MEMORY);
  EXPECT_EQ(svsimWaveformCalls(array, 6), 6u);
  svsimDisposeWaveformArray(array);
}

TEST_F(WaveformArray, LocksFailOnRequestAndRefuseWhatTheyCannotHold) {
  SvWaveformArray *array = svsimMakeWaveformArray(2, 1);
  SvWaveformDescriptor descriptors[3] = {};
  const double sample = 1.5;
  svsimFailAll(1);  // locks are not memory: they go on
  svsimFailWaveformLockAt(2);
  EXPECT_EQ(array->ops->Lock(array, 1, 3, descriptors), SVSIM_ERR_ARGUMENT) << "too many";
  EXPECT_EQ(array->ops->Lock(array, 1, 1, descriptors), 0);
  EXPECT_EQ(svsimWaveformWrite(array, 0, &sample, 1), -1) << "not while locked";
  EXPECT_EQ(array->ops->Unlock(array, 1, descriptors), 0);
  EXPECT_EQ(array->ops->Lock(array, 1, 1, descriptors), SVSIM_ERR_LOCK);
  svsimFailAll(0);
  EXPECT_EQ(svsimWaveformLocked(array), 0);
  EXPECT_EQ(array->ops->Unlock(array, 1, descriptors), 0);  // taken, and counted
  EXPECT_EQ(svsimStrayWaveformUnlocks(), 1u);
  EXPECT_EQ(array->ops->Lock(array, 2, 0, nullptr), 0);  // a lock of nothing opens nothing
  EXPECT_EQ(svsimWaveformLocked(array), 0);
  svsimFailWaveformUnlockAt(1);
  ASSERT_EQ(array->ops->Lock(array, 2, 1, descriptors), 0);
  EXPECT_EQ(array->ops->Unlock(array, 1, descriptors), SVSIM_ERR_LOCK);
  EXPECT_EQ(svsimWaveformLocked(array), 0);  // a failed Unlock still closes
  EXPECT_EQ(svsimWaveformWrite(array, 0, &sample, 1), 0);
  svsimReset();
  EXPECT_EQ(svsimStrayWaveformUnlocks(), 0u);
  svsimDisposeWaveformArray(array);
}

TEST_F(WaveformArrayDeathTest, ALockWithoutItsUnlockStopsTheProcess) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  static SvWaveformDescriptor descriptors[2];
  const struct {
    const char *message;
    void (*misuse)(SvWaveformArray *);
  } cases[] = {
      {"Lock.*locked again before its Unlock",
       [](SvWaveformArray *a) {
         a->ops->Lock(a, 2, 1, descriptors);
         a->ops->Lock(a, 2, 1, descriptors);
       }},
      {"Unlock.*differs from its Lock",
       [](SvWaveformArray *a) {
         a->ops->Lock(a, 2, 2, descriptors);
         a->ops->Unlock(a, 1, descriptors);
       }},
      {"disposed of while locked",
       [](SvWaveformArray *a) {
         a->ops->Lock(a, 1, 1, descriptors);
         svsimDisposeWaveformArray(a);
       }},
      {"GetCount.*not a live waveform array",
       [](SvWaveformArray *a) {
         const SvWaveformArrayOps *ops = a->ops;
         svsimDisposeWaveformArray(a);
         int32_t count = 0;
         ops->GetCount(a, &count);
       }},
  };
  for (const auto &c : cases) EXPECT_DEATH(c.misuse(svsimMakeWaveformArray(2, 1)), c.message);
}

}  // namespace
