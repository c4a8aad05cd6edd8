#include "contours/point_loader.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdio>
#include <limits>
#include <vector>

#include "contours/contour_test_files.h"

namespace pc {
namespace {

using test::kSep;
using test::writeContourInfo;
using Records = std::vector<std::vector<float>>;

struct Loaded {
  std::int32_t n = 0;
  std::vector<Point> points;
  std::vector<float> zs;
  Records entries() const {  // the stored entries as (x, y, z)
    Records out;
    for (std::int32_t i = 0; i < n; ++i) out.push_back({points[i].x, points[i].y, zs[i]});
    return out;
  }
};

Loaded load(std::int32_t capacity = 64, double tolerance = 1e-10) {
  Loaded r;
  r.points.assign(static_cast<std::size_t>(capacity), Point{-1.0f, -1.0f});
  r.zs.assign(r.points.size(), -1.0f);
  r.n = loadContourPoints(r.points.data(), r.zs.data(), capacity, tolerance);
  return r;
}

const std::vector<float> P1{1, 1, 5}, P2{2, 1, 5}, P3{3, 3, 6}, P4{4, 3, 6}, S{kSep, kSep, kSep};

TEST(PointLoader, DropsDuplicatesAndCollapsesSeparators) {
  writeContourInfo({P1, P1, P2});
  EXPECT_EQ(load().entries(), (Records{P1, P2}));
  writeContourInfo({S, S, P1, P2, S, {95000, 0, 0}, S, P3, P4, S});
  EXPECT_EQ(load().entries(), (Records{P1, P2, S, P3, P4}));
  // Z is tested only for the first point of a contour; the first point after
  // a separator is never compared with the one before.
  writeContourInfo({P1, {7, 7, 95000}, S, {8, 8, 95000}, P1});
  EXPECT_EQ(load().entries(), (Records{P1, {7, 7, 95000}, S, P1}));
}

TEST(PointLoader, DuplicateTolerance) {
  writeContourInfo({{0, 0, 0}, {1e-11f, 0, 0}, {1e-6f, 0, 0}});
  EXPECT_EQ(load().entries(), (Records{{0, 0, 0}, {1e-6f, 0, 0}}));
  writeContourInfo({{1, 0, 0}, {std::nextafter(1.0f, 2.0f), 0, 0}});
  EXPECT_EQ(load().n, 2);
  EXPECT_EQ(load(64, 1e-6).n, 1);
}

TEST(PointLoader, NaNAndInfinityAreSeparators) {
  const float nan = std::numeric_limits<float>::quiet_NaN();
  const float inf = std::numeric_limits<float>::infinity();
  writeContourInfo({{nan, 0, 0}, P1, P2, {0, nan, 0}, {1, 1, nan}, {-inf, 0, 0}, P3, {5, 5, nan}});
  const Loaded r = load();
  ASSERT_EQ(r.n, 5);
  const Records stored = r.entries();
  EXPECT_EQ(Records(stored.begin(), stored.begin() + 4), (Records{P1, P2, S, P3}));
  EXPECT_EQ(r.points[4].x, 5.0f);  // inside a contour Z is not tested: kept with its NaN
  EXPECT_TRUE(std::isnan(r.zs[4]));
}

TEST(PointLoader, NothingUsableGivesZero) {
  for (const Records& file : {Records{}, Records{S, S, {1, 1, 90000}}}) {
    writeContourInfo(file);
    EXPECT_EQ(load().n, 0);
  }
  std::remove(test::contourInfoPath().c_str());
  EXPECT_EQ(load().n, 0);
  writeContourInfo({S, S, P2});  // the only point is the last record
  EXPECT_EQ(load().entries(), (Records{P2}));
  std::vector<float> zs(4);
  std::vector<Point> points(4);
  EXPECT_EQ(loadContourPoints(nullptr, zs.data(), 4, 1e-10), 0);
  EXPECT_EQ(loadContourPoints(points.data(), nullptr, 4, 1e-10), 0);
  EXPECT_EQ(loadContourPoints(points.data(), zs.data(), 0, 1e-10), 0);
}

TEST(PointLoader, CapacityAndReadErrors) {
  writeContourInfo({P1, P2, S, P3});
  EXPECT_EQ(load(3).n, 0);  // the separator fits at index 2, the point does not
  EXPECT_EQ(load(4).n, 4);
  writeContourInfo({P1, P2, P3, S});
  EXPECT_EQ(load(2).n, 0);
  EXPECT_EQ(load(3).n, 3);  // a trailing separator needs no room
  // A damaged record ends the loading with what was stored.
  test::writeFile(test::contourInfoPath(),
                  test::contourInfoBytes({P1, P2, S, P3}) + test::framedRecord("short") + test::contourInfoBytes({P4}));
  EXPECT_EQ(load().n, 4);
}

}  // namespace
}  // namespace pc
