// Runs on a machine that misbehaves: full disks, FIFOs where files should be,
// an allocation limit, a lock in the way and eight runs in one zone. Every
// one ends with its report and status, never as a success and never blocked.
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <filesystem>
#include <string>
#include <tuple>
#include <vector>

#include "e2e/e2e_support.h"

namespace pc::test {
namespace {

namespace fs = std::filesystem;

bool contains(const std::string& text, const std::string& part) { return text.find(part) != std::string::npos; }
bool endsWith(const std::string& text, const std::string& tail) {
  return text.size() >= tail.size() && text.compare(text.size() - tail.size(), tail.size(), tail) == 0;
}

// A "zone.inf" with one scale record.
std::string zoneWithScale(float scale) {
  std::string value;
  putFloat(value, scale);
  const std::string data = std::string("001C 002C 001R ") + '\0' + "AEC" + value;
  std::string file = "QZTB";
  for (const std::int32_t field : {0, 160, 160, 1, 0}) putInt32(file, field);
  file.resize(152, '\0');
  file += std::string("\x01\x01\x01", 3);
  file.resize(160, '\0');
  putInt16(file, static_cast<std::int16_t>(data.size()));
  putInt16(file, 0);
  return file + data;
}

// One 10 x 10 square, and a minimum width of 0.1 that the run prints scaled.
void prepare(const WorkZone& wz) {
  std::vector<std::vector<float>> records;
  appendSquare(records, 0, 0, 10, 1);
  wz.writeContours(records);
  wz.writeParameters({{2, "12.0"}, {58, "0.1"}});
}

TEST(FaultRuns, EveryOutputOnAFullDiskIsLost) {
  if (!fileExists("/dev/full")) GTEST_SKIP() << "no /dev/full here";
  for (const auto& [arg, file, mode] : {std::tuple("C", "tmp/contour.bin", "w+b"), std::tuple("x", "poches.res", "w"),
                                        std::tuple("w", "tmp/wlevel.tmp", "w+b")}) {
    WorkZone wz;
    prepare(wz);
    fs::create_symlink("/dev/full", wz.zoneFile(file));
    const RunResult r = wz.run({arg});
    const std::string name = std::string(arg) == "x" ? file : wz.zoneFile(file);
    EXPECT_EQ(r.exitStatus, 255) << arg;
    EXPECT_TRUE(endsWith(r.out, "*** Cannot open file " + name + " in mode " + mode + ".\n")) << r.out;
  }
  // The record file replaces whatever had its name, the link included.
  WorkZone wz;
  prepare(wz);
  fs::create_symlink("/dev/full", wz.tmpFile("contour.bin"));
  const RunResult r = wz.run({"F"});
  EXPECT_EQ(r.exitStatus, 0);
  EXPECT_TRUE(endsWith(r.out, " DONE\n\n")) << r.out;
  EXPECT_TRUE(fs::is_regular_file(fs::symlink_status(wz.tmpFile("contour.bin"))));
}

// A FIFO is never opened to be read: it is a file that cannot be opened.
TEST(FaultRuns, FifosInPlaceOfInputsNeverBlockTheRun) {
  const auto fifoRun = [](const std::string& fifo, bool database) {
    WorkZone wz;
    prepare(wz);
    if (database) writeFile(wz.zoneFile("zone.inf"), zoneWithScale(2.0f));
    fs::remove(wz.zoneFile(fifo));
    EXPECT_EQ(::mkfifo(wz.zoneFile(fifo).c_str(), 0600), 0);
    RunResult r = wz.run({"x"}, {"TRX_TRXFILES_VERBOSE=on"});
    EXPECT_TRUE(fs::is_fifo(wz.zoneFile(fifo))) << fifo;  // left in place
    return std::pair(r, wz.zone());
  };
  const auto [contours, zone] = fifoRun("tmp/trxcon.inf", false);
  EXPECT_TRUE(contains(contours.out, " Fichier " + zone + "/tmp/trxcon.inf iomode= 1, err= 2\n Program terminated.\n"))
      << contours.out;
  for (const auto& [fifo, database, width] : {std::tuple("tmp/outil.par", false, "0.000"),
                                              std::tuple("tmp/offset2.err", true, "0.200"),
                                              std::tuple("zone.inf", true, "0.100"),  // the default scale
                                              std::tuple("zone.lck", false, "0.100")}) {
    const RunResult r = fifoRun(fifo, database).first;
    EXPECT_EQ(r.exitStatus, 0) << fifo;
    EXPECT_TRUE(endsWith(r.out, " DONE\n\n")) << fifo << r.out;
    EXPECT_EQ(contains(r.out, std::string("[width > ") + width + "mm]"), std::string(width) != "0.000") << r.out;
  }
}

// A lock that can never be taken keeps an existing database out of reach:
// the run stops on the fatal channel instead of guessing the unit scale.
TEST(FaultRuns, LockInTheWayOfAnExistingDatabaseEndsTheRun) {
  for (const bool fifo : {false, true}) {
    WorkZone wz;
    prepare(wz);
    writeFile(wz.zoneFile("zone.inf"), zoneWithScale(2.0f));
    if (fifo) EXPECT_EQ(::mkfifo(wz.zoneFile("zone.lck").c_str(), 0600), 0);
    else fs::create_directory(wz.zoneFile("zone.lck"));
    const RunResult r = wz.run({"x"}, {"TRX_TRXFILES_VERBOSE=on"});
    EXPECT_EQ(r.exitStatus, 255);
    EXPECT_TRUE(endsWith(r.out, "Zone database '" + wz.zoneFile("zone.inf") + "' cannot be read: its lock file '" +
                                    wz.zoneFile("zone.lck") + "' can be neither taken nor broken\n"))
        << r.out;
    EXPECT_FALSE(contains(r.out, " DONE"));
    // Without a database there is nothing to lose: the default scale.
    fs::remove(wz.zoneFile("zone.inf"));
    const RunResult missing = wz.run({"x"});
    EXPECT_EQ(missing.exitStatus, 0);
    EXPECT_TRUE(contains(missing.out, " 1 pockets [width > 0.100mm]\n")) << missing.out;
  }
}

// Eight runs in one zone at once: each waits its turn for the lock, reads the
// database's scale and finishes; no lock file is left behind.
TEST(FaultRuns, EightRunsContendingForTheZoneLockAllFinish) {
  WorkZone wz;
  prepare(wz);
  writeFile(wz.zoneFile("zone.inf"), zoneWithScale(2.0f));
  std::vector<pid_t> runs;
  std::fflush(nullptr);
  for (int i = 0; i < 8; ++i) {
    const pid_t pid = ::fork();
    if (pid == 0) {
      const RunResult r = wz.run({"x"});
      ::_exit(r.exitStatus == 0 && contains(r.out, " 1 pockets [width > 0.200mm]\n") ? 0 : 1);
    }
    runs.push_back(pid);
  }
  int finished = 0;
  for (const pid_t pid : runs) {
    int status = 0;
    if (pid > 0 && ::waitpid(pid, &status, 0) == pid && WIFEXITED(status) && WEXITSTATUS(status) == 0) ++finished;
  }
  EXPECT_EQ(finished, 8);
  EXPECT_FALSE(fs::exists(wz.zoneFile("zone.lck")));
}

// The run under an address-space limit: arrays that cannot be had end in
// the boxed report and status 1.
TEST(FaultRuns, AllocationLimitEndsInTheBoxedReport) {
  constexpr rlim_t kLimit = rlim_t{20} << 20;
  const auto limitedRun = [&](const WorkZone& wz) {
    std::fflush(nullptr);
    const pid_t pid = ::fork();
    if (pid == 0) {
      const rlimit limit{kLimit, kLimit};
      if (::setrlimit(RLIMIT_AS, &limit) != 0) ::_exit(100);
      const RunResult r = wz.run({"x"});
      writeFile(wz.zoneFile("run.out"), r.out);
      ::_exit(r.exitStatus);
    }
    int status = 0;
    ::waitpid(pid, &status, 0);
    return std::pair(WIFEXITED(status) ? WEXITSTATUS(status) : -1, readFile(wz.zoneFile("run.out")));
  };
  WorkZone small;
  prepare(small);
  if (limitedRun(small).first != 0) GTEST_SKIP() << "the program does not start under the limit (sanitizers?)";

  // 400,000 separators: a contour array of many megabytes.
  WorkZone large;
  large.writeParameters({});
  writeFile(large.tmpFile("trxcon.inf"),
            contourInfoBytes(std::vector<std::vector<float>>(400000, {99999.0f, 99999.0f, 99999.0f})));
  const auto [status, out] = limitedRun(large);
  EXPECT_EQ(status, 1);
  EXPECT_TRUE(endsWith(out, "\n*************************************\n*** ERROR : Memory Allocation Failure\n*** FILE  : "
                            "run_driver\n*** LINE  : 76\n*************************************\n\n"))
      << out;
}

}  // namespace
}  // namespace pc::test
