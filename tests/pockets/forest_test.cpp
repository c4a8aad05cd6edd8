// Orderings and the width filter over hand-built forests.
#include <gtest/gtest.h>

#include <utility>
#include <vector>

#include "pockets/contour_fixture.h"
#include "pockets/level_order.h"
#include "pockets/width_filter.h"
#include "pockets/zone_order.h"

namespace pc {
namespace {

using test::chainOf;
using test::listOf;
using List = std::vector<Pocket*>;

// Pockets over contours with the given vertex means.
struct Row {
  test::Contours set;
  test::HandForest hand;
  List add(Pocket* parent, std::vector<Point> centres, float z = 0.0f) {
    List out;
    // The closing point weighs twice in the vertex mean (c.x, c.y).
    for (Point c : centres) {
      out.push_back(hand.add(parent, set.add({c, {c.x + 1, c.y - 1}, {c.x, c.y + 2}, {c.x - 1, c.y - 1}, c}, z)));
    }
    return out;
  }
  List order(List list) {
    EXPECT_EQ(nearestNeighbourOrder(hand.forest, list.data(), static_cast<std::int32_t>(list.size())), 0);
    return list;
  }
};

TEST(NearestNeighbourOrder, LeftmostFirstThenNearestWithTiesToTheLowerIndex) {
  Row row;
  List p = row.add(nullptr, {{10, 0}, {0, 5}, {1, 5}});
  EXPECT_EQ(row.order(p), (List{p[1], p[2], p[0]}));
  // Equal smallest x: the earlier one starts.
  List q = row.add(nullptr, {{0, 10}, {5, 0}, {0, 0}});
  EXPECT_EQ(row.order(q), (List{q[0], q[2], q[1]}));
  // Equal distances: the lower index after the swaps made so far wins (the
  // fourth moved to index 1 sent the second to index 3, behind the third).
  List r = row.add(nullptr, {{0, 0}, {0, 10}, {0, -10}, {1, 0}});
  EXPECT_EQ(row.order(r), (List{r[0], r[3], r[2], r[1]}));
  List t = row.add(nullptr, {{0, 0}, {4, 3}, {3, 4}});  // both 25 away
  EXPECT_EQ(row.order(t), t);
  EXPECT_EQ(row.order({p[0], p[1]}), (List{p[0], p[1]}));
}

TEST(Orderings, LevelsOrderedOnTheirOwnZonesReorderedInTheForestAndListedWhole) {
  Row row;
  List roots = row.add(nullptr, {{100, 0}, {0, 0}, {50, 0}}, 3);
  List kids = row.add(roots[0], {{10, 0}, {0, 5}, {1, 5}}, 2);
  List sub0 = row.add(kids[0], {{10, 1}}, 1);
  List sub1 = row.add(kids[1], {{0, 6}}, 1);
  List pair = row.add(kids[2], {{5, 5}, {-5, 5}}, 1);
  List other = row.add(roots[1], {{3, 3}}, 2);
  CheckedArray<Pocket*> result(1, 1000);
  // Breadth first, each level a path of its own; the forest is not changed.
  EXPECT_EQ(levelOrder(row.hand.forest, result), 11);
  EXPECT_EQ(listOf(result), (List{roots[1], roots[2], roots[0], kids[1], kids[2], other[0], kids[0], pair[1],
                                  sub1[0], pair[0], sub0[0]}));
  EXPECT_EQ(chainOf(row.hand.forest.firstRoot), roots);
  // Each zone whole, depth first, its chains reordered in place (the pair
  // keeps its order).
  EXPECT_EQ(zoneOrder(row.hand.forest, result), 11);
  EXPECT_EQ(listOf(result), (List{roots[1], other[0], roots[2], roots[0], kids[1], sub1[0], kids[2], pair[0],
                                  pair[1], kids[0], sub0[0]}));
  EXPECT_EQ(chainOf(row.hand.forest.firstRoot), (List{roots[1], roots[2], roots[0]}));
  EXPECT_EQ(chainOf(roots[0]->firstChild), (List{kids[1], kids[2], kids[0]}));
  PocketForest empty;
  EXPECT_EQ(levelOrder(empty, result), 0);
  EXPECT_EQ(result.count, 0);
  EXPECT_EQ(zoneOrder(empty, result), 0);
}

TEST(WidthFilter, NarrowPocketsLeaveWithEverythingUnderThem) {
  test::Contours set;
  ZContour* wide = set.box(0, 0, 50, 50);
  ZContour* narrow = set.box(0, 0, 5, 5);
  // Inclusive on both extents, each taken on its own, in double: 0.3f - 0.1f
  // is 0.2000000179 in float.
  EXPECT_TRUE(fitsWithin(*set.box(0, 0, 10, 10), 10.0));
  EXPECT_FALSE(fitsWithin(*set.box(0, 0, 1, 100), 99.9));
  EXPECT_FALSE(fitsWithin(*set.box(0, 0, 100, 1), 99.9));
  EXPECT_TRUE(fitsWithin(*set.box(0.1f, 0, 0.3f, 0.1f), static_cast<double>(0.3f) - static_cast<double>(0.1f)));

  test::HandForest hand;
  hand.add(hand.add(hand.add(nullptr, narrow), wide), wide);  // a zone under a narrow root
  Pocket* keep = hand.add(nullptr, wide);
  Pocket* k1 = hand.add(keep, wide);
  Pocket* gone = hand.add(keep, narrow);
  hand.add(gone, wide);
  Pocket* k2 = hand.add(keep, wide);
  Pocket* k3 = hand.add(k2, wide);
  ContourNode* lastNode = hand.add(nullptr, narrow)->node;
  EXPECT_EQ(widthFilter(hand.forest, 6.0), 4);
  EXPECT_EQ(chainOf(hand.forest.firstRoot), List{keep});  // the next root moved up
  EXPECT_EQ(chainOf(keep->firstChild), (List{k1, k2}));
  EXPECT_EQ(chainOf(k2->firstChild), List{k3});
  EXPECT_EQ(lastNode->pocket, nullptr);  // nodes forget deleted pockets
  EXPECT_TRUE(lastNode->taken);
  EXPECT_EQ(widthFilter(hand.forest, 50.0), 0);
  EXPECT_EQ(hand.forest.firstRoot, nullptr);
}

TEST(ForestWalks, DeepChainsNeedNoRecursion) {
  // 400,000 pockets each under the previous one; one narrow halfway down.
  constexpr int kDepth = 400000;
  test::Contours set;
  ContourNode wide{set.box(0, 0, 50, 50)};
  ContourNode narrow{set.box(0, 0, 5, 5)};
  PocketForest forest;
  List chain{forest.firstRoot = new Pocket{&wide, nullptr, nullptr, nullptr, nullptr}};
  for (int i = 1; i < kDepth; ++i) {
    Pocket* above = chain.back();
    ContourNode* node = i == kDepth / 2 ? &narrow : &wide;
    chain.push_back(above->firstChild = new Pocket{node, nullptr, nullptr, above, nullptr});
  }
  EXPECT_EQ(pocketCount(forest), kDepth);
  CheckedArray<Pocket*> result(kDepth, 1000);
  EXPECT_EQ(zoneOrder(forest, result), kDepth);
  EXPECT_EQ(listOf(result), chain);
  EXPECT_EQ(breadthFirstPockets(forest, result), kDepth);
  EXPECT_EQ(result.data[kDepth - 1], chain.back());
  EXPECT_EQ(widthFilter(forest, 10.0), kDepth / 2);
  EXPECT_EQ(chain[kDepth / 2 - 1]->firstChild, nullptr);
  deletePocketTree(std::exchange(forest.firstRoot, nullptr));
}

}  // namespace
}  // namespace pc
