// The pocket model: levels of equal Z with their containment trees of
// contours, and the forest of pockets linked across consecutive levels.
#pragma once

#include <cstdint>
#include <memory>

#include "contours/point.h"
#include "contours/zcontour.h"
#include "driver/checked_array.h"
#include "driver/recycling_queue.h"

namespace pc {

struct Pocket;

// One contour in its level's containment tree. Even depth: the outer contour
// of a region; odd depth: an island of its parent's region.
struct ContourNode {
  ZContour* contour = nullptr;      // not owned
  ContourNode* firstChild = nullptr;
  ContourNode* nextSibling = nullptr;
  ContourNode* parent = nullptr;
  Pocket* pocket = nullptr;         // not owned; set at most once
};

// One run of consecutive contours with exactly equal Z. Owns its nodes.
struct ZLevel {
  ContourNode* root = nullptr;
  std::unique_ptr<CheckedArray<ContourNode*>> outerCache;

  ZLevel() = default;
  ZLevel(ZLevel&& other) noexcept;
  ZLevel& operator=(ZLevel&& other) noexcept;
  ZLevel(const ZLevel&) = delete;
  ZLevel& operator=(const ZLevel&) = delete;
  ~ZLevel();  // deletes every node of the tree (iteratively)
};

// A region made into a pocket, hanging from a pocket of the previous level.
struct Pocket {
  ContourNode* node = nullptr;
  Pocket* firstChild = nullptr;
  Pocket* nextSibling = nullptr;
  Pocket* parent = nullptr;
};

// The pockets of the run and the scratch of their building and ordering.
struct PocketForest {
  Pocket* firstRoot = nullptr;
  std::unique_ptr<CheckedArray<ZContour*>> regionContours;  // created on first use
  RecyclingQueue<Pocket*> queue;
  std::int32_t centroidCapacity = 0;
  std::unique_ptr<Point[]> centroids;

  PocketForest() = default;
  PocketForest(const PocketForest&) = delete;
  PocketForest& operator=(const PocketForest&) = delete;
  ~PocketForest();  // deletes every pocket (iteratively)
};

// Inserts one contour into the level's containment tree.
void addContourToLevel(ZLevel& level, ZContour* contour);

// The level's outer nodes (even depth), each followed by the outer nodes
// nested inside its islands. The list is the level's cache, refilled per call.
CheckedArray<ContourNode*>& outerNodes(ZLevel& level);

// Builds the pockets of all levels. 0 on success; -1 when some region had no
// interior point (that region got no pocket, building went on).
int buildPockets(PocketForest& forest, ZLevel* levels, std::int32_t levelCount);

// Number of pockets reachable from the roots.
std::int32_t pocketCount(const PocketForest& forest);

// Deletes a pocket and everything under it (iteratively).
void deletePocketTree(Pocket* pocket);

// Fills `outline` with the pocket's outer contour and its islands, each run
// opened by a separator point; gives the outer contour's Z. Returns the
// number of contours (1 + islands).
std::int32_t collectPocketOutline(const Pocket& pocket, CheckedArray<Point>& outline, float& z);

// The same outline for a bare contour node (used by the level dump).
std::int32_t collectNodeOutline(const ContourNode& node, CheckedArray<Point>& outline, float& z);

}  // namespace pc
