// The pocket model: levels of equal Z with their containment trees of
// contours, and the forest of pockets linked across consecutive levels.
#pragma once

#include <cstdint>
#include <memory>
#include <vector>

#include "contours/point.h"
#include "contours/zcontour.h"
#include "driver/checked_array.h"
#include "driver/recycling_queue.h"

namespace pc {

struct Pocket;
class EdgeBuckets;
class ChainIndex;

// One contour in its level's containment tree. Even depth: the outer contour
// of a region; odd depth: an island of its parent's region.
struct ContourNode {
  ZContour* contour = nullptr;      // not owned
  ContourNode* firstChild = nullptr;
  ContourNode* nextSibling = nullptr;
  ContourNode* parent = nullptr;
  Pocket* pocket = nullptr;         // not owned; cleared when the pocket is deleted
  // Set once the region has been handled by pocket building, whether or not
  // its pocket survived: a region is never taken twice.
  bool taken = false;
  // Search aids, owned with the node by its level: an index over the
  // contour's edges (built for big contours once they are tested often) and
  // a compact copy of the child chain (kept in step by addContourToLevel).
  std::int32_t edgeTests = 0;
  EdgeBuckets* edgeBuckets = nullptr;
  ChainIndex* childChain = nullptr;
};

// One run of consecutive contours with exactly equal Z. Owns its nodes.
// The tree is built by addContourToLevel only; a chain linked by other means
// gets its compact copy from its links on first use.
struct ZLevel {
  ContourNode* root = nullptr;
  std::unique_ptr<CheckedArray<ContourNode*>> outerCache;
  ChainIndex* rootChain = nullptr;  // compact copy of the top-level chain, owned

  ZLevel() = default;
  ZLevel(ZLevel&& other) noexcept;
  ZLevel& operator=(ZLevel&& other) noexcept;
  ZLevel(const ZLevel&) = delete;
  ZLevel& operator=(const ZLevel&) = delete;
  ~ZLevel();  // deletes every node of the tree (iteratively)
};

// Number of nodes in the level's tree, all depths.
std::int32_t nodeCount(const ZLevel& level);

// A region made into a pocket, hanging from a pocket of the previous level.
struct Pocket {
  ContourNode* node = nullptr;
  Pocket* firstChild = nullptr;
  Pocket* nextSibling = nullptr;
  Pocket* parent = nullptr;
  // End of the child chain while pockets are being built (chains are only
  // extended at their end there); absent outside buildPockets.
  Pocket* lastChild = nullptr;
};

// The pockets of the run and the scratch of their building and ordering.
struct PocketForest {
  Pocket* firstRoot = nullptr;
  std::unique_ptr<CheckedArray<ZContour*>> regionContours;  // created on first use
  RecyclingQueue<Pocket*> queue;
  std::int32_t centroidCapacity = 0;
  std::unique_ptr<Point[]> centroids;
  std::vector<double> crossings;  // scratch of the interior-point search

  PocketForest() = default;
  PocketForest(const PocketForest&) = delete;
  PocketForest& operator=(const PocketForest&) = delete;
  ~PocketForest();  // deletes every pocket (iteratively); touches no node, so
                    // it may run after the levels are gone
};

// Inserts one contour into the level's containment tree.
void addContourToLevel(ZLevel& level, ZContour* contour);

// The level's outer nodes (even depth), each followed by the outer nodes
// nested inside its islands. The list is the level's cache, refilled per call.
CheckedArray<ContourNode*>& outerNodes(ZLevel& level);

// Builds the pockets of all levels. 0 on success; -1 when some region had no
// interior point (that region got no pocket, building went on).
int buildPockets(PocketForest& forest, ZLevel* levels, std::int32_t levelCount);

// Number of pockets reachable from the roots. Like every walk over the
// forest it climbs back up through `parent`, so each pocket's `parent` must
// be the pocket whose child chain holds it (absent for roots).
std::int32_t pocketCount(const PocketForest& forest);

// Deletes a pocket and everything under it (iteratively); its following
// siblings are left alone and the caller unlinks it. The nodes of deleted
// pockets lose their `pocket` pointer but stay taken.
void deletePocketTree(Pocket* pocket);

// Fills `outline` with the pocket's outer contour and its islands, each run
// opened by a separator point; gives the outer contour's Z. Returns the
// number of contours (1 + islands).
std::int32_t collectPocketOutline(const Pocket& pocket, CheckedArray<Point>& outline, float& z);

// The same outline for a bare contour node (used by the level dump).
std::int32_t collectNodeOutline(const ContourNode& node, CheckedArray<Point>& outline, float& z);

}  // namespace pc
