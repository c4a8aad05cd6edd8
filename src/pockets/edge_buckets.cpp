#include "pockets/edge_buckets.h"

#include <algorithm>
#include <cmath>
#include <new>

#include "pockets/contour_geometry.h"

namespace pc {

namespace {

// An edge can cross a ray up to one tolerance below its lower end (an end
// within the tolerance is moved above the ray); twice that keeps rounding out.
constexpr double kSlabMargin = 2.0 * kGeometryEpsilon;
constexpr std::int32_t kEdgesPerSlab = 8;
constexpr std::int32_t kMaxSlabs = 1 << 20;

}  // namespace

// Monotone in y, which is all the correctness needs: a y between two heights
// falls in a slab between theirs.
std::int32_t EdgeBuckets::slabOf(double y) const {
  const double t = (y - y0_) * scale_;
  if (!(t > 0.0)) return 0;
  if (t >= static_cast<double>(slabs_)) return slabs_ - 1;
  return static_cast<std::int32_t>(t);
}

std::unique_ptr<EdgeBuckets> EdgeBuckets::build(const ZContour& contour) {
  const std::int32_t n = contour.pointCount;
  if (n < kMinPoints || contour.points == nullptr) return nullptr;
  const double ymin = contour.ymin;
  const double ymax = contour.ymax;
  if (!std::isfinite(ymin) || !std::isfinite(ymax) || !(ymax > ymin)) return nullptr;
  for (std::int32_t i = 0; i < n; ++i) {
    if (!std::isfinite(contour.points[i].x) || !std::isfinite(contour.points[i].y)) return nullptr;
  }
  std::unique_ptr<EdgeBuckets> index(new (std::nothrow) EdgeBuckets);
  if (!index) return nullptr;
  index->slabs_ = std::clamp((n - 1) / kEdgesPerSlab, 1, kMaxSlabs);
  index->y0_ = ymin;
  index->scale_ = static_cast<double>(index->slabs_) / (ymax - ymin);
  const std::int32_t slabs = index->slabs_;
  index->offsets_.reset(new (std::nothrow) std::int32_t[static_cast<std::size_t>(slabs) + 1]());
  if (!index->offsets_) return nullptr;
  std::int32_t* offsets = index->offsets_.get();

  // First pass: count the edges of each slab; an edge spread over too many
  // slabs (long edges on a finely cut contour) makes the index not worth it.
  const std::int64_t limit = 4 * static_cast<std::int64_t>(n) + slabs;
  std::int64_t total = 0;
  for (std::int32_t k = 0; k + 1 < n; ++k) {
    const double ya = contour.points[k].y;
    const double yb = contour.points[k + 1].y;
    const std::int32_t first = index->slabOf(std::min(ya, yb) - kSlabMargin);
    const std::int32_t last = index->slabOf(std::max(ya, yb) + kSlabMargin);
    total += last - first + 1;
    if (total > limit) return nullptr;
    for (std::int32_t s = first; s <= last; ++s) ++offsets[s + 1];
  }
  for (std::int32_t s = 0; s < slabs; ++s) offsets[s + 1] += offsets[s];
  index->edges_.reset(new (std::nothrow) std::int32_t[static_cast<std::size_t>(total)]);
  if (!index->edges_) return nullptr;

  // Second pass: fill, edges in increasing order within each slab.
  std::unique_ptr<std::int32_t[]> fillAt(new (std::nothrow) std::int32_t[static_cast<std::size_t>(slabs)]);
  if (!fillAt) return nullptr;
  std::copy(offsets, offsets + slabs, fillAt.get());
  for (std::int32_t k = 0; k + 1 < n; ++k) {
    const double ya = contour.points[k].y;
    const double yb = contour.points[k + 1].y;
    const std::int32_t first = index->slabOf(std::min(ya, yb) - kSlabMargin);
    const std::int32_t last = index->slabOf(std::max(ya, yb) + kSlabMargin);
    for (std::int32_t s = first; s <= last; ++s) index->edges_[fillAt[s]++] = k;
  }
  return index;
}

bool EdgeBuckets::contains(Point p, const ZContour& contour) const {
  const double px = p.x;
  const double py = p.y;
  if (!pointInBox(px, py, contour)) return false;
  // No edge crosses a ray at an undefined height.
  if (std::isnan(py)) return false;
  const std::int32_t s = slabOf(py);
  const Point* points = contour.points;
  const double below = py - 2.0 * kGeometryEpsilon;
  bool inside = false;
  for (std::int32_t i = offsets_[s]; i < offsets_[s + 1]; ++i) {
    const std::int32_t k = edges_[i];
    if (edgeMayCross(points[k].y, points[k + 1].y, py, below) &&
        edgeCrossesRay(points[k], points[k + 1], px, py)) {
      inside = !inside;
    }
  }
  return inside;
}

}  // namespace pc
