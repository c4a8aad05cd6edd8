// show for the contour information file: levels, contours, separators.
#include <cstdio>

#include "contour_stream.h"
#include "json_stream.h"
#include "show.h"

namespace pc::inspect {

namespace {

constexpr double kClosureTolerance = 0.005;
constexpr double kZTolerance = 0.0001;
constexpr std::size_t kFewestPoints = 4;

nlohmann::json contourJson(const InfoContour& c) {
  nlohmann::json j;
  j["contour"] = c.indexInLevel;
  j["file_contour"] = c.indexInFile;
  j["first_record"] = c.firstRecord;
  j["offset"] = c.firstOffset;
  j["points"] = c.points.size();
  j["box"] = {number(c.xmin), number(c.ymin), number(c.xmax), number(c.ymax)};
  j["orientation"] = c.signedArea > 0 ? "ccw" : c.signedArea < 0 ? "cw" : "flat";
  j["area"] = c.signedArea;
  j["closure"] = c.closure;
  j["closed"] = c.closure <= kClosureTolerance;
  j["z_min"] = number(c.zMin);
  j["z_max"] = number(c.zMax);
  j["separators_before"] = c.separatorsBefore;
  return j;
}

void printContourText(const InfoContour& c) {
  std::printf("  contour %d  record %lld  %zu points  box (%.4f, %.4f)-(%.4f, %.4f)  %s  area %.4f  ",
              c.indexInLevel, static_cast<long long>(c.firstRecord), c.points.size(), c.xmin, c.ymin, c.xmax, c.ymax,
              c.signedArea > 0 ? "ccw" : c.signedArea < 0 ? "cw" : "flat", c.signedArea);
  if (c.closure <= kClosureTolerance) std::printf("closed (%.6f)", c.closure);
  else std::printf("OPEN (ends %.6f apart)", c.closure);
  if (static_cast<double>(c.zMax) - c.zMin > kZTolerance) std::printf("  Z VARIES %s..%s", numberText(c.zMin).c_str(), numberText(c.zMax).c_str());
  if (c.points.size() < kFewestPoints) std::printf("  TOO FEW POINTS");
  if (c.separatorsBefore > 1) std::printf("  (%lld separators before)", static_cast<long long>(c.separatorsBefore));
  std::printf("\n");
}

}  // namespace

int showContourInfo(const std::string& path, const ShowOptions& options) {
  ContourStream stream;
  if (!stream.open(path)) return reportDamage(path, fileio::ReadProblem{0, 0, "a readable file"});
  JsonStream json(stdout);
  if (options.json) {
    json.beginObject();
    json.value("file", path);
    json.value("kind", "contour-info");
    json.beginArray("levels");
  } else {
    std::printf("contour information file %s\n", path.c_str());
  }
  InfoContour c;
  std::int32_t level = -1;
  std::int64_t contours = 0;
  fileio::RecordRead r;
  while ((r = stream.next(c)) == fileio::RecordRead::Record) {
    ++contours;
    if (c.level != level) {
      level = c.level;
      if (options.json) {
        if (level > 0) {
          json.end();
          json.end();
        }
        json.beginObject();
        json.value("level", level);
        json.value("z", number(c.z));
        json.beginArray("contours");
      } else {
        std::printf("level %d  z %s\n", level, numberText(c.z).c_str());
      }
    }
    if (options.json) {
      nlohmann::json j = contourJson(c);
      if (options.points) {
        j["point_list"] = nlohmann::json::array();
        for (const Point& p : c.points) j["point_list"].push_back(pointJson(p.x, p.y));
      }
      json.element(j);
    } else {
      printContourText(c);
      if (options.points) {
        for (const Point& p : c.points) std::printf("    %s %s\n", numberText(p.x).c_str(), numberText(p.y).c_str());
      }
    }
  }
  if (options.json) {
    if (level >= 0) {
      json.end();
      json.end();
    }
    json.end();
    json.value("levels_count", level + 1);
    json.value("contours", contours);
    json.value("records", stream.records());
    json.value("separators", stream.separators());
    json.value("trailing_separators", stream.trailingSeparators());
    json.end();
  } else {
    std::printf("%d levels, %lld contours, %lld records, %lld separators (%lld after the last contour)\n", level + 1,
                static_cast<long long>(contours), static_cast<long long>(stream.records()),
                static_cast<long long>(stream.separators()), static_cast<long long>(stream.trailingSeparators()));
  }
  std::fflush(stdout);
  if (r == fileio::RecordRead::Damaged) return reportDamage(path, stream.problem());
  return kExitClean;
}

}  // namespace pc::inspect
