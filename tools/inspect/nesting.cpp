#include "nesting.h"

#include <algorithm>
#include <cmath>

#include "contours/zcontour.h"
#include "exact_geometry.h"
#include "pocket_files.h"
#include "pockets/pocket_model.h"

namespace pc::inspect {

std::vector<Nesting> programNesting(std::span<const std::vector<Point>> rings, float z) {
  std::vector<std::vector<Point>> copies(rings.begin(), rings.end());
  std::vector<ZContour> contours(rings.size());
  ZLevel level;
  for (std::size_t i = 0; i < copies.size(); ++i) {
    fill(contours[i], copies[i].data(), static_cast<std::int32_t>(copies[i].size()), z);
    addContourToLevel(level, &contours[i]);
  }
  std::vector<Nesting> result(rings.size());
  // Depth-first over the tree, without recursion: a level may nest deeply.
  std::vector<std::pair<const ContourNode*, std::int32_t>> stack;
  for (const ContourNode* n = level.root; n != nullptr; n = n->nextSibling) stack.emplace_back(n, 0);
  while (!stack.empty()) {
    const auto [node, depth] = stack.back();
    stack.pop_back();
    const auto index = static_cast<std::size_t>(node->contour - contours.data());
    result[index].depth = depth;
    result[index].parent =
        node->parent != nullptr ? static_cast<std::int32_t>(node->parent->contour - contours.data()) : -1;
    for (const ContourNode* c = node->firstChild; c != nullptr; c = c->nextSibling) stack.emplace_back(c, depth + 1);
  }
  return result;
}

namespace {

double absoluteArea(const std::vector<Point>& ring) {
  double twice = 0.0;
  const double x0 = ring[0].x, y0 = ring[0].y;
  for (std::size_t k = 0; k + 1 < ring.size(); ++k) {
    twice += (ring[k].x - x0) * (static_cast<double>(ring[k + 1].y) - y0) -
             (ring[k].y - y0) * (static_cast<double>(ring[k + 1].x) - x0);
  }
  return std::fabs(twice / 2.0);
}

// The edges of the level in horizontal rows, so that the containers of a
// point are found by looking only at the edges of its row.
struct RowIndex {
  double y0 = 0.0, height = 1.0;
  std::size_t rows = 1;
  std::vector<std::size_t> start;  // rows + 1 entries
  std::vector<std::pair<std::int32_t, std::int32_t>> edges;  // (contour, edge)

  std::size_t rowOf(double y) const {
    const double r = std::floor((y - y0) / height);
    return static_cast<std::size_t>(std::clamp(r, 0.0, static_cast<double>(rows - 1)));
  }

  explicit RowIndex(std::span<const std::vector<Point>> rings) {
    double lo = INFINITY, hi = -INFINITY;
    std::size_t total = 0;
    for (const auto& r : rings) {
      for (const Point& p : r) {
        lo = std::min(lo, static_cast<double>(p.y));
        hi = std::max(hi, static_cast<double>(p.y));
      }
      total += r.size();
    }
    rows = std::clamp<std::size_t>(static_cast<std::size_t>(std::sqrt(static_cast<double>(total))), 1, 4096);
    y0 = lo;
    height = hi > lo ? (hi - lo) / static_cast<double>(rows) : 1.0;
    std::vector<std::size_t> counts(rows + 1, 0);
    auto each = [&](auto&& visit) {
      for (std::size_t c = 0; c < rings.size(); ++c) {
        for (std::size_t k = 0; k + 1 < rings[c].size(); ++k) {
          const double a = rings[c][k].y, b = rings[c][k + 1].y;
          for (std::size_t row = rowOf(std::min(a, b)); row <= rowOf(std::max(a, b)); ++row) visit(row, c, k);
        }
      }
    };
    each([&](std::size_t row, std::size_t, std::size_t) { ++counts[row + 1]; });
    for (std::size_t r = 0; r < rows; ++r) counts[r + 1] += counts[r];
    start = counts;
    edges.resize(counts[rows]);
    each([&](std::size_t row, std::size_t c, std::size_t k) {
      edges[counts[row]++] = {static_cast<std::int32_t>(c), static_cast<std::int32_t>(k)};
    });
  }
};

}  // namespace

std::vector<Nesting> exactNesting(std::span<const std::vector<Point>> rings) {
  const std::size_t n = rings.size();
  std::vector<Nesting> result(n);
  if (n == 0) return result;
  const RowIndex index(rings);
  std::vector<double> area(n);
  for (std::size_t i = 0; i < n; ++i) area[i] = absoluteArea(rings[i]);
  std::vector<std::uint8_t> parity(n, 0), boundary(n, 0), listed(n, 0);
  std::vector<std::int32_t> touched;
  std::vector<std::vector<std::int32_t>> containers(n);
  for (std::size_t i = 0; i < n; ++i) {
    const Point v = rings[i][0];
    const std::size_t row = index.rowOf(v.y);
    touched.clear();
    for (std::size_t e = index.start[row]; e < index.start[row + 1]; ++e) {
      const auto [c, k] = index.edges[e];
      if (static_cast<std::size_t>(c) == i) continue;
      const Point a = rings[static_cast<std::size_t>(c)][static_cast<std::size_t>(k)];
      const Point b = rings[static_cast<std::size_t>(c)][static_cast<std::size_t>(k) + 1];
      const bool aAbove = a.y > v.y, bAbove = b.y > v.y;
      bool onEdge = false, crosses = false;
      if (aAbove != bAbove) {
        const int o = orientation(a, b, v);
        onEdge = o == 0;
        crosses = (bAbove && o > 0) || (aAbove && o < 0);
      } else if (a.y == v.y && ((b.y == v.y && std::min(a.x, b.x) <= v.x && v.x <= std::max(a.x, b.x)) || a.x == v.x)) {
        onEdge = true;
      }
      if (!onEdge && !crosses) continue;
      const auto j = static_cast<std::size_t>(c);
      if (listed[j] == 0) {
        listed[j] = 1;
        touched.push_back(c);
      }
      if (onEdge) boundary[j] = 1;
      if (crosses) parity[j] ^= 1;
    }
    for (std::int32_t c : touched) {
      const auto j = static_cast<std::size_t>(c);
      const bool inside = boundary[j] ? contourInside(rings[i], rings[j]) : parity[j] != 0;
      if (inside) containers[i].push_back(c);
      parity[j] = boundary[j] = listed[j] = 0;
    }
    std::sort(containers[i].begin(), containers[i].end());
  }
  for (std::size_t i = 0; i < n; ++i) {
    result[i].depth = static_cast<std::int32_t>(containers[i].size());
    std::int32_t parent = -1;
    for (std::int32_t c : containers[i]) {
      if (parent < 0 || area[static_cast<std::size_t>(c)] < area[static_cast<std::size_t>(parent)]) parent = c;
    }
    result[i].parent = parent;
  }
  return result;
}

}  // namespace pc::inspect
