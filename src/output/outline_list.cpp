#include "output/outline_list.h"

#include <algorithm>
#include <limits>

namespace pc {

std::int64_t nodeOutlineSize(const ContourNode& node) {
  std::int64_t size = 1 + std::int64_t{node.contour->pointCount};
  for (const ContourNode* island = node.firstChild; island != nullptr; island = island->nextSibling) {
    size += 1 + std::int64_t{island->contour->pointCount};
  }
  return size;
}

std::int32_t outlineCapacityFor(std::int64_t entries) {
  const std::int64_t capped = std::min<std::int64_t>(entries, std::numeric_limits<std::int32_t>::max());
  return static_cast<std::int32_t>(std::max<std::int64_t>(capped, kOutlineInitialCapacity));
}

CheckedArray<Point> makeOutlineList(const CheckedArray<Pocket*>& pockets) {
  std::int64_t largest = 0;
  for (std::int32_t i = 0; i < pockets.count; ++i) {
    largest = std::max(largest, nodeOutlineSize(*pockets.data[i]->node));
  }
  return CheckedArray<Point>(outlineCapacityFor(largest), kOutlineGrowStep);
}

}  // namespace pc
