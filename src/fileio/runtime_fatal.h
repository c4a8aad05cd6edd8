// Fatal errors of the numbered-unit layer: a report on standard output built
// from a template whose '%' marks take integer values, then the run stops.
#pragma once

#include <span>
#include <string_view>

namespace pc::fileio {

// Exit status of the process after a fatal report of the file layer.
inline constexpr int kFatalStopStatus = 2;

[[noreturn]] void fatalError(std::string_view routine, std::string_view messageTemplate, int value);
[[noreturn]] void fatalErrorValues(std::string_view routine, std::string_view messageTemplate,
                                   std::span<const int> values);

}  // namespace pc::fileio
