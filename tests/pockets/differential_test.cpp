// The search aids (chain grids, edge index, grid path) against the plain
// definitions, on larger inputs with many exact ties.
#include <gtest/gtest.h>

#include <algorithm>
#include <deque>
#include <random>
#include <vector>

#include "pockets/contour_fixture.h"
#include "pockets/contour_geometry.h"
#include "pockets/nearest_path.h"
#include "pockets/node_geometry.h"

namespace pc {
namespace {

using test::Contours;

// The containment tree built as defined, over plain links.
struct PlainNode {
  ZContour* contour;
  PlainNode* firstChild = nullptr;
  PlainNode* nextSibling = nullptr;
};

void plainInsert(std::deque<PlainNode>& store, PlainNode*& root, ZContour* c) {
  PlainNode** link = &root;
  while (PlainNode* x = *link) {
    const int r = contourRelation(*c, *x->contour);
    if (r == 0) {
      link = &x->nextSibling;
    } else if (r == 1) {
      link = &x->firstChild;
    } else {
      PlainNode* n = &store.emplace_back(PlainNode{c, x, nullptr});
      PlainNode** tails[2] = {&n->nextSibling, &x->nextSibling};
      for (PlainNode* y = std::exchange(x->nextSibling, nullptr); y != nullptr;) {
        PlainNode** &tail = tails[contourRelation(*c, *y->contour) != 0 ? 1 : 0];
        *tail = y;
        tail = &y->nextSibling;
        y = std::exchange(y->nextSibling, nullptr);
      }
      *link = n;
      return;
    }
  }
  *link = &store.emplace_back(PlainNode{c});
}

template <typename Node>
void preOrder(const Node* n, int depth, std::vector<std::pair<ZContour*, int>>& out) {
  for (; n != nullptr; n = n->nextSibling) {
    out.emplace_back(n->contour, depth);
    preOrder(n->firstChild, depth + 1, out);
  }
}

ZContour* plainDeepest(const PlainNode* n, Point p) {
  ZContour* found = nullptr;
  while (n != nullptr) {
    if (pointInContour(p, *n->contour)) {
      found = n->contour;
      n = n->firstChild;
    } else {
      n = n->nextSibling;
    }
  }
  return found;
}

TEST(Differential, LevelTreesAndSearchesMatchThePlainDefinition) {
  std::mt19937 random(12345);
  std::uniform_int_distribution<int> cell(0, 59);
  std::uniform_int_distribution<int> size(1, 6);
  for (int round = 0; round < 2; ++round) {
    // A frame, small boxes on a coarse grid (touching and nested ones among
    // them), large boxes arriving late, and jagged outlines.
    Contours set;
    std::vector<ZContour*> contours{set.box(-1, -1, 121, 121)};
    for (int i = 0; i < 900; ++i) {
      const float x = 2.0f * cell(random);
      const float y = 2.0f * cell(random);
      const float s = static_cast<float>(size(random));
      if (i % 50 == 7) {
        contours.push_back(set.box(x, y, x + 10 * s, y + 10 * s));
      } else if (i % 9 == 4) {
        std::vector<Point> jag;
        for (int k = 0; k < 80; ++k) jag.push_back({x + s * (k % 2), y + s * k / 40.0f});
        jag.push_back({x - s, y + 2 * s});
        jag.push_back(jag.front());
        contours.push_back(set.add(jag));
      } else {
        contours.push_back(set.box(x, y, x + s, y + s));
      }
    }
    if (round == 1) std::reverse(contours.begin(), contours.end());  // enclosing ones last
    ZLevel level;
    std::deque<PlainNode> store;
    PlainNode* plainRoot = nullptr;
    for (ZContour* c : contours) {
      addContourToLevel(level, c);
      plainInsert(store, plainRoot, c);
    }
    std::vector<std::pair<ZContour*, int>> fast, plain;
    preOrder(level.root, 0, fast);
    preOrder(plainRoot, 0, plain);
    ASSERT_EQ(fast, plain) << "round " << round;
    std::uniform_int_distribution<int> coordinate(-8, 968);
    for (int i = 0; i < 4000; ++i) {
      const Point p{coordinate(random) / 8.0f, coordinate(random) / 8.0f};
      const ContourNode* found = deepestNodeHolding(level, p);
      ASSERT_EQ(found != nullptr ? found->contour : nullptr, plainDeepest(plainRoot, p)) << p.x << " " << p.y;
    }
  }
}

TEST(Differential, EdgeIndexAnswersAsThePlainTest) {
  // A zigzag ring with vertices on a coarse grid, probed on and around its
  // vertex heights (exactly, within and beyond the tolerance).
  std::vector<Point> ring;
  for (int i = 0; i < 500; ++i) ring.push_back({static_cast<float>(i % 50) * 0.5f, i * 0.25f});
  for (int i = 499; i >= 0; --i) ring.push_back({30.0f + static_cast<float>((i * 7) % 13) * 0.5f, i * 0.25f});
  ring.push_back(ring.front());
  Contours set;
  ContourNode node;
  node.contour = set.add(ring);
  int inside = 0;
  for (float y = -1.0f; y <= 126.0f; y += 0.25f) {
    for (float dy : {0.0f, 0.00005f, -0.00005f, 0.0002f}) {
      for (float x = -1.0f; x <= 38.0f; x += 1.0f) {
        const bool expected = pointInContour({x, y + dy}, *node.contour);
        ASSERT_EQ(pointInNode({x, y + dy}, node), expected) << x << " " << y + dy;
        inside += expected ? 1 : 0;
      }
    }
  }
  EXPECT_NE(node.edgeBuckets, nullptr);
  EXPECT_GT(inside, 10000);
  releaseSearchAids(node);
}

TEST(Differential, GridPathMatchesTheScan) {
  std::mt19937 random(777);
  constexpr int kCount = 3000;
  for (int spread : {3, 40, 100000}) {
    std::uniform_int_distribution<int> coordinate(0, spread);
    std::vector<Pocket> pockets(kCount);
    std::vector<Pocket*> a(kCount);
    std::vector<Point> ca(kCount);
    for (int i = 0; i < kCount; ++i) {
      a[i] = &pockets[i];
      // Small spreads give many equal points and equal distances.
      ca[i] = Point{coordinate(random) * 0.5f + (spread == 40 && i % 3 == 0 ? 1000.0f : 0.0f),
                    coordinate(random) * 0.25f};
    }
    moveLeftmostFirst(a.data(), ca.data(), kCount);
    std::vector<Pocket*> b = a;
    std::vector<Point> cb = ca;
    ASSERT_TRUE(nearestPathByGrid(a.data(), ca.data(), kCount));
    nearestPathByScan(b.data(), cb.data(), kCount);
    EXPECT_EQ(a, b) << "spread " << spread;
  }
  Pocket p[3];
  Pocket* list[3] = {&p[0], &p[1], &p[2]};
  Point c[3] = {{0, 0}, {std::nanf(""), 1}, {2, 2}};
  EXPECT_FALSE(nearestPathByGrid(list, c, 3));  // left to the scan
  EXPECT_EQ(list[1], &p[1]);
}

}  // namespace
}  // namespace pc
