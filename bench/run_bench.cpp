// bench_run: the whole program against the floors of what any run must do.
//
// For every input, in one run and interleaved round by round (so that a busy
// machine slows every figure alike), it takes the median of 7 rounds of:
//   raw     the contour file read twice with read(2) through a 1 MiB buffer;
//   decode  read twice, every record's framing checked, points, separators
//           and levels counted, x/y/z decoded into arrays allocated as the
//           program allocates its own (large blocks, huge pages);
//   C F w R the executable in each output mode (wall time, peak memory);
//   start   a statically linked program that does nothing (bench_nothing).
// and prints every run's ratio to the raw and to the decode floor.
//   bench_run [max-points] [rounds]      (defaults 5000000 and 7)
// The real parts come from PC_BENCH_DATA; extra ones may be named in
// PC_BENCH_EXTRA_DATA (a directory of .inf files).
#include <fcntl.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <functional>
#include <string>
#include <vector>

#include "contours/point.h"
#include "platform/platform.h"
#include "synthetic/synthetic_part.h"

namespace {

namespace fs = std::filesystem;
using Clock = std::chrono::steady_clock;

constexpr std::size_t kBuffer = std::size_t{1} << 20;
const char* const kModes[] = {"C", "F", "w", "R"};

struct Measure {
  double seconds = 0.0;
  long peakKiB = 0;
};

double since(Clock::time_point start) { return std::chrono::duration<double>(Clock::now() - start).count(); }

// Runs `program` (with `mode`, or none) in `dir`, output discarded.
Measure runProcess(const char* program, const std::string& dir, const char* mode) {
  std::fflush(stdout);  // the child must not inherit unwritten lines
  const auto start = Clock::now();
  const pid_t pid = fork();
  if (pid == 0) {
    setenv("TRXHOME", PC_BENCH_INSTALLATION, 1);
    setenv("TRXTMPDIR", dir.c_str(), 1);
    setenv("TRXZONE", dir.c_str(), 1);
    if (chdir(dir.c_str()) != 0) _exit(127);
    if (!freopen("/dev/null", "w", stdout)) _exit(127);
    execl(program, program, mode, static_cast<char*>(nullptr));
    _exit(127);
  }
  int status = 0;
  rusage usage{};
  wait4(pid, &status, 0, &usage);
  Measure m{since(start), usage.ru_maxrss};
  if (!WIFEXITED(status) || WEXITSTATUS(status) != 0) std::fprintf(stderr, "%s %s failed in %s\n", program, mode ? mode : "", dir.c_str());
  return m;
}

// Calls `chunk` for every buffer of the file read with read(2); false when
// the file cannot be read.
bool readFile(const std::string& path, std::vector<char>& buffer, const std::function<void(const char*, std::size_t)>& chunk) {
  const int fd = ::open(path.c_str(), O_RDONLY);
  if (fd < 0) return false;
  for (;;) {
    const ssize_t n = ::read(fd, buffer.data(), buffer.size());
    if (n <= 0) break;
    chunk(buffer.data(), static_cast<std::size_t>(n));
  }
  ::close(fd);
  return true;
}

double rawFloor(const std::string& path, std::vector<char>& buffer) {
  const auto start = Clock::now();
  std::size_t bytes = 0;
  for (int pass = 0; pass < 2; ++pass) readFile(path, buffer, [&](const char*, std::size_t n) { bytes += n; });
  if (bytes == 0) std::fprintf(stderr, "nothing read from %s\n", path.c_str());
  return since(start);
}

// The records are 20 bytes: length 12, x, y, z, length 12. Records may
// straddle buffers, so a partial record is carried over.
struct RecordWalk {
  char carry[20];
  std::size_t carried = 0;
  template <class F>
  bool feed(const char* data, std::size_t n, F&& record) {
    if (carried > 0) {
      const std::size_t take = std::min(n, 20 - carried);
      std::memcpy(carry + carried, data, take);
      carried += take;
      data += take;
      n -= take;
      if (carried < 20) return true;
      if (!record(carry)) return false;
      carried = 0;
    }
    while (n >= 20) {
      if (!record(data)) return false;
      data += 20;
      n -= 20;
    }
    std::memcpy(carry, data, n);
    carried = n;
    return true;
  }
};

bool framed(const char* r) {
  std::int32_t head, tail;
  std::memcpy(&head, r, 4);
  std::memcpy(&tail, r + 16, 4);
  return head == 12 && tail == 12;
}

double decodeFloor(const std::string& path, std::vector<char>& buffer, long long& pointsOut) {
  const auto start = Clock::now();
  long long records = 0, separators = 0, levels = 0;
  RecordWalk walk;
  bool ok = true;
  readFile(path, buffer, [&](const char* d, std::size_t n) {
    ok = ok && walk.feed(d, n, [&](const char* r) {
      if (!framed(r)) return false;
      float x;
      std::memcpy(&x, r + 4, 4);
      ++records;
      if (pc::isSeparatorValue(x)) ++separators;
      return true;
    });
  });
  auto* xy = static_cast<pc::Point*>(pc::platform::allocateLarge(static_cast<std::size_t>(records) * sizeof(pc::Point)));
  auto* zs = static_cast<float*>(pc::platform::allocateLarge(static_cast<std::size_t>(records) * sizeof(float)));
  long long i = 0;
  float lastZ = 0.0f;
  walk = RecordWalk{};
  readFile(path, buffer, [&](const char* d, std::size_t n) {
    walk.feed(d, n, [&](const char* r) {
      if (i >= records) return false;
      std::memcpy(&xy[i].x, r + 4, 4);
      std::memcpy(&xy[i].y, r + 8, 4);
      std::memcpy(&zs[i], r + 12, 4);
      if (!pc::isSeparatorValue(xy[i].x) && (i == 0 || zs[i] != lastZ)) {
        ++levels;
        lastZ = zs[i];
      }
      ++i;
      return true;
    });
  });
  const double seconds = since(start);
  if (!ok || i != records || levels == 0) std::fprintf(stderr, "decode floor: %s is not a clean contour file\n", path.c_str());
  pc::platform::releaseLarge(xy);
  pc::platform::releaseLarge(zs);
  pointsOut = records - separators;
  return seconds;
}

double median(std::vector<double> v) {
  std::sort(v.begin(), v.end());
  return v[v.size() / 2];
}

struct Input {
  std::string name;
  std::string dir;  // holds trxcon.inf and is the run's $TMP
};

void measure(const Input& input, int rounds, std::vector<char>& buffer) {
  const std::string file = input.dir + "/trxcon.inf";
  const auto fileBytes = static_cast<double>(fs::file_size(file));
  std::vector<double> raw, decode, start;
  std::vector<std::vector<double>> runs(std::size(kModes));
  std::vector<long> peak(std::size(kModes), 0);
  long long points = 0;
  for (int round = 0; round < rounds; ++round) {
    raw.push_back(rawFloor(file, buffer));
    decode.push_back(decodeFloor(file, buffer, points));
    start.push_back(runProcess(PC_NOTHING_EXECUTABLE, input.dir, nullptr).seconds);
    for (std::size_t m = 0; m < std::size(kModes); ++m) {
      const Measure r = runProcess(PC_EXECUTABLE, input.dir, kModes[m]);
      runs[m].push_back(r.seconds);
      peak[m] = std::max(peak[m], r.peakKiB);
    }
  }
  const double rawMs = median(raw) * 1e3, decodeMs = median(decode) * 1e3, startMs = median(start) * 1e3;
  for (std::size_t m = 0; m < std::size(kModes); ++m) {
    const double runMs = median(runs[m]) * 1e3;
    std::printf("%-30s %-2s %9lld %8.1f %8.2f %8.2f %7.2f %8.2f %6.2f %6.2f %6.2f %8.1f %5.2f\n", input.name.c_str(),
                kModes[m], points, fileBytes / 1048576.0, rawMs, decodeMs, startMs, runMs, runMs / rawMs,
                runMs / decodeMs, runMs / startMs, peak[m] / 1024.0, peak[m] * 1024.0 / fileBytes);
  }
}

Input realPart(const fs::path& root, const fs::path& source) {
  const fs::path dir = root / source.filename();
  fs::create_directories(dir);
  fs::copy_file(source, dir / "trxcon.inf", fs::copy_options::overwrite_existing);
  return {source.filename().string(), dir.string()};
}

}  // namespace

int main(int argc, char** argv) {
  const long long maxPoints = argc > 1 ? std::atoll(argv[1]) : 5000000;
  const int rounds = argc > 2 ? std::max(1, std::atoi(argv[2])) : 7;
  const fs::path root = fs::temp_directory_path() / ("pc-bench-" + std::to_string(getpid()));
  fs::create_directories(root);
  std::vector<char> buffer(kBuffer);

  std::vector<Input> inputs;
  std::vector<fs::path> realDirs = {PC_BENCH_DATA};
  if (const char* extra = std::getenv("PC_BENCH_EXTRA_DATA")) realDirs.emplace_back(extra);
  for (const auto& dir : realDirs) {
    std::vector<fs::path> files;
    std::error_code ec;
    for (const auto& entry : fs::directory_iterator(dir, ec))
      if (entry.path().extension() == ".inf") files.push_back(entry.path());
    std::sort(files.begin(), files.end());
    for (const auto& f : files) inputs.push_back(realPart(root, f));
  }

  struct Synthetic {
    const char* name;
    pc::synthetic::PartShape shape;
  };
  // levels x pockets x islands x points per contour, seed, rings.
  const std::vector<Synthetic> shapes = {
      {"500lv 10k", {500, 1, 1, 10, 11, 1}},
      {"500lv 100k", {500, 2, 4, 20, 12, 1}},
      {"500lv 1M", {500, 4, 4, 100, 13, 1}},
      {"500lv 5M", {500, 4, 4, 500, 14, 1}},
      {"plate 1000 holes x 20lv", {20, 1, 1000, 40, 15, 1}},
      {"5000lv x 3 contours", {5000, 1, 2, 220, 16, 1}},
      {"500lv x 360 nested 4", {500, 90, 0, 23, 17, 4}},
  };
  for (const auto& s : shapes) {
    if (pc::synthetic::pointCount(s.shape) > maxPoints) continue;
    const fs::path dir = root / ("synthetic-" + std::to_string(&s - shapes.data()));
    fs::create_directories(dir);
    if (!pc::synthetic::writeSyntheticPart(s.shape, (dir / "trxcon.inf").string())) return 1;
    inputs.push_back({s.name, dir.string()});
  }

  std::printf("%-30s %-2s %9s %8s %8s %8s %7s %8s %6s %6s %6s %8s %5s\n", "input", "md", "points", "MiB",
              "raw ms", "dec ms", "start", "run ms", "/raw", "/dec", "/start", "peak MiB", "xfile");
  for (const auto& input : inputs) measure(input, rounds, buffer);
  fs::remove_all(root);
  return 0;
}
