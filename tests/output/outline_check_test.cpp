#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "output/outline_check.h"

namespace pc {
namespace {

constexpr Point S = kSeparatorPoint;

TEST(OutlineCheck, ClosesNearlyClosedContoursAndBlanksShortOnes) {
  std::vector<Point> list = {S, {0, 0}, {10, 0}, {10, 10}, {0, 10}, {0.003f, 0.0035f},  // gap 0.0046
                             S, {1, 1}, {2, 2}, {3, 1},                                // 3 points
                             S, {5, 5}};                                               // 1 point
  testing::internal::CaptureStdout();
  EXPECT_EQ(checkOutline(list.data(), static_cast<std::int32_t>(list.size()), 3.0f, 0.005), 0);
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
  EXPECT_EQ(list[5].x, 0.0f);
  EXPECT_EQ(list[5].y, 0.0f);
  for (int k : {7, 8, 9, 11}) {
    EXPECT_EQ(list[k].x, kSeparatorValue) << k;
    EXPECT_EQ(list[k].y, kSeparatorValue) << k;
  }
  EXPECT_EQ(list[1].x, 0.0f);  // untouched
  EXPECT_EQ(list[2].x, 10.0f);
}

TEST(OutlineCheck, ReportsTheFirstOpenContourAndStops) {
  std::vector<Point> list = {S, {0, 0}, {10, 0}, {10, 10}, {0, 10}, {0, 0},
                             S, {1, 1}, {2, 1}, {2, 2}, {1, 2}, {1.5f, 1.25f},
                             S, {7, 7}, {8, 8}};  // after the failure: left alone
  testing::internal::CaptureStdout();
  EXPECT_EQ(checkOutline(list.data(), static_cast<std::int32_t>(list.size()), -2.5f, 0.005), -1);
  EXPECT_EQ(testing::internal::GetCapturedStdout(),
            "**************************************\n"
            "*** OPEN CONTOUR (5 pts)\n"
            "*** First Point : X=1.000 Y=1.000 Z=-2.500\n"
            "*** Last  Point : X=1.500 Y=1.250 Z=-2.500\n"
            "**************************************\n");
  EXPECT_EQ(list[11].x, 1.5f);
  EXPECT_EQ(list[13].x, 7.0f);
}

TEST(OutlineCheck, EmptyListsAndListsWithoutPointsFailSilently) {
  std::vector<Point> separators = {S, S, {95000.0f, 1.0f}};
  testing::internal::CaptureStdout();
  EXPECT_EQ(checkOutline(nullptr, 3, 0.0f, 0.005), -1);
  EXPECT_EQ(checkOutline(separators.data(), 0, 0.0f, 0.005), -1);
  EXPECT_EQ(checkOutline(separators.data(), 3, 0.0f, 0.005), -1);
  EXPECT_EQ(testing::internal::GetCapturedStdout(), "");
}

}  // namespace
}  // namespace pc
