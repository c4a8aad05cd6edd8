#include "pockets/zone_order.h"

#include "pockets/level_order.h"
#include "pockets/pocket_walk.h"

namespace pc {

namespace {

// Reorders one chain through `list`, the scratch shared by all chains.
void reorderChain(PocketForest& forest, Pocket*& link, CheckedArray<Pocket*>& list) {
  list.reset();
  for (Pocket* p = link; p != nullptr; p = p->nextSibling) list.append(p);
  if (list.count < 3) return;
  // On failure the list keeps its order, so relinking changes nothing.
  nearestNeighbourOrder(forest, list.data, list.count);
  link = list.data[0];
  for (std::int32_t i = 0; i + 1 < list.count; ++i) list.data[i]->nextSibling = list.data[i + 1];
  list.data[list.count - 1]->nextSibling = nullptr;
}

}  // namespace

void reorderSiblings(PocketForest& forest, Pocket*& link) {
  CheckedArray<Pocket*> list(0, 100);
  reorderChain(forest, link, list);
  if (link == nullptr) return;
  // Pre-order over the chain's pockets and everything under them; each child
  // chain is reordered just before the walk enters it.
  const Pocket* const above = link->parent;
  Pocket* p = link;
  while (p != nullptr) {
    reorderChain(forest, p->firstChild, list);
    if (p->firstChild != nullptr) {
      p = p->firstChild;
      continue;
    }
    while (p != nullptr && p->nextSibling == nullptr) {
      p = p->parent;
      if (p == above) p = nullptr;
    }
    if (p != nullptr) p = p->nextSibling;
  }
}

std::int32_t zoneOrder(PocketForest& forest, CheckedArray<Pocket*>& result) {
  reorderSiblings(forest, forest.firstRoot);
  result.reset();
  for (Pocket* p = forest.firstRoot; p != nullptr; p = nextPocketInPreOrder(p)) result.append(p);
  return result.count;
}

}  // namespace pc
