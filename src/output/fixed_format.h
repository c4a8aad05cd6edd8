// Fixed-width text fields of the pocket result file, producing exactly the
// characters of printf's "%*.3f" and "%*d" at a fraction of printf's cost:
// a result file can hold millions of point lines.
#pragma once

#include <cstdint>

namespace pc {

// Longest text one call can produce for widths up to 16.
inline constexpr int kMaxFixedFieldChars = 64;

// Writes printf("%*.3f", width, (double)value) at `out`; returns the end.
char* formatFixed3(char* out, float value, int width);
// Writes printf("%*d", width, value) at `out`; returns the end.
char* formatInteger(char* out, std::int32_t value, int width);

}  // namespace pc
