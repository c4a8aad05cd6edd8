// Names of a toolpath's files ("outil<number><extension>") and the short
// number text shown to the user.
#pragma once

#include <span>
#include <string_view>

namespace pc {

// Expanded path of the toolpath's file; static buffer, overwritten per call.
const char* toolFilePath(int number, const char* extension);
// "", "12" or "12.3"; kept in a ring of five buffers.
const char* toolNumberText(int number);
// Fixed-field variant: expands into `out` (blank-padded, left-justified);
// returns the expansion code.
int toolFilePathFixed(int number, std::span<char> out, std::string_view extension);

}  // namespace pc
