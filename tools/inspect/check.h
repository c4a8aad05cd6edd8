// The check subcommand: the geometry of a contour information file that the
// classifier takes on trust, checked exactly, level by level.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "contour_stream.h"
#include "report.h"

namespace pc::inspect {

struct CheckOptions {
  bool json = false;
};

// One finding. Contours are numbered from 0 within their level; `other` is
// -1 for findings about one contour.
struct Finding {
  std::string kind;  // open, z-varies, too-few-points, cross, touch, self-cross, self-touch, near, nesting
  std::int32_t level = 0;
  std::int32_t contour = 0;
  std::int32_t other = -1;
  double x = 0.0, y = 0.0;
  std::int64_t count = 1;
  std::string detail;
};

// The findings of one level's contours, in a fixed order: contour problems,
// contacts and near pairs by contour pair, nesting differences by contour.
std::vector<Finding> checkLevel(std::vector<InfoContour>& contours);

// Exit code: kExitClean, kExitProblems, or kExitUnreadable.
int checkFile(const std::string& path, const CheckOptions& options);

}  // namespace pc::inspect
