// What the tool parameters change in a run: the tool line, the
// classification choice and the width filter.
#include <gtest/gtest.h>

#include <string>

#include "e2e/e2e_support.h"

namespace pc::test {
namespace {

std::string toolLine(const std::string& out) {
  const auto start = out.find(" Tool : ");
  return start == std::string::npos ? "" : out.substr(start, out.find('\n', start) - start);
}

TEST(RunParameters, ToolLineFollowsTheRadii) {
  struct Case {
    const char* toolpath;
    const char* corner;
    const char* body;
    const char* expected;
  };
  const Case cases[] = {
      {"12.0", "0.0", "5.0", " Tool : #12 FLATEND(R=5.00mm)"},
      {"12.0", "3.0", "3.0", " Tool : #12 BALLEND(r=3.00mm)"},
      {"12.0", "2.0", "5.0", " Tool : #12 BULLNOSE(r=2.00mm,R=5.00mm)"},
      {"12.0", "6.0", "5.0", " Tool : #12 BALLEND(r=6.00mm)"},
      {"30012", "1.0", "4.0", " Tool : #12.3 BULLNOSE(r=1.00mm,R=4.00mm)"},
  };
  for (const auto& c : cases) {
    WorkZone wz;
    wz.writeParameters({{2, c.toolpath}, {3, c.corner}, {4, c.body}});
    EXPECT_EQ(toolLine(wz.run({}).out), c.expected);
  }
}

// Two levels, a square under a larger one: one zone of two pockets.
std::vector<std::vector<float>> twoLevels() {
  std::vector<std::vector<float>> records;
  appendSquare(records, 0, 0, 100, 10);
  appendSquare(records, 10, 10, 80, 5);
  return records;
}

TEST(RunParameters, MachiningOrderChoosesTheClassification) {
  struct Case {
    const char* order;
    const char* mode;
    const char* expected;
  };
  const Case cases[] = {
      {"2.0", "x", " LEVEL-BASED POCKET CLASSIFICATION...\n 2 pockets\n"},
      {"1.0", "x", " ZONE-BASED POCKET CLASSIFICATION...\n 2 pockets\n"},
      {"2.9", "x", " LEVEL-BASED POCKET CLASSIFICATION...\n 2 pockets\n"},
      {"1.0", "F", " LEVEL-BASED POCKET CLASSIFICATION...\n 2 pockets\n"},
      {"1.0", "w", " LEVEL-BASED POCKET CLASSIFICATION...\n 2 pockets\n"},
  };
  for (const auto& c : cases) {
    WorkZone wz;
    wz.writeContours(twoLevels());
    wz.writeParameters({{46, c.order}});
    const RunResult r = wz.run({c.mode});
    EXPECT_NE(r.out.find(std::string(" 2 z-levels\n\n") + c.expected), std::string::npos)
        << c.order << " " << c.mode << "\n" << r.out;
  }
}

TEST(RunParameters, WidthFilterLineCountsTheSurvivors) {
  WorkZone wz;
  std::vector<std::vector<float>> records;
  appendSquare(records, 0, 0, 10, 10);
  appendSquare(records, 20, 0, 10, 10);
  appendSquare(records, 40, 0, 10, 10);
  appendSquare(records, 60, 0, 2, 10);  // narrower than the threshold
  wz.writeContours(records);
  wz.writeParameters({{58, "2.5"}});
  const RunResult r = wz.run({"x"});
  EXPECT_NE(r.out.find(" 4 pockets\n 3 pockets [width > 2.500mm]\n"), std::string::npos) << r.out;
  EXPECT_TRUE(r.out.find(" DONE\n\n") != std::string::npos);
}

TEST(RunParameters, ExampleWorkZoneClassifiesEveryLevel) {
  WorkZone wz;
  writeFile(wz.tmpFile("trxcon.inf"), readFile(std::string(PC_EXAMPLES_DIR) + "/zone/tmp/trxcon.inf"));
  writeFile(wz.tmpFile("outil.par"), readFile(std::string(PC_EXAMPLES_DIR) + "/zone/tmp/outil.par"));
  const RunResult r = wz.run({"x"});
  EXPECT_EQ(r.exitStatus, 0);
  EXPECT_NE(r.out.find(" Tool : #12 BULLNOSE(r=1.00mm,R=5.00mm)\n"), std::string::npos) << r.out;
  EXPECT_NE(r.out.find(" 26 contours\n"), std::string::npos) << r.out;
  EXPECT_NE(r.out.find(" 8 z-levels\n\n ZONE-BASED POCKET CLASSIFICATION...\n"), std::string::npos) << r.out;
  // Every pocket the run announces is written, each closed by its end line.
  const auto widthLine = r.out.find(" pockets [width > 2.000mm]\n");
  ASSERT_NE(widthLine, std::string::npos) << r.out;
  const auto lineStart = r.out.rfind('\n', widthLine) + 1;
  const int announced = std::stoi(r.out.substr(lineStart, widthLine - lineStart));
  const std::string result = readFile(wz.zoneFile("poches.res"));
  int ends = 0;
  for (std::size_t at = 0; (at = result.find(" -1004\n", at)) != std::string::npos; ++at) ++ends;
  EXPECT_GT(announced, 0);
  EXPECT_EQ(ends, announced);
}

}  // namespace
}  // namespace pc::test
