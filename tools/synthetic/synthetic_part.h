// A seeded generator of synthetic multi-level contour information files:
// levels x pockets x islands x points per contour, pockets that shrink with
// depth like a machined cavity, islands inside every pocket (inside the
// innermost of its rings when a pocket has several).
#pragma once

#include <cstdint>
#include <string>

namespace pc::synthetic {

struct PartShape {
  std::int32_t levels = 10;
  std::int32_t pockets = 4;             // pockets per level
  std::int32_t islands = 2;             // islands per pocket
  std::int32_t pointsPerContour = 100;  // closing point included
  std::uint32_t seed = 1;
  std::int32_t rings = 1;               // concentric contours per pocket, nested inside each other
};

// Total number of point records the shape produces (separators excluded).
std::int64_t pointCount(const PartShape& shape);

// Writes the file; false when it cannot be written completely.
bool writeSyntheticPart(const PartShape& shape, const std::string& path);

}  // namespace pc::synthetic
