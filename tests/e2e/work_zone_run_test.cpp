// Runs in a full temporary installation: without TRXTMPDIR the work zone is
// numbered from the suite-wide counter and works in $TRXTMP/<number>.
#include <gtest/gtest.h>

#include <filesystem>
#include <string>

#include "e2e/e2e_support.h"

namespace pc::test {
namespace {

namespace fs = std::filesystem;

struct Installation {
  TempDir root;
  std::string home() const { return root.file("home"); }
  std::string zone() const { return root.file("zone"); }
  std::string tmpRoot() const { return root.file("tmp"); }
  std::string counter() const { return home() + "/client/trxconf/workzone.num"; }
  std::vector<std::string> env() const {
    return {"TRXHOME=" + home(), "TRXZONE=" + zone(), "TRXTMP=" + tmpRoot()};
  }
  Installation() {
    fs::create_directories(home() + "/client/trxconf");
    writeInstallation(home());
    fs::create_directories(zone());
    fs::create_directories(tmpRoot());
  }
};

std::string squareFile() {
  std::vector<std::vector<float>> records;
  appendSquare(records, 0, 0, 10, 10);
  return contourInfoBytes(records);
}

TEST(WorkZoneRun, NewZoneIsNumberedFromTheCounterAndReusedAfterwards) {
  Installation inst;
  writeFile(inst.counter(), "0000002a\n");
  // The contour file waits in the directory the zone is going to get.
  fs::create_directories(inst.tmpRoot() + "/0000002b");
  writeFile(inst.tmpRoot() + "/0000002b/trxcon.inf", squareFile());

  RunResult r = runProgram({}, inst.env(), inst.zone());
  EXPECT_EQ(r.exitStatus, 0) << r.out;
  EXPECT_NE(r.out.find(" DONE\n"), std::string::npos) << r.out;
  EXPECT_EQ(readFile(inst.counter()), "0000002b\n");
  EXPECT_EQ(readFile(inst.zone() + "/workzone.num"), "0000002b\n");
  EXPECT_TRUE(fileExists(inst.tmpRoot() + "/0000002b/contour.bin"));

  // A second run in the same zone keeps its number and its directory.
  fs::remove(inst.tmpRoot() + "/0000002b/contour.bin");
  r = runProgram({}, inst.env(), inst.zone());
  EXPECT_EQ(r.exitStatus, 0) << r.out;
  EXPECT_EQ(readFile(inst.counter()), "0000002b\n");
  EXPECT_TRUE(fileExists(inst.tmpRoot() + "/0000002b/contour.bin"));
}

TEST(WorkZoneRun, MissingTemporaryDirectoryIsCreated) {
  Installation inst;
  writeFile(inst.zone() + "/workzone.num", "00000007\n");
  const RunResult r = runProgram({}, inst.env(), inst.zone());
  EXPECT_EQ(r.exitStatus, 0);
  EXPECT_TRUE(fs::is_directory(inst.tmpRoot() + "/00000007"));
  // Nothing to read there yet: the run reports it and stops.
  EXPECT_NE(r.out.find(" *** ERROR : while loading trxcon.inf\n"), std::string::npos) << r.out;
}

TEST(WorkZoneRun, UndefinedZoneEndsOnTheFatalChannel) {
  Installation inst;
  const RunResult r = runProgram({}, {"TRXHOME=" + inst.home(), "TRXTMP=" + inst.tmpRoot()}, inst.zone());
  EXPECT_EQ(r.exitStatus, 255);
  EXPECT_EQ(r.out.find(" DONE"), std::string::npos);
}

}  // namespace
}  // namespace pc::test
