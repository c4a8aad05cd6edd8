// Truncation of a stored float toward zero into a 32-bit integer. Parameter
// files and contour files can hold any float, so values outside the integer
// range saturate and NaN gives 0 instead of making the conversion undefined.
#pragma once

#include <cmath>
#include <cstdint>
#include <limits>

namespace pc {

inline std::int32_t truncateToInt32(float v) {
  const double d = static_cast<double>(v);
  if (std::isnan(d)) return 0;
  if (d >= 2147483647.0) return std::numeric_limits<std::int32_t>::max();
  if (d <= -2147483648.0) return std::numeric_limits<std::int32_t>::min();
  return static_cast<std::int32_t>(d);
}

}  // namespace pc
