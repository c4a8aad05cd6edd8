// The pocket result file "poches.res": a text file in the current directory
// with every ordered pocket as point lines, separator lines between its
// contours and an end line after it.
//
// Layout of "poches.res", one line per record, every field right-aligned:
//
//   line               format                         values
//   header (once)      "%10.3lf%10d%10d%6d\n"         99999.0, 0, 0, 0
//   point              "%10.3lf%10.3lf%10.3lf%6d\n"   x, y, Z of the pocket, -1003
//   contour separator  same                           99999.0 three times, 9999
//   pocket end         same                           99999.0 three times, -1004
//
// Only the first pocket's block opens with a separator line; later blocks
// start with their first point line.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "driver/checked_array.h"
#include "pockets/pocket_model.h"

namespace pc {

inline constexpr const char* kPocketResultFileName = "poches.res";
inline constexpr const char* kPocketResultFileMode = "w";

// Writes the result file. 0 on success (nothing is created for an empty
// list); -1 when a pocket fails the outline check (the file keeps the lines
// written before). A file that cannot be created or completely written ends
// the run through reportLostOutput.
int writePocketResultFile(const CheckedArray<Pocket*>& pockets);

enum class ResultLineKind { Header, Point, Separator, PocketEnd };

struct ResultLine {
  ResultLineKind kind = ResultLineKind::Point;
  double x = 0.0;
  double y = 0.0;
  double z = 0.0;
  std::int32_t code = 0;
};

// Reads one line back (without its line end; a trailing carriage return is
// ignored). The first line must be the header, every other line a point,
// separator or end line. False with `expected` filled when the line is none
// of these.
bool parseResultLine(std::string_view line, bool firstLine, ResultLine& out, std::string& expected);

}  // namespace pc
