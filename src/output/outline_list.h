// The pocket outline list shared by the outputs: a point list holding one
// pocket outline at a time (separator, outer contour, then separator and
// points of each island).
#pragma once

#include <cstdint>

#include "contours/point.h"
#include "driver/checked_array.h"
#include "output/outline_check.h"
#include "pockets/pocket_model.h"

namespace pc {

inline constexpr std::int32_t kOutlineInitialCapacity = 50000;
inline constexpr std::int32_t kOutlineGrowStep = 10000;

// Number of entries collectNodeOutline gives for `node`.
std::int64_t nodeOutlineSize(const ContourNode& node);

// Capacity for a list that must hold `entries` entries: at least the usual
// 50000. Growing by the fixed step through a pocket of millions of points
// would copy the list hundreds of times, so the outputs size it up front.
std::int32_t outlineCapacityFor(std::int64_t entries);

// The outline list of an output, large enough for the largest outline of
// `pockets`.
CheckedArray<Point> makeOutlineList(const CheckedArray<Pocket*>& pockets);

// Hands each pocket's checked outline and its Z to `write`, in list order;
// pockets without a contour are passed over. False as soon as an outline
// fails the check (after its report): the caller then closes its file with
// the pockets written so far.
template <typename Write>
bool writeCheckedOutlines(const CheckedArray<Pocket*>& pockets, CheckedArray<Point>& outline, Write write) {
  for (std::int32_t i = 0; i < pockets.count; ++i) {
    float z = 0.0f;
    if (collectPocketOutline(*pockets.data[i], outline, z) < 1) continue;
    if (checkOutline(outline.data, outline.count, z, kOutlineClosureTolerance) != 0) return false;
    write(z);
  }
  return true;
}

}  // namespace pc
