// The run mode chosen by the first character of the first argument.
#pragma once


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

}  // namespace pc
