// Exact geometric predicates over single-precision points: the sign of an
// orientation is computed exactly (a floating-point filter, then an exact
// sum of error-free products), so that crossing, touching and containment
// never depend on rounding.
#pragma once

#include <cstdint>
#include <span>

#include "contours/point.h"

namespace pc::inspect {

// +1 when c lies to the left of the directed line a->b, -1 to the right,
// 0 exactly on it.
int orientation(Point a, Point b, Point c);

enum class SegmentContact { None, Touch, Cross };

// How segments ab and cd meet: Cross when they cross at one point inside
// both; Touch when they share a point otherwise (an end on the other, or
// collinear overlap); None when they are apart.
SegmentContact segmentContact(Point a, Point b, Point c, Point d);

// Euclidean distance between two segments (in double; for apart segments).
double segmentDistance(Point a, Point b, Point c, Point d);

enum class Containment { Outside, Inside, OnBoundary };

// Where p lies with respect to the closed polygon `ring` (first point
// repeated at the end or not): exact crossing parity.
Containment locatePoint(Point p, std::span<const Point> ring);

}  // namespace pc::inspect
