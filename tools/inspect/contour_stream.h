// The contour information file read contour by contour, with the program's
// own record reader and level rule: a contour opens a new level when its Z
// (that of its first point) differs from that of the contour before it.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "contours/point.h"
#include "fileio/framed_record_reader.h"

namespace pc::inspect {

struct InfoContour {
  std::int32_t level = 0;         // 0-based, in file order
  std::int32_t indexInLevel = 0;  // 0-based
  std::int64_t indexInFile = 0;   // 0-based
  std::int64_t firstRecord = 0;   // 1-based record number of the first point
  std::int64_t firstOffset = 0;   // byte offset of that record
  std::vector<Point> points;      // as stored, closing point included when stored
  float z = 0.0f;                 // of the first point
  float zMin = 0.0f, zMax = 0.0f;
  float xmin = 0.0f, xmax = 0.0f, ymin = 0.0f, ymax = 0.0f;
  double signedArea = 0.0;        // > 0 counter-clockwise
  double closure = 0.0;           // distance from the last point to the first
  std::int64_t separatorsBefore = 0;  // separator records just before it
};

class ContourStream {
 public:
  bool open(const std::string& path) { return reader_.open(path); }
  // Record: `contour` filled; End: no contour left; Damaged: problem().
  fileio::RecordRead next(InfoContour& contour);
  const fileio::ReadProblem& problem() const { return reader_.problem(); }
  std::int64_t records() const { return records_; }
  std::int64_t separators() const { return separators_; }
  // Separator records after the last contour.
  std::int64_t trailingSeparators() const { return pendingSeparators_; }
  std::int64_t fileSize() const { return reader_.fileSize(); }

 private:
  fileio::RecordRead readRecord();

  fileio::FramedRecordReader reader_;
  std::int64_t records_ = 0;
  std::int64_t separators_ = 0;
  std::int64_t pendingSeparators_ = 0;
  std::int64_t contours_ = 0;
  std::int32_t level_ = -1;
  std::int32_t inLevel_ = 0;
  bool havePrevious_ = false;
  float previousZ_ = 0.0f;
  // One record read ahead: the first point of the next contour.
  bool lookahead_ = false;
  float x_ = 0.0f, y_ = 0.0f, z_ = 0.0f;
  std::int64_t lookRecord_ = 0, lookOffset_ = 0;
};

// Shoelace area and closure of a finished contour, its box and Z range.
void measureContour(InfoContour& contour);

}  // namespace pc::inspect
