#include "pockets/contour_geometry.h"

#include <algorithm>
#include <new>

namespace pc {

bool pointInContour(Point p, const ZContour& c) {
  const double px = p.x;
  const double py = p.y;
  if (!pointInBox(px, py, c)) return false;
  if (c.pointCount < 2) return false;
  const double below = py - 2.0 * kGeometryEpsilon;
  const Point* points = c.points;
  bool inside = false;
  for (std::int32_t k = 0; k + 1 < c.pointCount; ++k) {
    if (edgeMayCross(points[k].y, points[k + 1].y, py, below) &&
        edgeCrossesRay(points[k], points[k + 1], px, py)) {
      inside = !inside;
    }
  }
  return inside;
}

std::int32_t voteSamples(std::int32_t pointCount, std::int32_t (&samples)[5]) {
  // A contour without points has nothing to vote with.
  if (pointCount < 1) return 0;
  const double q = static_cast<double>(pointCount - 2) * 0.25;
  std::int32_t taken = 0;
  samples[taken++] = 0;
  for (int k = 1; k <= 4; ++k) {
    const auto s = static_cast<std::int32_t>(q * static_cast<double>(k) + 0.5);
    if (s > samples[taken - 1] && s < pointCount - 1) samples[taken++] = s;
  }
  return taken;
}

bool contourInContour(const ZContour& a, const ZContour& b) {
  return sampleVote(a, [&b](Point p) { return pointInContour(p, b); });
}

int contourRelation(const ZContour& a, const ZContour& b) {
  if (b.xmin > a.xmax || b.ymin > a.ymax || a.xmin > b.xmax || a.ymin > b.ymax) return 0;
  if (contourInContour(a, b)) return 1;
  if (contourInContour(b, a)) return 2;
  return 0;
}

Point centroid(const ZContour& c) {
  if (c.pointCount < 1) return Point{};
  double sx = 0.0;
  double sy = 0.0;
  for (std::int32_t i = 0; i < c.pointCount; ++i) {
    sx += static_cast<double>(c.points[i].x);
    sy += static_cast<double>(c.points[i].y);
  }
  const double n = static_cast<double>(c.pointCount);
  return Point{static_cast<float>(sx / n), static_cast<float>(sy / n)};
}

namespace {

// NaN sorts last so that the order stays a strict weak ordering on any input;
// on numbers it is the plain ascending order.
bool ascending(double a, double b) { return (!std::isnan(a) && std::isnan(b)) || a < b; }

struct ProbeResult {
  double along = 0.0;  // middle of the widest span on the probe line
  double width = 0.0;
};

// One probe line at `at` across the axis selected by `vertical` (the line
// x = at when vertical, y = at otherwise). Collects where the region's edges
// cross it and keeps the widest span between consecutive crossings.
bool probe(ZContour* const* contours, std::int32_t count, bool vertical, double at,
           std::vector<double>& crossings, ProbeResult& result) {
  crossings.clear();
  const double below = at - 2.0 * kGeometryEpsilon;
  try {
    for (std::int32_t ci = 0; ci < count; ++ci) {
      const ZContour& c = *contours[ci];
      std::size_t before = crossings.size();
      for (std::int32_t k = 0; k + 1 < c.pointCount; ++k) {
        const Point& a = c.points[k];
        const Point& b = c.points[k + 1];
        // u runs across the line, v along it; the first end wins on equal u.
        const float au = vertical ? a.x : a.y;
        const float bu = vertical ? b.x : b.y;
        if (!edgeMayCross(au, bu, at, below)) continue;
        const bool aFirst = !(bu < au);
        const Point& lo = aFirst ? a : b;
        const Point& hi = aFirst ? b : a;
        double ulo = vertical ? lo.x : lo.y;
        const double vlo = vertical ? lo.y : lo.x;
        double uhi = vertical ? hi.x : hi.y;
        const double vhi = vertical ? hi.y : hi.x;
        if (std::fabs(ulo - at) <= kGeometryEpsilon) ulo = at + kGeometryEpsilon;
        if (std::fabs(uhi - at) <= kGeometryEpsilon) uhi = at + kGeometryEpsilon;
        if (ulo < at && at < uhi) crossings.push_back((at - ulo) / (uhi - ulo) * (vhi - vlo) + vlo);
      }
      // A contour crossed an odd number of times cannot bound spans.
      if ((crossings.size() - before) % 2 != 0) return false;
    }
  } catch (const std::bad_alloc&) {
    return false;
  }
  if (crossings.size() < 2) return false;
  std::sort(crossings.begin(), crossings.end(), ascending);
  std::size_t best = 0;
  double bestWidth = crossings[1] - crossings[0];
  for (std::size_t i = 2; i + 1 < crossings.size(); i += 2) {
    const double width = crossings[i + 1] - crossings[i];
    if (width > bestWidth) {
      bestWidth = width;
      best = i;
    }
  }
  result.along = (crossings[best] + crossings[best + 1]) * 0.5;
  result.width = bestWidth;
  return true;
}

}  // namespace

bool regionInteriorPoint(ZContour* const* contours, std::int32_t count, Point& point,
                         std::vector<double>& scratch) {
  if (contours == nullptr || count < 1) return false;
  const ZContour& outer = *contours[0];
  const double xm = static_cast<double>(outer.xmin + outer.xmax) * 0.5;
  const double ym = static_cast<double>(outer.ymin + outer.ymax) * 0.5;
  ProbeResult v;
  ProbeResult h;
  const bool vOk = probe(contours, count, true, xm, scratch, v);
  const bool hOk = probe(contours, count, false, ym, scratch, h);
  if (vOk && (!hOk || v.width >= h.width)) {
    point = Point{static_cast<float>(xm), static_cast<float>(v.along)};
    return true;
  }
  if (hOk) {
    point = Point{static_cast<float>(h.along), static_cast<float>(ym)};
    return true;
  }
  return false;
}

}  // namespace pc
