// The point of every contour sequence: two single-precision coordinates.
#pragma once

namespace pc {

struct Point {
  float x = 0.0f;
  float y = 0.0f;
};

// Any entry whose x or y reaches this magnitude is a separator, not a point.
inline constexpr double kSeparatorLimit = 90000.0;
// The value written for a separator in every coordinate.
inline constexpr float kSeparatorValue = 99999.0f;

inline bool isSeparatorValue(float v) {
  const double d = static_cast<double>(v);
  return !(d < kSeparatorLimit && d > -kSeparatorLimit);  // NaN is a separator too
}

// A point entry of the point array: |x| and |y| below the limit (widened).
inline bool isPointEntry(const Point& p) {
  return !isSeparatorValue(p.x) && !isSeparatorValue(p.y);
}

inline constexpr Point kSeparatorPoint{kSeparatorValue, kSeparatorValue};

}  // namespace pc
