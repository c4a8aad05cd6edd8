#include <gtest/gtest.h>

#include <vector>

#include "pockets/contour_fixture.h"
#include "pockets/pocket_model.h"

namespace pc {
namespace {

using test::chainOf;
using test::Contours;
using test::contoursOf;
using test::groupLevels;
using List = std::vector<ZContour*>;

// A contour whose points all coincide: its region has no interior point.
ZContour* collapsed(Contours& set, float x, float y, float z) {
  return set.add({{x, y}, {x, y}, {x, y}, {x, y}, {x, y}}, z);
}

TEST(BuildPockets, SingleLevelMakesEveryOuterARootWithoutInteriorPoints) {
  Contours set;
  ZContour* a = set.box(0, 0, 10, 10);
  ZContour* inner = set.box(3, 3, 7, 7);
  ZContour* flat = collapsed(set, 50, 50, 0);
  std::vector<ZLevel> levels = groupLevels({a, set.box(2, 2, 8, 8), inner, flat});
  PocketForest forest;
  EXPECT_EQ(buildPockets(forest, levels.data(), 1), 0);
  EXPECT_EQ(contoursOf(chainOf(forest.firstRoot)), (List{a, inner, flat}));
  EXPECT_EQ(pocketCount(forest), 3);
  EXPECT_EQ(levels[0].root->pocket, forest.firstRoot);
  EXPECT_EQ(levels[0].root->firstChild->pocket, nullptr);  // an island
}

TEST(BuildPockets, ChainsHangDeeperRegionsUnderTheRegionsAbove) {
  Contours set;
  ZContour* top = set.box(0, 0, 100, 100, 5);
  ZContour* mid = set.box(0, 0, 100, 100, 4);
  ZContour* low1 = set.box(10, 10, 20, 20, 3);
  ZContour* low2 = set.box(30, 30, 40, 40, 3);
  PocketForest forest;  // released after the levels, as at the end of a run
  std::vector<ZLevel> levels = groupLevels({top, mid, low1, low2});
  EXPECT_EQ(buildPockets(forest, levels.data(), 3), 0);
  EXPECT_EQ(contoursOf(chainOf(forest.firstRoot)), List{top});
  Pocket* middle = forest.firstRoot->firstChild;
  EXPECT_EQ(contoursOf(chainOf(middle)), List{mid});
  EXPECT_EQ(middle->parent, forest.firstRoot);
  // The second chain ended on the middle pocket made by the first.
  EXPECT_EQ(contoursOf(chainOf(middle->firstChild)), (List{low1, low2}));
  EXPECT_EQ(middle->firstChild->nextSibling->parent, middle);
  EXPECT_EQ(middle->lastChild, nullptr);
  EXPECT_EQ(pocketCount(forest), 4);
}

TEST(BuildPockets, RootsReachedByChainsComeFirstThenTheOthersInOuterOrder) {
  Contours set;
  ZContour* a = set.box(0, 0, 10, 10, 2);
  ZContour* b = set.box(20, 0, 30, 10, 2);
  ZContour* c = set.box(40, 0, 50, 10, 2);
  ZContour* nowhere = set.box(100, 0, 110, 10, 1);
  std::vector<ZLevel> levels = groupLevels({a, b, c, set.box(41, 1, 49, 9, 1), set.box(1, 1, 9, 9, 1), nowhere});
  PocketForest forest;
  EXPECT_EQ(buildPockets(forest, levels.data(), 2), 0);
  EXPECT_EQ(contoursOf(chainOf(forest.firstRoot)), (List{c, a, b}));
  EXPECT_EQ(pocketCount(forest), 5);
  // A region whose point lies in no contour above gets no pocket.
  const ContourNode* last = levels[1].root->nextSibling->nextSibling;
  ASSERT_EQ(last->contour, nowhere);
  EXPECT_EQ(last->pocket, nullptr);
  EXPECT_TRUE(last->taken);
}

TEST(BuildPockets, IslandReachedByAChainBecomesTheOuterOfItsPocket) {
  Contours set;
  ZContour* outer = set.box(0, 0, 100, 100, 2);
  ZContour* island = set.box(10, 10, 90, 90, 2);
  ZContour* insideIsland = set.box(12, 12, 18, 18, 2);
  ZContour* below = set.box(20, 20, 80, 80, 1);
  std::vector<ZLevel> levels = groupLevels({outer, island, insideIsland, below});
  PocketForest forest;
  EXPECT_EQ(buildPockets(forest, levels.data(), 2), 0);
  // The outer region and the one inside the island were reached by no chain.
  std::vector<Pocket*> roots = chainOf(forest.firstRoot);
  ASSERT_EQ(contoursOf(roots), (List{island, outer, insideIsland}));
  EXPECT_EQ(contoursOf(chainOf(roots[0]->firstChild)), List{below});
  CheckedArray<Point> outline(50000, 10000);
  float z = 0;
  EXPECT_EQ(collectPocketOutline(*roots[0], outline, z), 2);
  EXPECT_EQ(outline.at(7).x, 12.0f);
}

TEST(BuildPockets, RegionWithoutInteriorPointIsSkippedAndBuildingGoesOn) {
  Contours set;
  ZContour* a = set.box(0, 0, 10, 10, 3);
  ZContour* b = set.box(20, 0, 30, 10, 3);
  ZContour* flat = collapsed(set, 2, 2, 1);
  ZContour* low = set.box(6, 6, 9, 9, 1);
  std::vector<ZLevel> levels = groupLevels({a, b, set.box(0, 0, 10, 10, 2), flat, low});
  PocketForest forest;
  EXPECT_EQ(buildPockets(forest, levels.data(), 3), -1);
  // The next region is chained and the level-0 pass still runs.
  EXPECT_EQ(contoursOf(chainOf(forest.firstRoot)), (List{a, b}));
  EXPECT_EQ(forest.firstRoot->firstChild->firstChild->node->contour, low);
  EXPECT_EQ(pocketCount(forest), 4);
  ASSERT_EQ(levels[2].root->contour, flat);
  EXPECT_TRUE(levels[2].root->taken);
  EXPECT_EQ(levels[2].root->pocket, nullptr);
}

TEST(BuildPockets, ChainLandingOnADroppedRegionIsDroppedToo) {
  Contours set;
  ZContour* right = set.box(5, 0, 10, 10, 3);
  ZContour* left = set.box(1, 1, 3, 3, 1);   // its point (2, 2) misses level 0
  ZContour* upper = set.box(6, 6, 9, 9, 1);  // its point lands on the dropped middle
  std::vector<ZLevel> levels = groupLevels({right, set.box(0, 0, 10, 10, 2), left, upper});
  PocketForest forest;
  EXPECT_EQ(buildPockets(forest, levels.data(), 3), 0);
  EXPECT_EQ(contoursOf(chainOf(forest.firstRoot)), List{right});
  EXPECT_EQ(pocketCount(forest), 1);
  for (const ContourNode* n : {levels[1].root, levels[2].root, levels[2].root->nextSibling}) {
    EXPECT_TRUE(n->taken);
    EXPECT_EQ(n->pocket, nullptr);
  }
  EXPECT_EQ(buildPockets(forest, levels.data(), 3), 0);  // nothing is taken twice
  EXPECT_EQ(pocketCount(forest), 1);
}

TEST(BuildPockets, TenThousandLevelsMakeOneDeepZone) {
  constexpr int kLevels = 10000;
  Contours set;
  std::vector<ZLevel> levels(kLevels);
  for (int i = 0; i < kLevels; ++i) addContourToLevel(levels[i], set.box(0, 0, 10, 10, static_cast<float>(-i)));
  PocketForest forest;
  EXPECT_EQ(buildPockets(forest, levels.data(), kLevels), 0);
  EXPECT_EQ(pocketCount(forest), kLevels);
  int depth = 0;
  for (Pocket* p = forest.firstRoot; p != nullptr; p = p->firstChild, ++depth) {
    ASSERT_EQ(p->node, levels[depth].root);
    ASSERT_EQ(p->nextSibling, nullptr);
  }
  EXPECT_EQ(depth, kLevels);
}

}  // namespace
}  // namespace pc
