#include <gtest/gtest.h>

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <string>

#include "output/fixed_format.h"

namespace pc {
namespace {

std::string fixed(float v, int width) {
  char text[kMaxFixedFieldChars];
  return std::string(text, formatFixed3(text, v, width));
}

std::string printfFixed(float v, int width) {
  char text[128];
  std::snprintf(text, sizeof text, "%*.3f", width, static_cast<double>(v));
  return text;
}

TEST(FixedFormat, MatchesPrintfOnTiesSignsAndHugeValues) {
  for (float v : {0.0f, -0.0f, 0.0625f, -0.0625f, 0.0005f, 1.0005f, -0.0004f, 12.5f, -3.25f, 99999.0f,
                  8388607.5f, 0.1875f, 9.9999e11f, 1.0e12f, -3.0e38f, 1.0e-40f}) {
    EXPECT_EQ(fixed(v, 10), printfFixed(v, 10)) << v;
    EXPECT_EQ(fixed(v, 3), printfFixed(v, 3)) << v;
  }
}

TEST(FixedFormat, MatchesPrintfOnPseudoRandomFloats) {
  std::uint32_t state = 12345u;
  for (int i = 0; i < 200000; ++i) {
    state = state * 1664525u + 1013904223u;
    // Magnitudes from 2^-27 to 2^60: the fast path and the fallback.
    const std::uint32_t bits = (state & 0x807FFFFFu) | ((100u + (state >> 8) % 88u) << 23);
    float v = 0.0f;
    std::memcpy(&v, &bits, sizeof v);
    ASSERT_EQ(fixed(v, 10), printfFixed(v, 10)) << bits;
  }
}

TEST(FixedFormat, IntegersAreRightAlignedAndNeverCut) {
  for (std::int32_t v : {0, 7, -1003, 9999, 2147483647, -2147483647 - 1}) {
    for (int width : {6, 10}) {
      char text[32];
      char expected[32];
      std::snprintf(expected, sizeof expected, "%*d", width, static_cast<int>(v));
      EXPECT_EQ(std::string(text, formatInteger(text, v, width)), expected);
    }
  }
}

}  // namespace
}  // namespace pc
