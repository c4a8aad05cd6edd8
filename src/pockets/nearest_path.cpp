#include "pockets/nearest_path.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <memory>
#include <new>
#include <utility>

namespace pc {

namespace {

// Squared distance between two centroids, widened to double.
inline double squaredDistance(const Point& a, double cx, double cy) {
  const double dx = static_cast<double>(a.x) - cx;
  const double dy = static_cast<double>(a.y) - cy;
  return dx * dx + dy * dy;
}

template <typename T>
std::unique_ptr<T[]> block(std::size_t n) {
  return std::unique_ptr<T[]>(new (std::nothrow) T[std::max<std::size_t>(n, 1)]);
}

// The points not yet taken, by cell. Points are named by their index in the
// initial order (id); `posOf` gives an id's current index.
class PointGrid {
 public:
  bool build(const Point* points, const std::int32_t* ids, std::int32_t n) {
    double xmin = std::numeric_limits<double>::infinity();
    double ymin = xmin;
    double xmax = -xmin;
    double ymax = -xmin;
    for (std::int32_t k = 0; k < n; ++k) {
      const Point& p = points[ids[k]];
      xmin = std::min(xmin, static_cast<double>(p.x));
      xmax = std::max(xmax, static_cast<double>(p.x));
      ymin = std::min(ymin, static_cast<double>(p.y));
      ymax = std::max(ymax, static_cast<double>(p.y));
    }
    const double w = xmax - xmin;
    const double h = ymax - ymin;
    const double cells = std::max(1.0, n / 2.0);
    double gx = (w > 0.0 && h > 0.0) ? std::sqrt(cells * w / h) : (w > 0.0 ? cells : 1.0);
    gx = std::clamp(std::round(gx), 1.0, cells);
    const double gy = std::clamp(std::round(cells / gx), 1.0, cells);
    gx_ = static_cast<std::int32_t>(gx);
    gy_ = static_cast<std::int32_t>(gy);
    x0_ = xmin;
    y0_ = ymin;
    cw_ = w > 0.0 ? w / gx : 0.0;
    ch_ = h > 0.0 ? h / gy : 0.0;
    sx_ = w > 0.0 ? gx / w : 0.0;
    sy_ = h > 0.0 ? gy / h : 0.0;
    // Cell boundaries are known up to rounding far below this.
    margin_ = 1e-9 * (std::fabs(xmin) + std::fabs(ymin) + w + h);
    live_ = n;

    const std::size_t cellCount = static_cast<std::size_t>(gx_) * static_cast<std::size_t>(gy_);
    start_ = block<std::int32_t>(cellCount + 1);
    count_ = block<std::int32_t>(cellCount);
    items_ = block<std::int32_t>(static_cast<std::size_t>(n));
    if (!start_ || !count_ || !items_) return false;
    std::fill(start_.get(), start_.get() + cellCount + 1, 0);
    std::fill(count_.get(), count_.get() + cellCount, 0);
    for (std::int32_t k = 0; k < n; ++k) ++count_[cellOf(points[ids[k]])];
    for (std::size_t c = 0; c < cellCount; ++c) start_[c + 1] = start_[c] + count_[c];
    std::fill(count_.get(), count_.get() + cellCount, 0);
    for (std::int32_t k = 0; k < n; ++k) {
      const std::size_t c = cellOf(points[ids[k]]);
      const std::int32_t at = start_[c] + count_[c]++;
      items_[at] = ids[k];
      slot_[ids[k]] = at;
    }
    return true;
  }

  bool prepare(std::int32_t total) {
    slot_ = block<std::int32_t>(static_cast<std::size_t>(total));
    return slot_ != nullptr;
  }

  void remove(const Point* points, std::int32_t id) {
    const std::size_t c = cellOf(points[id]);
    const std::int32_t last = start_[c] + --count_[c];
    const std::int32_t at = slot_[id];
    items_[at] = items_[last];
    slot_[items_[at]] = at;
    --live_;
  }

  std::int32_t live() const { return live_; }
  std::size_t cellCount() const { return static_cast<std::size_t>(gx_) * static_cast<std::size_t>(gy_); }

  // The live id nearest to (qx, qy), the lowest current index among equally
  // near ones.
  template <typename PosOf>
  std::int32_t nearest(const Point* points, const Point& q, PosOf posOf) const {
    const double qx = q.x;
    const double qy = q.y;
    const std::int32_t qcx = cell(qx, x0_, sx_, gx_);
    const std::int32_t qcy = cell(qy, y0_, sy_, gy_);
    const std::int32_t maxRing = std::max(std::max(qcx, gx_ - 1 - qcx), std::max(qcy, gy_ - 1 - qcy));
    std::int32_t best = -1;
    std::int32_t bestPos = 0;
    double bestDistance = 0.0;
    auto consider = [&](std::int32_t cx, std::int32_t cy) {
      const std::size_t c = static_cast<std::size_t>(cy) * gx_ + cx;
      for (std::int32_t k = start_[c]; k < start_[c] + count_[c]; ++k) {
        const std::int32_t id = items_[k];
        const double d = squaredDistance(points[id], qx, qy);
        const std::int32_t pos = posOf(id);
        if (best < 0 || d < bestDistance || (d == bestDistance && pos < bestPos)) {
          best = id;
          bestPos = pos;
          bestDistance = d;
        }
      }
    };
    for (std::int32_t r = 0; r <= maxRing; ++r) {
      const std::int32_t xa = qcx - r;
      const std::int32_t xb = qcx + r;
      const std::int32_t ya = qcy - r;
      const std::int32_t yb = qcy + r;
      for (std::int32_t cx = std::max(xa, 0); cx <= std::min(xb, gx_ - 1); ++cx) {
        if (ya >= 0) consider(cx, ya);
        if (yb < gy_ && yb != ya) consider(cx, yb);
      }
      for (std::int32_t cy = std::max(ya + 1, 0); cy <= std::min(yb - 1, gy_ - 1); ++cy) {
        if (xa >= 0) consider(xa, cy);
        if (xb < gx_ && xb != xa) consider(xb, cy);
      }
      if (best < 0) continue;
      // Points outside the cells seen so far are at least `reach` away.
      double reach = std::numeric_limits<double>::infinity();
      if (xa > 0) reach = std::min(reach, qx - (x0_ + xa * cw_));
      if (xb < gx_ - 1) reach = std::min(reach, x0_ + (xb + 1) * cw_ - qx);
      if (ya > 0) reach = std::min(reach, qy - (y0_ + ya * ch_));
      if (yb < gy_ - 1) reach = std::min(reach, y0_ + (yb + 1) * ch_ - qy);
      reach -= margin_;
      if (reach > 0.0 && reach * reach > bestDistance * (1.0 + 1e-9)) break;
    }
    return best;
  }

 private:
  static std::int32_t cell(double v, double origin, double scale, std::int32_t cells) {
    const double t = (v - origin) * scale;
    if (!(t > 0.0)) return 0;
    if (t >= static_cast<double>(cells)) return cells - 1;
    return static_cast<std::int32_t>(t);
  }
  std::size_t cellOf(const Point& p) const {
    return static_cast<std::size_t>(cell(p.y, y0_, sy_, gy_)) * gx_ + cell(p.x, x0_, sx_, gx_);
  }

  double x0_ = 0.0, y0_ = 0.0, cw_ = 0.0, ch_ = 0.0, sx_ = 0.0, sy_ = 0.0, margin_ = 0.0;
  std::int32_t gx_ = 1, gy_ = 1, live_ = 0;
  std::unique_ptr<std::int32_t[]> start_, count_, items_, slot_;
};

}  // namespace

void moveLeftmostFirst(Pocket** pockets, Point* centroids, std::int32_t count) {
  std::int32_t start = 0;
  for (std::int32_t i = 1; i < count; ++i) {
    if (centroids[i].x < centroids[start].x) start = i;
  }
  if (start != 0) {
    std::swap(pockets[0], pockets[start]);
    std::swap(centroids[0], centroids[start]);
  }
}

void nearestPathByScan(Pocket** pockets, Point* c, std::int32_t count) {
  for (std::int32_t i = 1; i < count; ++i) {
    const double cx = c[i - 1].x;
    const double cy = c[i - 1].y;
    std::int32_t nearest = i;
    double nearestDistance = squaredDistance(c[i], cx, cy);
    for (std::int32_t j = i + 1; j < count; ++j) {
      const double d = squaredDistance(c[j], cx, cy);
      if (d < nearestDistance) {
        nearest = j;
        nearestDistance = d;
      }
    }
    if (nearest != i) {
      std::swap(pockets[i], pockets[nearest]);
      std::swap(c[i], c[nearest]);
    }
  }
}

bool nearestPathByGrid(Pocket** pockets, Point* c, std::int32_t count) {
  if (count < 2) return true;
  for (std::int32_t i = 0; i < count; ++i) {
    // Distances must be plain numbers for the skipping to be safe.
    if (!(std::fabs(c[i].x) < 1e15f) || !(std::fabs(c[i].y) < 1e15f)) return false;
  }
  const auto n = static_cast<std::size_t>(count);
  std::unique_ptr<Point[]> points = block<Point>(n);
  std::unique_ptr<Pocket*[]> owners = block<Pocket*>(n);
  std::unique_ptr<std::int32_t[]> idAt = block<std::int32_t>(n);
  std::unique_ptr<std::int32_t[]> posOf = block<std::int32_t>(n);
  PointGrid grid;
  if (!points || !owners || !idAt || !posOf || !grid.prepare(count)) return false;
  for (std::int32_t i = 0; i < count; ++i) {
    points[i] = c[i];
    owners[i] = pockets[i];
    idAt[i] = i;
    posOf[i] = i;
  }
  if (!grid.build(points.get(), idAt.get() + 1, count - 1)) return false;

  auto position = [&posOf](std::int32_t id) { return posOf[id]; };
  for (std::int32_t i = 1; i < count; ++i) {
    // Fewer live points than cells: a smaller grid keeps the searches short.
    if (grid.live() >= 64 && static_cast<std::size_t>(grid.live()) * 4 < grid.cellCount()) {
      if (!grid.build(points.get(), idAt.get() + i, count - i)) return false;
    }
    const std::int32_t winner = grid.nearest(points.get(), points[idAt[i - 1]], position);
    grid.remove(points.get(), winner);
    const std::int32_t from = posOf[winner];
    if (from != i) {
      const std::int32_t displaced = idAt[i];
      idAt[i] = winner;
      idAt[from] = displaced;
      posOf[winner] = i;
      posOf[displaced] = from;
    }
  }
  for (std::int32_t i = 0; i < count; ++i) {
    pockets[i] = owners[idAt[i]];
    c[i] = points[idAt[i]];
  }
  return true;
}

}  // namespace pc
