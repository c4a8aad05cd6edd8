#include "pockets/level_order.h"

#include <new>
#include <optional>

#include "pockets/contour_geometry.h"
#include "pockets/nearest_path.h"
#include "pockets/node_geometry.h"

namespace pc {

namespace {
constexpr std::int32_t kGridPathMinimum = 256;
}  // namespace

std::int32_t breadthFirstPockets(PocketForest& forest, CheckedArray<Pocket*>& result) {
  result.reset();
  if (forest.firstRoot == nullptr) return 0;
  forest.queue.clearAll();
  // A pocket that could not be queued would be missing from the output.
  auto push = [&forest](Pocket* pocket) {
    if (!forest.queue.push(pocket)) modelAllocationFailure();
  };
  for (Pocket* root = forest.firstRoot; root != nullptr; root = root->nextSibling) push(root);
  while (std::optional<Pocket*> head = forest.queue.pop()) {
    result.append(*head);
    for (Pocket* child = (*head)->firstChild; child != nullptr; child = child->nextSibling) push(child);
  }
  return result.count;
}

int nearestNeighbourOrder(PocketForest& forest, Pocket** pockets, std::int32_t count) {
  if (count < 3) return 0;
  if (count > forest.centroidCapacity) {
    forest.centroids.reset();
    forest.centroidCapacity = 0;
    forest.centroids.reset(new (std::nothrow) Point[static_cast<std::size_t>(count)]);
    if (!forest.centroids) return -1;
    forest.centroidCapacity = count;
  }
  Point* c = forest.centroids.get();
  for (std::int32_t i = 0; i < count; ++i) c[i] = centroid(*pockets[i]->node->contour);
  moveLeftmostFirst(pockets, c, count);
  // Long runs go through the grid; both give the same path.
  if (count < kGridPathMinimum || !nearestPathByGrid(pockets, c, count)) nearestPathByScan(pockets, c, count);
  return 0;
}

std::int32_t levelOrder(PocketForest& forest, CheckedArray<Pocket*>& result) {
  const std::int32_t n = breadthFirstPockets(forest, result);
  if (n < 3) return n;
  // Runs of equal Z are the levels; each is ordered on its own.
  std::int32_t runStart = 0;
  float runZ = result.at(0)->node->contour->z;
  for (std::int32_t i = 1; i < n; ++i) {
    const float z = result.at(i)->node->contour->z;
    if (z != runZ) {
      if (nearestNeighbourOrder(forest, result.data + runStart, i - runStart) != 0) return 0;
      runStart = i;
      runZ = z;
    }
  }
  if (nearestNeighbourOrder(forest, result.data + runStart, n - runStart) != 0) return 0;
  return n;
}

}  // namespace pc
