#include "level_sweep.h"

#include <algorithm>

#include "exact_geometry.h"

namespace pc::inspect {

namespace {

struct Edge {
  float xlo, xhi, ylo, yhi;
  std::int32_t contour;
  std::int32_t index;  // edge k joins points k and k + 1
};

void record(ContactMap& found, std::int32_t a, std::int32_t b, ContactKind kind, double x, double y, double d) {
  if (a > b) std::swap(a, b);
  Contact& c = found[{a, b, static_cast<int>(kind)}];
  if (c.count == 0 || d < c.distance) c.distance = d;
  if (c.count == 0) {
    c.x = x;
    c.y = y;
  }
  ++c.count;
}

}  // namespace

ContactMap sweepLevel(std::span<const std::vector<Point>> rings, double nearDistance) {
  std::vector<Edge> edges;
  std::size_t total = 0;
  for (const auto& r : rings) total += r.size();
  edges.reserve(total);
  for (std::size_t c = 0; c < rings.size(); ++c) {
    const auto& r = rings[c];
    for (std::size_t k = 0; k + 1 < r.size(); ++k) {
      const Point a = r[k], b = r[k + 1];
      if (a.x == b.x && a.y == b.y) continue;  // no edge
      edges.push_back(Edge{std::min(a.x, b.x), std::max(a.x, b.x), std::min(a.y, b.y), std::max(a.y, b.y),
                           static_cast<std::int32_t>(c), static_cast<std::int32_t>(k)});
    }
  }
  std::sort(edges.begin(), edges.end(), [](const Edge& l, const Edge& r) {
    return l.xlo != r.xlo ? l.xlo < r.xlo : l.contour != r.contour ? l.contour < r.contour : l.index < r.index;
  });

  ContactMap found;
  std::vector<std::size_t> active;
  for (std::size_t i = 0; i < edges.size(); ++i) {
    const Edge& s = edges[i];
    const auto& rs = rings[static_cast<std::size_t>(s.contour)];
    const Point a = rs[static_cast<std::size_t>(s.index)], b = rs[static_cast<std::size_t>(s.index) + 1];
    std::size_t kept = 0;
    for (std::size_t j : active) {
      const Edge& t = edges[j];
      if (static_cast<double>(t.xhi) + nearDistance < s.xlo) continue;  // behind the sweep for good
      active[kept++] = j;
      if (static_cast<double>(t.ylo) > static_cast<double>(s.yhi) + nearDistance ||
          static_cast<double>(s.ylo) > static_cast<double>(t.yhi) + nearDistance) {
        continue;
      }
      const bool same = t.contour == s.contour;
      const auto last = static_cast<std::int32_t>(rs.size()) - 2;  // index of the closing edge
      if (same && (std::abs(t.index - s.index) == 1 || (std::min(t.index, s.index) == 0 &&
                                                          std::max(t.index, s.index) == last))) {
        continue;  // neighbours along the contour share their point
      }
      const auto& rt = rings[static_cast<std::size_t>(t.contour)];
      const Point c = rt[static_cast<std::size_t>(t.index)], d = rt[static_cast<std::size_t>(t.index) + 1];
      const SegmentContact contact = segmentContact(a, b, c, d);
      if (contact == SegmentContact::Cross) {
        // Where they cross, for the report.
        const double rx = static_cast<double>(b.x) - a.x, ry = static_cast<double>(b.y) - a.y;
        const double sx = static_cast<double>(d.x) - c.x, sy = static_cast<double>(d.y) - c.y;
        const double den = rx * sy - ry * sx;
        const double u = den != 0.0 ? ((c.x - static_cast<double>(a.x)) * sy - (c.y - static_cast<double>(a.y)) * sx) / den : 0.0;
        record(found, s.contour, t.contour, ContactKind::Cross, a.x + u * rx, a.y + u * ry, 0.0);
      } else if (contact == SegmentContact::Touch) {
        record(found, s.contour, t.contour, ContactKind::Touch, a.x, a.y, 0.0);
      } else if (!same) {
        const double dist = segmentDistance(a, b, c, d);
        if (dist < nearDistance) record(found, s.contour, t.contour, ContactKind::Near, a.x, a.y, dist);
      }
    }
    active.resize(kept);
    active.push_back(i);
  }
  return found;
}

}  // namespace pc::inspect
