#include <gtest/gtest.h>

#include <filesystem>
#include <string>

#include "e2e/e2e_support.h"

namespace pc::test {
namespace {

std::vector<std::vector<float>> oneSquare() {
  std::vector<std::vector<float>> records;
  appendSquare(records, 0.0f, 0.0f, 10.0f, 10.0f);
  return records;
}

TEST(RunModes, OneSquareInPocketResultModePrintsEveryStep) {
  WorkZone wz;
  wz.writeContours(oneSquare());
  writeFile(wz.tmpFile("offset2.err"), "stale");
  const RunResult r = wz.run({"x"});
  EXPECT_EQ(r.exitStatus, 0);
  EXPECT_FALSE(fileExists(wz.tmpFile("offset2.err")));  // removed at the end of the run
  EXPECT_EQ(r.out, expectedBanner() +
                       "\n Tool : # FLATEND(R=0.00mm)\n\n INITIALIZATION...\n NZ=1 NP=6 NC=1\n"
                       "\n LOADING Z-CONTOURS...\n 1 contours\n\n BUILDING POCKETS IN EACH Z-LEVEL...\n"
                       " 1 z-levels\n\n LEVEL-BASED POCKET CLASSIFICATION...\n 1 pockets\n"
                       "\n OUTPUT : poches.res\n DONE\n\n");
  EXPECT_EQ(readFile(wz.zoneFile("poches.res")),
            " 99999.000         0         0     0\n"
            " 99999.000 99999.000 99999.000  9999\n"
            "     0.000     0.000    10.000 -1003\n"
            "    10.000     0.000    10.000 -1003\n"
            "    10.000    10.000    10.000 -1003\n"
            "     0.000    10.000    10.000 -1003\n"
            "     0.000     0.000    10.000 -1003\n"
            " 99999.000 99999.000 99999.000  9999\n"
            " 99999.000 99999.000 99999.000 -1004\n");
}

// Which files each argument writes, by their sizes for one square pocket:
// the tagged file is 72 bytes, the record file 7 framed records of 26, the
// text file 9 lines of 37, the level dump 192 bytes; -1 when absent.
TEST(RunModes, FirstCharacterOfTheArgumentSelectsTheOutput) {
  struct Case {
    std::vector<std::string> args;
    long contourBin, pochesRes, wlevel;
  };
  const std::vector<Case> cases = {
      {{}, 72, -1, -1},          {{"c"}, 72, -1, -1},  {{"Cxyz"}, 72, -1, -1},
      {{"f"}, 182, -1, -1},      {{"F", "w"}, 182, -1, -1},
      {{"w"}, 182, -1, 192},     {{"W"}, -1, 333, -1}, {{""}, -1, 333, -1},
      {{"x"}, -1, 333, -1},
  };
  auto size = [](const std::string& path) {
    return fileExists(path) ? static_cast<long>(readFile(path).size()) : -1L;
  };
  for (const auto& c : cases) {
    WorkZone wz;
    wz.writeContours(oneSquare());
    const RunResult r = wz.run(c.args);
    const std::string label = c.args.empty() ? "(none)" : "'" + c.args[0] + "'";
    EXPECT_EQ(r.exitStatus, 0) << label;
    EXPECT_EQ(size(wz.tmpFile("contour.bin")), c.contourBin) << label;
    EXPECT_EQ(size(wz.zoneFile("poches.res")), c.pochesRes) << label;
    EXPECT_EQ(size(wz.tmpFile("wlevel.tmp")), c.wlevel) << label;
  }
}

}  // namespace
}  // namespace pc::test
