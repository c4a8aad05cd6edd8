// The search aids (chain grids, edge buckets, grid path) against the plain
// definitions, on random inputs with many exact ties.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <deque>
#include <random>
#include <utility>
#include <vector>

#include "pockets/contour_fixture.h"
#include "pockets/contour_geometry.h"
#include "pockets/nearest_path.h"
#include "pockets/node_geometry.h"

namespace pc {
namespace {

// The containment tree built as defined, over plain links only.
void plainInsert(std::deque<ContourNode>& store, ContourNode** link, ZContour* c) {
  while (ContourNode* x = *link) {
    const int r = contourRelation(*c, *x->contour);
    if (r != 2) {
      link = r == 0 ? &x->nextSibling : &x->firstChild;
      continue;
    }
    // c takes x's place: x's related followers join x under c, the others
    // stay behind c.
    ContourNode* n = &store.emplace_back(ContourNode{c, x});
    ContourNode** tails[2] = {&n->nextSibling, &x->nextSibling};
    for (ContourNode* y = std::exchange(x->nextSibling, nullptr); y != nullptr;
         y = std::exchange(y->nextSibling, nullptr)) {
      ContourNode**& tail = tails[contourRelation(*c, *y->contour) != 0 ? 1 : 0];
      *tail = y;
      tail = &y->nextSibling;
    }
    *link = n;
    return;
  }
  *link = &store.emplace_back(ContourNode{c});
}

// Whether both trees hold the same contours in the same places.
bool sameTree(const ContourNode* a, const ContourNode* b) {
  for (; a != nullptr && b != nullptr; a = a->nextSibling, b = b->nextSibling) {
    if (a->contour != b->contour || !sameTree(a->firstChild, b->firstChild)) return false;
  }
  return a == b;
}

ZContour* plainDeepest(const ContourNode* n, Point p) {
  ZContour* found = nullptr;
  while (n != nullptr) {
    const bool in = pointInContour(p, *n->contour);
    if (in) found = n->contour;
    n = in ? n->firstChild : n->nextSibling;
  }
  return found;
}

TEST(Differential, LevelTreesAndSearchesMatchThePlainDefinition) {
  std::mt19937 random(12345);
  std::uniform_int_distribution<int> cell(0, 59);
  std::uniform_int_distribution<int> size(1, 6);
  for (bool enclosingLast : {false, true}) {
    // A frame, small boxes on a coarse grid (touching and nested ones among
    // them) and some large ones.
    test::Contours set;
    std::vector<ZContour*> contours{set.box(-1, -1, 121, 121)};
    for (int i = 0; i < 900; ++i) {
      const float x = 2.0f * cell(random), y = 2.0f * cell(random);
      const float s = static_cast<float>(size(random)) * (i % 50 == 7 ? 10.0f : 1.0f);
      contours.push_back(set.box(x, y, x + s, y + s));
    }
    if (enclosingLast) std::reverse(contours.begin(), contours.end());
    ZLevel level;
    std::deque<ContourNode> store;
    ContourNode* plainRoot = nullptr;
    for (ZContour* c : contours) {
      addContourToLevel(level, c);
      plainInsert(store, &plainRoot, c);
    }
    ASSERT_TRUE(sameTree(level.root, plainRoot)) << "enclosing last " << enclosingLast;
    std::uniform_int_distribution<int> coordinate(-8, 968);
    for (int i = 0; i < 4000; ++i) {
      const Point p{coordinate(random) / 8.0f, coordinate(random) / 8.0f};
      const ContourNode* found = deepestNodeHolding(level, p);
      ASSERT_EQ(found != nullptr ? found->contour : nullptr, plainDeepest(plainRoot, p)) << p.x << " " << p.y;
    }
  }
}

TEST(Differential, EdgeBucketsAnswerAsThePlainTest) {
  // A ring up one jagged side and down the other, its heights on a fine
  // lattice with many repeats, probed at vertex heights exactly, within and
  // beyond the tolerance: slab borders fall between edge ends and probes.
  std::mt19937 random(4242);
  std::uniform_int_distribution<int> rise(0, 4);
  std::uniform_int_distribution<int> column(0, 60);
  std::vector<Point> ring{{0, 0}};
  for (int i = 1; i < 2000; ++i) {
    const float up = i < 1000 ? 1.0f : -1.0f;
    ring.push_back({(i < 1000 ? 0.0f : 20.0f) + column(random) * 0.5f, ring.back().y + up * rise(random) * 0.0023f});
  }
  ring.push_back(ring.front());
  test::Contours set;
  ContourNode node;
  node.contour = set.add(ring);
  const float offsets[] = {0.0f, 0.00009f, -0.00005f, 0.0002f};
  int inside = 0;
  for (int i = 0; i < 40000; ++i) {
    const Point p{column(random) - 5.0f, ring[i % ring.size()].y + offsets[i % 4]};
    const bool expected = pointInContour(p, *node.contour);
    ASSERT_EQ(pointInNode(p, node), expected) << p.x << " " << p.y;
    inside += expected ? 1 : 0;
  }
  EXPECT_NE(node.edgeBuckets, nullptr);  // built once the node was tested often
  EXPECT_GT(inside, 4000);
  releaseSearchAids(node);
}

TEST(Differential, GridPathMatchesTheScan) {
  std::mt19937 random(777);
  std::vector<Pocket> pockets(1500);
  for (int spread : {3, 40, 100000}) {
    std::uniform_int_distribution<int> coordinate(0, spread);
    std::vector<Pocket*> a;
    std::vector<Point> ca;
    for (Pocket& p : pockets) {
      a.push_back(&p);
      // Small spreads give many equal points and distances; a far cluster
      // leaves most cells empty.
      const float shift = spread == 40 && a.size() % 3 == 0 ? 1000.0f : 0.0f;
      ca.push_back({coordinate(random) * 0.5f + shift, coordinate(random) * 0.25f});
    }
    const auto n = static_cast<std::int32_t>(a.size());
    moveLeftmostFirst(a.data(), ca.data(), n);
    std::vector<Pocket*> b = a;
    std::vector<Point> cb = ca;
    ASSERT_TRUE(nearestPathByGrid(a.data(), ca.data(), n));
    nearestPathByScan(b.data(), cb.data(), n);
    EXPECT_EQ(a, b) << "spread " << spread;
  }
  Pocket* list[3] = {&pockets[0], &pockets[1], &pockets[2]};
  Point c[3] = {{0, 0}, {std::nanf(""), 1}, {2, 2}};
  EXPECT_FALSE(nearestPathByGrid(list, c, 3));  // left to the scan
  EXPECT_EQ(list[1], &pockets[1]);
}

}  // namespace
}  // namespace pc
