#include <gtest/gtest.h>

#include <cmath>
#include <vector>

#include "pockets/contour_fixture.h"
#include "pockets/contour_geometry.h"

namespace pc {
namespace {

using test::Contours;

TEST(PointInContour, BoundaryFollowsTheToleranceRule) {
  Contours set;
  const ZContour& sq = *set.box(0, 0, 10, 10);
  // Top and left sides count as inside, bottom and right as outside; points
  // on the box edge go to the edge test.
  EXPECT_TRUE(pointInContour({5, 10}, sq));
  EXPECT_FALSE(pointInContour({5, 0}, sq));
  EXPECT_TRUE(pointInContour({0, 5}, sq));
  EXPECT_FALSE(pointInContour({10, 5}, sq));
  // Within the tolerance of a horizontal edge a point is taken as on it.
  EXPECT_TRUE(pointInContour({5, 9.99995f}, sq));
  EXPECT_FALSE(pointInContour({5, 0.00005f}, sq));
  EXPECT_TRUE(pointInContour({5, 0.0002f}, sq));
  EXPECT_FALSE(pointInContour({5, 10.00005f}, sq));
  EXPECT_FALSE(pointInContour({std::nanf(""), 5}, sq));
  // A ray through a vertex counts once.
  const ZContour& diamond = *set.add({{0, 5}, {5, 0}, {10, 5}, {5, 10}, {0, 5}});
  EXPECT_TRUE(pointInContour({2, 5}, diamond));
  EXPECT_FALSE(pointInContour({1, 9}, diamond));
  // Only stored edges count: no closing edge is added to an open run.
  EXPECT_FALSE(pointInContour({5, 5}, *set.add({{10, 10}, {0, 10}, {0, 0}, {10, 0}})));
}

TEST(ContourInContour, FiveVertexVoteWithTiesInside) {
  std::int32_t s[5];
  ASSERT_EQ(voteSamples(4, s), 3);
  EXPECT_EQ(s[2], 2);
  ASSERT_EQ(voteSamples(5, s), 4);
  EXPECT_EQ(s[3], 3);
  ASSERT_EQ(voteSamples(13, s), 5);
  EXPECT_EQ(std::vector<std::int32_t>(s, s + 5), (std::vector<std::int32_t>{0, 3, 6, 8, 11}));
  EXPECT_EQ(voteSamples(0, s), 0);

  Contours set;
  const ZContour& b = *set.box(0, 0, 10, 10);
  EXPECT_TRUE(contourInContour(*set.add({{2, 2}, {8, 2}, {20, 8}, {20, 2}, {2, 2}}), b));   // 2 of 4
  EXPECT_FALSE(contourInContour(*set.add({{2, 2}, {20, 2}, {20, 8}, {30, 8}, {2, 2}}), b));  // 1 of 4
  // Only the sampled vertices vote.
  std::vector<Point> many(13, Point{50, 50});
  for (int i : {0, 3, 6, 8, 11, 12}) many[i] = Point{5, 5};
  EXPECT_TRUE(contourInContour(*set.add(many), b));
  for (int i : {3, 6, 8}) many[i] = Point{50, 50};
  for (int i : {1, 2, 4, 5, 7, 9, 10}) many[i] = Point{5, 5};
  EXPECT_FALSE(contourInContour(*set.add(many), b));
}

TEST(ContourRelation, BoxesFirstThenVotesBothWays) {
  Contours set;
  const ZContour& big = *set.box(0, 0, 10, 10);
  const ZContour& small = *set.box(2, 2, 4, 4);
  EXPECT_EQ(contourRelation(small, big), 1);
  EXPECT_EQ(contourRelation(big, small), 2);
  // An identical copy votes with its boundary: only (0, 10) counts inside.
  EXPECT_EQ(contourRelation(*set.box(0, 0, 10, 10), big), 0);
  // Touching boxes go on to the vote: a sliver on the left side is inside.
  EXPECT_EQ(contourRelation(*set.add({{0, 2}, {0, 8}, {0, 5}, {0, 2}}), big), 1);
  // Apart boxes decide before any edge is looked at.
  ZContour fake = small;
  fake.xmin = 11;
  fake.xmax = 12;
  EXPECT_EQ(contourRelation(fake, big), 0);
  EXPECT_EQ(contourRelation(big, fake), 0);
}

TEST(Centroid, MeanOfAllStoredPointsSummedInDouble) {
  Contours set;
  const Point c = centroid(*set.box(0, 0, 10, 10));  // the closing point weighs twice
  EXPECT_EQ(c.x, 4.0f);
  EXPECT_EQ(c.y, 4.0f);
  // Summed in float the ones would be lost (6710886.5).
  EXPECT_EQ(centroid(*set.add({{16777216.0f, 0}, {1, 0}, {1, 0}, {1, 0}, {16777216.0f, 0}})).x, 6710887.0f);
}

bool interior(std::vector<ZContour*> region, Point& p) {
  std::vector<double> scratch;
  return regionInteriorPoint(region.data(), static_cast<std::int32_t>(region.size()), p, scratch);
}

void expectPoint(std::vector<ZContour*> region, float x, float y) {
  Point p;
  ASSERT_TRUE(interior(std::move(region), p));
  EXPECT_EQ(p.x, x);
  EXPECT_EQ(p.y, y);
}

TEST(RegionInteriorPoint, WidestSpanOfTheTwoProbes) {
  Contours set;
  // Spans 0..4 and 6..10 on both lines: the first span, the vertical probe.
  expectPoint({set.box(0, 0, 10, 10), set.box(4, 4, 6, 6)}, 5, 2);
  // x = 10 gives spans of 1; y = 2 gives 0..8, wider.
  expectPoint({set.box(0, 0, 20, 4), set.box(8, 1, 12, 3)}, 4, 2);
  // 1 + 16777216 is 16777216 in float: the vertical line runs along the
  // island's side (moved off it) instead of through the island.
  expectPoint({set.box(1, 0, 16777216.0f, 3e7f), set.box(8388608.0f, 1e7f, 8388609.0f, 10000002.0f)},
              8388608.0f, 1.5e7f);
  // Each open stroke crosses x = 5 once: the vertical probe fails although
  // the total is even, and the horizontal point is kept.
  expectPoint({set.box(0, 0, 10, 40), set.add({{4, 3}, {6, 4}}), set.add({{4, 7}, {6, 8}})}, 5, 20);
  Point p;
  EXPECT_FALSE(interior({set.add({{3, 3}, {3, 3}, {3, 3}, {3, 3}, {3, 3}})}, p));
  EXPECT_FALSE(interior({}, p));
}

TEST(RegionInteriorPoint, ThousandsOfCrossingsOnOneLine) {
  // A comb of 4001 teeth: y = 5 crosses 8002 edges; the last tooth, 3 wide,
  // is the widest span (x = 4002 runs through a gap and finds width 2).
  constexpr int kTeeth = 4001;
  std::vector<Point> comb{{0, 0}, {2.0f * kTeeth + 2, 0}};
  for (int i = kTeeth - 1; i >= 0; --i) {
    const float left = 2.0f * i + 0.5f;
    const float right = left + (i == kTeeth - 1 ? 3.0f : 1.0f);
    comb.insert(comb.end(), {{i == kTeeth - 1 ? right + 0.5f : right + 1.0f, 2}, {right, 2}, {right, 10}, {left, 10}, {left, 2}});
  }
  comb.insert(comb.end(), {{0, 2}, {0, 0}});
  Contours set;
  expectPoint({set.add(comb)}, 8002, 5);
}

}  // namespace
}  // namespace pc
