// Fixed-width text fields of the pocket result file, producing exactly the
// characters of printf's "%*.3f" and "%*d" at a fraction of printf's cost:
// a result file can hold millions of point lines.
#pragma once

#include <cstdint>

namespace pc {

// Room each call needs at `out` (for widths up to 16): the longest text,
// and scratch beyond the end of shorter ones.
inline constexpr int kMaxFixedFieldChars = 64;

// Writes printf("%*.3f", width, (double)value) at `out`; returns the end.
// Bytes after the end, up to kMaxFixedFieldChars from `out`, may change.
// `width` is at most 16.
char* formatFixed3(char* out, float value, int width);
// Writes printf("%*d", width, value) at `out`; returns the end.
char* formatInteger(char* out, std::int32_t value, int width);

}  // namespace pc
