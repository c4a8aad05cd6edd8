#include "pockets/chain_index.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <new>

#include "pockets/node_geometry.h"

namespace pc {

namespace {

// Chains shorter than this are scanned entry by entry.
constexpr std::int32_t kGridMinimum = 64;
// A box spread over more cells than this is kept in the overflow list.
constexpr std::int32_t kMaxCellsPerEntry = 16;

}  // namespace

// A uniform grid over the entries' boxes. Each cell keeps the entries that
// meet it in a list linked through `next`; a replaced entry is listed again
// in the cells of its new box (its old cells may keep it: the queries test
// every box exactly and sort what they collect). Cell coordinates are
// monotone in x and y and clamped to the grid, so an entry whose box meets a
// query box (or holds a query point) is in one of the query's cells wherever
// it lies; entries beyond the bounds of the build only crowd border cells.
struct ChainIndex::Grid {
  double x0 = 0.0;
  double y0 = 0.0;
  double x1 = 0.0;
  double y1 = 0.0;
  std::int32_t outside = 0;  // entries added beyond the bounds of the build
  double sx = 0.0;
  double sy = 0.0;
  std::int32_t gx = 1;
  std::int32_t gy = 1;
  std::unique_ptr<std::int32_t[]> head;   // per cell: first item, or -1
  std::unique_ptr<std::int32_t[]> tail;   // per cell: last item
  std::unique_ptr<std::int32_t[]> count;  // per cell: number of items
  std::unique_ptr<std::int32_t[]> entry;  // per item: entry index
  std::unique_ptr<std::int32_t[]> next;   // per item: next item of the cell, or -1
  std::int32_t items = 0;
  std::int32_t itemCapacity = 0;
  std::unique_ptr<std::int32_t[]> overflow;  // entries kept out of the cells
  std::int32_t overflowCount = 0;
  std::int32_t overflowCapacity = 0;

  std::int32_t cellX(double x) const { return cell(x, x0, sx, gx); }
  std::int32_t cellY(double y) const { return cell(y, y0, sy, gy); }
  static std::int32_t cell(double v, double origin, double scale, std::int32_t cells) {
    const double t = (v - origin) * scale;
    if (!(t > 0.0)) return 0;
    if (t >= static_cast<double>(cells)) return cells - 1;
    return static_cast<std::int32_t>(t);
  }

  static std::unique_ptr<Grid> build(const ChainEntry* entries, std::int32_t n);
  bool add(const ChainEntry& e, std::int32_t index);
};

namespace {

bool finiteBox(const ChainEntry& e) {
  return std::isfinite(e.xmin) && std::isfinite(e.xmax) && std::isfinite(e.ymin) && std::isfinite(e.ymax);
}

// The capacity for `needed` values grown from `capacity`, or -1 when too big.
std::int64_t grownCapacity(std::int32_t capacity, std::int64_t needed) {
  const std::int64_t grown = std::max<std::int64_t>(needed, 2 * static_cast<std::int64_t>(capacity));
  return grown > std::numeric_limits<std::int32_t>::max() ? -1 : grown;
}

// A copy of the first `used` values in a block of `capacity`, or null.
std::unique_ptr<std::int32_t[]> regrow(const std::int32_t* values, std::int32_t used, std::int64_t capacity) {
  std::unique_ptr<std::int32_t[]> block(new (std::nothrow) std::int32_t[static_cast<std::size_t>(capacity)]);
  if (block) std::copy(values, values + used, block.get());
  return block;
}

}  // namespace

bool ChainIndex::Grid::add(const ChainEntry& e, std::int32_t index) {
  std::int32_t cx0 = 0, cx1 = 0, cy0 = 0, cy1 = 0;
  bool spread = !finiteBox(e);
  if (!spread) {
    if (e.xmin < x0 || e.xmax > x1 || e.ymin < y0 || e.ymax > y1) ++outside;
    cx0 = cellX(e.xmin);
    cx1 = cellX(e.xmax);
    cy0 = cellY(e.ymin);
    cy1 = cellY(e.ymax);
    spread = static_cast<std::int64_t>(cx1 - cx0 + 1) * (cy1 - cy0 + 1) > kMaxCellsPerEntry;
  }
  if (spread) {
    if (overflowCount == overflowCapacity) {
      const std::int64_t capacity = grownCapacity(overflowCapacity, overflowCount + 1);
      if (capacity < 0 || !(overflow = regrow(overflow.get(), overflowCount, capacity))) return false;
      overflowCapacity = static_cast<std::int32_t>(capacity);
    }
    overflow[overflowCount++] = index;
    return true;
  }
  const std::int64_t needed = items + static_cast<std::int64_t>(cx1 - cx0 + 1) * (cy1 - cy0 + 1);
  if (needed > itemCapacity) {
    const std::int64_t capacity = grownCapacity(itemCapacity, needed);
    if (capacity < 0) return false;
    entry = regrow(entry.get(), items, capacity);
    next = regrow(next.get(), items, capacity);
    if (!entry || !next) return false;
    itemCapacity = static_cast<std::int32_t>(capacity);
  }
  for (std::int32_t cy = cy0; cy <= cy1; ++cy) {
    for (std::int32_t cx = cx0; cx <= cx1; ++cx) {
      const std::size_t c = static_cast<std::size_t>(cy) * gx + cx;
      entry[items] = index;
      next[items] = -1;
      if (head[c] < 0) {
        head[c] = items;
      } else {
        next[tail[c]] = items;
      }
      tail[c] = items;
      ++count[c];
      ++items;
    }
  }
  return true;
}

std::unique_ptr<ChainIndex::Grid> ChainIndex::Grid::build(const ChainEntry* entries, std::int32_t n) {
  double xmin = std::numeric_limits<double>::infinity();
  double ymin = xmin;
  double xmax = -xmin;
  double ymax = -xmin;
  for (std::int32_t i = 0; i < n; ++i) {
    const ChainEntry& e = entries[i];
    if (!finiteBox(e)) continue;  // such boxes go to the overflow list
    xmin = std::min(xmin, static_cast<double>(e.xmin));
    xmax = std::max(xmax, static_cast<double>(e.xmax));
    ymin = std::min(ymin, static_cast<double>(e.ymin));
    ymax = std::max(ymax, static_cast<double>(e.ymax));
  }
  std::unique_ptr<Grid> g(new (std::nothrow) Grid);
  if (!g || !(xmax >= xmin) || !(ymax >= ymin)) return nullptr;
  // About one entry per cell for the chain doubled, cells roughly square.
  const double w = xmax - xmin;
  const double h = ymax - ymin;
  const double cells = std::max(1.0, static_cast<double>(n));
  double gx = (w > 0.0 && h > 0.0) ? std::sqrt(cells * w / h) : (w > 0.0 ? cells : 1.0);
  gx = std::clamp(std::round(gx), 1.0, cells);
  const double gy = std::clamp(std::round(cells / gx), 1.0, cells);
  g->gx = static_cast<std::int32_t>(gx);
  g->gy = static_cast<std::int32_t>(gy);
  g->x0 = xmin;
  g->y0 = ymin;
  g->x1 = xmax;
  g->y1 = ymax;
  g->sx = w > 0.0 ? gx / w : 0.0;
  g->sy = h > 0.0 ? gy / h : 0.0;
  const std::size_t cellCount = static_cast<std::size_t>(g->gx) * static_cast<std::size_t>(g->gy);
  g->head.reset(new (std::nothrow) std::int32_t[cellCount]);
  g->tail.reset(new (std::nothrow) std::int32_t[cellCount]);
  g->count.reset(new (std::nothrow) std::int32_t[cellCount]());
  if (!g->head || !g->tail || !g->count) return nullptr;
  std::fill(g->head.get(), g->head.get() + cellCount, -1);
  for (std::int32_t i = 0; i < n; ++i) {
    if (!g->add(entries[i], i)) return nullptr;
  }
  g->outside = 0;
  return g;
}

ChainIndex::ChainIndex() = default;
ChainIndex::~ChainIndex() = default;

void ChainIndex::append(ContourNode* node) {
  if (size_ == capacity_) {
    if (capacity_ > std::numeric_limits<std::int32_t>::max() / 2) modelAllocationFailure();
    const std::int32_t grown = std::max<std::int32_t>(16, capacity_ * 2);
    std::unique_ptr<ChainEntry[]> block(new (std::nothrow) ChainEntry[static_cast<std::size_t>(grown)]);
    if (!block) modelAllocationFailure();
    std::copy(entries_.get(), entries_.get() + size_, block.get());
    entries_ = std::move(block);
    capacity_ = grown;
  }
  const ZContour& c = *node->contour;
  entries_[size_] = ChainEntry{c.xmin, c.xmax, c.ymin, c.ymax, node};
  // A grid that cannot take the entry is dropped: scans then read every entry.
  if (grid_ && !grid_->add(entries_[size_], size_)) grid_.reset();
  ++size_;
}

void ChainIndex::replace(std::int32_t i, ContourNode* node) {
  const ZContour& c = *node->contour;
  entries_[i] = ChainEntry{c.xmin, c.xmax, c.ymin, c.ymax, node};
  if (grid_ && !grid_->add(entries_[i], i)) grid_.reset();
}

void ChainIndex::remove(const std::int32_t* indices, std::int32_t count) {
  if (count <= 0) return;
  std::int32_t write = indices[0];
  std::int32_t next = 0;
  for (std::int32_t read = indices[0]; read < size_; ++read) {
    if (next < count && indices[next] == read) {
      ++next;
    } else {
      entries_[write++] = entries_[read];
    }
  }
  size_ = write;
  // Indices moved: the grid is made again on the next query.
  grid_.reset();
  gridded_ = 0;
}

ChainIndex* ChainIndex::fromLinks(ContourNode* head) {
  ChainIndex* index = new (std::nothrow) ChainIndex;
  if (index == nullptr) modelAllocationFailure();
  for (ContourNode* node = head; node != nullptr; node = node->nextSibling) index->append(node);
  return index;
}

// The grid is made again, finer, each time the chain has doubled since it
// was made, and wider when many new entries fell beyond its bounds (they
// crowd its border cells); in between, new entries are added to its cells.
void ChainIndex::refreshGrid() {
  if (size_ < kGridMinimum) return;
  const bool grown = gridded_ == 0 || size_ >= 2 * gridded_;
  const bool crowded = grid_ && grid_->outside > gridded_ / 4 + 8;
  if (!grown && !crowded) return;
  grid_ = Grid::build(entries_.get(), size_);
  gridded_ = size_;
}

bool ChainIndex::reserveScratch(std::int64_t n) {
  if (n <= scratchCapacity_) return true;
  const std::int64_t grown = std::max<std::int64_t>(n, 2 * scratchCapacity_);
  if (grown > std::numeric_limits<std::int32_t>::max()) return false;
  scratch_.reset(new (std::nothrow) std::int32_t[static_cast<std::size_t>(grown)]);
  scratchCapacity_ = scratch_ ? grown : 0;
  return scratch_ != nullptr;
}

std::int32_t ChainIndex::candidatesNotApart(const ZContour& c) {
  refreshGrid();
  if (!grid_ || !std::isfinite(c.xmin) || !std::isfinite(c.xmax) || !std::isfinite(c.ymin) ||
      !std::isfinite(c.ymax)) {
    return -1;
  }
  const Grid& g = *grid_;
  const std::int32_t cx0 = g.cellX(c.xmin);
  const std::int32_t cx1 = g.cellX(c.xmax);
  const std::int32_t cy0 = g.cellY(c.ymin);
  const std::int32_t cy1 = g.cellY(c.ymax);
  // A box over much of the grid is cheaper to answer by a plain scan.
  if (static_cast<std::int64_t>(cx1 - cx0 + 1) * (cy1 - cy0 + 1) * 2 > size_) return -1;
  std::int64_t bound = g.overflowCount;
  for (std::int32_t cy = cy0; cy <= cy1; ++cy) {
    for (std::int32_t cx = cx0; cx <= cx1; ++cx) bound += g.count[static_cast<std::size_t>(cy) * g.gx + cx];
  }
  if (bound * 2 > size_ || !reserveScratch(bound)) return -1;
  std::int32_t n = 0;
  for (std::int32_t cy = cy0; cy <= cy1; ++cy) {
    for (std::int32_t cx = cx0; cx <= cx1; ++cx) {
      for (std::int32_t k = g.head[static_cast<std::size_t>(cy) * g.gx + cx]; k >= 0; k = g.next[k]) {
        scratch_[n++] = g.entry[k];
      }
    }
  }
  for (std::int32_t k = 0; k < g.overflowCount; ++k) scratch_[n++] = g.overflow[k];
  std::sort(scratch_.get(), scratch_.get() + n);
  return static_cast<std::int32_t>(std::unique(scratch_.get(), scratch_.get() + n) - scratch_.get());
}

std::int32_t ChainIndex::candidatesHolding(Point p) {
  refreshGrid();
  // No contour holds an undefined point: the point test finds no crossing.
  if (std::isnan(p.x) || std::isnan(p.y)) return 0;
  if (!grid_) return -1;
  const Grid& g = *grid_;
  const std::size_t cell = static_cast<std::size_t>(g.cellY(p.y)) * g.gx + g.cellX(p.x);
  const std::int64_t bound = g.count[cell] + g.overflowCount;
  if (bound * 2 > size_ || !reserveScratch(bound)) return -1;
  std::int32_t n = 0;
  for (std::int32_t k = g.head[cell]; k >= 0; k = g.next[k]) scratch_[n++] = g.entry[k];
  for (std::int32_t k = 0; k < g.overflowCount; ++k) scratch_[n++] = g.overflow[k];
  std::sort(scratch_.get(), scratch_.get() + n);
  return static_cast<std::int32_t>(std::unique(scratch_.get(), scratch_.get() + n) - scratch_.get());
}

}  // namespace pc
