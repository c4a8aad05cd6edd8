#include "synthetic/synthetic_part.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <memory>
#include <random>
#include <vector>

namespace pc::synthetic {

namespace {

constexpr double kPi = 3.14159265358979323846;
constexpr float kSeparator = 99999.0f;

// Uniform in [0, 1) from the raw engine output: the standard distributions
// are not specified bit for bit, the engine is.
double unit(std::mt19937& rng) { return static_cast<double>(rng() >> 8) * (1.0 / 16777216.0); }

class RecordSink {
 public:
  explicit RecordSink(std::FILE* file) : file_(file) { buffer_.reserve(1 << 20); }
  void put(float x, float y, float z) {
    static const std::int32_t kLength = 12;
    char record[20];
    std::memcpy(record, &kLength, 4);
    std::memcpy(record + 4, &x, 4);
    std::memcpy(record + 8, &y, 4);
    std::memcpy(record + 12, &z, 4);
    std::memcpy(record + 16, &kLength, 4);
    buffer_.insert(buffer_.end(), record, record + 20);
    if (buffer_.size() >= (1u << 20)) flush();
  }
  bool flush() {
    if (!buffer_.empty() && std::fwrite(buffer_.data(), 1, buffer_.size(), file_) != buffer_.size()) ok_ = false;
    buffer_.clear();
    return ok_;
  }

 private:
  std::FILE* file_;
  std::vector<char> buffer_;
  bool ok_ = true;
};

// A closed wobbly loop around (cx, cy): the closing point repeats the first.
void writeLoop(RecordSink& sink, std::mt19937& rng, double cx, double cy, double radius, float z,
               std::int32_t points) {
  const double phase = unit(rng) * 2.0 * kPi;
  const int lobes = 3 + static_cast<int>(unit(rng) * 5.0);
  const std::int32_t distinct = points - 1;
  float firstX = 0.0f;
  float firstY = 0.0f;
  for (std::int32_t i = 0; i < distinct; ++i) {
    const double t = 2.0 * kPi * i / distinct;
    const double r = radius * (1.0 + 0.06 * std::sin(lobes * t + phase) + 0.004 * (unit(rng) - 0.5));
    const float x = static_cast<float>(cx + r * std::cos(t));
    const float y = static_cast<float>(cy + r * std::sin(t));
    if (i == 0) {
      firstX = x;
      firstY = y;
    }
    sink.put(x, y, z);
  }
  sink.put(firstX, firstY, z);
  sink.put(kSeparator, kSeparator, kSeparator);
}

}  // namespace

std::int64_t pointCount(const PartShape& shape) {
  return std::int64_t{shape.levels} * shape.pockets * (std::max(1, shape.rings) + shape.islands) *
         shape.pointsPerContour;
}

bool writeSyntheticPart(const PartShape& shape, const std::string& path) {
  std::unique_ptr<std::FILE, int (*)(std::FILE*)> file(std::fopen(path.c_str(), "wb"), &std::fclose);
  if (!file || shape.pointsPerContour < 4) return false;
  std::mt19937 rng(shape.seed);
  RecordSink sink(file.get());
  const int columns = static_cast<int>(std::ceil(std::sqrt(static_cast<double>(shape.pockets))));
  const double pitch = 100.0;
  for (std::int32_t level = 0; level < shape.levels; ++level) {
    const float z = static_cast<float>(-0.5 * level);
    // Deeper levels are narrower, as the walls of a real cavity taper.
    const double depthFactor = 1.0 - 0.6 * level / std::max(1, shape.levels);
    for (std::int32_t p = 0; p < shape.pockets; ++p) {
      const double cx = pitch * (p % columns);
      const double cy = pitch * (p / columns);
      const double outerRadius = 0.45 * pitch * depthFactor;
      // Each ring a little inside the one around it; islands sit in the last.
      const std::int32_t rings = std::max(1, shape.rings);
      double radius = outerRadius;
      for (std::int32_t r = 0; r < rings; ++r) {
        radius = outerRadius * (1.0 - 0.6 * r / rings);
        writeLoop(sink, rng, cx, cy, radius, z, shape.pointsPerContour);
      }
      for (std::int32_t k = 0; k < shape.islands; ++k) {
        const double angle = 2.0 * kPi * k / std::max(1, shape.islands);
        const double ring = shape.islands == 1 ? 0.0 : 0.5 * radius;
        const double islandRadius =
            shape.islands == 1 ? 0.3 * radius : std::min(0.15 * radius, 0.35 * ring * std::sin(kPi / shape.islands));
        writeLoop(sink, rng, cx + ring * std::cos(angle), cy + ring * std::sin(angle), islandRadius, z,
                  shape.pointsPerContour);
      }
    }
  }
  const bool flushed = sink.flush();
  return flushed && std::fclose(file.release()) == 0;
}

}  // namespace pc::synthetic
