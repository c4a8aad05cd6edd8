// Level trees and the pockets built over them.
#include <gtest/gtest.h>

#include <vector>

#include "pockets/contour_fixture.h"
#include "pockets/node_geometry.h"
#include "pockets/pocket_model.h"

namespace pc {
namespace {

using test::Contours;
using test::contoursOf;
using test::groupLevels;
using List = std::vector<ZContour*>;

List outerContours(ZLevel& level) {
  CheckedArray<ContourNode*>& outer = outerNodes(level);
  List out;
  for (std::int32_t i = 0; i < outer.count; ++i) out.push_back(outer.data[i]->contour);
  return out;
}

TEST(LevelTree, EnclosingContourAdoptsRelatedSiblingsAndPushesOthersBehind) {
  Contours set;
  ZContour* before = set.box(30, 0, 31, 1);
  ZContour* s1 = set.box(1, 1, 2, 2);
  ZContour* far1 = set.box(50, 50, 60, 60);
  ZContour* s2 = set.box(3, 3, 4, 4);
  ZContour* far2 = set.box(70, 0, 80, 10);
  ZContour* big = set.box(0, 0, 10, 10);
  ZLevel level;
  for (ZContour* x : {before, s1, far1, s2, far2, big}) addContourToLevel(level, x);
  // Siblings before the enclosed one stay; apart ones move behind the new
  // node in their order and keep their parent.
  EXPECT_EQ(contoursOf(level.root), (List{before, big, far1, far2}));
  // A contour around them all takes the whole chain; the next one goes down
  // two levels to the end of a chain.
  ZContour* out = set.box(-100, -100, 100, 100);
  ZContour* s3 = set.box(5, 5, 6, 6);
  addContourToLevel(level, out);
  addContourToLevel(level, s3);
  EXPECT_EQ(contoursOf(level.root), List{out});
  const ContourNode* first = level.root->firstChild;
  EXPECT_EQ(contoursOf(first), (List{before, big, far1, far2}));
  for (const ContourNode* n = first; n != nullptr; n = n->nextSibling) EXPECT_EQ(n->parent, level.root);
  EXPECT_EQ(contoursOf(first->nextSibling->firstChild), (List{s1, s2, s3}));
  EXPECT_EQ(first->nextSibling->firstChild->nextSibling->nextSibling->parent, first->nextSibling);
  EXPECT_EQ(nodeCount(level), 8);
}

TEST(LevelTree, DeepNestingNeedsNoRecursion) {
  // 100,000 concentric squares, innermost first: each one encloses the tree.
  constexpr int kCount = 100000;
  Contours set;
  List in;
  ZLevel level;
  for (int k = 0; k < kCount; ++k) {
    const float r = static_cast<float>(k + 1);
    in.push_back(set.box(-r, -r, r, r));
    addContourToLevel(level, in.back());
  }
  EXPECT_EQ(nodeCount(level), kCount);
  const List outer = outerContours(level);
  ASSERT_EQ(outer.size(), std::size_t{kCount / 2});
  EXPECT_EQ(outer[1], in[kCount - 3]);
  EXPECT_EQ(outer.back(), in[1]);
  EXPECT_EQ(outerNodes(level).count, kCount / 2);  // refilled, not extended
  EXPECT_EQ(deepestNodeHolding(level, {0.5f, 0.5f})->contour, in[0]);
  PocketForest forest;
  EXPECT_EQ(buildPockets(forest, &level, 1), 0);
  EXPECT_EQ(pocketCount(forest), kCount / 2);
}

TEST(BuildPockets, RootsReachedByChainsComeFirstThenTheOthersInOuterOrder) {
  Contours set;
  ZContour* a = set.box(0, 0, 10, 10, 2);
  ZContour* b = set.box(20, 0, 30, 10, 2);
  ZContour* island = set.box(22, 2, 28, 8, 2);
  ZContour* inner = set.box(24, 4, 26, 6, 2);
  ZContour* c = set.box(40, 0, 50, 10, 2);
  ZContour* flat = set.add({{60, 5}, {60, 5}, {60, 5}}, 2);  // level 0 needs no interior point
  ZContour* nowhere = set.box(100, 0, 110, 10, 1);
  ZContour* onIsland = set.box(23, 6.5f, 27, 7.5f, 1);  // its point (25, 7) is on the island
  // The region below c has an island: its point is (42.5, 5), off c's island.
  std::vector<ZLevel> levels = groupLevels({a, b, island, inner, c, set.box(44, 4, 46, 6, 2), flat,
                                            set.box(41, 1, 49, 9, 1), set.box(44, 3, 46, 7, 1),
                                            set.box(1, 1, 9, 9, 1), nowhere, onIsland});
  PocketForest forest;
  EXPECT_EQ(buildPockets(forest, levels.data(), 2), 0);
  EXPECT_EQ(contoursOf(forest.firstRoot), (List{c, a, island, b, inner, flat}));
  EXPECT_EQ(pocketCount(forest), 9);
  EXPECT_EQ(levels[0].root->pocket, forest.firstRoot->nextSibling);
  // The island reached by a chain is the outer of its pocket, with the
  // outer inside it as its island.
  const Pocket& islandPocket = *forest.firstRoot->nextSibling->nextSibling;
  EXPECT_EQ(contoursOf(islandPocket.firstChild), List{onIsland});
  CheckedArray<Point> outline(100, 100);
  float z = 0;
  EXPECT_EQ(collectPocketOutline(islandPocket, outline, z), 2);
  EXPECT_EQ(outline.count, 12);
  EXPECT_EQ(outline.at(7).x, 24.0f);  // after the separator closing the island
  // A region whose point lies in no contour above gets no pocket.
  const ContourNode* last = levels[1].root->nextSibling->nextSibling;
  ASSERT_EQ(last->contour, nowhere);
  EXPECT_EQ(last->pocket, nullptr);
  EXPECT_TRUE(last->taken);
}

TEST(BuildPockets, ChainsHangUnderTheRegionsAboveAndGoOnPastARegionWithoutInteriorPoint) {
  Contours set;
  ZContour* a = set.box(0, 0, 10, 10, 3);
  ZContour* b = set.box(20, 0, 30, 10, 3);
  ZContour* mid = set.box(0, 0, 10, 10, 2);
  ZContour* flat = set.add({{2, 2}, {2, 2}, {2, 2}}, 1);  // no interior point
  ZContour* low1 = set.box(6, 6, 9, 9, 1);
  ZContour* low2 = set.box(1, 6, 4, 9, 1);
  PocketForest forest;  // released after the levels, as at the end of a run
  std::vector<ZLevel> levels = groupLevels({a, b, mid, flat, low1, low2});
  EXPECT_EQ(buildPockets(forest, levels.data(), 3), -1);
  // The other regions are chained and the level-0 pass still runs.
  EXPECT_EQ(contoursOf(forest.firstRoot), (List{a, b}));
  Pocket* middle = forest.firstRoot->firstChild;
  EXPECT_EQ(contoursOf(middle), List{mid});
  EXPECT_EQ(middle->parent, forest.firstRoot);
  // The second chain ended on the middle pocket made by the first.
  EXPECT_EQ(contoursOf(middle->firstChild), (List{low1, low2}));
  EXPECT_EQ(middle->firstChild->nextSibling->parent, middle);
  EXPECT_EQ(middle->lastChild, nullptr);
  EXPECT_EQ(pocketCount(forest), 5);
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
  EXPECT_EQ(contoursOf(forest.firstRoot), List{right});
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
  for (Pocket* p = forest.firstRoot; p != nullptr; p = p->firstChild) ASSERT_EQ(p->node, levels[depth++].root);
  EXPECT_EQ(depth, kLevels);
}

}  // namespace
}  // namespace pc
