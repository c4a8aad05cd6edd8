#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdio>

#include "contours/point.h"
#include "driver/checked_array.h"
#include "driver/recycling_queue.h"

namespace pc {
namespace {

TEST(CheckedArray, StepBelowOneGrowsByHundredAndFirstAppendAllocatesOneStep) {
  CheckedArray<int*> zero(0, 0);
  CheckedArray<int*> negative(0, -5);
  EXPECT_EQ(zero.growStep, 100);
  EXPECT_EQ(negative.growStep, 100);
  EXPECT_EQ(zero.capacity, 0);
  EXPECT_EQ(zero.data, nullptr);
  zero.append(nullptr);
  EXPECT_EQ(zero.capacity, 100);
  EXPECT_EQ(zero.count, 1);
}

TEST(CheckedArray, GrowsLinearlyKeepingOrder) {
  CheckedArray<Point> points(1000, 1000);
  for (int i = 0; i < 1001; ++i) points.append(Point{static_cast<float>(i), -1.0f});
  EXPECT_EQ(points.capacity, 2000);
  for (int i = 0; i < 1001; ++i) ASSERT_EQ(points.at(i).x, static_cast<float>(i));
  // Fresh point slots start at the origin.
  EXPECT_EQ(points.data[1500].x, 0.0f);
  EXPECT_EQ(points.data[1500].y, 0.0f);
}

TEST(CheckedArray, ResetKeepsTheBlock) {
  CheckedArray<int> a(3, 5);
  for (int i = 0; i < 3; ++i) a.append(i);
  int* block = a.data;
  a.reset();
  for (int i = 0; i < 3; ++i) a.append(10 + i);
  EXPECT_EQ(a.data, block);
  EXPECT_EQ(a.capacity, 3);
  a.append(99);
  EXPECT_EQ(a.capacity, 8);
  a.clear();
  EXPECT_EQ(a.data, nullptr);
  EXPECT_EQ(a.growStep, 5);
}

// The report goes to standard output; the child mirrors it onto standard
// error, where the death-test matcher looks.
void readAt(int i) {
  CheckedArray<int> a(4, 4);
  a.append(7);
  std::fflush(stdout);
  dup2(fileno(stderr), fileno(stdout));
  (void)a.at(i);
}

TEST(CheckedArrayDeathTest, BadIndexEndsWithTheReport) {
  const char* report =
      "\n\\*{37}\n\\*\\*\\* ERROR : Invalid Array Index\n\\*\\*\\* FILE  : array_impl\n"
      "\\*\\*\\* LINE  : 59\n\\*{37}\n\n";
  EXPECT_EXIT(readAt(-1), testing::ExitedWithCode(1), testing::ContainsRegex(report));
  EXPECT_EXIT(readAt(1), testing::ExitedWithCode(1), testing::ContainsRegex(report));
}

TEST(RecyclingQueue, IsFifoAndReusesCells) {
  RecyclingQueue<int> q;
  for (int i = 0; i < 4; ++i) q.push(i);
  EXPECT_EQ(q.pop().value(), 0);
  EXPECT_EQ(q.count(), 3);
  q.clearAll();
  EXPECT_EQ(q.count(), 0);
  EXPECT_FALSE(q.pop().has_value());
  for (int i = 0; i < 4; ++i) q.push(10 + i);
  EXPECT_EQ(q.allocatedCells(), 4);
  EXPECT_EQ(q.pop().value(), 10);
  EXPECT_EQ(q.pop().value(), 11);
}

}  // namespace
}  // namespace pc
