// Text lines of the pocket result file and the point writer that turns an
// outline into point and separator lines.
#pragma once

#include <cstdint>

#include "contours/point.h"
#include "output/output_file.h"

namespace pc {

// Codes of the result file's lines.
inline constexpr std::int32_t kPointLineCode = -1003;
inline constexpr std::int32_t kPocketEndCode = -1004;
inline constexpr std::int32_t kSeparatorLineCode = 9999;

// Whether the last line written by the point writer was a contour separator.
// One state serves a whole file: it is never cleared between pockets, so the
// leading separator of every outline after the first writes no line.
struct SeparatorState {
  bool lastWasSeparator = false;
};

// "%10.3lf%10.3lf%10.3lf%6d\n"
void writeResultLine(OutputFile& file, float x, float y, float z, std::int32_t code);

// Point lines (x, y, z, code) for the points of `points[0..count)`, one
// separator line for each run of separators, and a separator line after the
// last entry unless the last line already was one.
void writeOutlinePoints(OutputFile& file, const Point* points, std::int32_t count, float z, std::int32_t code,
                        SeparatorState& state);

}  // namespace pc
