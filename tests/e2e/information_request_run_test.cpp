#include <gtest/gtest.h>

#include <filesystem>
#include <string>

#include "e2e/e2e_support.h"

namespace pc::test {
namespace {

// Lists a directory tree so that a run that touched any file shows.
std::string treeOf(const std::string& dir) {
  std::string listing;
  for (const auto& entry : std::filesystem::recursive_directory_iterator(dir)) {
    listing += entry.path().string() + "\n";
  }
  return listing;
}

// Without any installation or work zone the two words still answer, and
// nothing in the current directory or the zone is created.
TEST(InformationRequestRun, HelpAndVersionNeedNoInstallationAndTouchNothing) {
  WorkZone wz;
  std::vector<std::vector<float>> records;
  appendSquare(records, 0.0f, 0.0f, 10.0f, 10.0f);
  wz.writeContours(records);
  const std::string before = treeOf(wz.zone());

  const RunResult version = runProgram({"--version"}, {}, wz.zone());
  EXPECT_EQ(version.exitStatus, 0);
  EXPECT_EQ(version.out, std::string("pocket-classifier ") + PC_VERSION_TEXT + "\n");
  EXPECT_EQ(version.err, "");

  const RunResult help = wz.run({"--help"});
  EXPECT_EQ(help.exitStatus, 0);
  EXPECT_EQ(help.out.rfind("Usage: pocket-classifier [mode]\n", 0), 0u);
  EXPECT_EQ(help.out.find("INITIALIZATION"), std::string::npos);
  EXPECT_EQ(treeOf(wz.zone()), before);
}

// A near miss is a mode argument as before: '-' selects the text output.
TEST(InformationRequestRun, NearMissRunsTheTextMode) {
  WorkZone wz;
  std::vector<std::vector<float>> records;
  appendSquare(records, 0.0f, 0.0f, 10.0f, 10.0f);
  wz.writeContours(records);
  const RunResult r = wz.run({"--Help"});
  EXPECT_EQ(r.exitStatus, 0);
  EXPECT_EQ(r.out.rfind(expectedBanner(), 0), 0u);
  EXPECT_TRUE(fileExists(wz.zoneFile("poches.res")));
  EXPECT_FALSE(fileExists(wz.tmpFile("contour.bin")));
}

}  // namespace
}  // namespace pc::test
