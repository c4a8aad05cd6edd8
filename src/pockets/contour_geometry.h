// Geometric primitives of the pocket model: point and contour inclusion, the
// nesting relation of two contours, the vertex mean and a point inside a
// region (an outer contour minus its islands). Pure functions: coordinates
// are single-precision and widened to double for every computation, so that
// results are the same bit for bit on every platform.
#pragma once

#include <cmath>
#include <cstdint>
#include <vector>

#include "contours/point.h"
#include "contours/zcontour.h"

namespace pc {

// The one tolerance of the geometry: 0.0001 as a float, widened.
inline constexpr double kGeometryEpsilon = static_cast<double>(0.0001f);

// Whether the edge a -> b crosses the ray from (px, py) towards +x. Ends
// lying within the tolerance of the ray are moved just above it, so a ray
// through a vertex counts once and horizontal edges never count.
inline bool edgeCrossesRay(const Point& a, const Point& b, double px, double py) {
  const bool aIsLower = !(b.y < a.y);  // on equal y the first end is the lower
  const Point& lo = aIsLower ? a : b;
  const Point& hi = aIsLower ? b : a;
  const double xlo = lo.x;
  double ylo = lo.y;
  const double xhi = hi.x;
  double yhi = hi.y;
  if (std::fabs(ylo - py) <= kGeometryEpsilon) ylo = py + kGeometryEpsilon;
  if (std::fabs(yhi - py) <= kGeometryEpsilon) yhi = py + kGeometryEpsilon;
  return ylo < py && py < yhi && (py - ylo) / (yhi - ylo) * (xhi - xlo) > px - xlo;
}

// Cheap pre-test of edgeCrossesRay, with `below` = py - 2 * epsilon: an
// edge with both ends at or above the ray, or both clearly below it, cannot
// cross (a crossing needs its lower end strictly below the ray and its upper
// end above it or within the tolerance of it).
inline bool edgeMayCross(float ya, float yb, double py, double below) {
  return !((ya >= py && yb >= py) || (ya < below && yb < below));
}

// Bounding-box rejection of pointInContour, inclusive on the box edges.
inline bool pointInBox(double px, double py, const ZContour& c) {
  return !(static_cast<double>(c.xmin) > px || px > static_cast<double>(c.xmax) ||
           static_cast<double>(c.ymin) > py || py > static_cast<double>(c.ymax));
}

// Even-odd test along a ray towards +x over the stored edges.
bool pointInContour(Point p, const ZContour& c);

// Up to five vertices of `a` vote on whether `a` lies inside `b`; a tie
// counts as inside.
bool contourInContour(const ZContour& a, const ZContour& b);

// The vertex indices that contourInContour samples; returns how many (<= 5).
std::int32_t voteSamples(std::int32_t pointCount, std::int32_t (&samples)[5]);

// The vote of contourInContour, with the point test `inside(point)` supplied
// by the caller (the plain test, or one through an index of b's edges).
template <typename Inside>
bool sampleVote(const ZContour& a, Inside inside) {
  std::int32_t samples[5];
  const std::int32_t n = voteSamples(a.pointCount, samples);
  if (n == 0) return false;
  std::int32_t votes = 0;
  for (std::int32_t i = 0; i < n; ++i) {
    if (inside(a.points[samples[i]])) ++votes;
  }
  return votes >= n - votes;
}

// 0: apart, 1: a inside b, 2: b inside a.
int contourRelation(const ZContour& a, const ZContour& b);

// Mean of all stored points, the closing point included.
Point centroid(const ZContour& c);

// A point inside the region of contours[0] minus contours[1..count-1], found
// on a vertical and a horizontal line through the middle of the outer box.
// `scratch` holds the crossings of one line; it is the caller's so that it
// is reused across calls. False when neither line gives a region span.
bool regionInteriorPoint(ZContour* const* contours, std::int32_t count, Point& point,
                         std::vector<double>& scratch);

}  // namespace pc
