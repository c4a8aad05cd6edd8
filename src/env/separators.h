// Separator normalisation of expanded names: the other platform's separator
// becomes the native one, then every run of separators becomes one.
#pragma once

#include <string>

namespace pc {

// With the platform's native separator.
void normaliseSeparators(std::string& text);
// With an explicit separator ('/' or '\\'), so that both rewrites can be
// exercised on any platform.
void normaliseSeparators(std::string& text, char separator);

}  // namespace pc
