// The run mode chosen by the first character of the first argument, and the
// safe float-to-integer truncation the run uses on parameter values.
#pragma once

#include <cmath>
#include <cstdint>

namespace pc {

enum class RunMode : int {
  ContourFileRewrite = 1,    // no argument, C or c
  RecordContourFile = 2,     // F or f
  PocketResultFile = 3,      // anything else, W and "" included
  LevelDumpThenRecords = 4,  // w
};

inline RunMode runModeFromArguments(int argc, char** argv) {
  if (argc < 2 || argv[1] == nullptr) return RunMode::ContourFileRewrite;
  switch (argv[1][0]) {
    case 'C':
    case 'c': return RunMode::ContourFileRewrite;
    case 'F':
    case 'f': return RunMode::RecordContourFile;
    case 'w': return RunMode::LevelDumpThenRecords;
    default: return RunMode::PocketResultFile;
  }
}

// Truncation toward zero; a parameter file can hold any float, so values
// outside the integer range are clamped (NaN gives 0) instead of being
// undefined behaviour.
inline int truncateToInt(float value) {
  if (std::isnan(value)) return 0;
  if (value >= 2147483647.0f) return INT32_MAX;
  if (value <= -2147483648.0f) return INT32_MIN;
  return static_cast<int>(value);
}

}  // namespace pc
