// The tool view and the machine axis system file in whole runs: whatever
// they hold, the run prints at most one warning line for each and writes
// exactly what it writes without them.
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <filesystem>
#include <optional>
#include <string>

#include "e2e/e2e_support.h"

namespace pc::test {
namespace {

const std::string kValid = "tool view\n1 0 0 0\n0 0 1 0\n0 -1 0 0\n5 5 0 1\n1 0 0 0\n0 0 -1 0\n0 1 0 0\n-5 0 5 1\n";
const std::string kThreeColumns = "tool view\n1 0 0\n0 1 0\n0 0 1\n1 0 0\n0 1 0\n0 0 1\n";
const std::string kMalformed = "tool view\n1 0 0\nnan 1 0\n";
const std::string kDirectory = "<a directory>";
const std::string kFifo = "<a FIFO>";

// Writes `content` as `path`: nothing when absent, a directory or a FIFO
// (which must never block the run) for the markers.
void place(const std::string& path, const std::optional<std::string>& content) {
  if (content == kDirectory)
    std::filesystem::create_directory(path);
  else if (content == kFifo)
    EXPECT_EQ(::mkfifo(path.c_str(), 0600), 0);
  else if (content)
    writeFile(path, *content);
}

// Everything a run leaves behind that a later step of the suite reads.
struct Outcome {
  int status = 0;
  std::string out, err, contourBin, pochesRes;
};

// A run of toolpath `toolpath` in mode `mode` with `view` as the zone's
// file `viewName` and `machine` as the machine axis system file.
Outcome runWith(const std::string& toolpath, const std::string& mode, const std::optional<std::string>& view,
                const std::optional<std::string>& machine, const std::string& viewName = "outil12.mul") {
  WorkZone wz;
  std::vector<std::vector<float>> records;
  appendSquare(records, 0, 0, 100, 10);
  appendSquare(records, 10, 10, 30, 5);
  wz.writeContours(records);
  wz.writeParameters({{2, toolpath}, {4, "3.0"}});
  place(wz.zoneFile(viewName), view);
  place(wz.zoneFile("transfo.dat"), machine);
  const RunResult r = wz.run({mode});
  Outcome o{r.exitStatus, r.out, r.err, "", ""};
  if (fileExists(wz.tmpFile("contour.bin"))) o.contourBin = readFile(wz.tmpFile("contour.bin"));
  if (fileExists(wz.zoneFile("poches.res"))) o.pochesRes = readFile(wz.zoneFile("poches.res"));
  // The zone's path differs from run to run; the messages name it as <zone>.
  for (auto at = o.err.find(wz.zone()); at != std::string::npos; at = o.err.find(wz.zone()))
    o.err.replace(at, wz.zone().size(), "<zone>");
  return o;
}

TEST(ToolViewRun, ViewAndMachineFilesChangeNothingButTheirMessage) {
  struct Case {
    std::optional<std::string> view, machine;
    std::string err;
  };
  const std::string viewError = "read error <zone>/outil12.mul\n";
  const Case cases[] = {
      {kValid, {}, ""},
      {kThreeColumns, {}, ""},
      {kMalformed, {}, viewError},
      {"", {}, viewError},
      {kDirectory, {}, "cannot open <zone>/outil12.mul\n"},
      {kFifo, {}, "cannot open <zone>/outil12.mul\n"},
      {kValid, kValid, ""},
      {kValid, "axes\n1e400 x\n", "read error <zone>/transfo.dat\n"},
      {kValid, kDirectory, "cannot open <zone>/transfo.dat\n"},
      {kValid, kFifo, "cannot open <zone>/transfo.dat\n"},
      // Without a loaded view the machine file is never looked at.
      {{}, kMalformed, ""},
      {kMalformed, kMalformed, viewError},
  };
  for (const char* mode : {"", "x"}) {
    const Outcome absent = runWith("12", mode, {}, {});
    ASSERT_EQ(absent.status, 0);
    EXPECT_EQ(absent.err, "");
    EXPECT_NE(absent.out.find(" DONE\n"), std::string::npos);
    for (const auto& c : cases) {
      SCOPED_TRACE("mode '" + std::string(mode) + "' view " + c.view.value_or("-") + " machine " +
                   c.machine.value_or("-"));
      const Outcome o = runWith("12", mode, c.view, c.machine);
      EXPECT_EQ(o.status, absent.status);
      EXPECT_EQ(o.out, absent.out);
      EXPECT_EQ(o.err, c.err);
      EXPECT_EQ(o.contourBin, absent.contourBin);
      EXPECT_EQ(o.pochesRes, absent.pochesRes);
    }
  }
}

TEST(ToolViewRun, ToolpathZeroReadsItsViewFromTheTemporaryDirectory) {
  EXPECT_EQ(runWith("0", "x", kMalformed, {}, "tmp/outil.mul").err, "read error <zone>/tmp/outil.mul\n");
  EXPECT_EQ(runWith("0", "x", kMalformed, {}, "outil.mul").err, "");
  EXPECT_EQ(runWith("30012", "x", kMalformed, {}, "outil12.3.mul").err, "read error <zone>/outil12.3.mul\n");
}

}  // namespace
}  // namespace pc::test
