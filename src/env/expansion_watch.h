// Debugging aids of the expander, driven by environment variables read once
// per process: the buffer-size watch, which logs (and can stop in the
// debugger) every expansion into a buffer smaller than a minimum, and the
// expansion log it writes to.
//
//   TRX_EXPAND_MIN_BUFFER_SIZE  decimal minimum; 0 or unset: no watch;
//                               negative: trap on every buffer below |minimum|
//   TRX_EXPAND_WATCH            names (cut at ' ', '|', ';') that trap when a
//                               watched name holds one of them
//   TRX_EXPAND_LOGFILE_NAME     log file; default $TEMP/tarnex_expand_log.txt
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace pc {

struct ExpanderSettings {
  std::int64_t minimumBufferSize = 0;
  std::vector<std::string> watchList;
  std::string logFileName;  // empty: no log
  std::string programName;  // the executable's file name, without directory
};

// Computed on first use and kept for the life of the process.
const ExpanderSettings& expanderSettings();

// Format letters of the watched buffers.
inline constexpr char kFixedFieldFormat = 'F';
inline constexpr char kCStringFormat = 'C';

// Runs the watch for an expansion of `name` (nullptr allowed) into a buffer
// of `size` bytes of the given format.
void watchBufferSize(const char* name, std::size_t size, char format);

// "YYYY-MM-DD@hh:mm:ss" of the current local time, recomputed only when the
// second changes.
std::string expansionTimeStamp();

// The log line (with its line end) for a buffer of `size` below `required`.
std::string expansionLogLine(const std::string& timeStamp, std::int64_t required, std::size_t size,
                             char format, const std::string& programName, const char* name);

}  // namespace pc
