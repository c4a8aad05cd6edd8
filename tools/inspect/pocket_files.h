// The pocket files of a run read back pocket by pocket, in machining order:
// the tagged contour file, the record contour file and the pocket result
// file, and the outlines of the level dump.
#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "contours/point.h"
#include "fileio/byte_stream.h"
#include "file_kind.h"

namespace pc::inspect {

struct PocketView {
  std::int64_t number = 0;        // 1-based, in file order
  float z = 0.0f;
  bool hasZInteger = false;       // the tagged file stores Z truncated as well
  std::int32_t zInteger = 0;
  std::vector<std::vector<Point>> contours;  // outer first, then the islands
  std::int64_t firstRecord = 0;   // 1-based record (line) number
};

using PocketSink = std::function<void(const PocketView&)>;

// Reads a file of one of the three pocket kinds. False when it is damaged
// (problem filled); the pockets before the damage have been handed over.
bool readPocketFile(const std::string& path, FileKind kind, const PocketSink& sink, fileio::ReadProblem& problem);

// Cuts a sequence of contours, each opened by a separator only, back into
// outlines (an outer contour and the islands directly inside it): a contour
// at the same Z that lies inside the current outer contour and inside none
// of its islands so far is one more island; any other contour opens the
// next outline.
class OutlineGrouper {
 public:
  explicit OutlineGrouper(PocketSink sink) : sink_(std::move(sink)) {}
  void add(std::vector<Point>&& contour, float z, std::int64_t firstRecord);
  void finish();

 private:
  bool isIsland(const std::vector<Point>& contour, float z) const;

  PocketSink sink_;
  PocketView current_;
  bool open_ = false;
  std::int64_t count_ = 0;
};

// A vertex of `inner` that lies inside or outside `outer` decides; true
// when inside. Vertices on the boundary are passed over; false when every
// vertex is on it.
bool contourInside(const std::vector<Point>& inner, const std::vector<Point>& outer);

}  // namespace pc::inspect
