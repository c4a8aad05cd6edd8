// Level-based ordering: all pockets of level 0, then of level 1, and so on,
// each level in a greedy nearest-neighbour travel order.
#pragma once

#include <cstdint>

#include "driver/checked_array.h"
#include "pockets/pocket_model.h"

namespace pc {

// Fills `result` with the ordered pockets; their number, or 0 when the
// centroid scratch could not be obtained.
std::int32_t levelOrder(PocketForest& forest, CheckedArray<Pocket*>& result);

// Fills `result` breadth first from the roots (level by level, children in
// chain order); returns the number of pockets.
std::int32_t breadthFirstPockets(PocketForest& forest, CheckedArray<Pocket*>& result);

// Reorders pockets[0 .. count-1] in place into a greedy path through their
// outer contours' centroids, starting at the leftmost. Fewer than three
// pockets keep their order. 0, or -1 when the centroid scratch could not be
// obtained (the pockets then keep their order).
int nearestNeighbourOrder(PocketForest& forest, Pocket** pockets, std::int32_t count);

}  // namespace pc
