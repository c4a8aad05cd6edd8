#include "pockets/node_geometry.h"

#include "driver/fatal_report.h"
#include "pockets/contour_geometry.h"
#include "pockets/chain_index.h"
#include "pockets/edge_buckets.h"

namespace pc {

namespace {
constexpr std::int32_t kTestsBeforeIndex = 8;
}  // namespace

bool pointInNode(Point p, ContourNode& node) {
  const ZContour& c = *node.contour;
  if (!pointInBox(p.x, p.y, c)) return false;
  // The index pays once a big contour has been scanned a few times.
  if (node.edgeTests <= kTestsBeforeIndex) {
    ++node.edgeTests;
    if (node.edgeTests > kTestsBeforeIndex && c.pointCount >= EdgeBuckets::kMinPoints) {
      node.edgeBuckets = EdgeBuckets::build(c).release();
    }
  }
  if (node.edgeBuckets != nullptr) return node.edgeBuckets->contains(p, c);
  return pointInContour(p, c);
}

int nodeRelation(ContourNode& a, ContourNode& b) {
  const ZContour& ca = *a.contour;
  const ZContour& cb = *b.contour;
  if (cb.xmin > ca.xmax || cb.ymin > ca.ymax || ca.xmin > cb.xmax || ca.ymin > cb.ymax) return 0;
  if (sampleVote(ca, [&b](Point p) { return pointInNode(p, b); })) return 1;
  if (sampleVote(cb, [&a](Point p) { return pointInNode(p, a); })) return 2;
  return 0;
}

void releaseSearchAids(ContourNode& node) {
  delete node.edgeBuckets;
  node.edgeBuckets = nullptr;
  node.edgeTests = 0;
  delete node.childChain;
  node.childChain = nullptr;
}

void modelAllocationFailure() {
  FatalReport("pocket_model", kLineAllocAtConstruction, kMemoryAllocationFailure);
}

}  // namespace pc
