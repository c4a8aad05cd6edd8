// Hand-built contours, levels and forests for the pocket model tests; the
// fixtures own every point, contour and node at stable addresses.
#pragma once

#include <cstdint>
#include <deque>
#include <initializer_list>
#include <vector>

#include "contours/zcontour.h"
#include "pockets/pocket_model.h"

namespace pc::test {

struct Contours {
  // A contour through `points` as given (closing point included).
  ZContour* add(std::vector<Point> points, float z = 0.0f) {
    std::vector<Point>& kept = runs.emplace_back(std::move(points));
    ZContour& c = made.emplace_back();
    fill(c, kept.data(), static_cast<std::int32_t>(kept.size()), z);
    return &c;
  }
  ZContour* box(float x0, float y0, float x1, float y1, float z = 0.0f) {
    return add({{x0, y0}, {x1, y0}, {x1, y1}, {x0, y1}, {x0, y0}}, z);
  }
  std::deque<std::vector<Point>> runs;
  std::deque<ZContour> made;
};

// Levels as the run driver groups them: a change of z opens the next level.
inline std::vector<ZLevel> groupLevels(std::initializer_list<ZContour*> contours) {
  std::vector<ZLevel> levels;
  for (ZContour* c : contours) {
    if (levels.empty() || levels.back().root->contour->z != c->z) levels.emplace_back();
    addContourToLevel(levels.back(), c);
  }
  return levels;
}

// Pockets attached by hand, each the last child of `parent` (or last root).
struct HandForest {
  std::deque<ContourNode> nodes;
  PocketForest forest;

  Pocket* add(Pocket* parent, ZContour* contour) {
    ContourNode& node = nodes.emplace_back();
    node.contour = contour;
    node.taken = true;
    Pocket** link = parent != nullptr ? &parent->firstChild : &forest.firstRoot;
    while (*link != nullptr) link = &(*link)->nextSibling;
    return *link = node.pocket = new Pocket{&node, nullptr, nullptr, parent, nullptr};
  }
};

inline std::vector<Pocket*> listOf(const CheckedArray<Pocket*>& list) {
  return std::vector<Pocket*>(list.data, list.data + list.count);
}

template <typename T>
std::vector<T*> chainOf(T* first) {
  std::vector<T*> chain;
  for (; first != nullptr; first = first->nextSibling) chain.push_back(first);
  return chain;
}

// The contours of a chain of nodes or of pockets.
inline ZContour* contourOf(const ContourNode* n) { return n->contour; }
inline ZContour* contourOf(const Pocket* p) { return p->node->contour; }
template <typename T>
std::vector<ZContour*> contoursOf(const T* first) {
  std::vector<ZContour*> out;
  for (; first != nullptr; first = first->nextSibling) out.push_back(contourOf(first));
  return out;
}

}  // namespace pc::test
