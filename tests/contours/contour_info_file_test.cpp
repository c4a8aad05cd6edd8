#include "contours/contour_info_file.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <limits>
#include <string>

#include "contours/contour_test_files.h"
#include "env/path_expander.h"
#include "fileio/record_runtime.h"

namespace pc {
namespace {

using test::kSep;
using test::writeContourInfo;

constexpr float kNaN = std::numeric_limits<float>::quiet_NaN();
constexpr float kInf = std::numeric_limits<float>::infinity();

std::string counts() {
  const ContourCounts c = countContourInfoFile();
  return std::to_string(c.nz) + " " + std::to_string(c.np) + " " + std::to_string(c.nc);
}

TEST(ContourInfoFile, CountsPointsSeparatorsAndZChanges) {
  for (const auto& [z2, expected] : {std::pair{10.0f, "1 8 2"}, {10.00005f, "1 8 2"}, {10.001f, "2 8 2"}}) {
    writeContourInfo({{0, 0, 10}, {1, 0, 10}, {1, 1, 10}, {kSep, kSep, kSep},
                      {0, 0, z2}, {1, 0, z2}, {1, 1, z2}, {kSep, kSep, kSep}});
    EXPECT_EQ(counts(), expected) << z2;
  }
  // Changes along the file against the last counted Z, not distinct values.
  writeContourInfo({{0, 0, 10}, {0, 0, 20}, {0, 0, 10}, {0, 0, 10.00008f}, {0, 0, 10.00016f}});
  EXPECT_EQ(counts(), "4 5 0");
}

TEST(ContourInfoFile, SeparatorsByMagnitudeNaNAndInfinity) {
  writeContourInfo({{10, 20, 90000.0f}, {-95000.0f, 0, 5}, {0, 0, -90000.0f}, {kNaN, 0, 0}, {0, kNaN, 0},
                    {0, 0, kNaN}, {kInf, 0, 0}, {0, 0, -kInf}});
  EXPECT_EQ(counts(), "0 8 8");
  writeContourInfo({{10, 20, 89999.99f}, {-89999.99f, 89999.99f, 5}});
  EXPECT_EQ(counts(), "2 2 0");
}

TEST(ContourInfoFile, EmptyMissingAndDamagedFiles) {
  writeContourInfo({});
  int unit = 0;
  ASSERT_EQ(openContourInfoFile(unit), 0);
  EXPECT_GE(unit, 3);
  float x = 1, y = 2, z = 3;
  EXPECT_EQ(readContourRecord(unit, x, y, z), 1);
  closeContourInfoFile(unit);
  EXPECT_FALSE(fileio::isUnitOpen(unit));
  EXPECT_EQ(counts(), "0 0 0");

  std::remove(test::contourInfoPath().c_str());
  EXPECT_EQ(openContourInfoFile(unit), EXPAND_NOT_FOUND);
  EXPECT_FALSE(fileio::isUnitOpen(unit));
  EXPECT_EQ(counts(), "0 0 0");

  // A longer record gives its first three floats; a shorter one, or a file
  // cut inside a record, ends the reading there.
  std::string longData, shortData;
  for (float v : {1.0f, 2.0f, 3.0f, 4.0f}) test::putFloat(longData, v);
  for (float v : {7.0f, 8.0f}) test::putFloat(shortData, v);
  const std::string point = test::contourInfoBytes({{5, 6, 7}});
  test::writeFile(test::contourInfoPath(), test::framedRecord(longData) + test::framedRecord(shortData) + point);
  ASSERT_EQ(openContourInfoFile(unit), 0);
  ASSERT_EQ(readContourRecord(unit, x, y, z), 0);
  EXPECT_EQ(std::to_string(x) + std::to_string(y) + std::to_string(z), "1.0000002.0000003.000000");
  EXPECT_EQ(readContourRecord(unit, x, y, z), 1);
  closeContourInfoFile(unit);
  EXPECT_EQ(counts(), "1 1 0");
  test::writeFile(test::contourInfoPath(), test::contourInfoBytes({{0, 0, 1}, {kSep, kSep, kSep}}) + point.substr(0, 9));
  EXPECT_EQ(counts(), "1 2 1");
}

}  // namespace
}  // namespace pc
