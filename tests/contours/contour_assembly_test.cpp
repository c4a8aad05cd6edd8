#include "contours/contour_assembly.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <string>
#include <vector>

namespace pc {
namespace {

const std::string kStars = "**************************************\n";

struct Entries {
  std::vector<Point> points;
  std::vector<float> zs;
  Entries& add(float x, float y, float z) {
    points.push_back(Point{x, y});
    zs.push_back(z);
    return *this;
  }
  Entries& separator() { return add(99999.0f, 99999.0f, 99999.0f); }
  // The unit square from (x0, y0), its closing point dx away from the first.
  Entries& square(float x0, float y0, float z, float dx = 0.0f) {
    return add(x0, y0, z).add(x0 + 1, y0, z).add(x0 + 1, y0 + 1, z).add(x0, y0 + 1, z).add(x0 + dx, y0, z);
  }
  Entries& triangle() { return add(1, 2, 3).add(4, 2, 3).add(1, 2, 3); }
};

struct Result {
  std::int32_t count = 0;
  std::string output;
  std::vector<ZContour> contours;
};

Result assemble(Entries& e, std::int32_t capacity = 10) {
  Result r;
  r.contours.assign(static_cast<std::size_t>(capacity), ZContour{});
  testing::internal::CaptureStdout();
  r.count = assembleContours(e.points.data(), e.zs.data(), static_cast<std::int32_t>(e.points.size()),
                             r.contours.data(), capacity, 0.005);
  std::fflush(stdout);
  r.output = testing::internal::GetCapturedStdout();
  return r;
}

TEST(ContourAssembly, ClosesWithinToleranceAndFillsRecords) {
  Entries e;
  e.square(2, 3, 7.5f, 0.004f).separator().add(10, 10, 1).add(12, 10, 1).add(12, 13, 1).add(11, 14, 1);
  e.add(10, 12, 1).add(10, 10.001f, 1);
  const Result r = assemble(e);
  ASSERT_EQ(r.count, 2);
  EXPECT_EQ(r.output, "");
  const ZContour& a = r.contours[0];
  EXPECT_EQ(a.points, &e.points[0]);
  EXPECT_EQ(a.pointCount, 5);
  EXPECT_EQ(a.z, 7.5f);
  EXPECT_EQ(e.points[4].x, 2.0f);  // the last point is now exactly the first
  EXPECT_EQ(a.xmin, 2.0f);
  EXPECT_EQ(a.xmax, 3.0f);
  EXPECT_EQ(a.ymin, 3.0f);
  EXPECT_EQ(a.ymax, 4.0f);
  const ZContour& b = r.contours[1];
  EXPECT_EQ(b.points, &e.points[6]);
  EXPECT_EQ(b.pointCount, 6);
  EXPECT_EQ(e.points[11].y, 10.0f);
  EXPECT_EQ(b.ymax, 14.0f);
  // Four points (three vertices and the closing one) suffice.
  Entries four;
  four.add(0, 0, 2).add(1, 0, 2).add(0, 1, 2).add(0, 0, 2).separator();
  EXPECT_EQ(assemble(four).count, 1);
}

TEST(ContourAssembly, OpenContourReport) {
  Entries e;
  e.square(2, 3, 7.5f, 0.006f);
  Result r = assemble(e);
  EXPECT_EQ(r.count, 0);
  EXPECT_EQ(r.output, kStars + "*** OPEN CONTOUR (5 pts) in zcut.res\n*** First Point : X=2.000 Y=3.000 Z=7.500\n" +
                          "*** Last  Point : X=2.006 Y=3.000 Z=7.500\n" + kStars);
  EXPECT_EQ(e.points[4].x, 2.006f);  // a rejected run is left as it was

  Entries f;  // before a separator; the Z shown is the first point's
  f.add(0.1f, 0, -2.25f).add(1, 0, 9).add(1, 1, 9).add(0, 1, 9).separator().square(5, 5, 1);
  r = assemble(f);
  EXPECT_EQ(r.count, 0);
  EXPECT_EQ(r.output, kStars + "*** OPEN CONTOUR (4 pts) in zcut.res\n*** First Point : X=0.100 Y=0.000 Z=-2.250\n" +
                          "*** Last  Point : X=0.000 Y=1.000 Z=-2.250\n" + kStars);
}

TEST(ContourAssembly, TooShortRunsLongAndShortReports) {
  Entries e;
  e.triangle().separator().square(0, 0, 0);
  Result r = assemble(e);
  EXPECT_EQ(r.count, 0);
  EXPECT_EQ(r.output, kStars + "*** INVALID CONTOUR (3 pts) in zcut.res\n" + kStars +
                          "*** First Point : X=1.000 Y=2.000 Z=3.000\n" + kStars + "\n");
  Entries last;
  last.square(0, 0, 0).separator().triangle();
  r = assemble(last);
  EXPECT_EQ(r.count, 0);
  EXPECT_EQ(r.output, kStars + "*** INVALID CONTOUR (3 pts) in zcut.res\n" + kStars);
  Entries empty;  // two separators in a row: no first point to show
  empty.square(0, 0, 0).separator().separator().square(0, 0, 0);
  r = assemble(empty);
  EXPECT_EQ(r.count, 0);
  EXPECT_EQ(r.output, kStars + "*** INVALID CONTOUR (0 pts) in zcut.res\n" + kStars + kStars + "\n");
}

TEST(ContourAssembly, CapacityAndBadArgumentsFailSilently) {
  Entries e;
  e.square(0, 0, 0).separator().square(5, 0, 0);
  Result r = assemble(e, 1);
  EXPECT_EQ(r.count, 0);
  EXPECT_EQ(r.output, "");
  EXPECT_EQ(assemble(e, 2).count, 2);
  ZContour c;
  EXPECT_EQ(assembleContours(e.points.data(), e.zs.data(), 0, &c, 1, 0.005), 0);
  EXPECT_EQ(assembleContours(nullptr, e.zs.data(), 11, &c, 1, 0.005), 0);
}

}  // namespace
}  // namespace pc
