// Fatal errors of the numbered-unit layer: a report on standard output built
// from a template whose '%' marks take integer values, then the run stops.
#pragma once

#include <span>
#include <string>
#include <string_view>

namespace pc::fileio {

// Exit status of the process after a fatal report of the file layer.
inline constexpr int kFatalStopStatus = 2;

// The template with its '%' marks replaced by the values in order, each
// written in exactly as many characters as it needs (nine asterisks when it
// needs more than nine), as the report prints it. Templates are cut to 198
// characters. A '%' left without a value stays as it is.
std::string fatalMessageText(std::string_view messageTemplate, std::span<const int> values);

// Prints " Fatal error in <routine> : " (only for a routine text that is not
// blank), the message and " Program terminated.", each as one free-form
// record on standard output, then ends the process with kFatalStopStatus.
[[noreturn]] void fatalError(std::string_view routine, std::string_view messageTemplate, int value);
[[noreturn]] void fatalErrorValues(std::string_view routine, std::string_view messageTemplate,
                                   std::span<const int> values);

}  // namespace pc::fileio
