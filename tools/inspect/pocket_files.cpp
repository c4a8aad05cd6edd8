#include "pocket_files.h"

#include <fstream>

#include "exact_geometry.h"
#include "fileio/framed_record_reader.h"
#include "output/outline_writer.h"
#include "output/pocket_result_file.h"
#include "output/record_contour_file.h"
#include "output/tagged_file.h"

namespace pc::inspect {

bool contourInside(const std::vector<Point>& inner, const std::vector<Point>& outer) {
  for (const Point& p : inner) {
    const Containment c = locatePoint(p, outer);
    if (c != Containment::OnBoundary) return c == Containment::Inside;
  }
  return false;
}

bool OutlineGrouper::isIsland(const std::vector<Point>& contour, float z) const {
  if (!open_ || !(current_.z == z)) return false;
  if (!contourInside(contour, current_.contours.front())) return false;
  for (std::size_t i = 1; i < current_.contours.size(); ++i) {
    if (contourInside(contour, current_.contours[i])) return false;
  }
  return true;
}

void OutlineGrouper::add(std::vector<Point>&& contour, float z, std::int64_t firstRecord) {
  if (contour.empty()) return;
  if (isIsland(contour, z)) {
    current_.contours.push_back(std::move(contour));
    return;
  }
  finish();
  current_ = PocketView{};
  current_.number = ++count_;
  current_.z = z;
  current_.firstRecord = firstRecord;
  current_.contours.push_back(std::move(contour));
  open_ = true;
}

void OutlineGrouper::finish() {
  if (open_) sink_(current_);
  open_ = false;
}

namespace {

using fileio::ReadProblem;
using fileio::RecordRead;

bool readTagged(const std::string& path, const PocketSink& sink, ReadProblem& problem) {
  TaggedFileReader reader;
  if (!reader.open(path)) {
    problem = reader.problem();
    return false;
  }
  // Expected order per pocket: n, then (p+ f)+, then e.
  enum class State { BetweenPockets, PocketStart, InContour, AfterContour } state = State::BetweenPockets;
  PocketView pocket;
  std::int64_t count = 0;
  TaggedRecord r;
  auto fail = [&](const char* expected) {
    problem = ReadProblem{r.offset, reader.recordNumber(),
                          std::string(expected) + ", found '" + std::string(1, r.tag) + "'"};
    return false;
  };
  while (true) {
    const RecordRead got = reader.next(r);
    if (got == RecordRead::Damaged) {
      problem = reader.problem();
      return false;
    }
    if (got == RecordRead::End) break;
    switch (state) {
      case State::BetweenPockets:
        if (r.tag != 'n') return fail("a pocket start 'n'");
        pocket = PocketView{};
        pocket.number = ++count;
        pocket.z = r.a;
        pocket.hasZInteger = true;
        pocket.zInteger = r.ib;
        pocket.firstRecord = reader.recordNumber();
        state = State::PocketStart;
        break;
      case State::PocketStart:
        if (r.tag != 'p') return fail("a point 'p' opening the outer contour");
        pocket.contours.push_back({Point{r.a, r.b}});
        state = State::InContour;
        break;
      case State::InContour:
        if (r.tag == 'p') {
          pocket.contours.back().push_back(Point{r.a, r.b});
        } else if (r.tag == 'f') {
          state = State::AfterContour;
        } else {
          return fail("a point 'p' or a contour end 'f'");
        }
        break;
      case State::AfterContour:
        if (r.tag == 'p') {
          pocket.contours.push_back({Point{r.a, r.b}});
          state = State::InContour;
        } else if (r.tag == 'e') {
          sink(pocket);
          state = State::BetweenPockets;
        } else {
          return fail("a point 'p' opening an island or a pocket end 'e'");
        }
        break;
    }
  }
  if (state != State::BetweenPockets) {
    problem = ReadProblem{r.offset, reader.recordNumber(), "more records: the last pocket has no end 'e'"};
    return false;
  }
  return true;
}

bool readRecordContours(const std::string& path, const PocketSink& sink, ReadProblem& problem) {
  fileio::FramedRecordReader reader;
  if (!reader.open(path)) {
    problem = ReadProblem{0, 0, "a readable file"};
    return false;
  }
  OutlineGrouper grouper(sink);
  std::vector<Point> contour;
  float z = 0.0f;
  std::int64_t first = 0;
  bool lastWasSeparator = false;
  unsigned char data[kContourRecordBytes];
  while (true) {
    std::uint32_t count = 0;
    const RecordRead got = reader.next(data, sizeof data, count);
    if (got == RecordRead::Damaged) {
      problem = reader.problem();
      return false;
    }
    if (got == RecordRead::End) break;
    if (count != kContourRecordBytes) {
      problem = ReadProblem{reader.recordOffset(), reader.recordNumber(),
                            "a record of 18 data bytes, found " + std::to_string(count)};
      return false;
    }
    const ContourRecord rec = decodeContourRecord(data);
    if (rec.code == kRecordPointCode && rec.flag == 1) {
      if (contour.empty()) {
        z = rec.z;
        first = reader.recordNumber();
      } else if (!(rec.z == z)) {
        problem = ReadProblem{reader.recordOffset(), reader.recordNumber(),
                              "the Z of its pocket on every point record (" + std::to_string(z) + ")"};
        return false;
      }
      contour.push_back(Point{rec.x, rec.y});
      lastWasSeparator = false;
    } else if (rec.code == kRecordSeparatorCode && rec.flag == 0) {
      grouper.add(std::move(contour), z, first);
      contour.clear();
      lastWasSeparator = true;
    } else {
      problem = ReadProblem{reader.recordOffset(), reader.recordNumber(),
                            "a point record (code -1003, flag 1) or a separator (code -1001, flag 0), found code " +
                                std::to_string(rec.code) + " flag " + std::to_string(rec.flag)};
      return false;
    }
  }
  if (reader.recordNumber() > 0 && !lastWasSeparator) {
    problem = ReadProblem{reader.fileSize(), reader.recordNumber() + 1, "the final separator record"};
    return false;
  }
  grouper.finish();
  return true;
}

bool readPocketResult(const std::string& path, const PocketSink& sink, ReadProblem& problem) {
  std::ifstream in(path, std::ios::binary);
  if (!in) {
    problem = ReadProblem{0, 0, "a readable file"};
    return false;
  }
  std::string line;
  std::int64_t number = 0, offset = 0, count = 0;
  PocketView pocket;
  bool inContour = false;
  while (std::getline(in, line)) {
    ++number;
    const std::int64_t lineOffset = offset;
    offset += static_cast<std::int64_t>(line.size()) + 1;
    ResultLine r;
    std::string expected;
    if (!parseResultLine(line, number == 1, r, expected)) {
      problem = ReadProblem{lineOffset, number, expected};
      return false;
    }
    auto fail = [&](const char* what) {
      problem = ReadProblem{lineOffset, number, what};
      return false;
    };
    switch (r.kind) {
      case ResultLineKind::Header: break;
      case ResultLineKind::Point:
        if (pocket.contours.empty()) {
          pocket.number = count + 1;
          pocket.z = static_cast<float>(r.z);
          pocket.firstRecord = number;
        }
        if (!inContour) pocket.contours.emplace_back();
        pocket.contours.back().push_back(Point{static_cast<float>(r.x), static_cast<float>(r.y)});
        inContour = true;
        break;
      case ResultLineKind::Separator:
        if (!inContour && !pocket.contours.empty()) return fail("a point line: two separator lines in a row");
        inContour = false;
        break;
      case ResultLineKind::PocketEnd:
        if (inContour || pocket.contours.empty()) return fail("a separator line closing a contour before the pocket end");
        ++count;
        sink(pocket);
        pocket = PocketView{};
        break;
    }
  }
  if (number == 0) {
    problem = ReadProblem{0, 1, "the header line, the file is empty"};
    return false;
  }
  if (!pocket.contours.empty()) {
    problem = ReadProblem{offset, number + 1, "the pocket end line of the last pocket"};
    return false;
  }
  return true;
}

}  // namespace

bool readPocketFile(const std::string& path, FileKind kind, const PocketSink& sink, ReadProblem& problem) {
  switch (kind) {
    case FileKind::TaggedContours: return readTagged(path, sink, problem);
    case FileKind::RecordContours: return readRecordContours(path, sink, problem);
    case FileKind::PocketResult: return readPocketResult(path, sink, problem);
    default: break;
  }
  problem = ReadProblem{0, 0, "a pocket file"};
  return false;
}

}  // namespace pc::inspect
