// The boxed error report that ends the process when an array cannot grow or
// is indexed out of range: the pocket model has no way to go on without it.
#pragma once

namespace pc {

// Source name shown in the report's FILE line for every array failure.
inline constexpr const char* kArraySourceName = "array_impl";

// Line numbers the suite's support staff know the array failures by.
inline constexpr int kLineAllocAtConstruction = 35;
inline constexpr int kLineInvalidIndex = 59;
inline constexpr int kLineAllocAtGrowth = 105;

inline constexpr const char* kMemoryAllocationFailure = "Memory Allocation Failure";
inline constexpr const char* kInvalidArrayIndex = "Invalid Array Index";

// Prints the report on standard output and ends the process with status 1.
[[noreturn]] void FatalReport(const char* sourceFile, int line, const char* message);

}  // namespace pc
