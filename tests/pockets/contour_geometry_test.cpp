#include <gtest/gtest.h>

#include <cmath>
#include <optional>
#include <utility>
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
  // A ray through a vertex, or within the tolerance above it, counts once.
  const ZContour& diamond = *set.add({{0, 5}, {5, 0}, {10, 5}, {5, 10}, {0, 5}});
  EXPECT_TRUE(pointInContour({2, 5}, diamond));
  EXPECT_TRUE(pointInContour({2, 5.00005f}, diamond));
  EXPECT_FALSE(pointInContour({1, 9}, diamond));
  // Only stored edges count: no closing edge is added to an open run.
  EXPECT_FALSE(pointInContour({5, 5}, *set.add({{10, 10}, {0, 10}, {0, 0}, {10, 0}})));
}

TEST(ContourInContour, FiveVertexVoteWithTiesInside) {
  using Samples = std::vector<std::int32_t>;
  for (const auto& [count, want] : std::vector<std::pair<std::int32_t, Samples>>{
           {0, {}}, {4, {0, 1, 2}}, {5, {0, 1, 2, 3}}, {13, {0, 3, 6, 8, 11}}}) {
    std::int32_t s[5];
    EXPECT_EQ(Samples(s, s + voteSamples(count, s)), want) << count;
  }
  Contours set;
  const ZContour& b = *set.box(0, 0, 10, 10);
  EXPECT_TRUE(contourInContour(*set.add({{2, 2}, {8, 2}, {20, 8}, {20, 2}, {2, 2}}), b));   // 2 of 4
  EXPECT_FALSE(contourInContour(*set.add({{2, 2}, {20, 2}, {20, 8}, {30, 8}, {2, 2}}), b));  // 1 of 4
  // Only the sampled vertices vote: 5 of 5 samples in, 6 of 13 points.
  std::vector<Point> many(13, Point{50, 50});
  for (int i : {0, 3, 6, 8, 11, 12}) many[i] = Point{5, 5};
  EXPECT_TRUE(contourInContour(*set.add(many), b));
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
  const ZContour fake{small.points, small.pointCount, 11, 12, small.ymin, small.ymax};
  EXPECT_EQ(contourRelation(fake, big), 0);
  EXPECT_EQ(contourRelation(big, fake), 0);
}

TEST(Centroid, MeanOfAllStoredPointsSummedInDouble) {
  Contours set;
  EXPECT_EQ(centroid(*set.box(0, 0, 10, 10)).y, 4.0f);  // the closing point weighs twice
  // Summed in float the ones would be lost (6710886.5).
  EXPECT_EQ(centroid(*set.add({{16777216.0f, 0}, {1, 0}, {1, 0}, {1, 0}, {16777216.0f, 0}})).x, 6710887.0f);
}

// The interior point of a region, if found.
std::optional<std::pair<float, float>> interior(std::vector<ZContour*> region) {
  std::vector<double> scratch;
  Point p;
  if (!regionInteriorPoint(region.data(), static_cast<std::int32_t>(region.size()), p, scratch)) return std::nullopt;
  return std::pair(p.x, p.y);
}

TEST(RegionInteriorPoint, WidestSpanOfTheTwoProbes) {
  Contours set;
  // Spans 0..4 and 6..10 on both lines: the first span, the vertical probe.
  EXPECT_EQ(interior({set.box(0, 0, 10, 10), set.box(4, 4, 6, 6)}), std::pair(5.0f, 2.0f));
  // An island side within the tolerance of x = 5 is not crossed there.
  EXPECT_EQ(interior({set.box(0, 0, 10, 10), set.box(4.99995f, 2, 6, 8)}), std::pair(5.0f, 5.0f));
  // x = 10 gives 0..4; y = 2 gives 0..5 and the wider 9..20.
  EXPECT_EQ(interior({set.box(0, 0, 20, 4), set.box(5, 1, 9, 3)}), std::pair(14.5f, 2.0f));
  // 1 + 16777216 is 16777216 in float: the vertical line runs along the
  // island's side (moved off it) instead of through the island.
  EXPECT_EQ(interior({set.box(1, 0, 16777216.0f, 3e7f), set.box(8388608.0f, 1e7f, 8388609.0f, 10000002.0f)}),
            std::pair(8388608.0f, 1.5e7f));
  // Each open stroke crosses x = 5 once: the vertical probe fails although
  // the total is even, and the horizontal point is kept.
  EXPECT_EQ(interior({set.box(0, 0, 10, 40), set.add({{4, 3}, {6, 4}}), set.add({{4, 7}, {6, 8}})}),
            std::pair(5.0f, 20.0f));
  EXPECT_EQ(interior({set.add({{3, 3}, {3, 3}, {3, 3}, {3, 3}, {3, 3}})}), std::nullopt);
  EXPECT_EQ(interior({}), std::nullopt);
}

}  // namespace
}  // namespace pc
