#include "contours/point_loader.h"

#include <cmath>

#include "contours/contour_info_file.h"

namespace pc {

namespace {

// The open contour information file; closed however the loading ends.
class ContourReader {
 public:
  ContourReader() : open_(openContourInfoFile(unit_) == 0) {}
  ~ContourReader() {
    if (open_) closeContourInfoFile(unit_);
  }
  ContourReader(const ContourReader&) = delete;
  ContourReader& operator=(const ContourReader&) = delete;

  bool isOpen() const { return open_; }
  bool next(float& x, float& y, float& z) { return readContourRecord(unit_, x, y, z) == 0; }

 private:
  int unit_ = 0;
  bool open_ = false;
};

bool inXYRange(float x, float y) {
  const double dx = x, dy = y;
  return dx < kContourRecordLimit && dx > -kContourRecordLimit && dy < kContourRecordLimit &&
         dy > -kContourRecordLimit;
}

// Distance in XY: the differences in single precision, then widened.
double distance(float x, float y, const Point& previous) {
  const double dx = static_cast<double>(x - previous.x);
  const double dy = static_cast<double>(y - previous.y);
  return std::sqrt(dx * dx + dy * dy);
}

}  // namespace

std::int32_t loadContourPoints(Point* points, float* zs, std::int32_t capacity, double tolerance) {
  if (points == nullptr || zs == nullptr || capacity < 1) return 0;
  ContourReader reader;
  if (!reader.isOpen()) return 0;

  float x = 0.0f, y = 0.0f, z = 0.0f;
  do {
    if (!reader.next(x, y, z)) return 0;
  } while (!isContourPoint(x, y, z));

  std::int32_t k = 0;
  points[k] = Point{x, y};
  zs[k] = z;
  Point previous = points[k];
  ++k;

  while (reader.next(x, y, z)) {
    if (inXYRange(x, y)) {
      if (distance(x, y, previous) > tolerance) {
        if (k >= capacity) return 0;
        points[k] = Point{x, y};
        zs[k] = z;
        previous = points[k];
        ++k;
      }
      continue;
    }
    // A separator: skip to the next point record, all three values tested.
    do {
      if (!reader.next(x, y, z)) return k;  // trailing separators are not stored
    } while (!isContourPoint(x, y, z));
    if (k >= capacity) return 0;
    points[k] = kSeparatorPoint;
    zs[k] = kSeparatorValue;
    ++k;
    if (k >= capacity) return 0;
    points[k] = Point{x, y};
    zs[k] = z;
    previous = points[k];
    ++k;
  }
  return k;
}

}  // namespace pc
