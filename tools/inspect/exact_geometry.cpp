#include "exact_geometry.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace pc::inspect {

namespace {

// Error-free transformations: a + b = s + e and a * b = p + e exactly.
void twoSum(double a, double b, double& s, double& e) {
  s = a + b;
  const double bv = s - a;
  e = (a - (s - bv)) + (b - bv);
}

void twoProduct(double a, double b, double& p, double& e) {
  p = a * b;
  e = std::fma(a, b, -p);
}

// Adds `b` to the non-overlapping expansion e[0..n) (smallest first).
int growExpansion(double* e, int n, double b) {
  double q = b;
  int m = 0;
  for (int i = 0; i < n; ++i) {
    double s = 0.0, err = 0.0;
    twoSum(q, e[i], s, err);
    if (err != 0.0) e[m++] = err;
    q = s;
  }
  e[m++] = q;
  return m;
}

int exactOrientationSign(Point a, Point b, Point c) {
  // Coordinates differences as exact pairs, then the four products of each
  // side as exact pairs: 2 * 4 * 2 terms at most.
  double acx = 0, acxe = 0, bcy = 0, bcye = 0, acy = 0, acye = 0, bcx = 0, bcxe = 0;
  twoSum(static_cast<double>(a.x), -static_cast<double>(c.x), acx, acxe);
  twoSum(static_cast<double>(b.y), -static_cast<double>(c.y), bcy, bcye);
  twoSum(static_cast<double>(a.y), -static_cast<double>(c.y), acy, acye);
  twoSum(static_cast<double>(b.x), -static_cast<double>(c.x), bcx, bcxe);
  const double left[2] = {acx, acxe}, left2[2] = {bcy, bcye};
  const double right[2] = {acy, acye}, right2[2] = {bcx, bcxe};
  double e[40];
  int n = 0;
  for (double u : left) {
    for (double v : left2) {
      double p = 0, err = 0;
      twoProduct(u, v, p, err);
      n = growExpansion(e, n, p);
      n = growExpansion(e, n, err);
    }
  }
  for (double u : right) {
    for (double v : right2) {
      double p = 0, err = 0;
      twoProduct(u, v, p, err);
      n = growExpansion(e, n, -p);
      n = growExpansion(e, n, -err);
    }
  }
  for (int i = n - 1; i >= 0; --i) {
    if (e[i] != 0.0) return e[i] > 0.0 ? 1 : -1;
  }
  return 0;
}

bool onSegment(Point a, Point b, Point p) {
  // p is collinear with ab: inside the segment's box means on it.
  return std::min(a.x, b.x) <= p.x && p.x <= std::max(a.x, b.x) && std::min(a.y, b.y) <= p.y &&
         p.y <= std::max(a.y, b.y);
}

double pointSegmentDistance(Point p, Point a, Point b) {
  const double ax = a.x, ay = a.y, dx = static_cast<double>(b.x) - ax, dy = static_cast<double>(b.y) - ay;
  const double len2 = dx * dx + dy * dy;
  double t = len2 > 0.0 ? ((p.x - ax) * dx + (p.y - ay) * dy) / len2 : 0.0;
  t = std::clamp(t, 0.0, 1.0);
  const double qx = ax + t * dx - p.x, qy = ay + t * dy - p.y;
  return std::sqrt(qx * qx + qy * qy);
}

}  // namespace

int orientation(Point a, Point b, Point c) {
  const double detLeft = (static_cast<double>(a.x) - c.x) * (static_cast<double>(b.y) - c.y);
  const double detRight = (static_cast<double>(a.y) - c.y) * (static_cast<double>(b.x) - c.x);
  const double det = detLeft - detRight;
  // The bound of the plain evaluation (differences and products rounded once
  // each); beyond it the sign is certain.
  constexpr double kEpsilon = std::numeric_limits<double>::epsilon() / 2;
  constexpr double kBound = (3.0 + 16.0 * kEpsilon) * kEpsilon;
  const double bound = kBound * (std::fabs(detLeft) + std::fabs(detRight));
  if (det > bound) return 1;
  if (-det > bound) return -1;
  if (!std::isfinite(det)) return 0;
  return exactOrientationSign(a, b, c);
}

SegmentContact segmentContact(Point a, Point b, Point c, Point d) {
  if (std::max(a.x, b.x) < std::min(c.x, d.x) || std::max(c.x, d.x) < std::min(a.x, b.x) ||
      std::max(a.y, b.y) < std::min(c.y, d.y) || std::max(c.y, d.y) < std::min(a.y, b.y)) {
    return SegmentContact::None;
  }
  const int o1 = orientation(a, b, c), o2 = orientation(a, b, d);
  const int o3 = orientation(c, d, a), o4 = orientation(c, d, b);
  if (o1 * o2 < 0 && o3 * o4 < 0) return SegmentContact::Cross;
  if ((o1 == 0 && onSegment(a, b, c)) || (o2 == 0 && onSegment(a, b, d)) || (o3 == 0 && onSegment(c, d, a)) ||
      (o4 == 0 && onSegment(c, d, b))) {
    return SegmentContact::Touch;
  }
  return SegmentContact::None;
}

double segmentDistance(Point a, Point b, Point c, Point d) {
  return std::min({pointSegmentDistance(a, c, d), pointSegmentDistance(b, c, d), pointSegmentDistance(c, a, b),
                   pointSegmentDistance(d, a, b)});
}

Containment locatePoint(Point p, std::span<const Point> ring) {
  const std::size_t n = ring.size();
  if (n < 2) return Containment::Outside;
  bool inside = false;
  for (std::size_t i = 0; i < n; ++i) {
    const Point a = ring[i];
    const Point b = ring[(i + 1) % n];
    const bool aAbove = a.y > p.y, bAbove = b.y > p.y;
    if (aAbove == bAbove) {
      // A horizontal edge through p, or p at a vertex, is the boundary.
      if (a.y == p.y && b.y == p.y && std::min(a.x, b.x) <= p.x && p.x <= std::max(a.x, b.x)) {
        return Containment::OnBoundary;
      }
      if (a.x == p.x && a.y == p.y) return Containment::OnBoundary;
      continue;
    }
    const int o = orientation(a, b, p);
    if (o == 0) return Containment::OnBoundary;
    // Upward edge with p on its left, or downward edge with p on its right:
    // the ray to +x crosses it.
    if ((bAbove && o > 0) || (aAbove && o < 0)) inside = !inside;
  }
  return inside ? Containment::Inside : Containment::Outside;
}

}  // namespace pc::inspect
