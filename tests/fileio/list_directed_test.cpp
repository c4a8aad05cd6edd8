#include "fileio/list_directed.h"

#include <gtest/gtest.h>

#include <cfloat>
#include <cmath>
#include <cstdio>
#include <optional>
#include <utility>
#include <vector>

#include "fileio/record_runtime.h"

namespace pc::fileio {
namespace {

// Reads reals until the record has no further value; a null value shows as
// the -1 it was preset to.
std::vector<float> readAll(std::string_view text) {
  std::vector<float> out;
  std::size_t pos = 0;
  for (float v = -1.0f;; v = -1.0f) {
    const int r = readListReal(text, pos, v);
    if (r != kListValue) {
      EXPECT_EQ(r, kListNoValue) << text;
      return out;
    }
    out.push_back(v);
  }
}

TEST(ListDirected, SeparatorsNullsAndSlash) {
  using V = std::vector<float>;
  EXPECT_EQ(readAll("  1.5   2\t3"), (V{1.5f, 2, 3}));
  // A comma between blanks is one separator; two commas make a null value.
  EXPECT_EQ(readAll("1 , 2,,3 ,  , 4"), (V{1, 2, -1, 3, -1, 4}));
  EXPECT_EQ(readAll(",5"), (V{-1, 5}));
  EXPECT_EQ(readAll("   "), V{});
  // The slash ends the values, also for every later read.
  std::size_t pos = 0;
  float v = 0.0f;
  for (const int r : {kListValue, kListNoValue, kListNoValue}) EXPECT_EQ(readListReal("7 / 8", pos, v), r);
  EXPECT_EQ(v, 7.0f);
}

// A conversion error (no expected value) leaves the variable as it was.
TEST(ListDirected, RealAndIntegerForms) {
  const std::optional<float> bad;
  const std::pair<std::string_view, std::optional<float>> reals[] = {
      {"12.00000 trailing words", 12}, {"-3.", -3}, {".5", 0.5f}, {"+1.25e2", 125}, {"1.5D-1", 0.15f}, {"2d3", 2000},
      {"1.5+3", 1500}, {"6.35", 6.35f}, {"3.4028235e38", FLT_MAX}, {"1e-400", 0}, {"0e999999999999", 0},
      {"--3", bad}, {"1.2.3", bad}, {"abc", bad}, {"1e400", bad}, {"-1e400", bad}, {"3.4028236e38", bad},
      {"nan", bad}, {"inf", bad}, {"12.5abc", bad}, {"1e", bad}, {"1e+", bad}, {"+", bad}, {".", bad},
      {"1x5", bad}, {"0x10", bad}, {"1*2", bad}, {std::string_view("1\0", 2), bad}};
  for (const auto& [text, expected] : reals) {
    std::size_t pos = 0;
    float v = -7.0f;
    const int r = readListReal(text, pos, v);
    EXPECT_TRUE(expected ? r == kListValue : r > 0) << text << ": " << r;
    EXPECT_EQ(v, expected.value_or(-7.0f)) << text;
  }
  EXPECT_TRUE(std::signbit(readAll("-0.0").at(0)));

  std::size_t pos = 0;
  std::int32_t v = 0;
  std::vector<std::int32_t> got;
  const std::string text = "42 -7,+3 2147483647 -2147483648" + formatListInteger(-12);
  while (readListInteger(text, pos, v) == kListValue) got.push_back(v);
  EXPECT_EQ(got, (std::vector<std::int32_t>{42, -7, 3, INT32_MAX, INT32_MIN, -12}));
  for (const char* wrong : {"2147483648", "-2147483649", "99999999999", "12.7", "1e5", "abc", "-", "--3"}) {
    pos = 0;
    EXPECT_GT(readListInteger(wrong, pos, v), 0) << wrong;
    EXPECT_EQ(v, -12) << wrong;
  }
}

TEST(ListDirected, FormattedValuesReadBackExactly) {
  for (const float f : {0.0f, -0.0f, 6.35f, 0.1f, -99999.0f, 1e20f, 123456789.0f, FLT_MAX, -FLT_MAX, FLT_MIN,
                        FLT_TRUE_MIN, 1.0f / 3.0f}) {
    const std::string text = formatListReal(f);
    const std::vector<float> back = readAll(text);
    ASSERT_EQ(back.size(), 1u) << text;
    EXPECT_EQ(back[0], f) << text;
    EXPECT_EQ(std::signbit(back[0]), std::signbit(f)) << text;
  }
  EXPECT_EQ(formatListReal(6.35f), "6.35");
  EXPECT_EQ(formatListReal(25.0f), "25.0");
  EXPECT_EQ(formatListInteger(12), "         12");
  EXPECT_EQ(formatListInteger(INT32_MIN), "-2147483648");
}

TEST(ListDirected, RecordBeginsWithOneBlank) {
  testing::internal::CaptureStdout();
  EXPECT_EQ(writeListRecord(kStandardOutputUnit, "you are using " + formatListReal(1.0f)), kIoOk);
  std::fflush(stdout);
  EXPECT_EQ(testing::internal::GetCapturedStdout(), " you are using 1.0\n");
  EXPECT_GT(writeListRecord(8, "x"), 0);  // a unit that is not open
}

}  // namespace
}  // namespace pc::fileio
