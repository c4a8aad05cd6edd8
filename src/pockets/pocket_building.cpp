// Pocket building: the regions of consecutive levels are chained through an
// interior point, from the deepest level up to level 0, into the forest.
#include <new>

#include "pockets/contour_geometry.h"
#include "pockets/node_geometry.h"
#include "pockets/pocket_model.h"
#include "pockets/pocket_walk.h"

namespace pc {

namespace {

Pocket* makePocket(ContourNode& node) {
  Pocket* pocket = new (std::nothrow) Pocket;
  if (pocket == nullptr) modelAllocationFailure();
  pocket->node = &node;
  node.pocket = pocket;
  node.taken = true;
  return pocket;
}

void appendChild(Pocket& parent, Pocket* child) {
  child->parent = &parent;
  Pocket** end = parent.lastChild != nullptr ? &parent.lastChild->nextSibling : &parent.firstChild;
  while (*end != nullptr) end = &(*end)->nextSibling;  // a chain from an earlier call
  *end = child;
  parent.lastChild = child;
}

// Appends at the end of the root chain; `tail` is its last link.
void appendRoot(Pocket**& tail, Pocket* root) {
  *tail = root;
  tail = &root->nextSibling;
}

// The interior point of the region of `outer`: the outer contour minus the
// contours directly inside it.
bool regionPoint(PocketForest& forest, const ContourNode& outer, Point& point) {
  if (!forest.regionContours) {
    forest.regionContours.reset(new (std::nothrow) CheckedArray<ZContour*>(1000, 1000));
    if (!forest.regionContours) modelAllocationFailure();
  }
  CheckedArray<ZContour*>& contours = *forest.regionContours;
  contours.reset();
  contours.append(outer.contour);
  for (const ContourNode* island = outer.firstChild; island != nullptr; island = island->nextSibling) {
    contours.append(island->contour);
  }
  return regionInteriorPoint(contours.data, contours.count, point, forest.crossings);
}

// Follows the region of `start` (level `level`) up to level 0 through its
// interior point. Returns the level-0 pocket that completes a new chain, or
// nullptr when the chain ended on an existing pocket or was dropped.
Pocket* chainRegion(PocketForest& forest, ZLevel* levels, std::int32_t level, ContourNode& start,
                    bool& noInteriorPoint) {
  Point p;
  start.taken = true;
  if (!regionPoint(forest, start, p)) {
    // No pocket for a region that has no inside; building goes on.
    noInteriorPoint = true;
    return nullptr;
  }
  Pocket* current = makePocket(start);
  for (std::int32_t m = level - 1; m >= 0; --m) {
    ContourNode* below = deepestNodeHolding(levels[m], p);
    if (below != nullptr && below->pocket != nullptr) {
      appendChild(*below->pocket, current);
      return nullptr;
    }
    if (below == nullptr || below->taken) {
      // Nowhere to hang the chain, or only a region whose pocket an earlier
      // dropped chain deleted: the chain goes, its nodes stay taken.
      deletePocketTree(current);
      return nullptr;
    }
    Pocket* next = makePocket(*below);
    appendChild(*next, current);
    current = next;
  }
  return current;
}

}  // namespace

int buildPockets(PocketForest& forest, ZLevel* levels, std::int32_t levelCount) {
  if (levels == nullptr || levelCount < 1) return 0;
  Pocket** rootTail = &forest.firstRoot;
  while (*rootTail != nullptr) rootTail = &(*rootTail)->nextSibling;

  bool noInteriorPoint = false;
  for (std::int32_t level = levelCount - 1; level >= 1; --level) {
    CheckedArray<ContourNode*>& outer = outerNodes(levels[level]);
    for (std::int32_t i = 0; i < outer.count; ++i) {
      ContourNode& node = *outer.data[i];
      if (node.taken) continue;
      Pocket* root = chainRegion(forest, levels, level, node, noInteriorPoint);
      if (root != nullptr) appendRoot(rootTail, root);
    }
  }
  // Level 0 regions that no chain reached become roots of their own.
  CheckedArray<ContourNode*>& top = outerNodes(levels[0]);
  for (std::int32_t i = 0; i < top.count; ++i) {
    ContourNode& node = *top.data[i];
    if (!node.taken) appendRoot(rootTail, makePocket(node));
  }
  // The chain ends are only valid while building: the width filter and the
  // zone ordering change the chains later.
  for (Pocket* p = forest.firstRoot; p != nullptr; p = nextPocketInPreOrder(p)) p->lastChild = nullptr;
  return noInteriorPoint ? -1 : 0;
}

}  // namespace pc
