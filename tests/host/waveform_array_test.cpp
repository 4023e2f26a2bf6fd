// The host's waveform array: its table of operations at the fixed positions, samples in handles
// that count and fail as every handle does, locks that fail on request, and a Lock without its
// Unlock stopping the process.
#include <gtest/gtest.h>

#include <vector>

#include "host_fixture.h"

namespace {

using WaveformArray = HostTest;
using WaveformArrayDeathTest = HostTest;

int32_t Count(SvWaveformArray *array) {
  int32_t count = -1;
  EXPECT_EQ(array->ops->GetCount(array, &count), 0);
  return count;
}

TEST_F(WaveformArray, TheTableHoldsOnlyItsFourOperations) {
  SvWaveformArray *array = svsimMakeWaveformArray(2, 3);
  const void *const *table = reinterpret_cast<const void *const *>(array->ops);
  for (int position = 0; position < 13; ++position) {
    const bool used = position == 3 || position == 6 || position == 11 || position == 12;
    EXPECT_EQ(table[position] != nullptr, used) << position;
  }
  EXPECT_EQ(Count(array), 2);
  EXPECT_EQ(svsimWaveformCalls(array, 3), 1u);
  svsimDisposeWaveformArray(array);
}

TEST_F(WaveformArray, ResizeMakesResizesAndFreesSampleHandles) {
  SvWaveformArray *array = svsimMakeWaveformArray(0, 0);
  struct Case {
    int32_t kind, count, samples;
    int32_t status;
    uint64_t made, resized, freed;
  } cases[] = {
      {6, 3, 4, 0, 3, 0, 0},    // three new waveforms
      {6, 3, 4, 0, 0, 0, 0},    // nothing changes, nothing is done
      {6, 2, 8, 0, 0, 2, 1},    // one goes, the other two grow
      {5, 1, 1, SVSIM_ERR_ARGUMENT, 0, 0, 0},
      {6, -1, 1, SVSIM_ERR_ARGUMENT, 0, 0, 0},
      {6, 0, 0, 0, 0, 0, 2},
  };
  for (const Case &c : cases) {
    svsimResetCounters();
    EXPECT_EQ(array->ops->Resize(array, c.kind, c.count, c.samples), c.status);
    EXPECT_EQ(svsimAllocCount(), c.made);
    EXPECT_EQ(svsimResizeCount(), c.resized);
    EXPECT_EQ(svsimFreeCount(), c.freed);
  }
  EXPECT_EQ(svsimWaveformCalls(array, 6), 6u);
  // A refused handle is the host's refusal of the resize.
  svsimFailAllocAt(2);
  EXPECT_EQ(array->ops->Resize(array, 6, 3, 1), SVSIM_ERR_MEMORY);
  EXPECT_EQ(Count(array), 1);  // the waveform before the failing one was made
  svsimFailResizeAt(1);
  EXPECT_EQ(array->ops->Resize(array, 6, 1, 9), SVSIM_ERR_MEMORY);
  svsimDisposeWaveformArray(array);
}

TEST_F(WaveformArray, LockDescribesTheWaveformsAndUnlockKeepsTheirTiming) {
  SvWaveformArray *array = svsimMakeWaveformArray(2, 3);
  const double samples[] = {1.5, 2.5};
  ASSERT_EQ(svsimWaveformWrite(array, 1, samples, 2), 0);
  std::vector<SvWaveformDescriptor> descriptors(2);
  ASSERT_EQ(array->ops->Lock(array, 2, 2, descriptors.data()), 0);
  EXPECT_EQ(svsimWaveformLocked(array), 1);
  EXPECT_EQ(descriptors[0].numSamples, 3u);
  EXPECT_EQ(descriptors[1].numSamples, 2u);
  EXPECT_EQ(descriptors[1].samples[1], 2.5);
  EXPECT_EQ(descriptors[0].dt, 1.0);
  descriptors[1].samples[0] = -7.0;  // the samples are the waveform's own
  descriptors[1].t0 = SvTime{5, 6};
  descriptors[1].dt = 0.25;
  EXPECT_EQ(svsimWaveformWrite(array, 0, samples, 1), -1);  // not while locked
  ASSERT_EQ(array->ops->Unlock(array, 2, descriptors.data()), 0);
  std::vector<double> read(2);
  SvTime t0{};
  double dt = 0;
  EXPECT_EQ(svsimWaveformRead(array, 1, read.data(), 2, &t0, &dt), 2);
  EXPECT_EQ(read, (std::vector<double>{-7.0, 2.5}));
  EXPECT_EQ(t0.fraction, 5u);
  EXPECT_EQ(t0.seconds, 6);
  EXPECT_EQ(dt, 0.25);
  struct Case {
    int32_t access, count;
    bool nullDescriptors;
    int32_t status;
  } refused[] = {{3, 1, false, SVSIM_ERR_ARGUMENT},
                 {1, 3, false, SVSIM_ERR_ARGUMENT},
                 {1, 1, true, SVSIM_ERR_ARGUMENT}};
  for (const Case &c : refused) {
    EXPECT_EQ(array->ops->Lock(array, c.access, c.count,
                               c.nullDescriptors ? nullptr : descriptors.data()),
              c.status);
    EXPECT_EQ(svsimWaveformLocked(array), 0);
  }
  svsimDisposeWaveformArray(array);
}

TEST_F(WaveformArray, InjectedLockFailuresAndStrayUnlocks) {
  SvWaveformArray *array = svsimMakeWaveformArray(1, 1);
  SvWaveformDescriptor descriptor{};
  svsimFailWaveformLockAt(2);
  EXPECT_EQ(array->ops->Lock(array, 1, 1, &descriptor), 0);
  EXPECT_EQ(array->ops->Unlock(array, 1, &descriptor), 0);
  EXPECT_EQ(array->ops->Lock(array, 1, 1, &descriptor), SVSIM_ERR_LOCK);
  EXPECT_EQ(svsimWaveformLocked(array), 0);
  EXPECT_EQ(array->ops->Unlock(array, 1, &descriptor), 0);  // taken, and counted
  EXPECT_EQ(svsimStrayWaveformUnlocks(), 1u);
  // A lock of nothing opens nothing, so no Unlock follows it.
  EXPECT_EQ(array->ops->Lock(array, 2, 0, nullptr), 0);
  EXPECT_EQ(svsimWaveformLocked(array), 0);
  svsimFailWaveformUnlockAt(1);
  ASSERT_EQ(array->ops->Lock(array, 2, 1, &descriptor), 0);
  EXPECT_EQ(array->ops->Unlock(array, 1, &descriptor), SVSIM_ERR_LOCK);
  EXPECT_EQ(svsimWaveformLocked(array), 0);  // a failed Unlock still closes
  EXPECT_EQ(svsimInjectedFaults(), 2u);
  svsimFailAll(1);  // not a memory operation: locks go on
  EXPECT_EQ(array->ops->Lock(array, 2, 1, &descriptor), 0);
  EXPECT_EQ(array->ops->Unlock(array, 1, &descriptor), 0);
  svsimFailAll(0);
  svsimReset();
  EXPECT_EQ(svsimStrayWaveformUnlocks(), 0u);
  svsimDisposeWaveformArray(array);
}

TEST_F(WaveformArrayDeathTest, ALockWithoutItsUnlockStopsTheProcess) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  const struct {
    const char *message;
    void (*misuse)();
  } cases[] = {
      {"Lock.*locked again before its Unlock",
       [] {
         SvWaveformArray *array = svsimMakeWaveformArray(1, 1);
         SvWaveformDescriptor descriptor{};
         array->ops->Lock(array, 2, 1, &descriptor);
         array->ops->Lock(array, 2, 1, &descriptor);
       }},
      {"Unlock.*differs from its Lock",
       [] {
         SvWaveformArray *array = svsimMakeWaveformArray(2, 1);
         SvWaveformDescriptor descriptors[2] = {};
         array->ops->Lock(array, 2, 2, descriptors);
         array->ops->Unlock(array, 1, descriptors);
       }},
      {"disposed of while locked",
       [] {
         SvWaveformArray *array = svsimMakeWaveformArray(1, 1);
         SvWaveformDescriptor descriptor{};
         array->ops->Lock(array, 1, 1, &descriptor);
         svsimDisposeWaveformArray(array);
       }},
      {"GetCount.*not a live waveform array",
       [] {
         SvWaveformArray *array = svsimMakeWaveformArray(1, 1);
         const SvWaveformArrayOps *ops = array->ops;
         svsimDisposeWaveformArray(array);
         int32_t count = 0;
         ops->GetCount(array, &count);
       }},
  };
  for (const auto &c : cases) EXPECT_DEATH(c.misuse(), c.message);
}

}  // namespace
