#include "check.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <map>

#include "contours/zcontour.h"
#include "exact_geometry.h"
#include "json_stream.h"
#include "level_sweep.h"
#include "nesting.h"

namespace pc::inspect {

namespace {

constexpr double kClosureTolerance = 0.005;
constexpr double kZTolerance = 0.0001;
constexpr double kDuplicateTolerance = 1e-10;
constexpr double kNearDistance = 0.0002;
constexpr std::size_t kFewestPoints = 4;

// The contour as the classifier keeps it: consecutive points no farther
// apart than the duplicate tolerance kept once, the last point set to the
// first when the ends meet within the closure tolerance. An open contour is
// closed by one more edge for the geometric tests.
std::vector<Point> ringOf(const InfoContour& c) {
  std::vector<Point> ring;
  ring.reserve(c.points.size() + 1);
  for (const Point& p : c.points) {
    if (!ring.empty()) {
      const double dx = static_cast<double>(p.x) - ring.back().x, dy = static_cast<double>(p.y) - ring.back().y;
      if (std::sqrt(dx * dx + dy * dy) <= kDuplicateTolerance) continue;
    }
    ring.push_back(p);
  }
  if (ring.size() > 1 && c.closure <= kClosureTolerance) ring.back() = ring.front();
  else ring.push_back(ring.front());
  return ring;
}

const char* contactName(int kind, bool self) {
  switch (static_cast<ContactKind>(kind)) {
    case ContactKind::Cross: return self ? "self-cross" : "cross";
    case ContactKind::Touch: return self ? "self-touch" : "touch";
    case ContactKind::Near: break;
  }
  return "near";
}

std::string describe(const Finding& f) {
  char text[512];
  if (f.kind == "near") {
    std::snprintf(text, sizeof text, "level %d contours %d and %d: %s, closer than 0.0002 (the nesting vote may differ)",
                  f.level, f.contour, f.other, f.detail.c_str());
  } else if (f.other >= 0 && f.other != f.contour) {
    std::snprintf(text, sizeof text, "level %d contours %d and %d: %s at (%.6f, %.6f)%s", f.level, f.contour, f.other,
                  f.kind.c_str(), f.x, f.y, f.count > 1 ? (" and " + std::to_string(f.count - 1) + " more").c_str() : "");
  } else {
    std::snprintf(text, sizeof text, "level %d contour %d: %s%s%s", f.level, f.contour, f.kind.c_str(),
                  f.detail.empty() ? "" : ": ", f.detail.c_str());
  }
  return text;
}

}  // namespace

std::vector<Finding> checkLevel(std::vector<InfoContour>& contours) {
  std::vector<Finding> findings;
  if (contours.empty()) return findings;
  const std::int32_t level = contours.front().level;
  for (const InfoContour& c : contours) {
    char detail[160];
    if (c.points.size() < kFewestPoints) {
      std::snprintf(detail, sizeof detail, "%zu points, at least 4 expected (the classifier refuses the file)",
                    c.points.size());
      findings.push_back(Finding{"too-few-points", level, c.indexInLevel, -1, c.points[0].x, c.points[0].y, 1, detail});
    }
    if (c.closure > kClosureTolerance) {
      std::snprintf(detail, sizeof detail, "ends %.6f apart, at most 0.005 expected (record %lld)", c.closure,
                    static_cast<long long>(c.firstRecord));
      findings.push_back(Finding{"open", level, c.indexInLevel, -1, c.points[0].x, c.points[0].y, 1, detail});
    }
    if (static_cast<double>(c.zMax) - c.zMin > kZTolerance) {
      std::snprintf(detail, sizeof detail, "Z from %.6f to %.6f, one Z expected", c.zMin, c.zMax);
      findings.push_back(Finding{"z-varies", level, c.indexInLevel, -1, c.points[0].x, c.points[0].y, 1, detail});
    }
  }

  std::vector<std::vector<Point>> rings;
  rings.reserve(contours.size());
  for (const InfoContour& c : contours) rings.push_back(ringOf(c));
  // The points are no longer needed; a level of millions of points is held once.
  for (InfoContour& c : contours) std::vector<Point>().swap(c.points);

  const ContactMap contacts = sweepLevel(rings, kNearDistance);
  for (const auto& [key, contact] : contacts) {
    const auto [a, b, kind] = key;
    if (kind == static_cast<int>(ContactKind::Near) &&
        (contacts.count({a, b, static_cast<int>(ContactKind::Cross)}) ||
         contacts.count({a, b, static_cast<int>(ContactKind::Touch)}))) {
      continue;  // already reported as meeting
    }
    Finding f{contactName(kind, a == b), level, a, a == b ? -1 : b, contact.x, contact.y, contact.count, {}};
    if (kind == static_cast<int>(ContactKind::Near)) {
      char detail[96];
      std::snprintf(detail, sizeof detail, "%.6f apart near (%.6f, %.6f)", contact.distance, contact.x, contact.y);
      f.detail = detail;
    } else if (a == b) {
      char detail[96];
      std::snprintf(detail, sizeof detail, "at (%.6f, %.6f), %lld times", contact.x, contact.y,
                    static_cast<long long>(contact.count));
      f.detail = detail;
    }
    findings.push_back(f);
  }

  const std::vector<Nesting> program = programNesting(rings, contours.front().z);
  const std::vector<Nesting> exact = exactNesting(rings);
  for (std::size_t i = 0; i < rings.size(); ++i) {
    if (program[i].depth == exact[i].depth && program[i].parent == exact[i].parent) continue;
    char detail[160];
    std::snprintf(detail, sizeof detail, "the classifier nests it at depth %d under %d, exactly it is at depth %d under %d",
                  program[i].depth, program[i].parent, exact[i].depth, exact[i].parent);
    findings.push_back(Finding{"nesting", level, static_cast<std::int32_t>(i), -1, rings[i][0].x, rings[i][0].y, 1, detail});
  }
  return findings;
}

int checkFile(const std::string& path, const CheckOptions& options) {
  ContourStream stream;
  if (!stream.open(path)) return reportDamage(path, fileio::ReadProblem{0, 0, "a readable file"});
  JsonStream json(stdout);
  if (options.json) {
    json.beginObject();
    json.value("file", path);
    json.beginArray("findings");
  }
  std::int64_t problems = 0, contourCount = 0;
  std::int32_t levels = 0;
  auto flush = [&](std::vector<InfoContour>& level) {
    if (level.empty()) return;
    ++levels;
    for (const Finding& f : checkLevel(level)) {
      ++problems;
      if (options.json) {
        nlohmann::json j{{"kind", f.kind}, {"level", f.level}, {"contour", f.contour}, {"x", f.x}, {"y", f.y},
                         {"count", f.count}, {"message", describe(f)}};
        if (f.other >= 0) j["other"] = f.other;
        json.element(j);
      } else {
        std::printf("%s\n", describe(f).c_str());
      }
    }
    level.clear();
  };
  std::vector<InfoContour> level;
  InfoContour c;
  fileio::RecordRead r;
  while ((r = stream.next(c)) == fileio::RecordRead::Record) {
    ++contourCount;
    if (!level.empty() && c.level != level.front().level) flush(level);
    level.push_back(std::move(c));
    c = InfoContour{};
  }
  if (r != fileio::RecordRead::Damaged) flush(level);
  if (options.json) {
    json.end();
    json.value("levels", levels);
    json.value("contours", contourCount);
    json.value("problems", problems);
    json.value("clean", problems == 0 && r != fileio::RecordRead::Damaged);
    json.end();
  } else if (r != fileio::RecordRead::Damaged) {
    std::printf("%s: %d levels, %lld contours, %lld problems\n", path.c_str(), levels,
                static_cast<long long>(contourCount), static_cast<long long>(problems));
  }
  std::fflush(stdout);
  if (r == fileio::RecordRead::Damaged) return reportDamage(path, stream.problem());
  return problems == 0 ? kExitClean : kExitProblems;
}

}  // namespace pc::inspect
