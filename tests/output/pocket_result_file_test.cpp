#include <gtest/gtest.h>

#include <cstdio>
#include <string>

#include "output/pocket_result_file.h"
#include "output_fixture.h"

namespace pc {
namespace {

using test::square;

const std::string kHeader = " 99999.000         0         0     0\n";
const std::string kSeparator = " 99999.000 99999.000 99999.000  9999\n";
const std::string kEnd = " 99999.000 99999.000 99999.000 -1004\n";

std::string pointLines(const std::vector<Point>& points, double z) {
  std::string lines;
  for (const Point& p : points) {
    char line[64];
    std::snprintf(line, sizeof line, "%10.3lf%10.3lf%10.3lf%6d\n", double{p.x}, double{p.y}, z, -1003);
    lines += line;
  }
  return lines;
}

class PocketResultFile : public testing::Test {
 protected:
  test::TempDir dir;
  test::ScopedCurrentDir cwd{dir.path()};
  test::OutlineFixture model;
  int result = 0;

  std::string write(const CheckedArray<Pocket*>& list) {
    return test::console([&] { return writePocketResultFile(list); }, result);
  }
  std::string written() const { return test::readFile(dir.file("poches.res")); }
};

TEST_F(PocketResultFile, OnePocketGivesHeaderSeparatorPointsSeparatorAndEnd) {
  EXPECT_EQ(kHeader.size(), 37u);  // 36 characters and the line end
  const std::vector<Point> outer = {{12.5f, -3.25f}, {20, -3.25f}, {20, 4}, {12.5f, 4}, {12.5f, -3.25f}};
  EXPECT_EQ(write(test::pocketList({model.pocket(outer, 10.0f)})), "\n OUTPUT : poches.res\n");
  EXPECT_EQ(result, 0);
  EXPECT_EQ(written(), kHeader + kSeparator +
                           "    12.500    -3.250    10.000 -1003\n"
                           "    20.000    -3.250    10.000 -1003\n"
                           "    20.000     4.000    10.000 -1003\n"
                           "    12.500     4.000    10.000 -1003\n"
                           "    12.500    -3.250    10.000 -1003\n" +
                           kSeparator + kEnd);
}

TEST_F(PocketResultFile, LaterPocketsStartWithoutSeparatorAndIslandsTakeTheOuterZ) {
  Pocket* first = model.pocket(square(0, 0, 10), 10.0f);
  Pocket* second = model.pocket(square(0, 0, 30), -1.5f, {square(5, 5, 2)});
  write(test::pocketList({first, second}));
  EXPECT_EQ(result, 0);
  EXPECT_EQ(written(), kHeader + kSeparator + pointLines(square(0, 0, 10), 10.0) + kSeparator + kEnd +
                           pointLines(square(0, 0, 30), -1.5) + kSeparator + pointLines(square(5, 5, 2), -1.5) +
                           kSeparator + kEnd);
}

TEST_F(PocketResultFile, EmptyListCreatesNoFileAndPrintsNothing) {
  EXPECT_EQ(write(CheckedArray<Pocket*>(0, 1000)), "");
  EXPECT_EQ(result, 0);
  EXPECT_FALSE(test::fileExists(dir.file("poches.res")));
}

TEST_F(PocketResultFile, OpenContourStopsTheFileAfterTheEarlierPockets) {
  Pocket* good = model.pocket(square(0, 0, 10), 1.0f);
  const std::string out = write(test::pocketList({good, model.pocket(test::kOpenSquare, 2.0f), good}));
  EXPECT_EQ(result, -1);
  EXPECT_NE(out.find("*** OPEN CONTOUR (5 pts)\n*** First Point : X=0.000 Y=0.000 Z=2.000\n"), std::string::npos);
  EXPECT_EQ(written(), kHeader + kSeparator + pointLines(square(0, 0, 10), 1.0) + kSeparator + kEnd);
}

using PocketResultFileDeathTest = PocketResultFile;

TEST_F(PocketResultFileDeathTest, FileThatCannotBeOpenedWrittenOrClosedEndsTheRun) {
  auto list = test::pocketList({model.pocket(square(0, 0, 10), 1.0f)});
  for (const OutputFileHooks& hooks : test::failingHooks()) {
    test::ScopedOutputHooks scoped(hooks);
    EXPECT_EXIT(
        {
          test::sendStdoutToStderr();
          writePocketResultFile(list);
        },
        testing::ExitedWithCode(255), "^\n OUTPUT : poches\\.res\n\\*\\*\\* Cannot open file poches\\.res in mode w\\.\n$");
  }
}

}  // namespace
}  // namespace pc
