// ChainIndex: a compact copy of one long sibling chain of a level's tree, the
// boxes and nodes in chain order, with a grid over the boxes once the chain
// is long. The scans find the siblings whose box can matter in chain order
// without visiting the others. Their box tests are exactly the
// single-precision rejections of the contour relation and of the point test,
// so a scan visits the same siblings, in the same order, as a walk over the
// chain that applied those tests to every sibling.
#pragma once

#include <algorithm>
#include <cstdint>
#include <memory>

#include "pockets/pocket_model.h"

namespace pc {

struct ChainEntry {
  float xmin;
  float xmax;
  float ymin;
  float ymax;
  ContourNode* node;
};

class ChainIndex {
 public:
  ChainIndex();
  ~ChainIndex();
  ChainIndex(const ChainIndex&) = delete;
  ChainIndex& operator=(const ChainIndex&) = delete;

  // The chain starting at `head`, read through its links (empty for null).
  static ChainIndex* fromLinks(ContourNode* head);

  std::int32_t size() const { return size_; }
  const ChainEntry& operator[](std::int32_t i) const { return entries_[i]; }
  void append(ContourNode* node);
  // The node at index i is replaced by `node` (a node enclosing it).
  void replace(std::int32_t i, ContourNode* node);
  // Removes the entries at the given ascending indices.
  void remove(const std::int32_t* indices, std::int32_t count);

  // Calls accept(i) for the entries from index `from` on whose box is not
  // apart from the box of `c` (touching counts as not apart), in chain
  // order, until accept returns true; returns that index, or size() when
  // none accepted.
  template <typename Accept>
  std::int32_t firstNotApart(const ZContour& c, std::int32_t from, Accept accept) {
    const std::int32_t n = candidatesNotApart(c);
    return visit(n, from, accept, [&](const ChainEntry& e) {
      return !(e.xmin > c.xmax || e.ymin > c.ymax || c.xmin > e.xmax || c.ymin > e.ymax);
    });
  }

  // The same for the entries whose box holds p, edges included.
  template <typename Accept>
  std::int32_t firstHolding(Point p, Accept accept) {
    const std::int32_t n = candidatesHolding(p);
    return visit(n, 0, accept, [&](const ChainEntry& e) {
      return !(e.xmin > p.x || p.x > e.xmax || e.ymin > p.y || p.y > e.ymax);
    });
  }

 private:
  struct Grid;

  // Fill scratch_ with the ascending indices that may pass the box test and
  // return their number, or -1 when every entry has to be looked at. The
  // scratch is read by the visit that follows, before any other query.
  std::int32_t candidatesNotApart(const ZContour& c);
  std::int32_t candidatesHolding(Point p);
  void refreshGrid();
  bool reserveScratch(std::int64_t n);

  template <typename Accept, typename Passes>
  std::int32_t visit(std::int32_t candidates, std::int32_t from, Accept& accept, Passes passes) {
    if (candidates < 0) {
      for (std::int32_t i = from; i < size_; ++i) {
        if (passes(entries_[i]) && accept(i)) return i;
      }
      return size_;
    }
    const std::int32_t* begin = scratch_.get();
    const std::int32_t* end = begin + candidates;
    for (const std::int32_t* k = std::lower_bound(begin, end, from); k != end; ++k) {
      if (passes(entries_[*k]) && accept(*k)) return *k;
    }
    return size_;
  }

  std::int32_t size_ = 0;
  std::int32_t capacity_ = 0;
  std::unique_ptr<ChainEntry[]> entries_;
  std::unique_ptr<Grid> grid_;
  std::int32_t gridded_ = 0;  // chain length at the grid's last build
  std::unique_ptr<std::int32_t[]> scratch_;
  std::int64_t scratchCapacity_ = 0;
};

}  // namespace pc
