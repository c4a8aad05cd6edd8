#include "output/fixed_format.h"

#include <cmath>
#include <cstdio>
#include <cstring>

namespace pc {

namespace {

char* rightAligned(char* out, const char* text, int length, int width) {
  for (int i = length; i < width; ++i) *out++ = ' ';
  std::memcpy(out, text, static_cast<std::size_t>(length));
  return out + length;
}

}  // namespace

char* formatFixed3(char* out, float value, int width) {
  // A float has a 24-bit mantissa, so value * 1000 is exact in double and
  // rounding it half-to-even gives the correctly rounded three decimals,
  // as the C library's conversion does.
  const double scaled = static_cast<double>(value) * 1000.0;
  if (!(std::fabs(scaled) < 1.0e15)) {
    char text[kMaxFixedFieldChars];
    int length = std::snprintf(text, sizeof text, "%.3f", static_cast<double>(value));
    if (length < 0) length = 0;
    if (length >= static_cast<int>(sizeof text)) length = static_cast<int>(sizeof text) - 1;
    return rightAligned(out, text, length, width);
  }
  auto units = static_cast<std::uint64_t>(std::nearbyint(std::fabs(scaled)));
  char text[32];
  char* const end = text + sizeof text;
  char* p = end;
  for (int i = 0; i < 3; ++i) {
    *--p = static_cast<char>('0' + units % 10);
    units /= 10;
  }
  *--p = '.';
  do {
    *--p = static_cast<char>('0' + units % 10);
    units /= 10;
  } while (units != 0);
  if (std::signbit(value)) *--p = '-';  // the C library keeps the sign of -0.0004 and -0.0
  return rightAligned(out, p, static_cast<int>(end - p), width);
}

char* formatInteger(char* out, std::int32_t value, int width) {
  std::uint32_t magnitude = value < 0 ? 0u - static_cast<std::uint32_t>(value) : static_cast<std::uint32_t>(value);
  char text[16];
  char* const end = text + sizeof text;
  char* p = end;
  do {
    *--p = static_cast<char>('0' + magnitude % 10);
    magnitude /= 10;
  } while (magnitude != 0);
  if (value < 0) *--p = '-';
  return rightAligned(out, p, static_cast<int>(end - p), width);
}

}  // namespace pc
