// The greedy nearest-neighbour path of the orderings: from the first of the
// smallest x, always on to the nearest point not yet taken, the first in the
// current order among equally near ones, swapping it into place.
#pragma once

#include <cstdint>

#include "contours/point.h"
#include "pockets/pocket_model.h"

namespace pc {

// Puts the leftmost point (the first of equal ones) at index 0.
void moveLeftmostFirst(Pocket** pockets, Point* centroids, std::int32_t count);

// Orders indices 1 .. count-1 by comparing every remaining point (quadratic).
void nearestPathByScan(Pocket** pockets, Point* centroids, std::int32_t count);

// The same path found through a grid, in about linear time for spread-out
// points. Every distance is computed as in the scan and only points that are
// certainly farther are skipped, so the result is the scan's. False, with
// nothing changed, when the points are not all finite or memory is short.
bool nearestPathByGrid(Pocket** pockets, Point* centroids, std::int32_t count);

}  // namespace pc
