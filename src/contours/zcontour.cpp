#include "contours/zcontour.h"

namespace pc {

void fill(ZContour& contour, Point* firstPoint, std::int32_t pointCount, float z) {
  contour.points = firstPoint;
  contour.pointCount = pointCount;
  contour.z = z;
  if (pointCount < 1) return;
  contour.xmin = contour.xmax = firstPoint[0].x;
  contour.ymin = contour.ymax = firstPoint[0].y;
  for (std::int32_t i = 1; i < pointCount; ++i) {
    const Point& p = firstPoint[i];
    if (p.x < contour.xmin) contour.xmin = p.x;
    if (p.x > contour.xmax) contour.xmax = p.x;
    if (p.y < contour.ymin) contour.ymin = p.y;
    if (p.y > contour.ymax) contour.ymax = p.y;
  }
}

}  // namespace pc
