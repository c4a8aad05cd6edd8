// Point loading: the second pass over the contour information file fills the
// run's point and Z arrays with the contour points in file order.
#pragma once

#include <cstdint>

#include "contours/point.h"

namespace pc {

// Stores the points of the file, one separator entry (99999, 99999, Z 99999)
// between consecutive contours; consecutive points of a contour no farther
// apart than `tolerance` in XY are kept once, runs of separator records
// become one entry, and separators at the start and the end are dropped.
// Returns the number of entries stored, or 0 when the file does not open,
// holds no point, or needs more than `capacity` entries.
std::int32_t loadContourPoints(Point* points, float* zs, std::int32_t capacity, double tolerance);

}  // namespace pc
