// EdgeBuckets: the edges of one contour sorted into horizontal slabs, so that
// a point-in-contour test visits only the edges near the point's height. The
// answers are exactly those of pointInContour: every edge that can cross the
// ray is in the slab of the ray, and each is tested by the same arithmetic.
#pragma once

#include <cstdint>
#include <memory>

#include "contours/point.h"
#include "contours/zcontour.h"

namespace pc {

class EdgeBuckets {
 public:
  // Contours below this size are tested edge by edge.
  static constexpr std::int32_t kMinPoints = 64;

  // The index of `contour`, or nullptr when it would not pay (small or flat
  // contour, non-finite coordinates, edges spread over too many slabs) or the
  // memory is not there; the caller then falls back to pointInContour.
  static std::unique_ptr<EdgeBuckets> build(const ZContour& contour);

  // pointInContour(p, contour) for the contour the index was built from.
  bool contains(Point p, const ZContour& contour) const;

 private:
  EdgeBuckets() = default;
  std::int32_t slabOf(double y) const;

  double y0_ = 0.0;
  double scale_ = 0.0;
  std::int32_t slabs_ = 0;
  std::unique_ptr<std::int32_t[]> offsets_;  // slabs_ + 1 starts into edges_
  std::unique_ptr<std::int32_t[]> edges_;    // edge k runs from point k to k + 1
};

}  // namespace pc
