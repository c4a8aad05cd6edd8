// Contour input: the two passes over the contour information file (counting
// and loading), then the assembly of the loaded points into closed contours.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include "contours/contour_assembly.h"
#include "contours/contour_info_file.h"
#include "contours/point_loader.h"
#include "fileio/sequential_open.h"
#include "support/test_support.h"

namespace pc {
namespace {

using test::contourInfoBytes;
const std::vector<float> S{99999, 99999, 99999}, P1{1, 1, 5}, P2{2, 1, 5}, P3{3, 3, 6}, P4{4, 3, 6};

// $TMP is resolved once per process, so every test shares one directory.
std::string infoPath() {
  static test::TempDir dir;
  static test::ScopedEnv tmp("TRXTMPDIR", dir.path());
  return dir.file("trxcon.inf");
}

// The counts "nz np nc" of a first pass, then the entries a second pass
// stores with room for `capacity`, as " x y z|x y z...".
std::string passes(std::int32_t capacity) {
  const ContourCounts c = countContourInfoFile();
  std::vector<Point> points(static_cast<std::size_t>(std::max(capacity, 1)));
  std::vector<float> zs(points.size());
  const std::int32_t n = loadContourPoints(points.data(), zs.data(), capacity, 1e-7);
  std::ostringstream out;
  out.precision(9);
  out << c.nz << ' ' << c.np << ' ' << c.nc << ':';
  for (std::int32_t i = 0; i < n; ++i) out << (i > 0 ? '|' : ' ') << points[i].x << ' ' << points[i].y << ' ' << zs[i];
  return out.str();
}

TEST(ContourInfoFile, CountedAndLoaded) {
  const std::pair<std::string, std::string> cases[] = {
      // Separator runs become one entry, leading and trailing separators go;
      // records reaching 90000 in any value are separators.
      {contourInfoBytes({S, S, P1, P2, {90000, 0, 0}, {-90000, 0, 0}, S, P3, P4, S}),
       "2 10 6: 1 1 5|2 1 5|99999 99999 99999|3 3 6|4 3 6"},
      // Points within the tolerance of the last kept one are dropped.
      {contourInfoBytes({{1, 0, 0}, {0.99999994f, 0, 0}, {1.00000012f, 0, 0}}), "1 3 0: 1 0 0|1.00000012 0 0"},
      // Z changes are counted against the last counted Z, not as distinct
      // values. Z is tested only at the first point of a contour; the first
      // point after a separator is never compared with the one before.
      {contourInfoBytes({{0, 0, 10}, {0, 0, 20}, {0, 0, 10}, {0, 0, 10.00008f}, {0, 0, 10.00016f}}), "4 5 0: 0 0 10"},
      {contourInfoBytes({P1, {7, 7, 90000}, S, {8, 8, -90000}, P1}), "1 5 3: 1 1 5|7 7 90000|99999 99999 99999|1 1 5"},
      // NaN and infinity are separators (inside a contour Z is not tested).
      {contourInfoBytes({{NAN, 0, 0}, P1, P2, {0, NAN, 0}, {1, 1, NAN}, {-INFINITY, 0, 0}, P3, {5, 5, NAN}}),
       "2 8 5: 1 1 5|2 1 5|99999 99999 99999|3 3 6|5 5 nan"},
      {"", "0 0 0:"},
      {contourInfoBytes({S, S}), "0 2 2:"},
      // A longer record gives its first three floats; a shorter record, or a
      // file cut inside a record, ends the reading.
      {contourInfoBytes({{1, 2, 3, 4}, P2, S, P3, {7, 7}, P4}), "3 4 1: 1 2 3|2 1 5|99999 99999 99999|3 3 6"},
      {contourInfoBytes({{0, 0, 1}, S}) + contourInfoBytes({P1}).substr(0, 9), "1 2 1: 0 0 1"},
  };
  for (const auto& [bytes, expected] : cases) {
    test::writeFile(infoPath(), bytes);
    // Room for exactly the stored entries suffices, one less fails the load.
    const int stored = int(std::count(expected.begin(), expected.end(), '|')) + (expected.back() != ':');
    EXPECT_EQ(passes(std::max(stored, 1)), expected);
    EXPECT_EQ(passes(stored - 1), expected.substr(0, expected.find(':') + 1)) << expected;
    EXPECT_EQ(fileio::freeUnit(), 3);  // both passes close the file again
  }
  EXPECT_EQ(loadContourPoints(nullptr, nullptr, 1, 1e-10), 0);
  std::remove(infoPath().c_str());
  EXPECT_EQ(passes(64), "0 0 0:");
  EXPECT_EQ(fileio::freeUnit(), 3);
}

struct Entries {
  std::vector<Point> points;
  std::vector<float> zs;
  std::vector<ZContour> contours = std::vector<ZContour>(2);
  Entries& add(float x, float y, float z) { points.push_back({x, y}); zs.push_back(z); return *this; }
  Entries& separator() { return add(99999, 99999, 99999); }
  // The unit square from (x0, y0), its closing point dx away from the first.
  Entries& square(float x0, float y0, float z, float dx = 0) {
    return add(x0, y0, z).add(x0 + 1, y0, z).add(x0 + 1, y0 + 1, z).add(x0, y0 + 1, z).add(x0 + dx, y0, z);
  }
  // The number of contours, then what the assembly printed.
  std::string assemble(std::int32_t capacity = 2) {
    testing::internal::CaptureStdout();
    const int n = assembleContours(points.data(), zs.data(), int(points.size()), contours.data(), capacity, 0.005);
    std::fflush(stdout);
    return std::to_string(n) + "|" + testing::internal::GetCapturedStdout();
  }
};

// A rejected run is reported with the Z of its first point.
TEST(ContourAssembly, ClosesOrReportsEachRun) {
  const std::string stars = "**************************************\n";
  const std::string invalid3 = "0|" + stars + "*** INVALID CONTOUR (3 pts) in zcut.res\n" + stars;
  std::pair<Entries, std::string> cases[] = {
      {Entries().square(2, 3, 7.5f, 0.004f).separator().add(0, 0, 1).add(2, 0, 1).add(1, 4, 1).add(0, 0.001f, 1), "2|"},
      {Entries().add(0.1f, 0, -2.25f).add(1, 0, 9).add(1, 1, 9).add(0.106f, 0, 9).separator().square(5, 5, 1),
       "0|" + stars + "*** OPEN CONTOUR (4 pts) in zcut.res\n*** First Point : X=0.100 Y=0.000 Z=-2.250\n" +
           "*** Last  Point : X=0.106 Y=0.000 Z=-2.250\n" + stars},
      {Entries().add(1, 2, 3).add(4, 2, 3).add(1, 2, 3).separator().square(0, 0, 0),
       invalid3 + "*** First Point : X=1.000 Y=2.000 Z=3.000\n" + stars + "\n"},
      {Entries().square(0, 0, 0).separator().add(1, 2, 3).add(4, 2, 3).add(1, 2, 3), invalid3},  // count only
      // Two separators in a row: no first point to show.
      {Entries().square(0, 0, 0).separator().separator().square(0, 0, 0),
       "0|" + stars + "*** INVALID CONTOUR (0 pts) in zcut.res\n" + stars + stars + "\n"},
  };
  for (auto& [entries, expected] : cases) EXPECT_EQ(entries.assemble(), expected);
  Entries& r = cases[0].first;
  const ZContour &a = r.contours[0], &b = r.contours[1];  // four points suffice for b
  // The records; an accepted run's last point is now exactly its first, a
  // rejected run's is kept.
  EXPECT_EQ(std::vector<float>({float(a.pointCount), a.z, a.xmin, a.xmax, a.ymin, a.ymax, float(b.pointCount), b.z,
                                float(b.points - r.points.data()), r.points[4].x, cases[1].first.points[3].x}),
            std::vector<float>({5, 7.5f, 2, 3, 3, 4, 4, 1, 6, 2, 0.106f}));
  // More contours than the capacity fail silently, whether the last one ends
  // at a separator or not.
  EXPECT_EQ(r.assemble(1), "0|");
  EXPECT_EQ(r.separator().assemble(1), "0|");
  EXPECT_EQ(r.assemble(2), "2|");
  EXPECT_EQ(assembleContours(r.points.data(), r.zs.data(), 0, r.contours.data(), 2, 0.005), 0);
  EXPECT_EQ(assembleContours(nullptr, nullptr, 11, nullptr, 2, 0.005), 0);
}

}  // namespace
}  // namespace pc
