#include "contours/contour_assembly.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

namespace pc {
namespace {

const std::string kStars = "**************************************\n";

struct Entries {
  std::vector<Point> points;
  std::vector<float> zs;
  std::vector<ZContour> contours = std::vector<ZContour>(2);
  std::string output;  // what the last assembly printed
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
  std::int32_t assemble(std::int32_t capacity = 2) {
    testing::internal::CaptureStdout();
    const std::int32_t n = assembleContours(points.data(), zs.data(), static_cast<std::int32_t>(points.size()),
                                            contours.data(), capacity, 0.005);
    std::fflush(stdout);
    output = testing::internal::GetCapturedStdout();
    return n;
  }
};

TEST(ContourAssembly, ClosesWithinToleranceAndFillsRecords) {
  Entries r;
  r.square(2, 3, 7.5f, 0.004f).separator().add(10, 10, 1).add(12, 10, 1).add(11, 14, 1).add(10, 10.001f, 1);
  ASSERT_EQ(r.assemble(), 2);
  EXPECT_EQ(r.output, "");
  EXPECT_EQ(r.points[4].x, 2.0f);  // the last point is now exactly the first
  const ZContour& a = r.contours[0];
  EXPECT_EQ(a.points, &r.points[0]);
  EXPECT_EQ(std::vector<float>({float(a.pointCount), a.z, a.xmin, a.xmax, a.ymin, a.ymax}),
            std::vector<float>({5, 7.5f, 2, 3, 3, 4}));
  const ZContour& b = r.contours[1];  // four points suffice
  EXPECT_EQ(b.points, &r.points[6]);
  EXPECT_EQ(std::vector<float>({float(b.pointCount), b.z, b.ymax}), std::vector<float>({4, 1, 14}));
  // More contours than the capacity fail silently, whether the last one ends
  // at a separator or not.
  EXPECT_EQ(r.assemble(1), 0);
  EXPECT_EQ(r.output, "");
  EXPECT_EQ(r.separator().assemble(1), 0);
  EXPECT_EQ(r.output, "");
  EXPECT_EQ(r.assemble(2), 2);
  EXPECT_EQ(assembleContours(r.points.data(), r.zs.data(), 0, r.contours.data(), 2, 0.005), 0);
  EXPECT_EQ(assembleContours(nullptr, nullptr, 11, nullptr, 2, 0.005), 0);
}

TEST(ContourAssembly, RejectedRunsAreReportedAndLeftAsTheyWere) {
  Entries cases[4];
  // Just beyond the tolerance, before a separator; the Z shown is the first point's.
  cases[0].add(0.1f, 0, -2.25f).add(1, 0, 9).add(1, 1, 9).add(0.106f, 0, 9).separator().square(5, 5, 1);
  cases[1].add(1, 2, 3).add(4, 2, 3).add(1, 2, 3).separator().square(0, 0, 0);
  cases[2].square(0, 0, 0).separator().add(1, 2, 3).add(4, 2, 3).add(1, 2, 3);
  cases[3].square(0, 0, 0).separator().separator().square(0, 0, 0);
  const std::string invalid3 = kStars + "*** INVALID CONTOUR (3 pts) in zcut.res\n" + kStars;
  const std::string expected[4] = {
      kStars + "*** OPEN CONTOUR (4 pts) in zcut.res\n*** First Point : X=0.100 Y=0.000 Z=-2.250\n" +
          "*** Last  Point : X=0.106 Y=0.000 Z=-2.250\n" + kStars,
      invalid3 + "*** First Point : X=1.000 Y=2.000 Z=3.000\n" + kStars + "\n",
      invalid3,  // the last run shows only its count
      // Two separators in a row: no first point to show.
      kStars + "*** INVALID CONTOUR (0 pts) in zcut.res\n" + kStars + kStars + "\n",
  };
  for (int i = 0; i < 4; ++i) {
    const std::vector<Point> before = cases[i].points;
    EXPECT_EQ(cases[i].assemble(), 0) << i;
    EXPECT_EQ(cases[i].output, expected[i]) << i;
    EXPECT_EQ(std::memcmp(before.data(), cases[i].points.data(), before.size() * sizeof(Point)), 0) << i;
  }
}

}  // namespace
}  // namespace pc
