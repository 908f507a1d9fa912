// SPDX-License-Identifier: MIT
// Scaling of long runs onto a progress bar of at most 32767 steps.
#include "recordingbar.h"

#include <gtest/gtest.h>

#include <limits>

namespace walk {
namespace {

class ProgressScaleTest : public ::testing::Test {
 protected:
  // A bar left part-way by an earlier run: a new range must reset it.
  ProgressScaleTest() {
    bar.setMinimum(5);
    bar.setValue(7);
  }
  transform::test::RecordingBar bar;
  ProgressScale progress{bar};
};

TEST_F(ProgressScaleTest, RangesAboveTheLargestStepCountAreScaled) {
  struct Case {
    qint32 units;
    int maximum;
    double scale;
  };
  for (const Case& c : {Case{250, 250, 1.0}, Case{32767, 32767, 1.0}, Case{0, 1, 1.0}, Case{-5, 1, 1.0},
                        Case{32768, 32767, 32768.0 / 32767.0}}) {
    progress.SetProgressRange(c.units);
    EXPECT_EQ(bar.minimum(), 0) << c.units;
    EXPECT_EQ(bar.maximum(), c.maximum) << c.units;
    EXPECT_EQ(bar.value(), 0) << c.units;
    EXPECT_DOUBLE_EQ(progress.scale(), c.scale) << c.units;
  }
  progress.SetProgressRange(250);
  EXPECT_EQ(progress.totalUnits(), 250);
  progress.AdvanceProgress(1);
  progress.AdvanceProgress(40);
  EXPECT_EQ(bar.value(), 41);
}

TEST_F(ProgressScaleTest, FortyThousandMembersFillTheBarBeforeTheLastOne) {
  progress.SetProgressRange(40000);
  EXPECT_EQ(bar.maximum(), 32767);
  EXPECT_DOUBLE_EQ(progress.scale(), 40000.0 / 32767.0);
  progress.AdvanceProgress(1);
  EXPECT_EQ(bar.value(), 1);  // 1 / 1.2207 rounds to one whole step
  for (int member = 2; member <= 32767; ++member)
    progress.AdvanceProgress(1);
  EXPECT_EQ(bar.value(), 32767);
  const size_t writes = bar.values.size();
  for (int member = 32768; member <= 40000; ++member)
    progress.AdvanceProgress(1);
  EXPECT_EQ(bar.value(), 32767);
  EXPECT_EQ(bar.values.size(), writes);  // a full bar is left alone
}

TEST_F(ProgressScaleTest, StepsAreRoundedHalfUp) {
  progress.SetProgressRange(3 * 32767);  // three units per step
  for (const auto& [units, value] :
       {std::pair(1, 0), std::pair(2, 1), std::pair(4, 2), std::pair(3000, 1002)}) {
    progress.AdvanceProgress(units);
    EXPECT_EQ(bar.value(), value) << units;
  }
  progress.SetProgressRange(2 * 32767);
  progress.AdvanceProgress(1);
  EXPECT_EQ(bar.value(), 1) << "half a step";
}

TEST_F(ProgressScaleTest, NeverPastTheMaximum) {
  progress.SetProgressRange(10);
  progress.AdvanceProgress(7);
  progress.AdvanceProgress(7);
  EXPECT_EQ(bar.value(), 10);
  progress.SetProgressRange(100);
  progress.AdvanceProgress(std::numeric_limits<qint32>::max());
  EXPECT_EQ(bar.value(), 100);
}

TEST_F(ProgressScaleTest, NewRangeStartsAnEmptyBarAndLeavesVisibilityToTheCaller) {
  progress.SetProgressRange(10);
  progress.AdvanceProgress(4);
  bar.setVisible(true);
  progress.SetProgressRange(20);
  EXPECT_EQ(bar.value(), 0);
  EXPECT_TRUE(bar.isVisible());
  const size_t writes = bar.values.size();
  progress.AdvanceProgress(0);
  EXPECT_EQ(bar.value(), 0);
  EXPECT_EQ(bar.values.size(), writes) << "zero units move nothing";
}

}  // namespace
}  // namespace walk
