// The run's failure rows: what each prints, how it ends, which files it leaves.
#include <gtest/gtest.h>

#include <filesystem>
#include <string>

#include "e2e/e2e_support.h"

namespace pc::test {
namespace {

bool endsWith(const std::string& text, const std::string& tail) {
  return text.size() >= tail.size() && text.compare(text.size() - tail.size(), tail.size(), tail) == 0;
}

TEST(RunFailures, MissingContourFileEndsAfterTheLoadingLine) {
  WorkZone wz;
  writeFile(wz.tmpFile("offset2.err"), "stale");
  const RunResult r = wz.run({});
  EXPECT_EQ(r.exitStatus, 0);
  EXPECT_TRUE(endsWith(r.out, " NZ=0 NP=0 NC=0\n\n LOADING Z-CONTOURS...\n *** ERROR : while loading trxcon.inf\n"))
      << r.out;
  EXPECT_FALSE(fileExists(wz.tmpFile("errvide.tmp")));
  EXPECT_FALSE(fileExists(wz.tmpFile("contour.bin")));
  // The early return skips the clean-up.
  EXPECT_TRUE(fileExists(wz.tmpFile("offset2.err")));
}

TEST(RunFailures, OpenContourPrintsItsReportAndTheLoadError) {
  WorkZone wz;
  wz.writeContours({{0, 0, 10}, {10, 0, 10}, {10, 10, 10}, {0, 10, 10}, {0.006f, 0, 10}, {99999, 99999, 99999}});
  const RunResult r = wz.run({"x"});
  EXPECT_EQ(r.exitStatus, 0);
  EXPECT_TRUE(endsWith(r.out,
                       " LOADING Z-CONTOURS...\n"
                       "**************************************\n"
                       "*** OPEN CONTOUR (5 pts) in zcut.res\n"
                       "*** First Point : X=0.000 Y=0.000 Z=10.000\n"
                       "*** Last  Point : X=0.006 Y=0.000 Z=10.000\n"
                       "**************************************\n"
                       " *** ERROR : while loading trxcon.inf\n"))
      << r.out;
  EXPECT_FALSE(fileExists(wz.zoneFile("poches.res")));
}

TEST(RunFailures, DamagedContourFilesNeverCrash) {
  const std::vector<std::string> damaged = {
      "",                                     // empty
      std::string("\x08\x00\x00\x00", 4) + std::string(8, '\x01') + std::string("\x08\x00\x00\x00", 4),
      std::string("\x00\x00\x00\x80", 4) + std::string(96, 'x'),  // 2 GiB prefix in 100 bytes
      std::string(1000, '\xff'),              // garbage
  };
  for (const auto& bytes : damaged) {
    WorkZone wz;
    writeFile(wz.tmpFile("trxcon.inf"), bytes);
    const RunResult r = wz.run({});
    EXPECT_EQ(r.exitStatus, 0);
    EXPECT_TRUE(endsWith(r.out, " *** ERROR : while loading trxcon.inf\n")) << r.out;
  }
}

TEST(RunFailures, WidthFilterLeavingNoPocketWritesTheEmptyMarker) {
  WorkZone wz;
  std::vector<std::vector<float>> records;
  appendSquare(records, 0, 0, 10, 10);
  wz.writeContours(records);
  wz.writeParameters({{58, "20.0"}});
  writeFile(wz.tmpFile("contour.bin"), "earlier result");
  const RunResult r = wz.run({});
  EXPECT_EQ(r.exitStatus, 0);
  EXPECT_TRUE(endsWith(r.out, " 1 pockets\n")) << r.out;
  EXPECT_TRUE(fileExists(wz.tmpFile("errvide.tmp")));
  EXPECT_EQ(readFile(wz.tmpFile("errvide.tmp")), "");
  EXPECT_EQ(readFile(wz.tmpFile("contour.bin")), "earlier result");
}

// An output that cannot be created is a lost result, never a success.
TEST(RunFailures, OutputThatCannotBeCreatedEndsWithStatusMinusOne) {
  struct Case {
    std::string arg;
    std::string blocked;  // made a directory so that it cannot be opened as a file
    std::string mode;
  };
  for (const Case& c : {Case{"C", "tmp/contour.bin", "w+b"}, Case{"F", "tmp/contour.bin", "wb"},
                        Case{"x", "poches.res", "w"}}) {
    WorkZone wz;
    std::vector<std::vector<float>> records;
    appendSquare(records, 0, 0, 10, 10);
    wz.writeContours(records);
    std::filesystem::create_directories(wz.zoneFile(c.blocked + "/keep"));
    const RunResult r = wz.run({c.arg});
    EXPECT_EQ(r.exitStatus, 255) << c.arg;
    const std::string name = c.arg == "x" ? "poches.res" : wz.zoneFile(c.blocked);
    EXPECT_TRUE(endsWith(r.out, "*** Cannot open file " + name + " in mode " + c.mode + ".\n")) << c.arg << r.out;
  }
}

}  // namespace
}  // namespace pc::test
