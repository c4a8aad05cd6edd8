// The width filter: pockets whose outer contour fits within the minimum
// width in both X and Y leave the forest with everything under them.
#pragma once

#include <cstdint>

#include "contours/zcontour.h"
#include "pockets/pocket_model.h"

namespace pc {

// Removes the pockets that fit within `threshold` together with their
// subtrees; the order of the others is kept. Returns the pockets left.
std::int32_t widthFilter(PocketForest& forest, double threshold);

// Whether the contour's box is no wider and no taller than `threshold`.
bool fitsWithin(const ZContour& contour, double threshold);

}  // namespace pc
