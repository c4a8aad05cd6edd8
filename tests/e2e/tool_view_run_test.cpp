// The tool view and the machine axis system file in whole runs: whatever
// they hold, the run prints at most one warning line for each and writes
// exactly what it writes without them.
#include <gtest/gtest.h>

#include <filesystem>
#include <functional>
#include <string>

#include "e2e/e2e_support.h"

namespace pc::test {
namespace {

const std::string kValidView =
    "tool view\n1 0 0 0\n0 0 1 0\n0 -1 0 0\n5 5 0 1\n1 0 0 0\n0 0 -1 0\n0 1 0 0\n-5 0 5 1\n";
const std::string kThreeColumnView = "tool view\n1 0 0\n0 1 0\n0 0 1\n1 0 0\n0 1 0\n0 0 1\n";
const std::string kMalformedView = "tool view\n1 0 0\nnan 1 0\n";

// Everything a run leaves behind that a later step of the suite reads.
struct Outcome {
  int status = 0;
  std::string out, err, contourBin, pochesRes;
};

// One run of toolpath `toolpath` in mode `mode`, after `prepare` put files
// into the zone.
Outcome runWith(const std::string& toolpath, const std::string& mode,
                const std::function<void(const WorkZone&)>& prepare) {
  WorkZone wz;
  std::vector<std::vector<float>> records;
  appendSquare(records, 0, 0, 100, 10);
  appendSquare(records, 10, 10, 30, 5);
  wz.writeContours(records);
  wz.writeParameters({{2, toolpath}, {4, "3.0"}});
  prepare(wz);
  const RunResult r = wz.run({mode});
  Outcome o{r.exitStatus, r.out, r.err, "", ""};
  if (fileExists(wz.tmpFile("contour.bin"))) o.contourBin = readFile(wz.tmpFile("contour.bin"));
  if (fileExists(wz.zoneFile("poches.res"))) o.pochesRes = readFile(wz.zoneFile("poches.res"));
  // The zone's path differs from run to run; the messages name it as <zone>.
  for (std::string* text : {&o.out, &o.err}) {
    for (auto at = text->find(wz.zone()); at != std::string::npos; at = text->find(wz.zone()))
      text->replace(at, wz.zone().size(), "<zone>");
  }
  return o;
}

void expectSameRun(const Outcome& expected, const Outcome& actual, const std::string& err) {
  EXPECT_EQ(actual.status, expected.status);
  EXPECT_EQ(actual.out, expected.out);
  EXPECT_EQ(actual.err, err);
  EXPECT_EQ(actual.contourBin, expected.contourBin);
  EXPECT_EQ(actual.pochesRes, expected.pochesRes);
}

TEST(ToolViewRun, ViewFilesChangeNothingButTheirMessage) {
  struct Case {
    const char* what;
    std::function<void(const WorkZone&)> prepare;
    const char* err;
  };
  const std::string view = "outil12.mul";
  const std::vector<Case> cases = {
      {"valid", [&](const WorkZone& wz) { writeFile(wz.zoneFile(view), kValidView); }, ""},
      {"three columns", [&](const WorkZone& wz) { writeFile(wz.zoneFile(view), kThreeColumnView); }, ""},
      {"malformed", [&](const WorkZone& wz) { writeFile(wz.zoneFile(view), kMalformedView); },
       "read error <zone>/outil12.mul\n"},
      {"empty", [&](const WorkZone& wz) { writeFile(wz.zoneFile(view), ""); }, "read error <zone>/outil12.mul\n"},
      {"directory", [&](const WorkZone& wz) { std::filesystem::create_directory(wz.zoneFile(view)); },
       "cannot open <zone>/outil12.mul\n"},
  };
  for (const char* mode : {"", "x"}) {
    const Outcome absent = runWith("12.0", mode, [](const WorkZone&) {});
    ASSERT_EQ(absent.status, 0);
    EXPECT_EQ(absent.err, "");
    EXPECT_NE(absent.out.find(" DONE\n"), std::string::npos);
    for (const auto& c : cases) {
      SCOPED_TRACE(std::string(c.what) + " mode '" + mode + "'");
      expectSameRun(absent, runWith("12.0", mode, c.prepare), c.err);
    }
  }
}

TEST(ToolViewRun, ToolpathZeroReadsItsViewFromTheTemporaryDirectory) {
  const Outcome absent = runWith("0.0", "x", [](const WorkZone&) {});
  const Outcome malformed =
      runWith("0.0", "x", [](const WorkZone& wz) { writeFile(wz.tmpFile("outil.mul"), kMalformedView); });
  expectSameRun(absent, malformed, "read error <zone>/tmp/outil.mul\n");
  // A view file of another toolpath is not this run's.
  const Outcome other =
      runWith("0.0", "x", [](const WorkZone& wz) { writeFile(wz.zoneFile("outil12.mul"), kMalformedView); });
  expectSameRun(absent, other, "");
}

TEST(ToolViewRun, MachineAxisSystemFileIsReadOnlyAfterAValidView) {
  struct Case {
    const char* what;
    bool view;
    std::function<void(const WorkZone&)> machine;
    const char* err;
  };
  const auto machineFile = [](const WorkZone& wz) { return wz.zoneFile("transfo.dat"); };
  const std::vector<Case> cases = {
      {"valid", true, [&](const WorkZone& wz) { writeFile(machineFile(wz), kValidView); }, ""},
      {"malformed", true, [&](const WorkZone& wz) { writeFile(machineFile(wz), "axes\n1e400 x\n"); },
       "read error <zone>/transfo.dat\n"},
      {"directory", true, [&](const WorkZone& wz) { std::filesystem::create_directory(machineFile(wz)); },
       "cannot open <zone>/transfo.dat\n"},
      // Without a loaded view the machine file is never looked at.
      {"malformed, no view", false, [&](const WorkZone& wz) { writeFile(machineFile(wz), "axes\n"); }, ""},
  };
  const Outcome absent = runWith("12.0", "", [](const WorkZone&) {});
  for (const auto& c : cases) {
    SCOPED_TRACE(c.what);
    const Outcome o = runWith("12.0", "", [&](const WorkZone& wz) {
      if (c.view) writeFile(wz.zoneFile("outil12.mul"), kValidView);
      c.machine(wz);
    });
    expectSameRun(absent, o, c.err);
  }
  // Both files malformed: one line for each, the view's first.
  const Outcome both = runWith("12.0", "", [&](const WorkZone& wz) {
    writeFile(wz.zoneFile("outil12.mul"), kMalformedView);
    writeFile(machineFile(wz), kMalformedView);
  });
  expectSameRun(absent, both, "read error <zone>/outil12.mul\n");
}

TEST(ToolViewRun, VerboseChannelsPutTheMessageOnStandardOutput) {
  WorkZone wz;
  wz.writeParameters({{2, "12.0"}});
  writeFile(wz.zoneFile("outil12.mul"), kMalformedView);
  const RunResult r = wz.run({"x"}, {"TRX_TRXFILES_VERBOSE=on"});
  EXPECT_NE(r.out.find("read error " + wz.zoneFile("outil12.mul") + "\n\n Tool : #12 "), std::string::npos) << r.out;
}

}  // namespace
}  // namespace pc::test
