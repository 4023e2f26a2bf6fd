// The host's waveform array: its table of operations at the fixed positions, samples in handles
// that count and fail as every handle does, and a Lock without its Unlock stopping the process.
#include <gtest/gtest.h>

#include <vector>

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

TEST_F(WaveformArray, LockDescribesTheWaveformsAndUnlockKeepsTheirTiming) {
  SvWaveformArray *array = svsimMakeWaveformArray(2, 3);
  const double samples[] = {1.5, 2.5};
  ASSERT_EQ(svsimWaveformWrite(array, 1, samples, 2), 0);
  std::vector<SvWaveformDescriptor> descriptors(2);
  EXPECT_EQ(array->ops->Lock(array, 1, 3, descriptors.data()), SVSIM_ERR_ARGUMENT);  // too many
  ASSERT_EQ(array->ops->Lock(array, 2, 2, descriptors.data()), 0);
  EXPECT_EQ(descriptors[0].numSamples, 3u);
  EXPECT_EQ(descriptors[1].samples[1], 2.5);
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
  EXPECT_EQ(t0.seconds, 6);
  EXPECT_EQ(dt, 0.25);
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
