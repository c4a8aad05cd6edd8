#include <gtest/gtest.h>

#include <vector>

#include "pockets/contour_fixture.h"
#include "pockets/level_order.h"
#include "pockets/width_filter.h"
#include "pockets/zone_order.h"

namespace pc {
namespace {

using test::chainOf;
using List = std::vector<Pocket*>;

TEST(WidthFilter, FitsWithinIsInclusiveOnBothExtents) {
  test::Contours set;
  EXPECT_TRUE(fitsWithin(*set.box(0, 0, 10, 10), 10.0));
  EXPECT_FALSE(fitsWithin(*set.box(0, 0, 10, 10), 9.999));
  EXPECT_FALSE(fitsWithin(*set.box(0, 0, 1, 100), 99.9));
  EXPECT_FALSE(fitsWithin(*set.box(0, 0, 100, 1), 99.9));
  // Extents in double from the float box: 0.3f - 0.1f is not 0.2.
  const double extent = static_cast<double>(0.3f) - static_cast<double>(0.1f);
  EXPECT_TRUE(fitsWithin(*set.box(0.1f, 0, 0.3f, 0.1f), extent));
  EXPECT_EQ(fitsWithin(*set.box(0.1f, 0, 0.3f, 0.1f), 0.2), extent <= 0.2);
}

TEST(WidthFilter, NarrowPocketsLeaveWithEverythingUnderThem) {
  test::Contours set;
  ZContour* wide = set.box(0, 0, 50, 50);
  ZContour* narrow = set.box(0, 0, 5, 5);
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
  test::HandForest hand;
  hand.nodes.resize(2);
  hand.nodes[0].contour = set.box(0, 0, 50, 50);
  hand.nodes[1].contour = set.box(0, 0, 5, 5);
  List chain;
  for (int i = 0; i < kDepth; ++i) chain.push_back(hand.add(chain.empty() ? nullptr : chain.back(), hand.nodes[i == kDepth / 2]));
  EXPECT_EQ(pocketCount(hand.forest), kDepth);
  CheckedArray<Pocket*> result(kDepth, 1000);
  EXPECT_EQ(zoneOrder(hand.forest, result), kDepth);
  EXPECT_EQ(test::listOf(result), chain);
  EXPECT_EQ(breadthFirstPockets(hand.forest, result), kDepth);
  EXPECT_EQ(result.data[kDepth - 1], chain.back());
  EXPECT_EQ(widthFilter(hand.forest, 10.0), kDepth / 2);
  EXPECT_EQ(chain[kDepth / 2 - 1]->firstChild, nullptr);
  deletePocketTree(std::exchange(hand.forest.firstRoot, nullptr));
}

}  // namespace
}  // namespace pc
