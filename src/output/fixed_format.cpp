#include "output/fixed_format.h"

#include <cmath>
#include <cstdio>
#include <cstring>

namespace pc {

namespace {

// The fast path takes magnitudes below 10^12 (scaled by 1000, below 10^15).
constexpr int kFastWholeDigits = 12;
constexpr std::uint64_t kPowersOfTen[kFastWholeDigits] = {
    1, 10, 100, 1000, 10000, 100000, 1000000, 10000000, 100000000, 1000000000, 10000000000, 100000000000};
// Widths up to 16 take their padding from this run.
constexpr char kBlanks[] = "                ";

char* rightAligned(char* out, const char* text, int length, int width) {
  for (int i = length; i < width; ++i) *out++ = ' ';
  std::memcpy(out, text, static_cast<std::size_t>(length));
  return out + length;
}

constexpr char kDigitPairs[] =
    "00010203040506070809101112131415161718192021222324252627282930313233343536373839"
    "40414243444546474849505152535455565758596061626364656667686970717273747576777879"
    "8081828384858687888990919293949596979899";

// Nearest integer, ties to even, for 0 <= v < 2^52: adding and removing
// 2^52 leaves no fraction bits, and the addition rounds as the current
// (default, to-nearest-even) mode says, exactly as the C library's decimal
// conversion rounds.
std::uint64_t roundHalfEven(double v) {
  constexpr double kNoFraction = 4503599627370496.0;  // 2^52
  const double rounded = (v + kNoFraction) - kNoFraction;
  return static_cast<std::uint64_t>(rounded);
}

}  // namespace

char* formatFixed3(char* out, float value, int width) {
  // A float has a 24-bit mantissa, so value * 1000 is exact in double; its
  // nearest integer gives the correctly rounded three decimals.
  const double scaled = static_cast<double>(value) * 1000.0;
  if (!(std::fabs(scaled) < 1.0e15)) {
    char text[kMaxFixedFieldChars];
    int length = std::snprintf(text, sizeof text, "%.3f", static_cast<double>(value));
    if (length < 0) length = 0;
    if (length >= static_cast<int>(sizeof text)) length = static_cast<int>(sizeof text) - 1;
    return rightAligned(out, text, length, width);
  }
  const std::uint64_t units = roundHalfEven(std::fabs(scaled));
  std::uint64_t whole = units / 1000;
  int wholeDigits = 1;
  while (wholeDigits < kFastWholeDigits && whole >= kPowersOfTen[wholeDigits]) ++wholeDigits;
  const bool negative = std::signbit(value);  // the C library keeps the sign of -0.0004 and -0.0
  const int length = (negative ? 1 : 0) + wholeDigits + 4;
  const int padding = width > length ? width - length : 0;

  // Written in place, backwards from the end, over a run of blanks.
  std::memcpy(out, kBlanks, sizeof kBlanks - 1);
  char* const end = out + padding + length;
  char* p = end - 3;
  const auto fraction = static_cast<unsigned>(units % 1000);
  p[0] = static_cast<char>('0' + fraction / 100);
  std::memcpy(p + 1, kDigitPairs + 2 * (fraction % 100), 2);
  *--p = '.';
  while (whole >= 100) {
    p -= 2;
    std::memcpy(p, kDigitPairs + 2 * (whole % 100), 2);
    whole /= 100;
  }
  if (whole >= 10) {
    p -= 2;
    std::memcpy(p, kDigitPairs + 2 * whole, 2);
  } else {
    *--p = static_cast<char>('0' + whole);
  }
  if (negative) *--p = '-';
  return end;
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
