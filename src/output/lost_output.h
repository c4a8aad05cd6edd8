// The end of a run whose result file cannot be created or completely
// written: the result would be lost, so the run must not report success.
#pragma once

namespace pc {

// Exit status of a run that lost its output.
inline constexpr int kLostOutputStatus = -1;

// Prints "*** Cannot open file <name> in mode <mode>." and ends the process
// with kLostOutputStatus.
[[noreturn]] void reportLostOutput(const char* name, const char* mode);

}  // namespace pc
