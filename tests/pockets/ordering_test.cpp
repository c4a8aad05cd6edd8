#include <gtest/gtest.h>

#include <vector>

#include "pockets/contour_fixture.h"
#include "pockets/level_order.h"
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
    for (Point c : centres) out.push_back(hand.add(parent, set.around(c.x, c.y, z)));
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
  EXPECT_EQ(row.hand.forest.centroidCapacity, 4);  // kept at the largest run
}

TEST(LevelOrder, BreadthFirstThenEachLevelOrderedOnItsOwn) {
  Row row;
  List top = row.add(nullptr, {{10, 0}, {0, 5}, {1, 5}}, 3);
  List l1a = row.add(top[0], {{50, 50}}, 2);
  List l1b = row.add(top[2], {{-50, 50}}, 2);  // a run of two keeps its order
  List l2 = row.add(l1a[0], {{9, 9}, {7, 7}}, 1);
  List l2b = row.add(l1b[0], {{8, 8}}, 1);
  CheckedArray<Pocket*> result(1, 1000);
  EXPECT_EQ(breadthFirstPockets(row.hand.forest, result), 8);
  EXPECT_EQ(listOf(result), (List{top[0], top[1], top[2], l1a[0], l1b[0], l2[0], l2[1], l2b[0]}));
  EXPECT_EQ(levelOrder(row.hand.forest, result), 8);
  EXPECT_EQ(listOf(result), (List{top[1], top[2], top[0], l1a[0], l1b[0], l2[1], l2b[0], l2[0]}));
  EXPECT_EQ(chainOf(row.hand.forest.firstRoot), top);  // the forest is not changed

  Row two;
  List p = two.add(nullptr, {{10, 0}, {0, 5}});
  EXPECT_EQ(levelOrder(two.hand.forest, result), 2);
  EXPECT_EQ(listOf(result), p);
  PocketForest empty;
  EXPECT_EQ(levelOrder(empty, result), 0);
  EXPECT_EQ(result.count, 0);
}

TEST(ZoneOrder, SiblingsReorderedInTheForestAndZonesListedWhole) {
  Row row;
  List roots = row.add(nullptr, {{100, 0}, {0, 0}}, 3);
  List kids = row.add(roots[0], {{10, 0}, {0, 5}, {1, 5}}, 2);
  List sub0 = row.add(kids[0], {{10, 1}}, 1);
  List sub1 = row.add(kids[1], {{0, 6}}, 1);
  List pair = row.add(kids[2], {{5, 5}, {-5, 5}}, 1);  // two keep their order
  List other = row.add(roots[1], {{3, 3}}, 2);
  CheckedArray<Pocket*> result(0, 1000);
  EXPECT_EQ(zoneOrder(row.hand.forest, result), 10);
  EXPECT_EQ(listOf(result),
            (List{roots[0], kids[1], sub1[0], kids[2], pair[0], pair[1], kids[0], sub0[0], roots[1], other[0]}));
  EXPECT_EQ(chainOf(roots[0]->firstChild), (List{kids[1], kids[2], kids[0]}));
  EXPECT_EQ(kids[0]->nextSibling, nullptr);

  Row three;
  List r = three.add(nullptr, {{10, 0}, {0, 5}, {1, 5}});
  EXPECT_EQ(zoneOrder(three.hand.forest, result), 3);
  EXPECT_EQ(three.hand.forest.firstRoot, r[1]);
  PocketForest empty;
  EXPECT_EQ(zoneOrder(empty, result), 0);
  EXPECT_EQ(result.count, 0);
}

}  // namespace
}  // namespace pc
