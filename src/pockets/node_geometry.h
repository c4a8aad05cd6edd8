// Point-in-contour tests on the contours of a level's nodes. They give the
// answers of pointInContour and contourRelation, but big contours get an edge
// index on first use so that repeated tests stay cheap.
#pragma once

#include "pockets/pocket_model.h"

namespace pc {

// pointInContour(p, *node.contour).
bool pointInNode(Point p, ContourNode& node);

// contourRelation(*a.contour, *b.contour).
int nodeRelation(ContourNode& a, ContourNode& b);

// Releases the node's search aids.
void releaseSearchAids(ContourNode& node);

// The deepest node of the level whose contour holds p: the first node of the
// top-level chain that holds it, then the first of that node's children that
// holds it, and so on; nullptr when no top-level contour holds p.
ContourNode* deepestNodeHolding(ZLevel& level, Point p);

// Ends the run with the fatal report when a node or pocket cannot be made:
// the model cannot go on with a contour or region silently missing.
[[noreturn]] void modelAllocationFailure();

}  // namespace pc
