// Names of the suite's file kinds: a default name pattern per kind code,
// which the value of the kind's key in the section "Tarnex files names" of
// the file-names table replaces when it is not empty.
#pragma once

#include <string>

namespace pc {

// The kind of the machine axis system file.
inline constexpr int kMachineAxisSystemFile = 1022;

// Default pattern and key of a kind code; "" for an unknown code.
const char* defaultFileName(int code);
const char* fileNameKey(int code);

// The name of a kind: the non-empty value found under its key, else the
// default. Not expanded.
std::string fileKindName(int code);

}  // namespace pc
