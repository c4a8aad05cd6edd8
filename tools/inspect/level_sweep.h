// Sweep over the edges of one level: every pair of edges of different
// contours (or non-adjacent edges of one contour) whose boxes come within a
// margin of each other is tested exactly for crossing and touching, and for
// distance.
#pragma once

#include <cstdint>
#include <map>
#include <span>
#include <tuple>
#include <vector>

#include "contours/point.h"

namespace pc::inspect {

enum class ContactKind { Cross = 0, Touch = 1, Near = 2 };

struct Contact {
  std::int64_t count = 0;
  double x = 0.0, y = 0.0;  // where it was first seen
  double distance = 0.0;    // smallest distance, for Near
};

// Key: (contour a, contour b, kind) with a <= b.
using ContactMap = std::map<std::tuple<std::int32_t, std::int32_t, int>, Contact>;

// `rings[i]` is contour i closed (last point == first).
ContactMap sweepLevel(std::span<const std::vector<Point>> rings, double nearDistance);

}  // namespace pc::inspect
