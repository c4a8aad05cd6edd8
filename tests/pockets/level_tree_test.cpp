#include <gtest/gtest.h>

#include <vector>

#include "pockets/contour_fixture.h"
#include "pockets/node_geometry.h"
#include "pockets/pocket_model.h"

namespace pc {
namespace {

using test::Contours;

std::vector<ZContour*> chainContours(const ContourNode* first) {
  std::vector<ZContour*> out;
  for (; first != nullptr; first = first->nextSibling) out.push_back(first->contour);
  return out;
}

TEST(LevelTree, NestedContoursInEitherOrderGiveOneTreeAndTwoRegions) {
  Contours set;
  ZContour* a = set.box(0, 0, 10, 10);
  ZContour* b = set.box(2, 2, 8, 8);
  ZContour* c = set.box(4, 4, 6, 6);
  for (std::vector<ZContour*> order : {std::vector<ZContour*>{a, b, c}, std::vector<ZContour*>{c, b, a}}) {
    ZLevel level;
    for (ZContour* x : order) addContourToLevel(level, x);
    EXPECT_EQ(chainContours(level.root), std::vector<ZContour*>{a});
    EXPECT_EQ(chainContours(level.root->firstChild), std::vector<ZContour*>{b});
    EXPECT_EQ(chainContours(level.root->firstChild->firstChild), std::vector<ZContour*>{c});
    EXPECT_EQ(level.root->firstChild->firstChild->parent, level.root->firstChild);
    EXPECT_EQ(nodeCount(level), 3);
    CheckedArray<ContourNode*>& outer = outerNodes(level);
    ASSERT_EQ(outer.count, 2);
    EXPECT_EQ(outer.data[0]->contour, a);
    EXPECT_EQ(outer.data[1]->contour, c);
  }
}

TEST(LevelTree, EnclosingContourAdoptsRelatedSiblingsAndPushesOthersBehind) {
  Contours set;
  ZContour* out = set.box(-100, -100, 100, 100);
  ZContour* before = set.box(30, 0, 31, 1);
  ZContour* s1 = set.box(1, 1, 2, 2);
  ZContour* far1 = set.box(50, 50, 60, 60);
  ZContour* s2 = set.box(3, 3, 4, 4);
  ZContour* far2 = set.box(70, 0, 80, 10);
  ZContour* big = set.box(0, 0, 10, 10);
  for (bool nested : {false, true}) {
    ZLevel level;
    if (nested) addContourToLevel(level, out);
    for (ZContour* x : {before, s1, far1, s2, far2, big}) addContourToLevel(level, x);
    const ContourNode* above = nested ? level.root : nullptr;
    const ContourNode* first = nested ? level.root->firstChild : level.root;
    // Siblings before the enclosed one stay; apart ones move behind the new
    // node in their order and keep their parent.
    EXPECT_EQ(chainContours(first), (std::vector<ZContour*>{before, big, far1, far2}));
    for (const ContourNode* n = first; n != nullptr; n = n->nextSibling) EXPECT_EQ(n->parent, above);
    EXPECT_EQ(chainContours(first->nextSibling->firstChild), (std::vector<ZContour*>{s1, s2}));
    EXPECT_EQ(first->nextSibling->firstChild->nextSibling->parent, first->nextSibling);
  }
}

TEST(LevelTree, OuterNodesListEachOuterBeforeTheOutersInsideItsIslands) {
  Contours set;
  std::vector<ZContour*> in = {set.box(0, 0, 100, 100),  set.box(10, 10, 40, 90), set.box(20, 20, 30, 30),
                               set.box(50, 10, 90, 90),  set.box(60, 20, 70, 30), set.box(60, 50, 70, 60),
                               set.box(200, 0, 300, 100)};
  ZLevel level;
  for (ZContour* x : in) addContourToLevel(level, x);
  CheckedArray<ContourNode*>& outer = outerNodes(level);
  EXPECT_EQ(outer.capacity, 7);  // sized to the whole tree
  std::vector<ZContour*> got;
  for (std::int32_t i = 0; i < outer.count; ++i) got.push_back(outer.data[i]->contour);
  EXPECT_EQ(got, (std::vector<ZContour*>{in[0], in[2], in[4], in[5], in[6]}));
  ContourNode** block = outer.data;
  EXPECT_EQ(outerNodes(level).count, 5);  // refilled in place
  EXPECT_EQ(level.outerCache->data, block);
}

TEST(LevelTree, DeepNestingNeedsNoRecursion) {
  // 100,000 concentric squares, innermost first: each one encloses the tree.
  constexpr int kCount = 100000;
  std::vector<Point> points;
  points.reserve(5 * kCount);
  std::vector<ZContour> contours(kCount);
  ZLevel level;
  for (int k = 0; k < kCount; ++k) {
    const float r = static_cast<float>(k + 1);
    points.insert(points.end(), {{-r, -r}, {r, -r}, {r, r}, {-r, r}, {-r, -r}});
    fill(contours[k], &points[5 * static_cast<std::size_t>(k)], 5, 0.0f);
    addContourToLevel(level, &contours[k]);
  }
  EXPECT_EQ(nodeCount(level), kCount);
  CheckedArray<ContourNode*>& outer = outerNodes(level);
  ASSERT_EQ(outer.count, kCount / 2);
  EXPECT_EQ(outer.data[1]->contour, &contours[kCount - 3]);
  EXPECT_EQ(outer.data[kCount / 2 - 1]->contour, &contours[1]);
  EXPECT_EQ(deepestNodeHolding(level, {0.5f, 0.5f})->contour, &contours[0]);
  PocketForest forest;
  EXPECT_EQ(buildPockets(forest, &level, 1), 0);
  EXPECT_EQ(pocketCount(forest), kCount / 2);
}

}  // namespace
}  // namespace pc
