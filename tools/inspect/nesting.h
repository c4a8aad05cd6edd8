// The nesting of one level's contours, twice: as the classifier builds it
// (its own level tree and five-vertex vote) and by exact containment.
#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "contours/point.h"

namespace pc::inspect {

struct Nesting {
  std::int32_t depth = 0;
  std::int32_t parent = -1;  // contour number in the level, -1 at the top
};

// `rings[i]` is contour i closed (last point == first).
std::vector<Nesting> programNesting(std::span<const std::vector<Point>> rings, float z);
std::vector<Nesting> exactNesting(std::span<const std::vector<Point>> rings);

}  // namespace pc::inspect
