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

class Contours {
 public:
  // A contour through `points` as given (closing point included).
  ZContour* add(std::vector<Point> points, float z = 0.0f) {
    points_.push_back(std::move(points));
    contours_.emplace_back();
    fill(contours_.back(), points_.back().data(), static_cast<std::int32_t>(points_.back().size()), z);
    return &contours_.back();
  }
  // The closed rectangle x0..x1 x y0..y1 from (x0, y0): five points.
  ZContour* box(float x0, float y0, float x1, float y1, float z = 0.0f) {
    return add({{x0, y0}, {x1, y0}, {x1, y1}, {x0, y1}, {x0, y0}}, z);
  }
  // A closed quadrilateral whose vertex mean (closing point twice) is (cx, cy).
  ZContour* around(float cx, float cy, float z = 0.0f) {
    return add({{cx, cy}, {cx + 1, cy - 1}, {cx, cy + 2}, {cx - 1, cy - 1}, {cx, cy}}, z);
  }

 private:
  std::deque<std::vector<Point>> points_;
  std::deque<ZContour> contours_;
};

// Levels as the run driver groups them: a change of z opens the next level.
inline std::vector<ZLevel> groupLevels(std::initializer_list<ZContour*> contours) {
  std::vector<ZLevel> levels;
  const ZContour* previous = nullptr;
  for (ZContour* c : contours) {
    if (previous == nullptr || static_cast<double>(c->z) != static_cast<double>(previous->z)) levels.emplace_back();
    addContourToLevel(levels.back(), c);
    previous = c;
  }
  return levels;
}

// Pockets attached by hand; the nodes are declared first to outlive them.
struct HandForest {
  std::deque<ContourNode> nodes;
  PocketForest forest;

  // A pocket over a new node of `contour`, last child of `parent` (or root).
  Pocket* add(Pocket* parent, ZContour* contour) {
    nodes.emplace_back();
    nodes.back().contour = contour;
    nodes.back().taken = true;
    return nodes.back().pocket = add(parent, nodes.back());
  }
  Pocket* add(Pocket* parent, ContourNode& node) {
    Pocket* pocket = new Pocket;
    pocket->node = &node;
    pocket->parent = parent;
    Pocket** link = parent != nullptr ? &parent->firstChild : &forest.firstRoot;
    while (*link != nullptr) link = &(*link)->nextSibling;
    return *link = pocket;
  }
};

inline std::vector<Pocket*> listOf(const CheckedArray<Pocket*>& list) {
  return std::vector<Pocket*>(list.data, list.data + list.count);
}

inline std::vector<Pocket*> chainOf(Pocket* first) {
  std::vector<Pocket*> chain;
  for (; first != nullptr; first = first->nextSibling) chain.push_back(first);
  return chain;
}

inline std::vector<ZContour*> contoursOf(const std::vector<Pocket*>& pockets) {
  std::vector<ZContour*> out;
  for (const Pocket* p : pockets) out.push_back(p->node->contour);
  return out;
}

}  // namespace pc::test
