#include "svg_writer.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <map>
#include <memory>
#include <vector>

#include "contour_stream.h"
#include "contours/zcontour.h"
#include "file_kind.h"
#include "nesting.h"
#include "pocket_files.h"
#include "pockets/contour_geometry.h"
#include "report.h"

namespace pc::inspect {

namespace {

constexpr double kDrawingWidth = 1000.0;
constexpr double kMargin = 20.0;
constexpr double kLegendWidth = 220.0;
constexpr std::size_t kLegendRows = 40;
// Points closer than this (in drawing units) to the last one drawn add
// nothing visible and are left out.
constexpr double kVisibleStep = 0.05;

struct Frame {
  double xmin = INFINITY, xmax = -INFINITY, ymin = INFINITY, ymax = -INFINITY;
  double scale = 1.0;
  void include(const Point& p) {
    xmin = std::min(xmin, static_cast<double>(p.x));
    xmax = std::max(xmax, static_cast<double>(p.x));
    ymin = std::min(ymin, static_cast<double>(p.y));
    ymax = std::max(ymax, static_cast<double>(p.y));
  }
  void finish() {
    if (!(xmin <= xmax)) xmin = xmax = ymin = ymax = 0.0;
    const double extent = std::max({xmax - xmin, ymax - ymin, 1e-9});
    scale = kDrawingWidth / extent;
  }
  double x(double v) const { return kMargin + (v - xmin) * scale; }
  double y(double v) const { return kMargin + (ymax - v) * scale; }
  double width() const { return 2 * kMargin + (xmax - xmin) * scale; }
  double height() const { return 2 * kMargin + (ymax - ymin) * scale; }
};

struct FileCloser {
  void operator()(std::FILE* f) const { std::fclose(f); }
};
using SvgFile = std::unique_ptr<std::FILE, FileCloser>;

std::string levelColour(std::size_t k) {
  char text[40];
  std::snprintf(text, sizeof text, "hsl(%d,65%%,45%%)", static_cast<int>(std::fmod(k * 137.508, 360.0)));
  return text;
}

// One closed run "M x y L ... Z" of a path, thinned to visible steps.
void writeRing(std::FILE* out, const Frame& f, const std::vector<Point>& ring) {
  double lastX = 0, lastY = 0;
  for (std::size_t k = 0; k < ring.size(); ++k) {
    const double x = f.x(ring[k].x), y = f.y(ring[k].y);
    if (k > 0 && k + 1 < ring.size() && std::hypot(x - lastX, y - lastY) < kVisibleStep) continue;
    std::fprintf(out, "%s%.2f %.2f", k == 0 ? "M" : " L", x, y);
    lastX = x;
    lastY = y;
  }
  std::fputs(" Z", out);
}

void writeHead(std::FILE* out, const Frame& f, const std::string& title) {
  std::fprintf(out,
               "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
               "<svg xmlns=\"http://www.w3.org/2000/svg\" width=\"%.0f\" height=\"%.0f\" viewBox=\"0 0 %.2f %.2f\">\n"
               "<title>%s</title>\n"
               "<defs><marker id=\"arrow\" viewBox=\"0 0 10 10\" refX=\"9\" refY=\"5\" markerWidth=\"5\" "
               "markerHeight=\"5\" orient=\"auto\"><path d=\"M0 0 L10 5 L0 10 Z\" fill=\"#333\"/></marker></defs>\n"
               "<rect width=\"100%%\" height=\"100%%\" fill=\"white\"/>\n",
               f.width() + kLegendWidth, std::max(f.height(), 60.0), f.width() + kLegendWidth,
               std::max(f.height(), 60.0), xmlEscape(title).c_str());
}

void writeLegend(std::FILE* out, const Frame& f, const std::vector<std::pair<std::string, std::string>>& rows) {
  const double x = f.width() + 10;
  std::fprintf(out, "<g class=\"legend\" font-family=\"sans-serif\" font-size=\"12\">\n");
  for (std::size_t k = 0; k < rows.size() && k < kLegendRows; ++k) {
    const double y = kMargin + 16.0 * static_cast<double>(k);
    std::fprintf(out, "<rect x=\"%.1f\" y=\"%.1f\" width=\"10\" height=\"10\" fill=\"%s\"/>", x, y,
                 rows[k].second.c_str());
    std::fprintf(out, "<text x=\"%.1f\" y=\"%.1f\">%s</text>\n", x + 14, y + 9, xmlEscape(rows[k].first).c_str());
  }
  if (rows.size() > kLegendRows) {
    std::fprintf(out, "<text x=\"%.1f\" y=\"%.1f\">%s</text>\n", x, kMargin + 16.0 * kLegendRows + 9,
                 xmlEscape("... " + std::to_string(rows.size() - kLegendRows) + " more levels").c_str());
  }
  std::fprintf(out, "</g>\n");
}

bool finishFile(SvgFile& file, const std::string& output) {
  std::fputs("</svg>\n", file.get());
  const bool ok = std::ferror(file.get()) == 0;
  if (std::fclose(file.release()) != 0 || !ok) {
    std::fprintf(stderr, "pocket-inspect: %s: cannot be written completely\n", output.c_str());
    return false;
  }
  return true;
}

SvgFile openOutput(const std::string& output) {
  SvgFile file(std::fopen(output.c_str(), "wb"));
  if (!file) std::fprintf(stderr, "pocket-inspect: %s: cannot be created\n", output.c_str());
  return file;
}

int drawContourInfo(const std::string& path, const SvgOptions& options) {
  // First pass: the extent of what is drawn.
  Frame frame;
  {
    ContourStream stream;
    if (!stream.open(path)) return reportDamage(path, fileio::ReadProblem{0, 0, "a readable file"});
    InfoContour c;
    fileio::RecordRead r;
    while ((r = stream.next(c)) == fileio::RecordRead::Record) {
      if (options.level >= 0 && c.level != options.level) continue;
      frame.include(Point{c.xmin, c.ymin});
      frame.include(Point{c.xmax, c.ymax});
    }
    if (r == fileio::RecordRead::Damaged) return reportDamage(path, stream.problem());
  }
  frame.finish();
  SvgFile file = openOutput(options.output);
  if (!file) return kExitUnreadable;
  std::FILE* out = file.get();
  writeHead(out, frame, path);
  const bool single = options.level >= 0;
  std::vector<std::pair<std::string, std::string>> legend;

  auto drawLevel = [&](std::vector<InfoContour>& level) {
    if (level.empty()) return;
    const std::int32_t number = level.front().level;
    const std::string colour = levelColour(static_cast<std::size_t>(number));
    std::vector<std::vector<Point>> rings;
    for (InfoContour& c : level) {
      rings.push_back(std::move(c.points));
      rings.back().push_back(rings.back().front());
    }
    const std::vector<Nesting> nesting = programNesting(rings, level.front().z);
    const std::string z = numberText(level.front().z);
    std::fprintf(out, "<g class=\"level\" id=\"level-%d\" data-z=\"%s\">\n<path class=\"material\" fill=\"%s\" "
                      "fill-opacity=\"%.2f\" fill-rule=\"evenodd\" stroke=\"none\" d=\"",
                 number, xmlEscape(z).c_str(), colour.c_str(), single ? 0.35 : 0.12);
    for (const auto& r : rings) writeRing(out, frame, r);
    std::fputs("\"/>\n", out);
    for (int parity = 0; parity < 2; ++parity) {
      std::fprintf(out, "<path class=\"%s\" fill=\"none\" stroke=\"%s\" stroke-width=\"%.2f\" d=\"",
                   parity == 0 ? "outer" : "island", parity == 0 ? "#1f4e9c" : "#c0392b", single ? 0.8 : 0.4);
      for (std::size_t i = 0; i < rings.size(); ++i) {
        if (nesting[i].depth % 2 == parity) writeRing(out, frame, rings[i]);
      }
      std::fputs("\"/>\n", out);
    }
    std::fputs("</g>\n", out);
    legend.emplace_back("level " + std::to_string(number) + "  Z " + z, colour);
    level.clear();
  };

  ContourStream stream;
  stream.open(path);
  std::vector<InfoContour> level;
  InfoContour c;
  while (stream.next(c) == fileio::RecordRead::Record) {
    if (options.level >= 0 && c.level != options.level) continue;
    if (!level.empty() && c.level != level.front().level) drawLevel(level);
    level.push_back(std::move(c));
    c = InfoContour{};
  }
  drawLevel(level);
  legend.emplace_back("outer contour", "#1f4e9c");
  legend.emplace_back("island", "#c0392b");
  writeLegend(out, frame, legend);
  return finishFile(file, options.output) ? kExitClean : kExitUnreadable;
}

// Where a pocket's number goes: the classifier's interior point of its
// region, or its first point when there is none.
Point labelPoint(PocketView& pocket, std::vector<double>& scratch) {
  std::vector<ZContour> contours(pocket.contours.size());
  std::vector<ZContour*> list;
  for (std::size_t i = 0; i < contours.size(); ++i) {
    fill(contours[i], pocket.contours[i].data(), static_cast<std::int32_t>(pocket.contours[i].size()), pocket.z);
    list.push_back(&contours[i]);
  }
  Point p = pocket.contours.front().front();
  if (!regionInteriorPoint(list.data(), static_cast<std::int32_t>(list.size()), p, scratch)) {
    p = pocket.contours.front().front();
  }
  return p;
}

int drawPockets(const std::string& path, FileKind kind, const SvgOptions& options) {
  std::vector<PocketView> pockets;
  fileio::ReadProblem problem;
  if (!readPocketFile(path, kind, [&](const PocketView& p) { pockets.push_back(p); }, problem)) {
    return reportDamage(path, problem);
  }
  // Levels told apart by Z, highest first.
  std::vector<float> zs;
  for (const PocketView& p : pockets) zs.push_back(p.z);
  std::sort(zs.begin(), zs.end(), [](float a, float b) { return a > b; });
  zs.erase(std::unique(zs.begin(), zs.end()), zs.end());
  auto levelOf = [&](float z) {
    return static_cast<std::size_t>(std::find(zs.begin(), zs.end(), z) - zs.begin());
  };
  if (options.level >= 0) {
    std::erase_if(pockets, [&](const PocketView& p) { return levelOf(p.z) != static_cast<std::size_t>(options.level); });
  }
  Frame frame;
  for (const PocketView& p : pockets) {
    for (const Point& q : p.contours.front()) frame.include(q);
  }
  frame.finish();
  SvgFile file = openOutput(options.output);
  if (!file) return kExitUnreadable;
  std::FILE* out = file.get();
  writeHead(out, frame, path);
  const double font = std::clamp(kDrawingWidth / std::sqrt(static_cast<double>(std::max<std::size_t>(pockets.size(), 1))) / 4.0, 2.0, 16.0);
  std::vector<Point> labels;
  std::vector<double> scratch;
  std::fputs("<g class=\"pockets\">\n", out);
  for (PocketView& p : pockets) {
    const std::string colour = levelColour(levelOf(p.z));
    std::fprintf(out, "<path class=\"pocket\" data-pocket=\"%lld\" data-z=\"%s\" fill=\"%s\" fill-opacity=\"0.3\" "
                      "fill-rule=\"evenodd\" stroke=\"%s\" stroke-width=\"0.6\" d=\"",
                 static_cast<long long>(p.number), xmlEscape(numberText(p.z)).c_str(), colour.c_str(), colour.c_str());
    for (const auto& ring : p.contours) writeRing(out, frame, ring);
    std::fputs("\"/>\n", out);
    labels.push_back(labelPoint(p, scratch));
  }
  std::fputs("</g>\n", out);
  if (labels.size() > 1) {
    std::fprintf(out, "<polyline class=\"order\" fill=\"none\" stroke=\"#333\" stroke-width=\"%.2f\" "
                      "stroke-opacity=\"0.7\" marker-mid=\"url(#arrow)\" marker-end=\"url(#arrow)\" points=\"",
                 std::max(font / 10.0, 0.3));
    for (const Point& q : labels) std::fprintf(out, "%.2f,%.2f ", frame.x(q.x), frame.y(q.y));
    std::fputs("\"/>\n", out);
  }
  std::fprintf(out, "<g class=\"labels\" font-family=\"sans-serif\" font-size=\"%.1f\" text-anchor=\"middle\">\n", font);
  for (std::size_t i = 0; i < pockets.size(); ++i) {
    std::fprintf(out, "<text class=\"pocket-label\" x=\"%.2f\" y=\"%.2f\">%s</text>\n", frame.x(labels[i].x),
                 frame.y(labels[i].y) + font / 3.0, xmlEscape(std::to_string(pockets[i].number)).c_str());
  }
  std::fputs("</g>\n", out);
  std::vector<std::pair<std::string, std::string>> legend;
  for (std::size_t k = 0; k < zs.size(); ++k) {
    if (options.level < 0 || k == static_cast<std::size_t>(options.level)) {
      legend.emplace_back("level " + std::to_string(k) + "  Z " + numberText(zs[k]), levelColour(k));
    }
  }
  writeLegend(out, frame, legend);
  return finishFile(file, options.output) ? kExitClean : kExitUnreadable;
}

}  // namespace

std::string xmlEscape(std::string_view text) {
  std::string out;
  out.reserve(text.size());
  for (const char ch : text) {
    const auto c = static_cast<unsigned char>(ch);
    switch (ch) {
      case '&': out += "&amp;"; break;
      case '<': out += "&lt;"; break;
      case '>': out += "&gt;"; break;
      case '"': out += "&quot;"; break;
      case '\'': out += "&apos;"; break;
      default:
        // Control characters are not allowed in XML 1.0 at all.
        if (c < 0x20 && c != '\t' && c != '\n' && c != '\r') out += '?';
        else out += ch;
    }
  }
  return out;
}

int drawSvg(const std::string& path, const SvgOptions& options) {
  const std::optional<FileKind> kind = detectKind(path);
  if (!kind) {
    std::fprintf(stderr, "pocket-inspect: %s: not a file of the run\n", path.c_str());
    return kExitUnreadable;
  }
  switch (*kind) {
    case FileKind::ContourInfo: return drawContourInfo(path, options);
    case FileKind::TaggedContours:
    case FileKind::RecordContours:
    case FileKind::PocketResult: return drawPockets(path, *kind, options);
    default: break;
  }
  std::fprintf(stderr, "pocket-inspect: %s: a %s file has no picture (contour or pocket files only)\n", path.c_str(),
               std::string(kindName(*kind)).c_str());
  return kExitUnreadable;
}

}  // namespace pc::inspect
