// show for the pocket files (tagged, record, result) and the level dump.
#include <algorithm>
#include <array>
#include <cstdio>
#include <map>

#include "json_stream.h"
#include "output/level_dump.h"
#include "pocket_files.h"
#include "show.h"

namespace pc::inspect {

namespace {

nlohmann::json pointsJson(const std::vector<Point>& points) {
  nlohmann::json list = nlohmann::json::array();
  for (const Point& p : points) list.push_back(pointJson(p.x, p.y));
  return list;
}

void printPoints(const std::vector<Point>& points) {
  for (const Point& p : points) std::printf("      %s %s\n", numberText(p.x).c_str(), numberText(p.y).c_str());
}

}  // namespace

int showPockets(const std::string& path, FileKind kind, const ShowOptions& options) {
  JsonStream json(stdout);
  if (options.json) {
    json.beginObject();
    json.value("file", path);
    json.value("kind", kindName(kind));
    json.beginArray("pockets");
  } else {
    std::printf("%s file %s, pockets in machining order\n", std::string(kindName(kind)).c_str(), path.c_str());
  }
  std::int64_t pockets = 0, points = 0;
  const PocketSink sink = [&](const PocketView& p) {
    ++pockets;
    if (options.json) {
      nlohmann::json j;
      j["pocket"] = p.number;
      j["z"] = number(p.z);
      if (p.hasZInteger) j["z_integer"] = p.zInteger;
      j["first_record"] = p.firstRecord;
      j["outer_points"] = p.contours.front().size();
      j["island_points"] = nlohmann::json::array();
      for (std::size_t i = 1; i < p.contours.size(); ++i) j["island_points"].push_back(p.contours[i].size());
      if (options.points) {
        j["outer"] = pointsJson(p.contours.front());
        j["islands"] = nlohmann::json::array();
        for (std::size_t i = 1; i < p.contours.size(); ++i) j["islands"].push_back(pointsJson(p.contours[i]));
      }
      json.element(j);
    } else {
      std::printf("pocket %lld  z %s", static_cast<long long>(p.number), numberText(p.z).c_str());
      if (p.hasZInteger) std::printf(" (stored as %d)", p.zInteger);
      std::printf("  record %lld  outer %zu points  %zu islands\n", static_cast<long long>(p.firstRecord),
                  p.contours.front().size(), p.contours.size() - 1);
      if (options.points) printPoints(p.contours.front());
      for (std::size_t i = 1; i < p.contours.size(); ++i) {
        std::printf("  island %zu  %zu points\n", i, p.contours[i].size());
        if (options.points) printPoints(p.contours[i]);
      }
    }
    for (const auto& c : p.contours) points += static_cast<std::int64_t>(c.size());
  };
  fileio::ReadProblem problem;
  const bool ok = readPocketFile(path, kind, sink, problem);
  if (options.json) {
    json.end();
    json.value("pocket_count", pockets);
    json.value("point_count", points);
    json.end();
  } else {
    std::printf("%lld pockets, %lld points\n", static_cast<long long>(pockets), static_cast<long long>(points));
  }
  std::fflush(stdout);
  return ok ? kExitClean : reportDamage(path, problem);
}

int showLevelDump(const std::string& path, const ShowOptions& options) {
  LevelDumpReader reader;
  if (!reader.open(path)) return reportDamage(path, reader.problem());
  const LevelDumpHeader& h = reader.header();
  JsonStream json(stdout);
  if (options.json) {
    json.beginObject();
    json.value("file", path);
    json.value("kind", "level-dump");
    json.value("header", {{"entries", h.entries}, {"records", h.records}, {"ordered", h.ordered}});
    json.value("level_list", reader.levelList());
    json.beginArray("levels");
  } else {
    std::printf("level dump %s: %d index entries, %d point records, order flag %d\n", path.c_str(), h.entries,
                h.records, h.ordered);
  }
  bool damaged = false;
  for (std::size_t k = 0; k < reader.index().size() && !damaged; ++k) {
    const LevelDumpIndexEntry& e = reader.index()[k];
    // The outlines of the level, cut back into outer nodes and islands; an
    // outer node's depth is twice the number of outer contours around it.
    std::vector<PocketView> outlines;
    OutlineGrouper grouper([&](const PocketView& v) { outlines.push_back(v); });
    std::vector<Point> contour;
    std::int64_t first = 0;
    LevelDumpRecord r;
    fileio::RecordRead got = fileio::RecordRead::End;
    if (!reader.startEntry(k)) {
      damaged = true;
      break;
    }
    while ((got = reader.nextRecord(r)) == fileio::RecordRead::Record) {
      if (r.kind == 1) {
        if (contour.empty()) first = reader.recordNumber();
        contour.push_back(Point{static_cast<float>(r.x), static_cast<float>(r.y)});
      } else {
        grouper.add(std::move(contour), static_cast<float>(e.z), first);
        contour.clear();
      }
    }
    grouper.add(std::move(contour), static_cast<float>(e.z), first);
    grouper.finish();
    if (got == fileio::RecordRead::Damaged) damaged = true;

    std::vector<int> depth(outlines.size(), 0);
    std::vector<std::array<float, 4>> box;
    for (const PocketView& o : outlines) {
      std::array<float, 4> b{o.contours.front()[0].x, o.contours.front()[0].y, o.contours.front()[0].x,
                             o.contours.front()[0].y};
      for (const Point& p : o.contours.front()) b = {std::min(b[0], p.x), std::min(b[1], p.y), std::max(b[2], p.x),
                                                     std::max(b[3], p.y)};
      box.push_back(b);
    }
    for (std::size_t i = 0; i < outlines.size(); ++i) {
      for (std::size_t j = 0; j < outlines.size(); ++j) {
        const bool around = box[j][0] <= box[i][0] && box[j][1] <= box[i][1] && box[i][2] <= box[j][2] &&
                            box[i][3] <= box[j][3];
        if (i != j && around && contourInside(outlines[i].contours.front(), outlines[j].contours.front())) {
          depth[i] += 2;
        }
      }
    }
    if (options.json) {
      json.beginObject();
      json.value("level", e.level);
      json.value("z", e.z);
      json.value("records", e.records);
      json.value("offset", e.offset);
      json.beginArray("nodes");
    } else {
      std::printf("level %d  z %.6g  %d records at offset %d\n", e.level, e.z, e.records, e.offset);
    }
    for (std::size_t i = 0; i < outlines.size(); ++i) {
      const PocketView& o = outlines[i];
      for (std::size_t c = 0; c < o.contours.size(); ++c) {
        const int d = depth[i] + (c == 0 ? 0 : 1);
        if (options.json) {
          nlohmann::json j{{"outline", i}, {"role", c == 0 ? "outer" : "island"}, {"depth", d},
                           {"points", o.contours[c].size()}};
          if (options.points) j["point_list"] = pointsJson(o.contours[c]);
          json.element(j);
        } else {
          std::printf("  %s  depth %d  %zu points\n", c == 0 ? "outer " : "  island", d, o.contours[c].size());
          if (options.points) printPoints(o.contours[c]);
        }
      }
    }
    if (options.json) {
      json.end();
      json.end();
    }
  }
  if (options.json) {
    json.end();
    json.end();
  }
  std::fflush(stdout);
  return damaged ? reportDamage(path, reader.problem()) : kExitClean;
}

}  // namespace pc::inspect
