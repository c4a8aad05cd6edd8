#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "driver/float_truncation.h"
#include "driver/run_mode.h"

namespace pc {
namespace {

RunMode modeOf(std::vector<const char*> args) {
  std::vector<char*> argv{const_cast<char*>("pocket-classifier")};
  for (const char* a : args) argv.push_back(const_cast<char*>(a));
  return runModeFromArguments(static_cast<int>(argv.size()), argv.data());
}

TEST(RunMode, OnlyTheFirstCharacterOfTheFirstArgumentCounts) {
  EXPECT_EQ(modeOf({}), RunMode::ContourFileRewrite);
  EXPECT_EQ(modeOf({"c"}), RunMode::ContourFileRewrite);
  EXPECT_EQ(modeOf({"Cxyz"}), RunMode::ContourFileRewrite);
  EXPECT_EQ(modeOf({"f", "w"}), RunMode::RecordContourFile);
  EXPECT_EQ(modeOf({"F"}), RunMode::RecordContourFile);
  EXPECT_EQ(modeOf({"w"}), RunMode::LevelDumpThenRecords);
  EXPECT_EQ(modeOf({"W"}), RunMode::PocketResultFile);
  EXPECT_EQ(modeOf({""}), RunMode::PocketResultFile);
  EXPECT_EQ(modeOf({"x"}), RunMode::PocketResultFile);
}

TEST(RunMode, TruncationTowardZeroIsDefinedForEveryFloat) {
  EXPECT_EQ(truncateToInt32(2.9f), 2);
  EXPECT_EQ(truncateToInt32(-2.9f), -2);
  EXPECT_EQ(truncateToInt32(30012.0f), 30012);
  EXPECT_EQ(truncateToInt32(1e30f), INT32_MAX);
  EXPECT_EQ(truncateToInt32(-1e30f), INT32_MIN);
  EXPECT_EQ(truncateToInt32(std::numeric_limits<float>::quiet_NaN()), 0);
  EXPECT_EQ(truncateToInt32(std::numeric_limits<float>::infinity()), INT32_MAX);
}

}  // namespace
}  // namespace pc
