// bench_run: times the whole program on synthetic and real parts.
//
// For every input it reports the best of a few runs of the executable (wall
// time and the child's peak resident memory) and the floor: reading the same
// contour file twice through the contour reader, which every run must do.
//   bench_run [max-points]        (default 5000000)
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <vector>

#include "contours/contour_info_file.h"
#include "synthetic/synthetic_part.h"

namespace {

namespace fs = std::filesystem;
using Clock = std::chrono::steady_clock;

struct Measure {
  double seconds = 0.0;
  long peakKiB = 0;
};

// Runs the program once in `dir` (its $TMP) with `mode`, output discarded.
Measure runProgram(const std::string& dir, const char* mode) {
  std::fflush(stdout);  // the child must not inherit unwritten lines
  const auto start = Clock::now();
  const pid_t pid = fork();
  if (pid == 0) {
    setenv("TRXHOME", PC_BENCH_INSTALLATION, 1);
    setenv("TRXTMPDIR", dir.c_str(), 1);
    setenv("TRXZONE", dir.c_str(), 1);
    if (chdir(dir.c_str()) != 0) _exit(127);
    if (!freopen("/dev/null", "w", stdout)) _exit(127);
    execl(PC_EXECUTABLE, PC_EXECUTABLE, mode, static_cast<char*>(nullptr));
    _exit(127);
  }
  int status = 0;
  rusage usage{};
  wait4(pid, &status, 0, &usage);
  Measure m;
  m.seconds = std::chrono::duration<double>(Clock::now() - start).count();
  m.peakKiB = usage.ru_maxrss;
  if (!WIFEXITED(status) || WEXITSTATUS(status) != 0) std::fprintf(stderr, "run failed in %s\n", dir.c_str());
  return m;
}

// Seconds to read the file twice; `points` receives its point records.
double readTwice(const std::string& dir, long long& points) {
  setenv("TRXTMPDIR", dir.c_str(), 1);
  const auto start = Clock::now();
  for (int pass = 0; pass < 2; ++pass) {
    const pc::ContourCounts counts = pc::countContourInfoFile();
    points = counts.np - counts.nc;
  }
  return std::chrono::duration<double>(Clock::now() - start).count();
}

void report(const std::string& name, const std::string& dir) {
  const auto fileBytes = static_cast<double>(fs::file_size(dir + "/trxcon.inf"));
  double floorSeconds = 1e9;
  long long points = 0;
  for (int i = 0; i < 3; ++i) floorSeconds = std::min(floorSeconds, readTwice(dir, points));
  for (const char* mode : {"C", "F", "R"}) {
    Measure best{1e9, 0};
    for (int i = 0; i < 3; ++i) {
      const Measure m = runProgram(dir, mode);
      best.seconds = std::min(best.seconds, m.seconds);
      best.peakKiB = std::max(best.peakKiB, m.peakKiB);
    }
    std::printf("%-28s %-2s %10lld %9.1f %9.1f %8.1f %6.2f %9.1f %6.2f\n", name.c_str(), mode, points,
                fileBytes / 1e6, floorSeconds * 1e3, best.seconds * 1e3, best.seconds / floorSeconds,
                best.peakKiB / 1024.0, best.peakKiB * 1024.0 / fileBytes);
  }
}

}  // namespace

int main(int argc, char** argv) {
  const long long maxPoints = argc > 1 ? std::atoll(argv[1]) : 5000000;
  const fs::path root = fs::temp_directory_path() / ("pc-bench-" + std::to_string(getpid()));
  fs::create_directories(root);
  std::printf("%-28s %-2s %10s %9s %9s %8s %6s %9s %6s\n", "input", "md", "points", "file MB", "floor ms",
              "run ms", "ratio", "peak MB", "xfile");

  for (const char* real : {"candlestand_stock_8lv.inf", "fan_stock_200lv.inf"}) {
    const fs::path dir = root / real;
    fs::create_directories(dir);
    fs::copy_file(fs::path(PC_BENCH_DATA) / real, dir / "trxcon.inf", fs::copy_options::overwrite_existing);
    report(real, dir.string());
  }

  // levels x pockets x (1 + islands) x points per contour.
  const std::vector<pc::synthetic::PartShape> shapes = {
      {10, 2, 4, 100, 11},    // 10,000 points
      {50, 4, 4, 100, 12},    // 100,000
      {200, 4, 4, 250, 13},   // 1,000,000
      {500, 4, 4, 500, 14},   // 5,000,000
  };
  for (const auto& shape : shapes) {
    const long long points = pc::synthetic::pointCount(shape);
    if (points > maxPoints) continue;
    const fs::path dir = root / ("synthetic-" + std::to_string(points));
    fs::create_directories(dir);
    if (!pc::synthetic::writeSyntheticPart(shape, (dir / "trxcon.inf").string())) return 1;
    report("synthetic " + std::to_string(shape.levels) + "lv", dir.string());
  }
  fs::remove_all(root);
  return 0;
}
