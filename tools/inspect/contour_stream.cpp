#include "contour_stream.h"

#include <algorithm>
#include <cmath>

#include "contours/contour_info_file.h"

namespace pc::inspect {

fileio::RecordRead ContourStream::readRecord() {
  unsigned char data[kContourInfoRecordBytes];
  std::uint32_t count = 0;
  const fileio::RecordRead r = reader_.next(data, sizeof data, count);
  if (r != fileio::RecordRead::Record) return r;
  if (count < kContourInfoRecordBytes) {
    return reader_.damaged("a record of at least 12 data bytes (x, y, z), found " + std::to_string(count));
  }
  ++records_;
  decodeContourInfoRecord(data, x_, y_, z_);
  lookRecord_ = reader_.recordNumber();
  lookOffset_ = reader_.recordOffset();
  return r;
}

fileio::RecordRead ContourStream::next(InfoContour& contour) {
  // Skip to the first point.
  while (true) {
    if (!lookahead_) {
      const fileio::RecordRead r = readRecord();
      if (r != fileio::RecordRead::Record) return r;
    }
    lookahead_ = false;
    if (isContourPoint(x_, y_, z_)) break;
    ++separators_;
    ++pendingSeparators_;
  }
  contour.points.clear();
  contour.separatorsBefore = pendingSeparators_;
  pendingSeparators_ = 0;
  contour.firstRecord = lookRecord_;
  contour.firstOffset = lookOffset_;
  contour.z = contour.zMin = contour.zMax = z_;
  contour.points.push_back(Point{x_, y_});
  while (true) {
    const fileio::RecordRead r = readRecord();
    if (r == fileio::RecordRead::Damaged) return r;
    if (r == fileio::RecordRead::End) break;
    // Inside a contour only x and y tell a separator, as the loader does.
    if (!isPointEntry(Point{x_, y_})) {
      lookahead_ = true;
      break;
    }
    contour.points.push_back(Point{x_, y_});
    contour.zMin = std::min(contour.zMin, z_);
    contour.zMax = std::max(contour.zMax, z_);
  }
  const bool opens = !havePrevious_ || !(static_cast<double>(contour.z) == static_cast<double>(previousZ_));
  if (opens) {
    ++level_;
    inLevel_ = 0;
  }
  havePrevious_ = true;
  previousZ_ = contour.z;
  contour.level = level_;
  contour.indexInLevel = inLevel_++;
  contour.indexInFile = contours_++;
  measureContour(contour);
  return fileio::RecordRead::Record;
}

void measureContour(InfoContour& c) {
  const std::vector<Point>& p = c.points;
  c.xmin = c.xmax = p.front().x;
  c.ymin = c.ymax = p.front().y;
  double twiceArea = 0.0;
  const double x0 = p.front().x, y0 = p.front().y;
  for (std::size_t i = 0; i < p.size(); ++i) {
    c.xmin = std::min(c.xmin, p[i].x);
    c.xmax = std::max(c.xmax, p[i].x);
    c.ymin = std::min(c.ymin, p[i].y);
    c.ymax = std::max(c.ymax, p[i].y);
    const Point& a = p[i];
    const Point& b = p[(i + 1) % p.size()];
    // Relative to the first point, which keeps the sum well conditioned.
    twiceArea += (a.x - x0) * (static_cast<double>(b.y) - y0) - (a.y - y0) * (static_cast<double>(b.x) - x0);
  }
  c.signedArea = twiceArea / 2.0;
  const double dx = static_cast<double>(p.back().x) - x0, dy = static_cast<double>(p.back().y) - y0;
  c.closure = std::sqrt(dx * dx + dy * dy);
}

}  // namespace pc::inspect
