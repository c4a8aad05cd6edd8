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

// Which file each argument writes: the first character decides.
TEST(RunModes, FirstCharacterOfTheArgumentSelectsTheOutput) {
  struct Case {
    std::vector<std::string> args;
    const char* expectedFile;  // relative to the zone
    std::string expectedStart;
  };
  const std::string tagged("\x00\x01\x00\x00n", 5);
  const std::string record("\x12\x00\x00\x00", 4);
  const std::vector<Case> cases = {
      {{}, "tmp/contour.bin", tagged},          {{"c"}, "tmp/contour.bin", tagged},
      {{"Cxyz"}, "tmp/contour.bin", tagged},    {{"f"}, "tmp/contour.bin", record},
      {{"F", "ignored"}, "tmp/contour.bin", record}, {{"W"}, "poches.res", " 99999.000"},
      {{""}, "poches.res", " 99999.000"},       {{"x"}, "poches.res", " 99999.000"},
  };
  for (const auto& c : cases) {
    WorkZone wz;
    wz.writeContours(oneSquare());
    const RunResult r = wz.run(c.args);
    const std::string label = c.args.empty() ? "(none)" : c.args[0];
    EXPECT_EQ(r.exitStatus, 0) << label;
    EXPECT_EQ(readFile(wz.zoneFile(c.expectedFile)).substr(0, c.expectedStart.size()), c.expectedStart) << label;
    const bool pocketFile = std::string(c.expectedFile) == "poches.res";
    EXPECT_EQ(fileExists(wz.tmpFile("contour.bin")), !pocketFile) << label;
    EXPECT_EQ(fileExists(wz.zoneFile("poches.res")), pocketFile) << label;
    EXPECT_FALSE(fileExists(wz.tmpFile("wlevel.tmp"))) << label;
  }
}

TEST(RunModes, LevelDumpModeWritesTheDumpThenTheRecordFile) {
  WorkZone wz;
  wz.writeContours(oneSquare());
  const RunResult r = wz.run({"w"});
  EXPECT_EQ(r.exitStatus, 0);
  EXPECT_EQ(readFile(wz.tmpFile("wlevel.tmp")).size(), 192u);
  // Seven 18-byte records of 26 bytes each with their framing.
  EXPECT_EQ(readFile(wz.tmpFile("contour.bin")).size(), 7u * 26u);
  EXPECT_NE(r.out.find(" LEVEL-BASED POCKET CLASSIFICATION...\n"), std::string::npos);
}

}  // namespace
}  // namespace pc::test
