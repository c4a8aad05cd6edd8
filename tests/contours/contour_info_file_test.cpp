// The two passes over the contour information file: counting and loading.
#include "contours/contour_info_file.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <sstream>
#include <string>
#include <tuple>
#include <vector>

#include "contours/point_loader.h"
#include "env/path_expander.h"
#include "fileio/sequential_open.h"
#include "support/test_support.h"

namespace pc {
namespace {

using test::contourInfoBytes;
const std::vector<float> S{99999, 99999, 99999}, P1{1, 1, 5}, P2{2, 1, 5}, P3{3, 3, 6}, P4{4, 3, 6};

// $TMP is resolved once per process, so every test shares one directory.
std::string infoPath() {
  static test::TempDir dir;
  static test::ScopedEnv tmp("TRXTMPDIR", dir.path());
  return dir.file("trxcon.inf");
}

std::string counts() {
  const ContourCounts c = countContourInfoFile();
  return std::to_string(c.nz) + " " + std::to_string(c.np) + " " + std::to_string(c.nc);
}

// The stored entries as "x y z|x y z...".
std::string load(std::int32_t capacity = 64, double tolerance = 1e-10) {
  std::vector<Point> points(static_cast<std::size_t>(std::max(capacity, 1)));
  std::vector<float> zs(points.size());
  const std::int32_t n = loadContourPoints(points.data(), zs.data(), capacity, tolerance);
  std::ostringstream out;
  out.precision(9);
  for (std::int32_t i = 0; i < n; ++i) out << (i > 0 ? "|" : "") << points[i].x << ' ' << points[i].y << ' ' << zs[i];
  return out.str();
}

TEST(ContourInfoFile, CountedAndLoaded) {
  std::string longData;  // a longer record gives its first three floats
  for (float v : {1.0f, 2.0f, 3.0f, 4.0f}) test::putFloat(longData, v);
  const std::string sep = "99999 99999 99999";
  const std::tuple<std::string, const char*, std::string> cases[] = {
      // Duplicates are dropped, separator runs become one entry, leading and
      // trailing separators go.
      {contourInfoBytes({S, S, P1, P2, S, {95000, 0, 0}, S, P3, P4, S}), "2 10 6", "1 1 5|2 1 5|" + sep + "|3 3 6|4 3 6"},
      {contourInfoBytes({{0, 0, 0}, {0, 0, 0}, {1e-11f, 0, 0}, {0.5f, 0, 0}}), "1 4 0", "0 0 0|0.5 0 0"},
      // Z changes are counted against the last counted Z, not as distinct
      // values. Z is tested only at the first point of a contour; the first
      // point after a separator is never compared with the one before.
      {contourInfoBytes({{0, 0, 10}, {0, 0, 20}, {0, 0, 10}, {0, 0, 10.00008f}, {0, 0, 10.00016f}}), "4 5 0", "0 0 10"},
      {contourInfoBytes({P1, {7, 7, 95000}, S, {8, 8, 95000}, P1}), "1 5 3", "1 1 5|7 7 95000|" + sep + "|1 1 5"},
      // NaN and infinity are separators (inside a contour Z is not tested).
      {contourInfoBytes({{NAN, 0, 0}, P1, P2, {0, NAN, 0}, {1, 1, NAN}, {-INFINITY, 0, 0}, P3, {5, 5, NAN}}), "2 8 5",
       "1 1 5|2 1 5|" + sep + "|3 3 6|5 5 nan"},
      // Points lie below 90000 in magnitude.
      {contourInfoBytes({{10, 20, 89999.99f}, {-89999.99f, 89999.99f, 5}, {10, 20, 90000.0f}, {-95000.0f, 0, 5},
                         {0, 0, -90000.0f}, {0, 0, NAN}, {90000.0f, 0, 0}}),
       "2 7 5", "10 20 89999.9922|-89999.9922 89999.9922 5|10 20 90000"},
      {"", "0 0 0", ""},
      {contourInfoBytes({S, S, P2}), "1 3 2", "2 1 5"},  // the only point is the last record
      // A shorter record, or a file cut inside a record, ends the reading.
      {test::framedRecord(longData) + contourInfoBytes({P2, S, P3}) + test::framedRecord("short") +
           contourInfoBytes({P4}), "3 4 1", "1 2 3|2 1 5|" + sep + "|3 3 6"},
      {contourInfoBytes({{0, 0, 1}, S}) + contourInfoBytes({P1}).substr(0, 9), "1 2 1", "0 0 1"},
  };
  for (const auto& [bytes, expectedCounts, expectedEntries] : cases) {
    test::writeFile(infoPath(), bytes);
    EXPECT_EQ(counts(), expectedCounts) << expectedEntries;
    EXPECT_EQ(load(), expectedEntries) << expectedCounts;
    EXPECT_EQ(fileio::freeUnit(), 3);  // both passes close the file again
  }
}

TEST(ContourInfoFile, CapacityToleranceAndMissingFile) {
  test::writeFile(infoPath(), contourInfoBytes({P1, P2, S, P3}));
  EXPECT_EQ(load(3), "");  // the separator fits at index 2, the point does not
  EXPECT_EQ(load(4), "1 1 5|2 1 5|99999 99999 99999|3 3 6");
  test::writeFile(infoPath(), contourInfoBytes({P1, P2, P3, S}));
  EXPECT_EQ(load(2), "");
  EXPECT_EQ(load(3), "1 1 5|2 1 5|3 3 6");  // a trailing separator needs no room
  test::writeFile(infoPath(), contourInfoBytes({{1, 0, 0}, {std::nextafter(1.0f, 2.0f), 0, 0}}));
  EXPECT_EQ(load(64, 1e-10), "1 0 0|1.00000012 0 0");
  EXPECT_EQ(load(64, 1e-6), "1 0 0");
  EXPECT_EQ(load(0, 1e-6), "");
  EXPECT_EQ(loadContourPoints(nullptr, nullptr, 1, 1e-10), 0);

  std::remove(infoPath().c_str());
  int unit = 0;
  EXPECT_EQ(openContourInfoFile(unit), EXPAND_NOT_FOUND);
  EXPECT_EQ(counts(), "0 0 0");
  EXPECT_EQ(load(), "");
  EXPECT_EQ(fileio::freeUnit(), 3);
}

}  // namespace
}  // namespace pc
