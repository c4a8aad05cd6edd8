// The outline check shared by every output: before a pocket outline is
// written, each of its contours is checked for closure again and closed
// exactly, and contours too short to enclose anything are blanked out.
#pragma once

#include <cstdint>

#include "contours/point.h"

namespace pc {

// Tolerance the outputs use for the closure of a contour.
inline constexpr double kOutlineClosureTolerance = 0.005;

// Checks the runs of points of `points[0..count)` (separated by separator
// entries). A run of 4 or more points whose ends lie farther apart than
// `tolerance` is reported as an open contour (with `z`) and gives -1; the
// other runs of 4 or more get their last point set to their first; runs of
// 1 to 3 points are overwritten with separators. 0 when every run passed;
// -1 also for an empty list or one without any point.
int checkOutline(Point* points, std::int32_t count, float z, double tolerance);

}  // namespace pc
