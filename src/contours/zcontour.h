// ZContour: one closed contour at one Z, the shared contour record of pocket
// building, classification and output. It points into the run's point array
// and owns nothing.
#pragma once

#include <cstdint>

#include "contours/point.h"

namespace pc {

struct ZContour {
  Point* points = nullptr;        // first point, inside the run's point array
  std::int32_t pointCount = 0;    // closing point included; last == first
  float xmin = 0.0f;
  float xmax = 0.0f;
  float ymin = 0.0f;
  float ymax = 0.0f;
  float z = 0.0f;                 // Z of the contour's first point
};

// Sets points, pointCount and z and scans all points for the bounding box
// (single-precision comparisons, starting from the first point).
void fill(ZContour& contour, Point* firstPoint, std::int32_t pointCount, float z);

}  // namespace pc
