// Pockets and levels built by hand for the output tests, expected bytes, and
// seams that make the output files fail on demand.
#pragma once

#include <unistd.h>

#include <cstdint>
#include <cstdio>
#include <deque>
#include <filesystem>
#include <string>
#include <vector>

#include "contours/zcontour.h"
#include "output/output_file.h"
#include "pockets/pocket_model.h"
#include "support/test_support.h"

namespace pc::test {

// A closed square of five points from (x0, y0).
inline std::vector<Point> square(float x0, float y0, float side) {
  return {{x0, y0}, {x0 + side, y0}, {x0 + side, y0 + side}, {x0, y0 + side}, {x0, y0}};
}
inline const std::vector<Point> kOpenSquare = {{0, 0}, {4, 0}, {4, 4}, {0, 4}, {0, 1}};

// Little-endian bytes of the values in order (char, int16, int32, float, double).
inline void packOne(std::string& s, char v) { s += v; }
inline void packOne(std::string& s, std::int16_t v) { putInt16(s, v); }
inline void packOne(std::string& s, std::int32_t v) { putInt32(s, v); }
inline void packOne(std::string& s, float v) { putFloat(s, v); }
inline void packOne(std::string& s, double v) { putDouble(s, v); }
template <typename... T>
std::string pack(T... values) {
  std::string s;
  (packOne(s, values), ...);
  return s;
}

// Owns the contours, nodes and pockets; addresses stay put.
struct OutlineFixture {
  std::deque<std::vector<Point>> points;
  std::deque<ZContour> contours;
  std::deque<ContourNode> nodes;
  std::deque<Pocket> pockets;

  ZContour* contour(std::vector<Point> pts, float z) {
    points.push_back(std::move(pts));
    fill(contours.emplace_back(), points.back().data(), static_cast<std::int32_t>(points.back().size()), z);
    return &contours.back();
  }
  // A pocket of outer contour `outer` at `z` with the given islands.
  Pocket* pocket(std::vector<Point> outer, float z, std::vector<std::vector<Point>> islands = {}) {
    ContourNode* n = &nodes.emplace_back();
    n->contour = contour(std::move(outer), z);
    ContourNode** link = &n->firstChild;
    for (auto& island : islands) {
      *link = &nodes.emplace_back();
      (*link)->contour = contour(std::move(island), z + 1.0f);
      (*link)->parent = n;
      link = &(*link)->nextSibling;
    }
    pockets.emplace_back().node = n;
    return &pockets.back();
  }
};

inline CheckedArray<Pocket*> pocketList(std::initializer_list<Pocket*> items) {
  CheckedArray<Pocket*> list(static_cast<std::int32_t>(items.size()), 1000);
  for (Pocket* p : items) list.append(p);
  return list;
}

// Standard output of `run()`, with its result in `result`.
template <typename F>
std::string console(F run, int& result) {
  testing::internal::CaptureStdout();
  result = run();
  std::fflush(stdout);
  return testing::internal::GetCapturedStdout();
}

class ScopedCurrentDir {
 public:
  explicit ScopedCurrentDir(const std::string& dir) : old_(std::filesystem::current_path()) {
    std::filesystem::current_path(dir);
  }
  ~ScopedCurrentDir() { std::filesystem::current_path(old_); }

 private:
  std::filesystem::path old_;
};

class ScopedOutputHooks {
 public:
  explicit ScopedOutputHooks(OutputFileHooks hooks) : saved_(outputFileHooks()) { outputFileHooks() = hooks; }
  ~ScopedOutputHooks() { outputFileHooks() = saved_; }

 private:
  OutputFileHooks saved_;
};

inline std::FILE* refuseOpen(const char*, const char*) { return nullptr; }
inline std::size_t refuseWrite(const void*, std::size_t, std::FILE*) { return 0; }
inline int refuseClose(std::FILE* file) {
  std::fclose(file);
  return EOF;
}
// The three ways a file can be lost: not opened, not written, not closed.
inline std::vector<OutputFileHooks> failingHooks() {
  std::vector<OutputFileHooks> all(3, defaultOutputFileHooks());
  all[0].open = refuseOpen;
  all[1].write = refuseWrite;
  all[2].close = refuseClose;
  return all;
}

// `text` as a regular expression matching exactly itself.
inline std::string regexQuote(const std::string& text) {
  std::string out;
  for (char c : text) {
    if (std::string("\\^$.|?*+()[]{}").find(c) != std::string::npos) out += '\\';
    out += c;
  }
  return out;
}

// Death tests look at standard error; the loss report goes to standard output.
inline void sendStdoutToStderr() {
  std::fflush(stdout);
  ::dup2(2, 1);
}

}  // namespace pc::test
