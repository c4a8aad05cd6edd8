#include "pockets/width_filter.h"

#include "pockets/pocket_walk.h"

namespace pc {

bool fitsWithin(const ZContour& contour, double threshold) {
  const double dx = static_cast<double>(contour.xmax) - static_cast<double>(contour.xmin);
  const double dy = static_cast<double>(contour.ymax) - static_cast<double>(contour.ymin);
  return threshold >= dx && threshold >= dy;
}

namespace {

// Unlinks and deletes the pockets of one chain that fit, keeping the others
// in their order.
void filterChain(Pocket*& link, double threshold) {
  Pocket** at = &link;
  while (Pocket* p = *at) {
    if (fitsWithin(*p->node->contour, threshold)) {
      *at = p->nextSibling;
      deletePocketTree(p);
    } else {
      at = &p->nextSibling;
    }
  }
}

}  // namespace

std::int32_t widthFilter(PocketForest& forest, double threshold) {
  // A pocket survives when neither it nor any pocket above it fits: filter
  // each chain, then walk into the survivors only.
  filterChain(forest.firstRoot, threshold);
  for (Pocket* p = forest.firstRoot; p != nullptr; p = nextPocketInPreOrder(p)) {
    filterChain(p->firstChild, threshold);
  }
  return pocketCount(forest);
}

}  // namespace pc
