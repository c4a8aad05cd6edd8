#include "output/outline_check.h"

#include <cmath>
#include <cstdio>

namespace pc {

namespace {

std::int32_t nextPoint(const Point* points, std::int32_t from, std::int32_t count) {
  while (from < count && !isPointEntry(points[from])) ++from;
  return from;
}

std::int32_t nextSeparator(const Point* points, std::int32_t from, std::int32_t count) {
  while (from < count && isPointEntry(points[from])) ++from;
  return from;
}

void reportOpenContour(std::int32_t length, const Point& first, const Point& last, float z) {
  const double zd = static_cast<double>(z);
  std::printf("**************************************\n");
  std::printf("*** OPEN CONTOUR (%d pts)\n", static_cast<int>(length));
  std::printf("*** First Point : X=%.3f Y=%.3f Z=%.3f\n", static_cast<double>(first.x),
              static_cast<double>(first.y), zd);
  std::printf("*** Last  Point : X=%.3f Y=%.3f Z=%.3f\n", static_cast<double>(last.x),
              static_cast<double>(last.y), zd);
  std::printf("**************************************\n");
}

}  // namespace

int checkOutline(Point* points, std::int32_t count, float z, double tolerance) {
  if (points == nullptr || count < 1) return -1;
  std::int32_t i = nextPoint(points, 0, count);
  if (i >= count) return -1;
  while (i < count) {
    const std::int32_t end = nextSeparator(points, i, count);
    const std::int32_t length = end - i;
    if (length >= 4) {
      const Point& first = points[i];
      Point& last = points[end - 1];
      const double dx = static_cast<double>(last.x) - static_cast<double>(first.x);
      const double dy = static_cast<double>(last.y) - static_cast<double>(first.y);
      if (std::sqrt(dx * dx + dy * dy) > tolerance) {
        reportOpenContour(length, first, last, z);
        return -1;
      }
      last = first;
    } else {
      // Too short to enclose an area: dropped from everything written later.
      for (std::int32_t k = i; k < end; ++k) points[k] = kSeparatorPoint;
    }
    i = nextPoint(points, end, count);
  }
  return 0;
}

}  // namespace pc
