// Zone-based ordering: each root pocket with everything under it is listed
// whole, depth first, before the next root; siblings are first put into
// nearest-neighbour order, which is written back into the forest's chains.
#pragma once

#include <cstdint>

#include "driver/checked_array.h"
#include "pockets/pocket_model.h"

namespace pc {

// Reorders the forest's sibling chains and fills `result` in depth-first
// pre-order; returns the number of pockets (0 for an empty forest).
std::int32_t zoneOrder(PocketForest& forest, CheckedArray<Pocket*>& result);

// Puts the chain held by `link` into nearest-neighbour order (chains of one
// or two pockets keep theirs), then every chain below it. A chain whose
// centroid scratch cannot be obtained keeps its order.
void reorderSiblings(PocketForest& forest, Pocket*& link);

}  // namespace pc
