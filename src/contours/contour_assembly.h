// Contour assembly: cuts the loaded point sequence at its separators into
// closed contours, checked and closed exactly, one ZContour each.
#pragma once

#include <cstdint>

#include "contours/point.h"
#include "contours/zcontour.h"

namespace pc {

// Fills contours[0..] from the first n entries of points/zs, in order. A run
// with fewer than 4 points or whose ends lie more than `tolerance` apart
// fails the whole assembly with its boxed report on standard output; more
// runs than `capacity` fail it silently. The last point of every accepted run
// is overwritten with its first. Returns the number of contours, 0 on failure.
std::int32_t assembleContours(Point* points, const float* zs, std::int32_t n, ZContour* contours,
                              std::int32_t capacity, double tolerance);

}  // namespace pc
