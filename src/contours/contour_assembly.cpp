#include "contours/contour_assembly.h"

#include <cmath>
#include <cstdio>

namespace pc {

namespace {

constexpr char kStarLine[] = "**************************************\n";
constexpr std::int32_t kMinimumPoints = 4;

void printFirstPoint(const Point& first, float z) {
  std::printf("*** First Point : X=%.3f Y=%.3f Z=%.3f\n", static_cast<double>(first.x),
              static_cast<double>(first.y), static_cast<double>(z));
}

// A run cut short by a separator shows its first point; the last run of the
// sequence only its count.
void reportInvalid(const Point* first, std::int32_t count, float z, bool endsAtSeparator) {
  std::printf("%s", kStarLine);
  std::printf("*** INVALID CONTOUR (%d pts) in zcut.res\n", count);
  std::printf("%s", kStarLine);
  if (!endsAtSeparator) return;
  if (count >= 1) printFirstPoint(*first, z);
  std::printf("%s", kStarLine);
  std::printf("\n");
}

void reportOpen(const Point& first, const Point& last, std::int32_t count, float z) {
  std::printf("%s", kStarLine);
  std::printf("*** OPEN CONTOUR (%d pts) in zcut.res\n", count);
  printFirstPoint(first, z);
  std::printf("*** Last  Point : X=%.3f Y=%.3f Z=%.3f\n", static_cast<double>(last.x), static_cast<double>(last.y),
              static_cast<double>(z));
  std::printf("%s", kStarLine);
}

double closureDistance(const Point& first, const Point& last) {
  const double dx = static_cast<double>(last.x) - static_cast<double>(first.x);
  const double dy = static_cast<double>(last.y) - static_cast<double>(first.y);
  return std::sqrt(dx * dx + dy * dy);
}

// Checks, closes and records one run; false after its report.
bool acceptRun(Point* points, const float* zs, std::int32_t start, std::int32_t count, ZContour& contour,
               double tolerance, bool endsAtSeparator) {
  // The Z of a run is the Z of its first entry (any value when the run is empty).
  const float z = count >= 1 ? zs[start] : 0.0f;
  if (count < kMinimumPoints) {
    reportInvalid(points + start, count, z, endsAtSeparator);
    return false;
  }
  Point& first = points[start];
  Point& last = points[start + count - 1];
  if (!(closureDistance(first, last) <= tolerance)) {
    reportOpen(first, last, count, z);
    return false;
  }
  last = first;
  fill(contour, &first, count, z);
  return true;
}

}  // namespace

std::int32_t assembleContours(Point* points, const float* zs, std::int32_t n, ZContour* contours,
                              std::int32_t capacity, double tolerance) {
  if (points == nullptr || zs == nullptr || contours == nullptr || n < 1) return 0;
  std::int32_t start = 0;
  std::int32_t length = 0;
  std::int32_t filled = 0;
  std::int32_t ended = 0;
  for (std::int32_t i = 0; i < n; ++i) {
    if (isPointEntry(points[i])) {
      ++length;
      continue;
    }
    if (filled >= capacity) return 0;
    ++ended;
    if (!acceptRun(points, zs, start, length, contours[filled], tolerance, true)) return 0;
    ++filled;
    start = i + 1;
    length = 0;
  }
  if (!isPointEntry(points[n - 1])) return ended;

  if (filled >= capacity) return 0;
  ++ended;
  if (!acceptRun(points, zs, start, length, contours[filled], tolerance, false)) return 0;
  return ended;
}

}  // namespace pc
