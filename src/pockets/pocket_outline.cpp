#include "pockets/pocket_model.h"

namespace pc {

namespace {

void appendContour(CheckedArray<Point>& outline, const ZContour& contour) {
  outline.append(kSeparatorPoint);
  for (std::int32_t i = 0; i < contour.pointCount; ++i) outline.append(contour.points[i]);
}

}  // namespace

std::int32_t collectNodeOutline(const ContourNode& node, CheckedArray<Point>& outline, float& z) {
  outline.reset();
  appendContour(outline, *node.contour);
  z = node.contour->z;
  std::int32_t contours = 1;
  for (const ContourNode* island = node.firstChild; island != nullptr; island = island->nextSibling) {
    appendContour(outline, *island->contour);
    ++contours;
  }
  return contours;
}

std::int32_t collectPocketOutline(const Pocket& pocket, CheckedArray<Point>& outline, float& z) {
  return collectNodeOutline(*pocket.node, outline, z);
}

}  // namespace pc
